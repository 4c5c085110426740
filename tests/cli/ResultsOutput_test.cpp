#include "ResultsOutput.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <sstream>

#include "VtrVersion.h"

namespace vtr::cli {
namespace {

using ::testing::ElementsAre;
using ::testing::StartsWith;

ResultPtr MakeResult(Severity severity, int32_t number, int32_t help, const std::string& summary,
                     const std::vector<std::string>& details = {}) {
    auto result = std::make_shared<Result>();
    result->SetSeverity(severity);
    result->SetMessageNumber(number);
    result->SetHelpContextID(help);
    result->SetSummary(summary);
    for (const std::string& detail : details)
        result->AddDetail(detail);
    return result;
}

ResultPtr Conflict(const std::string& show, const std::string& a, const std::string& b,
                   const std::string& channel) {
    return MakeResult(Severity::Warning, 43, 43, "Channel conflict",
                      {"[SHOW]: /shows/" + show, "[SECTION]: Background", "[SEQUENCE]: /s/" + a,
                       "[TRACK]: Track 1: A", "[CHANNEL]: " + channel, "[SECTION]: Musical",
                       "[SEQUENCE]: /s/" + b, "[TRACK]: Track 1: B", "[CHANNEL]: " + channel});
}

RunRecord SampleRecord() {
    RunRecord record;
    record.target = TargetKind::Show;
    record.targetFile = "/shows/Evening.lss";
    record.checksPerformed = 97;
    record.results = {
        {MakeResult(Severity::Warning, 6, 6, "Verifier not running from VTR application path",
                    {"[APPLICATION]: /app/", "[VERIFIER]: /bin/"}),
         true},
        {MakeResult(Severity::Warning, 28, 28, "Channel is completely off",
                    {"[SEQUENCE]: /s/Snowfall.las", "[TRACK]: Track 1: Garage", "[CHANNEL]: Star"}),
         false},
        {MakeResult(Severity::Error, 23, 23, "Sequence file does not exist",
                    {"[SEQUENCE]: /s/Fireworks.las", "[SHOW]: show /shows/Evening.lss"}),
         false},
        {MakeResult(Severity::Warning, 45, 47,
                    "Channel settings conflict in sequence/intensity file"),
         false},
        {MakeResult(Severity::Error, 16, 16, "Application file has unexpected version number",
                    {"[FILE]: /app/SuiteTray.exe"}),
         true},
    };
    return record;
}

std::string Text(const RunRecord& record, const Presentation& presentation = {}) {
    std::ostringstream out;
    WriteText(out, record, presentation);
    return out.str();
}

nlohmann::json Json(const RunRecord& record, const Presentation& presentation = {}) {
    std::ostringstream out;
    WriteJson(out, record, presentation);
    return nlohmann::json::parse(out.str());
}

TEST(ResultsOutputTest, TextListsErrorsFirstThenIgnoredOnesThenTheCounts) {
    EXPECT_EQ(Text(SampleRecord()),
              "Error 23: Sequence file does not exist\n"
              "    [SEQUENCE]: /s/Fireworks.las\n"
              "    [SHOW]: show /shows/Evening.lss\n"
              "Warning 28: Channel is completely off\n"
              "    [SEQUENCE]: /s/Snowfall.las\n"
              "    [TRACK]: Track 1: Garage\n"
              "    [CHANNEL]: Star\n"
              "Warning 45: Channel settings conflict in sequence/intensity file\n"
              "\n"
              "Ignored results:\n"
              "Error 16: Application file has unexpected version number\n"
              "    [FILE]: /app/SuiteTray.exe\n"
              "Warning 6: Verifier not running from VTR application path\n"
              "    [APPLICATION]: /app/\n"
              "    [VERIFIER]: /bin/\n"
              "\n"
              "97 checks performed, 1 error, 2 warnings, 2 ignored results.\n");
}

TEST(ResultsOutputTest, TextWithoutIgnoredResultsHasNoHeadingAndCancellationIsSaid) {
    RunRecord record;
    record.checksPerformed = 1;
    record.cancelled = true;
    record.results = {{MakeResult(Severity::Warning, 2, 2, "Verification cancelled"), false}};
    EXPECT_EQ(Text(record),
              "Warning 2: Verification cancelled\n"
              "\n"
              "1 check performed, 0 errors, 1 warning, 0 ignored results. "
              "Verification cancelled.\n");

    record.results = {{MakeResult(static_cast<Severity>(7), 99, 99, "Odd"), false},
                      {MakeResult(Severity::Info, 1, 1, "No errors or warnings found"), false}};
    record.cancelled = false;
    EXPECT_THAT(Text(record),
                StartsWith("Info 1: No errors or warnings found\nSeverity 7 99: Odd\n"));
}

TEST(ResultsOutputTest, ASeverityHidesWhatIsBelowItAndTheSummarySaysHowMany) {
    Presentation presentation;
    presentation.minimumSeverity = Severity::Error;
    EXPECT_EQ(Text(SampleRecord(), presentation),
              "Error 23: Sequence file does not exist\n"
              "    [SEQUENCE]: /s/Fireworks.las\n"
              "    [SHOW]: show /shows/Evening.lss\n"
              "\n"
              "Ignored results:\n"
              "Error 16: Application file has unexpected version number\n"
              "    [FILE]: /app/SuiteTray.exe\n"
              "\n"
              "97 checks performed, 1 error, 2 warnings, 2 ignored results. 3 results below "
              "error not listed (--severity).\n");

    RunRecord record;
    record.results = {{MakeResult(Severity::Info, 1, 1, "No errors or warnings found"), false}};
    presentation.minimumSeverity = Severity::Warning;
    EXPECT_EQ(Text(record, presentation),
              "0 checks performed, 0 errors, 0 warnings, 0 ignored results. 1 result below "
              "warning not listed (--severity).\n");
}

TEST(ResultsOutputTest, GroupsAreHeadedByTheirTitleAndCounts) {
    RunRecord record = SampleRecord();
    record.results.push_back({Conflict("Evening.lss", "Glow.las", "Carol.lms", "Tree"), false});
    record.results.push_back({Conflict("Evening.lss", "Glow.las", "Carol.lms", "Star"), false});
    Presentation presentation;
    presentation.groupBy = GroupBy::SequencePair;
    EXPECT_EQ(Text(record, presentation),
              "== Other results (1 error, 2 warnings) ==\n"
              "Error 23: Sequence file does not exist\n"
              "    [SEQUENCE]: /s/Fireworks.las\n"
              "    [SHOW]: show /shows/Evening.lss\n"
              "Warning 28: Channel is completely off\n"
              "    [SEQUENCE]: /s/Snowfall.las\n"
              "    [TRACK]: Track 1: Garage\n"
              "    [CHANNEL]: Star\n"
              "Warning 45: Channel settings conflict in sequence/intensity file\n"
              "\n"
              "== Carol.lms (Musical) and Glow.las (Background), show Evening.lss (2 "
              "warnings) ==\n"
              "Warning 43: Channel conflict\n"
              "    [SHOW]: /shows/Evening.lss\n"
              "    [SECTION]: Background\n"
              "    [SEQUENCE]: /s/Glow.las\n"
              "    [TRACK]: Track 1: A\n"
              "    [CHANNEL]: Tree\n"
              "    [SECTION]: Musical\n"
              "    [SEQUENCE]: /s/Carol.lms\n"
              "    [TRACK]: Track 1: B\n"
              "    [CHANNEL]: Tree\n"
              "Warning 43: Channel conflict\n"
              "    [SHOW]: /shows/Evening.lss\n"
              "    [SECTION]: Background\n"
              "    [SEQUENCE]: /s/Glow.las\n"
              "    [TRACK]: Track 1: A\n"
              "    [CHANNEL]: Star\n"
              "    [SECTION]: Musical\n"
              "    [SEQUENCE]: /s/Carol.lms\n"
              "    [TRACK]: Track 1: B\n"
              "    [CHANNEL]: Star\n"
              "\n"
              "Ignored results:\n"
              "== Other results (1 error, 1 warning) ==\n"
              "Error 16: Application file has unexpected version number\n"
              "    [FILE]: /app/SuiteTray.exe\n"
              "Warning 6: Verifier not running from VTR application path\n"
              "    [APPLICATION]: /app/\n"
              "    [VERIFIER]: /bin/\n"
              "\n"
              "97 checks performed, 1 error, 4 warnings, 2 ignored results.\n");
}

TEST(ResultsOutputTest, StatisticsCountMessagesAndNameTheWorstAndLargestGroups) {
    RunRecord record = SampleRecord();
    // Twelve pairs: sequence n against Glow.las on n channels, 78 conflicts in all.
    for (int n = 1; n <= 12; ++n) {
        for (int channel = 0; channel < n; ++channel)
            record.results.push_back(
                {Conflict("Evening.lss", "Glow.las", "S" + std::to_string(n) + ".las",
                          "C" + std::to_string(channel)),
                 false});
    }
    Presentation presentation;
    presentation.statistics = true;
    EXPECT_EQ(Text(record, presentation),
              "Results by message:\n"
              "  78  Warning 43: Channel conflict\n"
              "   1  Error 23: Sequence file does not exist\n"
              "   1  Warning 28: Channel is completely off\n"
              "   1  Warning 45: Channel settings conflict in sequence/intensity file\n"
              "\n"
              "97 checks performed, 1 error, 80 warnings, 2 ignored results.\n");

    presentation.groupBy = GroupBy::SequencePair;
    EXPECT_EQ(Text(record, presentation),
              "Results by message:\n"
              "  78  Warning 43: Channel conflict\n"
              "   1  Error 23: Sequence file does not exist\n"
              "   1  Warning 28: Channel is completely off\n"
              "   1  Warning 45: Channel settings conflict in sequence/intensity file\n"
              "\n"
              "Results by sequence pair: 13 groups, the 10 with the worst and most results:\n"
              "   3  Other results\n"
              "  12  Glow.las (Background) and S12.las (Musical), show Evening.lss\n"
              "  11  Glow.las (Background) and S11.las (Musical), show Evening.lss\n"
              "  10  Glow.las (Background) and S10.las (Musical), show Evening.lss\n"
              "   9  Glow.las (Background) and S9.las (Musical), show Evening.lss\n"
              "   8  Glow.las (Background) and S8.las (Musical), show Evening.lss\n"
              "   7  Glow.las (Background) and S7.las (Musical), show Evening.lss\n"
              "   6  Glow.las (Background) and S6.las (Musical), show Evening.lss\n"
              "   5  Glow.las (Background) and S5.las (Musical), show Evening.lss\n"
              "   4  Glow.las (Background) and S4.las (Musical), show Evening.lss\n"
              "  and 3 more groups of at most 3 results each (--group-by without --statistics "
              "lists them all)\n"
              "\n"
              "97 checks performed, 1 error, 80 warnings, 2 ignored results.\n");

    // By message, the statistics are the groups.
    presentation.groupBy = GroupBy::Message;
    EXPECT_EQ(Text(record, presentation).find("Results by message:", 1), std::string::npos);
}

TEST(ResultsOutputTest, ColourMarksEachResultBySeverityAndHeadingsInBold) {
    RunRecord record = SampleRecord();
    record.results.push_back(
        {MakeResult(Severity::Info, 1, 1, "No errors or warnings found"), false});
    Presentation presentation;
    presentation.color = true;
    presentation.groupBy = GroupBy::Message;
    const std::string text = Text(record, presentation);
    EXPECT_THAT(text, StartsWith("\x1b[1m== Message 23: Sequence file does not exist (1 error) "
                                 "==\x1b[0m\n"
                                 "\x1b[1;31mError 23: Sequence file does not exist\x1b[0m\n"
                                 "    [SEQUENCE]: /s/Fireworks.las\n"));
    EXPECT_NE(text.find("\n\x1b[33mWarning 28: Channel is completely off\x1b[0m\n"),
              std::string::npos);
    EXPECT_NE(text.find("\n\x1b[36mInfo 1: No errors or warnings found\x1b[0m\n"),
              std::string::npos);
    // The summary line stays plain, and nothing is coloured without being asked.
    EXPECT_NE(text.find("\n\n97 checks performed, 1 error, 2 warnings, 2 ignored results.\n"),
              std::string::npos);
    presentation.color = false;
    EXPECT_EQ(Text(record, presentation).find('\x1b'), std::string::npos);
}

TEST(ResultsOutputTest, JsonHoldsTheProgramTargetCountsAndEveryResultInOrder) {
    RunRecord record = SampleRecord();
    record.results.push_back(
        {MakeResult(Severity::Info, 1, 1, "No errors or warnings found"), false});
    const nlohmann::json document = Json(record);
    EXPECT_EQ(document["program"], "vantori-verify");
    EXPECT_EQ(document["version"], kVersionText);
    EXPECT_EQ(document["target"],
              (nlohmann::json{{"kind", "show"}, {"file", "/shows/Evening.lss"}}));
    EXPECT_EQ(document["cancelled"], false);
    EXPECT_EQ(document["checksPerformed"], 97);
    EXPECT_EQ(document["errors"], 1);
    EXPECT_EQ(document["warnings"], 2);
    EXPECT_EQ(document["counts"],
              (nlohmann::json{{"errors", 1}, {"warnings", 2}, {"info", 1}, {"ignored", 2}}));
    for (const char* absent : {"severity", "hidden", "baseline", "groups", "statistics"})
        EXPECT_FALSE(document.contains(absent)) << absent;
    ASSERT_EQ(document["results"].size(), 6u);

    const nlohmann::json& first = document["results"][0];
    EXPECT_EQ(first["severity"], 1);
    EXPECT_EQ(first["severityText"], "Warning");
    EXPECT_EQ(first["messageNumber"], 6);
    EXPECT_EQ(first["helpContextId"], 6);
    EXPECT_EQ(first["summary"], "Verifier not running from VTR application path");
    EXPECT_EQ(first["details"], (nlohmann::json{"[APPLICATION]: /app/", "[VERIFIER]: /bin/"}));
    EXPECT_EQ(first["ignored"], true);
    EXPECT_EQ(first["ignoreKey"], "6-[APPLICATION]: /app/ / [VERIFIER]: /bin/ / ");

    // The order the run produced, errors not first.
    EXPECT_EQ(document["results"][1]["messageNumber"], 28);
    EXPECT_EQ(document["results"][2]["severity"], 2);
    EXPECT_EQ(document["results"][2]["ignored"], false);
    const nlohmann::json& conflict = document["results"][3];
    EXPECT_EQ(conflict["messageNumber"], 45);
    EXPECT_EQ(conflict["helpContextId"], 47);
    EXPECT_EQ(conflict["details"], nlohmann::json::array());
    EXPECT_EQ(conflict["ignoreKey"], "45-");
}

TEST(ResultsOutputTest, JsonListsWhatTheSeverityLeavesAndGroupsAndCountsIt) {
    RunRecord record = SampleRecord();
    record.results.push_back({Conflict("Evening.lss", "Glow.las", "Carol.lms", "Tree"), true});
    record.results.push_back({Conflict("Evening.lss", "Glow.las", "Carol.lms", "Star"), false});
    Presentation presentation;
    presentation.minimumSeverity = Severity::Warning;
    presentation.groupBy = GroupBy::SequencePair;
    presentation.statistics = true;
    const nlohmann::json document = Json(record, presentation);
    EXPECT_EQ(document["severity"], "warning");
    EXPECT_EQ(document["hidden"], 0);
    EXPECT_EQ(document["counts"],
              (nlohmann::json{{"errors", 1}, {"warnings", 3}, {"info", 0}, {"ignored", 3}}));
    ASSERT_EQ(document["results"].size(), 7u);
    ASSERT_EQ(document["groups"].size(), 2u);
    const nlohmann::json& pair = document["groups"][0];
    EXPECT_EQ(pair["title"], "Carol.lms (Musical) and Glow.las (Background), show Evening.lss");
    EXPECT_EQ(pair["key"],
              "pair:18:/shows/Evening.lss7:Musical12:/s/Carol.lms10:Background11:/s/Glow.las");
    EXPECT_EQ(pair["counts"],
              (nlohmann::json{{"errors", 0}, {"warnings", 1}, {"info", 0}, {"ignored", 1}}));
    EXPECT_EQ(pair["results"], (nlohmann::json{5, 6}));
    EXPECT_EQ(document["groups"][1]["title"], "Other results");
    EXPECT_EQ(document["groups"][1]["results"], (nlohmann::json{0, 1, 2, 3, 4}));
    EXPECT_EQ(document["statistics"],
              (nlohmann::json{{{"messageNumber", 23},
                               {"severityText", "Error"},
                               {"count", 1},
                               {"summary", "Sequence file does not exist"}},
                              {{"messageNumber", 28},
                               {"severityText", "Warning"},
                               {"count", 1},
                               {"summary", "Channel is completely off"}},
                              {{"messageNumber", 43},
                               {"severityText", "Warning"},
                               {"count", 1},
                               {"summary", "Channel conflict"}},
                              {{"messageNumber", 45},
                               {"severityText", "Warning"},
                               {"count", 1},
                               {"summary",
                                "Channel settings conflict in sequence/intensity "
                                "file"}}}));

    presentation = Presentation();
    presentation.minimumSeverity = Severity::Error;
    const nlohmann::json errors = Json(record, presentation);
    EXPECT_EQ(errors["severity"], "error");
    EXPECT_EQ(errors["hidden"], 5);
    ASSERT_EQ(errors["results"].size(), 2u);
    EXPECT_EQ(errors["results"][0]["messageNumber"], 23);
    EXPECT_EQ(errors["results"][1]["messageNumber"], 16);
    // The counts are the run's, whatever is listed.
    EXPECT_EQ(errors["counts"], document["counts"]);
}

TEST(ResultsOutputTest, JsonOfTheScheduleHasNoFileAndCarriesEveryKeyExactly) {
    RunRecord record;
    record.target = TargetKind::Schedule;
    record.targetFile = "ignored for the schedule";
    record.results = {{MakeResult(Severity::Error, 21, 21, "Show file does not exist",
                                  {std::string("C:\\Shows\\No\xebl.lss")}),
                       false}};
    const nlohmann::json document = Json(record);
    EXPECT_EQ(document["target"], (nlohmann::json{{"kind", "schedule"}}));
    // For reading, the byte that is not UTF-8 is a replacement character; the key keeps it.
    EXPECT_EQ(document["results"][0]["details"][0], "C:\\Shows\\No\xef\xbf\xbdl.lss");
    EXPECT_EQ(document["results"][0]["ignoreKey"], "escaped:21-C:\\\\Shows\\\\No\\xEBl.lss / ");

    record.target = TargetKind::Sequence;
    EXPECT_EQ(Json(record)["target"]["kind"], "sequence");
}

// The JSON is written a piece at a time; it must read byte for byte as the whole document
// laid out with an indent of two.
TEST(ResultsOutputTest, JsonIsLaidOutExactlyAsTheWholeDocumentDumped) {
    RunRecord empty;
    empty.target = TargetKind::Schedule;
    empty.store.file = "/tmp/store.reg";
    std::ostringstream out;
    WriteJson(out, empty);
    EXPECT_EQ(out.str(), std::string("{\n"
                                     "  \"program\": \"vantori-verify\",\n"
                                     "  \"version\": \"") +
                             kVersionText +
                             "\",\n"
                             "  \"target\": {\n"
                             "    \"kind\": \"schedule\"\n"
                             "  },\n"
                             "  \"store\": {\n"
                             "    \"path\": \"/tmp/store.reg\",\n"
                             "    \"chosenBy\": \"option\",\n"
                             "    \"exists\": true,\n"
                             "    \"understood\": true,\n"
                             "    \"readOnly\": false\n"
                             "  },\n"
                             "  \"cancelled\": false,\n"
                             "  \"checksPerformed\": 0,\n"
                             "  \"errors\": 0,\n"
                             "  \"warnings\": 0,\n"
                             "  \"counts\": {\n"
                             "    \"errors\": 0,\n"
                             "    \"warnings\": 0,\n"
                             "    \"info\": 0,\n"
                             "    \"ignored\": 0\n"
                             "  },\n"
                             "  \"results\": []\n"
                             "}\n");

    RunRecord record = SampleRecord();
    record.results.push_back({MakeResult(Severity::Error, 21, 21, "Show file does not exist",
                                         {std::string("C:\\Shows\\No\xebl.lss"), "two\nlines",
                                          "a \"quoted\"\tname\x7f", "caf\xc3\xa9", ""}),
                              false});
    record.results.push_back({Conflict("A.lss", "a.las", "b.las", "Star"), false, true});
    std::vector<Presentation> presentations(4);
    presentations[1].minimumSeverity = Severity::Warning;
    presentations[1].baselineFile = "/nightly/last.json";
    presentations[2].groupBy = GroupBy::SequencePair;
    presentations[2].statistics = true;
    presentations[3].groupBy = GroupBy::Message;
    presentations[3].minimumSeverity = Severity::Error;
    for (const Presentation& presentation : presentations) {
        std::ostringstream written;
        WriteJson(written, record, presentation);
        const std::string text = written.str();
        EXPECT_EQ(text, nlohmann::ordered_json::parse(text).dump(2) + "\n");
    }
}

TEST(ResultsOutputTest, TextOfARunWithNothingListedIsTheSummaryAlone) {
    RunRecord record;
    record.checksPerformed = 3;
    EXPECT_EQ(Text(record), "3 checks performed, 0 errors, 0 warnings, 0 ignored results.\n");
    record.results = {{MakeResult(Severity::Info, 1, 1, "No errors or warnings found"), true}};
    EXPECT_EQ(Text(record),
              "\nIgnored results:\n"
              "Info 1: No errors or warnings found\n"
              "\n"
              "3 checks performed, 0 errors, 0 warnings, 1 ignored result.\n");
}

TEST(ResultsOutputTest, TheExitStatusFollowsTheWorstCountedSeverityAndFailOn) {
    const auto status = [](std::vector<RecordedResult> results, FailOn failOn) {
        RunRecord record;
        record.results = std::move(results);
        return ExitStatusOf(record, failOn);
    };
    const RecordedResult info{MakeResult(Severity::Info, 1, 1, "No errors or warnings found")};
    const RecordedResult warning{
        MakeResult(Severity::Warning, 28, 28, "Channel is completely off")};
    const RecordedResult error{MakeResult(Severity::Error, 23, 23, "Sequence file does not exist")};
    RecordedResult ignoredError = error;
    ignoredError.ignored = true;
    RecordedResult knownError = error;
    knownError.inBaseline = true;

    struct Case {
        std::vector<RecordedResult> results;
        int warningStatus;
        int errorStatus;
    };
    const std::vector<Case> cases = {
        {{}, 0, 0},
        {{info}, 0, 0},
        {{info, warning}, 1, 0},
        {{warning, error}, 2, 2},
        {{error}, 2, 2},
        {{warning, ignoredError}, 1, 0},
        {{knownError, info}, 0, 0},
        {{knownError, warning}, 1, 0},
    };
    for (std::size_t n = 0; n < cases.size(); ++n) {
        EXPECT_EQ(status(cases[n].results, FailOn::Warning), cases[n].warningStatus) << n;
        EXPECT_EQ(status(cases[n].results, FailOn::Error), cases[n].errorStatus) << n;
        EXPECT_EQ(status(cases[n].results, FailOn::Never), 0) << n;
    }
}

TEST(ResultsOutputTest, ResultsInTheBaselineAreCountedApart) {
    RunRecord record = SampleRecord();
    record.results[2].inBaseline = true;  // the error
    record.results[0].inBaseline = true;  // an ignored warning
    Presentation presentation;
    presentation.baselineFile = "/nightly/last.json";
    EXPECT_EQ(Text(record, presentation),
              "Warning 28: Channel is completely off\n"
              "    [SEQUENCE]: /s/Snowfall.las\n"
              "    [TRACK]: Track 1: Garage\n"
              "    [CHANNEL]: Star\n"
              "Warning 45: Channel settings conflict in sequence/intensity file\n"
              "\n"
              "Ignored results:\n"
              "Error 16: Application file has unexpected version number\n"
              "    [FILE]: /app/SuiteTray.exe\n"
              "\n"
              "97 checks performed, 0 errors, 2 warnings, 1 ignored result. 2 results in the "
              "baseline not listed.\n");
    const nlohmann::json document = Json(record, presentation);
    EXPECT_EQ(document["baseline"],
              (nlohmann::json{{"file", "/nightly/last.json"}, {"inBaseline", 2}}));
    EXPECT_EQ(document["errors"], 0);
    EXPECT_EQ(document["results"].size(), 3u);
    EXPECT_EQ(ExitStatusOf(record), 1);
}

}  // namespace
}  // namespace vtr::cli
