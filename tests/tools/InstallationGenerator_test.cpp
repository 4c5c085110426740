// The generator of whole installations: what it writes, that it writes the same every
// time, and that a verification of the entire schedule of what it wrote finds exactly the
// problems it was asked to put in.
#include "vtrsupport/InstallationGenerator.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <set>

#include "engine/LibVerify.h"
#include "environment/LibFile.h"
#include "environment/MediaPlayerProbe.h"
#include "environment/VTRCommon.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"
#include "sequencelib/Sequence.h"
#include "show/Show.h"
#include "support/TempStore.h"
#include "support/VerifierFixture.h"
#include "vtrsupport/PeImage.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using testsupport::ReadFileBytes;

gen::InstallationOptions SmallOptions() {
    gen::InstallationOptions options;
    options.shows = 3;
    options.sequencesPerShow = 3;
    options.channelsPerSequence = 12;
    options.eventsPerChannel = 3;
    options.calendarDays = 2;
    options.calendarStart = DateTime::FromParts(2031, 12, 30);
    options.writeApplicationFile = [](const std::string& path, const std::string& version) {
        testsupport::WritePeImage(path, version);
    };
    return options;
}

std::set<int32_t> MessageNumbers() {
    std::set<int32_t> numbers;
    for (const ResultPtr& result : LibVerify::GetResults())
        numbers.insert(result->MessageNumber());
    return numbers;
}

class InstallationGeneratorTest : public ::testing::Test {
  protected:
    // Verifies the entire schedule of the installation with its own settings store, the
    // clock on the calendar's first date and temporary files in a folder of the test's.
    void VerifyEntireSchedule(const gen::Installation& installation) {
        testsupport::ScopedStore store(installation.registryFile);
        fs::create_directories(folder.File("tmp"));
        testsupport::ScopedEnvironment tmpdir("TMPDIR", folder.File("tmp"));
#ifdef _WIN32
        testsupport::ScopedEnvironment tmp("TMP", folder.File("tmp"));
        MediaPlayerProbe::ScopedVersionSource player(MediaPlayerProbe::StoredVersionText);
#endif
        ScopedNowSource now([] { return DateTime::FromParts(2031, 12, 30, 12); });
        const std::string storeBefore = ReadFileBytes(installation.registryFile);
        LibVerify::SetScheduleFiles(VTRCommon::GetWeeklyScheduleFile(),
                                    VTRCommon::GetYearlyScheduleFile());
        LibVerify::RunVerification();
        EXPECT_EQ(client.log.back(), "ChecksCompleted false");
        EXPECT_EQ(ReadFileBytes(installation.registryFile), storeBefore);
        EXPECT_TRUE(fs::is_empty(folder.File("tmp")));
    }

    testsupport::TempFolder folder;
    testsupport::RecordingClient client;
};

TEST_F(InstallationGeneratorTest, WritesTheFoldersStoreSchedulesShowsAndSequences) {
    const auto installation = gen::MakeInstallation(folder.Path(), SmallOptions());
    const std::string store = ReadFileBytes(installation.registryFile);
    EXPECT_THAT(store,
                HasSubstr("\"UserDataPath\"=" + testsupport::RegText(installation.userDataFolder)));
    EXPECT_THAT(store,
                HasSubstr("\"MediaDataPath\"=" + testsupport::RegText(installation.mediaFolder)));
    EXPECT_THAT(store, HasSubstr("[HKEY_CURRENT_USER\\Software\\Vantori\\Shared\\Network1\\AuxO]"));
    EXPECT_THAT(store, HasSubstr("\\DMX500]\r\n\"Adapter\"=\"USB DMX 500\""));

    ASSERT_EQ(installation.showFiles.size(), 3u);
    const auto schedule = ScheduleFunctions::LoadSchedule(installation.weeklyScheduleFile);
    EXPECT_EQ(schedule->FirstShowEvent()->Filename(), installation.showFiles[0]);
    const auto calendar = YearScheduleFunctions::LoadYearSchedule(installation.yearlyScheduleFile);
    EXPECT_THAT(calendar->Keys(), ElementsAre("2031-12-30", "2031-12-31"));

    // Glow and Sub, then per show: startup, shutdown, three sequences and (for the musical
    // show) the interactive group's.
    EXPECT_EQ(installation.sequenceFiles.size(), 2u + 5 + 6 + 5);
    std::uint64_t bytes = 0;
    std::int64_t channels = 0;
    for (const std::string& file : installation.sequenceFiles) {
        bytes += fs::file_size(file);
        seqlib::Sequence sequence;
        sequence.Load(file);
        channels += static_cast<std::int64_t>(sequence.Channels().size());
    }
    EXPECT_EQ(bytes, installation.sequenceFileBytes);
    EXPECT_EQ(bytes, installation.sequenceXmlBytes);
    EXPECT_EQ(channels, installation.channels);

    const auto musical = ShowFunctions::LoadShowFile(installation.showFiles[1]);
    ASSERT_TRUE(musical);
    EXPECT_EQ(musical->Musical()->List().front(), installation.nonMediaFolder + "Song-1-1.vtredit");
    EXPECT_EQ(musical->InteractiveGroups().size(), 1u);
    EXPECT_TRUE(fs::exists(installation.mediaFolder + "Song-1-2.mp3"));
    EXPECT_THAT(ReadFileBytes(installation.userDataFolder + "shellcmd.map"),
                "((1,echo Show 1*S begins))");
}

