#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <csignal>
#include <filesystem>
#include <regex>
#include <set>

#include "checks/installation/CheckAppFileExists.h"
#include "cli/DemoFixture.h"
#include "engine/LibVerify.h"
#include "environment/VTRCommon.h"
#include "support/VerifierFixture.h"

namespace vtr::cli {
namespace {

using ::testing::AllOf;
using testing::DemoTest;
using ::testing::ElementsAre;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::Not;
using testing::Outcome;
using testing::RunMain;
using ::testing::StartsWith;

namespace fs = std::filesystem;

// "E16", "W33", "W6 ignored": what a JSON run found, in order.
std::vector<std::string> Findings(const nlohmann::json& document) {
    std::vector<std::string> findings;
    for (const nlohmann::json& result : document["results"]) {
        const int severity = result["severity"];
        std::string text = std::string(severity == 2   ? "E"
                                       : severity == 1 ? "W"
                                                       : "I") +
                           std::to_string(result["messageNumber"].get<int>());
        if (result["ignored"].get<bool>())
            text += " ignored";
        findings.push_back(text);
    }
    return findings;
}

class VerifyDemoTest : public DemoTest {};

TEST_F(VerifyDemoTest, TheScheduleListsErrorsFirstThenIgnoredOnesAndExitsTwo) {
    const Outcome outcome = Run({"--schedule"});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.err, "");
    const std::string sequences = Demo("data/sequences/");
    const std::string shows = Demo("data/shows/");
    EXPECT_EQ(outcome.out,
              "Error 16: Application file has unexpected version number\n"
              "    [FILE]: " +
                  AppFile("SuiteTray.exe") +
                  "\n"
                  "    [EXPECTED]: 1.0.0.0\n"
                  "    [FOUND]: 0.9.4.2\n"
                  "Error 23: Sequence file does not exist\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Fireworks.las\n"
                  "    [SHOW]: show " +
                  shows +
                  "Weekend.lss\n"
                  "Error 26: Media file does not exist\n"
                  "    [FILE]: " +
                  MediaFile("Jingle.mp3") +
                  "\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Jingle.lms\n"
                  "Warning 33: Musical file used in non-audio section of show\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Carol.lms\n"
                  "    [SHOW]: " +
                  shows +
                  "Weekend.lss\n"
                  "    [SECTION]: background\n"
                  "Warning 43: Channel conflict\n"
                  "    [SHOW]: " +
                  shows +
                  "Evening.lss\n"
                  "    [SECTION]: Musical\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Carol.lms\n"
                  "    [TRACK]: Track 1: Tree\n"
                  "    [CHANNEL]: Tree\n"
                  "    [SECTION]: Background\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Twinkle.las\n"
                  "    [TRACK]: Track 2: Tree\n"
                  "    [CHANNEL]: Tree\n"
                  "Warning 28: Channel is completely off\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Snowfall.las\n"
                  "    [TRACK]: Track 1: Garage\n"
                  "    [CHANNEL]: Star\n"
                  "Warning 31: Channel uses undefined comm network\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Goodnight.las\n"
                  "    [TRACK]: Track 1: Drive\n"
                  "    [CHANNEL]: Driveway\n"
                  "\n"
                  "Ignored results:\n"
                  "Warning 6: Verifier not running from VTR application path\n"
                  "    [APPLICATION]: " +
                  AppFile("") +
                  "\n"
                  "    [VERIFIER]: " +
                  VTRCommon::GetProgramFolder() +
                  "\n"
                  "Warning 30: Channel is missing settings\n"
                  "    [SEQUENCE]: " +
                  sequences +
                  "Intro.las\n"
                  "    [TRACK]: Track 1: Porch\n"
                  "    [CHANNEL]: Sparkle\n"
                  "\n"
                  "141 checks performed, 3 errors, 4 warnings, 2 ignored results.\n");
}

TEST_F(VerifyDemoTest, TheCalendarShowIsVerifiedUntilItsDatesHavePassed) {
    EXPECT_THAT(
        Run({"--schedule", "--log"}).err,
        HasSubstr("Checking: Show file existence: " + Demo("data/shows/Holiday.lss") + "\n"));
    // 201 days on, both of the Holiday show's dates lie in the past.
    ScopedNowSource later([] { return Now().AddDays(201); });
    const Outcome outcome = Run({"--schedule", "--log"});
    EXPECT_THAT(outcome.err, Not(HasSubstr("Holiday.lss")));
    EXPECT_EQ(outcome.status, 2);
}

TEST_F(VerifyDemoTest, EachTargetFindsItsOwnShareOfTheDemo) {
    struct Case {
        std::vector<std::string> target;
        std::vector<std::string> findings;
        int status;
    };
    const std::vector<Case> cases = {
        {{"--show", Demo("data/shows/Evening.lss")},
         {"W6 ignored", "E16", "W43", "W30 ignored", "W28", "E26", "W31"},
         2},
        {{"--show", Demo("data/shows/Weekend.lss")},
         {"W6 ignored", "E16", "W33", "E23", "W30 ignored", "W28", "W31"},
         2},
        {{"--sequence", Demo("data/sequences/Snowfall.las")}, {"W6 ignored", "E16", "W28"}, 2},
        {{"--sequence", Demo("data/sequences/Bells.vtredit")}, {"W6 ignored", "E16"}, 2},
    };
    for (const Case& c : cases) {
        std::vector<std::string> arguments = c.target;
        arguments.insert(arguments.end(), {"--format", "json"});
        const Outcome outcome = Run(arguments);
        EXPECT_EQ(outcome.status, c.status) << c.target[1];
        EXPECT_EQ(Findings(nlohmann::json::parse(outcome.out)), c.findings) << c.target[1];
    }

    // Without the wrong application file only the sequence's own warning is left.
    testsupport::WritePeImage(AppFile("SuiteTray.exe"), DefaultExpectedVersion());
    Outcome outcome = Run({"--sequence", Demo("data/sequences/Snowfall.las")});
    EXPECT_EQ(outcome.status, 1);
    outcome = Run({"--sequence", Demo("data/sequences/Sparkle.las")});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.out, StartsWith("Info 1: No errors or warnings found\n"));
}

