#include "checks/sequence/MediaPathResolver.h"

#include "environment/LibFile.h"
#include "environment/SuitePathService.h"
#include "sequencelib/SequenceInfo.h"

namespace vtr {

namespace {
constexpr int32_t kMediaDataPath = 3;
}

std::string MediaPathResolver::Resolve(const std::string& mediaName,
                                       const std::string& sequenceFile) const {
    if (mediaName.empty() || seqlib::IsAbsolutePath(mediaName))
        return mediaName;
    const std::string mediaFolder = SuitePathService().GetPath(kMediaDataPath);
    if (!mediaFolder.empty())
        return LibFile::AddTrailingBackslash(mediaFolder) + mediaName;
    return seqlib::FolderOf(sequenceFile) + mediaName;
}

}  // namespace vtr
