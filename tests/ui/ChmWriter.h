#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

// Test support: writes small compiled help files, so that the help tests build their own
// fixtures. Everything is stored uncompressed, in one directory chunk, with the context map
// (#IVB and #STRINGS) and the system table (#SYSTEM) that help compilers write.
namespace vtr::testsupport {

struct ChmContent {
    // Archive paths ("/Verifier.htm", "/pics/dot.png") and their bytes.
    std::vector<std::pair<std::string, std::string>> files;
    // Context ids and the page text stored for each, exactly as given ("msg23.htm",
    // "sub\\page.htm#part", a compiler's full project path, ...).
    std::vector<std::pair<uint32_t, std::string>> contextMap;
    bool writeContextMap = true;
    std::string title;
    std::string defaultTopic;
    // When set, the context map's own length field claims this many bytes instead.
    std::optional<uint32_t> declaredMapLength;
};

// Writes the file; throws std::runtime_error when it cannot be written or does not fit.
void WriteChm(const std::string& path, const ChmContent& content);

}  // namespace vtr::testsupport
