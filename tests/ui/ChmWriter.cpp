#include "ChmWriter.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <fstream>
#include <stdexcept>

namespace vtr::testsupport {
namespace {

constexpr uint32_t kChunkSize = 0x1000;
constexpr uint32_t kItsfLength = 0x60;
constexpr uint32_t kHeaderSection0Length = 0x18;
constexpr uint32_t kItspLength = 0x54;
constexpr uint32_t kPmglHeaderLength = 0x14;
constexpr uint32_t kQuickRefDensity = 2;

void Put32(std::string& out, uint32_t value) {
    for (int i = 0; i < 4; ++i)
        out.push_back(static_cast<char>((value >> (8 * i)) & 0xFF));
}

void Put16(std::string& out, uint16_t value) {
    out.push_back(static_cast<char>(value & 0xFF));
    out.push_back(static_cast<char>(value >> 8));
}

void Put64(std::string& out, uint64_t value) {
    Put32(out, static_cast<uint32_t>(value));
    Put32(out, static_cast<uint32_t>(value >> 32));
}

// A GUID as stored: the first three fields little-endian, the last eight bytes as they are.
void PutGuid(std::string& out, uint32_t a, uint16_t b, uint16_t c,
             const std::array<uint8_t, 8>& d) {
    Put32(out, a);
    Put16(out, b);
    Put16(out, c);
    for (uint8_t byte : d)
        out.push_back(static_cast<char>(byte));
}

// The archive's variable-length numbers: seven bits a byte, most significant first, the
// high bit set on every byte but the last.
void PutEncInt(std::string& out, uint64_t value) {
    std::string bytes(1, static_cast<char>(value & 0x7F));
    value >>= 7;
    while (value != 0) {
        bytes.insert(bytes.begin(), static_cast<char>(0x80 | (value & 0x7F)));
        value >>= 7;
    }
    out += bytes;
}

std::string Lower(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return text;
}

std::string SystemTable(const ChmContent& content) {
    std::string table;
    Put32(table, 3);
    auto record = [&](uint16_t code, const std::string& text) {
        Put16(table, code);
        Put16(table, static_cast<uint16_t>(text.size() + 1));
        table += text;
        table.push_back('\0');
    };
    if (!content.defaultTopic.empty())
        record(2, content.defaultTopic);
    if (!content.title.empty())
        record(3, content.title);
    return table;
}

}  // namespace

void WriteChm(const std::string& path, const ChmContent& content) {
    std::vector<std::pair<std::string, std::string>> files = content.files;
    if (content.writeContextMap) {
        std::string strings(1, '\0');
        std::string map;
        for (const auto& [id, page] : content.contextMap) {
            Put32(map, id);
            Put32(map, static_cast<uint32_t>(strings.size()));
            strings += page;
            strings.push_back('\0');
        }
        std::string ivb;
        Put32(ivb, content.declaredMapLength.value_or(static_cast<uint32_t>(map.size())));
        files.emplace_back("/#IVB", ivb + map);
        files.emplace_back("/#STRINGS", strings);
    }
    files.emplace_back("/#SYSTEM", SystemTable(content));
    std::sort(files.begin(), files.end(),
              [](const auto& a, const auto& b) { return Lower(a.first) < Lower(b.first); });

    // Content section 0 holds every file, one after the other.
    std::string data;
    std::string entries;
    std::vector<uint16_t> quickRefs;
    for (std::size_t i = 0; i < files.size(); ++i) {
        if (i != 0 && i % ((1u << kQuickRefDensity) + 1) == 0)
            quickRefs.push_back(static_cast<uint16_t>(entries.size()));
        const auto& [name, bytes] = files[i];
        PutEncInt(entries, name.size());
        entries += name;
        PutEncInt(entries, 0);
        PutEncInt(entries, data.size());
        PutEncInt(entries, bytes.size());
        data += bytes;
    }
    const std::size_t quickRefLength = 2 * quickRefs.size() + 2;
    if (kPmglHeaderLength + entries.size() + quickRefLength > kChunkSize)
        throw std::runtime_error("WriteChm: the directory does not fit in one chunk");

    std::string chunk = "PMGL";
    const uint32_t freeSpace =
        kChunkSize - kPmglHeaderLength - static_cast<uint32_t>(entries.size());
    Put32(chunk, freeSpace);
    Put32(chunk, 0);
    Put32(chunk, 0xFFFFFFFF);  // no previous chunk
    Put32(chunk, 0xFFFFFFFF);  // no next chunk
    chunk += entries;
    chunk.resize(kChunkSize - quickRefLength, '\0');
    for (auto at = quickRefs.rbegin(); at != quickRefs.rend(); ++at)
        Put16(chunk, *at);
    Put16(chunk, static_cast<uint16_t>(files.size()));

    std::string directory = "ITSP";
    Put32(directory, 1);            // version
    Put32(directory, kItspLength);  // header length
    Put32(directory, 0x0A);
    Put32(directory, kChunkSize);
    Put32(directory, kQuickRefDensity);
    Put32(directory, 1);           // depth of the index tree: listing chunks only
    Put32(directory, 0xFFFFFFFF);  // no index chunk
    Put32(directory, 0);           // first listing chunk
    Put32(directory, 0);           // last listing chunk
    Put32(directory, 0xFFFFFFFF);
    Put32(directory, 1);       // chunks
    Put32(directory, 0x0409);  // language
    PutGuid(directory, 0x5D02926A, 0x212E, 0x11D0,
            {0x9D, 0xF9, 0x00, 0xA0, 0xC9, 0x22, 0xE6, 0xEC});
    Put32(directory, kItspLength);
    Put32(directory, 0xFFFFFFFF);
    Put32(directory, 0xFFFFFFFF);
    Put32(directory, 0xFFFFFFFF);
    directory += chunk;

    const uint64_t directoryOffset = kItsfLength + kHeaderSection0Length;
    const uint64_t dataOffset = directoryOffset + directory.size();
    const uint64_t fileSize = dataOffset + data.size();

    std::string file = "ITSF";
    Put32(file, 3);
    Put32(file, kItsfLength);
    Put32(file, 1);
    Put32(file, 0);       // time stamp
    Put32(file, 0x0409);  // language
    PutGuid(file, 0x7C01FD10, 0x7BAA, 0x11D0, {0x9E, 0x0C, 0x00, 0xA0, 0xC9, 0x22, 0xE6, 0xEC});
    PutGuid(file, 0x7C01FD11, 0x7BAA, 0x11D0, {0x9E, 0x0C, 0x00, 0xA0, 0xC9, 0x22, 0xE6, 0xEC});
    Put64(file, kItsfLength);
    Put64(file, kHeaderSection0Length);
    Put64(file, directoryOffset);
    Put64(file, directory.size());
    Put64(file, dataOffset);
    // Header section 0.
    Put32(file, 0x01FE);
    Put32(file, 0);
    Put64(file, fileSize);
    Put32(file, 0);
    Put32(file, 0);
    file += directory;
    file += data;

    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(file.data(), static_cast<std::streamsize>(file.size()));
    if (!out)
        throw std::runtime_error("WriteChm: cannot write " + path);
}

}  // namespace vtr::testsupport
