#include "CommandLine.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "VtrVersion.h"
#include "cli/CliTestSupport.h"

namespace vtr::cli {
namespace {

using ::testing::HasSubstr;
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

    EXPECT_THAT(UsageError({"--schedule", "--format", "xml"}), StartsWith("vantori-verify: "));
    EXPECT_THAT(UsageError({"--schedule", "--frobnicate"}), HasSubstr("--frobnicate"));
    EXPECT_THAT(UsageError({"--show"}), HasSubstr("--show"));
    EXPECT_THAT(UsageError({"--schedule", "stray"}), HasSubstr("stray"));
    EXPECT_THAT(UsageError({"--schedule", "--format", "xml"}), HasSubstr(kMoreHelp));
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
         {"--schedule", "--show", "--sequence", "--registry", "--format", "--output", "--log",
          "--quiet", "ignore", "unignore", "ignored", "Exit status: 0", "64 for wrong usage"})
        EXPECT_THAT(out, HasSubstr(text));
    EXPECT_EQ(err, "");

    outcome = Parse({"ignore", "--help"}, &out, &err);
    EXPECT_EQ(outcome.exitStatus, 0);
    EXPECT_THAT(out, HasSubstr("--message"));
    EXPECT_THAT(out, HasSubstr("--key"));
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

    EXPECT_EQ(UsageError({"ignore"}),
              std::string("vantori-verify: \"ignore\" needs --message N or --key KEY") + kMoreHelp);
    EXPECT_THAT(UsageError({"ignore", "--message", "5", "--key", "5-"}), HasSubstr("excludes"));
    EXPECT_THAT(UsageError({"ignore", "--message", "-1"}), StartsWith("vantori-verify: "));
    EXPECT_THAT(UsageError({"unignore", "--message", "five"}), StartsWith("vantori-verify: "));
    EXPECT_EQ(UsageError({"--schedule", "ignored"}),
              std::string("vantori-verify: \"ignored\" cannot be combined with a "
                          "verification's options (--schedule, --show, --sequence, "
                          "--output, --log, --quiet)") +
                  kMoreHelp);
    EXPECT_THAT(UsageError({"ignore", "--message", "5", "--log"}), HasSubstr("cannot be combined"));
    EXPECT_THAT(UsageError({"ignore", "unignore", "--message", "5"}),
                StartsWith("vantori-verify: "));
}

}  // namespace
}  // namespace vtr::cli
