#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

// The fixed version information (VS_FIXEDFILEINFO) of a Windows executable, library or
// control.
namespace vtr {

// The four numbers of a file version: the high and low halves of the most significant and
// then of the least significant version word.
struct FileVersionNumbers {
    uint16_t major = 0;
    uint16_t minor = 0;
    uint16_t build = 0;
    uint16_t revision = 0;
};

// "major.minor.build.revision" in decimal; "" for a file without version information, one
// that is not such a file, or any failure. On Windows the system's version service answers;
// elsewhere ReadPeFileVersion does.
std::string FileVersionText(const std::string& path);

// Our own reader of a PE file: the DOS and PE headers, the resource directory, the version
// resource and its fixed block (signature 0xFEEF04BD). It reads only the few small pieces
// it needs, with every offset and size checked against the file, so a malformed file gives
// nothing and a huge one costs no more than a small one. Nothing for a path that is not a
// regular file.
std::optional<FileVersionNumbers> ReadPeFileVersion(const std::string& path);
// The same reader over an image in memory.
std::optional<FileVersionNumbers> ReadPeVersion(std::string_view imageBytes);

std::string FileVersionToText(const FileVersionNumbers& version);

}  // namespace vtr
