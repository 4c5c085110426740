#include "ResultsOutput.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <sstream>

namespace vtr::cli {
namespace {

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

RunRecord SampleRecord() {
    RunRecord record;
    record.target = TargetKind::Show;
    record.targetFile = "/shows/Evening.lss";
    record.checksPerformed = 97;
    record.errors = 1;
    record.warnings = 2;
    record.results = {
        {MakeResult(Severity::Warning, 6, 6, "Verifier not running from VTR application path",
                    {"[APPLICATION]: /app/", "[VERIFIER]: /bin/"}),
         true},
        {MakeResult(Severity::Error, 23, 23, "Sequence file does not exist",
                    {"[SEQUENCE]: /s/Fireworks.las", "[SHOW]: show /shows/Evening.lss"}),
         false},
        {MakeResult(Severity::Warning, 28, 28, "Channel is completely off",
                    {"[SEQUENCE]: /s/Snowfall.las", "[TRACK]: Track 1: Garage", "[CHANNEL]: Star"}),
         false},
        {MakeResult(Severity::Warning, 45, 47,
                    "Channel settings conflict in sequence/intensity file"),
         false},
    };
    return record;
}

std::string Text(const RunRecord& record) {
    std::ostringstream out;
    WriteText(out, record);
    return out.str();
}

nlohmann::json Json(const RunRecord& record) {
    std::ostringstream out;
    WriteJson(out, record);
    return nlohmann::json::parse(out.str());
}

TEST(ResultsOutputTest, TextListsResultsThenIgnoredOnesThenTheCounts) {
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
              "Warning 6: Verifier not running from VTR application path\n"
              "    [APPLICATION]: /app/\n"
              "    [VERIFIER]: /bin/\n"
              "\n"
              "97 checks performed, 1 error, 2 warnings, 1 ignored result.\n");
}

TEST(ResultsOutputTest, TextWithoutIgnoredResultsHasNoHeadingAndCancellationIsSaid) {
    RunRecord record;
    record.checksPerformed = 1;
    record.warnings = 1;
    record.cancelled = true;
    record.results = {{MakeResult(Severity::Warning, 2, 2, "Verification cancelled"), false}};
    EXPECT_EQ(Text(record),
              "Warning 2: Verification cancelled\n"
              "\n"
              "1 check performed, 0 errors, 1 warning, 0 ignored results. "
              "Verification cancelled.\n");

    record.results = {{MakeResult(static_cast<Severity>(7), 99, 99, "Odd"), false}};
    record.cancelled = false;
    EXPECT_THAT(Text(record), ::testing::StartsWith("Severity 7 99: Odd\n"));
}

TEST(ResultsOutputTest, JsonHoldsTheTargetCountsAndEveryResultInOrder) {
    const nlohmann::json document = Json(SampleRecord());
    EXPECT_EQ(document["target"],
              (nlohmann::json{{"kind", "show"}, {"file", "/shows/Evening.lss"}}));
    EXPECT_EQ(document["cancelled"], false);
    EXPECT_EQ(document["checksPerformed"], 97);
    EXPECT_EQ(document["errors"], 1);
    EXPECT_EQ(document["warnings"], 2);
    ASSERT_EQ(document["results"].size(), 4u);

    const nlohmann::json& first = document["results"][0];
    EXPECT_EQ(first["severity"], 1);
    EXPECT_EQ(first["severityText"], "Warning");
    EXPECT_EQ(first["messageNumber"], 6);
    EXPECT_EQ(first["helpContextId"], 6);
    EXPECT_EQ(first["summary"], "Verifier not running from VTR application path");
    EXPECT_EQ(first["details"], (nlohmann::json{"[APPLICATION]: /app/", "[VERIFIER]: /bin/"}));
    EXPECT_EQ(first["ignored"], true);
    EXPECT_EQ(first["ignoreKey"], "6-[APPLICATION]: /app/ / [VERIFIER]: /bin/ / ");

    EXPECT_EQ(document["results"][1]["severity"], 2);
    EXPECT_EQ(document["results"][1]["ignored"], false);
    const nlohmann::json& last = document["results"][3];
    EXPECT_EQ(last["messageNumber"], 45);
    EXPECT_EQ(last["helpContextId"], 47);
    EXPECT_EQ(last["details"], nlohmann::json::array());
    EXPECT_EQ(last["ignoreKey"], "45-");
}

TEST(ResultsOutputTest, JsonOfTheScheduleHasNoFileAndSurvivesBytesThatAreNotUtf8) {
    RunRecord record;
    record.target = TargetKind::Schedule;
    record.targetFile = "ignored for the schedule";
    record.results = {{MakeResult(Severity::Error, 21, 21, "Show file does not exist",
                                  {std::string("C:\\Shows\\No\xebl.lss")}),
                       false}};
    const nlohmann::json document = Json(record);
    EXPECT_EQ(document["target"], (nlohmann::json{{"kind", "schedule"}}));
    EXPECT_EQ(document["results"][0]["details"][0], "C:\\Shows\\No\xef\xbf\xbdl.lss");

    record.target = TargetKind::Sequence;
    EXPECT_EQ(Json(record)["target"]["kind"], "sequence");
}

TEST(ResultsOutputTest, ExitStatusFollowsTheWorstNotIgnoredSeverity) {
    RunRecord record;
    EXPECT_EQ(ExitStatusOf(record), 0);
    record.warnings = 3;
    EXPECT_EQ(ExitStatusOf(record), 1);
    record.errors = 1;
    EXPECT_EQ(ExitStatusOf(record), 2);
    record.warnings = 0;
    EXPECT_EQ(ExitStatusOf(record), 2);
}

}  // namespace
}  // namespace vtr::cli
