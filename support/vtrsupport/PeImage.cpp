#include "vtrsupport/PeImage.h"

#include <array>
#include <fstream>
#include <stdexcept>
#include <vector>

namespace vtr::testsupport {
namespace {

constexpr uint32_t kFileAlignment = 0x200;
constexpr uint32_t kSectionAlignment = 0x1000;
constexpr uint32_t kPeOffset = 0x80;
constexpr uint32_t kHeadersSize = 0x200;
constexpr uint32_t kVersionType = 16;   // RT_VERSION
constexpr uint32_t kManifestType = 24;  // RT_MANIFEST
constexpr uint32_t kLanguage = 0x0409;

uint32_t AlignUp(uint32_t value, uint32_t alignment) {
    return (value + alignment - 1) / alignment * alignment;
}

// A growing little-endian byte buffer.
class Bytes {
  public:
    std::size_t Size() const { return data_.size(); }
    void U8(uint8_t v) { data_.push_back(static_cast<char>(v)); }
    void U16(uint16_t v) {
        U8(static_cast<uint8_t>(v));
        U8(static_cast<uint8_t>(v >> 8));
    }
    void U32(uint32_t v) {
        U16(static_cast<uint16_t>(v));
        U16(static_cast<uint16_t>(v >> 16));
    }
    void U64(uint64_t v) {
        U32(static_cast<uint32_t>(v));
        U32(static_cast<uint32_t>(v >> 32));
    }
    void Text(const char* text, std::size_t length) { data_.append(text, length); }
    void Wide(const char* text) {  // UTF-16 with its terminator, ASCII text only
        for (const char* c = text; *c != '\0'; ++c)
            U16(static_cast<uint8_t>(*c));
        U16(0);
    }
    void PadTo(std::size_t size) {
        if (data_.size() < size)
            data_.resize(size, '\0');
    }
    void Align(std::size_t alignment) {
        PadTo((data_.size() + alignment - 1) / alignment * alignment);
    }
    void Patch16(std::size_t at, uint16_t v) {
        data_[at] = static_cast<char>(v);
        data_[at + 1] = static_cast<char>(v >> 8);
    }
    void Patch32(std::size_t at, uint32_t v) {
        Patch16(at, static_cast<uint16_t>(v));
        Patch16(at + 2, static_cast<uint16_t>(v >> 16));
    }
    void Append(const Bytes& other) { data_ += other.data_; }
    const std::string& Data() const { return data_; }

