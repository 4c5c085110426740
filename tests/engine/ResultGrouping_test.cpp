#include "engine/ResultGrouping.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace vtr {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

ResultPtr MakeResult(Severity severity, int32_t number, const std::string& summary,
                     const std::vector<std::string>& details = {}) {
    auto result = std::make_shared<Result>();
    result->SetSeverity(severity);
    result->SetMessageNumber(number);
    result->SetSummary(summary);
    for (const std::string& detail : details)
        result->AddDetail(detail);
    return result;
}

const std::string kShows = "/inst/data/shows/";
const std::string kSeqs = "/inst/data/sequences/";

// A channel conflict between two sequences of a show, as the check words it.
ResultPtr ChannelConflict(const std::string& show, const std::string& section1,
                          const std::string& sequence1, const std::string& section2,
                          const std::string& sequence2, const std::string& channel = "Tree") {
    return MakeResult(
        Severity::Warning, 43, "Channel conflict",
        {"[SHOW]: " + kShows + show, "[SECTION]: " + section1, "[SEQUENCE]: " + kSeqs + sequence1,
         "[TRACK]: Track 1: Roof", "[CHANNEL]: " + channel, "[SECTION]: " + section2,
         "[SEQUENCE]: " + kSeqs + sequence2, "[TRACK]: Track 2: Roof", "[CHANNEL]: " + channel});
}

std::vector<std::string> Titles(const ResultView& view) {
    std::vector<std::string> titles;
    for (const ResultGroup& group : view.groups)
        titles.push_back(group.title);
    return titles;
}

std::vector<std::string> Headings(const ResultView& view) {
    std::vector<std::string> headings;
    for (const ResultGroup& group : view.groups)
        headings.push_back(GroupHeading(group));
    return headings;
}

ResultView Grouped(const ResultGrouping& grouping, GroupBy by,
                   ResultOrder order = ResultOrder::RunOrder) {
    ResultQuery query;
    query.groupBy = by;
    query.order = order;
    return grouping.View(query);
}

// The demo installation's findings, in the order a schedule run gives them, with the two the
// demo ignores.
class DemoResults : public ::testing::Test {
  protected:
    DemoResults() {
        Add(Severity::Warning, 6, "Verifier not running from VTR application path",
            {"[APPLICATION]: /inst/app/", "[VERIFIER]: /usr/bin/"}, true);  // 0
        Add(Severity::Error, 16, "Application file has unexpected version number",
            {"[FILE]: /inst/app/SuiteTray.exe", "[EXPECTED]: 1.0.0.0", "[FOUND]: 0.9.4.2"});  // 1
        Add(Severity::Warning, 33, "Musical file used in non-audio section of show",
            {"[SEQUENCE]: " + kSeqs + "Carol.lms", "[SHOW]: " + kShows + "Weekend.lss",
             "[SECTION]: background"});  // 2
        Add(Severity::Error, 23, "Sequence file does not exist",
            {"[SEQUENCE]: " + kSeqs + "Fireworks.las",
             "[SHOW]: show " + kShows + "Weekend.lss"});  // 3
        grouping_.Add(ChannelConflict("Evening.lss", "Musical", "Carol.lms", "Background",
                                      "Twinkle.las"));  // 4
        Add(Severity::Warning, 30, "Channel is missing settings",
            {"[SEQUENCE]: " + kSeqs + "Intro.las", "[TRACK]: Track 1: Porch", "[CHANNEL]: Sparkle"},
            true);  // 5
        Add(Severity::Warning, 28, "Channel is completely off",
            {"[SEQUENCE]: " + kSeqs + "Snowfall.las", "[TRACK]: Track 1: Garage",
             "[CHANNEL]: Star"});  // 6
        Add(Severity::Warning, 31, "Channel uses undefined comm network",
            {"[SEQUENCE]: " + kSeqs + "Goodnight.las", "[TRACK]: Track 1: Drive",
             "[CHANNEL]: Driveway"});  // 7
        Add(Severity::Error, 26, "Media file does not exist",
            {"[FILE]: /inst/media/Jingle.mp3", "[SEQUENCE]: " + kSeqs + "Jingle.lms"});  // 8
    }

