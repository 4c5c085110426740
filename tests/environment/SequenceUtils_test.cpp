#include "environment/SequenceUtils.h"

#include <gtest/gtest.h>

#include "engine/LibVerify.h"
#include "engine/VtrError.h"
#include "environment/SequenceLoader.h"
#include "support/TempStore.h"
#include "vtrsupport/SequenceGenerator.h"

namespace vtr {
namespace {

using SequenceUtils::DescribeDeviceAddress;
using SequenceUtils::NetworkText;
using SequenceUtils::TrackText;
using SequenceUtils::UnitText;
using SequenceUtils::VtrNetworkText;

TEST(SequenceUtils, DescribesADeviceByWhatItsTypeHas) {
    EXPECT_EQ(DescribeDeviceAddress(1, 0, 10, 1, 16), "VTR Regular 0A 1-16");
    EXPECT_EQ(DescribeDeviceAddress(7, 3, 0, 5, 1), "DMX Universe 3 5");
    EXPECT_EQ(DescribeDeviceAddress(7, 3, 99, 5, 0), "DMX Universe 3 ") << "no circuits at all";
    EXPECT_EQ(DescribeDeviceAddress(1, 27, 0, 100, 2), "VTR Net 27  100-101")
        << "the blank stays after an empty unit";
    EXPECT_EQ(DescribeDeviceAddress(2, 4, 5, 3, 2), "<Device type 2> 5 3-4");
    EXPECT_EQ(DescribeDeviceAddress(3, 4, 0x2F, 3, 2), "<Device type 3> C-16 ");
    EXPECT_EQ(DescribeDeviceAddress(9, 1, 1, 1, 8), "<Device type 9> ");
    EXPECT_EQ(DescribeDeviceAddress(0, 0, 0, 0, 1), "<Device type 0> ");
    EXPECT_EQ(DescribeDeviceAddress(5, 0, 7, 32767, 2), "<Device type 5> 7 32767-32768");
    EXPECT_EQ(DescribeDeviceAddress(seqlib::DeviceAddress(1, 2, 240, 1, 3)), "VTR Aux B F0 1-3");
}

TEST(SequenceUtils, NamesNetworksAndUniverses) {
    EXPECT_EQ(VtrNetworkText(0), "Regular");
    EXPECT_EQ(VtrNetworkText(1), "Aux A");
    EXPECT_EQ(VtrNetworkText(15), "Aux O");
    EXPECT_EQ(VtrNetworkText(26), "Aux Z");
    EXPECT_EQ(VtrNetworkText(27), "Net 27");
    EXPECT_EQ(VtrNetworkText(-1), "Net -1");
    EXPECT_EQ(SequenceUtils::UniverseText(512), "Universe 512");
    EXPECT_EQ(NetworkText(7, 0), "Universe 0");
    EXPECT_EQ(NetworkText(1, 3), "Aux C");
    EXPECT_EQ(NetworkText(3, 3), "");
    EXPECT_EQ(NetworkText(4, 3), "");
}

TEST(SequenceUtils, WritesUnitsInEachTypesOwnFormAndRange) {
    struct Row {
        int32_t type;
        int unit;
        const char* text;
    };
    for (const Row& row :
         {Row{1, 0, ""},     Row{1, 1, "01"},  Row{1, 15, "0F"},     Row{1, 16, "10"},
          Row{1, 240, "F0"}, Row{1, 241, ""},  Row{2, 0, "0"},       Row{2, 99, "99"},
          Row{2, 100, ""},   Row{3, 0, "A-1"}, Row{3, 0x2F, "C-16"}, Row{3, 255, "P-16"},
          Row{4, 0, ""},     Row{4, 1, "1"},   Row{4, 106, "106"},   Row{4, 107, ""},
          Row{5, 0, "0"},    Row{5, 99, "99"}, Row{5, 100, ""},      Row{7, 5, ""},
          Row{6, 5, ""}}) {
        EXPECT_EQ(UnitText(row.type, static_cast<uint8_t>(row.unit)), row.text)
            << "type " << row.type << " unit " << row.unit;
    }
}

TEST(SequenceUtils, NumbersTracksFromOneInTexts) {
    seqlib::Track roof;
    roof.SetName("Roof");
    const seqlib::Track unnamed;
    EXPECT_EQ(TrackText(&roof, 2), "Track 3: Roof");
    EXPECT_EQ(TrackText(&unnamed, 4), "Track 5");
    EXPECT_EQ(TrackText(nullptr, 0), "Track 1");
    EXPECT_EQ(TrackText(&roof, -1), "Roof");
    EXPECT_EQ(TrackText(&unnamed, -1), "Track");
    EXPECT_EQ(TrackText(std::shared_ptr<seqlib::Track>(), -1), "Track");
}

// Keeps the transient texts, results and event-pump calls of what runs while it lives.
class Recorder : public INotificationClient {
  public:
    Recorder() {
        LibVerify::ClearResults();
        LibVerify::AddNotificationClient(this);
        LibVerify::SetEventPump([this] { messages.push_back("(pump)"); });
    }
    ~Recorder() override {
        LibVerify::RemoveNotificationClient(this);
        LibVerify::SetEventPump(nullptr);
        LibVerify::ClearResults();
    }
    void CheckAdded(ICheck&) override {}
    void CheckCompleted(ICheck&) override {}
    void Checking(ICheck&) override {}
    void ChecksCompleted(bool) override {}
    void Initializing() override {}
    void ResultAdded(const ResultPtr& result) override { results.push_back(result); }
    void TransientMessage(const std::string& message) override { messages.push_back(message); }
    void VerificationCancelled() override {}

