// Finding what matters in a large run, through the command line as a user runs it: a
// generated installation with channel conflicts, a few errors of every kind, and the options
// that list, group, count, colour and compare its results.
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <filesystem>
#include <map>
#include <regex>
#include <set>
#include <sstream>

#include "cli/CliTestSupport.h"
#include "cli/DemoFixture.h"
#include "engine/LibVerify.h"
#include "show/Show.h"
#include "support/TempStore.h"
#include "vtrsupport/InstallationGenerator.h"
#include "vtrsupport/PeImage.h"

namespace vtr::cli {
namespace {

using ::testing::AllOf;
using ::testing::AnyOf;
using ::testing::Each;
using ::testing::Eq;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::Not;
using testing::Outcome;
using ::testing::StartsWith;
using testsupport::ReadFileBytes;
using testsupport::WriteFileBytes;

namespace fs = std::filesystem;

std::vector<std::string> Lines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

// The heading lines of the results ("Warning 43: Channel conflict"): those that do not begin
// with a blank, a "==" heading or the summary, before the blank line of the summary.
std::vector<std::string> ResultLines(const std::string& text) {
    static const std::regex heading("^(Error|Warning|Info|Severity -?[0-9]+) -?[0-9]+: .*");
    std::vector<std::string> found;
    for (const std::string& line : Lines(text)) {
        if (line == "Ignored results:")
            break;
        if (std::regex_match(line, heading))
            found.push_back(line);
    }
    return found;
}

class TriageTest : public testsupport::StoreTest {
  protected:
    TriageTest() : now_([] { return DateTime::FromParts(2031, 12, 30, 12); }) {
        gen::InstallationOptions options;
        options.shows = 4;
        options.sequencesPerShow = 3;
        options.channelsPerSequence = 12;
        options.eventsPerChannel = 3;
        options.calendarStart = DateTime::FromParts(2031, 12, 30);
        options.faults = true;
        options.writeApplicationFile = [](const std::string& path, const std::string& version) {
            testsupport::WritePeImage(path, version);
        };
        installation_ = gen::MakeInstallation(folder_.File("suite"), options);
        fs::create_directories(TempDir());
    }

    void TearDown() override {
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
        LibVerify::ClearResults();
    }

    Outcome Run(std::vector<std::string> arguments, bool colorTerminal = false) const {
        arguments.insert(arguments.begin(),
                         {"--schedule", "--registry", installation_.registryFile});
        std::ostringstream out;
        std::ostringstream err;
        Console console{out, err, false, 80};
        console.outIsColorTerminal = colorTerminal;
        const testing::Arguments argv(arguments);
        Outcome outcome;
        outcome.status = Main(argv.Count(), argv.Values(), console);
        outcome.out = out.str();
        outcome.err = err.str();
        return outcome;
    }

    nlohmann::json JsonRun(std::vector<std::string> arguments = {}) const {
        arguments.insert(arguments.end(), {"--format", "json"});
        const Outcome outcome = Run(arguments);
        EXPECT_EQ(outcome.err, "");
        return nlohmann::json::parse(outcome.out);
    }

    // What a plain run found: not-ignored results per severity text.
    std::map<std::string, int> SeverityCounts() const {
        std::map<std::string, int> counts;
        const nlohmann::json document = JsonRun();
        for (const nlohmann::json& result : document["results"]) {
            if (!result["ignored"].get<bool>())
                ++counts[result["severityText"].get<std::string>()];
        }
        return counts;
    }

    gen::Installation installation_;

