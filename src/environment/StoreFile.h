#pragma once

#include <cstdint>
#include <optional>
#include <string>

// File handling under the settings store file: reading it with a stamp that tells whether it
// changed since, a lock that writers of one store hold while they read, change and replace
// it, and the replacement itself (a new file in the same folder, flushed to disk, renamed
// over the old one).
namespace vtr::StoreFile {

// Identifies one version of a file: a replaced or edited file gets another stamp.
struct Stamp {
    bool exists = false;
    uint64_t device = 0;
    uint64_t inode = 0;
    uint64_t size = 0;
    int64_t modified = 0;  // in the platform's finest unit
    int64_t changed = 0;
    bool operator==(const Stamp&) const = default;
};

// The stamp of the file as it is now; nothing when it cannot be examined (missing is fine:
// exists is false).
std::optional<Stamp> StampOf(const std::string& path);

enum class ReadOutcome { Read, Missing, Failed };

// The whole file and the stamp of the version read.
ReadOutcome ReadAll(const std::string& path, std::string& bytes, Stamp& stamp);

// The path that a write must replace: the target of a symbolic link, else the path itself.
std::string WriteTarget(const std::string& path);

// The advisory lock of the stores in one folder, held while the object lives. It locks the
// folder itself, which is never replaced, so nothing is created for it and nothing is left
// behind. Creates the folder when it does not exist.
class FolderLock {
  public:
    explicit FolderLock(const std::string& storePath);
    ~FolderLock();
    FolderLock(const FolderLock&) = delete;
    FolderLock& operator=(const FolderLock&) = delete;

    bool Held() const { return held_; }

  private:
    bool held_ = false;
#ifdef _WIN32
    void* mutex_ = nullptr;
#else
    int folder_ = -1;
#endif
};

// Replaces the file's content with bytes, so that the file is at every moment either the old
// or the new version. Only to be called under the store's FolderLock. Temporary files that
// an interrupted writer left behind are removed first. False (and the old file untouched)
// on failure.
bool Replace(const std::string& path, const std::string& bytes);

}  // namespace vtr::StoreFile
