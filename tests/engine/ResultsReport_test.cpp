#include "engine/ResultsReport.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/FilesRead.h"
#include "environment/LibRegistryVTRShared.h"
#include "support/Raised.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

namespace fs = std::filesystem;

class ResultsReportTest : public testsupport::StoreTest {
  protected:
    ResultsReportTest() { Clear(); }
    ~ResultsReportTest() override { Clear(); }
    static void Clear() {
        LibVerify::ClearResults();
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
    }
    std::string Saved() {
        const std::string file = folder_.File("report.txt");
        ResultsReport::SaveResultsReport(file);
        return testsupport::ReadFileBytes(file);
    }
};

TEST_F(ResultsReportTest, NoResultsGiveAnEmptyFile) {
    const std::string file = folder_.File("report.txt");
    testsupport::WriteFileBytes(file, "old content");
    ResultsReport::SaveResultsReport(file);
    EXPECT_EQ(testsupport::ReadFileBytes(file), "");
}

TEST_F(ResultsReportTest, WritesEachResultWithSeparatorsBetweenThem) {
    LibVerify::AddResult(Severity::Error, "Sequence file does not exist", 23, 23,
                         {"[SEQUENCE]: a.lms", "[SHOW]: show b.lss"});
    LibVerify::AddResult(Severity::Warning, "Sequence is completely off", 29, 29, {"a.lms"});
    LibVerify::AddResult(Severity::Info, "No errors or warnings found", 1, 1);
    const std::string separator(79, '=');
    EXPECT_EQ(Saved(),
              "Message Number: 23\r\n"
              "Severity: Error\r\n"
              "Description: Sequence file does not exist\r\n"
              "Detail #1: [SEQUENCE]: a.lms\r\n"
              "Detail #2: [SHOW]: show b.lss\r\n" +
                  separator + "\r\n" +
                  "Message Number: 29\r\n"
                  "Severity: Warning\r\n"
                  "Description: Sequence is completely off\r\n"
                  "Detail: a.lms\r\n" +
                  separator + "\r\n" +
                  "Message Number: 1\r\n"
                  "Severity: Info\r\n"
                  "Description: No errors or warnings found\r\n");
}

TEST_F(ResultsReportTest, LeavesIgnoredResultsOut) {
    LibVerify::IgnoredMessageNumbers().Add("41");
    LibVerify::AddResult(Severity::Warning, "Shell command map file does not exist", 41, 41, {"m"});
    LibVerify::AddResult(static_cast<Severity>(7), "Odd", 3, 3);
    LibVerify::AddResult(Severity::Warning, "Kept", 42, 42, {"s.lms"});
    // Ignored after the run: no longer written either.
    LibVerify::IgnoredResultKeys().Add("3-");
    EXPECT_EQ(Saved(),
              "Message Number: 42\r\n"
              "Severity: Warning\r\n"
              "Description: Kept\r\n"
              "Detail: s.lms\r\n");
    LibVerify::IgnoredResultKeys().Clear();
    EXPECT_NE(Saved().find("Severity: Severity 7\r\n"), std::string::npos);
}

TEST_F(ResultsReportTest, AFailureRaisesItsErrorAndLeavesNothingOpen) {
    LibVerify::AddResult(Severity::Warning, "x", 5, 5);
    try {
        ResultsReport::SaveResultsReport(folder_.File("no such folder/report.txt"));
        FAIL() << "no error";
    } catch (const VtrError& e) {
        EXPECT_EQ(e.Number(), 75);
        EXPECT_EQ(e.Source(), "ResultsReport.SaveResultsReport");
        EXPECT_EQ(e.Description(), "Cannot create the results file " +
                                       folder_.File("no such folder/report.txt") +
                                       ": No such file or directory");
    }
#ifdef __linux__
    // The device takes the file but not its bytes.
    try {
        ResultsReport::SaveResultsReport("/dev/full");
        FAIL() << "no error";
    } catch (const VtrError& e) {
        EXPECT_EQ(e.Number(), 57);
        EXPECT_EQ(e.Description(),
                  "Cannot write the results file /dev/full: No space left on device");
    }
#endif
}

TEST_F(ResultsReportTest, AFileTheRunReadIsNeverReplacedAndAFailedSaveKeepsTheOldReport) {
    LibVerify::AddResult(Severity::Warning, "x", 5, 5);
    // What the window's Save gets when the user picks a file the run read: the error, shown
    // under "Error Saving Verifier Messages", and the file as it was.
    const std::string sequence = folder_.File("Snowfall.las");
    testsupport::WriteFileBytes(sequence, "<sequence/>");
    FilesRead::SetTargetFiles({});
    FilesRead::Record(sequence, FilesRead::Use::Read);
    const auto refused = testsupport::Raised([&] { ResultsReport::SaveResultsReport(sequence); });
    ASSERT_TRUE(refused);
    EXPECT_EQ(refused->Number(), 37);
    EXPECT_EQ(refused->Source(), "ResultsReport.SaveResultsReport");
    EXPECT_EQ(refused->Description(),
              "Cannot save the results file as " + sequence +
                  ": this verification read that file; the verifier never changes the files it "
                  "verifies. Choose another file.");
    EXPECT_EQ(testsupport::ReadFileBytes(sequence), "<sequence/>");
    FilesRead::BeginRun();

    // A report that cannot be replaced stays as it was.
    const std::string report = folder_.File("report.txt");
    testsupport::WriteFileBytes(report, "the last report");
    fs::permissions(report, fs::perms::owner_read);
    EXPECT_EQ(testsupport::RaisedNumber([&] { ResultsReport::SaveResultsReport(report); }), 75);
    EXPECT_EQ(testsupport::ReadFileBytes(report), "the last report");
}

TEST_F(ResultsReportTest, TheSaveDialogStartsInTheUserDataFolder) {
    LibRegistryVTRShared::SetSharedString("UserDataPath", folder_.Path(), "");
    const ResultsReport::DialogSettings settings = ResultsReport::ChooseResultsReportFileSettings();
    EXPECT_EQ(settings.title, "Save Verifier Results");
    EXPECT_EQ(settings.initialFolder, folder_.File(""));
    EXPECT_EQ(settings.fileName, "VTRVerifier Results");
    EXPECT_EQ(settings.defaultExtension, "txt");
    EXPECT_EQ(settings.filter, "Text Files (*.txt)|*.txt");
    EXPECT_EQ(settings.filterIndex, 1);
    EXPECT_TRUE(settings.promptToOverwrite && settings.hideReadOnlyBox && settings.pathMustExist &&
                settings.refuseReadOnlyFile);
}

}  // namespace
}  // namespace vtr