TEST_F(VerifyDemoTest, ARelativeTargetIsNamedByItsAbsolutePath) {
    std::error_code error;
    const fs::path previous = fs::current_path();
    fs::current_path(Demo("data"));
    const Outcome outcome =
        Run({"--sequence", "./sequences/../sequences/Intro.las", "--format", "json"});
    fs::current_path(previous, error);
    const nlohmann::json document = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(document["target"]["file"], Demo("data/sequences/Intro.las"));
    // So the demo's ignored result matches, as it does for the schedule.
    EXPECT_THAT(Findings(document), ::testing::Contains("W30 ignored"));
}

TEST_F(VerifyDemoTest, JsonAgreesWithTheTextAndTheDriversCounts) {
    const Outcome text = Run({"--schedule"});
    const Outcome json = Run({"--schedule", "--format", "json"});
    EXPECT_EQ(json.status, text.status);
    EXPECT_EQ(json.err, "");
    const nlohmann::json document = nlohmann::json::parse(json.out);

    EXPECT_EQ(document["target"], (nlohmann::json{{"kind", "schedule"}}));
    EXPECT_EQ(document["cancelled"], false);
    EXPECT_EQ(document["checksPerformed"], LibVerify::ChecksPerformedCount());
    EXPECT_EQ(document["errors"], LibVerify::ErrorCount());
    EXPECT_EQ(document["warnings"], LibVerify::WarningCount());
    int errors = 0;
    int warnings = 0;
    int ignored = 0;
    for (const nlohmann::json& result : document["results"]) {
        if (result["ignored"].get<bool>()) {
            ++ignored;
            continue;
        }
        errors += result["severity"] == 2 ? 1 : 0;
        warnings += result["severity"] == 1 ? 1 : 0;
        // Every not-ignored result is in the text, as its heading line.
        EXPECT_THAT(text.out, HasSubstr(result["severityText"].get<std::string>() + " " +
                                        std::to_string(result["messageNumber"].get<int>()) + ": " +
                                        result["summary"].get<std::string>() + "\n"));
    }
    EXPECT_EQ(document["errors"], errors);
    EXPECT_EQ(document["warnings"], warnings);
    EXPECT_EQ(ignored, static_cast<int>(LibVerify::GetIgnoredResults().size()));
    EXPECT_THAT(Findings(document), ::testing::Contains("W6 ignored"));
    EXPECT_THAT(Findings(document), ::testing::Contains("E16"));
}

