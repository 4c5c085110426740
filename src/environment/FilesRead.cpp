#include "environment/FilesRead.h"

#include <cctype>
#include <mutex>
#include <unordered_map>
#include <utility>

#include "environment/RegistryStore.h"

#ifdef _WIN32
#include <windows.h>
#else
#include <dirent.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <filesystem>
#include <memory>
#include <system_error>
#ifdef __linux__
#include <fcntl.h>
#include <linux/fs.h>
#include <sys/ioctl.h>
#include <sys/vfs.h>
#endif
#endif

namespace vtr::FilesRead {
namespace {

// Every file recorded, in the order first recorded, each once; a file both checked and read
// counts as read.
class FileList {
  public:
    void Add(const std::string& path, Use use) {
        if (path.empty())
            return;
        auto [at, added] = index_.emplace(path, files_.size());
        if (added)
            files_.push_back({path, use});
        else if (use == Use::Read)
            files_[at->second].use = Use::Read;
    }
    void Clear() {
        files_.clear();
        index_.clear();
    }
    const std::vector<Found>& Files() const { return files_; }

  private:
    std::vector<Found> files_;
    std::unordered_map<std::string, std::size_t> index_;
};

struct State {
    std::mutex mutex;
    std::vector<std::string> targets;
    FileList program;
    FileList run;
};

State& TheState() {
    static State state;
    return state;
}

// Where a path leads: the file itself when it exists, else the folder it would be made in
// and the name it would have there.
struct Location {
    std::optional<Identity> file;
    std::optional<Identity> folder;
    std::string name;
};

#ifdef _WIN32

bool IsSeparator(char c) {
    return c == '\\' || c == '/';
}

// The absolute, normalised form ("." and ".." resolved, separators made backslashes).
std::string FullPath(const std::string& path) {
    char buffer[MAX_PATH * 4];
    const DWORD length = GetFullPathNameA(path.c_str(), sizeof buffer, buffer, nullptr);
    if (length == 0 || length >= sizeof buffer)
        return path;
    return std::string(buffer, length);
}

bool SameName(const std::string& a, const std::string& b, const std::string&) {
    return CompareStringA(LOCALE_INVARIANT, NORM_IGNORECASE, a.data(), static_cast<int>(a.size()),
                          b.data(), static_cast<int>(b.size())) == CSTR_EQUAL;
}

#else

bool IsSeparator(char c) {
    return c == '/';
}

std::string FullPath(const std::string& path) {
    if (!path.empty() && path.front() == '/')
        return path;
    std::error_code error;
    const std::filesystem::path current = std::filesystem::current_path(error);
    return error ? path : (current / path).string();
}

bool SameName(const std::string& a, const std::string& b, const std::string& folder) {
    if (a == b)
        return true;
    if (a.size() != b.size())
        return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        const unsigned char x = static_cast<unsigned char>(a[i]);
        const unsigned char y = static_cast<unsigned char>(b[i]);
        if (x != y && !(x < 128 && y < 128 && std::tolower(x) == std::tolower(y)))
            return false;
    }
    return FolderIgnoresCase(folder);
}

#endif

// Splits the full path at its last separator; the name is empty for a path ending in one.
std::pair<std::string, std::string> FolderAndName(const std::string& full) {
    std::size_t cut = full.size();
    while (cut > 0 && !IsSeparator(full[cut - 1]))
        --cut;
    if (cut == 0)
        return {".", full};
    std::string folder = full.substr(0, cut);
    // Keeps a root ("/", "C:\") whole.
    while (folder.size() > 1 && IsSeparator(folder.back()) && folder[folder.size() - 2] != ':')
        folder.pop_back();
    return {folder, full.substr(cut)};
}

Location Locate(const std::string& path) {
    Location location;
    const std::string followed = FollowLinks(path);
    location.file = IdentityOf(followed);
    if (!location.file) {
        auto [folder, name] = FolderAndName(FullPath(followed));
        if (name.empty() || name == "." || name == "..")
            return location;
        location.folder = IdentityOf(folder);
        location.name = std::move(name);
    }
    return location;
}

bool SamePlace(const Location& a, const Location& b, const std::string& folderOfA) {
    if (a.file || b.file)
        return a.file && b.file && *a.file == *b.file;
    return a.folder && b.folder && *a.folder == *b.folder && !a.name.empty() &&
           SameName(a.name, b.name, folderOfA);
}

}  // namespace

void Record(const std::string& path, Use use) {
    State& state = TheState();
    std::lock_guard<std::mutex> lock(state.mutex);
    state.run.Add(path, use);
}

void SetTargetFiles(std::vector<std::string> paths) {
    State& state = TheState();
    std::lock_guard<std::mutex> lock(state.mutex);
    state.targets = std::move(paths);
    state.run.Clear();
}

void RecordProgramFile(const std::string& path) {
    State& state = TheState();
    std::lock_guard<std::mutex> lock(state.mutex);
    state.program.Add(path, Use::Read);
}

void BeginRun() {
    State& state = TheState();
    std::lock_guard<std::mutex> lock(state.mutex);
    state.run.Clear();
}

