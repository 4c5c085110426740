#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>

namespace vtr::seqlib::detail {

// The bytes of a file, read front to back: the file itself, or what its gzip data
// expands to. Failures are raised as LoadFailure.
class ByteSource {
  public:
    virtual ~ByteSource() = default;
    // Fills up to `size` bytes; returns 0 only at the end of the data.
    virtual std::size_t Read(char* buffer, std::size_t size) = 0;
    // How much of the file has been consumed, and the file's size (for progress).
    virtual std::uint64_t FileBytesConsumed() const = 0;
    virtual std::uint64_t FileBytesTotal() const = 0;
};

// Opens a file for reading: gzip data (first bytes 1F 8B) is expanded as it is read,
// and refused once it grows beyond maxExpandedBytes; anything else is read as it is.
std::unique_ptr<ByteSource> OpenDecodedFile(const std::string& path,
                                            std::uint64_t maxExpandedBytes);

// The whole decoded content of a small file; refused beyond maxBytes.
std::string ReadDecodedFile(const std::string& path, std::uint64_t maxBytes);

// True when the data begins with the gzip signature.
bool IsGzipSignature(const unsigned char* data, std::size_t size);

}  // namespace vtr::seqlib::detail
