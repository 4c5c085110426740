// A whole verification of a scheduled show: every sequence, subsequence, media file,
// trigger and conflict is reached, bad input gives its results and the run goes on.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "checks/SequenceFixture.h"
#include "engine/LibVerify.h"
#include "environment/VTRCommon.h"
#include "schedule/Schedule.h"
#include "schedule/WeekTime.h"
#include "schedule/YearSchedule.h"
#include "vtrsupport/SequenceGenerator.h"
#include "show/Show.h"
#include "show/TriggeredSequences.h"

namespace vtr {
namespace {

using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::Not;
using ::testing::UnorderedElementsAreArray;
using testsupport::DeviceXml;
using testsupport::IntensityFileXml;
using testsupport::RegText;
using testsupport::SequenceText;
using testsupport::WriteFileBytes;

class SequenceRunTest : public testsupport::SequenceCheckTest {
  protected:
    SequenceRunTest() {
        InstallApplicationFiles();
        store["Shared\\Network\\DMX1"] = {{"Adapter", RegText("USB0")}};
        WriteSuiteStore();
    }

    // Schedules the show on Monday morning and runs a verification of the entire schedule.
    void VerifySchedule(const std::string& showFile) {
        Schedule weekly;
        weekly.AddShowEventByFile(showFile, WeekTimeFunctions::NewWeekTime(1, 3, 0, 0),
                                  WeekTimeFunctions::NewWeekTime(1, 5, 0, 0));
        weekly.Save(VTRCommon::GetWeeklyScheduleFile());
        YearSchedule().Save(VTRCommon::GetYearlyScheduleFile());
        LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                    VTRCommon::GetYearlyScheduleFile());
        LibVerify::RunVerification();
    }

    // The results of the sequence, conflict and network checks (messages 23 and up).
    static std::vector<std::string> SequenceResults() {
        std::vector<std::string> texts;
        for (const std::string& text : testsupport::ResultTexts()) {
            if (std::stoi(text) >= 23)
                texts.push_back(text);
        }
        return texts;
    }

    int Count(const std::string& line) const {
        return static_cast<int>(std::count(client.log.begin(), client.log.end(), line));
    }
};

TEST_F(SequenceRunTest, EverythingAShowReachesIsVerifiedAndBadInputDoesNotStopTheRun) {
    const std::string a = DataFile("A.las");
    const std::string b = DataFile("B.las");
    const std::string glow = WriteSequence(
        "Glow.las", SequenceText()
                        .Channel(1, "Star", R"(deviceType="1" unit="1" circuit="1")")
                        .Channel(2, "Snow", R"(deviceType="7" network="1" circuit="20")")
                        .Track("Sky", {1, 2}));
    const std::string song =
        WriteSequence("Song.lms", SequenceText()
                                      .Attributes(R"(media="Song.mp3")")
                                      .Channel(1, "Beat", R"(deviceType="1" unit="1" circuit="1")")
                                      .Track("Drums", {1}));
    // A plays B, which plays A back and itself.
    WriteSequence("A.las",
                  SequenceText()
                      .Channel(1, "Sub B", R"(type="6" subsequence=")" + b + "\"")
                      .Channel(2, "Far", R"(deviceType="1" network="16" unit="1" circuit="2")")
                      .Track("Main", {1, 2}));
    WriteSequence("B.las", SequenceText()
                               .Channel(1, "Back to A", R"(type="6" subsequence=")" + a + "\"")
                               .Channel(2, "Itself", R"(type="6" subsequence=")" + b + "\"")
                               .Track("Loop", {1, 2}));
    // An intensity file whose second device runs past 32767.
    const std::string door = WriteSequence(
        "Door.las", SequenceText()
                        .Channel(1, "Bell", R"(deviceType="7" network="1" circuit="5")")
                        .Track("Porch", {1},
                               IntensityFileXml("Gridcraft", DeviceXml(7, 1, 0, 1, 10) +
                                                                 DeviceXml(7, 1, 0, 32000, 1000))));
    const std::string broken = WriteSequenceText("Broken.las", "<sequence><channels>");
    const std::string missing = DataFile("Missing.lms");

    Show show;
    show.Background()->List() = {glow};
    show.Main()->List() = {a};
    show.Musical()->List() = {song, missing, broken};
    show.SetStartupType(1);
    show.SetStartupTrigger(TriggerFunctions::CreateTrigger(0, 1, 1, "Start"));
    auto group = std::make_shared<InteractiveGroup>();
    group->SetName("Porch");
    group->AddTriggeredSequences(TriggeredSequencesFunctions::CreateTriggeredSequences(
        TriggerFunctions::CreateTrigger(5, 2, 1, "Bell push"), {door}));
    show.InteractiveGroups().push_back(group);
    const std::string showFile = DataFile("Eve.lss");
    WriteFileBytes(showFile, ShowFunctions::ShowToText(show));

    VerifySchedule(showFile);

    EXPECT_EQ(client.log.back(), "ChecksCompleted false");
    const std::string inShow = " | [SHOW]: show " + showFile;
    EXPECT_THAT(
        SequenceResults(),
        UnorderedElementsAreArray({
            "23: [SEQUENCE]: " + missing + inShow,
            "24: " + broken,
            "26: [FILE]: " + MediaFile("Song.mp3") + " | [SEQUENCE]: " + song,
            "30: [SEQUENCE]: " + a + " | [TRACK]: Track 1: Main | [CHANNEL]: Sub B",
            "31: [SEQUENCE]: " + a + " | [TRACK]: Track 1: Main | [CHANNEL]: Far",
            "30: [SEQUENCE]: " + b + " | [TRACK]: Track 1: Loop | [CHANNEL]: Back to A",
            "30: [SEQUENCE]: " + b + " | [TRACK]: Track 1: Loop | [CHANNEL]: Itself",
            "45: [SEQUENCE]: " + door +
                " | [TRACK]: Track 1: Porch | [CHANNEL]: Bell | "
                "[INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: DMX Universe 1 1-10",
            "53: [SHOW] " + showFile + " | [NETWORK] Aux E | [TRIGGER] Interactive group (Porch)",
            "43: [SHOW]: " + showFile + " | [SECTION]: Musical | [SEQUENCE]: " + song +
                " | [TRACK]: Track 1: Drums | [CHANNEL]: Beat | [SECTION]: Background | "
                "[SEQUENCE]: " +
                glow + " | [TRACK]: Track 1: Sky | [CHANNEL]: Star",
        }));

    // The subsequence chain is followed both ways and ends where it comes back.
    EXPECT_EQ(Count("Checking Sequence file loads: " + a), 1);
    EXPECT_EQ(Count("Checking Sequence file loads: " + b), 1);
    EXPECT_EQ(
        Count("Checking Sequence file existence: " + b + " (referenced in sequence " + a + ")"), 1);
    EXPECT_EQ(
        Count("Checking Sequence file existence: " + a + " (referenced in sequence " + b + ")"), 1);
    EXPECT_EQ(
        Count("Checking Sequence file existence: " + b + " (referenced in sequence " + b + ")"), 1);
    EXPECT_EQ(Count("Checking Trigger on VTR Enhanced network: Startup trigger"), 1);
    EXPECT_EQ(Count("Checking Intersequence channel conflicts: " + showFile), 1);
    EXPECT_EQ(Count("Checking Media file existence: " + MediaFile("Song.mp3") +
                    " (referenced in sequence " + song + ")"),
              1);
    // Every sequence file is read once, the one that fails to load included.
    EXPECT_EQ(LibVerify::GetFileLoadCounts().sequenceLoads, 6);
}

