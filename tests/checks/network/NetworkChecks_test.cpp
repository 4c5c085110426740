// Channels, intensity-file devices and triggers on networks the preferences define, or not.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>

#include "checks/SequenceFixture.h"
#include "checks/network/CheckTrigNetNotEnhanced.h"
#include "checks/network/CheckTriggerDefinedNetwork.h"
#include "checks/network/CheckUsedNetworksDefined.h"
#include "engine/LibVerify.h"
#include "environment/NetworkPreferences.h"

namespace vtr {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;
using testsupport::DeviceXml;
using testsupport::IntensityFileXml;
using testsupport::RegDword;
using testsupport::RegText;
using testsupport::ResultTexts;
using testsupport::SequenceText;

TEST(IsNetworkDefinedTest, TheSuitesOwnNetworksNeedAPortAndExistOnlyFrom0To15) {
    NetworkPreferences preferences;
    preferences.VTRNetwork(0).SetPort(1);
    preferences.VTRNetwork(15).SetPort(2);
    EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 1, 0));
    EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 1, 15));
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 1, 3));
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 1, 16));
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 1, -1));
}

TEST(IsNetworkDefinedTest, X10AndTolvexNeedTheirPortsWhateverTheNetwork) {
    NetworkPreferences preferences;
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 3, 0));
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 4, 0));
    preferences.SetX10Port(3);
    preferences.SetTolvexPort(4);
    EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 3, 77));
    EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 4, -5));
}

TEST(IsNetworkDefinedTest, ADmxUniverseNeedsItsE131AddressWhenItUsesE131AndElseAnAdapter) {
    NetworkPreferences preferences;
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 7, 1));
    preferences.DMXUniverse(1).SetAdapter("USB0");
    EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 7, 1));
    preferences.DMXUniverse(1).SetUsesE131(true);
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 7, 1));
    preferences.DMXUniverse(1).SetE131IPAddress("10.0.0.9");
    EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 7, 1));
    preferences.DMXUniverse(1).SetAdapter("");
    EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 7, 1));
    // No universe 0 or 1000.
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 7, 0));
    EXPECT_FALSE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, 7, 1000));
}

TEST(IsNetworkDefinedTest, OtherDeviceTypesAreAlwaysDefined) {
    const NetworkPreferences preferences;
    for (int type : {0, 2, 5, 6, 8, -1})
        EXPECT_TRUE(CheckUsedNetworksDefined::IsNetworkDefined(preferences, type, 99)) << type;
}

class NetworkChecksTest : public testsupport::SequenceCheckTest {
  protected:
    std::vector<std::string> Run(const SequenceText& sequence) {
        path = WriteSequence("Net.las", sequence);
        CheckUsedNetworksDefined check(path);
        RunCheck(check);
        return ResultTexts();
    }
    std::string path = DataFile("Net.las");
};

TEST_F(NetworkChecksTest, AChannelOnNetwork16IsAlwaysUndefined) {
    store["Shared\\Network"] = {{"NetworkVantori", RegDword(1)}};
    WriteSuiteStore();
    SequenceText seq;
    seq.Channel(1, "Roof", R"(deviceType="1" network="16" unit="1" circuit="1")")
        .Channel(2, "Yard", R"(deviceType="1" network="0" unit="1" circuit="2")")
        .Channel(3, "Servo", R"(deviceType="5" network="9" unit="1" circuit="2")")
        .Channel(4, "Relay", R"(deviceType="2" network="9" unit="1" circuit="2")")
        .Track("Front", {1, 2, 3, 4})
        .Track("Back", {1});
    // The channel shared by the two tracks is reported once, with the first.
    {
        const auto results = Run(seq);
        EXPECT_THAT(results, ElementsAre("31: [SEQUENCE]: " + path +
                                         " | [TRACK]: Track 1: Front | [CHANNEL]: Roof"));
    }
}

