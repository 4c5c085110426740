#include "sequencelib/SequenceInfo.h"

#include <pugixml.hpp>

#include <cctype>

#include "sequencelib/ByteSource.h"
#include "sequencelib/LoadFailure.h"

namespace vtr::seqlib {

namespace {

// An edit file is a few lines; anything far larger is not one.
constexpr std::uint64_t kMaxEditFileBytes = std::uint64_t{16} << 20;

}  // namespace

bool IsAbsolutePath(const std::string& path) {
    if (path.empty())
        return false;
    if (path[0] == '/' || path[0] == '\\')
        return true;
    return path.size() >= 2 && std::isalpha(static_cast<unsigned char>(path[0])) && path[1] == ':';
}

std::string FolderOf(const std::string& path) {
    const std::size_t separator = path.find_last_of("/\\");
    return separator == std::string::npos ? std::string() : path.substr(0, separator + 1);
}

std::optional<SequenceInfo> SequenceInfoService::GetSequenceInfo(
    const std::string& fileName) const {
    std::string text;
    try {
        text = detail::ReadDecodedFile(fileName, kMaxEditFileBytes);
    } catch (const detail::LoadFailure&) {
        return std::nullopt;
    }
    pugi::xml_document doc;
    if (!doc.load_buffer_inplace(text.data(), text.size(), pugi::parse_default,
                                 pugi::encoding_utf8)) {
        return std::nullopt;
    }
    const pugi::xml_node root = doc.document_element();
    if (std::string_view(root.name()) != "sequenceEdit")
        return std::nullopt;

    SequenceInfo info;
    const std::string playback = root.child("playback").attribute("file").value();
    if (playback.empty()) {
        info.problemTexts_ = {"[SEQUENCE]: " + fileName, "[PROBLEM]: No playback file named"};
    } else {
        info.playbackFile_ = IsAbsolutePath(playback) ? playback : FolderOf(fileName) + playback;
    }
    return info;
}

}  // namespace vtr::seqlib
