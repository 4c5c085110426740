// The verification driver: targets, the run loop, de-duplication, cancellation, the
// caches and the temporary files.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <stdexcept>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/FilesRead.h"
#include "environment/LibFile.h"
#include "environment/NetworkPreferences.h"
#include "schedule/Schedule.h"
#include "schedule/YearSchedule.h"
#include "sequencelib/Sequence.h"
#include "show/Show.h"
#include "support/VerifierFixture.h"

#ifndef _WIN32
#include <sys/resource.h>

#include <csignal>
#endif

namespace vtr {
namespace {

namespace fs = std::filesystem;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;
using testsupport::MakeScripted;
using testsupport::RecordingClient;
using testsupport::ResultTexts;

// Everything in the test's temporary folder (TMPDIR), by file name.
std::vector<std::string> TempFiles(const std::string& folder) {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

class DriverTest : public testsupport::StoreTest {
  protected:
    ~DriverTest() override {
        LibVerify::SetEventPump(nullptr);
        LibVerify::DeleteTempFiles();
    }

    // A run whose root checks find a suite that is not installed: they report message 3
    // (not installed) and 9 (no media player) and queue nothing. The test's own checks are
    // queued when the first root check is announced, behind the three roots.
    void RunWith(std::vector<CheckPtr> checks) {
        bool queued = false;
        client.onLine = [&](const std::string& line) {
            if (!queued && line.rfind("Checking ", 0) == 0) {
                queued = true;
                for (const CheckPtr& check : checks)
                    LibVerify::AddCheck(check);
            }
        };
        LibVerify::RunVerification();
        client.onLine = nullptr;
    }

    RecordingClient client;
};

TEST_F(DriverTest, ARunStartsFromTheThreeRootChecksAndEndsWithChecksCompleted) {
    LibVerify::SetScheduleFiles(folder_.File("weeksched.lsc"), folder_.File("yearsched.lsc"));
    LibVerify::RunVerification();
    EXPECT_THAT(
        client.log,
        ElementsAre("Initializing", "Added Vantori installation",
                    "Added Windows Media Player version", "Added Old KR-P compatibility",
                    "Checking Vantori installation", "Result 3", "Completed Vantori installation",
                    "Checking Windows Media Player version", "Result 9",
                    "Completed Windows Media Player version", "Checking Old KR-P compatibility",
                    "Completed Old KR-P compatibility", "ChecksCompleted false"));
    EXPECT_FALSE(LibVerify::IsVerifying());
    EXPECT_FALSE(LibVerify::IsCancelled());
    EXPECT_EQ(LibVerify::ChecksPerformedCount(), 3);
    EXPECT_EQ(LibVerify::ChecksRemainingCount(), 0);
    EXPECT_EQ(LibVerify::ErrorCount(), 1);
    EXPECT_EQ(LibVerify::WarningCount(), 1);
    // The store is only read.
    EXPECT_FALSE(fs::exists(StoreFile()));
}

TEST_F(DriverTest, AChecksIdentifierRunsOnceWhetherItIsPendingOrDone) {
    auto first = MakeScripted("x");
    auto again = MakeScripted("x");
    auto later = MakeScripted("x");
    auto other = MakeScripted("y", [&] { LibVerify::AddCheck(later); });
    RunWith({first, again, other});
    EXPECT_EQ(first->runs, 1);
    EXPECT_EQ(again->runs, 0);  // dropped while "x" was pending
    EXPECT_EQ(later->runs, 0);  // dropped once "x" was done
    EXPECT_EQ(other->runs, 1);
    EXPECT_EQ(client.Lines("Added ").size(), 5u);  // three roots, x and y
    EXPECT_EQ(LibVerify::ChecksPerformedCount(), 5);
}

TEST_F(DriverTest, ChildrenAreQueuedBehindEverythingPendingSoTheRunIsBreadthFirst) {
    std::vector<std::string> order;
    auto note = [&](std::string id) { order.push_back(id); };
    auto a1 = MakeScripted("a1", [&] { note("a1"); });
    auto b1 = MakeScripted("b1", [&] { note("b1"); });
    auto a = MakeScripted("a", [&] {
        note("a");
        LibVerify::AddCheck(a1);
    });
    auto b = MakeScripted("b", [&] {
        note("b");
        LibVerify::AddCheck(b1);
    });
    RunWith({a, b});
    EXPECT_THAT(order, ElementsAre("a", "b", "a1", "b1"));
}

TEST_F(DriverTest, ACheckThatFailsHalfWayKeepsItsResultsAndTheRunGoesOn) {
    auto failing = MakeScripted("failing", [] {
        LibVerify::AddResult(Messages::ShowFileMissing, {"first.lss"});
        throw VtrError(5, "test", "half way");
    });
    auto next =
        MakeScripted("next", [] { LibVerify::AddResult(Messages::ShowFileMissing, {"next.lss"}); });
    RunWith({failing, next});
    EXPECT_THAT(ResultTexts(), ElementsAre("3:", "9:", "21: first.lss", "21: next.lss"));
    EXPECT_THAT(client.Lines("Completed "), ::testing::Contains("failing"));
    EXPECT_EQ(client.log.back(), "ChecksCompleted false");
}

TEST_F(DriverTest, ARunWhoseFindingsAreAllIgnoredEndsWithNoErrorsOrWarnings) {
    WriteStore(testsupport::StoreText({{"Verifier",
                                        {{"CountIgnoreMsgNum", testsupport::RegDword(2)},
                                         {"IgnoreMsgNum1", testsupport::RegText("3")},
                                         {"IgnoreMsgNum2", testsupport::RegText("9")}}}}));
    LibVerify::RunVerification();
    EXPECT_THAT(ResultTexts(), ElementsAre("1:"));
    ASSERT_THAT(LibVerify::GetResults(), SizeIs(1));
    EXPECT_EQ(LibVerify::GetResults()[0]->Summary(), "No errors or warnings found");
    EXPECT_EQ(LibVerify::GetResults()[0]->Severity(), Severity::Info);
    EXPECT_THAT(LibVerify::GetIgnoredResults(), SizeIs(2));
    EXPECT_THAT(client.Lines("Result "), ElementsAre("3 ignored", "9 ignored", "1"));
}

TEST_F(DriverTest, AnInfoResultAloneStillEndsWithMessageOne) {
    RunWith({MakeScripted("info", [] { LibVerify::AddResult(Severity::Info, "fine", 0, 0); })});
    // 3 and 9 are not ignored here: no message 1.
    EXPECT_THAT(client.Lines("Result "), ElementsAre("3", "9", "0"));
}

TEST_F(DriverTest, CancellingFromAClientLetsTheRunningCheckFinishAndRunsNothingElse) {
    auto never = MakeScripted("never");
    auto child = MakeScripted("child");
    auto running = MakeScripted("running", [&] {
        LibVerify::CancelVerification();  // what a Cancel click inside a long check does
        LibVerify::AddCheck(child);       // refused once cancelled
        LibVerify::AddResult(Messages::ShowFileMissing, {"after cancel"});
    });
    RunWith({running, never});
    EXPECT_EQ(running->runs, 1);
    EXPECT_EQ(never->runs, 0);
    EXPECT_EQ(child->runs, 0);
    EXPECT_TRUE(LibVerify::IsCancelled());
    const auto& log = client.log;
    const auto at = std::find(log.begin(), log.end(), "Checking running") - log.begin();
    EXPECT_THAT(std::vector<std::string>(log.begin() + at, log.end()),
                ElementsAre("Checking running", "Result 2", "Cancelled", "Result 21",
                            "Completed running", "ChecksCompleted true"));
    EXPECT_THAT(ResultTexts(), ElementsAre("3:", "9:", "2:", "21: after cancel"));
    EXPECT_EQ(LibVerify::ChecksRemainingCount(), 0);
    // The running check is recorded as done; the dropped ones are not.
    EXPECT_EQ(LibVerify::ChecksPerformedCount(), 4);
}

TEST_F(DriverTest, CancellingFromTheEventPumpStopsBetweenChecks) {
    auto first = MakeScripted("first");
    auto second = MakeScripted("second");
    LibVerify::SetEventPump([&] {
        if (first->runs == 1 && !LibVerify::IsCancelled())
            LibVerify::CancelVerification();
    });
    RunWith({first, second});
    EXPECT_EQ(first->runs, 1);
    EXPECT_EQ(second->runs, 0);
    EXPECT_THAT(client.Lines("Result "), ElementsAre("3", "9", "2"));
    EXPECT_THAT(std::vector<std::string>(client.log.end() - 3, client.log.end()),
                ElementsAre("Result 2", "Cancelled", "ChecksCompleted true"));
}

TEST_F(DriverTest, ACheckAnnouncedWhenCancelArrivesStillRuns) {
    auto announced = MakeScripted("announced");
    auto behind = MakeScripted("behind");
    bool queued = false;
    client.onLine = [&](const std::string& line) {
        if (!queued && line == "Checking Vantori installation") {
            queued = true;
            LibVerify::AddCheck(announced);
            LibVerify::AddCheck(behind);
        }
        if (line == "Checking announced")
            LibVerify::CancelVerification();
    };
    LibVerify::RunVerification();
    EXPECT_EQ(announced->runs, 1);
    EXPECT_EQ(behind->runs, 0);
    EXPECT_EQ(client.log.back(), "ChecksCompleted true");
}

TEST_F(DriverTest, ACancelledWarningThatIsIgnoredLetsMessageOneThrough) {
    WriteStore(testsupport::StoreText({{"Verifier",
                                        {{"CountIgnoreMsgNum", testsupport::RegDword(3)},
                                         {"IgnoreMsgNum1", testsupport::RegText("3")},
                                         {"IgnoreMsgNum2", testsupport::RegText("9")},
                                         {"IgnoreMsgNum3", testsupport::RegText("2")}}}}));
    RunWith({MakeScripted("cancel", [] { LibVerify::CancelVerification(); })});
    EXPECT_THAT(ResultTexts(), ElementsAre("1:"));
    EXPECT_EQ(client.log.back(), "ChecksCompleted true");
}

TEST_F(DriverTest, ANewRunClearsTheLastOneAndForgetsCancellation) {
    RunWith({MakeScripted("cancel", [] { LibVerify::CancelVerification(); })});
    ASSERT_TRUE(LibVerify::IsCancelled());
    client.Clear();
    auto again = MakeScripted("cancel");
    RunWith({again});
    EXPECT_EQ(again->runs, 1);  // the done checks of the last run are forgotten
    EXPECT_FALSE(LibVerify::IsCancelled());
    EXPECT_THAT(ResultTexts(), ElementsAre("3:", "9:"));
    EXPECT_EQ(client.log.back(), "ChecksCompleted false");
}

TEST_F(DriverTest, ARunAskedForInsideARunIsRefused) {
    int inner = 0;
    RunWith({MakeScripted("nested", [&] {
        LibVerify::RunVerification();
        ++inner;
    })});
    EXPECT_EQ(inner, 1);
    EXPECT_EQ(std::count(client.log.begin(), client.log.end(), "Initializing"), 1);
    EXPECT_EQ(std::count(client.log.begin(), client.log.end(), "ChecksCompleted false"), 1);
}

TEST_F(DriverTest, TheWindowsStartUpCallLeavesTheFirstRunPossible) {
    LibVerify::BeginVerification();
    EXPECT_TRUE(LibVerify::IsVerifying());
    EXPECT_EQ(LibVerify::ChecksRemainingCount(), 3);
    LibVerify::RunVerification();
    EXPECT_FALSE(LibVerify::IsVerifying());
    EXPECT_EQ(LibVerify::ChecksPerformedCount(), 3);
}

TEST_F(DriverTest, NetworkPreferencesAreReadAfreshForEveryRun) {
    LibVerify::RunVerification();
    EXPECT_EQ(LibVerify::GetNetworkPreferences().VTRNetwork(0).Port(), 1);  // the default
    WriteStore(testsupport::StoreText(
        {{"Shared\\Network", {{"NetworkVantori", testsupport::RegDword(3)}}}}));
    LibVerify::RunVerification();
    EXPECT_EQ(LibVerify::GetNetworkPreferences().VTRNetwork(0).Port(), 3);
}

// --- Targets and temporary files -------------------------------------------------------

TEST_F(DriverTest, VerifyingASequenceMakesThreeTemporaryFilesThatTheRunDeletes) {
    LibVerify::VerifySequenceFile("/shows/Carol.lms");
    const auto made = TempFiles(TempDir());
    ASSERT_THAT(made, SizeIs(3));
    EXPECT_EQ(made[0].rfind("VTRVer-Show-", 0), 0u);
    EXPECT_EQ(made[1].rfind("VTRVer-WS-", 0), 0u);
    EXPECT_EQ(made[2].rfind("VTRVer-YS-", 0), 0u);

    // The show holds the sequence as the only entry of its musical section.
    const std::string showFile = LibFile::AddTrailingBackslash(TempDir()) + made[0];
    ShowPtr show = ShowFunctions::LoadShowFile(showFile);
    ASSERT_TRUE(show);
    EXPECT_THAT(show->Musical()->List(), ElementsAre("/shows/Carol.lms"));
    EXPECT_EQ(show->Background()->Count() + show->Startup()->Count() + show->Main()->Count() +
                  show->Shutdown()->Count(),
              0);

    // One show event, day 1 from 3:00:37 to 7:00:37; an empty calendar.
    EXPECT_EQ(LibVerify::VerifiedWeeklyScheduleFile(),
              LibFile::AddTrailingBackslash(TempDir()) + made[1]);
    EXPECT_EQ(LibVerify::VerifiedYearlyScheduleFile(),
              LibFile::AddTrailingBackslash(TempDir()) + made[2]);
    SchedulePtr weekly = LibVerify::GetSchedule();
    ASSERT_TRUE(weekly);
    ShowEventPtr event = weekly->FirstShowEvent();
    ASSERT_TRUE(event);
    EXPECT_EQ(event->Filename(), showFile);
    EXPECT_EQ(event->StartTime()->TimeVal(), 86400 + 3 * 3600 + 37);
    EXPECT_EQ(event->EndTime()->TimeVal(), 86400 + 7 * 3600 + 37);
    EXPECT_EQ(weekly->LastShowEvent(), event);
    EXPECT_EQ(LibVerify::GetSchedule(), weekly);  // loaded once
    ASSERT_TRUE(LibVerify::GetYearSchedule());
    EXPECT_THAT(LibVerify::GetYearSchedule()->Keys(), IsEmpty());

    LibVerify::RunVerification();
    EXPECT_THAT(TempFiles(TempDir()), IsEmpty());
}

TEST_F(DriverTest, TemporaryFilesAreGoneAfterACancelledRunAndAfterANewSelection) {
    LibVerify::VerifyShowFile("/shows/a.lss");
    ASSERT_THAT(TempFiles(TempDir()), SizeIs(2));
    LibVerify::VerifyShowFile("/shows/b.lss");  // the first pair is never used
    ASSERT_THAT(TempFiles(TempDir()), SizeIs(2));
    RunWith({MakeScripted("cancel", [] { LibVerify::CancelVerification(); })});
    EXPECT_THAT(TempFiles(TempDir()), IsEmpty());
}

TEST_F(DriverTest, TheTemporaryFilesAreWhereASignalHandlerCanRemoveThem) {
    LibVerify::VerifySequenceFile("/shows/Carol.lms");
    ASSERT_THAT(TempFiles(TempDir()), SizeIs(3));
    // What a second Ctrl-C does, in its handler.
    LibFile::RemoveRegisteredTempFiles();
    EXPECT_THAT(TempFiles(TempDir()), IsEmpty());
    // Once the run has deleted them, nothing of theirs is left to remove.
    LibVerify::VerifyShowFile("/shows/a.lss");
    LibVerify::DeleteTempFiles();
    testsupport::WriteFileBytes(TempDir() + "/kept.txt", "");
    LibFile::RemoveRegisteredTempFiles();
    EXPECT_THAT(TempFiles(TempDir()), ElementsAre("kept.txt"));
}

TEST_F(DriverTest, TheFilesOfTheTargetAndThoseTheRunReadAreRecorded) {
    const std::string show = folder_.File("a.lss");
    const std::string other = folder_.File("b.lss");
    for (const std::string& file : {show, other})
        testsupport::WriteFileBytes(file, "");
    LibVerify::VerifyShowFile(show);
    // The target counts from its selection on; the run's own temporary files never do.
    ASSERT_TRUE(FilesRead::FileNamedBy(show));
    RunWith({MakeScripted("read", [&] { LibVerify::LoadShow(other); })});
    ASSERT_TRUE(FilesRead::FileNamedBy(other));
    EXPECT_EQ(FilesRead::FileNamedBy(other)->use, FilesRead::Use::Read);
    for (const std::string& file :
         {LibVerify::VerifiedWeeklyScheduleFile(), LibVerify::VerifiedYearlyScheduleFile()}) {
        testsupport::WriteFileBytes(file, "");
        EXPECT_FALSE(FilesRead::FileNamedBy(file)) << file;
        fs::remove(file);
    }
    // The next run starts afresh, still with the same target.
    RunWith({});
    EXPECT_FALSE(FilesRead::FileNamedBy(other));
    EXPECT_TRUE(FilesRead::FileNamedBy(show));
}

TEST_F(DriverTest, ATemporaryFileThatCannotBeMadeRaisesError37AndLeavesNothing) {
    fs::remove_all(TempDir());  // TMPDIR names a folder that does not exist
    try {
        LibVerify::VerifySequenceFile("/shows/Carol.lms");
        FAIL() << "no error";
    } catch (const VtrError& error) {
        EXPECT_EQ(error.Number(), 37);
        EXPECT_EQ(error.Description().rfind("Cannot get temp file, error ", 0), 0u)
            << error.Description();
    }
    EXPECT_FALSE(fs::exists(TempDir()));
    EXPECT_EQ(std::distance(fs::directory_iterator(folder_.Path()), fs::directory_iterator()), 0);
}

#ifndef _WIN32
// Any write of data fails (EFBIG) while the object lives; empty files can still be made.
class ScopedNoFileGrowth {
  public:
    ScopedNoFileGrowth() {
        getrlimit(RLIMIT_FSIZE, &saved_);
        previous_ = std::signal(SIGXFSZ, SIG_IGN);
        rlimit none = saved_;
        none.rlim_cur = 0;
        setrlimit(RLIMIT_FSIZE, &none);
    }
    ~ScopedNoFileGrowth() {
        setrlimit(RLIMIT_FSIZE, &saved_);
        std::signal(SIGXFSZ, previous_);
    }

  private:
    rlimit saved_{};
    void (*previous_)(int) = nullptr;
};

TEST_F(DriverTest, ATemporaryShowThatCannotBeWrittenRaisesError37AndLeavesNothing) {
    std::string description;
    {
        ScopedNoFileGrowth full;
        try {
            LibVerify::VerifySequenceFile("/shows/Carol.lms");
        } catch (const VtrError& error) {
            EXPECT_EQ(error.Number(), 37);
            EXPECT_EQ(error.Source(), "LibVerify.VerifySequenceFile");
            description = error.Description();
        }
    }
    const std::string prefix = "Cannot write temporary show file " + TempDir() + "/VTRVer-Show-";
    EXPECT_EQ(description.rfind(prefix, 0), 0u) << description;
    EXPECT_THAT(TempFiles(TempDir()), IsEmpty());
}

TEST_F(DriverTest, ATemporaryWeeklyScheduleThatCannotBeSavedRaisesError37AndLeavesNothing) {
    LibVerify::SetScheduleFiles("week.lsc", "year.lsc");
    std::string description;
    {
        ScopedNoFileGrowth full;
        try {
            LibVerify::VerifyShowFile("/shows/a.lss");
        } catch (const VtrError& error) {
            EXPECT_EQ(error.Number(), 37);
            EXPECT_EQ(error.Source(), "LibVerify.VerifyShowFile");
            description = error.Description();
        }
    }
    const std::string prefix = "Cannot save temporary weekly file " + TempDir() + "/VTRVer-WS-";
    EXPECT_EQ(description.rfind(prefix, 0), 0u) << description;
    EXPECT_THAT(TempFiles(TempDir()), IsEmpty());
    // The failed selection did not replace the schedule names.
    EXPECT_EQ(LibVerify::VerifiedWeeklyScheduleFile(), "week.lsc");
    EXPECT_EQ(LibVerify::VerifiedYearlyScheduleFile(), "year.lsc");
}
#endif

// --- Caches --------------------------------------------------------------------------------

TEST_F(DriverTest, AShowIsReadOncePerRunAndAFailureIsTriedAgain) {
    const std::string good = folder_.File("good.lss");
    testsupport::WriteFileBytes(good, ShowFunctions::ShowToText(Show()));
    const std::string bad = folder_.File("bad.lss");
    testsupport::WriteFileBytes(bad, "not a show");

    LibVerify::BeginVerification();
    ShowPtr first = LibVerify::LoadShow(good);
    ASSERT_TRUE(first);
    EXPECT_EQ(LibVerify::LoadShow(good), first);
    EXPECT_FALSE(LibVerify::LoadShow(bad));
    EXPECT_FALSE(LibVerify::LoadShow(bad));
    EXPECT_FALSE(LibVerify::LoadShow(folder_.File("missing.lss")));
    EXPECT_EQ(LibVerify::GetFileLoadCounts().showReads, 4);

    // A new run reads the file again.
    LibVerify::BeginVerification();
    EXPECT_EQ(LibVerify::GetFileLoadCounts().showReads, 0);
    EXPECT_NE(LibVerify::LoadShow(good), first);
}

TEST_F(DriverTest, ASequenceIsLoadedOncePerRunAndAFailureIsKeptAndExplained) {
    const std::string good = folder_.File("Carol.lms");
    testsupport::WriteFileBytes(good,
                                "<?xml version=\"1.0\"?><sequence length=\"1000\"><channels>"
                                "<channel id=\"1\" name=\"Roof\"/></channels></sequence>");
    const std::string bad = folder_.File("Broken.lms");
    testsupport::WriteFileBytes(bad, "<sequence><channels><channel/></channels></sequence>");

    LibVerify::BeginVerification();
    client.Clear();
    auto sequence = LibVerify::LoadSequence(good);
    ASSERT_TRUE(sequence);
    EXPECT_EQ(sequence->Channels().size(), 1u);
    EXPECT_EQ(LibVerify::LoadSequence(good), sequence);
    const auto progress = client.Lines("Transient Loading ");
    ASSERT_FALSE(progress.empty());
    EXPECT_EQ(progress.front(), "0% of " + good);
    EXPECT_EQ(progress.back(), "100% of " + good);

    client.Clear();
    EXPECT_FALSE(LibVerify::LoadSequence(bad));
    EXPECT_FALSE(LibVerify::LoadSequence(bad));
    EXPECT_EQ(LibVerify::GetFileLoadCounts().sequenceLoads, 2);
    // The loader's own explanation reaches the log, once.
    const auto said = client.Lines("Transient ");
    ASSERT_FALSE(said.empty());
    const std::string why = said.back();
    EXPECT_NE(why.find(bad), std::string::npos) << why;
    EXPECT_EQ(why.rfind("Loading ", 0), std::string::npos) << why;
    EXPECT_EQ(std::count(said.begin(), said.end(), why), 1);

    EXPECT_FALSE(LibVerify::LoadSequence(folder_.File("missing.lms")));
    EXPECT_EQ(LibVerify::GetFileLoadCounts().sequenceLoads, 3);
}

TEST_F(DriverTest, SchedulesAreLoadedOnFirstRequestAndDroppedWithANewSelection) {
    const std::string weekly = folder_.File("weeksched.lsc");
    Schedule schedule;
    schedule.AddShowEventByFile("/shows/a.lss", WeekTimeFunctions::NewWeekTime(2, 18, 0, 0),
                                WeekTimeFunctions::NewWeekTime(2, 22, 0, 0));
    schedule.Save(weekly);
    LibVerify::SetScheduleFiles(weekly, folder_.File("yearsched.lsc"));
    SchedulePtr loaded = LibVerify::GetSchedule();
    ASSERT_TRUE(loaded);
    ASSERT_TRUE(loaded->FirstShowEvent());
    EXPECT_EQ(loaded->FirstShowEvent()->Filename(), "/shows/a.lss");
    EXPECT_EQ(LibVerify::GetSchedule(), loaded);
    // A missing calendar file is an empty calendar.
    ASSERT_TRUE(LibVerify::GetYearSchedule());
    EXPECT_THAT(LibVerify::GetYearSchedule()->Keys(), IsEmpty());

    LibVerify::SetScheduleFiles(folder_.File("other.lsc"), folder_.File("yearsched.lsc"));
    ASSERT_TRUE(LibVerify::GetSchedule());
    EXPECT_NE(LibVerify::GetSchedule(), loaded);
    EXPECT_FALSE(LibVerify::GetSchedule()->FirstShowEvent());
}

}  // namespace
}  // namespace vtr
