#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <regex>

#include "cli/DemoFixture.h"
#include "report/ReportText.h"

namespace vtr::cli {
namespace {

using testing::DemoTest;
using ::testing::ElementsAreArray;
using ::testing::HasSubstr;
using ::testing::Not;
using testing::Outcome;
using Json = nlohmann::json;

std::size_t Occurrences(const std::string& text, const std::string& what) {
    std::size_t count = 0;
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1))
        ++count;
    return count;
}

// "16", "23", ...: the message numbers of a JSON or SARIF run, in order.
std::vector<int> MessageNumbers(const Json& results, const char* key) {
    std::vector<int> numbers;
    for (const Json& result : results) {
        numbers.push_back(key[0] == 'm' ? result[key].get<int>()
                                        : result["properties"]["messageNumber"].get<int>());
    }
    return numbers;
}

class ReportsDemoTest : public DemoTest {
  protected:
    std::string Report(const std::string& name) const { return folder_.File(name); }
};

TEST_F(ReportsDemoTest, TheHtmlReportOfTheScheduleShowsTheCountsTheShowsAndTheWeek) {
    const std::string file = Report("report.html");
    const Outcome plain = Run({"--schedule"});
    const Outcome outcome = Run({"--schedule", "--output", file});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.err, "");
    EXPECT_EQ(outcome.out, plain.out);  // the report changes nothing of what is printed

    const std::string page = testsupport::ReadFileBytes(file);
    const std::string shows = Demo("data/shows/");
    EXPECT_THAT(page, HasSubstr("<h1>Verifier report: the entire schedule</h1>"));
    EXPECT_THAT(page, HasSubstr("<dt>When</dt><dd>Friday 2031-03-14, 19:30:00 (141 checks)</dd>"));
    EXPECT_THAT(page,
                HasSubstr("<dt>Settings</dt><dd>the settings store " + report::Html(DemoStore())));
    EXPECT_THAT(page, HasSubstr("id=\"count-errors\" data-count=\"3\""));
    EXPECT_THAT(page, HasSubstr("id=\"count-warnings\" data-count=\"4\""));
    EXPECT_THAT(page, HasSubstr("id=\"count-info\" data-count=\"0\""));
    EXPECT_THAT(page, HasSubstr("id=\"count-ignored\" data-count=\"2\""));
    EXPECT_EQ(Occurrences(page, "<li class=\"r "), 9u);

    // Every scheduled show has an error: Weekend its missing sequence, Evening and Holiday the
    // missing music of Jingle.lms, which they play; the wrong program file is the
    // installation's.
    EXPECT_THAT(page, HasSubstr("<b>Weekend.lss</b></a>: 1 error, 3 warnings</li>"));
    EXPECT_THAT(page, HasSubstr("<b>Evening.lss</b></a>: 1 error, 3 warnings</li>"));
    EXPECT_THAT(page, HasSubstr("<b>Holiday.lss</b>: 1 error, 1 warning</li>"));
    EXPECT_THAT(page, HasSubstr("<b>Installation and settings</b></a>: 1 error</li>"));
    EXPECT_THAT(page, HasSubstr("<p class=\"note\">Played by Evening.lss, Holiday.lss</p>"));

    // The week: Evening on the five weekdays, Weekend on Saturday and Sunday, today marked;
    // Holiday on its two dates to come.
    // Evening: a block on each weekday, one beside the Holiday date that is a Tuesday, and
    // its line among the shows with findings.
    EXPECT_EQ(Occurrences(page, "data-show=\"" + report::Html(shows + "Evening.lss") + "\""), 7u);
    EXPECT_THAT(page, HasSubstr("Friday (today)"));
    EXPECT_THAT(page, HasSubstr("data-date=\"2031-03-23\""));
    EXPECT_THAT(page, HasSubstr("data-date=\"2031-09-30\""));
    EXPECT_THAT(page, HasSubstr("title=\"Weekend.lss, Sat 17:00\u201323:30: 1 error, 3 warnings"));
}

TEST_F(ReportsDemoTest, FormatHtmlPrintsThePageThatOutputSaves) {
    const std::string file = Report("report.HTML");  // the extension in any case
    const Outcome outcome = Run({"--schedule", "--format", "html", "--output", file});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_TRUE(outcome.out.starts_with("<!DOCTYPE html>"));
    EXPECT_EQ(outcome.out, testsupport::ReadFileBytes(file));
}

