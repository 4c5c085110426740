#include "IgnoreCommands.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include "cli/CliTestSupport.h"
#include "engine/LibVerify.h"
#include "support/TempStore.h"

namespace vtr::cli {
namespace {

using ::testing::HasSubstr;
using ::testing::Not;
using testing::Outcome;
using testing::RunMain;

class IgnoreCommandsTest : public testsupport::StoreTest {
  protected:
    // The commands leave the lists they read in the driver's memory; later tests start clean.
    void TearDown() override {
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
    }

    Outcome Run(std::vector<std::string> arguments) {
        arguments.push_back("--registry");
        arguments.push_back(StoreFile());
        return RunMain(arguments);
    }
};

TEST_F(IgnoreCommandsTest, MessageNumbersAreAddedOnceAndRemovedCompactly) {
    Outcome outcome = Run({"ignore", "--message", "23"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out, "Results with message number 23 will be ignored.\n");
    EXPECT_EQ(outcome.err, "");
    EXPECT_THAT(ReadStore(), HasSubstr("[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]"));
    EXPECT_THAT(ReadStore(), HasSubstr("\"IgnoreMsgNum1\"=\"23\""));
    EXPECT_THAT(ReadStore(), HasSubstr("\"CountIgnoreMsgNum\"=dword:00000001"));

    const std::string before = ReadStore();
    outcome = Run({"ignore", "--message", "23"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out, "Results with message number 23 are already ignored.\n");
    EXPECT_EQ(ReadStore(), before);

    EXPECT_EQ(Run({"ignore", "--message", "44"}).status, 0);
    outcome = Run({"unignore", "--message", "23"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out, "Results with message number 23 are no longer ignored.\n");
    // The list is rewritten from its first entry and its count lowered.
    EXPECT_THAT(ReadStore(), HasSubstr("\"IgnoreMsgNum1\"=\"44\""));
    EXPECT_THAT(ReadStore(), HasSubstr("\"CountIgnoreMsgNum\"=dword:00000001"));

    outcome = Run({"unignore", "--message", "23"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out, "Results with message number 23 were not ignored.\n");
}

TEST_F(IgnoreCommandsTest, SingleResultsByKeyAndTheListingOfBothLists) {
    const std::string key = "23-[SEQUENCE]: /s/a, b.las / [SHOW]: show /x / y.lss / ";
    Outcome outcome = Run({"ignore", "--key", key});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out, "The result \"" + key + "\" will be ignored.\n");
    EXPECT_EQ(Run({"ignore", "--key", "20-"}).status, 0);
    EXPECT_EQ(Run({"ignore", "--message", "6"}).status, 0);

    outcome = Run({"ignored"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out,
              "Ignored message numbers:\n"
              "    6\n"
              "Ignored results:\n"
              "    \"" +
                  key +
                  "\"\n"
                  "    \"20-\"\n");

    outcome = Run({"ignored", "--format", "json"});
    EXPECT_EQ(outcome.status, 0);
    const nlohmann::json document = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(document["messageNumbers"], (nlohmann::json{"6"}));
    EXPECT_EQ(document["results"], (nlohmann::json{key, "20-"}));

    outcome = Run({"unignore", "--key", key});
    EXPECT_EQ(outcome.out, "The result \"" + key + "\" is no longer ignored.\n");
    outcome = Run({"unignore", "--key", key});
    EXPECT_EQ(outcome.out, "The result \"" + key + "\" was not ignored.\n");
    outcome = Run({"ignore", "--key", "20-"});
    EXPECT_EQ(outcome.out, "The result \"20-\" is already ignored.\n");
}

TEST_F(IgnoreCommandsTest, AnEmptyStoreListsNothingAndIsNotCreatedByListing) {
    const Outcome outcome = Run({"ignored"});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out, "Ignored message numbers:\n    (none)\nIgnored results:\n    (none)\n");
    EXPECT_FALSE(std::filesystem::exists(StoreFile()));
}

TEST_F(IgnoreCommandsTest, AKeyNoResultCanHaveIsWrongUsageAndChangesNothing) {
    WriteStore("Windows Registry Editor Version 5.00\r\n");
    for (const char* key : {"", "23", "-23", "x-a / ", "023-a / ", "+5-", "escaped:7-a\\",
                            "escaped:7-\\q", "escaped:7-\\x4"}) {
        const Outcome outcome = Run({"ignore", "--key", key});
        EXPECT_EQ(outcome.status, 64) << key;
        EXPECT_EQ(outcome.out, "") << key;
        EXPECT_THAT(outcome.err, HasSubstr("is not a result's key")) << key;
    }
    EXPECT_EQ(ReadStore(), "Windows Registry Editor Version 5.00\r\n");
}

TEST_F(IgnoreCommandsTest, AKeyIsTakenWithOrWithoutItsLastSeparator) {
    const std::string key = "28-[SEQUENCE]: /s/Snowfall.las / [CHANNEL]: Star / ";
    for (const std::string& given :
         {std::string("28-[SEQUENCE]: /s/Snowfall.las / [CHANNEL]: Star"),
          std::string("28-[SEQUENCE]: /s/Snowfall.las / [CHANNEL]: Star /"), key}) {
        const Outcome outcome = Run({"ignore", "--key", given});
        EXPECT_EQ(outcome.status, 0) << given;
        EXPECT_EQ(outcome.err, "") << given;
    }
    EXPECT_EQ(Run({"ignored"}).out,
              "Ignored message numbers:\n    (none)\nIgnored results:\n    \"" + key + "\"\n");
    const Outcome outcome = Run({"unignore", "--key",
                                 "28-[SEQUENCE]: /s/Snowfall.las / "
                                 "[CHANNEL]: Star"});
    EXPECT_EQ(outcome.out, "The result \"" + key + "\" is no longer ignored.\n");
    // A key without details stays as it is.
    EXPECT_EQ(Run({"ignore", "--key", "20-"}).out, "The result \"20-\" will be ignored.\n");
}

// Paths in another code page give keys that are not UTF-8: they are shown, listed and taken
// back in the escaped form, and the store keeps their bytes.
TEST_F(IgnoreCommandsTest, AKeyOfAnyBytesIsShownAndTakenInItsEscapedForm) {
    const std::string key = "21-C:\\Shows\\Caf\xE9.lss / ";
    const std::string text = "escaped:21-C:\\\\Shows\\\\Caf\\xE9.lss / ";
    Outcome outcome = Run({"ignore", "--key", text});
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.out, "The result \"" + text + "\" will be ignored.\n");
    LibVerify::IgnoredResultKeys().Clear();
    EXPECT_EQ(Run({"ignored"}).out,
              "Ignored message numbers:\n    (none)\nIgnored results:\n    \"" + text + "\"\n");
    EXPECT_EQ(nlohmann::json::parse(Run({"ignored", "--format", "json"}).out)["results"],
              (nlohmann::json{text}));
    EXPECT_TRUE(LibVerify::IgnoredResultKeys().Contains(key));

    // The key's own bytes, as a shell on Linux passes them, name the same result.
    outcome = Run({"ignore", "--key", key});
    EXPECT_EQ(outcome.out, "The result \"" + text + "\" is already ignored.\n");
    outcome = Run({"unignore", "--key", "escaped:21-C:\\\\Shows\\\\Caf\\xe9.lss"});
    EXPECT_EQ(outcome.out, "The result \"" + text + "\" is no longer ignored.\n");

    outcome = Run({"ignore", "--key", "escaped:21-C:\\Shows"});
    EXPECT_EQ(outcome.status, 64);
    EXPECT_EQ(outcome.err,
              "vantori-verify: \"escaped:21-C:\\Shows\" is not a result's key: after "
              "\"escaped:\", a backslash begins \"\\\\\" (one backslash) or \"\\x\" and two "
              "hexadecimal digits (one byte)\n");
}

TEST_F(IgnoreCommandsTest, AStoreThatCannotBeWrittenIsReportedAndLeftAsItWas) {
    const std::string garbage = "this is not a settings store\n\x01\x02";
    WriteStore(garbage);
    Outcome outcome = Run({"ignore", "--message", "23"});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.out, "");
    EXPECT_EQ(outcome.err, "vantori-verify: the settings store " + StoreFile() +
                               " is not a registry export (its first line is neither \"Windows "
                               "Registry Editor Version 5.00\" nor \"REGEDIT4\"); it was left "
                               "as it is\n");
    EXPECT_EQ(ReadStore(), garbage);

    // A store whose folder cannot be made (a file stands in the way).
    testsupport::WriteFileBytes(folder_.File("blocker"), "x");
    const std::string blocked = folder_.File("blocker") + "/registry.reg";
    outcome = RunMain({"ignore", "--key", "20-", "--registry", blocked});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_THAT(outcome.err, HasSubstr("could not be written: its folder " +
                                       folder_.File("blocker") + " could not be made"));
}

TEST(IgnoreKeyTest, AResultIsMadeWhoseKeyIsTheGivenOne) {
    for (const std::string key :
         {"20-", "23-A / ", "23-A / B / ", "5-a / b / c / ", "0- / ", "-7-x / ", "2147483647-"}) {
        const std::optional<Result> result = ResultFromIgnoreKey(key);
        ASSERT_TRUE(result) << key;
        EXPECT_EQ(result->IgnoreKey(), key);
    }
    EXPECT_EQ(ResultFromIgnoreKey("23-A / B / ")->MessageNumber(), 23);
    EXPECT_EQ(ResultFromIgnoreKey("-7-x / ")->MessageNumber(), -7);
    EXPECT_THAT(ResultFromIgnoreKey("20-")->Details(), ::testing::IsEmpty());
    for (const std::string key : {"", "-", "20", "2147483648-", "20-x", "20-x /", " 20-x / "})
        EXPECT_FALSE(ResultFromIgnoreKey(key)) << key;
}

}  // namespace
}  // namespace vtr::cli
