#include "report/HtmlReport.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <regex>

#include "engine/VtrError.h"
#include "report/ReportFixture.h"
#include "support/TempStore.h"

namespace vtr::report {
namespace {

using ::testing::HasSubstr;
using ::testing::Not;
using namespace testing;
using WeekTimeFunctions::NewWeekTime;

// The text from the first `from` on, up to (not including) the first `to` after it.
std::string Between(const std::string& text, const std::string& from, const std::string& to) {
    const std::size_t start = text.find(from);
    if (start == std::string::npos)
        return "";
    const std::size_t end = text.find(to, start + from.size());
    return text.substr(start, end == std::string::npos ? std::string::npos : end - start);
}

std::size_t Occurrences(const std::string& text, const std::string& what) {
    std::size_t count = 0;
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1))
        ++count;
    return count;
}

// Each text is found in the page, each after the one before.
void ExpectInOrder(const std::string& page, const std::vector<std::string>& texts) {
    std::size_t at = 0;
    for (const std::string& text : texts) {
        const std::size_t found = page.find(text, at);
        ASSERT_NE(found, std::string::npos) << "not found (in order): " << text;
        at = found + text.size();
    }
}

// A schedule of three shows, one across Sunday midnight, a calendar with one date to come and
// one gone, and the findings a real run gives them.
class HtmlReportTest : public ::testing::Test {
  protected:
    HtmlReportTest() : report_(BaseReport()) {
        report_.weekly = Week({
            {"/s/Evening.lss", {NewWeekTime(1, 17, 30, 0), NewWeekTime(1, 22, 30, 0)}},
            {"/s/Evening.lss", {NewWeekTime(3, 17, 30, 0), NewWeekTime(3, 22, 30, 0)}},
            {"/s/Weekend.lss", {NewWeekTime(6, 23, 0, 0), NewWeekTime(0, 1, 0, 0)}},
        });
        auto calendar = std::make_shared<YearSchedule>();
        calendar->AddShowEventByFile("/s/Holiday.lss", DateTime::FromParts(2031, 12, 24, 18),
                                     DateTime::FromParts(2031, 12, 24, 22));
        calendar->AddShowEventByFile("/s/Old.lss", DateTime::FromParts(2031, 3, 1, 18),
                                     DateTime::FromParts(2031, 3, 1, 20));
        report_.calendar = calendar;
        report_.showFiles = {{"/s/Evening.lss", {"/q/Carol.lms", "/q/Glow.las"}},
                             {"/s/Weekend.lss", {"/q/Carol.lms", "/q/Fireworks.las"}},
                             {"/s/Holiday.lss", {"/q/Jingle.lms"}}};
        report_.results = {
            {Make(Messages::NotRunningFromAppPath, {"[APPLICATION]: /app/", "[VERIFIER]: /bin/"}),
             true},
            {Make(Messages::AppFileUnexpectedVersion,
                  {"[FILE]: /app/SuiteTray.exe", "[EXPECTED]: 1.0.0.0", "[FOUND]: 0.9.4.2"})},
            {Make(Messages::MusicalInNonAudioSection,
                  {"[SEQUENCE]: /q/Carol.lms", "[SHOW]: /s/Weekend.lss", "[SECTION]: background"})},
            {Make(Messages::SequenceFileMissing,
                  {"[SEQUENCE]: /q/Fireworks.las", "[SHOW]: show /s/Weekend.lss"})},
            {Conflict("/s/Evening.lss", "Musical", "/q/Carol.lms", "Background", "/q/Glow.las",
                      "Tree")},
            {Conflict("/s/Evening.lss", "Background", "/q/Glow.las", "Musical", "/q/Carol.lms",
                      "Porch")},
            {Make(Messages::MediaFileMissing,
                  {"[FILE]: /m/Jingle.mp3", "[SEQUENCE]: /q/Jingle.lms"})},
            {Make(Messages::ChannelCompletelyOff,
                  {"[SEQUENCE]: /q/Glow.las", "[TRACK]: Track 1: Garage", "[CHANNEL]: Star"})},
        };
    }

