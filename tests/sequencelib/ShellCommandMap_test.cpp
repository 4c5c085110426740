#include "sequencelib/ShellCommandMap.h"

#include <gtest/gtest.h>

#include "engine/LibVerify.h"
#include "environment/LibRegistryVTRShared.h"
#include "support/TempStore.h"

namespace vtr::seqlib {
namespace {

class ShellCommandMapTest : public testsupport::StoreTest {
  protected:
    ShellCommandMapTest() {
        LibRegistryVTRShared::SetSharedString("UserDataPath", folder_.Path(), "");
    }
    std::string WriteMap(const std::string& text) {
        const std::string path = ShellCommandMap().MapFilePath();
        testsupport::WriteFileBytes(path, text);
        return path;
    }
};

TEST_F(ShellCommandMapTest, TheMapIsShellcmdMapInTheUserDataFolder) {
    EXPECT_EQ(ShellCommandMap().MapFilePath(), folder_.File("shellcmd.map"));
}

TEST_F(ShellCommandMapTest, GivesTheCommandOfTheFirstItemWithTheIdentifier) {
    WriteMap(
        "((12,C:\\Show\\lights.bat),(13,notify-send Show*Sstarted),"
        "(12,second),(*O7*C,paren*Eid))");
    const ShellCommandMap map;
    EXPECT_EQ(map.CommandText("12"), "C:\\Show\\lights.bat");
    EXPECT_EQ(map.CommandText("13"), "notify-send Show,started");
    EXPECT_EQ(map.CommandText("(7)"), "paren*id");
    EXPECT_EQ(map.CommandText("14"), "");
    EXPECT_EQ(map.CommandText(""), "");
    EXPECT_EQ(map.CommandText(" 12"), "") << "identifiers compare exactly";
}

TEST_F(ShellCommandMapTest, PassesOverItemsThatAreNotPairs) {
    WriteMap("(plain,(5),(6,),(7,run seven,extra))");
    const ShellCommandMap map;
    EXPECT_EQ(map.CommandText("plain"), "");
    EXPECT_EQ(map.CommandText("5"), "");
    EXPECT_EQ(map.CommandText("6"), "");
    EXPECT_EQ(map.CommandText("7"), "run seven");
}

TEST_F(ShellCommandMapTest, AMissingOrUnreadableMapGivesNothing) {
    const ShellCommandMap map;
    EXPECT_EQ(map.CommandText("12"), "") << "no map file";
    WriteMap("((12,run)");
    EXPECT_EQ(map.CommandText("12"), "") << "not a list";
    WriteMap("");
    EXPECT_EQ(map.CommandText("12"), "");
    EXPECT_EQ(ShellCommandMap::CommandTextIn(folder_.Path(), "12"), "") << "a folder";
}

TEST_F(ShellCommandMapTest, ReadsTheMapAgainOnEveryCall) {
    const ShellCommandMap map;
    WriteMap("((1,first))");
    EXPECT_EQ(map.CommandText("1"), "first");
    WriteMap("((1,changed))");
    EXPECT_EQ(map.CommandText("1"), "changed");
}

TEST_F(ShellCommandMapTest, AVerificationReadsTheMapOncePerRun) {
    WriteMap("((1,first),(2,second))");
    LibVerify::RunVerification();
    EXPECT_EQ(LibVerify::ShellCommandText("1"), "first");
    WriteMap("((1,changed))");
    EXPECT_EQ(LibVerify::ShellCommandText("2"), "second") << "the map as the run first read it";
    // The next run reads it again.
    LibVerify::RunVerification();
    EXPECT_EQ(LibVerify::ShellCommandText("1"), "changed");
    EXPECT_EQ(LibVerify::ShellCommandText("2"), "");
    LibVerify::ClearResults();
}

}  // namespace
}  // namespace vtr::seqlib