    void Add(Severity severity, int32_t number, const std::string& summary,
             const std::vector<std::string>& details, bool ignored = false) {
        grouping_.Add(MakeResult(severity, number, summary, details), ignored);
    }

    ResultGrouping grouping_;
};

TEST_F(DemoResults, ListsEachListingInRunOrderOrErrorsFirst) {
    ResultQuery query;
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(1, 2, 3, 4, 6, 7, 8));
    query.order = ResultOrder::ErrorsFirst;
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(1, 3, 8, 2, 4, 6, 7));
    EXPECT_THAT(grouping_.View(query).groups, IsEmpty());

    query.listing = Listing::Ignored;
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(0, 5));
    query.listing = Listing::All;
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(1, 3, 8, 0, 2, 4, 5, 6, 7));

    EXPECT_EQ(grouping_.Counts(Listing::NotIgnored), (SeverityCounts{3, 4, 0, 0}));
    EXPECT_EQ(grouping_.Counts(Listing::Ignored), (SeverityCounts{0, 2, 0, 0}));

    // Ignoring moves a result from one listing to the other.
    grouping_.SetIgnored(1, true);
    grouping_.SetIgnored(5, false);
    query.listing = Listing::NotIgnored;
    query.order = ResultOrder::RunOrder;
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(2, 3, 4, 5, 6, 7, 8));
    EXPECT_EQ(grouping_.Counts(Listing::Ignored), (SeverityCounts{1, 1, 0, 0}));
}

TEST_F(DemoResults, FiltersBySeverityAndTextAndCountsWhatItHid) {
    ResultQuery query;
    query.filter = ResultFilter::AtLeast(Severity::Error);
    ResultView view = grouping_.View(query);
    EXPECT_THAT(view.shown, ElementsAre(1, 3, 8));
    EXPECT_EQ(view.hidden, 4u);

    // Any letter case, in the summary or in any detail, never across two details.
    query.filter = ResultFilter();
    query.filter.text = "SNOWFALL";
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(6));
    query.filter.text = "media file DOES";
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(8));
    query.filter.text = "weekend.lss";
    EXPECT_THAT(grouping_.View(query).shown, ElementsAre(2, 3));
    query.filter.text = "Garage[CHANNEL]";
    EXPECT_THAT(grouping_.View(query).shown, IsEmpty());

    // Both together, and on the ignored list.
    query.filter = ResultFilter::AtLeast(Severity::Warning);
    query.filter.errors = false;
    query.filter.text = "track 1";
    view = grouping_.View(query);
    EXPECT_THAT(view.shown, ElementsAre(4, 6, 7));
    EXPECT_EQ(view.hidden, 4u);
    query.listing = Listing::Ignored;
    view = grouping_.View(query);
    EXPECT_THAT(view.shown, ElementsAre(5));
    EXPECT_EQ(view.hidden, 1u);
    EXPECT_TRUE(grouping_.Passes(5, query.filter));
    EXPECT_FALSE(grouping_.Passes(0, query.filter));
}

TEST(ResultGroupingTest, InformationAndOtherSeveritiesShowTogetherAndSortLast) {
    ResultGrouping grouping;
    grouping.Add(MakeResult(static_cast<Severity>(5), 60, "Odd"));
    grouping.Add(MakeResult(Severity::Info, 1, "No errors or warnings found"));
    grouping.Add(MakeResult(Severity::Warning, 2, "Verification cancelled"));
    ResultQuery query;
    query.order = ResultOrder::ErrorsFirst;
    EXPECT_THAT(grouping.View(query).shown, ElementsAre(2, 1, 0));
    query.filter = ResultFilter::AtLeast(Severity::Warning);
    EXPECT_THAT(grouping.View(query).shown, ElementsAre(2));
    query.filter = ResultFilter::AtLeast(Severity::Info);
    EXPECT_THAT(grouping.View(query).shown, ElementsAre(2, 1, 0));
    EXPECT_EQ(grouping.Counts(Listing::All), (SeverityCounts{0, 1, 1, 1}));
}