    RunReport report_;
};

TEST_F(HtmlReportTest, TheTopSaysWhatWasVerifiedTheCountsAndWhereTheFindingsAre) {
    const std::string page = HtmlReport::Write(report_);
    ASSERT_TRUE(
        page.starts_with("<!DOCTYPE html>\n<html lang=\"en\"><head><meta charset=\"utf-8\">"));
    EXPECT_THAT(page, HasSubstr("<h1>Verifier report: the entire schedule</h1>"));
    EXPECT_THAT(page,
                HasSubstr("<dt>When</dt><dd>Wednesday 2031-03-12, 19:30:00 (141 checks)</dd>"));
    EXPECT_THAT(page, HasSubstr("<dt>Settings</dt><dd>the settings store /home/ann/registry.reg "
                                "(named with --registry)</dd>"));
    EXPECT_THAT(page, HasSubstr("<dt>Program</dt><dd>vantori-verify 1.2.3</dd>"));

    EXPECT_THAT(page, HasSubstr("id=\"count-errors\" data-count=\"3\"><b>3</b>errors"));
    EXPECT_THAT(page, HasSubstr("id=\"count-warnings\" data-count=\"4\"><b>4</b>warnings"));
    EXPECT_THAT(page, HasSubstr("id=\"count-info\" data-count=\"0\"><b>0</b>info results"));
    EXPECT_THAT(page, HasSubstr("id=\"count-ignored\" data-count=\"1\"><b>1</b>ignored"));
    EXPECT_THAT(page, HasSubstr("<div class=\"bar\" role=\"img\" aria-label=\"3 errors, 4 "
                                "warnings, 1 ignored\"><span class=\"e\" style=\"flex-grow:3\">"
                                "</span><span class=\"w\" style=\"flex-grow:4\"></span><span "
                                "class=\"g\" style=\"flex-grow:1\"></span></div>"));

    // The shows with findings, worst first: the missing media file of a sequence counts for
    // the show that plays it, the conflicts and the channel that is off for Evening.
    const std::string owners = Between(page, "<section id=\"owners\">", "</section>");
    ExpectInOrder(owners, {"<b>Weekend.lss</b></a>: 1 error, 1 warning",
                           "<b>Holiday.lss</b>: 1 error", "<b>Evening.lss</b></a>: 3 warnings",
                           "<b>Installation and settings</b></a>: 1 error"});

    // Header, counts, owners and the week come before the long list.
    ExpectInOrder(page,
                  {"<header>", "id=\"counts\"", "id=\"owners\"", "id=\"week\"", "id=\"results\""});
}