std::optional<Found> FileNamedBy(const std::string& path) {
    std::vector<Found> candidates;
    {
        State& state = TheState();
        std::lock_guard<std::mutex> lock(state.mutex);
        for (const std::string& target : state.targets)
            candidates.push_back({target, Use::Read});
        if (auto store = RegistryStore::CurrentFile())
            candidates.push_back({*store, Use::Read});
        for (const FileList* record : {&state.program, &state.run}) {
            candidates.insert(candidates.end(), record->Files().begin(), record->Files().end());
        }
    }
    const Location wanted = Locate(path);
    if (wanted.file) {
        for (const Found& candidate : candidates) {
            if (IdentityOf(candidate.file) == wanted.file)
                return candidate;
        }
    } else if (wanted.folder) {
        // A file still to be made: only a recorded file that does not exist either can be it.
        const std::string wantedFolder = FolderAndName(FullPath(FollowLinks(path))).first;
        for (const Found& candidate : candidates) {
            if (SamePlace(wanted, Locate(candidate.file), wantedFolder))
                return candidate;
        }
    }
    return std::nullopt;
}

#ifdef _WIN32

std::optional<Identity> IdentityOf(const std::string& path) {
    if (path.empty())
        return std::nullopt;
    // No access asked for: only the file's identity is read. Folders open with backup
    // semantics.
    HANDLE handle =
        CreateFileA(path.c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                    nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (handle == INVALID_HANDLE_VALUE)
        return std::nullopt;
    BY_HANDLE_FILE_INFORMATION information;
    const bool ok = GetFileInformationByHandle(handle, &information) != 0;
    CloseHandle(handle);
    if (!ok)
        return std::nullopt;
    return Identity{information.dwVolumeSerialNumber,
                    (static_cast<unsigned long long>(information.nFileIndexHigh) << 32) |
                        information.nFileIndexLow};
}

std::string FollowLinks(const std::string& path) {
    // Opening a link for writing follows it to its target, which IdentityOf does as well; a
    // link whose target is missing is rare enough on Windows to be taken as the file itself.
    return path;
}

bool FolderIgnoresCase(const std::string&) {
    return true;
}

#else

std::optional<Identity> IdentityOf(const std::string& path) {
    struct stat status;
    if (path.empty() || ::stat(path.c_str(), &status) != 0)
        return std::nullopt;
    return Identity{static_cast<unsigned long long>(status.st_dev),
                    static_cast<unsigned long long>(status.st_ino)};
}

std::string FollowLinks(const std::string& path) {
    std::string current = path;
    // As many links as the system itself follows before it gives up.
    for (int hop = 0; hop < 40; ++hop) {
        struct stat status;
        if (::lstat(current.c_str(), &status) != 0 || !S_ISLNK(status.st_mode))
            return current;
        std::string target(static_cast<std::size_t>(PATH_MAX), '\0');
        const ssize_t length = ::readlink(current.c_str(), target.data(), target.size());
        if (length <= 0 || static_cast<std::size_t>(length) >= target.size())
            return current;
        target.resize(static_cast<std::size_t>(length));
        if (target.front() != '/') {
            const std::size_t slash = current.rfind('/');
            if (slash != std::string::npos)
                target.insert(0, current, 0, slash + 1);
        }
        current = std::move(target);
    }
    return current;
}

namespace {

// What the folder's entries say: a name with its letters' case swapped that leads to the
// same entry means the folder ignores case; one that leads nowhere means it does not.
std::optional<bool> CaseProbe(const std::string& folder) {
    std::unique_ptr<DIR, int (*)(DIR*)> directory(::opendir(folder.c_str()), &::closedir);
    if (!directory)
        return std::nullopt;
    const std::string prefix = folder.back() == '/' ? folder : folder + "/";
    int looked = 0;
    while (const dirent* entry = ::readdir(directory.get())) {
        if (++looked > 256)
            break;
        const std::string name = entry->d_name;
        std::string swapped = name;
        for (char& c : swapped) {
            if (c >= 'a' && c <= 'z')
                c = static_cast<char>(c - 'a' + 'A');
            else if (c >= 'A' && c <= 'Z')
                c = static_cast<char>(c - 'A' + 'a');
        }
        if (swapped == name)
            continue;
        struct stat original;
        struct stat other;
        if (::lstat((prefix + name).c_str(), &original) != 0)
            continue;
        if (::lstat((prefix + swapped).c_str(), &other) != 0)
            return errno == ENOENT ? std::optional<bool>(false) : std::nullopt;
        return original.st_dev == other.st_dev && original.st_ino == other.st_ino;
    }
    return std::nullopt;
}

}  // namespace

bool FolderIgnoresCase(const std::string& folder) {
    if (const std::optional<bool> probed = CaseProbe(folder))
        return *probed;
#ifdef __linux__
    // A folder with nothing to probe: what the file system is known to do.
    struct statfs system;
    if (::statfs(folder.c_str(), &system) == 0) {
        switch (static_cast<unsigned long>(system.f_type)) {
            case 0x4d44UL:      // FAT
            case 0x2011BAB0UL:  // exFAT
            case 0x5346544eUL:  // NTFS
            case 0x7366746eUL:  // NTFS (ntfs3)
            case 0xFF534D42UL:  // CIFS
            case 0xFE534D42UL:  // SMB2
                return true;
            default:
                break;
        }
    }
#ifdef FS_CASEFOLD_FL
    const int fd = ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd >= 0) {
        int flags = 0;
        const bool folded = ::ioctl(fd, FS_IOC_GETFLAGS, &flags) == 0 && (flags & FS_CASEFOLD_FL);
        ::close(fd);
        return folded;
    }
#endif
#endif
    return false;
}

#endif

}  // namespace vtr::FilesRead
