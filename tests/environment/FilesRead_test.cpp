#include "environment/FilesRead.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "environment/LibFile.h"
#include "environment/OutputFile.h"
#include "support/Raised.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;
using FilesRead::FileNamedBy;
using FilesRead::Use;

class FilesReadTest : public testsupport::StoreTest {
  protected:
    FilesReadTest() {
        FilesRead::BeginRun();
        FilesRead::SetTargetFiles({});
        fs::create_directories(folder_.File("shows"));
        fs::create_directories(folder_.File("media"));
        testsupport::WriteFileBytes(Show(), "show");
        testsupport::WriteFileBytes(folder_.File("media/Carol.mp3"), "audio");
    }
    ~FilesReadTest() override {
        FilesRead::BeginRun();
        FilesRead::SetTargetFiles({});
    }
    std::string Show() const { return folder_.File("shows/Evening.lss"); }
    // The file the path was found to name, or "" when none.
    static std::string Named(const std::string& path) {
        const auto found = FileNamedBy(path);
        return found ? found->file : std::string();
    }
};

TEST_F(FilesReadTest, ARecordedFileIsFoundWhateverPathNamesIt) {
    FilesRead::Record(Show(), Use::Read);
    EXPECT_EQ(Named(Show()), Show());
    EXPECT_EQ(Named(folder_.File("media/../shows/./Evening.lss")), Show());
    EXPECT_EQ(FileNamedBy(Show())->use, Use::Read);

    // Another file, even with the same content or in the same folder, is not it.
    testsupport::WriteFileBytes(folder_.File("shows/Copy.lss"), "show");
    EXPECT_EQ(Named(folder_.File("shows/Copy.lss")), "");
    EXPECT_EQ(Named(folder_.File("shows/New.lss")), "");
    EXPECT_EQ(Named(folder_.File("shows")), "");

#ifndef _WIN32
    // A symbolic link to it, a link to the link, a hard link, and a link to its folder.
    fs::create_symlink(Show(), folder_.File("link.txt"));
    fs::create_symlink(folder_.File("link.txt"), folder_.File("link2.txt"));
    fs::create_hard_link(Show(), folder_.File("hard.txt"));
    fs::create_directory_symlink(folder_.File("shows"), folder_.File("showlink"));
    EXPECT_EQ(Named(folder_.File("link.txt")), Show());
    EXPECT_EQ(Named(folder_.File("link2.txt")), Show());
    EXPECT_EQ(Named(folder_.File("hard.txt")), Show());
    EXPECT_EQ(Named(folder_.File("showlink/Evening.lss")), Show());
    // Relative to the current folder.
    const fs::path previous = fs::current_path();
    fs::current_path(folder_.File("media"));
    EXPECT_EQ(Named("../shows/Evening.lss"), Show());
    EXPECT_EQ(Named("Carol.mp3"), "");
    fs::current_path(previous);
#endif
}

TEST_F(FilesReadTest, AFileCheckedButMissingIsFoundByItsNameInItsFolder) {
    const std::string missing = folder_.File("media/Jingle.mp3");
    EXPECT_FALSE(LibFile::FileExists(missing));  // the check records it
    EXPECT_EQ(Named(missing), missing);
    EXPECT_EQ(FileNamedBy(missing)->use, Use::Checked);
    EXPECT_EQ(Named(folder_.File("shows/../media/Jingle.mp3")), missing);
    EXPECT_EQ(Named(folder_.File("media/Bells.mp3")), "");
    EXPECT_EQ(Named(folder_.File("shows/Jingle.mp3")), "");
    // Letter case counts where the file system does not ignore it.
    EXPECT_EQ(Named(folder_.File("media/jingle.mp3")),
              FilesRead::FolderIgnoresCase(folder_.File("media")) ? missing : "");
#ifndef _WIN32
    // A link that leads to where it would be made.
    fs::create_symlink(missing, folder_.File("dangling.txt"));
    EXPECT_EQ(Named(folder_.File("dangling.txt")), missing);
    fs::create_directory_symlink(folder_.File("media"), folder_.File("medialink"));
    EXPECT_EQ(Named(folder_.File("medialink/Jingle.mp3")), missing);
#endif
    // Once it exists, it is found as itself.
    testsupport::WriteFileBytes(missing, "made since");
    EXPECT_EQ(Named(missing), missing);
}