TEST_F(HtmlReportTest, TheWeekDrawsEachShowAsABlockMarkedByWhatWasFoundInIt) {
    const std::string page = HtmlReport::Write(report_);
    const std::string weekly = Between(page, "id=\"weekly\"", "</div>\n");
    ASSERT_FALSE(weekly.empty());
    auto row = [&](int day) {
        return Between(weekly, "data-day=\"" + std::to_string(day) + "\"", "</div></div>");
    };
    // Across Sunday midnight: the last hour of Saturday and the first of Sunday, each marked
    // as going on past its edge.
    EXPECT_THAT(row(6), HasSubstr("class=\"blk e tn\" style=\"left:95.833%;width:4.167%\" "
                                  "data-show=\"/s/Weekend.lss\" data-from=\"82800\" "
                                  "data-to=\"86400\""));
    EXPECT_THAT(row(6), HasSubstr("Weekend Sat 23:00 \u2013 Sun 01:00 \u2192</a>"));
    EXPECT_THAT(row(0), HasSubstr("class=\"blk e fp\" style=\"left:0.000%;width:4.167%\" "
                                  "data-show=\"/s/Weekend.lss\" data-from=\"0\" data-to=\"3600\""));
    EXPECT_THAT(row(0), HasSubstr("\u2190 Weekend"));
    EXPECT_THAT(row(1), HasSubstr("class=\"blk w\" style=\"left:72.917%;width:20.833%\" "
                                  "data-show=\"/s/Evening.lss\""));
    // Days without a show are empty lanes; today is named.
    EXPECT_THAT(row(2), Not(HasSubstr("blk")));
    EXPECT_THAT(row(3), HasSubstr("Wednesday (today)"));
    EXPECT_EQ(Occurrences(weekly, "class=\"blk"), 4u);

    // The calendar: the date to come with its own show, and on the line below the weekly
    // schedule's show of the same weekday; the date gone is not drawn.
    const std::string dates = Between(page, "id=\"calendar\"", "</section>");
    EXPECT_THAT(dates, HasSubstr("data-date=\"2031-12-24\"><div class=\"dn\">Wed 2031-12-24"));
    EXPECT_THAT(Between(dates, "data-date=\"2031-12-24\"", "weekly-too"),
                HasSubstr("class=\"blk e\" style=\"left:75.000%;width:16.667%\" "
                          "data-show=\"/s/Holiday.lss\""));
    EXPECT_THAT(Between(dates, "weekly-too", "</div></div>"),
                HasSubstr("class=\"blk w\" style=\"left:72.917%;width:20.833%\" "
                          "data-show=\"/s/Evening.lss\""));
    EXPECT_THAT(dates, HasSubstr("This report does not say which the show player runs."));
    EXPECT_THAT(dates, HasSubstr("1 earlier date is not drawn."));
    EXPECT_THAT(page, Not(HasSubstr("Old.lss")));
}

TEST_F(HtmlReportTest, ResultsGoUnderTheirShowOrSequenceErrorsFirstWithTheirHelp) {
    const std::string page = HtmlReport::Write(report_);
    const std::string results = Between(page, "id=\"results\"", "<footer>");
    ExpectInOrder(results, {"<h3>Show Weekend.lss", "<h3>Sequence Jingle.lms",
                            "<h3>Installation and settings", "<h3>Show Evening.lss",
                            "<h3>Sequence Glow.las", "Ignored results"});

    // Within a show, errors first; the show says when it plays.
    const std::string weekend = Between(results, "<h3>Show Weekend.lss", "</section>");
    EXPECT_THAT(weekend, HasSubstr("1 error, 1 warning</span><span class=\"path\">/s/Weekend.lss"));
    EXPECT_THAT(weekend, HasSubstr("<p class=\"note\">Plays Sat 23:00 \u2013 Sun 01:00</p>"));
    ExpectInOrder(weekend, {"data-m=\"23\"", "data-m=\"33\""});

    // Each result whole, with what to do.
    EXPECT_THAT(weekend,
                HasSubstr("<li class=\"r e\" data-s=\"e\" data-sev=\"2\" data-m=\"23\"><span "
                          "class=\"sv\">Error 23</span><span class=\"sm\">Sequence file does not "
                          "exist</span><ul class=\"d\"><li>[SEQUENCE]: /q/Fireworks.las</li><li>"
                          "[SHOW]: show /s/Weekend.lss</li></ul><p class=\"h\"><b>What to do:</b> "
                          "A show, or a sequence that plays it as a subsequence"));

    // The two conflicts of one pair of sequences under one heading with their count and one
    // piece of advice.
    const std::string evening = Between(results, "<h3>Show Evening.lss", "</section>");
    EXPECT_THAT(evening,
                HasSubstr("<details class=\"grp sub\" open><summary>Carol.lms (Musical) "
                          "and Glow.las (Background), show Evening.lss <span class=\"tally "
                          "w\">2 warnings</span></summary><p class=\"h\"><b>What to do "
                          "(message 43):</b> Two sequences"));
    EXPECT_EQ(Occurrences(evening, "data-m=\"43\""), 2u);
    EXPECT_EQ(Occurrences(evening, "What to do"), 1u);

    // A sequence's findings say which shows play it.
    EXPECT_THAT(Between(results, "<h3>Sequence Jingle.lms", "</section>"),
                HasSubstr("<p class=\"note\">Played by Holiday.lss</p>"));

    // Every result once; the ignored one in its own closed part.
    EXPECT_EQ(Occurrences(results, "<li class=\"r "), 8u);
    const std::string ignored = Between(results, "id=\"ignored\"", "</section>");
    EXPECT_THAT(ignored, HasSubstr("<details class=\"grp\"><summary>"));
    EXPECT_THAT(ignored, HasSubstr("<li class=\"r g\" data-s=\"g\" data-sev=\"1\" data-m=\"6\">"));
}

