#include "DemoInstance.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <map>
#include <stdexcept>

#include "checks/installation/CheckAppFileExists.h"
#include "environment/FileVersion.h"
#include "support/TempStore.h"
#include "support/VerifierFixture.h"
#include "vtrsupport/PeImage.h"

namespace vtr::demo {
namespace {

using ::testing::HasSubstr;

namespace fs = std::filesystem;

// The day of instantiation, a Friday.
DateTime Today() {
    return DateTime::FromParts(2031, 3, 14);
}

std::string ErrorOf(const std::function<void()>& call) {
    try {
        call();
    } catch (const std::runtime_error& error) {
        return error.what();
    }
    return "(no error)";
}

// The separator after the folder, as the instance writes it (escaped in registry strings).
#ifdef _WIN32
const std::string kSep = "\\";
const std::string kRegSep = "\\\\";
#else
const std::string kSep = "/";
const std::string kRegSep = "/";
#endif

TEST(DemoSubstituteTest, TheFolderIsEscapedAsEachFormatNeeds) {
    const std::string folder = "/b (x,y)/a*b \"q\" & <z>\\w";
    EXPECT_EQ(Substitute("\"AppPath\"=\"@DEMO@/app\"", FileKind::Registry, folder, Today()),
              "\"AppPath\"=\"/b (x,y)/a*b \\\"q\\\" & <z>\\\\w" + kRegSep + "app\"");
    EXPECT_EQ(Substitute("(@DEMO@/s.las)", FileKind::ListNotation, folder, Today()),
              "(/b *Ox*Sy*C/a*Eb \"q\" & <z>\\w" + kSep + "s.las)");
    EXPECT_EQ(
        Substitute("<c subsequence=\"@DEMO@/s.las\"/>", FileKind::Xml, folder, Today()),
        "<c subsequence=\"/b (x,y)/a*b &quot;q&quot; &amp; &lt;z&gt;\\w" + kSep + "s.las\"/>");
    EXPECT_EQ(Substitute("@DEMO@", FileKind::Plain, folder, Today()), folder);
}

TEST(DemoSubstituteTest, DatesAndWeekTimesCountFromTheDayOfInstantiation) {
    EXPECT_EQ(Substitute("@DATE+0@ @DATE+9@ @DATE+20@", FileKind::Plain, "", Today()),
              "2031-03-14 2031-03-23 2031-04-03");
    // 2031-03-23 is a Sunday, 2031-03-24 a Monday; 2031-03-14 a Friday.
    EXPECT_EQ(Substitute("@WEEKTIME+9 18:00@", FileKind::Plain, "", Today()), "64800");
    EXPECT_EQ(Substitute("@WEEKTIME+10 22:30@", FileKind::Plain, "", Today()),
              std::to_string(86400 + 22 * 3600 + 30 * 60));
    EXPECT_EQ(Substitute("@WEEKTIME+0 0:05@", FileKind::Plain, "", Today()),
              std::to_string(5 * 86400 + 300));
}

TEST(DemoSubstituteTest, OtherAtSignsStayAndBadPlaceholdersAreRefused) {
    EXPECT_EQ(Substitute("mail me@home.net, @ 5 @", FileKind::Plain, "/d", Today()),
              "mail me@home.net, @ 5 @");
    EXPECT_EQ(ErrorOf([] { Substitute("@DATE+x@", FileKind::Plain, "", Today()); }),
              "malformed placeholder @DATE+x@");
    EXPECT_EQ(ErrorOf([] { Substitute("@WEEKTIME+1 25:00@", FileKind::Plain, "", Today()); }),
              "malformed placeholder @WEEKTIME+1 25:00@");
    EXPECT_EQ(ErrorOf([] { Substitute("@WEEKTIME+1@", FileKind::Plain, "", Today()); }),
              "malformed placeholder @WEEKTIME+1@");
    EXPECT_THAT(ErrorOf([] { Substitute("x @DATE+9", FileKind::Plain, "", Today()); }),
                HasSubstr("unterminated placeholder"));
}

TEST(DemoSubstituteTest, FileKindsComeFromTheNameWithoutTheCompressedEnding) {
    EXPECT_EQ(KindOf("registry.reg"), FileKind::Registry);
    EXPECT_EQ(KindOf("shows/Evening.LSS"), FileKind::ListNotation);
    EXPECT_EQ(KindOf("userdata/yearsched.lsc"), FileKind::ListNotation);
    EXPECT_EQ(KindOf("userdata/shellcmd.map"), FileKind::ListNotation);
    EXPECT_EQ(KindOf("Twinkle.las.compressed"), FileKind::Xml);
    EXPECT_EQ(KindOf("Carol.lms"), FileKind::Xml);
    EXPECT_EQ(KindOf("Bells.vtredit"), FileKind::Xml);
    EXPECT_EQ(KindOf("media/Carol.mp3"), FileKind::Plain);
}

class DemoInstanceTest : public ::testing::Test {
  protected:
    InstanceOptions Options() {
        InstanceOptions options;
        options.today = Today();
        options.writeAppFile = [this](const std::string& path, const std::string& version) {
            testsupport::WritePeImage(path, version);
            written[fs::path(path).filename().string()] = version;
        };
        return options;
    }