TEST_F(FilesReadTest, ARunForgetsTheFilesOfTheRunBeforeButNotTheTargetTheStoreOrTheProgramsOwn) {
    const std::string sequence = folder_.File("media/Carol.mp3");
    FilesRead::SetTargetFiles({Show()});
    FilesRead::Record(sequence, Use::Read);
    const std::string help = folder_.File("VTRHelp.chm");
    testsupport::WriteFileBytes(help, "help");
    FilesRead::RecordProgramFile(help);
    EXPECT_EQ(Named(sequence), sequence);

    FilesRead::BeginRun();
    EXPECT_EQ(Named(sequence), "");
    EXPECT_EQ(Named(Show()), Show());
    EXPECT_EQ(Named(help), help);
    // The store in use counts as read, existing or not.
    EXPECT_EQ(Named(StoreFile()), StoreFile());
    WriteStore("Windows Registry Editor Version 5.00\r\n");
    EXPECT_EQ(Named(StoreFile()), StoreFile());

    // A new selection forgets the last run too.
    FilesRead::Record(sequence, Use::Read);
    FilesRead::SetTargetFiles({});
    EXPECT_EQ(Named(Show()), "");
    EXPECT_EQ(Named(sequence), "");
}

TEST_F(FilesReadTest, AnOutputThatWouldReplaceAFileReadIsRefusedWithBothNames) {
    FilesRead::Record(Show(), Use::Read);
    const auto error = testsupport::Raised(
        [&] { OutputFile::Write(Show(), "report", "results file", "Test.Save"); });
    ASSERT_TRUE(error);
    EXPECT_EQ(error->Number(), 37);
    EXPECT_EQ(error->Source(), "Test.Save");
    EXPECT_EQ(error->Description(),
              "Cannot save the results file as " + Show() +
                  ": this verification read that file; the verifier never changes the files "
                  "it verifies. Choose another file.");
    EXPECT_EQ(testsupport::ReadFileBytes(Show()), "show");

    const std::string missing = folder_.File("media/Jingle.mp3");
    LibFile::FileExists(missing);
    const std::string roundabout = folder_.File("shows/../media/Jingle.mp3");
    EXPECT_EQ(testsupport::RaisedDescription(
                  [&] { OutputFile::Write(roundabout, "report", "baseline", "Test.Save"); }),
              "Cannot save the baseline as " + roundabout +
                  ": this verification checked that file; the verifier never changes the files "
                  "it verifies. Choose another file.");
    EXPECT_FALSE(fs::exists(missing));
#ifndef _WIN32
    // Named otherwise, both names are given.
    fs::create_symlink(Show(), folder_.File("link.txt"));
    EXPECT_EQ(
        testsupport::RaisedDescription([&] {
            OutputFile::Write(folder_.File("link.txt"), "report", "results file", "Test.Save");
        }),
        "Cannot save the results file as " + folder_.File("link.txt") + ": that is " + Show() +
            ", which this verification read; the verifier never changes the files it "
            "verifies. Choose another file.");
    EXPECT_EQ(testsupport::ReadFileBytes(Show()), "show");
    EXPECT_TRUE(fs::is_symlink(folder_.File("link.txt")));
#endif

    // Anything else is written.
    OutputFile::Write(folder_.File("report.txt"), "report", "results file", "Test.Save");
    EXPECT_EQ(testsupport::ReadFileBytes(folder_.File("report.txt")), "report");
}

}  // namespace
}  // namespace vtr
