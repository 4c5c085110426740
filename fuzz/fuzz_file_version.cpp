// The file-version reader of Windows executables, libraries and controls (PE headers,
// resource directory, version resource, fixed information block). Any bytes give no
// version or one; the reader over a file and the reader over the same bytes in memory
// must agree, and FileVersionText gives the version's text or "".

#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "environment/FileVersion.h"

namespace {

std::string Text(const std::optional<vtr::FileVersionNumbers>& version) {
    return version ? vtr::FileVersionToText(*version) : std::string("(none)");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    const std::string_view bytes = vtr::fuzz::AsText(data, size);
    const std::string path = vtr::fuzz::ScratchFolder::Instance().Write("image.dll", bytes);
    const auto inMemory = vtr::ReadPeVersion(bytes);
    const auto fromFile = vtr::ReadPeFileVersion(path);
    const std::string context = "image: " + vtr::fuzz::Printable(bytes, 200);
    VTR_FUZZ_CHECK(Text(inMemory) == Text(fromFile), context + "\nin memory: " + Text(inMemory) +
                                                         "\nfrom the file: " + Text(fromFile));
#ifndef _WIN32
    VTR_FUZZ_CHECK(vtr::FileVersionText(path) == (inMemory ? Text(inMemory) : std::string()),
                   context);
#endif
    return 0;
}