  private:
    ScopedNowSource now_;
};

TEST_F(TriageTest, TheInstallationHasConflictsErrorsAndWarnings) {
    const std::map<std::string, int> counts = SeverityCounts();
    EXPECT_GE(counts.at("Error"), 4);
    EXPECT_GE(counts.at("Warning"), 80);
    std::set<int> numbers;
    const nlohmann::json document = JsonRun();
    for (const nlohmann::json& result : document["results"])
        numbers.insert(result["messageNumber"].get<int>());
    for (const int number : {23, 24, 26, 30, 43, 45, 46, 53})
        EXPECT_TRUE(numbers.count(number)) << number;
}

TEST_F(TriageTest, ErrorsComeFirstAndASeverityListsOnlyItselfAndWorse) {
    const std::map<std::string, int> counts = SeverityCounts();
    const int total = counts.at("Error") + counts.at("Warning");

    Outcome outcome = Run({});
    EXPECT_EQ(outcome.status, 2);
    std::vector<std::string> listed = ResultLines(outcome.out);
    ASSERT_EQ(static_cast<int>(listed.size()), total);
    for (int n = 0; n < total; ++n)
        EXPECT_THAT(listed[n], StartsWith(n < counts.at("Error") ? "Error " : "Warning ")) << n;

    outcome = Run({"--severity", "error"});
    EXPECT_EQ(outcome.status, 2);
    listed = ResultLines(outcome.out);
    EXPECT_EQ(static_cast<int>(listed.size()), counts.at("Error"));
    EXPECT_THAT(listed, Each(StartsWith("Error ")));
    // The errors are at the top of the output, and the summary says what was left out.
    EXPECT_THAT(outcome.out, StartsWith("Error "));
    EXPECT_THAT(Lines(outcome.out).back(),
                HasSubstr(", " + std::to_string(counts.at("Error")) + " errors, " +
                          FormatCount(counts.at("Warning")) + " warnings, 0 ignored results. " +
                          FormatCount(counts.at("Warning")) +
                          " results below error not listed (--severity)."));

    // The JSON alike, in the order of the run.
    const nlohmann::json document = JsonRun({"--severity", "error"});
    EXPECT_EQ(document["severity"], "error");
    EXPECT_EQ(document["hidden"], counts.at("Warning"));
    EXPECT_EQ(static_cast<int>(document["results"].size()), counts.at("Error"));
    EXPECT_EQ(document["counts"]["warnings"], counts.at("Warning"));
}

TEST_F(TriageTest, GroupedCountsAddUpToTheUngroupedResults) {
    const nlohmann::json plain = JsonRun();
    const std::size_t total = ResultLines(Run({}).out).size();
    static const std::regex heading("^== (.*) \\((.*)\\) ==$");
    for (const char* groupBy : {"message", "show", "sequence", "pair"}) {
        const Outcome outcome = Run({"--group-by", groupBy});
        EXPECT_EQ(outcome.status, 2) << groupBy;
        // Each heading's counts are those of the lines under it.
        std::size_t listed = 0;
        std::set<std::string> titles;
        std::string counted;
        std::map<std::string, int> under;
        const auto check = [&] {
            if (counted.empty())
                return;
            std::string expected;
            for (const char* severity : {"Error", "Warning", "Info"}) {
                const int n = under[severity];
                if (n == 0)
                    continue;
                const std::string word = std::string(severity) == "Error"     ? "error"
                                         : std::string(severity) == "Warning" ? "warning"
                                                                              : "info result";
                expected += (expected.empty() ? "" : ", ") + FormatCount(n) + " " + word +
                            (n == 1 ? "" : "s");
            }
            EXPECT_EQ(counted, expected) << groupBy;
            under.clear();
        };
        for (const std::string& line : Lines(outcome.out)) {
            if (line == "Ignored results:")
                break;
            std::smatch match;
            if (std::regex_match(line, match, heading)) {
                check();
                EXPECT_TRUE(titles.insert(match[1]).second) << line;
                counted = match[2];
            } else if (!line.empty() && line[0] != ' ' && line.find(": ") != std::string::npos &&
                       !line.starts_with("==") &&
                       line.find(" checks performed") == std::string::npos) {
                ++listed;
                ++under[line.substr(0, line.find(' '))];
            }
        }
        check();
        EXPECT_EQ(listed, total) << groupBy;

        // The JSON's groups divide its results among them.
        const nlohmann::json document = JsonRun({"--group-by", groupBy});
        std::vector<int> positions;
        for (const nlohmann::json& group : document["groups"]) {
            for (const nlohmann::json& position : group["results"])
                positions.push_back(position.get<int>());
        }
        std::sort(positions.begin(), positions.end());
        ASSERT_EQ(positions.size(), plain["results"].size()) << groupBy;
        for (std::size_t n = 0; n < positions.size(); ++n)
            EXPECT_EQ(positions[n], static_cast<int>(n)) << groupBy;
        EXPECT_EQ(document["results"], plain["results"]) << groupBy;
    }
}

// The sequence's file name in a detail "[SEQUENCE]: <path>".
std::string SequenceName(const std::string& detail) {
    return fs::path(detail.substr(detail.find(": ") + 2)).filename().string();
}

TEST_F(TriageTest, PairsGatherEveryConflictOfTwoSequencesUnderOneHeading) {
    const nlohmann::json document = JsonRun({"--group-by", "pair"});
    std::size_t conflicts = 0;
    for (const nlohmann::json& group : document["groups"]) {
        const std::string title = group["title"];
        std::set<std::set<std::string>> pairs;
        for (const nlohmann::json& position : group["results"]) {
            const nlohmann::json& result = document["results"][position.get<int>()];
            const int number = result["messageNumber"];
            if (number != 43 && number != 47 && number != 48) {
                EXPECT_THAT(title, AnyOf(StartsWith("Inside "), Eq("Other results"))) << number;
                continue;
            }
            ++conflicts;
            std::set<std::string> sequences;
            std::string show;
            for (const nlohmann::json& detail : result["details"]) {
                const std::string text = detail;
                if (text.starts_with("[SEQUENCE]: "))
                    sequences.insert(SequenceName(text));
                if (text.starts_with("[SHOW]: "))
                    show = fs::path(text.substr(8)).filename().string();
            }
            pairs.insert(sequences);
            for (const std::string& sequence : sequences)
                EXPECT_THAT(title, HasSubstr(sequence + " ("));
            EXPECT_THAT(title, ::testing::EndsWith(", show " + show));
        }
        // One pair of sequences per group.
        EXPECT_LE(pairs.size(), 1u) << title;
    }
    EXPECT_GE(conflicts, 50u);
}

TEST_F(TriageTest, StatisticsFitOnOneScreenAndCountEveryResult) {
    const std::map<std::string, int> counts = SeverityCounts();
    const Outcome outcome = Run({"--group-by", "pair", "--statistics"});
    EXPECT_EQ(outcome.status, 2);
    const std::vector<std::string> lines = Lines(outcome.out);
    EXPECT_LE(lines.size(), 40u) << outcome.out;
    ASSERT_EQ(lines.front(), "Results by message:");
    static const std::regex statistic("^ +([0-9,]+)  (Error|Warning|Info) ([0-9]+): .*");
    int counted = 0;
    int previous = INT32_MAX;
    std::size_t n = 1;
    for (; n < lines.size() && !lines[n].empty(); ++n) {
        std::smatch match;
        ASSERT_TRUE(std::regex_match(lines[n], match, statistic)) << lines[n];
        const int count = std::stoi(std::regex_replace(match[1].str(), std::regex(","), ""));
        EXPECT_LE(count, previous) << lines[n];
        previous = count;
        counted += count;
    }
    EXPECT_EQ(counted, counts.at("Error") + counts.at("Warning"));
    EXPECT_THAT(lines[n + 1], AllOf(StartsWith("Results by sequence pair: "),
                                    HasSubstr(" groups, the 10 with the worst and most results:")));
    // The errors are among the other results, named first.
    EXPECT_THAT(lines[n + 2], ::testing::EndsWith("  Other results"));
    EXPECT_THAT(outcome.out, Not(HasSubstr("[SEQUENCE]: ")));
}

TEST_F(TriageTest, FailOnDecidesWhichFindingsMakeTheStatus) {
    EXPECT_EQ(Run({}).status, 2);
    EXPECT_EQ(Run({"--fail-on", "error"}).status, 2);
    EXPECT_EQ(Run({"--fail-on", "never"}).status, 0);
    // The severity shown does not change what counts.
    EXPECT_EQ(Run({"--severity", "error", "--fail-on", "warning"}).status, 2);

    std::set<int> errors;
    std::set<int> warnings;
    const nlohmann::json document = JsonRun();
    for (const nlohmann::json& result : document["results"])
        (result["severity"] == 2 ? errors : warnings).insert(result["messageNumber"].get<int>());
    for (const int number : errors) {
        ASSERT_EQ(testing::RunMain({"ignore", "--message", std::to_string(number), "--registry",
                                    installation_.registryFile})
                      .status,
                  0);
    }
    EXPECT_EQ(Run({}).status, 1);
    EXPECT_EQ(Run({"--fail-on", "warning"}).status, 1);
    EXPECT_EQ(Run({"--fail-on", "error"}).status, 0);
    EXPECT_EQ(Run({"--fail-on", "never"}).status, 0);

    for (const int number : warnings) {
        ASSERT_EQ(testing::RunMain({"ignore", "--message", std::to_string(number), "--registry",
                                    installation_.registryFile})
                      .status,
                  0);
    }
    for (const char* failOn : {"warning", "error", "never"})
        EXPECT_EQ(Run({"--fail-on", failOn}).status, 0) << failOn;
}

TEST_F(TriageTest, ColourOnlyOnATerminalOrWhenAskedFor) {
    const auto colored = [](const Outcome& outcome) {
        return outcome.out.find("\x1b[1;31mError ") != std::string::npos;
    };
    EXPECT_FALSE(colored(Run({})));
    EXPECT_TRUE(colored(Run({}, true)));
    EXPECT_TRUE(colored(Run({"--color", "always"})));
    EXPECT_FALSE(colored(Run({"--color", "never"}, true)));
    {
        testsupport::ScopedEnvironment noColor("NO_COLOR", "1");
        EXPECT_FALSE(colored(Run({}, true)));
        EXPECT_TRUE(colored(Run({"--color", "always"}, true)));
    }
    {
        testsupport::ScopedEnvironment dumb("TERM", "dumb");
        EXPECT_FALSE(colored(Run({}, true)));
    }
    {
        testsupport::ScopedEnvironment empty("NO_COLOR", "");
        EXPECT_TRUE(colored(Run({}, true)));
    }
    // The JSON is never coloured.
    EXPECT_EQ(Run({"--format", "json", "--color", "always"}).out.find('\x1b'), std::string::npos);
}

TEST_F(TriageTest, OutputChoosesTheReportByTheFileExtension) {
    const std::string json = folder_.File("report.JSON");
    const Outcome outcome = Run({"--format", "json", "--group-by", "show", "--output", json});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(ReadFileBytes(json), outcome.out);
    EXPECT_EQ(nlohmann::json::parse(ReadFileBytes(json))["program"], "vantori-verify");

    // The text listing on standard output does not change what the file holds.
    const std::string fromText = folder_.File("from-text.json");
    EXPECT_EQ(Run({"--group-by", "show", "--output", fromText}).status, 2);
    EXPECT_EQ(ReadFileBytes(fromText), ReadFileBytes(json));

    // Any other name gets the text report of the suite.
    for (const char* name : {"report.txt", "report", "report.json.txt"}) {
        const std::string text = folder_.File(name);
        EXPECT_EQ(Run({"--output", text}).status, 2);
        EXPECT_THAT(ReadFileBytes(text), StartsWith("Message Number: ")) << name;
    }
}

TEST_F(TriageTest, ABaselineListsOnlyWhatIsNewAndTakesTheStatusFromIt) {
    const std::string baseline = folder_.File("nightly.json");
    const std::string storeBefore = ReadFileBytes(installation_.registryFile);
    const nlohmann::json first = JsonRun({"--write-baseline", baseline});
    const std::size_t results = first["results"].size();
    const nlohmann::json written = nlohmann::json::parse(ReadFileBytes(baseline));
    EXPECT_EQ(written["vantoriVerifyBaseline"], 1);
    EXPECT_EQ(written["keys"].size(), results);
    EXPECT_EQ(written["keys"][0], first["results"][0]["ignoreKey"]);

    // Nothing new: nothing listed, and a clean status.
    Outcome outcome = Run({"--baseline", baseline});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.err, "");
    EXPECT_THAT(ResultLines(outcome.out), IsEmpty());
    EXPECT_THAT(outcome.out, HasSubstr(" 0 errors, 0 warnings, 0 ignored results. " +
                                       FormatCount(static_cast<int64_t>(results)) +
                                       " results in the baseline not listed.\n"));