    std::vector<std::string> messages;
    std::vector<ResultPtr> results;
};

class SequenceAccessTest : public testsupport::StoreTest {};

TEST_F(SequenceAccessTest, PlaybackFileOfAnEditFileIsReadEachTimeWithItsProblem) {
    const std::string edit = folder_.File("Carol.vtredit");
    const std::string empty = folder_.File("Empty.VTRPROT");
    testsupport::WriteFileBytes(
        edit, R"(<sequenceEdit formatVersion="1"><playback file="Carol.lms"/></sequenceEdit>)");
    testsupport::WriteFileBytes(empty, R"(<sequenceEdit formatVersion="1"/>)");
    Recorder recorder;

    EXPECT_EQ(SequenceUtils::GetR9PlaybackFile(edit), folder_.File("Carol.lms"));
    EXPECT_TRUE(recorder.results.empty());
    EXPECT_EQ(recorder.messages, std::vector<std::string>{"Getting info for R9 Sequence: " + edit});

    EXPECT_EQ(SequenceUtils::GetR9PlaybackFile(empty), "");
    EXPECT_EQ(SequenceUtils::GetR9PlaybackFile(empty), "") << "not answered from a cache";
    ASSERT_EQ(recorder.results.size(), 2u);
    const Result& result = *recorder.results[0];
    EXPECT_EQ(result.Severity(), Severity::Error);
    EXPECT_EQ(result.Summary(), "No Playback File Name");
    EXPECT_EQ(result.MessageNumber(), 0);
    EXPECT_EQ(result.HelpContextID(), 0);
    EXPECT_EQ(result.Details(), (std::vector<std::string>{"[SEQUENCE]: " + empty,
                                                          "[PROBLEM]: No playback file named"}));

    recorder.results.clear();
    EXPECT_EQ(SequenceUtils::GetR9PlaybackFile(folder_.File("missing.vtredit")), "");
    EXPECT_TRUE(recorder.results.empty()) << "an unreadable edit file gives no record";
}

TEST_F(SequenceAccessTest, LoaderTellsEachPercentAndLetsEventsThrough) {
    seqlib::SequenceGenerator::Options options;
    options.channels = 400;
    options.eventsPerChannel = 200;
    const std::string file = folder_.File("big.lms");
    seqlib::SequenceGenerator::WriteFile(file, options);
    Recorder recorder;
    std::shared_ptr<seqlib::Sequence> sequence;
    {
        SequenceLoader loader;
        sequence = loader.Load(file);
    }
    ASSERT_NE(sequence, nullptr);
    EXPECT_EQ(sequence->Channels().size(), 400u) << "the sequence outlives its loader";
    const auto& told = recorder.messages;
    ASSERT_GE(told.size(), 6u);
    EXPECT_EQ(told.front(), "Loading 0% of " + file);
    EXPECT_EQ(told[told.size() - 2], "Loading 100% of " + file);
    for (std::size_t i = 0; i < told.size(); i += 2) {
        EXPECT_EQ(told[i].rfind("Loading ", 0), 0u) << told[i];
        EXPECT_EQ(told[i + 1], "(pump)") << "the pump runs after each text";
    }
}

TEST_F(SequenceAccessTest, LoaderPassesLoadErrorsOnUnchanged) {
    const std::string file = folder_.File("bad.lms");
    testsupport::WriteFileBytes(file, "<show/>");
    Recorder recorder;
    SequenceLoader loader;
    try {
        loader.Load(file);
        FAIL() << "no error";
    } catch (const VtrError& e) {
        EXPECT_EQ(e.Number(), ErrorNumbers::UserMessage);
        EXPECT_EQ(e.Description(), "Cannot load sequence file \"" + file +
                                       "\": line 1, column 1: the root element is <show>, not "
                                       "<sequence>");
    }
}

}  // namespace
}  // namespace vtr
