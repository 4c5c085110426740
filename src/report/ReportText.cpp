#include "report/ReportText.h"

#include <cstdint>

#include "engine/IgnoreKeyText.h"

#ifdef _WIN32
#include <windows.h>
#endif

namespace vtr::report {
namespace {

constexpr std::string_view kReplacement = "\xEF\xBF\xBD";  // U+FFFD

#ifdef _WIN32
std::string FromCodePage(std::string_view bytes) {
    if (bytes.empty())
        return {};
    const int size = static_cast<int>(bytes.size());
    const int wide = MultiByteToWideChar(CP_ACP, 0, bytes.data(), size, nullptr, 0);
    if (wide <= 0)
        return ValidUtf8(bytes);
    std::wstring text(static_cast<std::size_t>(wide), L'\0');
    MultiByteToWideChar(CP_ACP, 0, bytes.data(), size, text.data(), wide);
    const int narrow =
        WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, nullptr, 0, nullptr, nullptr);
    if (narrow <= 0)
        return ValidUtf8(bytes);
    std::string utf8(static_cast<std::size_t>(narrow), '\0');
    WideCharToMultiByte(CP_UTF8, 0, text.data(), wide, utf8.data(), narrow, nullptr, nullptr);
    return utf8;
}
#endif

bool IsUnreserved(unsigned char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '-' ||
           c == '.' || c == '_' || c == '~';
}

void AppendEncoded(std::string& out, std::string_view segment) {
    static constexpr char kHex[] = "0123456789ABCDEF";
    for (const char c : segment) {
        const auto byte = static_cast<unsigned char>(c);
        if (IsUnreserved(byte)) {
            out += c;
        } else {
            out += '%';
            out += kHex[byte >> 4];
            out += kHex[byte & 0x0F];
        }
    }
}

bool IsDriveLetterPath(std::string_view path) {
    return path.size() >= 2 && path[1] == ':' &&
           ((path[0] >= 'A' && path[0] <= 'Z') || (path[0] >= 'a' && path[0] <= 'z')) &&
           (path.size() == 2 || path[2] == '\\' || path[2] == '/');
}

}  // namespace

std::string ValidUtf8(std::string_view bytes) {
    std::string out;
    out.reserve(bytes.size());
    while (!bytes.empty()) {
        const std::size_t length = IgnoreKeyText::CharacterLength(bytes);
        if (length == 0) {
            out += kReplacement;
            bytes.remove_prefix(1);
        } else {
            out.append(bytes.substr(0, length));
            bytes.remove_prefix(length);
        }
    }
    return out;
}

std::string DisplayText(std::string_view bytes) {
#ifdef _WIN32
    return FromCodePage(bytes);
#else
    return ValidUtf8(bytes);
#endif
}

std::string Html(std::string_view bytes) {
    return OwnHtml(DisplayText(bytes));
}

std::string OwnHtml(std::string_view utf8) {
    const std::string text = ValidUtf8(utf8);
    std::string out;
    out.reserve(text.size() + text.size() / 8);
    for (const char c : text) {
        switch (c) {
            case '&':
                out += "&amp;";
                break;
            case '<':
                out += "&lt;";
                break;
            case '>':
                out += "&gt;";
                break;
            case '"':
                out += "&quot;";
                break;
            case '\'':
                out += "&#39;";
                break;
            default:
                out += c;
        }
    }
    return out;
}

std::string FileUri(std::string_view path) {
#ifdef _WIN32
    const std::string text = DisplayText(path);
    std::string_view name = text;
#else
    std::string_view name = path;
#endif
    std::string uri;
    const bool drive = IsDriveLetterPath(name);
    const bool unc = name.starts_with("\\\\") || name.starts_with("//");
    const bool windowsForm = drive || unc;
    if (drive) {
        uri = "file:///";
        uri += name.substr(0, 2);  // "C:"
        name.remove_prefix(2);
    } else if (unc) {
        uri = "file://";
        name.remove_prefix(2);
    } else if (name.starts_with('/')) {
        uri = "file://";
    }
    std::size_t start = 0;
    for (std::size_t i = 0; i <= name.size(); ++i) {
        const bool end = i == name.size();
        const bool separator = !end && (name[i] == '/' || (windowsForm && name[i] == '\\'));
        if (!end && !separator)
            continue;
        AppendEncoded(uri, name.substr(start, i - start));
        if (separator)
            uri += '/';
        start = i + 1;
    }
    return uri;
}

}  // namespace vtr::report
