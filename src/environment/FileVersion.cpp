#include "environment/FileVersion.h"

#include <array>
#include <filesystem>
#include <fstream>
#include <string_view>
#include <system_error>
#include <vector>

#include "engine/VtrError.h"

#ifdef _WIN32
#include <windows.h>
#endif

namespace vtr {
namespace {

// Header layout of a PE file (all little-endian).
constexpr uint32_t kDosHeaderSize = 64;
constexpr uint32_t kPeOffsetField = 0x3C;
constexpr uint32_t kCoffHeaderSize = 20;  // after the 4-byte "PE\0\0"
constexpr uint16_t kPe32Magic = 0x10B;
constexpr uint16_t kPe32PlusMagic = 0x20B;
constexpr uint32_t kResourceDirectoryIndex = 2;
constexpr uint32_t kSectionHeaderSize = 40;
constexpr uint32_t kResourceDirectorySize = 16;
constexpr uint32_t kResourceEntrySize = 8;
constexpr uint32_t kResourceDataEntrySize = 16;
constexpr uint32_t kSubdirectoryFlag = 0x80000000u;
constexpr uint32_t kNamedEntryFlag = 0x80000000u;
constexpr uint32_t kVersionResourceType = 16;
constexpr uint32_t kFixedInfoSignature = 0xFEEF04BDu;
constexpr uint32_t kFixedInfoSize = 52;
// "VS_VERSION_INFO" in UTF-16 with its terminator, after the three 16-bit header fields.
constexpr std::array<char16_t, 16> kVersionKey = {u'V', u'S', u'_', u'V', u'E', u'R', u'S', u'I',
                                                  u'O', u'N', u'_', u'I', u'N', u'F', u'O', 0};
constexpr uint32_t kVersionKeyOffset = 6;
constexpr uint32_t kVersionValueOffset = 40;  // key end (38) rounded up to 32 bits

uint16_t Le16(const std::vector<unsigned char>& bytes, std::size_t at) {
    return static_cast<uint16_t>(bytes[at] | (bytes[at + 1] << 8));
}

uint32_t Le32(const std::vector<unsigned char>& bytes, std::size_t at) {
    return static_cast<uint32_t>(bytes[at]) | (static_cast<uint32_t>(bytes[at + 1]) << 8) |
           (static_cast<uint32_t>(bytes[at + 2]) << 16) |
           (static_cast<uint32_t>(bytes[at + 3]) << 24);
}

// Reads pieces of a file, refusing any that does not lie wholly inside it.
class PieceReader {
  public:
    explicit PieceReader(const std::string& path) : in_(path, std::ios::binary) {
        if (!in_)
            return;
        in_.seekg(0, std::ios::end);
        const std::streamoff end = in_.tellg();
        if (end > 0)
            size_ = static_cast<uint64_t>(end);
    }

    bool Read(uint64_t offset, uint32_t length, std::vector<unsigned char>& out) {
        if (!in_ || offset > size_ || length > size_ - offset)
            return false;
        out.resize(length);
        if (length == 0)
            return true;
        in_.seekg(static_cast<std::streamoff>(offset));
        in_.read(reinterpret_cast<char*>(out.data()), static_cast<std::streamsize>(length));
        return static_cast<uint32_t>(in_.gcount()) == length;
    }

  private:
    std::ifstream in_;
    uint64_t size_ = 0;
};

// The same over bytes in memory.
class MemoryReader {
  public:
    explicit MemoryReader(std::string_view bytes) : bytes_(bytes) {}

    bool Read(uint64_t offset, uint32_t length, std::vector<unsigned char>& out) const {
        if (offset > bytes_.size() || length > bytes_.size() - offset)
            return false;
        out.assign(bytes_.begin() + static_cast<std::ptrdiff_t>(offset),
                   bytes_.begin() + static_cast<std::ptrdiff_t>(offset + length));
        return true;
    }