TEST_F(VerifyDemoTest, TheExitStatusFollowsWhatIsLeftAfterIgnoring) {
    const nlohmann::json first = nlohmann::json::parse(Run({"--schedule", "--format", "json"}).out);
    std::set<int> errorNumbers;
    std::set<int> warningNumbers;
    for (const nlohmann::json& result : first["results"]) {
        if (result["severity"] == 2)
            errorNumbers.insert(result["messageNumber"].get<int>());
        else if (result["severity"] == 1)
            warningNumbers.insert(result["messageNumber"].get<int>());
    }
    ASSERT_FALSE(errorNumbers.empty());
    ASSERT_FALSE(warningNumbers.empty());

    for (int number : errorNumbers)
        ASSERT_EQ(Run({"ignore", "--message", std::to_string(number)}).status, 0);
    Outcome outcome = Run({"--schedule"});
    EXPECT_EQ(outcome.status, 1);
    const std::string listed = outcome.out.substr(0, outcome.out.find("\nIgnored results:\n"));
    EXPECT_THAT(listed, StartsWith("Warning "));
    EXPECT_THAT(listed, Not(HasSubstr("\nError ")));
    EXPECT_THAT(outcome.out, HasSubstr("\nIgnored results:\n"));

    for (int number : warningNumbers)
        ASSERT_EQ(Run({"ignore", "--message", std::to_string(number)}).status, 0);
    outcome = Run({"--schedule"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_THAT(outcome.out,
                StartsWith("Info 1: No errors or warnings found\n\nIgnored results:\n"));
    EXPECT_THAT(outcome.out, HasSubstr(", 0 errors, 0 warnings, "));

    ASSERT_EQ(Run({"unignore", "--message", std::to_string(*errorNumbers.begin())}).status, 0);
    EXPECT_EQ(Run({"--schedule"}).status, 2);
}

TEST_F(VerifyDemoTest, AShowOrASequenceIsVerifiedThroughTemporaryFilesThatAreRemoved) {
    Outcome outcome = Run({"--show", Demo("data/shows/Evening.lss"), "--format", "json"});
    EXPECT_EQ(outcome.err, "");
    nlohmann::json document = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(document["target"],
              (nlohmann::json{{"kind", "show"}, {"file", Demo("data/shows/Evening.lss")}}));
    EXPECT_THAT(TempFiles(), IsEmpty());

    outcome = Run({"--sequence", Demo("data/sequences/Snowfall.las"), "--format", "json"});
    EXPECT_EQ(outcome.err, "");
    document = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(document["target"], (nlohmann::json{{"kind", "sequence"},
                                                  {"file", Demo("data/sequences/Snowfall.las")}}));
    EXPECT_THAT(TempFiles(), IsEmpty());
}

TEST_F(VerifyDemoTest, AMissingOrGarbledShowEndsInResults) {
    Outcome outcome = Run({"--show", Demo("data/shows/Nowhere.lss")});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_THAT(outcome.out, HasSubstr("Error 21: Show file does not exist\n    " +
                                       Demo("data/shows/Nowhere.lss") + "\n"));

    testsupport::WriteFileBytes(Demo("data/shows/Garbled.lss"), "((1,0,1,0,,(a.las)\x01\xff");
    outcome = Run({"--show", Demo("data/shows/Garbled.lss")});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_THAT(outcome.out, HasSubstr("Error 22: Error reading show file\n    " +
                                       Demo("data/shows/Garbled.lss") + "\n"));

    // A folder named as the show is not a show file.
    outcome = Run({"--show", Demo("data/shows")});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_THAT(outcome.out, HasSubstr("Error 21: Show file does not exist\n"));
    EXPECT_THAT(TempFiles(), IsEmpty());
}

TEST_F(VerifyDemoTest, ATargetThatCannotBeSetUpExitsThreeWithTheReason) {
    // No temporary folder to write the wrapping schedule into.
    {
        testsupport::ScopedEnvironment noTemp("TMPDIR", folder_.File("no such folder"));
#ifdef _WIN32
        testsupport::ScopedEnvironment noTmp("TMP", folder_.File("no such folder"));
#endif
        const Outcome outcome = Run({"--show", Demo("data/shows/Evening.lss")});
        EXPECT_EQ(outcome.status, 3);
        EXPECT_EQ(outcome.out, "");
        EXPECT_THAT(outcome.err, StartsWith("vantori-verify: Cannot get temp file, error "));
    }

    Outcome outcome = RunMain({"--schedule", "--registry", folder_.File("missing.reg")});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.out, "");
    EXPECT_EQ(outcome.err, "vantori-verify: the settings store file " +
                               folder_.File("missing.reg") + " does not exist\n");
    EXPECT_FALSE(fs::exists(folder_.File("missing.reg")));

    outcome = Run({"--schedule", "--output", folder_.File("no folder/report.txt")});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.err, "vantori-verify: cannot write the results report " +
                               folder_.File("no folder/report.txt") +
                               ": its folder does not exist\n");

    outcome = Run({"--schedule", "--output", Demo("data")});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_THAT(outcome.err, HasSubstr("it is a folder"));

    // The report never overwrites the target, the schedules or the store, which is known
    // before the run: nothing runs.
    const auto before = Snapshot();
    for (const std::vector<std::string>& arguments :
         {std::vector<std::string>{"--show", Demo("data/shows/Evening.lss"), "--output",
                                   Demo("data/shows/Evening.lss")},
          std::vector<std::string>{"--sequence", Demo("data/sequences/Intro.las"), "--output",
                                   Demo("data/shows/../sequences/Intro.las")},
          std::vector<std::string>{"--schedule", "--output", Demo("userdata/weeksched.lsc")},
          std::vector<std::string>{"--schedule", "--output", Demo("registry.reg")}}) {
        outcome = Run(arguments);
        EXPECT_EQ(outcome.status, 3);
        EXPECT_EQ(outcome.out, "");
        EXPECT_EQ(outcome.err, "vantori-verify: Cannot save the results file as " +
                                   arguments.back() +
                                   ": this verification read that file; the verifier never "
                                   "changes the files it verifies. Choose another file.\n");
        EXPECT_THAT(TempFiles(), IsEmpty());
    }
    EXPECT_EQ(Snapshot(), before);
}