    // One more missing sequence in the first show: only its result is new.
    const ShowPtr show = ShowFunctions::LoadShowFile(installation_.showFiles[0]);
    ASSERT_TRUE(show);
    const std::string missing = (fs::path(installation_.nonMediaFolder) / "Vanished.las").string();
    ASSERT_FALSE(fs::exists(missing));
    show->Musical()->List().push_back(missing);
    WriteFileBytes(installation_.showFiles[0], ShowFunctions::ShowToText(*show));

    outcome = Run({"--baseline", baseline});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_THAT(ResultLines(outcome.out),
                ::testing::ElementsAre("Error 23: Sequence file does not exist"));
    EXPECT_THAT(outcome.out, HasSubstr("    [SEQUENCE]: " + missing + "\n"));
    const nlohmann::json document = JsonRun({"--baseline", baseline});
    ASSERT_EQ(document["results"].size(), 1u);
    EXPECT_EQ(document["baseline"]["inBaseline"], results);
    EXPECT_EQ(document["baseline"]["file"], baseline);
    EXPECT_EQ(Run({"--baseline", baseline, "--fail-on", "never"}).status, 0);

    // The same file compared and then replaced, as a nightly script does.
    EXPECT_EQ(Run({"--baseline", baseline, "--write-baseline", baseline}).status, 2);
    EXPECT_EQ(Run({"--baseline", baseline}).status, 0);
    // The suite's ignore lists are never touched.
    EXPECT_EQ(ReadFileBytes(installation_.registryFile), storeBefore);
}

TEST_F(TriageTest, ABaselineNeverReplacesAFileTheRunRead) {
    for (const std::string& input : {installation_.weeklyScheduleFile, installation_.registryFile,
                                     installation_.showFiles[1], installation_.sequenceFiles[0]}) {
        const std::string before = ReadFileBytes(input);
        const Outcome outcome = Run({"--write-baseline", input});
        EXPECT_EQ(outcome.status, 3) << input;
        EXPECT_EQ(outcome.err, "vantori-verify: Cannot save the baseline as " + input +
                                   ": this verification read that file; the verifier never "
                                   "changes the files it verifies. Choose another file.\n");
        EXPECT_EQ(ReadFileBytes(input), before) << input;
    }
}

TEST_F(TriageTest, ABaselineThatCannotBeReadStopsTheRunWithTheReason) {
    const std::string missing = folder_.File("none.json");
    Outcome outcome = Run({"--baseline", missing});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.out, "");
    EXPECT_EQ(outcome.err, "vantori-verify: the baseline " + missing +
                               " does not exist; make it with --write-baseline " + missing + "\n");