    testsupport::TempFolder folder;
    std::map<std::string, std::string> written;
    const std::string source = VTR_SOURCE_DIR "/examples/demo";
};

TEST_F(DemoInstanceTest, TheInstanceHoldsEverySourceWithItsPlaceholdersReplaced) {
    const std::string target = folder.File("demo");
    Instantiate(source, target, Options());

    const std::string store = testsupport::ReadFileBytes(target + "/registry.reg");
    EXPECT_THAT(store, HasSubstr("\"AppPath\"=" + testsupport::RegText(target + kSep + "app")));
    EXPECT_THAT(store, ::testing::Not(HasSubstr("@")));
    EXPECT_THAT(testsupport::ReadFileBytes(target + "/userdata/yearsched.lsc"),
                HasSubstr("(2031-03-23,"));
    EXPECT_THAT(testsupport::ReadFileBytes(target + "/data/shows/Evening.lss"),
                HasSubstr("(" + target + kSep + "data" + kSep + "sequences" + kSep + "Intro.las)"));
    EXPECT_TRUE(fs::exists(target + "/.vantori-demo"));
    EXPECT_FALSE(fs::exists(target + "/app-versions.txt"));

    // The compressed sequence is gzip data under the name without its ending.
    EXPECT_FALSE(fs::exists(target + "/data/sequences/Twinkle.las.compressed"));
    EXPECT_EQ(testsupport::ReadFileBytes(target + "/data/sequences/Twinkle.las").substr(0, 2),
              "\x1f\x8b");
}

TEST_F(DemoInstanceTest, EveryApplicationFileCarriesItsVersionButTheDemosOddOne) {
    const std::string target = folder.File("demo");
    Instantiate(source, target, Options());
    ASSERT_EQ(written.size(), 28u);
    EXPECT_EQ(written["AudioEngineA.dll"], "9.2.3.1");
    EXPECT_EQ(written["XmlParserH.dll"], "2.5.0.0");
    EXPECT_EQ(written["SuiteCommon.dll"], DefaultExpectedVersion());
    EXPECT_EQ(written["SuiteTray.exe"], "0.9.4.2");
    EXPECT_EQ(FileVersionText(target + "/app/SuiteTray.exe"), "0.9.4.2");
    EXPECT_EQ(FileVersionText(target + "/app/AudioDeckB.ocx"), "6.1.1.0");
}

TEST_F(DemoInstanceTest, AnEarlierInstanceIsReplacedAndAnyOtherFolderRefused) {
    const std::string target = folder.File("demo");
    Instantiate(source, target, Options());
    testsupport::WriteFileBytes(target + "/stale.txt", "left from before");
    Instantiate(source, target, Options());
    EXPECT_FALSE(fs::exists(target + "/stale.txt"));

    const std::string other = folder.File("precious");
    fs::create_directories(other);
    testsupport::WriteFileBytes(other + "/notes.txt", "mine");
    EXPECT_THAT(ErrorOf([&] { Instantiate(source, other, Options()); }),
                HasSubstr("refusing to replace"));
    EXPECT_EQ(testsupport::ReadFileBytes(other + "/notes.txt"), "mine");

    EXPECT_THAT(ErrorOf([&] { Instantiate(folder.File("nowhere"), target, Options()); }),
                HasSubstr("are not a folder"));
}

}  // namespace
}  // namespace vtr::demo
