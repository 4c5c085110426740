#include "show/WholeFile.h"

#include <cstdio>
#include <filesystem>
#include <memory>
#include <system_error>

namespace vtr {

namespace {

struct FileCloser {
    void operator()(std::FILE* file) const noexcept { std::fclose(file); }
};
using FileHandle = std::unique_ptr<std::FILE, FileCloser>;

std::filesystem::path ToPath(const std::string& path) {
    // The path is in the system code page, as the rest of the suite's texts.
    return std::filesystem::path(path);
}

}  // namespace

int32_t ReadWholeFile(const std::string& path, std::string& text) {
    text.clear();
    std::error_code ec;
    const auto status = std::filesystem::status(ToPath(path), ec);
    if (path.empty() || status.type() == std::filesystem::file_type::not_found) {
        return FileErrors::FileNotFound;
    }
    if (status.type() != std::filesystem::file_type::regular) {
        // A folder; or a pipe, which would keep the open waiting for a writer, or a device,
        // which could be read for ever.
        return FileErrors::PathFileAccessError;
    }
    if (std::filesystem::file_size(ToPath(path), ec) > kMaxWholeFileBytes && !ec) {
        return FileErrors::OutOfMemory;
    }
    FileHandle file(std::fopen(path.c_str(), "rb"));
    if (!file) {
        return FileErrors::PathFileAccessError;
    }
    std::string content;
    char buffer[65536];
    for (;;) {
        const std::size_t got = std::fread(buffer, 1, sizeof buffer, file.get());
        content.append(buffer, got);
        if (content.size() > kMaxWholeFileBytes) {
            return FileErrors::OutOfMemory;  // it grew while being read
        }
        if (got < sizeof buffer) {
            break;
        }
    }
    if (std::ferror(file.get())) {
        return FileErrors::DeviceIoError;
    }
    text = std::move(content);
    return 0;
}

int32_t WriteWholeFile(const std::string& path, const std::string& text) {
    std::error_code ec;
    const auto target = ToPath(path);
    if (path.empty()) {
        return FileErrors::PathNotFound;
    }
    const auto parent = target.parent_path();
    if (!parent.empty() && !std::filesystem::is_directory(parent, ec)) {
        return FileErrors::PathNotFound;
    }
    FileHandle file(std::fopen(path.c_str(), "wb"));
    if (!file) {
        return FileErrors::PathFileAccessError;
    }
    if (!text.empty() && std::fwrite(text.data(), 1, text.size(), file.get()) != text.size()) {
        return FileErrors::DeviceIoError;
    }
    if (std::fclose(file.release()) != 0) {
        return FileErrors::DeviceIoError;
    }
    return 0;
}

std::string FileErrorDescription(int32_t number) {
    switch (number) {
        case 0:
            return "";
        case FileErrors::OutOfMemory:
            return "Out of memory";
        case FileErrors::FileNotFound:
            return "File not found";
        case FileErrors::DeviceIoError:
            return "Device I/O error";
        case FileErrors::PathNotFound:
            return "Path not found";
        default:
            return "Path/File access error";
    }
}

}  // namespace vtr