TEST_F(NetworkChecksTest, UndefinedNetworksFollowThePreferencesOfTheRun) {
    store["Shared\\Network"] = {{"NetworkVantori", RegDword(0)}, {"NetworkX10", RegDword(3)}};
    store["Shared\\Network\\AuxB"] = {{"NetworkVantori", RegDword(2)}};
    WriteSuiteStore();
    SequenceText seq;
    seq.Channel(1, "Regular", R"(deviceType="1" network="0" unit="1" circuit="1")")
        .Channel(2, "AuxB", R"(deviceType="1" network="2" unit="1" circuit="1")")
        .Channel(3, "X10", R"(deviceType="3" unit="33")")
        .Channel(4, "Tolvex", R"(deviceType="4" unit="3" circuit="1")")
        .Track("", {1, 2, 3, 4});
    {
        const auto results = Run(seq);
        EXPECT_THAT(
            results,
            ElementsAre("31: [SEQUENCE]: " + path + " | [TRACK]: Track 1 | [CHANNEL]: Regular",
                        "31: [SEQUENCE]: " + path + " | [TRACK]: Track 1 | [CHANNEL]: Tolvex"));
    }
    const auto& result = LibVerify::GetResults().front();
    EXPECT_EQ(result->Summary(), "Channel uses undefined comm network");
    EXPECT_EQ(result->HelpContextID(), 31);
}

TEST_F(NetworkChecksTest, EveryIntensityFileDeviceOnAnUndefinedNetworkIsReported) {
    store["Shared\\Network\\DMX1"] = {{"Adapter", RegText("USB0")}};
    store["Shared\\Network\\DMX2"] = {{"Adapter", RegText("USB1")}, {"Uses E131", RegDword(1)}};
    WriteSuiteStore();
    SequenceText seq;
    seq.Channel(1, "Roof", R"(deviceType="1" unit="1" circuit="1")")
        .Track("A", {1},
               IntensityFileXml("Novalux", DeviceXml(7, 1, 0, 1, 10) + DeviceXml(1, 27, 1, 1, 16)))
        .Track("B", {1},
               IntensityFileXml("Gridcraft", DeviceXml(7, 2, 0, 1, 3) + DeviceXml(7, 2, 0, 4, 3) +
                                                 DeviceXml(3, 0, 1, 1, 1)));
    const std::string head = "49: [SEQUENCE]: ";
    EXPECT_THAT(
        Run(seq),
        ElementsAre(
            head + path + " | [INTENSITY FILE]: Gridcraft Intensity File | [NETWORK]: Universe 2",
            head + path + " | [INTENSITY FILE]: Gridcraft Intensity File | [NETWORK]: Universe 2",
            head + path + " | [INTENSITY FILE]: Gridcraft Intensity File | [NETWORK]: ",
            head + path + " | [INTENSITY FILE]: Novalux Intensity File | [NETWORK]: Net 27"));
    const auto& result = LibVerify::GetResults().front();
    EXPECT_EQ(result->Summary(), "Intensity file uses undefined comm network");
    EXPECT_EQ(result->HelpContextID(), 51);
}

class TriggerChecksTest : public testsupport::SequenceCheckTest {};

TEST_F(TriggerChecksTest, ATriggerOnAnUndefinedNetworkGivesMessage53Only) {
    auto trigger = TriggerFunctions::CreateTrigger(4, 1, 2, "Button");
    CheckTriggerDefinedNetwork check("Eve.lss", trigger, "Startup trigger");
    EXPECT_THAT(RunCheck(check), IsEmpty());
    EXPECT_THAT(ResultTexts(),
                ElementsAre("53: [SHOW] Eve.lss | [NETWORK] Aux D | [TRIGGER] Startup trigger"));
    const auto& result = LibVerify::GetResults().front();
    EXPECT_EQ(result->HelpContextID(), 56);
    EXPECT_EQ(result->Summary(), "Trigger uses undefined network");

    // A network the preferences cannot hold is undefined too.
    LibVerify::ClearResults();
    trigger->SetNetwork(16);
    CheckTriggerDefinedNetwork outside("Eve.lss", trigger, "Interactive group (Porch)");
    EXPECT_THAT(RunCheck(outside), IsEmpty());
    EXPECT_THAT(
        ResultTexts(),
        ElementsAre("53: [SHOW] Eve.lss | [NETWORK] Aux P | [TRIGGER] Interactive group (Porch)"));
}

