#include "FuzzSupport.h"

#include <filesystem>
#include <fstream>
#include <system_error>

#ifndef _WIN32
#include <unistd.h>
#endif

namespace vtr::fuzz {

namespace fs = std::filesystem;

ScratchFolder& ScratchFolder::Instance() {
    static ScratchFolder folder;
    return folder;
}

ScratchFolder::ScratchFolder() {
    std::error_code error;
    const fs::path base = fs::temp_directory_path(error);
    if (error)
        Fail("a temporary folder", error.message());
#ifdef _WIN32
    const std::string unique = std::to_string(reinterpret_cast<std::uintptr_t>(this));
#else
    const std::string unique = std::to_string(::getpid());
#endif
    for (int attempt = 0;; ++attempt) {
        const fs::path candidate =
            base / ("vtr-fuzz-" + unique + (attempt ? "-" + std::to_string(attempt) : ""));
        if (fs::create_directory(candidate, error)) {
            path_ = candidate.string();
            break;
        }
        if (attempt == 100)
            Fail("a scratch folder of its own", candidate.string());
    }
}

ScratchFolder::~ScratchFolder() {
    std::error_code ignored;
    fs::remove_all(path_, ignored);
}

std::string ScratchFolder::File(const std::string& name) const {
    return (fs::path(path_) / name).string();
}

std::string ScratchFolder::Write(const std::string& name, std::string_view bytes) const {
    const std::string path = File(name);
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    out.close();
    if (!out)
        Fail("writing the scratch file", path);
    return path;
}

std::string Printable(std::string_view bytes, std::size_t limit) {
    std::string out;
    for (std::size_t i = 0; i < bytes.size() && i < limit; ++i) {
        const auto c = static_cast<unsigned char>(bytes[i]);
        if (c >= 0x20 && c < 0x7F && c != '\\') {
            out += static_cast<char>(c);
        } else {
            char hex[8];
            std::snprintf(hex, sizeof hex, "\\x%02x", c);
            out += hex;
        }
    }
    if (bytes.size() > limit)
        out += "... (" + std::to_string(bytes.size()) + " bytes)";
    return out;
}

}  // namespace vtr::fuzz
