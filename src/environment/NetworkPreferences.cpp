#include "environment/NetworkPreferences.h"

#include "engine/VtrError.h"
#include "environment/LibRegistryVTRShared.h"
#include "environment/RegistryStore.h"

namespace vtr {

namespace {

using LibRegistryVTRShared::GetSharedBool;
using LibRegistryVTRShared::GetSharedLong;
using LibRegistryVTRShared::GetSharedString;
using LibRegistryVTRShared::SharedKeyExists;

// A DWORD read as a byte; a stored value that does not fit one reads as the default.
uint8_t GetSharedByte(const std::string& valueName, const std::string& key, uint8_t defaultValue) {
    const int32_t value = GetSharedLong(valueName, key, defaultValue);
    return value >= 0 && value <= 255 ? static_cast<uint8_t>(value) : defaultValue;
}

[[noreturn]] void RaiseOutOfRange(const char* what, int32_t index) {
    Raise(ErrorNumbers::SubscriptOutOfRange, "NetworkPreferences",
          std::string("No ") + what + " " + std::to_string(index));
}

}  // namespace

void VTRNetworkPreferences::InitFromRegistry(const std::string& key, uint8_t defaultPort,
                                             bool defaultOldKRP, bool defaultUsesACN,
                                             int32_t defaultACNIPType,
                                             const std::string& defaultACNIPAddress,
                                             int32_t defaultACNSendToPort) {
    if (!SharedKeyExists(key)) {
        // Every value of a missing key takes its default; no need to ask for each.
        *this = VTRNetworkPreferences();
        oldKRP_ = defaultOldKRP;
        port_ = defaultPort;
        usesACN_ = defaultUsesACN;
        acnIPType_ = defaultACNIPType;
        acnIPAddress_ = defaultACNIPAddress;
        acnSendToPort_ = defaultACNSendToPort;
        return;
    }
    oldKRP_ = GetSharedBool("OldKRP-NewRegVal", key, defaultOldKRP);
    port_ = GetSharedByte("NetworkVantori", key, defaultPort);
    speed_ = GetSharedLong("VtrSpeed", key, 2);
    enhanced_ = GetSharedBool("Enhanced", key, false);
    usesACN_ = GetSharedBool("Uses ACN", key, defaultUsesACN);
    acnIPType_ = GetSharedLong("ACN IP Address Type", key, defaultACNIPType);
    acnIPAddress_ = GetSharedString("ACN IP Address", key, defaultACNIPAddress);
    acnSendToPort_ = GetSharedLong("ACN Send To Port", key, defaultACNSendToPort);
    comment_ = GetSharedString("Comment", key, "");
}

void DMXUniversePrefs::InitFromRegistry(const std::string& key) {
    if (!SharedKeyExists(key)) {
        *this = DMXUniversePrefs();
        return;
    }
    adapter_ = GetSharedString("Adapter", key, "");
    protocol_ = GetSharedLong("Protocol", key, 0);
    usesE131_ = GetSharedBool("Uses E131", key, false);
    e131IPType_ = GetSharedLong("E131 IP Address Type", key, 1);
    e131IPAddress_ = GetSharedString("E131 IP Address", key, "");
    e131SendToPort_ = GetSharedLong("E131 Send To Port", key, 0);
    comment_ = GetSharedString("Comment", key, "");
}

NetworkPreferences::NetworkPreferences() {
    networks_[0].SetPort(1);
}

VTRNetworkPreferences& NetworkPreferences::VTRNetwork(int32_t n) {
    if (n < 0 || n >= kVTRNetworks)
        RaiseOutOfRange("network", n);
    return networks_[static_cast<std::size_t>(n)];
}

const VTRNetworkPreferences& NetworkPreferences::VTRNetwork(int32_t n) const {
    return const_cast<NetworkPreferences*>(this)->VTRNetwork(n);
}

DMXUniversePrefs& NetworkPreferences::DMXUniverse(int32_t u) {
    if (u < 1 || u > kDMXUniverses)
        RaiseOutOfRange("universe", u);
    return universes_[static_cast<std::size_t>(u - 1)];
}

const DMXUniversePrefs& NetworkPreferences::DMXUniverse(int32_t u) const {
    return const_cast<NetworkPreferences*>(this)->DMXUniverse(u);
}

std::string NetworkPreferences::CurrentRevKey() {
    return "Network" + GetSharedString("Ver", "NetVersion", "");
}

void NetworkPreferences::InitFromRegistry(bool force) {
    if (loaded_ && !force)
        return;
    // Some seven thousand values, most of them usually absent: one look at the store.
    RegistryStore::ReadScope reading;
    const std::string revKey = CurrentRevKey();
    listNetworks_ = GetSharedBool("ListNetworks", revKey, false);
    tolvexPort_ = GetSharedByte("NetworkTolvex", revKey, 0);
    x10Port_ = GetSharedByte("NetworkX10", revKey, 0);
    commListenerPort_ = GetSharedLong("DMXListenerPort", revKey, kDefaultListenerPort);
    for (int32_t n = 0; n < kVTRNetworks; ++n) {
        // The regular network's values sit in the revision key itself; the auxiliary ones
        // in its subkeys AuxA to AuxO.
        const std::string key =
            n == 0 ? revKey : revKey + "\\Aux" + std::string(1, static_cast<char>(64 + n));
        const bool defaultOldKRP = n == 0 && GetSharedBool("VtrOldKRP", revKey, false);
        networks_[static_cast<std::size_t>(n)].InitFromRegistry(key, n == 0 ? 1 : 0, defaultOldKRP,
                                                                false, 1, "", 0);
    }
    for (int32_t u = 1; u <= kDMXUniverses; ++u) {
        universes_[static_cast<std::size_t>(u - 1)].InitFromRegistry(revKey + "\\DMX" +
                                                                     std::to_string(u));
    }
    MakePortsUnique();
    loaded_ = true;
}

void NetworkPreferences::MakePortsUnique() {
    for (std::size_t i = 0; i < networks_.size(); ++i) {
        const uint8_t port = networks_[i].Port();
        if (port == 0)
            continue;
        for (std::size_t j = i + 1; j < networks_.size(); ++j) {
            if (networks_[j].Port() == port)
                networks_[j].SetPort(0);
        }
    }
    for (const VTRNetworkPreferences& network : networks_) {
        if (network.Port() == x10Port_)
            x10Port_ = 0;
        if (network.Port() == tolvexPort_)
            tolvexPort_ = 0;
    }
    if (x10Port_ == tolvexPort_)
        tolvexPort_ = 0;
}

bool NetworkPreferences::DiffersFrom(const NetworkPreferences& other) const {
    return listNetworks_ != other.listNetworks_ || tolvexPort_ != other.tolvexPort_ ||
           x10Port_ != other.x10Port_ || commListenerPort_ != other.commListenerPort_ ||
           networks_ != other.networks_ || universes_ != other.universes_;
}

bool NetworkPreferences::IsVTRNetworkPort(uint8_t port) const {
    return GetVTRNetworkForPort(port) >= 0;
}

bool NetworkPreferences::IsAuxiliaryVTRNetworkPort(uint8_t port) const {
    return GetVTRNetworkForPort(port) >= 1;
}

int32_t NetworkPreferences::GetVTRNetworkForPort(uint8_t port) const {
    if (port == 0)
        return -1;
    for (std::size_t n = 0; n < networks_.size(); ++n) {
        if (networks_[n].Port() == port)
            return static_cast<int32_t>(n);
    }
    return -1;
}

}  // namespace vtr
