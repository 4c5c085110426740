#pragma once

#include <string>

// Writing a file so that it is, at every moment and whatever happens to the program or the
// disk, either its old version or its new one, never a part of either.
namespace vtr::AtomicFile {

// Replaces the file's content with `bytes`: they go to a new file beside it (named
// ".<name>.vtrnew-" and six more characters), flushed to disk and renamed over the file only
// when complete. A symbolic link is followed and stays a link; the new version keeps the old
// one's permissions. A device or a pipe, which cannot be replaced, is written in place.
//
// A failure (a full disk, a folder that cannot be written, a read-only file) leaves the file
// as it was and no new file beside it, and raises the error with `source`:
//   75 "Cannot create the <what> <path>: <reason>" when the new version cannot be made;
//   57 "Cannot write the <what> <path>: <reason>" when its bytes cannot be written.
// The name of the new version is registered as a temporary file (LibFile) while it exists,
// and new versions that a killed writer left behind are removed.
void Write(const std::string& path, const std::string& bytes, const std::string& what,
           const std::string& source);

// The name marking a file as a new version being written.
inline constexpr const char* kNewVersionMarker = ".vtrnew-";

}  // namespace vtr::AtomicFile
