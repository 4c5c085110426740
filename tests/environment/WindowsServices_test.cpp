// The Windows side of the platform services, against the system itself: temporary files
// through GetTempPathA, token privileges, the program folder, file versions (our reader
// must agree with GetFileVersionInfo) and the media player control through COM.
#ifdef _WIN32

#include <windows.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "engine/VtrError.h"
#include "environment/FileVersion.h"
#include "environment/LibFile.h"
#include "environment/LibSecurityTokens.h"
#include "environment/MediaPlayerProbe.h"
#include "environment/VTRCommon.h"
#include "support/TempStore.h"
#include "vtrsupport/PeImage.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;
using ::testing::StartsWith;

// ---- temporary files ------------------------------------------------------------------

class WindowsTempFileTest : public testsupport::StoreTest {
  protected:
    // The error MakeTempFileName raised: number, source and description.
    static VtrError Raised(const std::string& prefix) {
        try {
            LibFile::MakeTempFileName(prefix);
        } catch (const VtrError& error) {
            return error;
        }
        ADD_FAILURE() << "nothing raised";
        return VtrError(0, "", "");
    }
};

TEST_F(WindowsTempFileTest, FilesAreMadeInTheFolderTheSystemNamesWithTheWholePrefix) {
    char folder[MAX_PATH + 1];
    const DWORD length = GetTempPathA(sizeof folder, folder);
    ASSERT_GT(length, 0u);
    ASSERT_EQ(fs::path(std::string(folder, length)), fs::path(TempDir() + "\\"));

    std::vector<std::string> made;
    for (const char* prefix : {"VTRVer-Show-", "VTRVer-WS-", "VTRVer-YS-", "VTRVer-WS-"})
        made.push_back(LibFile::MakeTempFileName(prefix));
    EXPECT_THAT(made[0], StartsWith(std::string(folder, length) + "VTRVer-Show-"));
    EXPECT_THAT(made[1], StartsWith(std::string(folder, length) + "VTRVer-WS-"));
    EXPECT_THAT(made[2], StartsWith(std::string(folder, length) + "VTRVer-YS-"));
    EXPECT_NE(made[1], made[3]);
    for (const std::string& name : made) {
        const DWORD attributes = GetFileAttributesA(name.c_str());
        ASSERT_NE(attributes, INVALID_FILE_ATTRIBUTES) << name;
        EXPECT_EQ(attributes & FILE_ATTRIBUTE_DIRECTORY, 0u);
        EXPECT_EQ(fs::file_size(name), 0u);
    }
}

TEST_F(WindowsTempFileTest, AMissingTempFolderGivesTheSystemErrorNumber) {
    testsupport::ScopedEnvironment missing("TMP", folder_.File("no\\such\\folder"));
    const VtrError error = Raised("VTRVer-Show-");
    EXPECT_EQ(error.Number(), ErrorNumbers::UserMessage);
    EXPECT_EQ(error.Source(), "LibFile.MakeTempFileName");
    EXPECT_EQ(error.Description(),
              "Cannot get temp file, error " + std::to_string(ERROR_PATH_NOT_FOUND));
    EXPECT_FALSE(fs::exists(folder_.File("no")));
}

TEST_F(WindowsTempFileTest, ATempFolderTooLongForTheBufferIsRefused) {
    const std::string tooLong = folder_.Path() + "\\" + std::string(300, 'x');
    testsupport::ScopedEnvironment longFolder("TMP", tooLong);
    // What the system answers for a buffer of 261 characters decides the text.
    char buffer[261];
    SetLastError(ERROR_SUCCESS);
    const DWORD answer = GetTempPathA(sizeof buffer, buffer);
    const DWORD systemError = GetLastError();
    ASSERT_TRUE(answer == 0 || answer >= sizeof buffer) << answer;

    const VtrError error = Raised("VTRVer-WS-");
    EXPECT_EQ(error.Number(), ErrorNumbers::UserMessage);
    if (answer == 0) {
        EXPECT_EQ(error.Description(),
                  "Cannot get temp path, error " + std::to_string(systemError));
    } else {
        EXPECT_EQ(error.Description(), "Unexpected length of temp path, " + std::to_string(answer));
    }
}

// ---- token privileges -----------------------------------------------------------------

