#pragma once

#include <string>

#include "checks/common/FileCheck.h"

namespace vtr {

// Reports message 28 for every channel (per track that lists it) that is never on, except a
// channel named "c0" that is the first channel of the first track: the placeholder channel of
// an empty sequence.
class CheckChannelsHaveEvents : public FileCheck {
  public:
    explicit CheckChannelsHaveEvents(std::string filename = {});

    void Check() override;
};

}  // namespace vtr
