#pragma once

#include <cstdint>
#include <string>

namespace vtr {

// The suite's path service: GetPath(2) is the non-media data folder, GetPath(3) the media
// data folder, as stored under "Software\Vantori\Shared"; any other kind gives "".
class SuitePathService {
public:
    std::string GetPath(int32_t kind) const;
};

}  // namespace vtr
