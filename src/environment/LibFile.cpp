#include "environment/LibFile.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "engine/VtrError.h"
#include "environment/FilesRead.h"

#ifdef _WIN32
#include <windows.h>
#else
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#endif

namespace vtr::LibFile {
namespace {

#ifdef _WIN32
constexpr char kSeparator = '\\';
#else
constexpr char kSeparator = '/';
#endif

constexpr const char* kTempSource = "LibFile.MakeTempFileName";

// The registered temporary files. A slot is free, being filled or emptied by the program, or
// ready; a signal handler only ever takes ready slots, so it never reads a half-written name.
enum SlotState : int { kFree = 0, kBusy = 1, kReady = 2 };
constexpr std::size_t kTempSlots = 16;
constexpr std::size_t kTempPathBytes = 4096;
static_assert(std::atomic<int>::is_always_lock_free, "slots must be usable in a signal handler");

struct TempSlot {
    std::atomic<int> state{kFree};
    char path[kTempPathBytes];
};
TempSlot tempSlots[kTempSlots];

void RemoveFile(const char* path) noexcept {
#ifdef _WIN32
    DeleteFileA(path);
#else
    ::unlink(path);
#endif
}

}  // namespace

void RegisterTempFile(const std::string& path) {
    if (path.empty() || path.size() >= kTempPathBytes)
        return;
    for (TempSlot& slot : tempSlots) {
        int expected = kFree;
        if (slot.state.compare_exchange_strong(expected, kBusy)) {
            std::memcpy(slot.path, path.c_str(), path.size() + 1);
            slot.state.store(kReady);
            return;
        }
    }
}

void UnregisterTempFile(const std::string& path) {
    for (TempSlot& slot : tempSlots) {
        int expected = kReady;
        if (slot.state.load() == kReady && std::strcmp(slot.path, path.c_str()) == 0 &&
            slot.state.compare_exchange_strong(expected, kBusy)) {
            slot.state.store(kFree);
            return;
        }
    }
}

void DeleteTempFile(const std::string& path) {
    // Deleted before it is forgotten: a signal in between finds the name still registered.
    RemoveFile(path.c_str());
    UnregisterTempFile(path);
}

void RemoveRegisteredTempFiles() noexcept {
    for (TempSlot& slot : tempSlots) {
        int expected = kReady;
        if (slot.state.compare_exchange_strong(expected, kBusy)) {
            RemoveFile(slot.path);
            slot.state.store(kFree);
        }
    }
}

std::string AddTrailingBackslash(const std::string& path) {
    if (path.empty() || path.back() == '\\' || path.back() == '/')
        return path;
    return path + kSeparator;
}

#ifdef _WIN32

bool DirectoryExists(const std::string& path) {
    FilesRead::Record(path, FilesRead::Use::Checked);
    const DWORD attributes = GetFileAttributesA(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

bool FileExists(const std::string& path) {
    FilesRead::Record(path, FilesRead::Use::Checked);
    const DWORD attributes = GetFileAttributesA(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) == 0;
}

std::string MakeTempFileName(const std::string& prefix) {
    constexpr DWORD kBufferChars = 261;
    std::string folder(kBufferChars, ' ');
    const DWORD length = GetTempPathA(kBufferChars, folder.data());
    if (length == 0) {
        Raise(ErrorNumbers::UserMessage, kTempSource,
              "Cannot get temp path, error " + std::to_string(GetLastError()));
    }
    if (length >= kBufferChars) {
        Raise(ErrorNumbers::UserMessage, kTempSource,
              "Unexpected length of temp path, " + std::to_string(length));
    }
    folder.resize(length);
    // The system's own unique-name service keeps only three characters of a prefix; the
    // whole prefix is kept here, with a unique number after it, and the file is created
    // exclusively so that no other process can have it.
    static unsigned counter = 0;
    for (int attempt = 0; attempt < 1000; ++attempt) {
        const unsigned unique = (GetCurrentProcessId() * 2654435761u) ^
                                static_cast<unsigned>(GetTickCount64()) ^ (++counter * 40503u);
        char number[16];
        wsprintfA(number, "%08X", unique);
        const std::string name = folder + prefix + number + ".tmp";
        HANDLE file = CreateFileA(name.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                  FILE_ATTRIBUTE_NORMAL, nullptr);
        if (file != INVALID_HANDLE_VALUE) {
            CloseHandle(file);
            return name;
        }
        const DWORD error = GetLastError();
        if (error != ERROR_FILE_EXISTS && error != ERROR_ALREADY_EXISTS) {
            Raise(ErrorNumbers::UserMessage, kTempSource,
                  "Cannot get temp file, error " + std::to_string(error));
        }
    }
    Raise(ErrorNumbers::UserMessage, kTempSource,
          "Cannot get temp file, error " + std::to_string(ERROR_FILE_EXISTS));
}

#else

bool DirectoryExists(const std::string& path) {
    FilesRead::Record(path, FilesRead::Use::Checked);
    struct stat status;
    return ::stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
}

bool FileExists(const std::string& path) {
    FilesRead::Record(path, FilesRead::Use::Checked);
    struct stat status;
    return ::stat(path.c_str(), &status) == 0 && !S_ISDIR(status.st_mode);
}

std::string MakeTempFileName(const std::string& prefix) {
    const char* configured = std::getenv("TMPDIR");
    const std::string folder =
        AddTrailingBackslash(configured != nullptr && *configured != '\0' ? configured : "/tmp");
    // The unique part comes after the prefix; the file is created exclusively, so no other
    // process can be given the same name.
    constexpr int kSuffixChars = 4;  // ".tmp"
    std::string name = folder + prefix + "XXXXXX.tmp";
    const int fd = ::mkstemps(name.data(), kSuffixChars);
    if (fd < 0) {
        Raise(ErrorNumbers::UserMessage, kTempSource,
              "Cannot get temp file, error " + std::to_string(errno));
    }
    ::close(fd);
    return name;
}

#endif

}  // namespace vtr::LibFile