TEST(ResultGroupingTest, LetterCaseIsIgnoredBeyondAsciiInUtf8) {
    ResultGrouping grouping;
    grouping.Add(MakeResult(
        Severity::Warning, 28, "Channel is completely off",
        {"[SEQUENCE]: /d/ÉTÉ À GENÈVE.las", "[CHANNEL]: ŁUK", "[TRACK]: ЁЛКА", "[TRACK]: ΔΈΝΔΡΟ"}));
    grouping.Add(MakeResult(Severity::Warning, 28, "x", {"bytes \xC3 \xFF \xC1\x81"}));
    for (const char* text : {"été à genève", "ÉTÉ À GENÈVE", "łuk", "ёлка", "δένδρο", "Ё"}) {
        ResultFilter filter;
        filter.text = text;
        EXPECT_TRUE(grouping.Passes(0, filter)) << text;
        EXPECT_FALSE(grouping.Passes(1, filter)) << text;
    }
    // Bytes that are no UTF-8 are compared as they are.
    ResultFilter filter;
    filter.text = "\xC3 \xFF \xC1\x81";
    EXPECT_TRUE(grouping.Passes(1, filter));
    EXPECT_EQ(FoldCase("ÀÞ×ĀĹŽŸΑΫЀЯ"), "àþ×āĺžÿαϋѐя");
}

TEST_F(DemoResults, GroupsByMessageWithTitlesCountsAndTheWorstSeverity) {
    grouping_.Add(ChannelConflict("Evening.lss", "Musical", "Carol.lms", "Background",
                                  "Twinkle.las", "Star"));  // 9
    ResultView view = Grouped(grouping_, GroupBy::Message);
    EXPECT_THAT(
        Headings(view),
        ElementsAre("Message 16: Application file has unexpected version number (1)",
                    "Message 33: Musical file used in non-audio section of show (1)",
                    "Message 23: Sequence file does not exist (1)",
                    "Message 43: Channel conflict (2)", "Message 28: Channel is completely off (1)",
                    "Message 31: Channel uses undefined comm network (1)",
                    "Message 26: Media file does not exist (1)"));
    EXPECT_EQ(view.groups[3].key, "message:43");
    EXPECT_THAT(view.groups[3].members, ElementsAre(4, 9));
    EXPECT_EQ(view.groups[3].counts, (SeverityCounts{0, 2, 0, 0}));
    EXPECT_EQ(view.groups[3].worst, Severity::Warning);
    EXPECT_THAT(view.shown, ElementsAre(1, 2, 3, 4, 9, 6, 7, 8));

    view = Grouped(grouping_, GroupBy::Message, ResultOrder::ErrorsFirst);
    EXPECT_THAT(Titles(view),
                ElementsAre("Message 16: Application file has unexpected version "
                            "number",
                            "Message 23: Sequence file does not exist",
                            "Message 26: Media file does not exist",
                            "Message 33: Musical file used in non-audio section "
                            "of show",
                            "Message 43: Channel conflict", "Message 28: Channel is completely off",
                            "Message 31: Channel uses undefined comm network"));
    EXPECT_EQ(view.groups[0].worst, Severity::Error);
    EXPECT_EQ(grouping_.GroupOf(9, GroupBy::Message).key, "message:43");
    EXPECT_EQ(grouping_.GroupOf(9, GroupBy::None).key, "");
}

