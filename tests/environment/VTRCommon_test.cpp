#include "environment/VTRCommon.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "engine/VtrError.h"
#include "environment/LibFile.h"
#include "environment/LibRegistryVTRShared.h"
#include "environment/LibSecurityTokens.h"
#include "environment/SuitePathService.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;
using LibRegistryVTRShared::SetSharedString;
using ::testing::StartsWith;

#ifdef _WIN32
constexpr char kSep = '\\';
#else
constexpr char kSep = '/';
#endif

class VTRCommonTest : public testsupport::StoreTest {};

TEST_F(VTRCommonTest, WithoutSettingsTheFoldersAreEmptyAndScheduleNamesAreBare) {
    EXPECT_EQ(VTRCommon::GetAppPath(), "");
    EXPECT_EQ(VTRCommon::GetUserDataPath(), "");
    EXPECT_EQ(VTRCommon::GetWeeklyScheduleFile(), "weeksched.lsc");
    EXPECT_EQ(VTRCommon::GetYearlyScheduleFile(), "yearsched.lsc");
}

TEST_F(VTRCommonTest, UserDataFolderIsKeptOnceReadButAppFolderIsReadEveryTime) {
    // An empty user-data folder is asked again on the next call.
    EXPECT_EQ(VTRCommon::GetUserDataPath(), "");
    SetSharedString("UserDataPath", "/shows/data", "");
    SetSharedString("AppPath", "C:\\Vantori\\", "");
    EXPECT_EQ(VTRCommon::GetUserDataPath(), std::string("/shows/data") + kSep);
    EXPECT_EQ(VTRCommon::GetAppPath(), "C:\\Vantori\\");
    EXPECT_EQ(VTRCommon::GetWeeklyScheduleFile(),
              std::string("/shows/data") + kSep + "weeksched.lsc");
    EXPECT_EQ(VTRCommon::GetYearlyScheduleFile(),
              std::string("/shows/data") + kSep + "yearsched.lsc");

    SetSharedString("UserDataPath", "/elsewhere/", "");
    SetSharedString("AppPath", "/opt/vantori", "");
    EXPECT_EQ(VTRCommon::GetUserDataPath(), std::string("/shows/data") + kSep);  // not seen
    EXPECT_EQ(VTRCommon::GetAppPath(), std::string("/opt/vantori") + kSep);      // seen

    VTRCommon::ResetCachedFolders();
    EXPECT_EQ(VTRCommon::GetUserDataPath(), "/elsewhere/");
}

TEST_F(VTRCommonTest, SuitePathServiceReadsTheTwoDataFoldersAsStored) {
    SetSharedString("NonMediaDataPath", "/data/nonmedia", "");
    SetSharedString("MediaDataPath", "D:\\Media", "");
    const SuitePathService paths;
    EXPECT_EQ(paths.GetPath(2), "/data/nonmedia");
    EXPECT_EQ(paths.GetPath(3), "D:\\Media");
    EXPECT_EQ(paths.GetPath(1), "");
    EXPECT_EQ(paths.GetPath(4), "");
    LibRegistry::DeleteRegistryKey(LibRegistry::kCurrentUser, "Software\\Vantori", "Shared");
    EXPECT_EQ(paths.GetPath(3), "");
}

TEST(LibFile, TrailingSeparatorIsAddedOnlyWhenMissing) {
    EXPECT_EQ(LibFile::AddTrailingBackslash(""), "");
    EXPECT_EQ(LibFile::AddTrailingBackslash("C:\\Data\\"), "C:\\Data\\");
    EXPECT_EQ(LibFile::AddTrailingBackslash("/data/"), "/data/");
    EXPECT_EQ(LibFile::AddTrailingBackslash("/data"), std::string("/data") + kSep);
    EXPECT_EQ(LibFile::AddTrailingBackslash("C:\\Data"), std::string("C:\\Data") + kSep);
}

TEST_F(VTRCommonTest, FilesAndFoldersAreToldApart) {
    const std::string file = folder_.File("show.lss");
    testsupport::WriteFileBytes(file, "()");
    EXPECT_TRUE(LibFile::FileExists(file));
    EXPECT_FALSE(LibFile::DirectoryExists(file));
    EXPECT_TRUE(LibFile::DirectoryExists(folder_.Path()));
    EXPECT_FALSE(LibFile::FileExists(folder_.Path()));
    EXPECT_FALSE(LibFile::FileExists(folder_.File("missing.lss")));
    EXPECT_FALSE(LibFile::DirectoryExists(folder_.File("missing")));
    EXPECT_FALSE(LibFile::FileExists(""));
    EXPECT_FALSE(LibFile::DirectoryExists(""));
}

TEST_F(VTRCommonTest, TempFilesAreNewEmptyAndUniqueInTheTempFolder) {
    const std::string first = LibFile::MakeTempFileName("VTRVer-WS-");
    const std::string second = LibFile::MakeTempFileName("VTRVer-WS-");
    EXPECT_NE(first, second);
    for (const std::string& name : {first, second}) {
        EXPECT_EQ(fs::path(name).parent_path(), fs::path(TempDir()));
        EXPECT_THAT(fs::path(name).filename().string(), StartsWith("VTRVer-WS-"));
        EXPECT_TRUE(LibFile::FileExists(name));
        EXPECT_EQ(fs::file_size(name), 0u);
    }
}

#ifndef _WIN32
TEST_F(VTRCommonTest, ATempFileThatCannotBeMadeRaisesError37) {
    testsupport::ScopedEnvironment missing("TMPDIR", folder_.File("no/such/folder"));
    try {
        LibFile::MakeTempFileName("VTRVer-Show-");
        FAIL() << "nothing raised";
    } catch (const VtrError& error) {
        EXPECT_EQ(error.Number(), ErrorNumbers::UserMessage);
        EXPECT_THAT(error.Description(), StartsWith("Cannot get temp file, error "));
        EXPECT_EQ(error.Description(), "Cannot get temp file, error " + std::to_string(ENOENT));
    }
}
#endif

TEST(VTRCommon, ProgramFolderIsTheFolderOfTheRunningExecutable) {
    const std::string folder = VTRCommon::GetProgramFolder();
    ASSERT_FALSE(folder.empty());
    EXPECT_EQ(folder.back(), kSep);
    // The tests run from their build folder.
    // (Without its trailing separator: the system's file status refuses a folder named with
    // one on Windows.)
    EXPECT_TRUE(fs::equivalent(fs::path(folder).parent_path(), fs::path(VTR_BINARY_DIR) / "tests"));
}

TEST(LibSecurityTokens, PrivilegesAreGrantedWhereTheyDoNotExist) {
#ifndef _WIN32
    EXPECT_TRUE(LibSecurityTokens::EnableTokenPrivilege("SeBackupPrivilege"));
    EXPECT_TRUE(LibSecurityTokens::DisableTokenPrivilege("SeBackupPrivilege"));
#else
    EXPECT_FALSE(LibSecurityTokens::EnableTokenPrivilege("NoSuchPrivilege"));
#endif
}

}  // namespace
}  // namespace vtr
