// What the command line says about the settings store it uses: a store that is missing or
// cannot be read is named on standard error before the results, with how it was chosen and
// what to do; the verification still runs (on an empty store). The JSON output names the
// store. A store the ignore commands cannot change is reported with the reason, status 3.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <filesystem>

#include "cli/CliTestSupport.h"
#include "engine/LibVerify.h"
#include "support/TempStore.h"

namespace vtr::cli {
namespace {

using ::testing::HasSubstr;
using testing::Outcome;
using testing::RunMain;
using ::testing::StartsWith;

class StoreNoticesTest : public testsupport::StoreTest {
  protected:
    StoreNoticesTest()
        : noStore_("VANTORI_REGISTRY", std::nullopt), config_("XDG_CONFIG_HOME", Config()) {}
    void TearDown() override {
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
    }
    std::string Config() const { return folder_.File("config"); }
    std::string DefaultStore() const { return Config() + "/vantori/registry.reg"; }

  private:
    testsupport::ScopedEnvironment noStore_;
    testsupport::ScopedEnvironment config_;
};

// The empty installation gives "Vantori is not fully installed" whatever the store's trouble.
constexpr const char* kEmptyInstallationResults = "Error 3: Vantori is not fully installed\n";

TEST_F(StoreNoticesTest, AMissingStoreIsNamedWithHowItWasChosenAndTheRunGoesOn) {
#ifdef _WIN32
    // With neither --registry nor VANTORI_REGISTRY the store is the Windows registry, which
    // is always there: nothing to say about it, and no file is looked for or made.
    Outcome outcome = RunMain({"--schedule", "--quiet", "--format", "json"});
    EXPECT_EQ(outcome.err, "");
    const nlohmann::json registry = nlohmann::json::parse(outcome.out);
    EXPECT_TRUE(registry["store"]["path"].is_null());
    EXPECT_EQ(registry["store"]["chosenBy"], "registry");
#else
    Outcome outcome = RunMain({"--schedule", "--quiet"});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.err, "vantori-verify: the settings store " + DefaultStore() +
                               " (the per-user default, as neither --registry nor "
                               "VANTORI_REGISTRY names one) does not exist; verifying with no "
                               "settings. Name the suite's exported settings with --registry "
                               "FILE or the environment variable VANTORI_REGISTRY.\n");
    EXPECT_THAT(outcome.out, StartsWith(kEmptyInstallationResults));
#endif
    EXPECT_FALSE(std::filesystem::exists(DefaultStore()));

    testsupport::ScopedEnvironment named("VANTORI_REGISTRY", folder_.File("typo.reg"));
    outcome = RunMain({"--schedule", "--quiet", "--format", "json"});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_THAT(outcome.err,
                StartsWith("vantori-verify: the settings store " + folder_.File("typo.reg") +
                           " (named by VANTORI_REGISTRY) does not exist; "));
    const nlohmann::json json = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(json["store"]["path"], folder_.File("typo.reg"));
    EXPECT_EQ(json["store"]["chosenBy"], "environment");
    EXPECT_EQ(json["store"]["exists"], false);

    // Named with --registry, a missing file is refused before anything runs.
    outcome = RunMain({"--schedule", "--registry", folder_.File("typo.reg")});
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.out, "");
}

TEST_F(StoreNoticesTest, AFileThatIsNotARegistryExportIsNamedAndLeftAlone) {
    WriteStore("AppPath=/opt/vantori\n");
    const Outcome outcome = RunMain({"--schedule", "--quiet", "--registry", StoreFile()});
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.err, "vantori-verify: the settings store " + StoreFile() +
                               " (named with --registry) exists but could not be read as a "
                               "registry export (its first line is neither \"Windows Registry "
                               "Editor Version 5.00\" nor \"REGEDIT4\"); verifying with no "
                               "settings. Export the suite's settings again, or name another "
                               "file with --registry FILE or VANTORI_REGISTRY.\n");
    EXPECT_THAT(outcome.out, StartsWith(kEmptyInstallationResults));
    EXPECT_EQ(ReadStore(), "AppPath=/opt/vantori\n");
}

TEST_F(StoreNoticesTest, AStoreThatReadsWellGoesUnmentionedButTheJsonNamesIt) {
    WriteStore("Windows Registry Editor Version 5.00\r\n");
    const Outcome outcome =
        RunMain({"--schedule", "--quiet", "--format", "json", "--registry", StoreFile()});
    EXPECT_EQ(outcome.err, "");
    const nlohmann::json json = nlohmann::json::parse(outcome.out);
    EXPECT_EQ(json["store"], nlohmann::json({{"path", StoreFile()},
                                             {"chosenBy", "option"},
                                             {"exists", true},
                                             {"understood", true},
                                             {"readOnly", false}}));
}

TEST_F(StoreNoticesTest, IgnoringInAReadOnlyStoreSaysSoAndChangesNothing) {
    const std::string text =
        "Windows Registry Editor Version 5.00\r\n\r\n"
        "[HKEY_CURRENT_USER\\Software\\Vantori\\Verifier]\r\n"
        "\"CountIgnoreMsgNum\"=dword:00000001\r\n\"IgnoreMsgNum1\"=\"23\"\r\n";
    WriteStore(text);
    std::filesystem::permissions(
        StoreFile(), std::filesystem::perms::owner_read | std::filesystem::perms::group_read);
    for (const std::vector<std::string>& arguments :
         {std::vector<std::string>{"ignore", "--message", "41"},
          std::vector<std::string>{"unignore", "--message", "23"},
          std::vector<std::string>{"ignore", "--key", "20-x / "}}) {
        std::vector<std::string> withStore = arguments;
        withStore.insert(withStore.end(), {"--registry", StoreFile()});
        const Outcome outcome = RunMain(withStore);
        EXPECT_EQ(outcome.status, 3) << arguments[0];
        EXPECT_EQ(outcome.out, "");
        EXPECT_EQ(outcome.err, "vantori-verify: the settings store is read-only: " + StoreFile() +
                                   " (its permissions do not allow writing; it was left as it "
                                   "is)\n");
    }
    EXPECT_EQ(ReadStore(), text);
    // Listing reads it as it is.
    const Outcome listed = RunMain({"ignored", "--registry", StoreFile()});
    EXPECT_EQ(listed.status, 0);
    EXPECT_THAT(listed.out, HasSubstr("    23\n"));
}

}  // namespace
}  // namespace vtr::cli
