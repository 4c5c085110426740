#pragma once

#include <cstdint>
#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

class NetworkPreferences;

// Reports message 31 for every channel, and message 49 for every intensity-file device,
// whose communication network is not defined in the network preferences.
class CheckUsedNetworksDefined : public FileCheck {
  public:
    explicit CheckUsedNetworksDefined(std::string filename = {});

    void Check() override;

    // Whether a device of the type can reach network `network` under these preferences:
    // type 1 (the suite's own controllers) when 0 <= network <= 15 and that network has a
    // port; type 3 (X10) when the X10 port is set; type 4 (Tolvex) when the Tolvex port is
    // set; type 7 (DMX) when universe `network` has an E1.31 address if it uses E1.31, or
    // else an adapter (a universe outside 1..999 is never defined); any other type always.
    static bool IsNetworkDefined(const NetworkPreferences& preferences, int32_t deviceType,
                                 int32_t network);
};

}  // namespace vtr
