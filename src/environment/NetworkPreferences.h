#pragma once

#include <array>
#include <cstdint>
#include <string>

// The suite's communication networks as configured below "Software\Vantori\Shared": up
// to 16 networks of its own controllers, a Tolvex port, an X10 port and 999 DMX
// universes, under a revision key "Network" + the tag stored in "NetVersion\Ver".
namespace vtr {

// One network of the suite's own controllers.
class VTRNetworkPreferences {
  public:
    // The comm port, 0 when the network is not defined.
    uint8_t Port() const { return port_; }
    void SetPort(uint8_t port) { port_ = port; }
    int32_t Speed() const { return speed_; }
    void SetSpeed(int32_t speed) { speed_ = speed; }
    bool Enhanced() const { return enhanced_; }
    void SetEnhanced(bool enhanced) { enhanced_ = enhanced; }
    // Compatibility with old KR-P controllers.
    bool OldKRP() const { return oldKRP_; }
    void SetOldKRP(bool oldKRP) { oldKRP_ = oldKRP; }
    bool UsesACN() const { return usesACN_; }
    void SetUsesACN(bool usesACN) { usesACN_ = usesACN; }
    int32_t ACNIPType() const { return acnIPType_; }
    void SetACNIPType(int32_t type) { acnIPType_ = type; }
    const std::string& ACNIPAddress() const { return acnIPAddress_; }
    void SetACNIPAddress(std::string address) { acnIPAddress_ = std::move(address); }
    int32_t ACNSendToPort() const { return acnSendToPort_; }
    void SetACNSendToPort(int32_t port) { acnSendToPort_ = port; }
    const std::string& Comment() const { return comment_; }
    void SetComment(std::string comment) { comment_ = std::move(comment); }

    // Reads the values of one network key (a path below the Shared key) with the given
    // defaults; "VtrSpeed" defaults to 2, "Enhanced" to False, "Comment" to "". Never
    // fails.
    void InitFromRegistry(const std::string& key, uint8_t defaultPort, bool defaultOldKRP,
                          bool defaultUsesACN, int32_t defaultACNIPType,
                          const std::string& defaultACNIPAddress, int32_t defaultACNSendToPort);
    void CopyFrom(const VTRNetworkPreferences& other) { *this = other; }
    bool DiffersFrom(const VTRNetworkPreferences& other) const { return !(*this == other); }
    bool operator==(const VTRNetworkPreferences&) const = default;

  private:
    uint8_t port_ = 0;
    int32_t speed_ = 2;
    bool enhanced_ = false;
    bool oldKRP_ = false;
    bool usesACN_ = false;
    int32_t acnIPType_ = 1;
    std::string acnIPAddress_;
    int32_t acnSendToPort_ = 0;
    std::string comment_;
};

// One DMX universe.
class DMXUniversePrefs {
  public:
    const std::string& Adapter() const { return adapter_; }
    void SetAdapter(std::string adapter) { adapter_ = std::move(adapter); }
    int32_t Protocol() const { return protocol_; }
    void SetProtocol(int32_t protocol) { protocol_ = protocol; }
    bool UsesE131() const { return usesE131_; }
    void SetUsesE131(bool uses) { usesE131_ = uses; }
    int32_t E131IPType() const { return e131IPType_; }
    void SetE131IPType(int32_t type) { e131IPType_ = type; }
    const std::string& E131IPAddress() const { return e131IPAddress_; }
    void SetE131IPAddress(std::string address) { e131IPAddress_ = std::move(address); }
    int32_t E131SendToPort() const { return e131SendToPort_; }
    void SetE131SendToPort(int32_t port) { e131SendToPort_ = port; }
    const std::string& Comment() const { return comment_; }
    void SetComment(std::string comment) { comment_ = std::move(comment); }

    // Reads one universe key (a path below the Shared key). Never fails.
    void InitFromRegistry(const std::string& key);
    void CopyFrom(const DMXUniversePrefs& other) { *this = other; }
    bool DiffersFrom(const DMXUniversePrefs& other) const { return !(*this == other); }
    bool operator==(const DMXUniversePrefs&) const = default;

  private:
    std::string adapter_;
    int32_t protocol_ = 0;
    bool usesE131_ = false;
    int32_t e131IPType_ = 1;
    std::string e131IPAddress_;
    int32_t e131SendToPort_ = 0;
    std::string comment_;
};

class NetworkPreferences {
  public:
    static constexpr int32_t kVTRNetworks = 16;    // 0 (the regular one) to 15
    static constexpr int32_t kDMXUniverses = 999;  // 1 to 999
    static constexpr int32_t kDefaultListenerPort = 8837;

    NetworkPreferences();

    bool ListNetworks() const { return listNetworks_; }
    void SetListNetworks(bool list) { listNetworks_ = list; }
    uint8_t TolvexPort() const { return tolvexPort_; }
    void SetTolvexPort(uint8_t port) { tolvexPort_ = port; }
    uint8_t X10Port() const { return x10Port_; }
    void SetX10Port(uint8_t port) { x10Port_ = port; }
    int32_t CommListenerPort() const { return commListenerPort_; }
    void SetCommListenerPort(int32_t port) { commListenerPort_ = port; }

    // Network n, 0 to 15; universe u, 1 to 999. Another number raises VtrError 9
    // (subscript out of range).
    VTRNetworkPreferences& VTRNetwork(int32_t n);
    const VTRNetworkPreferences& VTRNetwork(int32_t n) const;
    DMXUniversePrefs& DMXUniverse(int32_t u);
    const DMXUniversePrefs& DMXUniverse(int32_t u) const;

    // True once InitFromRegistry has read the store.
    bool Loaded() const { return loaded_; }

    // "Network" followed by the revision tag now stored (read from the store).
    static std::string CurrentRevKey();

    // Reads everything, unless already loaded and not forced. Missing keys and values
    // take their defaults. A comm port claimed twice goes to the first claim: a later
    // network on an earlier network's port, and the X10 and Tolvex ports when a network
    // uses them, get port 0; Tolvex also yields to X10.
    void InitFromRegistry(bool force);

    void CopyFrom(const NetworkPreferences& other) { *this = other; }
    // True when any setting differs (the loaded flag is not a setting).
    bool DiffersFrom(const NetworkPreferences& other) const;

    // Whether the comm port is that of a defined network (of an auxiliary one, 1 to 15),
    // and which network uses it (-1 for none). Port 0 belongs to no network.
    bool IsVTRNetworkPort(uint8_t port) const;
    bool IsAuxiliaryVTRNetworkPort(uint8_t port) const;
    int32_t GetVTRNetworkForPort(uint8_t port) const;

  private:
    void MakePortsUnique();

    bool listNetworks_ = false;
    uint8_t tolvexPort_ = 0;
    uint8_t x10Port_ = 0;
    int32_t commListenerPort_ = kDefaultListenerPort;
    std::array<VTRNetworkPreferences, kVTRNetworks> networks_;
    std::array<DMXUniversePrefs, kDMXUniverses> universes_;
    bool loaded_ = false;
};

}  // namespace vtr