    const std::string garbage = folder_.File("garbage.json");
    for (const std::string& text :
         {std::string("not json"), std::string("{\"keys\": []}"),
          std::string("{\"vantoriVerifyBaseline\": 1, \"keys\": [1]}"),
          std::string("{\"vantoriVerifyBaseline\": 1, \"keys\": [\"escaped:\\\\q\"]}")}) {
        WriteFileBytes(garbage, text);
        outcome = Run({"--baseline", garbage});
        EXPECT_EQ(outcome.status, 3) << text;
        EXPECT_THAT(outcome.err, StartsWith("vantori-verify: the baseline " + garbage + " "))
            << text;
    }
    EXPECT_TRUE(fs::is_empty(TempDir()));
}

// Paths that are not UTF-8 (a folder named in another code page) make keys that are not
// UTF-8 either; the JSON carries them in a form "ignore --key" takes back exactly.
#ifndef _WIN32
class ForeignBytesDemoTest : public testing::DemoTest {};

TEST_F(ForeignBytesDemoTest, AResultWhosePathIsNotUtf8CanBeIgnoredByItsKey) {
    const std::string show = Demo("data/shows/Caf\xE9.lss");
    const auto missingShow = [&](const nlohmann::json& document) {
        for (const nlohmann::json& result : document["results"]) {
            if (result["messageNumber"] == 21)
                return result;
        }
        return nlohmann::json();
    };
    nlohmann::json found =
        missingShow(nlohmann::json::parse(Run({"--show", show, "--format", "json"}).out));
    ASSERT_FALSE(found.is_null());
    EXPECT_EQ(found["ignored"], false);
    const std::string key = found["ignoreKey"];
    EXPECT_EQ(key, "escaped:21-" + Demo("data/shows/Caf") + "\\xE9.lss / ");

    const Outcome ignored = Run({"ignore", "--key", key});
    EXPECT_EQ(ignored.status, 0);
    EXPECT_EQ(ignored.out, "The result \"" + key + "\" will be ignored.\n");
    LibVerify::IgnoredResultKeys().Clear();

    const Outcome again = Run({"--show", show, "--format", "json"});
    found = missingShow(nlohmann::json::parse(again.out));
    EXPECT_EQ(found["ignored"], true);
    EXPECT_EQ(found["ignoreKey"], key);

    // A baseline keeps the key as exactly.
    const std::string baseline = folder_.File("baseline.json");
    Run({"--show", show, "--write-baseline", baseline});
    const Outcome compared = Run({"--show", show, "--baseline", baseline, "--format", "json"});
    EXPECT_EQ(compared.status, 0);
    EXPECT_EQ(nlohmann::json::parse(compared.out)["results"], nlohmann::json::array());
}
#endif

}  // namespace
}  // namespace vtr::cli
