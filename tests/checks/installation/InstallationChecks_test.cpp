// The installation and settings checks, each run on its own against a suite installed in
// the test's folder, and the installation tree as a whole run by the driver.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "VtrVersion.h"
#include "checks/installation/CheckAppFileExists.h"
#include "checks/installation/CheckAppFileVersion.h"
#include "checks/installation/CheckAppPathExists.h"
#include "checks/installation/CheckAppPathMatches.h"
#include "checks/installation/CheckAppPathRegEntry.h"
#include "checks/installation/CheckMediaPathExists.h"
#include "checks/installation/CheckMediaPathRegEntry.h"
#include "checks/installation/CheckNonMediaPathExists.h"
#include "checks/installation/CheckNonMediaPathRegEntry.h"
#include "checks/installation/CheckOldKRP.h"
#include "checks/installation/CheckPostInstall.h"
#include "checks/installation/CheckShowPlayerMemRestarts.h"
#include "checks/installation/CheckUseCompressedSequences.h"
#include "checks/installation/CheckUserDataPathExists.h"
#include "checks/installation/CheckUserDataPathRegEntry.h"
#include "checks/installation/CheckWMP.h"
#include "engine/LibVerify.h"
#include "environment/VTRCommon.h"
#include "support/VerifierFixture.h"
#include "vtrsupport/PeImage.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using testsupport::RegDword;
using testsupport::RegText;
using testsupport::ResultTexts;

class InstallationTest : public testsupport::SuiteTest {
  protected:
    // Runs the check alone; gives the descriptions of the checks it queued.
    template <typename CheckClass>
    std::vector<std::string> Run() {
        CheckClass check;
        RunAlone(check);
        return client.Lines("Added ");
    }
    std::vector<std::string> Run(ICheck& check) {
        RunAlone(check);
        return client.Lines("Added ");
    }
    void SetShared(const std::string& name, const std::string& value) {
        store["Shared"][name] = value;
        WriteSuiteStore();
    }
    void RemoveShared(const std::string& name) {
        store["Shared"].erase(name);
        WriteSuiteStore();
    }
};

TEST_F(InstallationTest, IdentifiersAndDescriptions) {
    struct Row {
        std::shared_ptr<ICheck> check;
        const char* identifier;
        const char* description;
    };
    auto file = std::make_shared<CheckAppFileExists>();
    file->SetFilename("SuiteCommon.dll");
    auto version = std::make_shared<CheckAppFileVersion>();
    version->SetFilename("SuiteCommon.dll");
    const Row rows[] = {
        {std::make_shared<CheckPostInstall>(), "0", "Vantori installation"},
        {std::make_shared<CheckAppPathRegEntry>(), "1", "Application path registry"},
        {std::make_shared<CheckAppPathExists>(), "2", "Application path existence"},
        {std::make_shared<CheckAppPathMatches>(), "3", "Verifier running from application path"},
        {file, "4_SuiteCommon.dll", "Application file existence: SuiteCommon.dll"},
        {version, "4_SuiteCommon.dll", "Application file version: SuiteCommon.dll"},
        {std::make_shared<CheckWMP>(), "6", "Windows Media Player version"},
        {std::make_shared<CheckUserDataPathRegEntry>(), "7", "User data path registry"},
        {std::make_shared<CheckUserDataPathExists>(), "8", "User data path existence"},
        {std::make_shared<CheckNonMediaPathRegEntry>(), "9", "Non-media path registry"},
        {std::make_shared<CheckNonMediaPathExists>(), "10", "Non-media data path existence"},
        {std::make_shared<CheckMediaPathRegEntry>(), "11", "Media path registry"},
        {std::make_shared<CheckMediaPathExists>(), "12", "Media data path existence"},
        {std::make_shared<CheckOldKRP>(), "33", "Old KR-P compatibility"},
        {std::make_shared<CheckUseCompressedSequences>(), "35", "Use Compressed Sequences"},
        {std::make_shared<CheckShowPlayerMemRestarts>(), "36", "Show Player Memory Restarts"},
    };
    for (const Row& row : rows) {
        EXPECT_EQ(row.check->CheckIdentifier(), row.identifier);
        EXPECT_EQ(row.check->Description(), row.description);
    }
}

