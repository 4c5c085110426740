#include "engine/SequencePrefetch.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "engine/VtrError.h"
#include "sequencelib/Sequence.h"
#include "support/TempStore.h"
#include "vtrsupport/SequenceGenerator.h"

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
