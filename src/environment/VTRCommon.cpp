#include "environment/VTRCommon.h"

#include <filesystem>
#include <system_error>

#include "environment/LibFile.h"
#include "environment/LibRegistryVTRShared.h"

#ifdef _WIN32
#include <windows.h>
#elif defined(__APPLE__)
#include <mach-o/dyld.h>

#include <vector>
#elif defined(__FreeBSD__)
#include <sys/sysctl.h>
#include <sys/types.h>
#endif

namespace vtr::VTRCommon {
namespace {

// The suite's two folders, as last read.
struct Folders {
    std::string appPath;
    std::string userDataPath;
};

Folders& Cached() {
    static Folders folders;
    return folders;
}

// The full path of the running program; empty when it cannot be told.
std::string ExecutablePath() {
#ifdef _WIN32
    std::string buffer(MAX_PATH, '\0');
    while (true) {
        const DWORD length =
            GetModuleFileNameA(nullptr, buffer.data(), static_cast<DWORD>(buffer.size()));
        if (length == 0)
            return {};
        if (length < buffer.size())
            return buffer.substr(0, length);
        buffer.resize(buffer.size() * 2);
    }
#elif defined(__APPLE__)
    uint32_t size = 0;
    _NSGetExecutablePath(nullptr, &size);
    std::vector<char> buffer(size + 1, '\0');
    if (_NSGetExecutablePath(buffer.data(), &size) != 0)
        return {};
    std::error_code error;
    const auto path = std::filesystem::weakly_canonical(buffer.data(), error);
    return error ? std::string(buffer.data()) : path.string();
#elif defined(__FreeBSD__)
    int name[4] = {CTL_KERN, KERN_PROC, KERN_PROC_PATHNAME, -1};
    char buffer[4096];
    size_t size = sizeof buffer;
    if (sysctl(name, 4, buffer, &size, nullptr, 0) != 0)
        return {};
    return std::string(buffer);
#else
    std::error_code error;
    const auto path = std::filesystem::read_symlink("/proc/self/exe", error);
    return error ? std::string() : path.string();
#endif
}

}  // namespace

std::string GetAppPath() {
    // Read afresh on every call; the cache is only written.
    Cached().appPath =
        LibFile::AddTrailingBackslash(LibRegistryVTRShared::GetSharedString("AppPath", "", ""));
    return Cached().appPath;
}

std::string GetUserDataPath() {
    // Once read non-empty, kept for the life of the process; an empty one is read again.
    Folders& folders = Cached();
    if (folders.userDataPath.empty()) {
        folders.userDataPath = LibFile::AddTrailingBackslash(
            LibRegistryVTRShared::GetSharedString("UserDataPath", "", ""));
    }
    return folders.userDataPath;
}

std::string GetWeeklyScheduleFile() {
    return GetUserDataPath() + "weeksched." + "lsc";
}

std::string GetYearlyScheduleFile() {
    return GetUserDataPath() + "yearsched." + "lsc";
}

std::string GetProgramFolder() {
    std::string executable = ExecutablePath();
    std::string folder;
    if (!executable.empty()) {
        folder = std::filesystem::path(executable).parent_path().string();
    } else {
        std::error_code error;
        folder = std::filesystem::current_path(error).string();
    }
    return LibFile::AddTrailingBackslash(folder);
}

void ResetCachedFolders() {
    Cached() = Folders{};
}

}  // namespace vtr::VTRCommon