TEST_F(DemoResults, GroupsByShowAndBySequenceWithOtherResultsLast) {
    grouping_.Add(MakeResult(Severity::Error, 21, "Show file does not exist",
                             {kShows + "Nowhere.lss"}));  // 9
    grouping_.Add(MakeResult(Severity::Warning, 53, "Trigger uses undefined network",
                             {"[SHOW] " + kShows + "Evening.lss", "[NETWORK] Aux P",
                              "[TRIGGER] Interactive group (Porch)"}));  // 10
    // A missing subsequence is referenced by a sequence, not by a show.
    grouping_.Add(MakeResult(
        Severity::Error, 23, "Sequence file does not exist",
        {"[SEQUENCE]: " + kSeqs + "Sub.las", "[SHOW]: sequence " + kSeqs + "Bells.las"}));  // 11
    grouping_.Add(MakeResult(Severity::Error, 24, "Sequence file cannot be loaded",
                             {kSeqs + "Broken.lms"}));  // 12
    grouping_.Add(MakeResult(Severity::Error, 26, "Media file does not exist",
                             {"[FILE]: ", "[SEQUENCE]: "}));  // 13

    ResultView view = Grouped(grouping_, GroupBy::Show);
    EXPECT_THAT(Headings(view), ElementsAre(kShows + "Weekend.lss (2)", kShows + "Evening.lss (2)",
                                            kShows + "Nowhere.lss (1)", "Other results (7)"));
    EXPECT_THAT(view.groups[0].members, ElementsAre(2, 3));
    EXPECT_THAT(view.groups[1].members, ElementsAre(4, 10));
    EXPECT_THAT(view.groups[3].members, ElementsAre(1, 6, 7, 8, 11, 12, 13));
    EXPECT_EQ(view.groups[0].key, "show:" + kShows + "Weekend.lss");
    EXPECT_EQ(view.groups[3].key, "other");

    // With errors first, the groups holding errors come first, the other results among them.
    view = Grouped(grouping_, GroupBy::Show, ResultOrder::ErrorsFirst);
    EXPECT_THAT(Titles(view), ElementsAre(kShows + "Weekend.lss", kShows + "Nowhere.lss",
                                          "Other results", kShows + "Evening.lss"));
    EXPECT_THAT(view.groups[0].members, ElementsAre(3, 2));
    EXPECT_THAT(view.groups[2].members, ElementsAre(1, 8, 11, 12, 13, 6, 7));
    EXPECT_EQ(view.groups[0].counts, (SeverityCounts{1, 1, 0, 0}));

    view = Grouped(grouping_, GroupBy::Sequence);
    EXPECT_THAT(Headings(view), ElementsAre(kSeqs + "Carol.lms (2)", kSeqs + "Fireworks.las (1)",
                                            kSeqs + "Snowfall.las (1)", kSeqs + "Goodnight.las (1)",
                                            kSeqs + "Jingle.lms (1)", kSeqs + "Sub.las (1)",
                                            kSeqs + "Broken.lms (1)", "Other results (4)"));
    // A conflict goes under the sequence the check was walking.
    EXPECT_THAT(view.groups[0].members, ElementsAre(2, 4));
    EXPECT_THAT(view.groups[7].members, ElementsAre(1, 9, 10, 13));
}