// Whether the process token holds the privilege, and then whether it is enabled; read
// straight from the token.
std::optional<bool> PrivilegeState(const std::string& name) {
    LUID id;
    if (!LookupPrivilegeValueA(nullptr, name.c_str(), &id))
        return std::nullopt;
    HANDLE token = nullptr;
    if (!OpenProcessToken(GetCurrentProcess(), TOKEN_QUERY, &token))
        return std::nullopt;
    DWORD size = 0;
    GetTokenInformation(token, TokenPrivileges, nullptr, 0, &size);
    std::vector<unsigned char> buffer(size);
    std::optional<bool> state;
    if (GetTokenInformation(token, TokenPrivileges, buffer.data(), size, &size)) {
        const auto* privileges = reinterpret_cast<const TOKEN_PRIVILEGES*>(buffer.data());
        for (DWORD i = 0; i < privileges->PrivilegeCount; ++i) {
            const LUID& held = privileges->Privileges[i].Luid;
            if (held.LowPart == id.LowPart && held.HighPart == id.HighPart)
                state = (privileges->Privileges[i].Attributes & SE_PRIVILEGE_ENABLED) != 0;
        }
    }
    CloseHandle(token);
    return state;
}

TEST(WindowsTokenPrivileges, AHeldPrivilegeIsEnabledAndDisabledOnTheToken) {
    for (const char* name : {"SeBackupPrivilege", "SeShutdownPrivilege"}) {
        const std::optional<bool> before = PrivilegeState(name);
        const bool held = before.has_value();
        EXPECT_EQ(LibSecurityTokens::EnableTokenPrivilege(name), held) << name;
        if (held) {
            EXPECT_EQ(PrivilegeState(name), std::optional<bool>(true)) << name;
        }
        EXPECT_EQ(LibSecurityTokens::DisableTokenPrivilege(name), held) << name;
        if (held) {
            EXPECT_EQ(PrivilegeState(name), std::optional<bool>(false)) << name;
        }
        if (before.value_or(false))
            LibSecurityTokens::EnableTokenPrivilege(name);  // as it was
    }
}

TEST(WindowsTokenPrivileges, UnknownOrUnheldPrivilegesFail) {
    EXPECT_FALSE(LibSecurityTokens::EnableTokenPrivilege("NoSuchPrivilege"));
    EXPECT_FALSE(LibSecurityTokens::DisableTokenPrivilege("NoSuchPrivilege"));
    // A privilege the system knows but the token lacks: the adjustment is only partial,
    // which counts as failure.
    for (const char* name :
         {"SeCreateTokenPrivilege", "SeAssignPrimaryTokenPrivilege", "SeLockMemoryPrivilege",
          "SeMachineAccountPrivilege", "SeTrustedCredManAccessPrivilege", "SeRelabelPrivilege"}) {
        LUID id;
        if (!LookupPrivilegeValueA(nullptr, name, &id) || PrivilegeState(name).has_value())
            continue;
        EXPECT_FALSE(LibSecurityTokens::EnableTokenPrivilege(name)) << name;
        EXPECT_FALSE(PrivilegeState(name).has_value()) << name;
        return;
    }
    GTEST_SKIP() << "the token holds every privilege tried";
}

// ---- program folder -------------------------------------------------------------------

TEST(WindowsProgramFolder, IsTheFolderOfTheRunningProgramWithABackslash) {
    char path[MAX_PATH * 4];
    const DWORD length = GetModuleFileNameA(nullptr, path, sizeof path);
    ASSERT_GT(length, 0u);
    const std::string program(path, length);
    const std::string expected = program.substr(0, program.find_last_of("\\/")) + "\\";
    EXPECT_EQ(VTRCommon::GetProgramFolder(), expected);
}

// ---- file versions --------------------------------------------------------------------

// Our reader's answer for a file, as text.
std::string OurVersion(const std::string& path) {
    const auto version = ReadPeFileVersion(path);
    return version ? FileVersionToText(*version) : "";
}

class WindowsFileVersionTest : public ::testing::Test {
  protected:
    testsupport::TempFolder folder_;
};

TEST_F(WindowsFileVersionTest, OurReaderAgreesWithTheSystemOnImagesWeWrite) {
    struct Case {
        const char* name;
        testsupport::PeImageOptions options;
        const char* expected;
    };
    std::vector<Case> cases = {
        {"plain.dll", {"1.0.0.0"}, "1.0.0.0"},
        {"player.dll", {"12.0.19041.1"}, "12.0.19041.1"},
        {"largest.dll", {"65535.65535.65535.65535"}, "65535.65535.65535.65535"},
        {"zero.dll", {"0.0.0.0"}, "0.0.0.0"},
        {"unversioned.exe", {""}, ""},
        {"wide.dll", {"4.3.2.1", true}, "4.3.2.1"},
        {"code-first.exe", {"7.0.0.9", false, true}, "7.0.0.9"},
        {"bad-signature.dll", {"1.2.3.4", false, false, 0xFEEF04BEu}, ""},
    };
    for (const Case& c : cases) {
        const std::string path = folder_.File(c.name);
        testsupport::WriteFileBytes(path, testsupport::PeImageBytes(c.options));
        EXPECT_EQ(FileVersionText(path), c.expected) << c.name;
        EXPECT_EQ(OurVersion(path), c.expected) << c.name;
    }
}

