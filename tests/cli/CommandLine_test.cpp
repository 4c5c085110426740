#include "CommandLine.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

#include "VtrVersion.h"
#include "cli/CliTestSupport.h"

namespace vtr::cli {
namespace {

using ::testing::HasSubstr;
using ::testing::Not;
using testing::Parse;
using ::testing::StartsWith;

const char* const kMoreHelp = "\nRun with --help for more information.\n";

// Parses, expects wrong usage, and returns what was printed to standard error.
std::string UsageError(const std::vector<std::string>& arguments) {
    std::string out;
    std::string err;
    const ParseOutcome outcome = Parse(arguments, &out, &err);
    EXPECT_FALSE(outcome.options.has_value());
    EXPECT_EQ(outcome.exitStatus, ExitStatus::Usage);
    EXPECT_EQ(out, "");
    return err;
}

TEST(CommandLineTest, ChoosesEachTargetWithTheRunOptions) {
    ParseOutcome outcome = Parse({"--schedule"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->command, Command::Verify);
    EXPECT_EQ(outcome.options->target, TargetKind::Schedule);
    EXPECT_EQ(outcome.options->targetFile, "");
    EXPECT_EQ(outcome.options->format, OutputFormat::Text);
    EXPECT_FALSE(outcome.options->registry);
    EXPECT_FALSE(outcome.options->output);
    EXPECT_FALSE(outcome.options->log);
    EXPECT_FALSE(outcome.options->quiet);

    outcome = Parse({"--show", "a b.lss", "--registry", "r.reg", "--format", "json"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->target, TargetKind::Show);
    EXPECT_EQ(outcome.options->targetFile, "a b.lss");
    EXPECT_EQ(outcome.options->registry, "r.reg");
    EXPECT_EQ(outcome.options->format, OutputFormat::Json);

    outcome = Parse({"--sequence", "x.las", "--output", "report.txt", "--log", "--quiet"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->target, TargetKind::Sequence);
    EXPECT_EQ(outcome.options->targetFile, "x.las");
    EXPECT_EQ(outcome.options->output, "report.txt");
    EXPECT_TRUE(outcome.options->log);
    EXPECT_TRUE(outcome.options->quiet);
}

TEST(CommandLineTest, WrongUsageGivesSixtyFourWithTheReason) {
    EXPECT_EQ(UsageError({}), std::string("vantori-verify: choose what to verify: --schedule, "
                                          "--show FILE or --sequence FILE") +
                                  kMoreHelp);
    EXPECT_EQ(UsageError({"--schedule", "--show", "a.lss"}),
              std::string("vantori-verify: choose only one of --schedule, --show and --sequence") +
                  kMoreHelp);
    EXPECT_EQ(UsageError({"--show", ""}),
              std::string("vantori-verify: Please specify the show file to verify") + kMoreHelp);
    EXPECT_EQ(
        UsageError({"--sequence", ""}),
        std::string("vantori-verify: Please specify the sequence file to verify") + kMoreHelp);
    EXPECT_EQ(UsageError({"--schedule", "--output", ""}),
              std::string("vantori-verify: --output needs a file name") + kMoreHelp);
}

TEST(CommandLineTest, HelpAndVersionPrintToStandardOutputAndSucceed) {
    std::string out;
    std::string err;
    ParseOutcome outcome = Parse({"--version"}, &out, &err);
    EXPECT_FALSE(outcome.options);
    EXPECT_EQ(outcome.exitStatus, 0);
    EXPECT_EQ(out, std::string("vantori-verify ") + kVersionText + "\n");
    EXPECT_EQ(err, "");

    outcome = Parse({"--help"}, &out, &err);
    EXPECT_FALSE(outcome.options);
    EXPECT_EQ(outcome.exitStatus, 0);
    for (const char* text :
         {"\nUsage:\n  vantori-verify --schedule | --show FILE | --sequence FILE  [options]\n",
          "\n  --show FILE             one show file and its sequences\n",
          "\n  --severity LEVEL        list only results of this severity and worse: error,\n",
          "\n  -q, --quiet             no progress line on a terminal\n", "--group-by WHAT",
          "--statistics", "--fail-on LEVEL", "--format FORMAT", "--output FILE",
          "--color, --colour WHEN", "--log", "--baseline FILE", "--write-baseline FILE",
          "--registry FILE",
          "\nCommands:\n  ignore                  Ignore results in later verifications.\n",
          "\nExamples:\n  vantori-verify --schedule\n", "--group-by pair --statistics\n",
          "Exit status: 0", "130 when the run was cancelled."})
        EXPECT_THAT(out, HasSubstr(text));
    // The parser's own notation stays out of the help.
    for (const char* notation : {"TEXT", "INT", ":{", "Excludes", "NONNEGATIVE", "REQUIRED",
                                 "Subcommands", "SUBCOMMAND", "[OPTIONS]"})
        EXPECT_THAT(out, Not(HasSubstr(notation))) << notation;
    // Every line fits in 80 columns, but the examples that cannot be cut.
    std::istringstream lines(out);
    for (std::string line; std::getline(lines, line);) {
        if (!line.starts_with("  vantori-verify")) {
            EXPECT_LE(line.size(), 80u) << line;
        }
    }
    EXPECT_EQ(err, "");

    outcome = Parse({"ignore", "--help"}, &out, &err);
    EXPECT_EQ(outcome.exitStatus, 0);
    EXPECT_THAT(out, HasSubstr("\nUsage:\n  vantori-verify ignore --message N | --key KEY  "
                               "[--registry FILE]\n"));
    EXPECT_THAT(out, HasSubstr("  --message N             every result with this message "
                               "number: 0-7, 9-18,\n"
                               "                          20-33, 41-49 and 51-54\n"));
    EXPECT_THAT(out, HasSubstr("  --key KEY "));
    EXPECT_THAT(out, HasSubstr("\nExamples:\n  vantori-verify ignore --message 43\n"));
    for (const char* notation : {"TEXT", "INT", "Excludes", "NONNEGATIVE", "--schedule"})
        EXPECT_THAT(out, Not(HasSubstr(notation))) << notation;
}

TEST(CommandLineTest, TheCatalogsNumbersAreNamedWithTheirGaps) {
    EXPECT_EQ(CatalogRanges(), "0-7, 9-18, 20-33, 41-49 and 51-54");
}

TEST(CommandLineTest, IgnoreCommandsTakeOneOfMessageAndKeyAndTheStoreOnEitherSide) {
    ParseOutcome outcome = Parse({"ignore", "--message", "23"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->command, Command::Ignore);
    EXPECT_EQ(outcome.options->messageNumber, 23);
    EXPECT_FALSE(outcome.options->ignoreKey);

    outcome = Parse({"unignore", "--key", "23-a / ", "--registry", "r.reg"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->command, Command::Unignore);
    EXPECT_EQ(outcome.options->ignoreKey, "23-a / ");
    EXPECT_FALSE(outcome.options->messageNumber);
    EXPECT_EQ(outcome.options->registry, "r.reg");

    outcome = Parse({"--registry", "r.reg", "ignored", "--format", "json"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->command, Command::ListIgnored);
    EXPECT_EQ(outcome.options->registry, "r.reg");
    EXPECT_EQ(outcome.options->format, OutputFormat::Json);

    // Any whole number can be un-ignored, so that a stale entry can be removed.
    for (const char* number : {"9999", "-1", "8"}) {
        outcome = Parse({"unignore", "--message", number});
        ASSERT_TRUE(outcome.options) << number;
        EXPECT_EQ(outcome.options->messageNumber, std::stoi(number));
    }

    EXPECT_EQ(UsageError({"ignore"}),
              std::string("vantori-verify: \"ignore\" needs --message N or --key KEY") + kMoreHelp);
    EXPECT_EQ(UsageError({"ignore", "--message", "5", "--key", "5-"}),
              std::string("vantori-verify: \"ignore\" takes either --message N or --key KEY, not "
                          "both") +
                  kMoreHelp);
    EXPECT_EQ(UsageError({"--schedule", "ignored"}),
              std::string("vantori-verify: \"ignored\" cannot be combined with --schedule, an "
                          "option of a verification") +
                  kMoreHelp);
    EXPECT_EQ(UsageError({"ignore", "--message", "5", "--log", "--severity", "error"}),
              std::string("vantori-verify: \"ignore\" cannot be combined with --log or "
                          "--severity, options of a verification") +
                  kMoreHelp);
    EXPECT_EQ(UsageError({"ignore", "unignore", "--message", "5"}),
              std::string("vantori-verify: unexpected argument \"unignore\"") + kMoreHelp);
}

TEST(CommandLineTest, MessageNumbersAreCheckedAgainstTheCatalogInPlainWords) {
    const std::string numbers = "; the message numbers are 0-7, 9-18, 20-33, 41-49 and 51-54";
    EXPECT_EQ(UsageError({"ignore", "--message", "-1"}),
              "vantori-verify: there is no message -1" + numbers + kMoreHelp);
    EXPECT_EQ(UsageError({"ignore", "--message", "9999"}),
              "vantori-verify: there is no message 9999" + numbers + kMoreHelp);
    EXPECT_EQ(UsageError({"ignore", "--message", "8"}),
              "vantori-verify: there is no message 8" + numbers + kMoreHelp);
    EXPECT_EQ(
        UsageError({"unignore", "--message", "five"}),
        std::string("vantori-verify: --message takes a message number, not \"five\"") + kMoreHelp);
    EXPECT_EQ(
        UsageError({"ignore", "--message", "4.5"}),
        std::string("vantori-verify: --message takes a message number, not \"4.5\"") + kMoreHelp);
    EXPECT_EQ(UsageError({"unignore", "--message", "99999999999"}),
              std::string("vantori-verify: there is no message 99999999999") + kMoreHelp);
    EXPECT_EQ(Parse({"ignore", "--message", "0"}).options->messageNumber, 0);
    EXPECT_EQ(Parse({"ignore", "--message", "54"}).options->messageNumber, 54);
}

TEST(CommandLineTest, AMistypedOptionCommandOrValueGetsASuggestion) {
    const auto reason = [](const std::vector<std::string>& arguments) {
        const std::string err = UsageError(arguments);
        EXPECT_THAT(err, ::testing::EndsWith(kMoreHelp));
        return err.substr(0, err.size() - std::string(kMoreHelp).size());
    };
    EXPECT_EQ(reason({"--shedule"}),
              "vantori-verify: unknown option --shedule; did you mean --schedule?");
    EXPECT_EQ(reason({"--scheduel"}),
              "vantori-verify: unknown option --scheduel; did you mean --schedule?");
    EXPECT_EQ(reason({"--sched"}),
              "vantori-verify: unknown option --sched; did you mean --schedule?");
    EXPECT_EQ(reason({"--schedule", "--stats"}), "vantori-verify: unknown option --stats");
    EXPECT_EQ(reason({"--schedule", "--group=pair"}),
              "vantori-verify: unknown option --group; did you mean --group-by?");
    EXPECT_EQ(reason({"--frobnicate"}), "vantori-verify: unknown option --frobnicate");
    EXPECT_EQ(reason({"ignor", "--message", "5"}),
              "vantori-verify: unknown command \"ignor\"; did you mean \"ignore\"?");
    EXPECT_EQ(reason({"ignore", "--mesage", "5"}),
              "vantori-verify: unknown option --mesage; did you mean --message?");
    EXPECT_EQ(reason({"--message", "5"}),
              "vantori-verify: --message is an option of \"ignore\" and \"unignore\", e.g. "
              "vantori-verify ignore --message ...");
    EXPECT_EQ(reason({"--schedule", "stray"}),
              "vantori-verify: unexpected argument \"stray\" (a file to verify follows --show "
              "or --sequence)");
    EXPECT_EQ(reason({"--schedule", "--group-by", "pairs"}),
              "vantori-verify: --group-by takes message, show, sequence, pair or none, not "
              "\"pairs\"; did you mean pair?");
    EXPECT_EQ(reason({"--schedule", "--severity", "warn"}),
              "vantori-verify: --severity takes error, warning or info, not \"warn\"; did you "
              "mean warning?");
    EXPECT_EQ(reason({"--schedule", "--fail-on", "always"}),
              "vantori-verify: --fail-on takes warning, error or never, not \"always\"");
    EXPECT_EQ(reason({"--schedule", "--format", "xml"}),
              "vantori-verify: --format takes text, json, html or sarif, not \"xml\"");
    EXPECT_EQ(reason({"--schedule", "--color", "sometimes"}),
              "vantori-verify: --color takes auto, always or never, not \"sometimes\"");
    EXPECT_EQ(reason({"--show"}), "vantori-verify: --show needs a value: --show FILE");
    EXPECT_EQ(reason({"--schedule", "--baseline", ""}),
              "vantori-verify: --baseline needs a file name");
}

TEST(CommandLineTest, TriageOptionsAreReadInAnyLetterCase) {
    ParseOutcome outcome = Parse({"--schedule"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->minimumSeverity, Severity::Info);
    EXPECT_EQ(outcome.options->failOn, FailOn::Warning);
    EXPECT_EQ(outcome.options->groupBy, GroupBy::None);
    EXPECT_FALSE(outcome.options->statistics);
    EXPECT_EQ(outcome.options->color, ColorChoice::Auto);
    EXPECT_FALSE(outcome.options->baseline);
    EXPECT_FALSE(outcome.options->writeBaseline);

    outcome = Parse({"--schedule", "--severity", "Error", "--fail-on", "never", "--group-by",
                     "pair", "--statistics", "--colour", "ALWAYS", "--baseline", "a.json",
                     "--write-baseline", "b.json", "-q"});
    ASSERT_TRUE(outcome.options);
    EXPECT_EQ(outcome.options->minimumSeverity, Severity::Error);
    EXPECT_EQ(outcome.options->failOn, FailOn::Never);
    EXPECT_EQ(outcome.options->groupBy, GroupBy::SequencePair);
    EXPECT_TRUE(outcome.options->statistics);
    EXPECT_EQ(outcome.options->color, ColorChoice::Always);
    EXPECT_EQ(outcome.options->baseline, "a.json");
    EXPECT_EQ(outcome.options->writeBaseline, "b.json");
    EXPECT_TRUE(outcome.options->quiet);

    for (const auto& [word, groupBy] :
         std::vector<std::pair<std::string, GroupBy>>{{"message", GroupBy::Message},
                                                      {"show", GroupBy::Show},
                                                      {"sequence", GroupBy::Sequence},
                                                      {"none", GroupBy::None}})
        EXPECT_EQ(Parse({"--schedule", "--group-by", word}).options->groupBy, groupBy) << word;
    EXPECT_EQ(Parse({"--schedule", "--severity", "warning"}).options->minimumSeverity,
              Severity::Warning);
    EXPECT_EQ(Parse({"--schedule", "--fail-on", "error"}).options->failOn, FailOn::Error);
    EXPECT_EQ(Parse({"--schedule", "--color", "never"}).options->color, ColorChoice::Never);
    // The last of an option given twice counts.
    EXPECT_EQ(
        Parse({"--schedule", "--severity", "error", "--severity", "info"}).options->minimumSeverity,
        Severity::Info);
}

TEST(CommandLineTest, JobsTakeAWholeNumberOfProcessorsForAVerificationOnly) {
    EXPECT_EQ(Parse({"--schedule"}).options->jobs, 0);  // every processor
    EXPECT_EQ(Parse({"--schedule", "--jobs", "1"}).options->jobs, 1);
    EXPECT_EQ(Parse({"--show", "a.lss", "--jobs", "12"}).options->jobs, 12);
    for (const char* text : {"0", "-2", "two", "3x", "", "257"}) {
        const std::string wrong = text;
        EXPECT_EQ(UsageError({"--schedule", "--jobs", wrong}),
                  "vantori-verify: --jobs needs a number of processors from 1 to 256, not \"" +
                      wrong + "\"" + kMoreHelp)
            << wrong;
    }
    EXPECT_THAT(UsageError({"ignored", "--jobs", "2"}),
                HasSubstr("\"ignored\" cannot be combined with --jobs"));

    std::string out;
    std::string err;
    Parse({"--help"}, &out, &err);
    EXPECT_THAT(out, HasSubstr("--jobs N"));
}

}  // namespace
}  // namespace vtr::cli