TEST_F(SequenceRunTest, ASequenceSharedByTwoShowsIsCheckedForEachReferenceAndLoadedOnce) {
    const std::string glow =
        WriteSequence("Glow.las", SequenceText()
                                      .Channel(1, "Star", R"(deviceType="1" unit="1" circuit="1")")
                                      .Track("Sky", {1}));
    Show first;
    first.Background()->List() = {glow};
    const std::string firstFile = DataFile("First.lss");
    WriteFileBytes(firstFile, ShowFunctions::ShowToText(first));
    Show second;
    second.Shutdown()->List() = {glow};
    const std::string secondFile = DataFile("Second.lss");
    WriteFileBytes(secondFile, ShowFunctions::ShowToText(second));

    Schedule weekly;
    weekly.AddShowEventByFile(firstFile, WeekTimeFunctions::NewWeekTime(1, 3, 0, 0),
                              WeekTimeFunctions::NewWeekTime(1, 5, 0, 0));
    weekly.AddShowEventByFile(secondFile, WeekTimeFunctions::NewWeekTime(2, 3, 0, 0),
                              WeekTimeFunctions::NewWeekTime(2, 5, 0, 0));
    weekly.Save(VTRCommon::GetWeeklyScheduleFile());
    YearSchedule().Save(VTRCommon::GetYearlyScheduleFile());
    LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                VTRCommon::GetYearlyScheduleFile());
    LibVerify::RunVerification();

    EXPECT_EQ(Count("Checking Sequence file existence: " + glow + " (referenced in show " +
                    firstFile + ")"),
              1);
    EXPECT_EQ(Count("Checking Sequence file existence: " + glow + " (referenced in show " +
                    secondFile + ")"),
              1);
    EXPECT_EQ(Count("Checking Sequence file loads: " + glow), 1);
    EXPECT_EQ(Count("Checking Channels have events: " + glow), 1);
    EXPECT_EQ(LibVerify::GetFileLoadCounts().sequenceLoads, 1);
    EXPECT_THAT(SequenceResults(), ElementsAre());
    // The shows are apart in time, so the sequence conflicts with nothing.
    EXPECT_THAT(client.Lines("Checking Intersequence channel conflicts: "),
                ElementsAre(firstFile, secondFile));
}

TEST_F(SequenceRunTest, ACancelWhileASequenceLoadsStopsTheLoadAndBlamesNothingOnTheFile) {
    seqlib::SequenceGenerator::Options options;
    options.channels = 400;
    options.eventsPerChannel = 200;
    const std::string big = DataFile("Big.las");
    seqlib::SequenceGenerator::WriteFile(big, options);
    Show show;
    show.Musical()->List() = {big};
    const std::string showFile = DataFile("Show.lss");
    WriteFileBytes(showFile, ShowFunctions::ShowToText(show));

    // The user cancels at the first turn the user interface gets once the load has begun.
    bool loading = false;
    client.onLine = [&](const std::string& line) {
        loading = loading || line == "Transient Loading 0% of " + big;
    };
    LibVerify::SetEventPump([&] {
        if (loading && !LibVerify::IsCancelled())
            LibVerify::CancelVerification();
    });
    VerifySchedule(showFile);
    LibVerify::SetEventPump(nullptr);

    EXPECT_THAT(client.Lines("Transient Loading "), ElementsAre("0% of " + big));
    EXPECT_THAT(client.Lines("Transient Cannot load"), ElementsAre());
    EXPECT_THAT(client.Lines("Result "), Contains("2"));
    EXPECT_THAT(client.Lines("Result "), Not(Contains("24"))) << "the file is not at fault";
    EXPECT_THAT(client.Lines("ChecksCompleted "), ElementsAre("true"));
    EXPECT_EQ(LibVerify::GetFileLoadCounts().sequenceLoads, 1);
}

}  // namespace
}  // namespace vtr
