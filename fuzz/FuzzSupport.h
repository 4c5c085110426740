#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

// Shared pieces of the fuzz targets: the input as text, a check that stops the run with a
// message (so that a broken property counts as a crash and its input is kept), a private
// folder for readers that only take a file, and the first bytes of an input used as
// switches.
namespace vtr::fuzz {

inline std::string_view AsText(const uint8_t* data, std::size_t size) {
    return {reinterpret_cast<const char*>(data), size};
}

// Stops the run: the fuzzer records the input that led here.
[[noreturn]] inline void Fail(const char* what, const std::string& detail) {
    std::fprintf(stderr, "\nproperty broken: %s\n%s\n", what, detail.c_str());
    std::fflush(stderr);
    std::abort();
}

#define VTR_FUZZ_CHECK(condition, detail)            \
    do {                                             \
        if (!(condition))                            \
            ::vtr::fuzz::Fail(#condition, (detail)); \
    } while (false)

// A folder of the process's own under the temporary folder, removed with its files when the
// process ends normally (a crashed run leaves it to the system's temporary-folder cleaning,
// like any other crashed program).
class ScratchFolder {
  public:
    static ScratchFolder& Instance();

    // A path in the folder (the same name always gives the same path).
    std::string File(const std::string& name) const;
    // Replaces the file's content; aborts when it cannot be written.
    std::string Write(const std::string& name, std::string_view bytes) const;

  private:
    ScratchFolder();
    ~ScratchFolder();
    std::string path_;
};

// Takes the first byte of the input as a switch (0 when there is none).
inline uint8_t TakeByte(std::string_view& text) {
    if (text.empty())
        return 0;
    const auto byte = static_cast<uint8_t>(text.front());
    text.remove_prefix(1);
    return byte;
}

// A printable form of bytes for messages: at most `limit` of them, others as \xNN.
std::string Printable(std::string_view bytes, std::size_t limit = 400);

}  // namespace vtr::fuzz