  private:
    std::string data_;
};

std::array<uint16_t, 4> ParseVersion(const std::string& version) {
    std::array<uint16_t, 4> parts{};
    std::size_t start = 0;
    for (std::size_t i = 0; i < parts.size(); ++i) {
        const std::size_t end = i + 1 < parts.size() ? version.find('.', start) : version.size();
        if (end == std::string::npos || end == start || end - start > 5)
            throw std::invalid_argument("not a version a.b.c.d: " + version);
        uint32_t value = 0;
        for (std::size_t k = start; k < end; ++k) {
            if (version[k] < '0' || version[k] > '9')
                throw std::invalid_argument("not a version a.b.c.d: " + version);
            value = value * 10 + static_cast<uint32_t>(version[k] - '0');
        }
        if (value > 0xFFFF)
            throw std::invalid_argument("version part above 65535: " + version);
        parts[i] = static_cast<uint16_t>(value);
        start = end + 1;
    }
    return parts;
}

// VS_VERSIONINFO with its fixed block and a translation table.
Bytes VersionResource(const std::array<uint16_t, 4>& v, uint32_t signature, std::size_t* fixedAt) {
    Bytes info;
    info.U16(0);   // length, patched below
    info.U16(52);  // the fixed block's size
    info.U16(0);   // binary
    info.Wide("VS_VERSION_INFO");
    info.Align(4);
    *fixedAt = info.Size();
    info.U32(signature);
    info.U32(0x00010000);  // structure version 1.0
    info.U32((uint32_t{v[0]} << 16) | v[1]);
    info.U32((uint32_t{v[2]} << 16) | v[3]);
    info.U32((uint32_t{v[0]} << 16) | v[1]);  // product version: the same
    info.U32((uint32_t{v[2]} << 16) | v[3]);
    info.U32(0x3F);     // flags mask
    info.U32(0);        // flags
    info.U32(0x40004);  // Windows NT, 32-bit
    info.U32(2);        // a library
    info.U32(0);        // subtype
    info.U32(0);        // date
    info.U32(0);

    const std::size_t varFileInfo = info.Size();
    info.U16(0);  // length, patched below
    info.U16(0);
    info.U16(1);  // text
    info.Wide("VarFileInfo");
    info.Align(4);
    const std::size_t var = info.Size();
    info.U16(0);  // length, patched below
    info.U16(4);
    info.U16(0);
    info.Wide("Translation");
    info.Align(4);
    info.U16(kLanguage);
    info.U16(1200);  // Unicode
    info.Patch16(var, static_cast<uint16_t>(info.Size() - var));
    info.Patch16(varFileInfo, static_cast<uint16_t>(info.Size() - varFileInfo));
    info.Patch16(0, static_cast<uint16_t>(info.Size()));
    return info;
}

void Directory(Bytes& out, uint32_t id, uint32_t target, bool subdirectory) {
    out.U32(0);  // characteristics
    out.U32(0);  // time stamp
    out.U16(0);  // version
    out.U16(0);
    out.U16(0);  // named entries
    out.U16(1);  // id entries
    out.U32(id);
    out.U32(target | (subdirectory ? 0x80000000u : 0u));
}

}  // namespace

std::string PeImageBytes(const std::string& version) {
    PeImageOptions options;
    options.version = version;
    return PeImageBytes(options);
}

std::string PeImageBytes(const PeImageOptions& options, PeImageLayout* layout) {
    PeImageLayout where;
    const bool hasVersion = !options.version.empty();
    const std::array<uint16_t, 4> version =
        hasVersion ? ParseVersion(options.version) : std::array<uint16_t, 4>{};

    const uint32_t codeSize = options.codeSectionFirst ? kFileAlignment : 0;
    const uint32_t resourceAddress =
        options.codeSectionFirst ? 2 * kSectionAlignment : kSectionAlignment;
    const uint32_t resourceOffset = kHeadersSize + codeSize;

    // The resource section: type -> name -> language -> data entry -> data.
    Bytes resources;
    Directory(resources, hasVersion ? kVersionType : kManifestType, 0x18, true);
    Directory(resources, 1, 0x30, true);
    Directory(resources, kLanguage, 0x48, false);
    const uint32_t dataAt = 0x58;
    Bytes data;
    std::size_t fixedAt = 0;
    if (hasVersion) {
        data = VersionResource(version, options.fixedInfoSignature, &fixedAt);
    } else {
        const char manifest[] =
            "<assembly xmlns=\"urn:schemas-microsoft-com:asm.v1\" "
            "manifestVersion=\"1.0\"/>";
        data.Text(manifest, sizeof manifest - 1);
    }
    resources.U32(resourceAddress + dataAt);
    resources.U32(static_cast<uint32_t>(data.Size()));
    resources.U32(0);  // code page
    resources.U32(0);
    resources.PadTo(dataAt);
    resources.Append(data);
    const uint32_t resourceSize = static_cast<uint32_t>(resources.Size());
    const uint32_t resourceRawSize = AlignUp(resourceSize, kFileAlignment);
    resources.PadTo(resourceRawSize);

    const uint16_t sectionCount = options.codeSectionFirst ? 2 : 1;
    const uint32_t imageSize = resourceAddress + AlignUp(resourceSize, kSectionAlignment);

    Bytes image;
    // DOS header: "MZ" and the offset of the PE header; the rest is unused by a library.
    image.Text("MZ", 2);
    image.PadTo(0x3C);
    image.U32(kPeOffset);
    image.PadTo(kPeOffset);

    where.peHeader = image.Size();
    image.Text("PE\0\0", 4);
    image.U16(options.pe32Plus ? 0x8664 : 0x14C);  // machine
    image.U16(sectionCount);
    image.U32(0);  // time stamp
    image.U32(0);  // symbols
    image.U32(0);
    image.U16(options.pe32Plus ? 240 : 224);        // optional header size
    image.U16(options.pe32Plus ? 0x2022 : 0x2102);  // executable library

    where.optionalHeader = image.Size();
    image.U16(options.pe32Plus ? 0x20B : 0x10B);
    image.U8(14);  // linker version
    image.U8(0);
    image.U32(codeSize);
    image.U32(resourceRawSize);    // initialised data
    image.U32(0);                  // uninitialised data
    image.U32(0);                  // no entry point
    image.U32(kSectionAlignment);  // base of code
    if (options.pe32Plus) {
        image.U64(0x180000000ull);
    } else {
        image.U32(resourceAddress);  // base of data
        image.U32(0x10000000);
    }
    image.U32(kSectionAlignment);
    image.U32(kFileAlignment);
    image.U16(6);  // operating system version
    image.U16(0);
    image.U16(0);  // image version
    image.U16(0);
    image.U16(6);  // subsystem version
    image.U16(0);
    image.U32(0);  // reserved
    image.U32(imageSize);
    image.U32(kHeadersSize);
    image.U32(0);       // checksum
    image.U16(2);       // Windows GUI
    image.U16(0x0140);  // relocatable, no-execute compatible
    if (options.pe32Plus) {
        image.U64(0x100000);
        image.U64(0x1000);
        image.U64(0x100000);
        image.U64(0x1000);
    } else {
        image.U32(0x100000);
        image.U32(0x1000);
        image.U32(0x100000);
        image.U32(0x1000);
    }
    image.U32(0);   // loader flags
    image.U32(16);  // data directories
    for (uint32_t i = 0; i < 16; ++i) {
        if (i == 2) {
            where.resourceDirectoryEntry = image.Size();
            image.U32(resourceAddress);
            image.U32(resourceSize);
        } else {
            image.U64(0);
        }
    }

    where.sectionTable = image.Size();
    if (options.codeSectionFirst) {
        image.Text(".text\0\0\0", 8);
        image.U32(codeSize);           // virtual size
        image.U32(kSectionAlignment);  // address
        image.U32(codeSize);           // raw size
        image.U32(kHeadersSize);       // raw offset
        image.U32(0);
        image.U32(0);
        image.U16(0);
        image.U16(0);
        image.U32(0x60000020);  // code, execute, read
    }
    image.Text(".rsrc\0\0\0", 8);
    image.U32(resourceSize);
    image.U32(resourceAddress);
    image.U32(resourceRawSize);
    image.U32(resourceOffset);
    image.U32(0);
    image.U32(0);
    image.U16(0);
    image.U16(0);
    image.U32(0x40000040);  // initialised data, read
    image.PadTo(kHeadersSize);
    if (options.codeSectionFirst) {
        image.U8(0xC3);  // a lone return
        image.PadTo(kHeadersSize + codeSize);
    }

    where.resourceSection = image.Size();
    if (hasVersion) {
        where.dataEntry = where.resourceSection + 0x48;
        where.versionInfo = where.resourceSection + dataAt;
        where.fixedInfo = where.versionInfo + fixedAt;
    }
    image.Append(resources);
    if (layout != nullptr)
        *layout = where;
    return image.Data();
}

void WritePeImage(const std::string& fileName, const std::string& version) {
    const std::string bytes = PeImageBytes(version);
    std::ofstream out(fileName, std::ios::binary | std::ios::trunc);
    out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    out.close();
    if (!out)
        throw std::runtime_error("cannot write " + fileName);
}

}  // namespace vtr::testsupport