TEST_F(VerifyDemoTest, TheReportNeverReplacesAFileTheRunReadOrCheckedWhateverNamesIt) {
    std::vector<std::pair<std::string, std::string>> cases = {
        // What --output names, and the file of the suite that is.
        {Demo("data/shows/Weekend.lss"), Demo("data/shows/Weekend.lss")},
        {Demo("data/sequences/Snowfall.las"), Demo("data/sequences/Snowfall.las")},
        {Demo("data/sequences/Sparkle.las"), Demo("data/sequences/Sparkle.las")},  // subsequence
        {Demo("data/sequences/Bells.vtredit"), Demo("data/sequences/Bells.vtredit")},
        {Demo("userdata/shellcmd.map"), Demo("userdata/shellcmd.map")},
        {MediaFile("Carol.mp3"), MediaFile("Carol.mp3")},
        {AppFile("SuiteTray.exe"), AppFile("SuiteTray.exe")},
        // A media file that does not exist: the report would stand in for it.
        {MediaFile("Jingle.mp3"), MediaFile("Jingle.mp3")},
    };
#ifndef _WIN32
    fs::create_symlink(Demo("data/sequences/Goodnight.las"), folder_.File("link.txt"));
    cases.push_back({folder_.File("link.txt"), Demo("data/sequences/Goodnight.las")});
    fs::create_hard_link(Demo("data/sequences/Intro.las"), folder_.File("hard.txt"));
    cases.push_back({folder_.File("hard.txt"), Demo("data/sequences/Intro.las")});
    fs::create_symlink(MediaFile("Jingle.mp3"), folder_.File("dangling.txt"));
    cases.push_back({folder_.File("dangling.txt"), MediaFile("Jingle.mp3")});
    // The JSON report is refused alike.
    fs::create_symlink(Demo("data/sequences/Carol.lms"), folder_.File("link.json"));
    cases.push_back({folder_.File("link.json"), Demo("data/sequences/Carol.lms")});
#endif
    const auto before = Snapshot();
    for (const auto& [output, file] : cases) {
        const Outcome outcome = Run({"--schedule", "--output", output});
        EXPECT_EQ(outcome.status, 3) << output;
        // The run itself went through; only the report was refused.
        EXPECT_THAT(outcome.out, StartsWith("Error 16: ")) << output;
        const std::string why = output == file ? "this verification "
                                               : "that is " + file + ", which this verification ";
        EXPECT_THAT(outcome.err, StartsWith("vantori-verify: Cannot save the results file as " +
                                            output + ": " + why))
            << output;
        EXPECT_THAT(outcome.err, EndsWith("; the verifier never changes the files it verifies. "
                                          "Choose another file.\n"));
    }
    // So is a baseline.
    const Outcome baseline = Run({"--schedule", "--write-baseline", Demo("userdata/shellcmd.map")});
    EXPECT_EQ(baseline.status, 3);
    EXPECT_EQ(baseline.err, "vantori-verify: Cannot save the baseline as " +
                                Demo("userdata/shellcmd.map") +
                                ": this verification checked that file; the verifier never "
                                "changes the files it verifies. Choose another file.\n");
    EXPECT_EQ(Snapshot(), before);
#ifndef _WIN32
    EXPECT_TRUE(fs::is_symlink(folder_.File("dangling.txt")));
    EXPECT_FALSE(fs::exists(MediaFile("Jingle.mp3")));
#endif
}

