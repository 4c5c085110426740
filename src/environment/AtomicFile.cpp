#include "environment/AtomicFile.h"

#include <algorithm>
#include <cerrno>
#include <random>
#include <system_error>

#include "engine/VtrError.h"
#include "environment/FilesRead.h"
#include "environment/LibFile.h"
#include "show/WholeFile.h"

#ifdef _WIN32
#include <fcntl.h>
#include <io.h>
#include <share.h>
#include <sys/stat.h>
#include <windows.h>
#else
#include <dirent.h>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <memory>
#endif

namespace vtr::AtomicFile {
namespace {

constexpr std::size_t kUniqueChars = 6;

struct Naming {
    const std::string& path;
    const std::string& what;
    const std::string& source;
};

[[noreturn]] void CannotCreate(const Naming& naming, const std::string& reason) {
    Raise(FileErrors::PathFileAccessError, naming.source,
          "Cannot create the " + naming.what + " " + naming.path + ": " + reason);
}

[[noreturn]] void CannotWrite(const Naming& naming, const std::string& reason) {
    Raise(FileErrors::DeviceIoError, naming.source,
          "Cannot write the " + naming.what + " " + naming.path + ": " + reason);
}

std::string Reason(int error) {
    return std::generic_category().message(error != 0 ? error : EIO);
}

// The folder of a path (with its trailing separator, "" for the current folder) and its name.
std::pair<std::string, std::string> Split(const std::string& path) {
#ifdef _WIN32
    const std::size_t cut = path.find_last_of("\\/:");
#else
    const std::size_t cut = path.rfind('/');
#endif
    if (cut == std::string::npos)
        return {std::string(), path};
    return {path.substr(0, cut + 1), path.substr(cut + 1)};
}

std::string NewVersionPrefix(const std::string& name) {
    return "." + name + kNewVersionMarker;
}

std::string UniqueChars() {
    static constexpr char kChars[] = "abcdefghijklmnopqrstuvwxyz0123456789";
    static thread_local std::mt19937 random(std::random_device{}());
    std::uniform_int_distribution<int> pick(0, static_cast<int>(sizeof kChars) - 2);
    std::string text;
    for (std::size_t i = 0; i < kUniqueChars; ++i)
        text += kChars[pick(random)];
    return text;
}

bool IsNewVersionName(const std::string& entry, const std::string& prefix) {
    return entry.size() == prefix.size() + kUniqueChars &&
           entry.compare(0, prefix.size(), prefix) == 0;
}

// Writes all the bytes through the writer, a call that returns what it wrote or -1.
template <typename WriteSome>
bool WriteAll(const std::string& bytes, WriteSome&& writeSome) {
    std::size_t done = 0;
    while (done < bytes.size()) {
        const long long written = writeSome(bytes.data() + done, bytes.size() - done);
        if (written < 0 && errno == EINTR)
            continue;
        if (written <= 0) {
            if (written == 0)
                errno = EIO;
            return false;
        }
        done += static_cast<std::size_t>(written);
    }
    return true;
}

#ifdef _WIN32

// The open file is a device or a pipe, not a file on a disk.
bool IsDeviceOrPipe(int fd) {
    const DWORD type = GetFileType(reinterpret_cast<HANDLE>(_get_osfhandle(fd)));
    return type == FILE_TYPE_CHAR || type == FILE_TYPE_PIPE;
}

void RemoveLeftovers(const std::string& folder, const std::string& name) {
    const std::string prefix = NewVersionPrefix(name);
    WIN32_FIND_DATAA found;
    HANDLE search = FindFirstFileA((folder + prefix + "*").c_str(), &found);
    if (search == INVALID_HANDLE_VALUE)
        return;
    do {
        // A new version still being written is open without sharing, so deleting it fails.
        if (IsNewVersionName(found.cFileName, prefix))
            DeleteFileA((folder + found.cFileName).c_str());
    } while (FindNextFileA(search, &found));
    FindClose(search);
}

void WriteInPlace(int fd, const std::string& bytes, const Naming& naming) {
    const bool ok = WriteAll(bytes, [&](const char* data, std::size_t size) -> long long {
        return _write(fd, data, static_cast<unsigned>(std::min<std::size_t>(size, 1u << 30)));
    });
    const int error = errno;
    _close(fd);
    if (!ok)
        CannotWrite(naming, Reason(error));
}

void WriteNewVersion(const std::string& target, const std::string& bytes, const Naming& naming) {
    const DWORD attributes = GetFileAttributesA(target.c_str());
    if (attributes != INVALID_FILE_ATTRIBUTES) {
        if ((attributes & FILE_ATTRIBUTE_DIRECTORY) != 0)
            CannotCreate(naming, Reason(EISDIR));
        if ((attributes & FILE_ATTRIBUTE_READONLY) != 0)
            CannotCreate(naming, Reason(EACCES));
        int existing = -1;
        if (_sopen_s(&existing, target.c_str(), _O_WRONLY | _O_BINARY | _O_NOINHERIT, _SH_DENYNO,
                     0) == 0) {
            if (IsDeviceOrPipe(existing)) {
                WriteInPlace(existing, bytes, naming);
                return;
            }
            _close(existing);
        }
    }

    const auto [folder, name] = Split(target);
    RemoveLeftovers(folder, name);
    std::string temp;
    int fd = -1;
    for (int attempt = 0; fd < 0; ++attempt) {
        temp = folder + NewVersionPrefix(name) + UniqueChars();
        LibFile::RegisterTempFile(temp);
        if (_sopen_s(&fd, temp.c_str(), _O_WRONLY | _O_CREAT | _O_EXCL | _O_BINARY | _O_NOINHERIT,
                     _SH_DENYRW, _S_IREAD | _S_IWRITE) != 0) {
            const int error = errno;
            fd = -1;
            LibFile::UnregisterTempFile(temp);
            if (error != EEXIST || attempt > 100)
                CannotCreate(naming, Reason(error));
        }
    }
    const bool written =
        WriteAll(bytes,
                 [&](const char* data, std::size_t size) -> long long {
                     return _write(fd, data,
                                   static_cast<unsigned>(std::min<std::size_t>(size, 1u << 30)));
                 }) &&
        _commit(fd) == 0;
    const int error = errno;
    const bool closed = _close(fd) == 0;
    if (!written || !closed) {
        LibFile::DeleteTempFile(temp);
        CannotWrite(naming, Reason(written ? errno : error));
    }
    if (!MoveFileExA(temp.c_str(), target.c_str(),
                     MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH)) {
        const DWORD moveError = GetLastError();
        LibFile::DeleteTempFile(temp);
        CannotCreate(naming, std::system_category().message(static_cast<int>(moveError)));
    }
    LibFile::UnregisterTempFile(temp);
}

#else

struct Descriptor {
    int fd = -1;
    ~Descriptor() {
        if (fd >= 0)
            ::close(fd);
    }
};

// Removes the new versions that writers killed half way left behind. A live writer holds a
// lock on its new version for as long as it exists, so a file that can be locked is stale.
void RemoveLeftovers(const std::string& folder, const std::string& name) {
    const std::string prefix = NewVersionPrefix(name);
    const std::string where = folder.empty() ? std::string(".") : folder;
    std::unique_ptr<DIR, int (*)(DIR*)> directory(::opendir(where.c_str()), &::closedir);
    if (!directory)
        return;
    while (const dirent* entry = ::readdir(directory.get())) {
        if (!IsNewVersionName(entry->d_name, prefix))
            continue;
        const std::string path = folder + entry->d_name;
        Descriptor file;
        file.fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK);
        struct stat opened;
        struct stat named;
        if (file.fd >= 0 && ::flock(file.fd, LOCK_EX | LOCK_NB) == 0 &&
            ::fstat(file.fd, &opened) == 0 && ::lstat(path.c_str(), &named) == 0 &&
            opened.st_dev == named.st_dev && opened.st_ino == named.st_ino) {
            ::unlink(path.c_str());
        }
    }
}

// Makes the new version beside the target, locked (see RemoveLeftovers) and registered.
std::string MakeNewVersion(const std::string& folder, const std::string& name, Descriptor& file,
                           const Naming& naming) {
    for (int attempt = 0;; ++attempt) {
        std::string temp = folder + NewVersionPrefix(name) + UniqueChars();
        // Registered first, so that no signal finds the file made but not yet registered.
        LibFile::RegisterTempFile(temp);
        file.fd = ::open(temp.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
        if (file.fd < 0) {
            const int error = errno;
            LibFile::UnregisterTempFile(temp);
            if (error != EEXIST || attempt > 100)
                CannotCreate(naming, Reason(error));
            continue;
        }
        // Another writer's clean-up may have taken the file between its creation and the
        // lock; then it is made again under another name.
        struct stat opened;
        struct stat named;
        if (::flock(file.fd, LOCK_EX | LOCK_NB) == 0 && ::fstat(file.fd, &opened) == 0 &&
            ::lstat(temp.c_str(), &named) == 0 && opened.st_dev == named.st_dev &&
            opened.st_ino == named.st_ino) {
            return temp;
        }
        ::close(file.fd);
        file.fd = -1;
        LibFile::UnregisterTempFile(temp);
        if (attempt > 100)
            CannotCreate(naming, Reason(EEXIST));
    }
}

void WriteNewVersion(const std::string& target, const std::string& bytes, const Naming& naming) {
    struct stat old;
    const bool exists = ::stat(target.c_str(), &old) == 0;
    if (exists && S_ISDIR(old.st_mode))
        CannotCreate(naming, Reason(EISDIR));
    if (exists && !S_ISREG(old.st_mode)) {
        Descriptor device;
        device.fd = ::open(target.c_str(), O_WRONLY | O_TRUNC | O_CLOEXEC);
        if (device.fd < 0)
            CannotCreate(naming, Reason(errno));
        if (!WriteAll(bytes, [&](const char* data, std::size_t size) -> long long {
                return ::write(device.fd, data, size);
            })) {
            CannotWrite(naming, Reason(errno));
        }
        return;
    }
    // A file that may not be written is not replaced either; its own permission bits decide,
    // so that the same holds for the superuser.
    if (exists && ((old.st_mode & 0222) == 0 || ::access(target.c_str(), W_OK) != 0))
        CannotCreate(naming, Reason(EACCES));

    const auto [folder, name] = Split(target);
    RemoveLeftovers(folder, name);
    Descriptor file;
    const std::string temp = MakeNewVersion(folder, name, file, naming);
    // Permissions as the old version had them, or as a new file gets them; a file system
    // without permissions refuses, which changes nothing.
    if (exists) {
        (void)::fchmod(file.fd, old.st_mode & 07777);
        if (old.st_uid != ::geteuid())
            (void)::fchown(file.fd, old.st_uid, old.st_gid);
    } else {
        const mode_t mask = ::umask(0);
        ::umask(mask);
        (void)::fchmod(file.fd, 0666 & ~mask);
    }
    bool ok = WriteAll(bytes, [&](const char* data, std::size_t size) -> long long {
        return ::write(file.fd, data, size);
    });
    ok = ok && ::fsync(file.fd) == 0;
    int error = errno;
    if (!ok) {
        LibFile::DeleteTempFile(temp);
        CannotWrite(naming, Reason(error));
    }
    // Renamed while still open and locked, so that no clean-up can take it before.
    if (::rename(temp.c_str(), target.c_str()) != 0) {
        error = errno;
        LibFile::DeleteTempFile(temp);
        CannotCreate(naming, Reason(error));
    }
    LibFile::UnregisterTempFile(temp);
    // Makes the rename itself durable.
    Descriptor directory;
    directory.fd =
        ::open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (directory.fd >= 0)
        ::fsync(directory.fd);
}

#endif

}  // namespace

void Write(const std::string& path, const std::string& bytes, const std::string& what,
           const std::string& source) {
    const Naming naming{path, what, source};
    if (path.empty())
        CannotCreate(naming, Reason(ENOENT));
    WriteNewVersion(FilesRead::FollowLinks(path), bytes, naming);
}

}  // namespace vtr::AtomicFile
