#include "engine/SequencePrefetch.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <exception>
#include <optional>
#include <string>

#include "engine/VtrError.h"
#include "sequencelib/Sequence.h"
#include "sequencelib/SequenceGenerator.h"
#include "support/Raised.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

class SequencePrefetchTest : public ::testing::Test {
  protected:
    std::string Write(const std::string& name, int32_t channels) {
        seqlib::SequenceGenerator::Options options;
        options.channels = channels;
        const std::string file = folder_.File(name);
        seqlib::SequenceGenerator::WriteFile(file, options);
        return file;
    }

    testsupport::TempFolder folder_;
};

TEST_F(SequencePrefetchTest, AFileWantedIsLoadedWithItsProgressKeptForTheCaller) {
    const std::string a = Write("A.las", 12);
    const std::string b = Write("B.las", 30);
    SequencePrefetch prefetch(2, 4);
    prefetch.Want(a);
    prefetch.Want(b);
    prefetch.Want(a);  // named twice, loaded once

    std::optional<SequencePrefetch::Load> second = prefetch.Take(b);
    ASSERT_TRUE(second.has_value());
    ASSERT_NE(second->sequence, nullptr);
    EXPECT_EQ(second->sequence->Channels().size(), 30u);
    EXPECT_FALSE(second->failure);
    // Told from the start to the end, each percent once, rising.
    ASSERT_GE(second->progress.size(), 2u);
    EXPECT_EQ(second->progress.front(), 0);
    EXPECT_EQ(second->progress.back(), 100);
    EXPECT_TRUE(std::is_sorted(second->progress.begin(), second->progress.end()));
    EXPECT_EQ(std::adjacent_find(second->progress.begin(), second->progress.end()),
              second->progress.end());

    const std::optional<SequencePrefetch::Load> first = prefetch.Take(a);
    ASSERT_TRUE(first.has_value());
    EXPECT_EQ(first->sequence->Channels().size(), 12u);
    // Taken once: from now on the file is the caller's.
    EXPECT_FALSE(prefetch.Take(a).has_value());
}

TEST_F(SequencePrefetchTest, AFileThatCannotLoadHandsTheCallerTheSameErrorAsLoadingItThere) {
    const std::string missing = folder_.File("Missing.las");
    const std::string broken = folder_.File("Broken.las");
    testsupport::WriteFileBytes(broken, "<?xml version=\"1.0\"?><sequence><channels><chan");
    SequencePrefetch prefetch(1, 2);
    for (const std::string& file : {missing, broken}) {
        SCOPED_TRACE(file);
        prefetch.Want(file);
        const std::optional<SequencePrefetch::Load> load = prefetch.Take(file);
        ASSERT_TRUE(load.has_value());
        EXPECT_EQ(load->sequence, nullptr);
        ASSERT_TRUE(load->failure);
        const std::string expected =
            testsupport::RaisedDescription([&] { seqlib::Sequence().Load(file); });
        ASSERT_FALSE(expected.empty());
        EXPECT_EQ(testsupport::RaisedDescription([&] { std::rethrow_exception(load->failure); }),
                  expected);
    }
}

TEST_F(SequencePrefetchTest, AFileTheCallerAskedForFirstIsNeverLoadedByAWorker) {
    const std::string a = Write("A.las", 4);
    SequencePrefetch prefetch(2, 4);
    EXPECT_FALSE(prefetch.Take(a).has_value());
    prefetch.Want(a);
    EXPECT_FALSE(prefetch.Take(a).has_value());
}

TEST_F(SequencePrefetchTest, WorkersStayWithinTheirLeadAndStopWhenTold) {
    const std::string a = Write("A.las", 2000);
    const std::string b = Write("B.las", 4);
    {
        // One file ahead at most: B waits until A is taken, which never happens; stopping
        // leaves B unloaded for the caller.
        SequencePrefetch prefetch(1, 1);
        prefetch.Want(a);
        prefetch.Want(b);
        prefetch.Stop();
        EXPECT_FALSE(prefetch.Take(b).has_value());
        // A was either loaded whole before the stop or given up: never half a sequence.
        const std::optional<SequencePrefetch::Load> load = prefetch.Take(a);
        if (load) {
            ASSERT_NE(load->sequence, nullptr);
            EXPECT_EQ(load->sequence->Channels().size(), 2000u);
        }
        prefetch.Want(b);  // after a stop nothing more is loaded
        EXPECT_FALSE(prefetch.Take(b).has_value());
    }
    // Stopped with loads under way and nothing taken: the destructor waits for the workers.
    SequencePrefetch abandoned(2, 8);
    abandoned.Want(a);
    abandoned.Want(b);
}

}  // namespace
}  // namespace vtr