TEST_F(VerifyDemoTest, TheReportIsSavedAndTheLogWrittenAsTheWindowWritesIt) {
    const std::string report = folder_.File("report.txt");
    const Outcome outcome = Run({"--schedule", "--output", report, "--log"});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_THAT(testsupport::ReadFileBytes(report),
                StartsWith("Message Number: 16\r\n"
                           "Severity: Error\r\n"
                           "Description: Application file has unexpected version number\r\n"
                           "Detail #1: [FILE]: " +
                           AppFile("SuiteTray.exe") +
                           "\r\n"
                           "Detail #2: [EXPECTED]: 1.0.0.0\r\n"
                           "Detail #3: [FOUND]: 0.9.4.2\r\n"));
    // Ignored results are not in the report.
    EXPECT_THAT(testsupport::ReadFileBytes(report), Not(HasSubstr("Message Number: 6\r\n")));

    std::vector<std::string> lines;
    std::istringstream log(outcome.err);
    for (std::string line; std::getline(log, line);)
        lines.push_back(line);
    ASSERT_GE(lines.size(), 4u);
    EXPECT_EQ(lines[0], "7:30:00 PM: Adding check: Vantori installation");
    EXPECT_EQ(lines[3], "7:30:00 PM: Checking: Vantori installation");
    EXPECT_EQ(lines.back(), "7:30:00 PM: Verification completed");
    for (const std::string& line : lines)
        EXPECT_THAT(line, StartsWith("7:30:00 PM: "));
    EXPECT_THAT(lines, ::testing::Contains("7:30:00 PM: Application file has unexpected version "
                                           "number: [FILE]: " +
                                           AppFile("SuiteTray.exe") +
                                           " / [EXPECTED]: 1.0.0.0 / [FOUND]: 0.9.4.2"));
    // Ignored results are logged too.
    EXPECT_THAT(lines, ::testing::Contains(
                           StartsWith("7:30:00 PM: Verifier not running from VTR application "
                                      "path: [APPLICATION]: ")));
}

