#pragma once

#include <string>

namespace vtr::LibFile {

// Appends the platform's separator unless the path is empty or already ends in one.
std::string AddTrailingBackslash(const std::string& path);
// Both remember the path as one the run checked (FilesRead), so that no output replaces it.
bool DirectoryExists(const std::string& path);
bool FileExists(const std::string& path);
// A new, unique, empty file in the user's temporary folder whose name begins with the
// prefix; raises error 37 on failure.
std::string MakeTempFileName(const std::string& prefix);

// Temporary files that must not outlive the program, however it ends. A registered name is
// kept where a signal handler can reach it without allocating; up to 16 names at once, each
// shorter than 4096 bytes (a name that does not fit is simply not registered).
void RegisterTempFile(const std::string& path);
void UnregisterTempFile(const std::string& path);
// Deletes a temporary file and forgets it; a failure to delete is ignored.
void DeleteTempFile(const std::string& path);
// Deletes every registered temporary file and forgets it. Safe inside a signal handler (it
// calls nothing but unlink) and from another thread (the console's control handler).
void RemoveRegisteredTempFiles() noexcept;

}  // namespace vtr::LibFile