TEST_F(InstallationTest, TheIdentifierFollowsTheFileName) {
    CheckAppFileExists check;
    check.SetFilename("a.dll");
    EXPECT_EQ(check.CheckIdentifier(), "4_a.dll");
    check.SetFilename("b.dll");
    EXPECT_EQ(check.CheckIdentifier(), "4_b.dll");
    EXPECT_EQ(check.ExpectedVersion(), std::to_string(kVersionMajor) + "." +
                                           std::to_string(kVersionMinor) + ".0." +
                                           std::to_string(kVersionPatch));
    EXPECT_EQ(CheckAppFileVersion().ExpectedVersion(), DefaultExpectedVersion());
}

TEST_F(InstallationTest, PostInstallNeedsVersion53AndTheDoneFlag) {
    EXPECT_THAT(Run<CheckPostInstall>(),
                ElementsAre("Application path registry", "User data path registry",
                            "Non-media path registry", "Media path registry",
                            "Use Compressed Sequences", "Show Player Memory Restarts"));
    EXPECT_THAT(ResultTexts(), IsEmpty());

    SetShared("PostInstallVer", RegDword(52));
    EXPECT_THAT(Run<CheckPostInstall>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("3:"));
    ASSERT_EQ(LibVerify::GetResults().size(), 1u);
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Vantori is not fully installed");
    EXPECT_EQ(LibVerify::GetResults()[0]->Severity(), Severity::Error);

    SetShared("PostInstallVer", RegDword(54));
    SetShared("PostInstall", RegDword(0));
    EXPECT_THAT(Run<CheckPostInstall>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("3:"));

    RemoveShared("PostInstall");
    RemoveShared("PostInstallVer");
    EXPECT_THAT(Run<CheckPostInstall>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("3:"));
}

TEST_F(InstallationTest, ApplicationPath) {
    EXPECT_THAT(Run<CheckAppPathRegEntry>(), ElementsAre("Application path existence"));
    EXPECT_THAT(ResultTexts(), IsEmpty());

    const auto queued = Run<CheckAppPathExists>();
    EXPECT_THAT(ResultTexts(), IsEmpty());
    ASSERT_EQ(queued.size(), 29u);
    EXPECT_EQ(queued[0], "Verifier running from application path");
    EXPECT_EQ(queued[1], "Application file existence: AudioEngineA.dll");
    EXPECT_EQ(queued[28], "Application file existence: XmlParserH.dll");

    fs::remove_all(AppFolder());
    EXPECT_THAT(Run<CheckAppPathExists>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("5: " + AppFolder()));

    // The folder as configured without its separator is reported with it.
    std::string bare = AppFolder();
    bare.pop_back();
    SetShared("AppPath", RegText(bare));
    EXPECT_THAT(Run<CheckAppPathExists>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("5: " + AppFolder()));

    RemoveShared("AppPath");
    EXPECT_THAT(Run<CheckAppPathRegEntry>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("4:"));
}

