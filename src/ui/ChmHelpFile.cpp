#include "ChmHelpFile.h"

#include <chm_lib.h>

#include <algorithm>
#include <cstring>

#include "engine/VtrError.h"

namespace vtr {
namespace {

constexpr const char* kSource = "ChmHelpFile";

uint32_t ReadLittleEndian32(const std::string& bytes, std::size_t at) {
    uint32_t value = 0;
    for (int i = 3; i >= 0; --i)
        value = (value << 8) | static_cast<unsigned char>(bytes[at + static_cast<std::size_t>(i)]);
    return value;
}

uint16_t ReadLittleEndian16(const std::string& bytes, std::size_t at) {
    return static_cast<uint16_t>(static_cast<unsigned char>(bytes[at]) |
                                 (static_cast<unsigned char>(bytes[at + 1]) << 8));
}

// The text up to the first NUL (or the end).
std::string UpToNul(const std::string& bytes, std::size_t from = 0) {
    if (from >= bytes.size())
        return {};
    const std::size_t end = bytes.find('\0', from);
    return bytes.substr(from, end == std::string::npos ? std::string::npos : end - from);
}

// "a\\b.htm", "/a/b.htm", "./a/b.htm" -> "/a/b.htm"; the anchor is left to the caller.
std::string ArchivePath(std::string page) {
    std::replace(page.begin(), page.end(), '\\', '/');
    while (page.rfind("./", 0) == 0)
        page.erase(0, 2);
    while (!page.empty() && page.front() == '/')
        page.erase(0, 1);
    return "/" + page;
}

struct Listing {
    std::vector<std::string> paths;
};

int CollectPage(chmFile*, chmUnitInfo* unit, void* context) {
    const std::string path = unit->path;
    // Internal tables start with "#" or "$" below the root, and "::" names the storage.
    const bool internal =
        path.rfind("/#", 0) == 0 || path.rfind("/$", 0) == 0 || path.rfind("::", 0) == 0;
    if (!internal && !path.empty() && path.back() != '/')
        static_cast<Listing*>(context)->paths.push_back(path);
    return CHM_ENUMERATOR_CONTINUE;
}

}  // namespace

ChmHelpFile::ChmHelpFile(const std::string& path) : path_(path) {
    handle_ = chm_open(path.c_str());
    if (handle_ == nullptr)
        Raise(ErrorNumbers::UserMessage, kSource, "Cannot open the help file " + path);
    ReadSystemTable();
}

ChmHelpFile::~ChmHelpFile() {
    if (handle_ != nullptr)
        chm_close(handle_);
}

std::optional<std::string> ChmHelpFile::ReadObject(const std::string& archivePath) const {
    chmUnitInfo unit{};
    if (archivePath.size() > CHM_MAX_PATHLEN ||
        chm_resolve_object(handle_, archivePath.c_str(), &unit) != CHM_RESOLVE_SUCCESS)
        return std::nullopt;
    if (unit.length > kMaxObjectSize)
        return std::nullopt;
    std::string bytes(static_cast<std::size_t>(unit.length), '\0');
    if (unit.length == 0)
        return bytes;
    const LONGINT64 got =
        chm_retrieve_object(handle_, &unit, reinterpret_cast<unsigned char*>(bytes.data()), 0,
                            static_cast<LONGINT64>(unit.length));
    if (got != static_cast<LONGINT64>(unit.length))
        return std::nullopt;
    return bytes;
}

std::optional<std::string> ChmHelpFile::FindPage(const std::string& page) const {
    std::string path = page;
    const std::size_t anchor = path.find('#');
    if (anchor != std::string::npos)
        path.erase(anchor);
    path = ArchivePath(path);
    if (path == "/" || path.size() > CHM_MAX_PATHLEN)
        return std::nullopt;
    chmUnitInfo unit{};
    if (chm_resolve_object(handle_, path.c_str(), &unit) != CHM_RESOLVE_SUCCESS)
        return std::nullopt;
    // The archive's own spelling of the name.
    return std::string(unit.path);
}

std::optional<std::string> ChmHelpFile::ReadPage(const std::string& page) const {
    const std::optional<std::string> path = FindPage(page);
    if (!path)
        return std::nullopt;
    return ReadObject(*path);
}

std::vector<std::string> ChmHelpFile::Pages() const {
    Listing listing;
    chm_enumerate(handle_, CHM_ENUMERATE_ALL, CollectPage, &listing);
    return listing.paths;
}

// A map entry names a page as the help compiler saw it. Compilers differ in how much of
// the project folder they keep in front of the name, so when the full text is not a page
// of the file, leading folders are dropped one at a time until one is.
std::optional<std::string> ChmHelpFile::ResolveMapTarget(std::string target) const {
    std::string anchor;
    const std::size_t hash = target.find('#');
    if (hash != std::string::npos) {
        anchor = target.substr(hash);
        target.erase(hash);
    }
    std::replace(target.begin(), target.end(), '\\', '/');
    // "file.chm::/page.htm" names a page of this file by its path after "::".
    const std::size_t separator = target.find("::");
    if (separator != std::string::npos)
        target.erase(0, separator + 2);
    while (!target.empty()) {
        if (std::optional<std::string> found = FindPage(target))
            return *found + anchor;
        const std::size_t slash = target.find('/', target.front() == '/' ? 1 : 0);
        if (slash == std::string::npos)
            break;
        target.erase(0, slash + 1);
    }
    return std::nullopt;
}

std::optional<std::string> ChmHelpFile::PageForContext(int32_t contextId) const {
    // The context map: a 32-bit length of what follows, then pairs of 32-bit little-endian
    // numbers, the context id and the offset of the page's name in the strings table.
    const std::optional<std::string> map = ReadObject("/#IVB");
    if (!map || map->size() < 4)
        return std::nullopt;
    const std::optional<std::string> strings = ReadObject("/#STRINGS");
    if (!strings)
        return std::nullopt;
    const std::size_t declared = ReadLittleEndian32(*map, 0);
    const std::size_t end = 4 + std::min(declared, map->size() - 4);
    for (std::size_t at = 4; at + 8 <= end; at += 8) {
        if (static_cast<int32_t>(ReadLittleEndian32(*map, at)) != contextId)
            continue;
        const std::size_t offset = ReadLittleEndian32(*map, at + 4);
        const std::string target = UpToNul(*strings, offset);
        if (target.empty())
            continue;
        if (std::optional<std::string> page = ResolveMapTarget(target))
            return page;
    }
    return std::nullopt;
}

void ChmHelpFile::ReadSystemTable() {
    // A 32-bit version, then records: 16-bit code, 16-bit length, that many bytes.
    // Code 2 is the default topic, code 3 the title.
    const std::optional<std::string> table = ReadObject("/#SYSTEM");
    if (!table)
        return;
    std::size_t at = 4;
    while (at + 4 <= table->size()) {
        const uint16_t code = ReadLittleEndian16(*table, at);
        const std::size_t length = ReadLittleEndian16(*table, at + 2);
        at += 4;
        if (at + length > table->size())
            break;
        const std::string value = UpToNul(table->substr(at, length));
        if (code == 2) {
            defaultTopic_ = value;
        } else if (code == 3) {
            title_ = value;
        }
        at += length;
    }
}

}  // namespace vtr
