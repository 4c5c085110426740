#include "engine/IgnoreKeyText.h"

#include <charconv>
#include <cstdint>

namespace vtr::IgnoreKeyText {

std::size_t CharacterLength(std::string_view bytes) {
    if (bytes.empty())
        return 0;
    const auto byte = [&](std::size_t i) { return static_cast<unsigned char>(bytes[i]); };
    const unsigned char first = byte(0);
    if (first < 0x80)
        return 1;
    std::size_t length = 0;
    uint32_t codePoint = 0;
    if (first >= 0xC2 && first <= 0xDF) {
        length = 2;
        codePoint = first & 0x1Fu;
    } else if (first >= 0xE0 && first <= 0xEF) {
        length = 3;
        codePoint = first & 0x0Fu;
    } else if (first >= 0xF0 && first <= 0xF4) {
        length = 4;
        codePoint = first & 0x07u;
    } else {
        return 0;
    }
    if (bytes.size() < length)
        return 0;
    for (std::size_t i = 1; i < length; ++i) {
        if ((byte(i) & 0xC0) != 0x80)
            return 0;
        codePoint = (codePoint << 6) | (byte(i) & 0x3Fu);
    }
    const uint32_t smallest = length == 3 ? 0x800 : length == 4 ? 0x10000 : 0x80;
    if (codePoint < smallest || codePoint > 0x10FFFF ||
        (codePoint >= 0xD800 && codePoint <= 0xDFFF))
        return 0;
    return length;
}

namespace {

bool IsControl(unsigned char byte) {
    return byte < 0x20 || byte == 0x7F;
}

}  // namespace

bool IsUtf8(std::string_view bytes) {
    while (!bytes.empty()) {
        const std::size_t length = CharacterLength(bytes);
        if (length == 0)
            return false;
        bytes.remove_prefix(length);
    }
    return true;
}

std::string Encode(std::string_view key) {
    // Most keys are plain ASCII text: one pass over the bytes tells.
    bool ascii = true;
    bool control = false;
    for (const char c : key) {
        const auto byte = static_cast<unsigned char>(c);
        ascii = ascii && byte < 0x80;
        control = control || IsControl(byte);
    }
    if (!control && !key.starts_with(kEscapedMarker) && (ascii || IsUtf8(key)))
        return std::string(key);

    static constexpr char kHex[] = "0123456789ABCDEF";
    std::string text(kEscapedMarker);
    while (!key.empty()) {
        const std::size_t length = CharacterLength(key);
        const auto first = static_cast<unsigned char>(key.front());
        if (length == 0 || IsControl(first)) {
            text += "\\x";
            text += kHex[first >> 4];
            text += kHex[first & 0x0F];
            key.remove_prefix(1);
        } else {
            if (first == '\\')
                text += '\\';
            text += key.substr(0, length);
            key.remove_prefix(length);
        }
    }
    return text;
}

std::optional<std::string> Decode(std::string_view text) {
    if (!text.starts_with(kEscapedMarker))
        return std::string(text);
    text.remove_prefix(kEscapedMarker.size());
    std::string key;
    key.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\\') {
            key += text[i];
            continue;
        }
        if (i + 1 < text.size() && text[i + 1] == '\\') {
            key += '\\';
            ++i;
            continue;
        }
        if (i + 3 >= text.size() || text[i + 1] != 'x')
            return std::nullopt;
        unsigned int byte = 0;
        const char* digits = text.data() + i + 2;
        const auto [end, error] = std::from_chars(digits, digits + 2, byte, 16);
        if (error != std::errc() || end != digits + 2)
            return std::nullopt;
        key += static_cast<char>(byte);
        i += 3;
    }
    return key;
}

}  // namespace vtr::IgnoreKeyText
