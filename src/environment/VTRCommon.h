#pragma once

#include <string>

// The suite's folders and well-known files.
namespace vtr::VTRCommon {

// Read from the store on every call (never answered from the cache).
std::string GetAppPath();
// Cached once non-empty, for the life of the process.
std::string GetUserDataPath();
std::string GetWeeklyScheduleFile();
std::string GetYearlyScheduleFile();
// The folder of the running executable, with a trailing separator.
std::string GetProgramFolder();

// Forgets the cached folders (tests, and a front end that switches settings stores).
void ResetCachedFolders();

}  // namespace vtr::VTRCommon