TEST_F(HtmlReportTest, SelfContainedReadableWithoutScriptsAndPrintable) {
    const std::string page = HtmlReport::Write(report_);
    // Nothing is fetched: no link, no source, no image, font or import.
    for (const char* outside :
         {"http:", "https:", "<link", "src=", "url(", "@import", "@font-face", "<img", "<iframe"}) {
        EXPECT_THAT(page, Not(HasSubstr(outside))) << outside;
    }
    // Every reference stays inside the page.
    const std::regex href("href=\"([^\"]*)\"");
    for (auto it = std::sregex_iterator(page.begin(), page.end(), href);
         it != std::sregex_iterator(); ++it) {
        EXPECT_TRUE((*it)[1].str().starts_with("#")) << (*it)[1].str();
    }
    // The filter shows itself only when the script runs; a print style is there.
    EXPECT_THAT(page, HasSubstr("<div class=\"filter\" id=\"filter\" hidden>"));
    EXPECT_THAT(page, HasSubstr("@media print{"));
    EXPECT_EQ(Occurrences(page, "<script>"), 1u);
    EXPECT_TRUE(page.ends_with("</script>\n</body></html>\n"));
}

TEST_F(HtmlReportTest, TextFromTheUsersFilesIsEscaped) {
    report_.results.push_back(
        {Make(Messages::ShowFileMissing, {"/s/<script>alert(\"x\")</script>&'B'.lss"})});
    report_.results.push_back({Make(Messages::SequenceCannotLoad, {"/q/Caf\xE9.las"})});
    report_.weekly =
        Week({{"/s/<i>Night</i>.lss", {NewWeekTime(2, 20, 0, 0), NewWeekTime(2, 21, 0, 0)}}});
    const std::string page = HtmlReport::Write(report_);
    EXPECT_THAT(page, Not(HasSubstr("<script>alert")));
    EXPECT_THAT(page, Not(HasSubstr("<i>Night")));
    EXPECT_THAT(page, HasSubstr("<li>/s/&lt;script&gt;alert(&quot;x&quot;)&lt;/script&gt;&amp;"
                                "&#39;B&#39;.lss</li>"));
    EXPECT_THAT(page, HasSubstr("data-show=\"/s/&lt;i&gt;Night&lt;/i&gt;.lss\""));
    // The page stays UTF-8: on Windows a name is read in the ANSI code page; elsewhere a
    // name that is not UTF-8 reads with a replacement character.
#ifdef _WIN32
    EXPECT_THAT(page, HasSubstr("<li>/q/Caf"));
#else
    EXPECT_THAT(page, HasSubstr("<li>/q/Caf\xEF\xBF\xBD.las</li>"));
#endif
    EXPECT_THAT(page, Not(HasSubstr("Caf\xE9")));
}

