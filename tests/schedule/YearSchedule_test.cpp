#include "schedule/YearSchedule.h"

#include <gtest/gtest.h>

#include <functional>

#include "engine/VtrError.h"
#include "show/TempFolder.h"
#include "show/WholeFile.h"

namespace vtr {
namespace {

using namespace YearScheduleFunctions;

DateTime At(int y, int m, int d, int h = 0, int mi = 0, int s = 0) {
    return DateTime::FromParts(y, m, d, h, mi, s);
}

struct Raised {
    int32_t number = 0;
    std::string source;
    std::string description;
};

Raised ErrorOf(const std::function<void()>& step) {
    try {
        step();
    } catch (const VtrError& e) {
        return {e.Number(), e.Source(), e.Description()};
    }
    return {};
}

TEST(YearSchedule, StoresAShowUnderItsStartDate) {
    YearSchedule year;
    year.AddShowEventByFile("Eve.lss", At(2009, 12, 24, 23), At(2009, 12, 25, 1));
    EXPECT_TRUE(year.Modified());
    ASSERT_EQ(year.Keys(), std::vector<std::string>{"2009-12-24"});
    const auto day = year.ScheduleByKey("2009-12-24");
    ASSERT_NE(day, nullptr);
    const auto show = day->FirstShowEvent();
    ASSERT_NE(show, nullptr);
    EXPECT_EQ(show->StartTime()->ToString(), "Thu2300");
    EXPECT_EQ(show->EndTime()->ToString(), "Fri100");
    EXPECT_EQ(YearScheduleToText(year), "((2009-12-24,((435600,2,(,0,Eve.lss),428400))))");
    EXPECT_EQ(year.DateSchedule(At(2009, 12, 24, 15)), day);
    EXPECT_EQ(year.ScheduleByKey("2009-12-25"), nullptr);

    // A second show on the same date goes into the same schedule.
    year.AddShowEventByFile("Noon.lss", At(2009, 12, 24, 12), At(2009, 12, 24, 13));
    EXPECT_EQ(year.Keys().size(), 1u);
    EXPECT_EQ(day->FirstShowEvent()->Filename(), "Noon.lss");
}

TEST(YearSchedule, RefusesWhatDoesNotFit) {
    YearSchedule year;
    year.AddShowEventByFile("Eve.lss", At(2009, 12, 24, 18), At(2009, 12, 24, 22));
    year.AddShowEventByFile("Morning.lss", At(2009, 12, 25, 6), At(2009, 12, 25, 8));
    year.SetModified(false);
    const std::string before = YearScheduleToText(year);

    auto refusal = [&](const DateTime& start, const DateTime& end) {
        return ErrorOf([&] { year.AddShowEventByFile("New.lss", start, end); });
    };
    Raised r = refusal(At(2009, 12, 26, 20), At(2009, 12, 26, 20));
    EXPECT_EQ(r.number, 1);
    EXPECT_EQ(r.source, "Schedule.AddShowEventByFile");
    EXPECT_EQ(r.description, "End time precedes start time");
    EXPECT_FALSE(year.Modified());  // refused before anything was touched
    EXPECT_EQ(refusal(At(2009, 12, 26, 21), At(2009, 12, 26, 20)).number, 1);

    r = refusal(At(2009, 12, 26, 23), At(2009, 12, 28, 1));
    EXPECT_EQ(r.number, 2);
    EXPECT_EQ(r.description, "Event spans more than two days");
    EXPECT_TRUE(year.Modified());

    r = refusal(At(2009, 12, 24, 23), At(2009, 12, 25, 7));
    EXPECT_EQ(r.number, 3);
    EXPECT_EQ(r.description, "End time conficts with event in next day");

    r = refusal(At(2009, 12, 24, 21), At(2009, 12, 25, 1));
    EXPECT_EQ(r.number, 4);
    EXPECT_EQ(r.description, "Start time conflicts with event in previous day");

    r = refusal(At(2009, 12, 24, 17), At(2009, 12, 24, 19));
    EXPECT_EQ(r.number, 4);
    EXPECT_EQ(r.description, "Event conflict");

    EXPECT_EQ(YearScheduleToText(year), before);
    // Up to the next day's first show is fine.
    year.AddShowEventByFile("Late.lss", At(2009, 12, 24, 23), At(2009, 12, 25, 6));
}

TEST(YearSchedule, DateKeys) {
    EXPECT_EQ(YearSchedule::DateStringToDate("2009-12-24"), At(2009, 12, 24));
    EXPECT_EQ(YearSchedule::DateStringToDate(" 2009- 1-5"), At(2009, 1, 5));
    EXPECT_EQ(YearSchedule::DateStringToDate("2009-13-01"), At(2010, 1, 1));
    const Raised r = ErrorOf([] { YearSchedule::DateStringToDate("2009/12/24"); });
    EXPECT_EQ(r.number, 37);
    EXPECT_EQ(r.description, "Unexpected date string format: 2009/12/24");
    EXPECT_EQ(ErrorOf([] { YearSchedule::DateStringToDate("2009-12-24-1"); }).number, 37);
    EXPECT_EQ(ErrorOf([] { YearSchedule::DateStringToDate("2009-ab-01"); }).number,
              ErrorNumbers::TypeMismatch);
    EXPECT_EQ(ErrorOf([] { YearSchedule::DateStringToDate("40000-1-1"); }).number,
              ErrorNumbers::Overflow);
    EXPECT_EQ(YearSchedule::DateToString(At(2009, 1, 5, 13)), "2009-01-05");

    YearSchedule year;
    year.AddSchedule(At(2009, 12, 24), std::make_shared<Schedule>());
    const Raised duplicate =
        ErrorOf([&] { year.AddSchedule(At(2009, 12, 24, 8), std::make_shared<Schedule>()); });
    EXPECT_EQ(duplicate.number, ErrorNumbers::KeyAlreadyExists);
    EXPECT_EQ(duplicate.description,
              "This key is already associated with an element of this collection");
}

TEST(YearSchedule, RemovingTheLastShowOfADateRemovesTheDate) {
    YearSchedule year;
    year.AddShowEventByFile("A.lss", At(2009, 12, 24, 18), At(2009, 12, 24, 19));
    year.AddShowEventByFile("B.lss", At(2009, 12, 24, 20), At(2009, 12, 24, 21));
    year.AddShowEventByFile("C.lss", At(2009, 12, 31, 20), At(2009, 12, 31, 21));
    const auto day = year.ScheduleByKey("2009-12-24");
    year.RemoveShowEvent(At(2009, 12, 24), day->FirstNode()->NextNode());
    EXPECT_EQ(year.Keys().size(), 2u);
    year.RemoveShowEvent(At(2009, 12, 24), day->FirstNode()->NextNode());
    EXPECT_EQ(year.Keys(), std::vector<std::string>{"2009-12-31"});
    EXPECT_EQ(ErrorOf([&] { year.RemoveShowEvent(At(2010, 1, 1), nullptr); }).number,
              ErrorNumbers::ObjectNotSet);
}

TEST(YearSchedule, FirstShowWithinRange) {
    YearSchedule year;
    year.AddShowEventByFile("Late.lss", At(2009, 12, 26, 23), At(2009, 12, 27, 1));
    year.AddShowEventByFile("Eve.lss", At(2009, 12, 24, 18), At(2009, 12, 24, 22));
    year.AddShowEventByFile("Noon.lss", At(2009, 12, 24, 12), At(2009, 12, 24, 13));
    TimeRange range;
    range.SetStartTime(At(2009, 12, 24, 12, 30));
    range.SetEndTime(At(2009, 12, 31));
    auto first = year.FirstShowWithinRange(range);
    ASSERT_TRUE(first.has_value());
    EXPECT_EQ(first->Event->Filename(), "Noon.lss");
    EXPECT_EQ(first->Range.StartTime(), At(2009, 12, 24, 12));

    range.SetStartTime(At(2009, 12, 26, 23, 30));
    first = year.FirstShowWithinRange(range);
    ASSERT_TRUE(first.has_value());
    EXPECT_EQ(first->Event->Filename(), "Late.lss");  // runs across Sunday midnight
    EXPECT_EQ(first->Range.EndTime(), At(2009, 12, 27, 1));

    range.SetStartTime(At(2009, 12, 27, 1));
    EXPECT_FALSE(year.FirstShowWithinRange(range).has_value());
}

TEST(YearScheduleFile, ReadingSkipsBadDates) {
    const auto year = YearScheduleFromText(
        "((2009-12-24,((435600,2,(,0,Eve.lss),428400))),(someday,()),(2009-12-24,()),"
        "(2009-12-31),(2010-01-01T00:00:00,((3600,2,(,0,New.lss),0))),(2010-01-02,))");
    EXPECT_EQ(year->Keys(), (std::vector<std::string>{"2009-12-24", "2010-01-01", "2010-01-02"}));
    EXPECT_EQ(year->ScheduleByKey("2010-01-01")->FirstShowEvent()->Filename(), "New.lss");
    EXPECT_EQ(year->ScheduleByKey("2010-01-02")->FirstShowEvent(), nullptr);
    for (const char* text : {"", "(", "garbage", "((2009-12-24"}) {
        EXPECT_TRUE(YearScheduleFromText(text)->Keys().empty()) << text;
    }
    EXPECT_EQ(YearScheduleToText(YearSchedule()), "");
}

TEST(YearScheduleFile, SavedAndLoadedBackIsTheSame) {
    testing::TempFolder folder;
    YearSchedule year;
    year.AddShowEventByFile("Eve (late).lss", At(2009, 12, 24, 23), At(2009, 12, 25, 1));
    year.AddShowEventByFile("Noon.lss", At(2009, 12, 24, 12), At(2009, 12, 24, 13));
    year.AddShowEventByFile("Old.lss", At(2008, 1, 1, 12), At(2008, 1, 1, 13));
    const std::string path = folder.File("yearsched.lsc");
    year.Save(path);
    const auto loaded = LoadYearSchedule(path);
    EXPECT_FALSE(loaded->Modified());
    EXPECT_EQ(loaded->Keys(), year.Keys());
    EXPECT_EQ(YearScheduleToText(*loaded), YearScheduleToText(year));

    const auto missing = LoadYearSchedule(folder.File("none.lsc"));
    EXPECT_TRUE(missing->Keys().empty());
    EXPECT_FALSE(missing->Modified());
    YearSchedule().Save(path);
    std::string text = "x";
    ASSERT_EQ(ReadWholeFile(path, text), 0);
    EXPECT_EQ(text, "");
    EXPECT_EQ(ErrorOf([&] { year.Save(folder.File("no/such/yearsched.lsc")); }).number,
              FileErrors::PathNotFound);
}

TEST(VTRDictionary, KeepsKeysInOrderAndRefusesDuplicates) {
    VTRDictionary<int> dictionary;
    dictionary.Add("b", 2);
    dictionary.Add("a", 1);
    dictionary.Add("c", 3);
    EXPECT_EQ(dictionary.Keys(), (std::vector<std::string>{"b", "a", "c"}));
    EXPECT_EQ(dictionary.Count(), 3);
    EXPECT_TRUE(dictionary.Exists("a"));
    EXPECT_FALSE(dictionary.Exists("A"));
    EXPECT_EQ(dictionary.Item("c"), 3);

    Raised r = ErrorOf([&] { dictionary.Add("a", 9); });
    EXPECT_EQ(r.number, 457);
    EXPECT_EQ(r.description, "This key is already associated with an element of this collection");
    EXPECT_EQ(dictionary.Item("a"), 1);

    dictionary.Remove("a");
    EXPECT_EQ(dictionary.Keys(), (std::vector<std::string>{"b", "c"}));
    r = ErrorOf([&] { dictionary.Remove("a"); });
    EXPECT_EQ(r.number, 32811);
    EXPECT_EQ(r.description, "Method 'Remove' of object 'IDictionary' failed");
    EXPECT_EQ(ErrorOf([&] { dictionary.Item("a"); }).number, ErrorNumbers::InvalidProcedureCall);

    dictionary.SetItem("b", 20);
    dictionary.SetItem("a", 10);  // a new key goes at the end
    std::vector<std::string> keys(dictionary.begin(), dictionary.end());
    EXPECT_EQ(keys, (std::vector<std::string>{"b", "c", "a"}));
    EXPECT_EQ(dictionary.Item("b"), 20);
}

}  // namespace
}  // namespace vtr
