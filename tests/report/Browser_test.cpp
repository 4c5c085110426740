// The demo's HTML report in a real browser: headless chromium loads the page from a file,
// with its scripts, and the page it ends up with (--dump-dom) must show the counts and every
// result of the JSON of the same run.
//
// Skipped, saying so, when no chromium is installed; the CI job scripts/ci-report.sh installs
// it and sets VTR_REQUIRE_BROWSER=1, which turns the skip into a failure. VTR_CHROMIUM names
// the browser's program when it is not "chromium" on the PATH. Linux only: the Windows build
// has no browser to drive.
#ifndef _WIN32
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <map>
#include <regex>
#include <set>
#include <sstream>

#include "cli/DemoFixture.h"

namespace vtr::report {
namespace {

namespace fs = std::filesystem;
using ::testing::HasSubstr;
using Json = nlohmann::json;

std::optional<std::string> FindChromium() {
    if (const char* named = std::getenv("VTR_CHROMIUM"); named != nullptr && *named != '\0')
        return std::string(named);
    const char* path = std::getenv("PATH");
    if (path == nullptr)
        return std::nullopt;
    std::istringstream folders(path);
    for (std::string folder; std::getline(folders, folder, ':');) {
        for (const char* name : {"chromium", "chromium-browser"}) {
            const fs::path candidate = fs::path(folder) / name;
            std::error_code error;
            if (fs::is_regular_file(candidate, error))
                return candidate.string();
        }
    }
    return std::nullopt;
}

bool BrowserRequired() {
    const char* required = std::getenv("VTR_REQUIRE_BROWSER");
    return required != nullptr && std::string(required) == "1";
}

std::string Quoted(const std::string& text) {
    std::string quoted = "'";
    for (const char c : text)
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return quoted + "'";
}

// The text of the page's markup with the five character references it uses undone.
std::string Unescaped(std::string text) {
    static const std::pair<const char*, const char*> kReferences[] = {
        {"&lt;", "<"},  {"&gt;", ">"},        {"&quot;", "\""},
        {"&#39;", "'"}, {"&nbsp;", "\u00A0"}, {"&amp;", "&"}};
    for (const auto& [reference, character] : kReferences) {
        for (std::size_t at = text.find(reference); at != std::string::npos;
             at = text.find(reference, at + 1))
            text.replace(at, std::strlen(reference), character);
    }
    return text;
}

// One result as a row of the page shows it, or as the JSON has it.
std::string Finding(int severity, int message, bool ignored,
                    const std::vector<std::string>& details) {
    std::string text =
        std::to_string(severity) + " " + std::to_string(message) + (ignored ? " ignored" : "");
    for (const std::string& detail : details)
        text += " | " + detail;
    return text;
}

class BrowserTest : public cli::testing::DemoTest {
  protected:
    // Runs the browser on the page with nothing from the network and a profile of its own;
    // what it printed on standard output.
    std::string DumpDom(const std::string& browser, const std::string& page) {
        const std::string profile = folder_.File("browser-profile");
        fs::create_directories(profile);
        const std::string out = folder_.File("dom.html");
        const std::string err = folder_.File("browser.log");
        const std::string command =
            "timeout 180 " + Quoted(browser) +
            " --headless --no-sandbox --disable-gpu --disable-dev-shm-usage"
            " --disable-background-networking --disable-component-update --disable-sync"
            " --no-first-run --no-default-browser-check --user-data-dir=" +
            Quoted(profile) + " --dump-dom " + Quoted("file://" + page) + " >" + Quoted(out) +
            " 2>" + Quoted(err);
        const int status = std::system(command.c_str());
        EXPECT_EQ(status, 0) << command << "\n" << testsupport::ReadFileBytes(err);
        return testsupport::ReadFileBytes(out);
    }
};

TEST_F(BrowserTest, TheDemosReportShowsTheCountsAndResultsOfTheJson) {
    const std::optional<std::string> browser = FindChromium();
    if (!browser) {
        if (BrowserRequired())
            FAIL() << "VTR_REQUIRE_BROWSER=1 but no chromium is on the PATH";
        GTEST_SKIP() << "chromium is not installed: the HTML report is not tried in a browser "
                        "(scripts/ci-report.sh installs it and runs this test)";
    }
    const std::string page = folder_.File("report.html");
    const cli::testing::Outcome json = Run({"--schedule", "--format", "json", "--output", page});
    ASSERT_EQ(json.status, 2) << json.err;
    const Json document = Json::parse(json.out);

    const std::string dom = DumpDom(*browser, page);
    ASSERT_THAT(dom, HasSubstr("<h1>Verifier report: the entire schedule</h1>"));

    // The counts, as the page shows them.
    for (const auto& [id, key] : {std::pair{"errors", "errors"}, std::pair{"warnings", "warnings"},
                                  std::pair{"info", "info"}, std::pair{"ignored", "ignored"}}) {
        const std::regex count("id=\"count-" + std::string(id) +
                               "\" data-count=\"(\\d+)\"><b>([0-9,]+)</b>");
        std::smatch match;
        ASSERT_TRUE(std::regex_search(dom, match, count)) << id;
        EXPECT_EQ(std::stoi(match[1]), document["counts"][key].get<int>()) << id;
        EXPECT_EQ(match[2].str(), std::to_string(document["counts"][key].get<int>())) << id;
    }

    // Every result row of the page, with its details, against every result of the JSON.
    std::multiset<std::string> rows;
    const std::regex row(
        "<li class=\"r [a-z]\" data-s=\"([a-z])\" data-sev=\"(\\d+)\" "
        "data-m=\"(\\d+)\">");
    const std::regex detail("<li>(.*?)</li>");
    for (auto it = std::sregex_iterator(dom.begin(), dom.end(), row); it != std::sregex_iterator();
         ++it) {
        const std::size_t start = it->position() + it->length();
        const std::size_t end = dom.find("<li class=\"r ", start);
        const std::string body = dom.substr(start, end == std::string::npos ? end : end - start);
        const std::size_t list = body.find("<ul class=\"d\">");
        std::vector<std::string> details;
        if (list != std::string::npos) {
            const std::string items = body.substr(list, body.find("</ul>", list) - list);
            for (auto d = std::sregex_iterator(items.begin(), items.end(), detail);
                 d != std::sregex_iterator(); ++d)
                details.push_back(Unescaped((*d)[1]));
        }
        rows.insert(Finding(std::stoi((*it)[2]), std::stoi((*it)[3]), (*it)[1] == "g", details));
    }
    std::multiset<std::string> expected;
    for (const Json& result : document["results"]) {
        expected.insert(Finding(result["severity"], result["messageNumber"], result["ignored"],
                                result["details"].get<std::vector<std::string> >()));
    }
    EXPECT_EQ(rows, expected);
    EXPECT_EQ(rows.size(), 9u);

    // The script ran: the filter is shown and says how many results it shows.
    EXPECT_THAT(dom, HasSubstr("<div class=\"filter\" id=\"filter\">"));
    EXPECT_THAT(dom, HasSubstr("<span id=\"shown\" class=\"note\">9 of 9 results shown</span>"));
}

}  // namespace
}  // namespace vtr::report
#endif
