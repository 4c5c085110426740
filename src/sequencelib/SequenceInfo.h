#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace vtr::seqlib {

// What the sequence-information service knows of an edit file (a sequence of the newer
// format, "vtredit", or "vtrprot" when it is gzip-compressed): the playable sequence file
// it plays, or the problem that keeps it from naming one.
class SequenceInfo {
  public:
    int32_t ProblemCount() const { return static_cast<int32_t>(problemTexts_.size() / 2); }
    // Two texts per problem: "[SEQUENCE]: " and the edit file, then "[PROBLEM]: " and what
    // is wrong.
    const std::vector<std::string>& ProblemTexts() const { return problemTexts_; }
    // The file it plays: a relative name taken against the edit file's own folder.
    const std::string& PlaybackFile() const { return playbackFile_; }

  private:
    friend class SequenceInfoService;
    std::vector<std::string> problemTexts_;
    std::string playbackFile_;
};

class SequenceInfoService {
  public:
    // Reads the edit file afresh on every call; nothing when it cannot be read or is not
    // an edit file.
    std::optional<SequenceInfo> GetSequenceInfo(const std::string& fileName) const;
};

// Path helpers shared by the services: whether a name stands on its own (a root, a drive
// or a network share), and the folder part of a path with its trailing separator.
bool IsAbsolutePath(const std::string& path);
std::string FolderOf(const std::string& path);

}  // namespace vtr::seqlib
