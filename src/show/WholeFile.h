#pragma once

#include <cstdint>
#include <string>

// Whole-file text reading and writing. The suite's files are bytes in the system code page:
// they are read and written as they are, without any transcoding or line-end translation.
namespace vtr {

namespace FileErrors {
inline constexpr int32_t OutOfMemory = 7;
inline constexpr int32_t FileNotFound = 53;
inline constexpr int32_t DeviceIoError = 57;
inline constexpr int32_t PathFileAccessError = 75;
inline constexpr int32_t PathNotFound = 76;
}  // namespace FileErrors

// The largest file read whole. The suite's text files are far smaller; anything larger is
// not one of them (a film picked by mistake, say) and is refused before it is read.
inline constexpr std::uint64_t kMaxWholeFileBytes = std::uint64_t{256} << 20;

// Reads the whole file into text. Returns 0 on success, otherwise the error number
// (53 file not found, 75 path/file access error, 57 device I/O error, 7 out of memory for a
// file larger than kMaxWholeFileBytes), leaving text empty.
int32_t ReadWholeFile(const std::string& path, std::string& text);

// Replaces the file's content with text. Returns 0 on success, otherwise the error number
// (76 path not found, 75 path/file access error, 57 device I/O error).
int32_t WriteWholeFile(const std::string& path, const std::string& text);

// The description of a file error number returned above ("File not found", ...).
std::string FileErrorDescription(int32_t number);

}  // namespace vtr