TEST_F(InstallationGeneratorTest, TheSameOptionsWriteTheSameFiles) {
    auto options = SmallOptions();
    options.compressed = true;
    options.faults = true;
    const auto first = gen::MakeInstallation(folder.Path(), options);
    std::vector<std::string> bytes;
    for (const std::string& file : first.sequenceFiles)
        bytes.push_back(ReadFileBytes(file));
    const std::string store = ReadFileBytes(first.registryFile);
    const std::string show = ReadFileBytes(first.showFiles.back());

    const auto second = gen::MakeInstallation(folder.Path(), options);
    EXPECT_EQ(second.sequenceFiles, first.sequenceFiles);
    EXPECT_EQ(second.sequenceFileBytes, first.sequenceFileBytes);
    EXPECT_LT(first.sequenceFileBytes, first.sequenceXmlBytes);
    for (std::size_t i = 0; i < first.sequenceFiles.size(); ++i)
        EXPECT_EQ(ReadFileBytes(first.sequenceFiles[i]), bytes[i]) << first.sequenceFiles[i];
    EXPECT_EQ(ReadFileBytes(first.registryFile), store);
    EXPECT_EQ(ReadFileBytes(first.showFiles.back()), show);
}

TEST_F(InstallationGeneratorTest, AVerificationOfACleanInstallationFindsOnlyItsConflicts) {
    const auto installation = gen::MakeInstallation(folder.Path(), SmallOptions());
    VerifyEntireSchedule(installation);
    // 6: the verifier is not in the generated application folder; 30: the subsequence
    // channel has no device; 43: every sequence shares circuits with the background.
    EXPECT_EQ(MessageNumbers(), (std::set<int32_t>{6, 30, 43}));
    EXPECT_EQ(LibVerify::ErrorCount(), 0);
}

TEST_F(InstallationGeneratorTest, AFolderNamedRelativelyIsWrittenWithAbsolutePaths) {
    const fs::path previous = fs::current_path();
    fs::current_path(folder.Path());
    const auto installation = gen::MakeInstallation("./made/../inst", SmallOptions());
    fs::current_path(previous);

    const std::string root = folder.File("inst") + static_cast<char>(fs::path::preferred_separator);
    EXPECT_EQ(installation.root, root);
    EXPECT_EQ(installation.registryFile, root + "registry.reg");
    EXPECT_THAT(ReadFileBytes(installation.registryFile),
                HasSubstr("\"UserDataPath\"=" +
                          testsupport::RegText(root + "data" +
                                               static_cast<char>(fs::path::preferred_separator))));
    const auto schedule = ScheduleFunctions::LoadSchedule(installation.weeklyScheduleFile);
    EXPECT_EQ(schedule->FirstShowEvent()->Filename(), installation.showFiles[0]);
    EXPECT_EQ(installation.showFiles[0].rfind(root, 0), 0u);
    // Verified from another folder than the one it was made in, it finds what it always does.
    VerifyEntireSchedule(installation);
    EXPECT_EQ(MessageNumbers(), (std::set<int32_t>{6, 30, 43}));
}

TEST_F(InstallationGeneratorTest, AVerificationFindsEveryFaultAndGoesOn) {
    auto options = SmallOptions();
    options.faults = true;
    const auto installation = gen::MakeInstallation(folder.Path(), options);
    VerifyEntireSchedule(installation);
    EXPECT_EQ(MessageNumbers(), (std::set<int32_t>{0, 6, 23, 24, 26, 30, 31, 42, 43, 45, 46, 53}));
    const std::string seq = installation.nonMediaFolder;
    EXPECT_THAT(testsupport::ResultTexts(),
                ::testing::IsSupersetOf(
                    {"24: " + seq + "Broken.lms", "42: " + seq + "NoMedia.lms",
                     "53: [SHOW] " + installation.userDataFolder +
                         "Faults.lss | [NETWORK] Aux P | [TRIGGER] Interactive group (Faults)",
                     "46: [SEQUENCE]: " + seq +
                         "Overflow.las | [INTENSITY FILE]: Gridcraft Intensity File | [RANGE]: DMX "
                         "Universe 1 1-10 | [INTENSITY FILE]: Novalux Intensity File | [RANGE]: "
                         "DMX Universe 1 8-11"}));
}

}  // namespace
}  // namespace vtr
