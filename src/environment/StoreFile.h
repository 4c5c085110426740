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

// The lock that writers of a store hold for the whole of a change (reading the store,
// changing it, replacing it): a lock of the operating system, which is released when its
// holder ends however it ends, so nothing has to be cleaned up after a writer that was killed.
// Nothing is ever created in the store's folder for it.
//   - On a store file: on POSIX the store's folder itself is locked (flock), which is never
//     replaced, so nothing is created for the lock. On Windows a lock file of this program's
//     own is locked (LockFileEx): LockFileOf(the store file), in the user's local
//     application data; it is created, with its folder, when missing and is never deleted
//     (deleting it could let a second writer lock a new file while the first holds the old).
//   - On a lock file of its own (the Windows registry's writers use one in the user's
//     profile): that file is locked; it is created, with its folder, when missing.
// Waits while another process (or another lock object of this one) holds it.
#ifdef _WIN32
// The folder of this program's lock files: %LOCALAPPDATA%\Vantori (APPDATA, then TEMP, then
// the system's temporary folder, when that is not set).
std::string LockFolder();
// The lock file of a store file: LockFolder()\locks\store-<16 hex digits>.lock, the digits
// a hash of the store's full path as the file system resolves it (the part that exists named
// by the system, all of it case-folded), so that every name of one store file (relative,
// other letter case, short names, through a link to its folder) gives the same lock file.
std::string LockFileOf(const std::string& storePath);
#endif

class Lock {
  public:
    enum class On { StoreFile, LockFile };
    Lock(const std::string& path, On on);
    ~Lock();
    Lock(const Lock&) = delete;
    Lock& operator=(const Lock&) = delete;

    bool Held() const { return held_; }
    // The system's error number when the lock could not be taken.
    int Error() const { return error_; }

  private:
    bool held_ = false;
    int error_ = 0;
#ifdef _WIN32
    void* file_ = nullptr;
#else
    int fd_ = -1;
#endif
};

// Whether the file's own permissions forbid writing it: on POSIX the write bit of the class
// the process belongs to (owner, group, others; the superuser counts as the owner, so a file
// that its owner cannot write is read-only for the superuser too); on Windows the read-only
// attribute. A missing file is not read-only. Nothing when the file cannot be examined.
std::optional<bool> IsReadOnly(const std::string& path);

// Replaces the file's content with bytes, so that the file is at every moment either the old
// or the new version. Only to be called under the store's Lock. Temporary files that an
// interrupted writer left behind are removed first. False (and the old file untouched, the
// system's error number in *error when given) on failure.
bool Replace(const std::string& path, const std::string& bytes, int* error = nullptr);

// The system's words for an error number of the calls above ("Permission denied").
std::string ErrorText(int error);

}  // namespace vtr::StoreFile
