#include "engine/LibVerify.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <stdexcept>

#include "engine/ProgressHandler.h"
#include "engine/SavedErr.h"
#include "engine/ScopedMousePointer.h"
#include "engine/VtrError.h"

namespace vtr {
namespace {

using ::testing::ElementsAre;

// Writes down what it is told, as "<who>:<what>".
class RecordingClient : public INotificationClient {
  public:
    RecordingClient(std::string name, std::vector<std::string>& log, bool fails = false)
        : name_(std::move(name)), log_(log), fails_(fails) {}

    void CheckAdded(ICheck&) override { Note("CheckAdded"); }
    void CheckCompleted(ICheck&) override { Note("CheckCompleted"); }
    void Checking(ICheck&) override { Note("Checking"); }
    void ChecksCompleted(bool) override { Note("ChecksCompleted"); }
    void Initializing() override { Note("Initializing"); }
    void ResultAdded(const ResultPtr& result) override {
        Note("ResultAdded " + std::to_string(result->MessageNumber()) +
             (result->Ignorable() ? " ignored" : ""));
    }
    void TransientMessage(const std::string& message) override { Note(message); }
    void VerificationCancelled() override { Note("VerificationCancelled"); }

  private:
    void Note(const std::string& what) {
        log_.push_back(name_ + ":" + what);
        if (fails_)
            throw VtrError(5, "client", "client failed");
    }

    std::string name_;
    std::vector<std::string>& log_;
    bool fails_;
};

class LibVerifyTest : public ::testing::Test {
  protected:
    void SetUp() override { Reset(); }
    void TearDown() override {
        for (INotificationClient* client : registered_)
            LibVerify::RemoveNotificationClient(client);
        LibVerify::SetEventPump(nullptr);
        Reset();
    }
    static void Reset() {
        LibVerify::ClearResults();
        LibVerify::IgnoredMessageNumbers().Clear();
        LibVerify::IgnoredResultKeys().Clear();
    }
    void Register(INotificationClient& client) {
        LibVerify::AddNotificationClient(&client);
        registered_.push_back(&client);
    }