TEST_F(WindowsFileVersionTest, OurReaderAgreesWithTheSystemOnItsOwnFiles) {
    char system[MAX_PATH];
    const UINT length = GetSystemDirectoryA(system, sizeof system);
    ASSERT_GT(length, 0u);
    int versioned = 0;
    for (const char* name : {"kernel32.dll", "user32.dll", "advapi32.dll", "ole32.dll",
                             "oleaut32.dll", "version.dll", "shell32.dll", "notepad.exe"}) {
        const std::string path = std::string(system, length) + "\\" + name;
        if (GetFileAttributesA(path.c_str()) == INVALID_FILE_ATTRIBUTES)
            continue;
        const std::string expected = FileVersionText(path);
        EXPECT_EQ(OurVersion(path), expected) << path;
        if (!expected.empty())
            ++versioned;
    }
    EXPECT_GE(versioned, 3) << "the system's own libraries carry versions";

    // The test program itself has no version resource.
    char self[MAX_PATH * 4];
    const DWORD selfLength = GetModuleFileNameA(nullptr, self, sizeof self);
    const std::string program(self, selfLength);
    EXPECT_EQ(FileVersionText(program), "");
    EXPECT_EQ(OurVersion(program), "");
}

TEST_F(WindowsFileVersionTest, WhatIsNoImageHasNoVersionForEither) {
    const std::string text = folder_.File("notes.txt");
    testsupport::WriteFileBytes(text, "MZ but nothing more\r\n");
    for (const std::string& path :
         {text, folder_.File("missing.dll"), folder_.Path(), std::string()}) {
        EXPECT_EQ(FileVersionText(path), "") << path;
        EXPECT_EQ(OurVersion(path), "") << path;
    }
}

// ---- media player control -------------------------------------------------------------

TEST(WindowsMediaPlayer, AMissingControlGivesAnEmptyVersionThatFailsTheTest) {
    EXPECT_EQ(MediaPlayerProbe::ControlVersionText("Vantori.NoSuchControl.1"), "");
    EXPECT_FALSE(MediaPlayerProbe::IsVersionTextAtLeast("", 9));
}

TEST(WindowsMediaPlayer, AControlThatIsNoMediaPlayerCannotBeAsked) {
    // The scripting runtime's dictionary is registered on every system but has no media
    // player interface.
    CLSID classId;
    if (FAILED(CLSIDFromProgID(L"Scripting.Dictionary", &classId)))
        GTEST_SKIP() << "no scripting runtime here";
    try {
        MediaPlayerProbe::ControlVersionText("Scripting.Dictionary");
        FAIL() << "nothing raised";
    } catch (const VtrError& error) {
        EXPECT_EQ(error.Number(), ErrorNumbers::ObjectNotSet);
        EXPECT_EQ(error.Source(), "MediaPlayerProbe.VersionText");
        EXPECT_EQ(error.Description(),
                  "Asking the control for its core interface failed (0x80004002)");
    }
}

TEST(WindowsMediaPlayer, TheSystemControlsVersionIsReadAndJudged) {
    const std::string text = MediaPlayerProbe::VersionText();
    EXPECT_EQ(text, MediaPlayerProbe::ControlVersionText("WMPlayer.OCX"));
    if (!text.empty()) {
        EXPECT_EQ(std::count(text.begin(), text.end(), '.'), 3) << text;
    }
    EXPECT_EQ(MediaPlayerProbe::IsVersionAtLeast(9),
              MediaPlayerProbe::IsVersionTextAtLeast(text, 9));
    EXPECT_TRUE(MediaPlayerProbe::IsVersionAtLeast(0));
    // The store plays no part on Windows.
    testsupport::TempFolder folder;
    testsupport::WriteFileBytes(folder.File("registry.reg"),
                                "Windows Registry Editor Version 5.00\n\n"
                                "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\MediaPlayer]\n"
                                "\"VersionInfo\"=\"1.0.0.0\"\n");
    testsupport::ScopedStore store(folder.File("registry.reg"));
    EXPECT_EQ(MediaPlayerProbe::VersionText(), text);
}

}  // namespace
}  // namespace vtr

#endif  // _WIN32