TEST_F(VerifyDemoTest, NoRunChangesAFileOfTheSuiteOrLeavesATemporaryFile) {
    const auto before = Snapshot();
    for (const std::vector<std::string>& arguments :
         {std::vector<std::string>{"--schedule", "--log"},
          std::vector<std::string>{"--show", Demo("data/shows/Weekend.lss"), "--format", "json"},
          std::vector<std::string>{"--sequence", Demo("data/sequences/Intro.las")},
          std::vector<std::string>{"--sequence", Demo("data/sequences/Bells.vtredit")},
          std::vector<std::string>{"--sequence", Demo("data/sequences/Twinkle.las")},
          std::vector<std::string>{"ignored"}}) {
        const Outcome outcome = Run(arguments);
        EXPECT_NE(outcome.status, 3) << outcome.err;
        EXPECT_NE(outcome.status, 64) << outcome.err;
        EXPECT_EQ(Snapshot(), before) << arguments[0];
        EXPECT_THAT(TempFiles(), IsEmpty()) << arguments[0];
    }
}

TEST_F(VerifyDemoTest, CtrlCDuringARunCancelsItCleanly) {
    const nlohmann::json full = nlohmann::json::parse(
        Run({"--show", Demo("data/shows/Evening.lss"), "--format", "json"}).out);

    // A signal arrives while the tenth check runs; the pump sees it after that check.
    testsupport::RecordingClient interrupter;
    int checking = 0;
    interrupter.onLine = [&](const std::string& line) {
        if (line.rfind("Checking ", 0) == 0 && ++checking == 10)
            std::raise(SIGINT);
    };
    const Outcome outcome = Run({"--show", Demo("data/shows/Evening.lss"), "--format", "json"});
    const nlohmann::json document = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(document["cancelled"], true);
    EXPECT_EQ(document["checksPerformed"], 10);
    EXPECT_LT(document["checksPerformed"], full["checksPerformed"]);
    EXPECT_THAT(Findings(document), ::testing::Contains("W2"));
    EXPECT_EQ(outcome.status, 130);
    EXPECT_EQ(outcome.err,
              "vantori-verify: Ctrl-C: cancelling. The check that is running finishes first; "
              "press Ctrl-C again to stop at once.\n");
    EXPECT_THAT(TempFiles(), IsEmpty());
    EXPECT_THAT(interrupter.Lines("ChecksCompleted "), ElementsAre("true"));

    // Cancelled is cancelled, even when everything found, the cancellation included, is
    // ignored and the run ends with "No errors or warnings found".
    for (const char* number : {"2", "16", "43", "28", "26", "31"})
        ASSERT_EQ(Run({"ignore", "--message", number}).status, 0);
    checking = 0;
    const Outcome quiet = Run({"--show", Demo("data/shows/Evening.lss")});
    EXPECT_EQ(quiet.status, 130);
    EXPECT_THAT(quiet.out, StartsWith("Info 1: No errors or warnings found\n"));
    EXPECT_THAT(quiet.out, EndsWith(" Verification cancelled.\n"));

    // The handler is gone with the run: the next run is not cancelled.
    interrupter.onLine = nullptr;
    EXPECT_EQ(
        nlohmann::json::parse(
            Run({"--show", Demo("data/shows/Evening.lss"), "--format", "json"}).out)["cancelled"],
        false);
}