TEST(ResultGroupingTest, PairsGatherTheConflictsOfTwoSequencesInAShowWhicheverSideCameFirst) {
    ResultGrouping grouping;
    grouping.Add(ChannelConflict("Evening.lss", "Musical", "Carol.lms", "Background", "Twinkle.las",
                                 "Tree"));  // 0
    grouping.Add(MakeResult(Severity::Warning, 27, "Conflicting channel settings in sequence",
                            {"[SEQUENCE]: " + kSeqs + "Snow.las", "[TRACK]: Track 1: A",
                             "[CHANNEL]: a", "[TRACK]: Track 2: B", "[CHANNEL]: b"}));  // 1
    grouping.Add(ChannelConflict("Evening.lss", "Background", "Twinkle.las", "Musical", "Carol.lms",
                                 "Star"));  // 2
    // The same two sequences in another show are another pair.
    grouping.Add(ChannelConflict("Weekend.lss", "Musical", "Carol.lms", "Background", "Twinkle.las",
                                 "Tree"));  // 3
    grouping.Add(MakeResult(
        Severity::Warning, 47, "Intensity file conflict",
        {"[SHOW]: " + kShows + "Evening.lss", "[SECTION]: Background",
         "[SEQUENCE]: " + kSeqs + "Twinkle.las", "[INTENSITY FILE]: Gridcraft Intensity File",
         "[RANGE]: DMX Universe 1 1-10", "[SECTION]: Musical", "[SEQUENCE]: " + kSeqs + "Carol.lms",
         "[INTENSITY FILE]: Novalux Intensity File", "[RANGE]: DMX Universe 1 8-11"}));  // 4
    grouping.Add(MakeResult(
        Severity::Warning, 48, "Channel/intensity file conflict",
        {"[SHOW]: " + kShows + "Evening.lss", "[SECTION]: Background",
         "[SEQUENCE]: " + kSeqs + "Glow.las", "[TRACK]: Track 1: A", "[CHANNEL]: Arch",
         "[SECTION]: Background", "[SEQUENCE]: " + kSeqs + "Glow.las",
         "[INTENSITY FILE]: Gridcraft Intensity File", "[RANGE]: DMX Universe 1 1-10"}));  // 5
    grouping.Add(MakeResult(Severity::Error, 16,
                            "Application file has unexpected version "
                            "number",
                            {"[FILE]: /inst/app/SuiteTray.exe"}));  // 6
    for (const auto& [number, summary] : std::vector<std::pair<int32_t, std::string>>{
             {32, "Channel in tracks of conflicting length"},
             {45, "Channel settings conflict in sequence/intensity file"},
             {46, "Channel settings conflict in intensity file"}})
        grouping.Add(MakeResult(Severity::Warning, number, summary,
                                {"[SEQUENCE]: " + kSeqs + "Snow.las"}));  // 7, 8, 9
    // A sequence that the same section names twice meets itself.
    grouping.Add(ChannelConflict("Evening.lss", "Background", "Glow.las", "Background",
                                 "Glow.las"));  // 10
    grouping.Add(ChannelConflict("Evening.lss", "Animation", "Glow.las", "Background",
                                 "Glow.las"));  // 11

    ResultView view = Grouped(grouping, GroupBy::SequencePair);
    EXPECT_THAT(
        Headings(view),
        ElementsAre("Carol.lms (Musical) and Twinkle.las (Background), show Evening.lss (3)",
                    "Inside Snow.las (4)",
                    "Carol.lms (Musical) and Twinkle.las (Background), show Weekend.lss (1)",
                    "Glow.las (Background) with itself, show Evening.lss (2)",
                    "Glow.las (Animation) and Glow.las (Background), show Evening.lss (1)",
                    "Other results (1)"));
    EXPECT_THAT(view.groups[0].members, ElementsAre(0, 2, 4));
    EXPECT_THAT(view.groups[1].members, ElementsAre(1, 7, 8, 9));
    EXPECT_THAT(view.groups[3].members, ElementsAre(5, 10));
    EXPECT_THAT(view.groups[5].members, ElementsAre(6));
    EXPECT_EQ(view.groups[1].key, "inside:" + kSeqs + "Snow.las");
    EXPECT_EQ(view.groups[0].key,
              "pair:28:/inst/data/shows/Evening.lss7:Musical"
              "30:/inst/data/sequences/Carol.lms10:Background"
              "32:/inst/data/sequences/Twinkle.las");
    EXPECT_NE(view.groups[0].key, view.groups[2].key);

    // The keys stay when the filter or the order changes what is shown.
    ResultQuery query;
    query.groupBy = GroupBy::SequencePair;
    query.order = ResultOrder::ErrorsFirst;
    query.filter.text = "star";
    view = grouping.View(query);
    ASSERT_EQ(view.groups.size(), 1u);
    EXPECT_EQ(view.groups[0].key, grouping.GroupOf(0, GroupBy::SequencePair).key);
    EXPECT_THAT(view.groups[0].members, ElementsAre(2));
    EXPECT_EQ(view.hidden, 11u);
}

TEST(ResultGroupingTest, PairKeysStayApartWhateverBytesTheNamesHold) {
    // Written one after the other, the texts of both pairs would read "Sab1:cde".
    ResultGrouping grouping;
    grouping.Add(MakeResult(
        Severity::Warning, 43, "Channel conflict",
        {"[SHOW]: S", "[SECTION]: a", "[SEQUENCE]: b1:c", "[SECTION]: d", "[SEQUENCE]: e"}));
    grouping.Add(MakeResult(
        Severity::Warning, 43, "Channel conflict",
        {"[SHOW]: S", "[SECTION]: a", "[SEQUENCE]: b", "[SECTION]: 1:cd", "[SEQUENCE]: e"}));
    // A conflict whose sides cannot be read is one of the other results.
    grouping.Add(MakeResult(Severity::Warning, 43, "Channel conflict",
                            {"[SHOW]: S", "[SECTION]: a", "[SEQUENCE]: b"}));
    const ResultView view = Grouped(grouping, GroupBy::SequencePair);
    ASSERT_EQ(view.groups.size(), 3u);
    EXPECT_NE(view.groups[0].key, view.groups[1].key);
    EXPECT_EQ(view.groups[2].title, "Other results");
}

