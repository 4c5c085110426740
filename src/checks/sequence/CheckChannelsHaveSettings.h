#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

// Reports message 30 for every channel (per track that lists it) without physical settings,
// with the same "c0" exemption as CheckChannelsHaveEvents.
class CheckChannelsHaveSettings : public FileCheck {
  public:
    explicit CheckChannelsHaveSettings(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
