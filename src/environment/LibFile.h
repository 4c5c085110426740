#pragma once

#include <string>

namespace vtr::LibFile {

// Appends the platform's separator unless the path is empty or already ends in one.
std::string AddTrailingBackslash(const std::string& path);
bool DirectoryExists(const std::string& path);
bool FileExists(const std::string& path);
// A new, unique, empty file in the user's temporary folder whose name begins with the
// prefix; raises error 37 on failure.
std::string MakeTempFileName(const std::string& prefix);

}  // namespace vtr::LibFile