TEST(ResultGroupingTest, GroupsAddUpToTheShownResultsForEveryGrouping) {
    ResultGrouping grouping;
    const char* sections[] = {"Background", "Animation", "Musical"};
    for (int i = 0; i < 300; ++i) {
        const std::string a = "S" + std::to_string(i % 7) + ".las";
        const std::string b = "S" + std::to_string(i % 5) + ".las";
        grouping.Add(ChannelConflict("Show" + std::to_string(i % 3) + ".lss", sections[i % 3], a,
                                     sections[(i + 1) % 3], b),
                     i % 50 == 0);
        if (i % 11 == 0)
            grouping.Add(
                MakeResult(Severity::Error, 24, "Sequence file cannot be loaded", {kSeqs + a}));
    }
    for (const GroupBy by :
         {GroupBy::Message, GroupBy::Show, GroupBy::Sequence, GroupBy::SequencePair}) {
        for (const ResultOrder order : {ResultOrder::RunOrder, ResultOrder::ErrorsFirst}) {
            ResultQuery query;
            query.groupBy = by;
            query.order = order;
            query.filter.text = "s3";
            const ResultView view = grouping.View(query);
            query.groupBy = GroupBy::None;
            const ResultView flat = grouping.View(query);
            std::size_t total = 0;
            SeverityCounts counts;
            std::vector<std::size_t> members;
            for (const ResultGroup& group : view.groups) {
                total += group.members.size();
                counts.errors += group.counts.errors;
                counts.warnings += group.counts.warnings;
                EXPECT_EQ(static_cast<int64_t>(group.members.size()), group.counts.Total());
                members.insert(members.end(), group.members.begin(), group.members.end());
            }
            EXPECT_EQ(total, flat.shown.size());
            EXPECT_EQ(members, view.shown);
            EXPECT_EQ(view.hidden, flat.hidden);
            EXPECT_EQ(counts.errors, 4);  // S3.las cannot be loaded: i = 66, 143, 220, 297
            std::sort(members.begin(), members.end());
            std::vector<std::size_t> sortedFlat = flat.shown;
            std::sort(sortedFlat.begin(), sortedFlat.end());
            EXPECT_EQ(members, sortedFlat);
        }
    }
}

TEST_F(DemoResults, StatisticsCountEachMessageMostFrequentFirst) {
    grouping_.Add(ChannelConflict("Evening.lss", "Musical", "Carol.lms", "Background",
                                  "Twinkle.las", "Star"));
    grouping_.Add(MakeResult(Severity::Error, 23, "Sequence file does not exist",
                             {"[SEQUENCE]: " + kSeqs + "Sub.las"}));
    grouping_.Add(ChannelConflict("Evening.lss", "Musical", "Carol.lms", "Background",
                                  "Twinkle.las", "Moon"));
    EXPECT_THAT(
        grouping_.Statistics(grouping_.View(ResultQuery{}).shown),
        ElementsAre(
            MessageStatistic{43, 3, Severity::Warning, "Channel conflict"},
            MessageStatistic{23, 2, Severity::Error, "Sequence file does not exist"},
            MessageStatistic{16, 1, Severity::Error,
                             "Application file has unexpected version number"},
            MessageStatistic{26, 1, Severity::Error, "Media file does not exist"},
            MessageStatistic{28, 1, Severity::Warning, "Channel is completely off"},
            MessageStatistic{31, 1, Severity::Warning, "Channel uses undefined comm network"},
            MessageStatistic{33, 1, Severity::Warning,
                             "Musical file used in non-audio section of show"}));
    EXPECT_THAT(grouping_.Statistics({}), IsEmpty());
}

TEST(ResultGroupingTest, CountsAreWrittenWithThousandsSeparated) {
    EXPECT_EQ(FormatCount(0), "0");
    EXPECT_EQ(FormatCount(999), "999");
    EXPECT_EQ(FormatCount(2491), "2,491");
    EXPECT_EQ(FormatCount(50000), "50,000");
    EXPECT_EQ(FormatCount(1234567), "1,234,567");
    EXPECT_EQ(FormatCount(-1000), "-1,000");
}

}  // namespace
}  // namespace vtr
