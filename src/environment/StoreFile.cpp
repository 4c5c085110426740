#include "environment/StoreFile.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <system_error>
#include <vector>

#ifdef _WIN32
#include <windows.h>
#else
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#endif

namespace vtr::StoreFile {
namespace {

namespace fs = std::filesystem;

// Temporary files of a write are named ".<store file>.vtrtmp-" and six more characters.
constexpr const char* kTempMarker = ".vtrtmp-";
constexpr std::size_t kTempUniqueChars = 6;

std::string FolderOf(const std::string& path) {
    const fs::path folder = fs::path(path).parent_path();
    return folder.empty() ? std::string(".") : folder.string();
}

std::string TempPrefix(const std::string& path) {
    return "." + fs::path(path).filename().string() + kTempMarker;
}

// Removes what writers killed half way left behind. Every writer holds the folder lock while
// its temporary file exists, so under the lock none of them belongs to a live writer.
void RemoveStaleTemporaries(const std::string& path) {
    const std::string prefix = TempPrefix(path);
    std::error_code error;
    for (fs::directory_iterator it(FolderOf(path), error), end; !error && it != end;
         it.increment(error)) {
        const std::string name = it->path().filename().string();
        if (name.size() == prefix.size() + kTempUniqueChars &&
            name.compare(0, prefix.size(), prefix) == 0) {
            std::error_code ignored;
            fs::remove(it->path(), ignored);
        }
    }
}

}  // namespace

std::string WriteTarget(const std::string& path) {
    std::error_code error;
    if (fs::is_symlink(path, error)) {
        const fs::path target = fs::weakly_canonical(path, error);
        if (!error)
            return target.string();
    }
    return path;
}

#ifdef _WIN32

namespace {

int64_t TimeValue(const LARGE_INTEGER& time) {
    return static_cast<int64_t>(time.QuadPart);
}

// Size, last write and last change of the open file. The file's identity (volume and index)
// is left out on purpose: asking for the volume costs a round trip to the volume manager on
// every look, and a file replaced by a writer has a new write and change time anyway.
Stamp StampOfHandle(HANDLE file) {
    Stamp stamp;
    FILE_BASIC_INFO basic;
    FILE_STANDARD_INFO standard;
    if (GetFileInformationByHandleEx(file, FileBasicInfo, &basic, sizeof basic) &&
        GetFileInformationByHandleEx(file, FileStandardInfo, &standard, sizeof standard)) {
        stamp.exists = true;
        stamp.size = static_cast<uint64_t>(standard.EndOfFile.QuadPart);
        stamp.modified = TimeValue(basic.LastWriteTime);
        stamp.changed = TimeValue(basic.ChangeTime);
    }
    return stamp;
}

bool IsMissing(DWORD error) {
    return error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND;
}

}  // namespace

std::optional<Stamp> StampOf(const std::string& path) {
    HANDLE file = CreateFileA(path.c_str(), FILE_READ_ATTRIBUTES,
                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                              OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (file == INVALID_HANDLE_VALUE) {
        if (IsMissing(GetLastError()))
            return Stamp{};
        return std::nullopt;
    }
    const Stamp stamp = StampOfHandle(file);
    CloseHandle(file);
    if (!stamp.exists)
        return std::nullopt;
    return stamp;
}

ReadOutcome ReadAll(const std::string& path, std::string& bytes, Stamp& stamp) {
    HANDLE file = CreateFileA(path.c_str(), GENERIC_READ,
                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                              OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) {
        return IsMissing(GetLastError()) ? ReadOutcome::Missing : ReadOutcome::Failed;
    }
    stamp = StampOfHandle(file);
    bytes.clear();
    bool ok = stamp.exists;
    char buffer[65536];
    while (ok) {
        DWORD got = 0;
        if (!ReadFile(file, buffer, sizeof buffer, &got, nullptr)) {
            ok = false;
        } else if (got == 0) {
            break;
        } else {
            bytes.append(buffer, got);
        }
    }
    CloseHandle(file);
    return ok ? ReadOutcome::Read : ReadOutcome::Failed;
}

namespace {

// The path as the file system resolves it: the longest part that exists is named by the
// system (links, short names and letter case as stored), the rest is appended as given; all
// of it case-folded, since names differing in case name one file.
std::wstring ResolvedPath(const std::string& path) {
    std::error_code error;
    fs::path existing = fs::absolute(fs::path(path), error).lexically_normal();
    if (error)
        existing = fs::path(path).lexically_normal();
    std::vector<fs::path> missing;
    while (!fs::exists(existing, error) && existing.has_relative_path()) {
        missing.push_back(existing.filename());
        existing = existing.parent_path();
    }
    std::wstring resolved = existing.wstring();
    HANDLE handle =
        CreateFileW(resolved.c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                    nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (handle != INVALID_HANDLE_VALUE) {
        std::wstring name(MAX_PATH, L'\0');
        DWORD length =
            GetFinalPathNameByHandleW(handle, name.data(), static_cast<DWORD>(name.size()), 0);
        if (length >= name.size()) {
            name.resize(length);
            length =
                GetFinalPathNameByHandleW(handle, name.data(), static_cast<DWORD>(name.size()), 0);
        }
        if (length > 0 && length < name.size())
            resolved.assign(name.data(), length);
        CloseHandle(handle);
    }
    for (auto part = missing.rbegin(); part != missing.rend(); ++part) {
        if (!resolved.empty() && resolved.back() != L'\\')
            resolved += L'\\';
        resolved += part->wstring();
    }
    if (!resolved.empty())
        CharLowerBuffW(resolved.data(), static_cast<DWORD>(resolved.size()));
    return resolved;
}

}  // namespace

std::string LockFolder() {
    for (const char* name : {"LOCALAPPDATA", "APPDATA", "TEMP"}) {
        const char* folder = std::getenv(name);
        if (folder != nullptr && *folder != '\0')
            return (fs::path(folder) / "Vantori").string();
    }
    std::error_code error;
    return (fs::temp_directory_path(error) / "Vantori").string();
}

std::string LockFileOf(const std::string& storePath) {
    // 64-bit FNV-1a over the resolved path's UTF-16 units.
    uint64_t hash = 14695981039346656037ull;
    for (wchar_t unit : ResolvedPath(storePath)) {
        for (int byte = 0; byte < 2; ++byte) {
            hash ^= (static_cast<uint64_t>(unit) >> (8 * byte)) & 0xFF;
            hash *= 1099511628211ull;
        }
    }
    char name[40];
    std::snprintf(name, sizeof name, "store-%016llx.lock", static_cast<unsigned long long>(hash));
    return (fs::path(LockFolder()) / "locks" / name).string();
}

Lock::Lock(const std::string& path, On on) {
    const std::string lockFile = on == On::StoreFile ? LockFileOf(path) : path;
    std::error_code ignored;
    fs::create_directories(FolderOf(lockFile), ignored);
    HANDLE file = CreateFileA(lockFile.c_str(), GENERIC_READ | GENERIC_WRITE,
                              FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                              OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) {
        error_ = static_cast<int>(GetLastError());
        return;
    }
    file_ = file;
    OVERLAPPED whole = {};
    held_ = LockFileEx(file, LOCKFILE_EXCLUSIVE_LOCK, 0, MAXDWORD, MAXDWORD, &whole) != 0;
    if (!held_)
        error_ = static_cast<int>(GetLastError());
}

Lock::~Lock() {
    if (file_ == nullptr)
        return;
    if (held_) {
        OVERLAPPED whole = {};
        UnlockFileEx(static_cast<HANDLE>(file_), 0, MAXDWORD, MAXDWORD, &whole);
    }
    CloseHandle(static_cast<HANDLE>(file_));
}

std::optional<bool> IsReadOnly(const std::string& path) {
    const DWORD attributes = GetFileAttributesA(path.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return IsMissing(GetLastError()) ? std::optional<bool>(false) : std::nullopt;
    return (attributes & FILE_ATTRIBUTE_READONLY) != 0 &&
           (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0;
}

std::string ErrorText(int error) {
    char* text = nullptr;
    const DWORD length = FormatMessageA(
        FORMAT_MESSAGE_ALLOCATE_BUFFER | FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS,
        nullptr, static_cast<DWORD>(error), 0, reinterpret_cast<LPSTR>(&text), 0, nullptr);
    std::string out = length > 0 && text != nullptr ? std::string(text, length)
                                                    : "system error " + std::to_string(error);
    if (text != nullptr)
        LocalFree(text);
    while (!out.empty() &&
           (out.back() == '\n' || out.back() == '\r' || out.back() == '.' || out.back() == ' '))
        out.pop_back();
    return out;
}

bool Replace(const std::string& path, const std::string& bytes, int* error) {
    auto fail = [&] {
        if (error != nullptr)
            *error = static_cast<int>(GetLastError());
        return false;
    };
    RemoveStaleTemporaries(path);
    const std::string folder = FolderOf(path);
    static const char kDigits[] = "0123456789abcdefghijklmnopqrstuvwxyz";
    static unsigned counter = 0;
    HANDLE file = INVALID_HANDLE_VALUE;
    std::string temp;
    for (int attempt = 0; attempt < 100 && file == INVALID_HANDLE_VALUE; ++attempt) {
        unsigned long long seed = (static_cast<unsigned long long>(GetCurrentProcessId()) << 32) ^
                                  GetTickCount64() ^ (++counter * 2654435761u);
        std::string unique;
        for (std::size_t i = 0; i < kTempUniqueChars; ++i, seed /= 36)
            unique += kDigits[seed % 36];
        temp = (fs::path(folder) / (TempPrefix(path) + unique)).string();
        file = CreateFileA(temp.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                           FILE_ATTRIBUTE_NORMAL, nullptr);
        if (file == INVALID_HANDLE_VALUE && GetLastError() != ERROR_FILE_EXISTS)
            return fail();
    }
    if (file == INVALID_HANDLE_VALUE)
        return fail();
    bool ok = true;
    for (std::size_t done = 0; ok && done < bytes.size();) {
        const DWORD chunk = static_cast<DWORD>(std::min<std::size_t>(bytes.size() - done, 1 << 20));
        DWORD written = 0;
        ok = WriteFile(file, bytes.data() + done, chunk, &written, nullptr) && written > 0;
        done += written;
    }
    ok = ok && FlushFileBuffers(file);
    DWORD failure = ok ? 0 : GetLastError();
    ok = CloseHandle(file) && ok;
    // A reader of another program may hold the old file open for a moment.
    for (int attempt = 0; ok; ++attempt) {
        if (MoveFileExA(temp.c_str(), path.c_str(),
                        MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH)) {
            return true;
        }
        if (attempt == 20) {
            ok = false;
            failure = GetLastError();
        }
        Sleep(50);
    }
    if (failure == 0)
        failure = GetLastError();
    DeleteFileA(temp.c_str());
    SetLastError(failure);
    return fail();
}

#else  // POSIX

namespace {

Stamp StampOfStat(const struct stat& status) {
    Stamp stamp;
    stamp.exists = true;
    stamp.device = static_cast<uint64_t>(status.st_dev);
    stamp.inode = static_cast<uint64_t>(status.st_ino);
    stamp.size = static_cast<uint64_t>(status.st_size);
#ifdef __APPLE__
    stamp.modified = status.st_mtimespec.tv_sec * 1000000000LL + status.st_mtimespec.tv_nsec;
    stamp.changed = status.st_ctimespec.tv_sec * 1000000000LL + status.st_ctimespec.tv_nsec;
#else
    stamp.modified = status.st_mtim.tv_sec * 1000000000LL + status.st_mtim.tv_nsec;
    stamp.changed = status.st_ctim.tv_sec * 1000000000LL + status.st_ctim.tv_nsec;
#endif
    return stamp;
}

bool WriteFully(int fd, const std::string& bytes) {
    for (std::size_t done = 0; done < bytes.size();) {
        const ssize_t written = ::write(fd, bytes.data() + done, bytes.size() - done);
        if (written < 0) {
            if (errno == EINTR)
                continue;
            return false;
        }
        done += static_cast<std::size_t>(written);
    }
    return true;
}

}  // namespace

std::optional<Stamp> StampOf(const std::string& path) {
    struct stat status;
    if (::stat(path.c_str(), &status) != 0) {
        if (errno == ENOENT || errno == ENOTDIR)
            return Stamp{};
        return std::nullopt;
    }
    return StampOfStat(status);
}

ReadOutcome ReadAll(const std::string& path, std::string& bytes, Stamp& stamp) {
    // Without waiting: a pipe in the store's place would otherwise block the open until a
    // writer came. It is refused below, as anything else that is not a regular file is.
    const int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (fd < 0) {
        return errno == ENOENT || errno == ENOTDIR ? ReadOutcome::Missing : ReadOutcome::Failed;
    }
    struct stat status;
    bool ok = ::fstat(fd, &status) == 0 && S_ISREG(status.st_mode);
    if (ok) {
        stamp = StampOfStat(status);
        bytes.clear();
        bytes.reserve(static_cast<std::size_t>(status.st_size));
        char buffer[65536];
        while (true) {
            const ssize_t got = ::read(fd, buffer, sizeof buffer);
            if (got < 0 && errno == EINTR)
                continue;
            if (got <= 0) {
                ok = got == 0;
                break;
            }
            bytes.append(buffer, static_cast<std::size_t>(got));
        }
    }
    ::close(fd);
    return ok ? ReadOutcome::Read : ReadOutcome::Failed;
}

Lock::Lock(const std::string& path, On on) {
    const std::string folder = FolderOf(path);
    std::error_code ignored;
    fs::create_directories(folder, ignored);
    fd_ = on == On::StoreFile ? ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)
                              : ::open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
    if (fd_ < 0) {
        error_ = errno;
        return;
    }
    int result;
    do {
        result = ::flock(fd_, LOCK_EX);
    } while (result != 0 && errno == EINTR);
    held_ = result == 0;
    if (!held_)
        error_ = errno;
}

Lock::~Lock() {
    // Closing the descriptor releases the lock.
    if (fd_ >= 0)
        ::close(fd_);
}

std::optional<bool> IsReadOnly(const std::string& path) {
    struct stat status;
    if (::stat(path.c_str(), &status) != 0) {
        if (errno == ENOENT || errno == ENOTDIR)
            return false;
        return std::nullopt;
    }
    const uid_t user = ::geteuid();
    mode_t bit = S_IWOTH;
    if (user == 0 || user == status.st_uid) {
        bit = S_IWUSR;
    } else if (status.st_gid == ::getegid()) {
        bit = S_IWGRP;
    } else {
        const int count = ::getgroups(0, nullptr);
        std::vector<gid_t> groups(count > 0 ? static_cast<std::size_t>(count) : 0);
        if (count > 0 && ::getgroups(count, groups.data()) == count &&
            std::find(groups.begin(), groups.end(), status.st_gid) != groups.end()) {
            bit = S_IWGRP;
        }
    }
    return (status.st_mode & bit) == 0;
}

std::string ErrorText(int error) {
    return std::strerror(error);
}

bool Replace(const std::string& path, const std::string& bytes, int* error) {
    auto fail = [&](int number) {
        if (error != nullptr)
            *error = number;
        return false;
    };
    RemoveStaleTemporaries(path);
    const std::string folder = FolderOf(path);
    std::string temp =
        (fs::path(folder) / (TempPrefix(path) + std::string(kTempUniqueChars, 'X'))).string();
    const int fd = ::mkstemp(temp.data());
    if (fd < 0)
        return fail(errno);
    ::fcntl(fd, F_SETFD, FD_CLOEXEC);
    // The new version keeps the old one's permissions; a new store is private to the user.
    struct stat old;
    if (::stat(path.c_str(), &old) == 0)
        ::fchmod(fd, old.st_mode & 07777);
    bool ok = WriteFully(fd, bytes) && ::fsync(fd) == 0;
    int failure = ok ? 0 : errno;
    ok = ::close(fd) == 0 && ok;
    if (ok && ::rename(temp.c_str(), path.c_str()) != 0)
        ok = false;
    if (!ok) {
        if (failure == 0)
            failure = errno;
        ::unlink(temp.c_str());
        return fail(failure);
    }
    // Makes the rename itself durable.
    const int directory = ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (directory >= 0) {
        ::fsync(directory);
        ::close(directory);
    }
    return true;
}

#endif

}  // namespace vtr::StoreFile