TEST_F(InstallationTest, TheApplicationFileListIsTheSuitesOwn) {
    const auto& files = CheckAppPathExists::ApplicationFiles();
    ASSERT_EQ(files.size(), 28u);
    std::vector<std::string> explicitVersions;
    for (const ApplicationFile& file : files) {
        if (file.expectedVersion != nullptr)
            explicitVersions.push_back(std::string(file.name) + " " + file.expectedVersion);
    }
    EXPECT_THAT(
        explicitVersions,
        ElementsAre("AudioEngineA.dll 9.2.3.1", "AudioDeckB.ocx 6.1.1.0", "AudioEditC.ocx 3.1.1.0",
                    "CommonControlsG.ocx 1.1.0.25", "XmlParserH.dll 2.5.0.0"));
    EXPECT_STREQ(files[3].name, "DigitalPortD.ocx");
    EXPECT_STREQ(files[22].name, "SuiteVerifier.exe");
    EXPECT_STREQ(files[25].name, "SimpleShowEdit.exe");

    // Each existence check carries its file's version on to the version check.
    InstallApplicationFiles();
    Run<CheckAppPathExists>();
    CheckAppFileExists deck;
    deck.SetFilename("AudioDeckB.ocx");
    deck.SetExpectedVersion("6.1.1.0");
    EXPECT_THAT(Run(deck), ElementsAre("Application file version: AudioDeckB.ocx"));
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(InstallationTest, VerifierFolderComparedWithoutLetterCase) {
    std::string own = VTRCommon::GetProgramFolder();
    ASSERT_FALSE(own.empty());
    std::string bare = own;
    bare.pop_back();
    SetShared("AppPath", RegText(bare));  // no trailing separator: added on reading
    Run<CheckAppPathMatches>();
    EXPECT_THAT(ResultTexts(), IsEmpty());

    std::string upper = own;
    for (char& c : upper)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    SetShared("AppPath", RegText(upper));
    Run<CheckAppPathMatches>();
    EXPECT_THAT(ResultTexts(), IsEmpty());

    SetShared("AppPath", RegText(AppFolder()));
    Run<CheckAppPathMatches>();
    EXPECT_THAT(ResultTexts(),
                ElementsAre("6: [APPLICATION]: " + AppFolder() + " | [VERIFIER]: " + own));
    EXPECT_EQ(LibVerify::GetResults()[0]->Severity(), Severity::Warning);
}

TEST_F(InstallationTest, AMissingFileGivesTheExistenceResultOnly) {
    CheckAppFileExists check;
    check.SetFilename("SuiteCommon.dll");
    EXPECT_THAT(Run(check), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("7: " + AppFolder() + "SuiteCommon.dll"));
}

TEST_F(InstallationTest, APresentFileWithTheWrongVersionGivesTheVersionResultOnly) {
    testsupport::WritePeImage(AppFolder() + "SuiteCommon.dll", "1.0.0.9");
    CheckAppFileExists exists;
    exists.SetFilename("SuiteCommon.dll");
    exists.SetExpectedVersion("1.0.0.3");
    EXPECT_THAT(Run(exists), ElementsAre("Application file version: SuiteCommon.dll"));
    EXPECT_THAT(ResultTexts(), IsEmpty());

    CheckAppFileVersion version;
    version.SetFilename("SuiteCommon.dll");
    version.SetExpectedVersion("1.0.0.3");
    Run(version);
    EXPECT_THAT(ResultTexts(), ElementsAre("16: [FILE]: " + AppFolder() +
                                           "SuiteCommon.dll | [EXPECTED]: 1.0.0.3 | "
                                           "[FOUND]: 1.0.0.9"));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(),
              "Application file has unexpected version number");

    version.SetExpectedVersion("1.0.0.9");
    Run(version);
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(InstallationTest, AFileWithoutVersionInformationIsReportedWithAnEmptyFoundVersion) {
    testsupport::WritePeImage(AppFolder() + "SuiteTray.exe");
    CheckAppFileVersion version;
    version.SetFilename("SuiteTray.exe");
    Run(version);
    ASSERT_EQ(LibVerify::GetResults().size(), 1u);
    EXPECT_THAT(LibVerify::GetResults()[0]->Details(),
                ElementsAre("[FILE]: " + AppFolder() + "SuiteTray.exe",
                            "[EXPECTED]: " + DefaultExpectedVersion(), "[FOUND]: "));

    // The comparison is exact: "1.0.0.0" is not "1.0.0.00".
    testsupport::WritePeImage(AppFolder() + "SuiteTray.exe", "1.0.0.0");
    version.SetExpectedVersion("1.0.0.00");
    Run(version);
    EXPECT_THAT(ResultTexts(), ElementsAre("16: [FILE]: " + AppFolder() +
                                           "SuiteTray.exe | [EXPECTED]: 1.0.0.00 | "
                                           "[FOUND]: 1.0.0.0"));
}

TEST_F(InstallationTest, MediaPlayerVersion) {
    Run<CheckWMP>();
    EXPECT_THAT(ResultTexts(), IsEmpty());
    for (const char* old : {"8.0.0.1", "12.0", "09.0.0.1"}) {
        store["Shared\\MediaPlayer"]["VersionInfo"] = RegText(old);
        WriteSuiteStore();
        Run<CheckWMP>();
        EXPECT_THAT(ResultTexts(), ElementsAre("9:")) << old;
        EXPECT_EQ(LibVerify::GetResults()[0]->Summary(),
                  "Unsupported version of Windows Media Player");
    }
}

TEST_F(InstallationTest, UserDataPath) {
    EXPECT_THAT(Run<CheckUserDataPathRegEntry>(), ElementsAre("User data path existence"));
    EXPECT_THAT(Run<CheckUserDataPathExists>(),
                ElementsAre("Weekly schedule file existence", "Yearly schedule file existence",
                            "At least one show scheduled"));
    EXPECT_THAT(ResultTexts(), IsEmpty());

    fs::remove_all(DataFolder());
    EXPECT_THAT(Run<CheckUserDataPathExists>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("11: " + DataFolder()));

    RemoveShared("UserDataPath");
    VTRCommon::ResetCachedFolders();  // a folder once read is kept for the process's life
    EXPECT_THAT(Run<CheckUserDataPathRegEntry>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("10:"));
}

TEST_F(InstallationTest, NonMediaAndMediaPaths) {
    EXPECT_THAT(Run<CheckNonMediaPathRegEntry>(), ElementsAre("Non-media data path existence"));
    EXPECT_THAT(Run<CheckMediaPathRegEntry>(), ElementsAre("Media data path existence"));
    Run<CheckNonMediaPathExists>();
    EXPECT_THAT(ResultTexts(), IsEmpty());
    Run<CheckMediaPathExists>();
    EXPECT_THAT(ResultTexts(), IsEmpty());

    // The path service's text is reported as stored, without a separator added.
    fs::remove_all(DataFolder() + "media");
    fs::remove_all(DataFolder() + "nonmedia");
    Run<CheckNonMediaPathExists>();
    EXPECT_THAT(ResultTexts(), ElementsAre("13: " + DataFolder() + "nonmedia"));
    EXPECT_EQ(LibVerify::GetResults()[0]->Severity(), Severity::Warning);
    Run<CheckMediaPathExists>();
    EXPECT_THAT(ResultTexts(), ElementsAre("15: " + DataFolder() + "media"));

    RemoveShared("NonMediaDataPath");
    RemoveShared("MediaDataPath");
    EXPECT_THAT(Run<CheckNonMediaPathRegEntry>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("12:"));
    EXPECT_THAT(Run<CheckMediaPathRegEntry>(), IsEmpty());
    EXPECT_THAT(ResultTexts(), ElementsAre("14:"));
}

TEST_F(InstallationTest, OldKRPIsReportedForEachNetworkWithAPort) {
    Run<CheckOldKRP>();
    EXPECT_THAT(ResultTexts(), IsEmpty());

    // The regular network has port 1 unless told otherwise; Aux C is on port 4; Aux D has
    // no port, so its flag does not matter.
    store["Shared\\Network"] = {{"OldKRP-NewRegVal", RegDword(1)}};
    store["Shared\\Network\\AuxC"] = {{"NetworkVantori", RegDword(4)},
                                      {"OldKRP-NewRegVal", RegDword(1)}};
    store["Shared\\Network\\AuxD"] = {{"OldKRP-NewRegVal", RegDword(1)}};
    WriteSuiteStore();
    Run<CheckOldKRP>();
    EXPECT_THAT(ResultTexts(), ElementsAre("44: Regular", "44: Aux C"));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Old KR-P compatibility enabled");

    store["Shared\\Network"]["NetworkVantori"] = RegDword(0);
    WriteSuiteStore();
    Run<CheckOldKRP>();
    EXPECT_THAT(ResultTexts(), ElementsAre("44: Aux C"));
}

TEST_F(InstallationTest, PlayerOptions) {
    Run<CheckUseCompressedSequences>();
    Run<CheckShowPlayerMemRestarts>();
    EXPECT_THAT(ResultTexts(), IsEmpty());

    SetShared("UseCompressedSequences", RegDword(0));
    store["Shared\\MonitorMemory"] = {{"MonitorRestart", RegDword(0)}};
    WriteSuiteStore();
    Run<CheckUseCompressedSequences>();
    ASSERT_THAT(ResultTexts(), ElementsAre("51:"));
    EXPECT_EQ(LibVerify::GetResults()[0]->HelpContextID(), 54);
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Use Compressed Sequences disabled");
    Run<CheckShowPlayerMemRestarts>();
    ASSERT_THAT(ResultTexts(), ElementsAre("52:"));
    EXPECT_EQ(LibVerify::GetResults()[0]->HelpContextID(), 55);
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "Show Player Memory Restarts disabled");

    // Any non-zero value is on.
    SetShared("UseCompressedSequences", RegDword(5));
    Run<CheckUseCompressedSequences>();
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

// --- The installation tree run by the driver -----------------------------------------

TEST_F(InstallationTest, EachApplicationFileIsCheckedForExistenceAndThenForItsVersion) {
    InstallApplicationFiles();
    testsupport::WritePeImage(AppFolder() + "AudioDeckB.ocx", "6.1.0.0");
    fs::remove(AppFolder() + "SuiteTray.exe");
    LibVerify::SetScheduleFiles(DataFile("weeksched.lsc"), DataFile("yearsched.lsc"));
    LibVerify::RunVerification();

    const auto ran = client.Lines("Checking ");
    const auto count = [&](const std::string& description) {
        return std::count(ran.begin(), ran.end(), description);
    };
    EXPECT_EQ(count("Application file existence: AudioDeckB.ocx"), 1);
    EXPECT_EQ(count("Application file version: AudioDeckB.ocx"), 1);
    EXPECT_EQ(count("Application file existence: SuiteTray.exe"), 1);
    EXPECT_EQ(count("Application file version: SuiteTray.exe"), 0);
    EXPECT_EQ(count("Application file version: XmlParserH.dll"), 1);

    const auto results = ResultTexts();
    EXPECT_THAT(results, ::testing::Contains("7: " + AppFolder() + "SuiteTray.exe"));
    EXPECT_THAT(results, ::testing::Contains("16: [FILE]: " + AppFolder() +
                                             "AudioDeckB.ocx | [EXPECTED]: 6.1.1.0 | "
                                             "[FOUND]: 6.1.0.0"));
    // A version check shares its existence check's identifier: recorded as done once.
    EXPECT_EQ(LibVerify::ChecksPerformedCount(),
              static_cast<int32_t>(ran.size()) - 27);  // 27 version checks ran
}

TEST_F(InstallationTest, AVersionCheckQueuedBesideItsExistenceCheckIsDropped) {
    InstallApplicationFiles();
    auto early = std::make_shared<CheckAppFileVersion>();
    early->SetFilename("SuiteCommon.dll");
    early->SetExpectedVersion("0.0.0.1");  // would fail if it ran
    auto late = std::make_shared<CheckAppFileVersion>();
    late->SetFilename("SuiteListener.exe");
    late->SetExpectedVersion("0.0.0.1");
    client.onLine = [&](const std::string& line) {
        if (line == "Completed Application path existence")  // existence checks pending
            LibVerify::AddCheck(early);
        if (line == "Completed Application file existence: SuiteListener.exe")  // done
            LibVerify::AddCheck(late);
    };
    LibVerify::SetScheduleFiles(DataFile("weeksched.lsc"), DataFile("yearsched.lsc"));
    LibVerify::RunVerification();
    client.onLine = nullptr;
    for (const std::string& result : ResultTexts())
        EXPECT_EQ(result.rfind("16:", 0), std::string::npos) << result;
}

}  // namespace
}  // namespace vtr
