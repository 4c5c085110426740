#include "sequencelib/SequenceInfo.h"

#include <gtest/gtest.h>

#include "SeqTestFiles.h"
#include "sequencelib/DeviceTypeInfo.h"

namespace vtr::seqlib {
namespace {

using testing::Gzip;
using testing::TempFolder;

TEST(SequenceInfoService, GivesThePlaybackFileAgainstTheEditFilesFolder) {
    TempFolder folder;
    const std::string edit = folder.Write(
        "Carol.vtredit",
        R"(<sequenceEdit formatVersion="1"><playback file="Carol.lms"/></sequenceEdit>)");
    const auto info = SequenceInfoService().GetSequenceInfo(edit);
    ASSERT_TRUE(info.has_value());
    EXPECT_EQ(info->ProblemCount(), 0);
    EXPECT_TRUE(info->ProblemTexts().empty());
    EXPECT_EQ(info->PlaybackFile(), FolderOf(edit) + "Carol.lms");
    EXPECT_EQ(info->PlaybackFile(), folder.File("Carol.lms"));

    const std::string absolute = folder.Write(
        "abs.vtredit", R"(<sequenceEdit><playback file="/shows/Carol.lms"/></sequenceEdit>)");
    EXPECT_EQ(SequenceInfoService().GetSequenceInfo(absolute)->PlaybackFile(), "/shows/Carol.lms");
    const std::string drive = folder.Write(
        "drive.vtredit", R"(<sequenceEdit><playback file="C:\Shows\Carol.lms"/></sequenceEdit>)");
    EXPECT_EQ(SequenceInfoService().GetSequenceInfo(drive)->PlaybackFile(), "C:\\Shows\\Carol.lms");
}

TEST(SequenceInfoService, ReadsTheProtectedFormCompressed) {
    TempFolder folder;
    const std::string edit = folder.Write(
        "Carol.vtrprot",
        Gzip(R"(<sequenceEdit formatVersion="1"><playback file="sub/Carol.lms"/></sequenceEdit>)"));
    const auto info = SequenceInfoService().GetSequenceInfo(edit);
    ASSERT_TRUE(info.has_value());
    EXPECT_EQ(info->PlaybackFile(), folder.File("sub/Carol.lms"));
}

TEST(SequenceInfoService, AnEditFileWithoutPlaybackFileHasOneProblem) {
    TempFolder folder;
    for (const char* text : {R"(<sequenceEdit formatVersion="1"/>)",
                             R"(<sequenceEdit><playback file=""/></sequenceEdit>)",
                             R"(<sequenceEdit><playback/></sequenceEdit>)"}) {
        const std::string edit = folder.Write("x.vtredit", text);
        const auto info = SequenceInfoService().GetSequenceInfo(edit);
        ASSERT_TRUE(info.has_value()) << text;
        EXPECT_EQ(info->ProblemCount(), 1);
        EXPECT_EQ(
            info->ProblemTexts(),
            (std::vector<std::string>{"[SEQUENCE]: " + edit, "[PROBLEM]: No playback file named"}));
        EXPECT_EQ(info->PlaybackFile(), "");
    }
}

TEST(SequenceInfoService, GivesNothingForWhatItCannotRead) {
    TempFolder folder;
    const SequenceInfoService service;
    EXPECT_FALSE(service.GetSequenceInfo(folder.File("missing.vtredit")).has_value());
    EXPECT_FALSE(service.GetSequenceInfo(folder.Path().string()).has_value());
    EXPECT_FALSE(service.GetSequenceInfo(folder.Write("a.vtredit", "<sequenceEdit>")).has_value());
    EXPECT_FALSE(service.GetSequenceInfo(folder.Write("b.vtredit", "<sequence/>")).has_value());
    EXPECT_FALSE(
        service.GetSequenceInfo(folder.Write("c.vtrprot", "\x1f\x8b garbage")).has_value());
}

TEST(DeviceTypeInfo, TellsWhatAddressesEachDeviceType) {
    const DeviceTypeInfo info;
    struct Row {
        int32_t type;
        bool network, unit, circuits;
    };
    for (const Row& row :
         {Row{1, true, true, true}, Row{2, false, true, true}, Row{3, false, true, false},
          Row{4, false, true, true}, Row{5, false, true, true}, Row{7, true, false, true},
          Row{0, false, false, false}, Row{6, false, false, false}, Row{8, false, false, false},
          Row{-1, false, false, false}}) {
        EXPECT_EQ(info.HasNetwork(row.type), row.network) << row.type;
        EXPECT_EQ(info.HasUnit(row.type), row.unit) << row.type;
        EXPECT_EQ(info.HasCircuits(row.type), row.circuits) << row.type;
    }
}

}  // namespace
}  // namespace vtr::seqlib