TEST_F(VerifyDemoTest, OnATerminalAProgressLineIsDrawnAndErasedAndQuietHidesIt) {
    auto ticks = std::make_shared<int>(0);
    auto clock = [ticks] {
        return std::chrono::steady_clock::time_point(std::chrono::seconds(++*ticks));
    };
    Outcome outcome = Run({"--schedule"}, true, 50, clock);
    EXPECT_EQ(outcome.status, 2);
    ASSERT_THAT(outcome.err, StartsWith("\r"));
    // Each drawing fits in 49 columns; the last thing written blanks the line.
    std::vector<std::string> drawings;
    std::string piece;
    for (char c : outcome.err.substr(1)) {
        if (c == '\r') {
            drawings.push_back(piece);
            piece.clear();
        } else {
            piece += c;
        }
    }
    ASSERT_GE(drawings.size(), 3u);
    for (const std::string& drawing : drawings)
        EXPECT_LE(drawing.size(), 49u) << drawing;
    EXPECT_THAT(drawings, ::testing::Contains(
                              AllOf(StartsWith("1 check performed, "), HasSubstr(" remaining: "))));
    EXPECT_EQ(drawings.back(), std::string(drawings.back().size(), ' '));
    EXPECT_THAT(outcome.err, Not(HasSubstr("\n")));
    EXPECT_THAT(outcome.out, StartsWith("Error 16: "));

    EXPECT_EQ(Run({"--schedule", "--quiet"}, true, 50, clock).err, "");
    EXPECT_EQ(Run({"--schedule"}, false, 50, clock).err, "");

    // With the log, lines are written on a clean line, never after a progress drawing.
    outcome = Run({"--schedule", "--log"}, true, 50, clock);
    EXPECT_THAT(outcome.err, HasSubstr("\r7:30:00 PM: Checking: "));
    EXPECT_FALSE(std::regex_search(outcome.err, std::regex("remaining[^\r\n]*7:30:00 PM")));
}

// The same demo in a folder whose name needs escaping in every format of the suite.
class AwkwardFolderDemoTest : public DemoTest {
  protected:
#ifdef _WIN32
    // Windows allows no "*" in a name.
    AwkwardFolderDemoTest() : DemoTest("demo (a,b) & 'c' [x]") {}
#else
    AwkwardFolderDemoTest() : DemoTest("demo (a,b) & 'c' *x*") {}
#endif
};

TEST_F(AwkwardFolderDemoTest, FindsWhatTheDemoFindsAnywhere) {
    const Outcome outcome = Run({"--schedule", "--format", "json"});
    EXPECT_EQ(outcome.status, 2);
    const std::vector<std::string> awkward = Findings(nlohmann::json::parse(outcome.out));

    testsupport::TempFolder plainFolder;
    demo::InstanceOptions options;
    options.today = Now().Date();
    options.writeAppFile = [](const std::string& path, const std::string& version) {
        testsupport::WritePeImage(path, version);
    };
    demo::Instantiate(VTR_SOURCE_DIR "/examples/demo", plainFolder.File("demo"), options);
    const Outcome plain = RunMain(
        {"--schedule", "--format", "json", "--registry", plainFolder.File("demo/registry.reg")});
    EXPECT_EQ(awkward, Findings(nlohmann::json::parse(plain.out)));
    EXPECT_THAT(awkward, ::testing::Contains("W6 ignored"));
}

#ifndef _WIN32
// The built program, as a user runs it.
TEST_F(VerifyDemoTest, TheProgramRunsAsAChildProcess) {
    const std::string program = VTR_BINARY_DIR "/src/cli/vantori-verify";
    auto run = [&](const std::string& arguments) {
        const std::string command = "\"" + program + "\" " + arguments + " > \"" +
                                    folder_.File("out.txt") + "\" 2> \"" + folder_.File("err.txt") +
                                    "\"";
        const int status = std::system(command.c_str());
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    };
    EXPECT_EQ(run("--schedule --quiet --registry \"" + DemoStore() + "\""), 2);
    EXPECT_THAT(testsupport::ReadFileBytes(folder_.File("out.txt")), StartsWith("Error 16: "));
    EXPECT_EQ(testsupport::ReadFileBytes(folder_.File("err.txt")), "");

    EXPECT_EQ(run(""), 64);
    EXPECT_THAT(testsupport::ReadFileBytes(folder_.File("err.txt")),
                StartsWith("vantori-verify: choose what to verify"));
    EXPECT_EQ(run("--version"), 0);
    EXPECT_EQ(run("--show \"" + Demo("data/shows/Evening.lss") + "\" --registry \"" +
                  folder_.File("absent.reg") + "\""),
              3);
    EXPECT_THAT(TempFiles(), IsEmpty());
}
#endif

}  // namespace
}  // namespace vtr::cli
