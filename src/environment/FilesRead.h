#pragma once

#include <optional>
#include <string>
#include <vector>

// The files a verification read or checked, so that nothing the program writes (a results
// report, a baseline) ever replaces one of them, whatever path names it: a symbolic link, a
// hard link, a path through "..", other letter case where the file system ignores case.
namespace vtr::FilesRead {

// How a run used a file: looked for it (its existence, a folder's) or read it.
enum class Use { Checked, Read };

// Remembers that the current run used the file. Safe from any thread.
void Record(const std::string& path, Use use);

// The files the selected target names (the show, the sequence, or the two schedules). They
// count as read from the selection on, even by a run cancelled before it reads them. What an
// earlier run used is forgotten.
void SetTargetFiles(std::vector<std::string> paths);

// A file a front end reads for itself (the help file): kept for the life of the program.
void RecordProgramFile(const std::string& path);

// A new run: forgets what the previous run used; the target files and the program's own
// files stay.
void BeginRun();

struct Found {
    std::string file;  // as it was recorded
    Use use = Use::Read;
};

// The recorded file that `path` names, if any: the same file (device and inode, or volume
// and file index) for a file that exists, the same name in the same folder for one that does
// not. The settings store file in use always counts as read.
std::optional<Found> FileNamedBy(const std::string& path);

// The parts of the lookup, for the writers and the tests.
struct Identity {
    unsigned long long device = 0;
    unsigned long long index = 0;
    bool operator==(const Identity&) const = default;
};
// The identity of the file or folder the path leads to (links followed); nothing when there
// is none.
std::optional<Identity> IdentityOf(const std::string& path);
// The path with symbolic links in its last part followed, as opening it for writing would.
std::string FollowLinks(const std::string& path);
// True when the folder's file system treats names differing only in letter case as one.
bool FolderIgnoresCase(const std::string& folder);

}  // namespace vtr::FilesRead