TEST_F(HtmlReportTest, OneShowIsDrawnInTheSuitesWeekAmongShowsNotVerified) {
    report_.target = Target::Show;
    report_.targetFile = "/s/Evening.lss";
    report_.showFiles = {{"/s/Evening.lss", {"/q/Carol.lms", "/q/Glow.las"}}};
    report_.results = {{Conflict("/s/Evening.lss", "Musical", "/q/Carol.lms", "Background",
                                 "/q/Glow.las", "Tree")}};
    const std::string page = HtmlReport::Write(report_);
    EXPECT_THAT(page, HasSubstr("<h1>Verifier report: show Evening.lss</h1>"));
    EXPECT_THAT(page, HasSubstr("only Evening.lss was verified in this run"));
    const std::string weekly = Between(page, "id=\"weekly\"", "</div>\n");
    EXPECT_EQ(Occurrences(weekly, "class=\"blk w\""), 2u);
    EXPECT_EQ(Occurrences(weekly, "class=\"blk u"), 2u);  // Weekend, on both days
    EXPECT_THAT(weekly,
                HasSubstr("Weekend.lss, Sat 23:00 \u2013 Sun 01:00: not verified in this run"));

    report_.targetFile = "/s/Elsewhere.lss";
    report_.showFiles = {{"/s/Elsewhere.lss", {}}};
    EXPECT_THAT(HtmlReport::Write(report_),
                HasSubstr("<b>Elsewhere.lss</b> is not on the weekly schedule or on a calendar "
                          "date from today on."));
}

TEST_F(HtmlReportTest, OneSequenceHasNoWeekAndACancelledRunSaysItIsIncomplete) {
    report_.target = Target::Sequence;
    report_.targetFile = "/q/Glow.las";
    report_.cancelled = true;
    const std::string page = HtmlReport::Write(report_);
    EXPECT_THAT(page, HasSubstr("<h1>Verifier report: sequence Glow.las</h1>"));
    EXPECT_THAT(page, HasSubstr("One sequence was verified; it has no place in the week"));
    EXPECT_THAT(page, Not(HasSubstr("id=\"weekly\"")));
    EXPECT_THAT(page, HasSubstr("<p class=\"banner e\">The verification was cancelled: this "
                                "report is incomplete"));
}

TEST_F(HtmlReportTest, ResultsInTheBaselineAreCountedNotListedAndACleanRunSaysSo) {
    report_.baselineFile = "known.json";
    for (ReportedResult& reported : report_.results)
        reported.inBaseline = reported.result->MessageNumber() == 43;
    std::string page = HtmlReport::Write(report_);
    EXPECT_THAT(page, HasSubstr("<dt>Baseline</dt><dd>2 results in known.json are known and not "
                                "listed</dd>"));
    EXPECT_THAT(page, Not(HasSubstr("data-m=\"43\"")));
    EXPECT_THAT(page, HasSubstr("data-count=\"2\"><b>2</b>warnings"));
    EXPECT_THAT(page, Not(HasSubstr("No errors or warnings found.")));

    report_.results = {{Make(Messages::NoErrorsOrWarnings, {})}};
    page = HtmlReport::Write(report_);
    EXPECT_THAT(page, HasSubstr("<p class=\"banner o\">No errors or warnings found.</p>"));
    EXPECT_THAT(page, Not(HasSubstr("id=\"owners\"")));
    // Every show verified and clean.
    EXPECT_EQ(Occurrences(Between(page, "id=\"weekly\"", "</div>\n"), "class=\"blk o"), 4u);
}

class HtmlReportSaveTest : public testsupport::StoreTest {};

TEST_F(HtmlReportSaveTest, SavingWritesThePageWholeOrSaysWhyNot) {
    const std::string file = folder_.File("report.html");
    HtmlReport::Save(file, BaseReport());
    EXPECT_TRUE(testsupport::ReadFileBytes(file).starts_with("<!DOCTYPE html>"));

    const std::string nowhere = folder_.File("missing folder") + "/report.html";
    try {
        HtmlReport::Save(nowhere, BaseReport());
        FAIL() << "saved into a folder that does not exist";
    } catch (const VtrError& error) {
        EXPECT_THAT(error.Description(), HasSubstr(nowhere));
    }
}

}  // namespace
}  // namespace vtr::report
