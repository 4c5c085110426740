#include "environment/NetworkPreferences.h"

#include <gtest/gtest.h>

#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"
#include "support/TempStore.h"

namespace vtr {
namespace {

using LibRegistryVTRShared::SetSharedLong;
using LibRegistryVTRShared::SetSharedString;

const char* const kHeader = "Windows Registry Editor Version 5.00\r\n\r\n";
const char* const kShared = "[HKEY_CURRENT_USER\\Software\\Vantori\\Shared";

class NetworkPreferencesTest : public testsupport::StoreTest {
  protected:
    NetworkPreferences Loaded() {
        NetworkPreferences prefs;
        prefs.InitFromRegistry(false);
        return prefs;
    }
};

TEST_F(NetworkPreferencesTest, AnEmptyStoreGivesTheDefaults) {
    const NetworkPreferences prefs = Loaded();
    EXPECT_TRUE(prefs.Loaded());
    EXPECT_FALSE(prefs.ListNetworks());
    EXPECT_EQ(prefs.TolvexPort(), 0);
    EXPECT_EQ(prefs.X10Port(), 0);
    EXPECT_EQ(prefs.CommListenerPort(), 8837);
    EXPECT_EQ(prefs.VTRNetwork(0).Port(), 1);
    for (int32_t n = 1; n < 16; ++n)
        EXPECT_EQ(prefs.VTRNetwork(n).Port(), 0) << n;
    const VTRNetworkPreferences& regular = prefs.VTRNetwork(0);
    EXPECT_EQ(regular.Speed(), 2);
    EXPECT_FALSE(regular.Enhanced());
    EXPECT_FALSE(regular.OldKRP());
    EXPECT_FALSE(regular.UsesACN());
    EXPECT_EQ(regular.ACNIPType(), 1);
    EXPECT_EQ(regular.ACNIPAddress(), "");
    EXPECT_EQ(regular.ACNSendToPort(), 0);
    for (const int32_t u : {1, 500, 999}) {
        const DMXUniversePrefs& universe = prefs.DMXUniverse(u);
        EXPECT_EQ(universe.Adapter(), "");
        EXPECT_FALSE(universe.UsesE131());
        EXPECT_EQ(universe.E131IPType(), 1);
        EXPECT_EQ(universe.E131IPAddress(), "");
        EXPECT_EQ(universe.Protocol(), 0);
    }
    EXPECT_EQ(NetworkPreferences::CurrentRevKey(), "Network");
    EXPECT_FALSE(NetworkPreferences().Loaded());
}

TEST_F(NetworkPreferencesTest, ReadsEveryValueBelowTheCurrentRevisionKey) {
    const std::string rev = "{5E1B0C2A-77D4-4B7E-9C11-3F2A0D6E8B41}";
    const std::string key = std::string(kShared) + "\\Network" + rev;
    WriteStore(
        std::string(kHeader) + kShared + "\\NetVersion]\r\n\"Ver\"=\"" + rev + "\"\r\n\r\n" + key +
        "]\r\n\"ListNetworks\"=dword:00000001\r\n\"NetworkTolvex\"=dword:00000007\r\n"
        "\"NetworkX10\"=dword:00000008\r\n\"DMXListenerPort\"=dword:00002710\r\n"
        "\"VtrOldKRP\"=dword:00000001\r\n\"NetworkVantori\"=dword:00000003\r\n"
        "\"VtrSpeed\"=dword:00000004\r\n\"Comment\"=\"Front yard\"\r\n\r\n" +
        key +
        "\\AuxC]\r\n\"NetworkVantori\"=dword:00000009\r\n\"Enhanced\"=dword:00000001\r\n"
        "\"Uses ACN\"=dword:00000001\r\n\"ACN IP Address Type\"=dword:00000002\r\n"
        "\"ACN IP Address\"=\"10.0.0.9\"\r\n\"ACN Send To Port\"=dword:00001538\r\n\r\n" +
        key + "\\DMX1]\r\n\"Adapter\"=\"USB Pro\"\r\n\"Protocol\"=dword:00000002\r\n\r\n" + key +
        "\\DMX999]\r\n\"Uses E131\"=dword:00000001\r\n\"E131 IP Address Type\"=dword:00000000\r\n"
        "\"E131 IP Address\"=\"239.255.3.231\"\r\n\"E131 Send To Port\"=dword:000015c0\r\n"
        "\"Comment\"=\"Last\"\r\n\r\n" +
        std::string(kShared) + "\\Network\\AuxC]\r\n\"NetworkVantori\"=dword:0000000b\r\n");
    const NetworkPreferences prefs = Loaded();
    EXPECT_EQ(NetworkPreferences::CurrentRevKey(), "Network" + rev);
    EXPECT_TRUE(prefs.ListNetworks());
    EXPECT_EQ(prefs.TolvexPort(), 7);
    EXPECT_EQ(prefs.X10Port(), 8);
    EXPECT_EQ(prefs.CommListenerPort(), 10000);
    const VTRNetworkPreferences& regular = prefs.VTRNetwork(0);
    EXPECT_EQ(regular.Port(), 3);
    EXPECT_EQ(regular.Speed(), 4);
    EXPECT_TRUE(regular.OldKRP()) << "the regular network takes VtrOldKRP as its default";
    EXPECT_EQ(regular.Comment(), "Front yard");
    const VTRNetworkPreferences& auxC = prefs.VTRNetwork(3);
    EXPECT_EQ(auxC.Port(), 9) << "read from the current revision, not the old key";
    EXPECT_TRUE(auxC.Enhanced());
    EXPECT_FALSE(auxC.OldKRP()) << "auxiliary networks do not inherit VtrOldKRP";
    EXPECT_TRUE(auxC.UsesACN());
    EXPECT_EQ(auxC.ACNIPType(), 2);
    EXPECT_EQ(auxC.ACNIPAddress(), "10.0.0.9");
    EXPECT_EQ(auxC.ACNSendToPort(), 5432);
    EXPECT_EQ(prefs.VTRNetwork(1).Port(), 0);
    EXPECT_EQ(prefs.DMXUniverse(1).Adapter(), "USB Pro");
    EXPECT_EQ(prefs.DMXUniverse(1).Protocol(), 2);
    const DMXUniversePrefs& last = prefs.DMXUniverse(999);
    EXPECT_TRUE(last.UsesE131());
    EXPECT_EQ(last.E131IPType(), 0);
    EXPECT_EQ(last.E131IPAddress(), "239.255.3.231");
    EXPECT_EQ(last.E131SendToPort(), 5568);
    EXPECT_EQ(last.Comment(), "Last");
    EXPECT_EQ(prefs.DMXUniverse(2).Adapter(), "");
}

TEST_F(NetworkPreferencesTest, AnExplicitOldKRPValueWinsOverTheDefault) {
    SetSharedLong("VtrOldKRP", 1, "Network");
    SetSharedLong("OldKRP-NewRegVal", 0, "Network");
    SetSharedLong("OldKRP-NewRegVal", 1, "Network\\AuxA");
    const NetworkPreferences prefs = Loaded();
    EXPECT_FALSE(prefs.VTRNetwork(0).OldKRP());
    EXPECT_TRUE(prefs.VTRNetwork(1).OldKRP());
}

TEST_F(NetworkPreferencesTest, EachCommPortGoesToItsFirstClaim) {
    SetSharedLong("NetworkVantori", 4, "Network");
    SetSharedLong("NetworkVantori", 4, "Network\\AuxC");
    SetSharedLong("NetworkVantori", 6, "Network\\AuxB");
    SetSharedLong("NetworkVantori", 6, "Network\\AuxE");
    SetSharedLong("NetworkVantori", 2, "Network\\AuxO");
    SetSharedLong("NetworkX10", 4, "Network");
    SetSharedLong("NetworkTolvex", 2, "Network");
    NetworkPreferences prefs = Loaded();
    EXPECT_EQ(prefs.VTRNetwork(0).Port(), 4);
    EXPECT_EQ(prefs.VTRNetwork(3).Port(), 0) << "network 3 lost port 4 to network 0";
    EXPECT_EQ(prefs.VTRNetwork(2).Port(), 6);
    EXPECT_EQ(prefs.VTRNetwork(5).Port(), 0);
    EXPECT_EQ(prefs.VTRNetwork(15).Port(), 2);
    EXPECT_EQ(prefs.X10Port(), 0) << "network 0 is on the X10 port";
    EXPECT_EQ(prefs.TolvexPort(), 0) << "network 15 is on the Tolvex port";

    SetSharedLong("NetworkX10", 5, "Network");
    SetSharedLong("NetworkTolvex", 5, "Network");
    prefs.InitFromRegistry(true);
    EXPECT_EQ(prefs.X10Port(), 5);
    EXPECT_EQ(prefs.TolvexPort(), 0) << "Tolvex yields to X10";

    SetSharedLong("NetworkTolvex", 7, "Network");
    prefs.InitFromRegistry(true);
    EXPECT_EQ(prefs.X10Port(), 5);
    EXPECT_EQ(prefs.TolvexPort(), 7);
}

TEST_F(NetworkPreferencesTest, AValueThatDoesNotFitAPortReadsAsItsDefault) {
    SetSharedLong("NetworkVantori", 300, "Network");
    SetSharedLong("NetworkVantori", -1, "Network\\AuxA");
    SetSharedLong("NetworkX10", 256, "Network");
    const NetworkPreferences prefs = Loaded();
    EXPECT_EQ(prefs.VTRNetwork(0).Port(), 1);
    EXPECT_EQ(prefs.VTRNetwork(1).Port(), 0);
    EXPECT_EQ(prefs.X10Port(), 0);
}

TEST_F(NetworkPreferencesTest, RereadsOnlyWhenForced) {
    NetworkPreferences prefs;
    prefs.InitFromRegistry(false);
    SetSharedLong("NetworkVantori", 9, "Network");
    SetSharedString("Adapter", "Box", "Network\\DMX7");
    prefs.InitFromRegistry(false);
    EXPECT_EQ(prefs.VTRNetwork(0).Port(), 1);
    EXPECT_EQ(prefs.DMXUniverse(7).Adapter(), "");
    prefs.InitFromRegistry(true);
    EXPECT_EQ(prefs.VTRNetwork(0).Port(), 9);
    EXPECT_EQ(prefs.DMXUniverse(7).Adapter(), "Box");
}

TEST_F(NetworkPreferencesTest, AStoreThatCannotBeParsedStillGivesDefaults) {
    WriteStore("this is not an export file\r\n[HKEY_CURRENT_USER\\Software\\Vantori\\Shared");
    const NetworkPreferences prefs = Loaded();
    EXPECT_EQ(prefs.VTRNetwork(0).Port(), 1);
    EXPECT_EQ(prefs.CommListenerPort(), 8837);
}

TEST(NetworkPreferences, MapsCommPortsToNetworks) {
    NetworkPreferences prefs;
    prefs.VTRNetwork(0).SetPort(3);
    prefs.VTRNetwork(4).SetPort(8);
    EXPECT_TRUE(prefs.IsVTRNetworkPort(3));
    EXPECT_FALSE(prefs.IsAuxiliaryVTRNetworkPort(3));
    EXPECT_TRUE(prefs.IsVTRNetworkPort(8));
    EXPECT_TRUE(prefs.IsAuxiliaryVTRNetworkPort(8));
    EXPECT_EQ(prefs.GetVTRNetworkForPort(3), 0);
    EXPECT_EQ(prefs.GetVTRNetworkForPort(8), 4);
    EXPECT_EQ(prefs.GetVTRNetworkForPort(5), -1);
    EXPECT_FALSE(prefs.IsVTRNetworkPort(0)) << "port 0 means no port";
    EXPECT_EQ(prefs.GetVTRNetworkForPort(0), -1);
    EXPECT_FALSE(prefs.IsAuxiliaryVTRNetworkPort(5));
}

TEST(NetworkPreferences, CopiesAndComparesEverySetting) {
    NetworkPreferences a;
    NetworkPreferences b;
    EXPECT_FALSE(a.DiffersFrom(b));
    b.DMXUniverse(999).SetComment("x");
    EXPECT_TRUE(a.DiffersFrom(b));
    a.CopyFrom(b);
    EXPECT_FALSE(a.DiffersFrom(b));
    a.VTRNetwork(15).SetACNSendToPort(1);
    EXPECT_TRUE(a.DiffersFrom(b));
    EXPECT_TRUE(a.VTRNetwork(15).DiffersFrom(b.VTRNetwork(15)));
    b.VTRNetwork(15).CopyFrom(a.VTRNetwork(15));
    EXPECT_FALSE(a.DiffersFrom(b));
    b.SetCommListenerPort(1);
    EXPECT_TRUE(a.DiffersFrom(b));
    DMXUniversePrefs u;
    u.CopyFrom(a.DMXUniverse(999));
    EXPECT_EQ(u.Comment(), "x");
    EXPECT_FALSE(u.DiffersFrom(a.DMXUniverse(999)));
}

TEST(NetworkPreferences, RefusesNetworksAndUniversesOutsideTheirRanges) {
    NetworkPreferences prefs;
    for (const int32_t n : {-1, 16}) {
        try {
            prefs.VTRNetwork(n);
            ADD_FAILURE() << n;
        } catch (const VtrError& e) {
            EXPECT_EQ(e.Number(), ErrorNumbers::SubscriptOutOfRange);
        }
    }
    EXPECT_THROW(prefs.DMXUniverse(0), VtrError);
    EXPECT_THROW(prefs.DMXUniverse(1000), VtrError);
    EXPECT_NO_THROW(prefs.DMXUniverse(999));
}

}  // namespace
}  // namespace vtr