  private:
    std::string_view bytes_;
};

struct Section {
    uint32_t virtualAddress;
    uint32_t virtualSize;
    uint32_t rawSize;
    uint32_t rawOffset;
};

// The file offset of an address of the loaded image, inside a section's data on disk.
std::optional<uint64_t> FileOffsetOf(const std::vector<Section>& sections, uint32_t address,
                                     uint32_t length) {
    for (const Section& section : sections) {
        const uint64_t start = section.virtualAddress;
        const uint64_t end = start + section.rawSize;
        if (address >= start && uint64_t{address} + length <= end)
            return uint64_t{section.rawOffset} + (address - start);
    }
    return std::nullopt;
}

// The offset (from the resource section's start) of the entry of a resource directory that
// matches: the version type at the first level, the first entry below it.
template <typename Reader>
std::optional<uint32_t> FindEntry(Reader& file, uint64_t resourceBase, uint32_t resourceSize,
                                  uint32_t directoryOffset, std::optional<uint32_t> wantedId,
                                  bool wantSubdirectory) {
    std::vector<unsigned char> bytes;
    if (directoryOffset > resourceSize || kResourceDirectorySize > resourceSize - directoryOffset ||
        !file.Read(resourceBase + directoryOffset, kResourceDirectorySize, bytes)) {
        return std::nullopt;
    }
    const uint32_t named = Le16(bytes, 12);
    const uint32_t ids = Le16(bytes, 14);
    const uint32_t count = named + ids;  // at most 131070 entries of 8 bytes
    const uint32_t entriesOffset = directoryOffset + kResourceDirectorySize;
    if (count == 0 || entriesOffset > resourceSize ||
        count * kResourceEntrySize > resourceSize - entriesOffset ||
        !file.Read(resourceBase + entriesOffset, std::size_t{count} * kResourceEntrySize, bytes)) {
        return std::nullopt;
    }
    for (uint32_t i = 0; i < count; ++i) {
        const uint32_t name = Le32(bytes, std::size_t{i} * kResourceEntrySize);
        const uint32_t target = Le32(bytes, std::size_t{i} * kResourceEntrySize + 4);
        if (wantedId && ((name & kNamedEntryFlag) != 0 || name != *wantedId))
            continue;
        if (((target & kSubdirectoryFlag) != 0) != wantSubdirectory)
            return std::nullopt;
        return target & ~kSubdirectoryFlag;
    }
    return std::nullopt;
}

template <typename Reader>
std::optional<FileVersionNumbers> ReadPe(Reader& file) {
    std::vector<unsigned char> bytes;
    if (!file.Read(0, kDosHeaderSize, bytes) || bytes[0] != 'M' || bytes[1] != 'Z')
        return std::nullopt;
    const uint64_t peOffset = Le32(bytes, kPeOffsetField);

    if (!file.Read(peOffset, 4 + kCoffHeaderSize, bytes) || bytes[0] != 'P' || bytes[1] != 'E' ||
        bytes[2] != 0 || bytes[3] != 0) {
        return std::nullopt;
    }
    const uint32_t sectionCount = Le16(bytes, 4 + 2);
    const uint32_t optionalHeaderSize = Le16(bytes, 4 + 16);
    const uint64_t optionalOffset = peOffset + 4 + kCoffHeaderSize;

    if (!file.Read(optionalOffset, optionalHeaderSize, bytes) || optionalHeaderSize < 2)
        return std::nullopt;
    const uint16_t magic = Le16(bytes, 0);
    uint32_t directoryCountField = 0;
    if (magic == kPe32Magic) {
        directoryCountField = 92;
    } else if (magic == kPe32PlusMagic) {
        directoryCountField = 108;
    } else {
        return std::nullopt;
    }
    const uint32_t directoriesStart = directoryCountField + 4;
    if (optionalHeaderSize < directoriesStart)
        return std::nullopt;
    const uint32_t directoryCount = Le32(bytes, directoryCountField);
    const uint32_t resourceField = directoriesStart + kResourceDirectoryIndex * 8;
    if (directoryCount <= kResourceDirectoryIndex || resourceField + 8 > optionalHeaderSize)
        return std::nullopt;
    const uint32_t resourceAddress = Le32(bytes, resourceField);
    const uint32_t resourceSize = Le32(bytes, resourceField + 4);
    if (resourceAddress == 0 || resourceSize == 0)
        return std::nullopt;

    // At most 65535 section headers: a bounded read whatever the file claims.
    if (!file.Read(optionalOffset + optionalHeaderSize, sectionCount * kSectionHeaderSize, bytes))
        return std::nullopt;
    std::vector<Section> sections;
    sections.reserve(sectionCount);
    for (uint32_t i = 0; i < sectionCount; ++i) {
        const std::size_t at = std::size_t{i} * kSectionHeaderSize;
        sections.push_back({Le32(bytes, at + 12), Le32(bytes, at + 8), Le32(bytes, at + 16),
                            Le32(bytes, at + 20)});
    }

    // The resource directory as far as it lies in one section's data on disk.
    uint64_t resourceBase = 0;
    uint32_t resourceSpan = 0;
    for (const Section& section : sections) {
        if (resourceAddress >= section.virtualAddress &&
            resourceAddress - section.virtualAddress < section.rawSize) {
            resourceBase = uint64_t{section.rawOffset} + (resourceAddress - section.virtualAddress);
            resourceSpan = section.rawSize - (resourceAddress - section.virtualAddress);
            break;
        }
    }
    if (resourceSpan == 0)
        return std::nullopt;

    // Type (the version type) -> name (the first) -> language (the first) -> data entry.
    const auto names = FindEntry(file, resourceBase, resourceSpan, 0, kVersionResourceType, true);
    if (!names)
        return std::nullopt;
    const auto languages = FindEntry(file, resourceBase, resourceSpan, *names, std::nullopt, true);
    if (!languages)
        return std::nullopt;
    const auto dataEntry =
        FindEntry(file, resourceBase, resourceSpan, *languages, std::nullopt, false);
    if (!dataEntry || *dataEntry > resourceSpan ||
        kResourceDataEntrySize > resourceSpan - *dataEntry ||
        !file.Read(resourceBase + *dataEntry, kResourceDataEntrySize, bytes)) {
        return std::nullopt;
    }
    const uint32_t dataAddress = Le32(bytes, 0);
    const uint32_t dataSize = Le32(bytes, 4);
    constexpr uint32_t kNeeded = kVersionValueOffset + kFixedInfoSize;
    if (dataSize < kNeeded)
        return std::nullopt;
    const auto dataOffset = FileOffsetOf(sections, dataAddress, kNeeded);
    if (!dataOffset || !file.Read(*dataOffset, kNeeded, bytes))
        return std::nullopt;

    // VS_VERSIONINFO: length, value length, type, the key, then the fixed block.
    const uint32_t length = Le16(bytes, 0);
    const uint32_t valueLength = Le16(bytes, 2);
    if (length < kNeeded || valueLength < kFixedInfoSize)
        return std::nullopt;
    for (std::size_t i = 0; i < kVersionKey.size(); ++i) {
        if (Le16(bytes, kVersionKeyOffset + 2 * i) != kVersionKey[i])
            return std::nullopt;
    }
    if (Le32(bytes, kVersionValueOffset) != kFixedInfoSignature)
        return std::nullopt;
    const uint32_t mostSignificant = Le32(bytes, kVersionValueOffset + 8);
    const uint32_t leastSignificant = Le32(bytes, kVersionValueOffset + 12);
    return FileVersionNumbers{static_cast<uint16_t>(mostSignificant >> 16),
                              static_cast<uint16_t>(mostSignificant & 0xFFFF),
                              static_cast<uint16_t>(leastSignificant >> 16),
                              static_cast<uint16_t>(leastSignificant & 0xFFFF)};
}

#ifdef _WIN32
std::string SystemFileVersion(const std::string& path) {
    DWORD ignored = 0;
    const DWORD size = GetFileVersionInfoSizeA(path.c_str(), &ignored);
    if (size == 0)
        return "";
    std::vector<unsigned char> data(size);
    if (!GetFileVersionInfoA(path.c_str(), 0, size, data.data()))
        return "";
    void* block = nullptr;
    UINT blockSize = 0;
    char root[] = "\\";
    if (!VerQueryValueA(data.data(), root, &block, &blockSize) || block == nullptr ||
        blockSize < sizeof(VS_FIXEDFILEINFO)) {
        return "";
    }
    const auto* info = static_cast<const VS_FIXEDFILEINFO*>(block);
    if (info->dwSignature != kFixedInfoSignature)
        return "";
    return FileVersionToText({HIWORD(info->dwFileVersionMS), LOWORD(info->dwFileVersionMS),
                              HIWORD(info->dwFileVersionLS), LOWORD(info->dwFileVersionLS)});
}
#endif

}  // namespace

std::optional<FileVersionNumbers> ReadPeFileVersion(const std::string& path) {
    return ResumeOr(std::optional<FileVersionNumbers>{},
                    [&]() -> std::optional<FileVersionNumbers> {
                        // A folder, a device or a pipe is no such file (and opening a pipe could
                        // wait).
                        std::error_code error;
                        if (!std::filesystem::is_regular_file(path, error))
                            return std::nullopt;
                        PieceReader file(path);
                        return ReadPe(file);
                    });
}

std::optional<FileVersionNumbers> ReadPeVersion(std::string_view imageBytes) {
    return ResumeOr(std::optional<FileVersionNumbers>{},
                    [&]() -> std::optional<FileVersionNumbers> {
                        MemoryReader bytes(imageBytes);
                        return ReadPe(bytes);
                    });
}

std::string FileVersionToText(const FileVersionNumbers& version) {
    return std::to_string(version.major) + "." + std::to_string(version.minor) + "." +
           std::to_string(version.build) + "." + std::to_string(version.revision);
}

std::string FileVersionText(const std::string& path) {
#ifdef _WIN32
    return ResumeOr(std::string{}, [&] { return SystemFileVersion(path); });
#else
    const auto version = ReadPeFileVersion(path);
    return version ? FileVersionToText(*version) : std::string{};
#endif
}

}  // namespace vtr