TEST_F(ReportsDemoTest, TheSarifReportListsEveryFindingAtItsFileInTheRunsOrder) {
    const std::string file = Report("report.sarif");
    const Outcome json = Run({"--schedule", "--format", "json"});
    const Outcome outcome = Run({"--schedule", "--output", file});
    EXPECT_EQ(outcome.status, 2);
    const Json log = Json::parse(testsupport::ReadFileBytes(file));
    const Json& run = log["runs"][0];
    const Json& results = run["results"];
    EXPECT_THAT(
        MessageNumbers(results, "properties"),
        ElementsAreArray(MessageNumbers(Json::parse(json.out)["results"], "messageNumber")));
    int suppressed = 0;
    for (const Json& result : results)
        suppressed += result.contains("suppressions") ? 1 : 0;
    EXPECT_EQ(suppressed, 2);
    EXPECT_EQ(run["properties"]["target"], Json({{"kind", "schedule"}}));

    // The missing music at the sequence that plays it, the music file beside it.
    for (const Json& result : results) {
        if (result["ruleId"] != "VTR026")
            continue;
        EXPECT_EQ(result["locations"][0]["physicalLocation"]["artifactLocation"]["uri"],
                  report::FileUri(Demo("data/sequences/Jingle.lms")));
        EXPECT_EQ(result["relatedLocations"][0]["physicalLocation"]["artifactLocation"]["uri"],
                  report::FileUri(MediaFile("Jingle.mp3")));
    }

    // --format sarif prints the same document, but for the times of its run.
    Json printed = Json::parse(Run({"--schedule", "--format", "sarif"}).out);
    Json saved = log;
    for (Json* document : {&printed, &saved}) {
        (*document)["runs"][0]["invocations"][0].erase("startTimeUtc");
        (*document)["runs"][0]["invocations"][0].erase("endTimeUtc");
    }
    EXPECT_EQ(printed, saved);
}

TEST_F(ReportsDemoTest, OneShowIsDrawnInTheSuitesWeekAndOneSequenceWithout) {
    const std::string evening = Demo("data/shows/Evening.lss");
    const Outcome show = Run({"--show", evening, "--format", "html"});
    EXPECT_EQ(show.status, 2);
    EXPECT_THAT(show.out, HasSubstr("<h1>Verifier report: show Evening.lss</h1>"));
    // Evening verified (the music of Jingle.lms is missing), the others drawn as not.
    EXPECT_THAT(show.out,
                HasSubstr("title=\"Evening.lss, Mon 17:30\u201322:30: 1 error, 3 warnings"));
    EXPECT_THAT(show.out,
                HasSubstr("title=\"Weekend.lss, Sat 17:00\u201323:30: not verified in this run"));
    // The temporary schedule the run made for the show is not drawn.
    EXPECT_THAT(show.out, Not(HasSubstr("03:00:37")));

    const Outcome sequence =
        Run({"--sequence", Demo("data/sequences/Snowfall.las"), "--format", "sarif"});
    const Json run = Json::parse(sequence.out)["runs"][0];
    EXPECT_EQ(run["properties"]["target"],
              Json({{"kind", "sequence"}, {"file", Demo("data/sequences/Snowfall.las")}}));
    EXPECT_THAT(Run({"--sequence", Demo("data/sequences/Snowfall.las"), "--format", "html"}).out,
                HasSubstr("One sequence was verified; it has no place in the week"));
}

TEST_F(ReportsDemoTest, WrongFormatsAreRefusedWithTheReason) {
    Outcome outcome = Run({"ignored", "--format", "html"});
    EXPECT_EQ(outcome.status, 64);
    EXPECT_THAT(outcome.err, HasSubstr("\"ignored\" lists the ignore lists as text or json, not "
                                       "html; the html report is a verification's"));
    outcome = Run({"--schedule", "--format", "htm"});
    EXPECT_EQ(outcome.status, 64);
    EXPECT_THAT(outcome.err, HasSubstr("--format takes text, json, html or sarif, not \"htm\"; "
                                       "did you mean html?"));
}

TEST_F(ReportsDemoTest, TheReportIsNeverWrittenOverAFileTheRunRead) {
    // A show saved under a name that asks for an HTML report is still the run's input.
    const std::string show = Report("Evening.html");
    std::filesystem::copy_file(Demo("data/shows/Evening.lss"), show);
    const std::string before = testsupport::ReadFileBytes(show);
    const Outcome outcome = Run({"--show", show, "--output", show});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_THAT(outcome.err, HasSubstr("the verifier never changes the files it verifies"));
    EXPECT_EQ(testsupport::ReadFileBytes(show), before);
}

}  // namespace
}  // namespace vtr::cli