TEST_F(TriggerChecksTest, ATriggerOnADefinedNetworkGoesOnToTheEnhancedCheck) {
    store["Shared\\Network\\AuxA"] = {{"NetworkVantori", RegDword(3)}, {"Enhanced", RegDword(1)}};
    WriteSuiteStore();
    auto trigger = TriggerFunctions::CreateTrigger(1, 1, 2, "Button");
    CheckTriggerDefinedNetwork check("Eve.lss", trigger, "Startup trigger");
    EXPECT_THAT(RunCheck(check), ElementsAre("Trigger on VTR Enhanced network: Startup trigger"));
    EXPECT_THAT(ResultTexts(), IsEmpty());

    CheckTrigNetNotEnhanced enhanced("Eve.lss", trigger, "Startup trigger");
    enhanced.Check();
    EXPECT_THAT(ResultTexts(),
                ElementsAre("54: [SHOW] Eve.lss | [NETWORK] Aux A | [TRIGGER] Startup trigger"));
    EXPECT_EQ(LibVerify::GetResults().front()->HelpContextID(), 57);

    // The regular network, on its default port and not enhanced, passes both.
    LibVerify::ClearResults();
    auto regular = TriggerFunctions::CreateTrigger(0, 1, 2, "Button");
    CheckTriggerDefinedNetwork regularCheck("Eve.lss", regular, "Startup trigger");
    EXPECT_THAT(RunCheck(regularCheck),
                ElementsAre("Trigger on VTR Enhanced network: Startup trigger"));
    CheckTrigNetNotEnhanced regularEnhanced("Eve.lss", regular, "Startup trigger");
    regularEnhanced.Check();
    EXPECT_THAT(ResultTexts(), IsEmpty());
}

TEST_F(TriggerChecksTest, TriggersAreIdentifiedByTheObjectNotItsContents) {
    auto first = TriggerFunctions::CreateTrigger(0, 1, 2, "Button");
    auto twin = TriggerFunctions::CreateTrigger(0, 1, 2, "Button");
    ASSERT_TRUE(first->Equals(twin));
    CheckTriggerDefinedNetwork a("Eve.lss", first, "Startup trigger");
    CheckTriggerDefinedNetwork b("Day.lss", twin, "Startup trigger");
    const std::string firstId = std::to_string(reinterpret_cast<std::uintptr_t>(first.get()));
    EXPECT_EQ(a.CheckIdentifier(), "37_" + firstId);
    EXPECT_NE(a.CheckIdentifier(), b.CheckIdentifier());
    EXPECT_EQ(CheckTrigNetNotEnhanced("x", first, "y").CheckIdentifier(), "38_" + firstId);
    EXPECT_EQ(a.Description(), "Trigger on defined network: Startup trigger");
    EXPECT_EQ(CheckTrigNetNotEnhanced("x", first, "Interactive group (A)").Description(),
              "Trigger on VTR Enhanced network: Interactive group (A)");
    a.SetTrig(twin);
    EXPECT_EQ(a.CheckIdentifier(), b.CheckIdentifier());

    // In a run, one object queued twice is checked once; equal objects each once.
    LibVerify::BeginVerification();
    client.Clear();
    LibVerify::AddCheck(std::make_shared<CheckTriggerDefinedNetwork>("Eve.lss", first, "T1"));
    LibVerify::AddCheck(std::make_shared<CheckTriggerDefinedNetwork>("Day.lss", first, "T2"));
    LibVerify::AddCheck(std::make_shared<CheckTriggerDefinedNetwork>("Day.lss", twin, "T3"));
    EXPECT_THAT(client.Lines("Added "),
                ElementsAre("Trigger on defined network: T1", "Trigger on defined network: T3"));
}

TEST(NetworkCheckIdentityTest, UsedNetworksIdentifierAndDescription) {
    CheckUsedNetworksDefined check("a.lms");
    EXPECT_EQ(check.CheckIdentifier(), "27_a.lms");
    EXPECT_EQ(check.Description(), "Channels use defined networks: a.lms");
    check.SetFilename("b.lms");
    EXPECT_EQ(check.CheckIdentifier(), "27_b.lms");
}

}  // namespace
}  // namespace vtr
