#pragma once

#include <string>

namespace vtr {

// Turns the media (audio or video) file name stored in a sequence into the path that is
// checked: an absolute name stands as it is; a relative one is joined to the suite's media
// data folder, or, when that folder is not configured, to the sequence file's own folder.
class MediaPathResolver {
  public:
    std::string Resolve(const std::string& mediaName, const std::string& sequenceFile) const;
};

}  // namespace vtr