    std::vector<std::string> log_;
    std::vector<INotificationClient*> registered_;
};

TEST_F(LibVerifyTest, AddResultSetsFieldsAndSkipsEmptyDetailsWithoutGaps) {
    ResultPtr result = LibVerify::AddResult(Severity::Warning, "Summary", 47, 5, {"", "b"});
    EXPECT_EQ(result->Severity(), Severity::Warning);
    EXPECT_EQ(result->Summary(), "Summary");
    EXPECT_EQ(result->HelpContextID(), 47);
    EXPECT_EQ(result->MessageNumber(), 5);
    EXPECT_THAT(result->Details(), ElementsAre("b"));
    EXPECT_EQ(result->IgnoreKey(), "5-b / ");

    // At most nine details are taken.
    ResultPtr many = LibVerify::AddResult(Severity::Info, "", 1, 1,
                                          {"1", "2", "3", "4", "5", "6", "7", "8", "9", "10"});
    EXPECT_EQ(many->Details().size(), 9u);
    EXPECT_EQ(many->Details().back(), "9");

    ResultPtr fromCatalog = LibVerify::AddResult(Messages::CompressedSequencesDisabled);
    EXPECT_EQ(fromCatalog->MessageNumber(), 51);
    EXPECT_EQ(fromCatalog->HelpContextID(), 54);
    EXPECT_EQ(fromCatalog->Summary(), "Use Compressed Sequences disabled");
    EXPECT_EQ(fromCatalog->Severity(), Severity::Warning);
}

TEST_F(LibVerifyTest, ResultsAreSortedIntoCollectionsAndIgnoredOnesCountForNothing) {
    RecordingClient client("c", log_);
    Register(client);
    LibVerify::IgnoredMessageNumbers().Add("24");
    LibVerify::IgnoredResultKeys().Add("23-a.lms / ");

    LibVerify::AddResult(Messages::SequenceFileMissing, {"a.lms"});  // ignored by key
    LibVerify::AddResult(Messages::SequenceFileMissing, {"b.lms"});  // error
    LibVerify::AddResult(Messages::SequenceCannotLoad, {"c.lms"});   // ignored by number
    LibVerify::AddResult(Messages::ShowHasNoSequences);              // warning
    LibVerify::AddResult(Messages::NoErrorsOrWarnings);              // info

    EXPECT_EQ(LibVerify::GetResults().size(), 3u);
    EXPECT_EQ(LibVerify::GetIgnoredResults().size(), 2u);
    EXPECT_EQ(LibVerify::ErrorCount(), 1);
    EXPECT_EQ(LibVerify::WarningCount(), 1);
    EXPECT_EQ(LibVerify::GetResults()[0]->Details()[0], "b.lms");
    EXPECT_TRUE(LibVerify::GetIgnoredResults()[0]->Ignorable());
    EXPECT_FALSE(LibVerify::GetResults()[0]->Ignorable());
    // Every result is told, ignored ones too.
    EXPECT_THAT(log_,
                ElementsAre("c:ResultAdded 23 ignored", "c:ResultAdded 23",
                            "c:ResultAdded 24 ignored", "c:ResultAdded 25", "c:ResultAdded 1"));

    // Ignoring only errors and warnings leaves no error or warning counted.
    LibVerify::ClearResults();
    LibVerify::IgnoredMessageNumbers().Add("25");
    LibVerify::AddResult(Messages::SequenceCannotLoad);
    LibVerify::AddResult(Messages::ShowHasNoSequences);
    EXPECT_EQ(LibVerify::ErrorCount(), 0);
    EXPECT_EQ(LibVerify::WarningCount(), 0);
    EXPECT_TRUE(LibVerify::GetResults().empty());
}

TEST_F(LibVerifyTest, IgnoreKeyWithSeparatorsInsideDetailsIsComparedWhole) {
    Result result;
    result.SetMessageNumber(30);
    result.AddDetail("x / y");
    EXPECT_FALSE(LibVerify::IsResultIgnored(result));
    LibVerify::IgnoredResultKeys().Add("30-x / y / ");
    EXPECT_TRUE(LibVerify::IsResultIgnored(result));
    EXPECT_TRUE(result.Ignorable());
    LibVerify::IgnoredResultKeys().Remove("30-x / y / ");
    EXPECT_FALSE(result.Ignorable());  // asked afresh each time
}

TEST_F(LibVerifyTest, ClientsAreToldInOrderAndOneThatFailsDoesNotStopTheOthers) {
    RecordingClient first("1", log_, /*fails=*/true);
    RecordingClient second("2", log_);
    Register(first);
    Register(second);
    LibVerify::PostTransientMessage("hello");
    LibVerify::AddResult(Messages::ChannelConflict);
    EXPECT_THAT(log_, ElementsAre("1:hello", "2:hello", "1:ResultAdded 43", "2:ResultAdded 43"));
    EXPECT_EQ(LibVerify::WarningCount(), 1);
}

// A check that cannot say who it is.
class NamelessCheck : public ICheck {
  public:
    void Check() override {}
    std::string CheckIdentifier() override { throw std::length_error("identifier too long"); }
    std::string Description() override { return "Nameless"; }
};

TEST_F(LibVerifyTest, AddCheckNeverThrowsAndLeavesOutACheckThatCannotBeIdentified) {
    RecordingClient client("1", log_);
    Register(client);
    std::vector<std::string> swallowed;
    static std::vector<std::string>* told = nullptr;
    told = &swallowed;
    const ResumeReporter saved = GetResumeReporter();
    SetResumeReporter([](std::string_view description) { told->emplace_back(description); });
    LibVerify::AddCheck(std::make_shared<NamelessCheck>());
    SetResumeReporter(saved);
    EXPECT_TRUE(log_.empty());  // nobody was told of a check added
    EXPECT_THAT(swallowed, ElementsAre("identifier too long"));
}

TEST_F(LibVerifyTest, ProgressIsPostedOncePerPercentWithTheFixedTextAndPumpsEvents) {
    RecordingClient client("c", log_);
    Register(client);
    int pumped = 0;
    LibVerify::SetEventPump([&] { ++pumped; });

    ProgressHandler progress;
    progress.SetDescription("ignored by the posted text");
    progress.SetProgressParts(3);
    EXPECT_EQ(progress.ProgressParts(), 3);
    progress.MakeProgress(1);  // 33
    progress.MakeProgress(0);  // still 33: nothing
    progress.MakeProgress(1);  // 66
    progress.MakeProgress(1);  // 100
    EXPECT_THAT(log_, ElementsAre("c:Channel conflict check progress: 33%",
                                  "c:Channel conflict check progress: 66%",
                                  "c:Channel conflict check progress: 100%"));
    EXPECT_EQ(pumped, 3);

    // A total of 0 reports 100 on the first step and nothing after.
    log_.clear();
    ProgressHandler empty;
    empty.MakeProgress(1);
    empty.MakeProgress(5);
    EXPECT_THAT(log_, ElementsAre("c:Channel conflict check progress: 100%"));

    // Nothing is reported while the percent stays 0.
    log_.clear();
    ProgressHandler large;
    large.SetProgressParts(1000);
    large.MakeProgress(9);
    EXPECT_TRUE(log_.empty());
    large.MakeProgress(1);
    EXPECT_THAT(log_, ElementsAre("c:Channel conflict check progress: 1%"));
}

TEST_F(LibVerifyTest, TheEventPumpIsOptionalAndItsFailuresAreIgnored) {
    LibVerify::ProcessPendingEvents();  // none installed: nothing happens
    int pumped = 0;
    LibVerify::SetEventPump([&] {
        ++pumped;
        throw std::runtime_error("window gone");
    });
    LibVerify::ProcessPendingEvents();
    EXPECT_EQ(pumped, 1);
}

TEST(SavedErr, RaisesTheFirstErrorAfterTheCleanUpFailed) {
    try {
        try {
            throw VtrError(91, "First.Source", "first", "help.chm", 12);
        } catch (...) {
            SavedErr saved;
            ResumeStep([] { Raise(5, "CleanUp", "second"); });
            saved.Raise();
        }
        FAIL() << "nothing raised";
    } catch (const VtrError& error) {
        EXPECT_EQ(error.Number(), 91);
        EXPECT_EQ(error.Source(), "First.Source");
        EXPECT_EQ(error.Description(), "first");
        EXPECT_EQ(error.HelpFile(), "help.chm");
        EXPECT_EQ(error.HelpContext(), 12);
    }
    // Any other exception goes on as it was.
    EXPECT_THROW(
        {
            try {
                throw std::out_of_range("x");
            } catch (...) {
                SavedErr saved;
                saved.Raise();
            }
        },
        std::out_of_range);
}

TEST(ScopedMousePointer, SetsThroughTheHooksAndPutsTheFirstPointerBack) {
    std::vector<int16_t> set;
    int16_t current = MousePointer::Arrow;
    ScopedMousePointer::InstallHooks([&] { return current; },
                                     [&](int16_t pointer) {
                                         set.push_back(pointer);
                                         current = pointer;
                                     });
    {
        ScopedMousePointer busy;
        busy.SetPointer(MousePointer::Hourglass);
        busy.SetPointer(MousePointer::Default);
    }
    EXPECT_THAT(set,
                ElementsAre(MousePointer::Hourglass, MousePointer::Default, MousePointer::Arrow));

    // Failing hooks are ignored; without hooks nothing happens.
    ScopedMousePointer::InstallHooks([]() -> int16_t { throw std::runtime_error("no screen"); },
                                     [](int16_t) { throw std::runtime_error("no screen"); });
    {
        ScopedMousePointer failing;
        failing.SetPointer(MousePointer::Hourglass);
    }
    ScopedMousePointer::InstallHooks(nullptr, nullptr);
    {
        ScopedMousePointer none;
        none.SetPointer(MousePointer::Hourglass);
    }
}

}  // namespace
}  // namespace vtr
