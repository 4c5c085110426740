#include "environment/RegistryFile.h"

#include <algorithm>
#include <cstdio>

namespace vtr::RegistryFile {
namespace {

namespace Code = RegistryStore::StatusCode;

constexpr std::string_view kHeader5 = "Windows Registry Editor Version 5.00";
constexpr std::string_view kHeader4 = "REGEDIT4";
constexpr std::string_view kRootName = "HKEY_CURRENT_USER";
constexpr std::string_view kRootShort = "HKCU";

// --- Text ----------------------------------------------------------------------------------

bool IsBlank(char c) {
    return c == ' ' || c == '\t';
}

std::string_view Trim(std::string_view s) {
    while (!s.empty() && (IsBlank(s.front()) || s.front() == '\r'))
        s.remove_prefix(1);
    while (!s.empty() && (IsBlank(s.back()) || s.back() == '\r'))
        s.remove_suffix(1);
    return s;
}

std::string_view TrimLeft(std::string_view s) {
    while (!s.empty() && IsBlank(s.front()))
        s.remove_prefix(1);
    return s;
}

char Upper(char c) {
    return (c >= 'a' && c <= 'z') ? static_cast<char>(c - 'a' + 'A') : c;
}

bool EqualsNoCase(std::string_view a, std::string_view b) {
    if (a.size() != b.size())
        return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (Upper(a[i]) != Upper(b[i]))
            return false;
    }
    return true;
}

bool StartsWithNoCase(std::string_view s, std::string_view prefix) {
    return s.size() >= prefix.size() && EqualsNoCase(s.substr(0, prefix.size()), prefix);
}

// The line without its line end.
std::string_view Content(std::string_view raw) {
    if (!raw.empty() && raw.back() == '\n')
        raw.remove_suffix(1);
    if (!raw.empty() && raw.back() == '\r')
        raw.remove_suffix(1);
    return raw;
}

// The line end of a line as it stands ("" for a last line without one).
std::string LineEnd(std::string_view raw) {
    if (raw.size() >= 2 && raw.substr(raw.size() - 2) == "\r\n")
        return "\r\n";
    if (!raw.empty() && raw.back() == '\n')
        return "\n";
    return "";
}

int HexDigit(char c) {
    if (c >= '0' && c <= '9')
        return c - '0';
    if (c >= 'a' && c <= 'f')
        return c - 'a' + 10;
    if (c >= 'A' && c <= 'F')
        return c - 'A' + 10;
    return -1;
}

// --- UTF-16 and the generalised UTF-8 that keeps unpaired surrogates ------------------------

void AppendCodePoint(std::string& out, uint32_t cp) {
    if (cp < 0x80) {
        out += static_cast<char>(cp);
    } else if (cp < 0x800) {
        out += static_cast<char>(0xC0 | (cp >> 6));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    } else if (cp < 0x10000) {
        out += static_cast<char>(0xE0 | (cp >> 12));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    } else {
        out += static_cast<char>(0xF0 | (cp >> 18));
        out += static_cast<char>(0x80 | ((cp >> 12) & 0x3F));
        out += static_cast<char>(0x80 | ((cp >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (cp & 0x3F));
    }
}

// UTF-16LE code units (an even number of bytes) to text. Unpaired surrogates are kept as
// three-byte sequences so that the text converts back to the same units.
std::string Utf16LeToText(std::string_view bytes) {
    std::string text;
    text.reserve(bytes.size() / 2);
    const std::size_t units = bytes.size() / 2;
    auto unit = [&](std::size_t i) {
        return static_cast<uint32_t>(static_cast<unsigned char>(bytes[2 * i])) |
               static_cast<uint32_t>(static_cast<unsigned char>(bytes[2 * i + 1])) << 8;
    };
    for (std::size_t i = 0; i < units; ++i) {
        uint32_t u = unit(i);
        if (u >= 0xD800 && u <= 0xDBFF && i + 1 < units) {
            const uint32_t low = unit(i + 1);
            if (low >= 0xDC00 && low <= 0xDFFF) {
                AppendCodePoint(text, 0x10000 + ((u - 0xD800) << 10) + (low - 0xDC00));
                ++i;
                continue;
            }
        }
        AppendCodePoint(text, u);
    }
    return text;
}

// Text back to UTF-16LE; nothing when the text is not valid (generalised) UTF-8.
std::optional<std::string> TextToUtf16Le(std::string_view text) {
    std::string bytes;
    bytes.reserve(text.size() * 2);
    auto put = [&](uint32_t u) {
        bytes += static_cast<char>(u & 0xFF);
        bytes += static_cast<char>(u >> 8);
    };
    for (std::size_t i = 0; i < text.size();) {
        const auto lead = static_cast<unsigned char>(text[i]);
        std::size_t length;
        uint32_t cp;
        if (lead < 0x80) {
            length = 1, cp = lead;
        } else if (lead >= 0xC2 && lead <= 0xDF) {
            length = 2, cp = lead & 0x1F;
        } else if (lead >= 0xE0 && lead <= 0xEF) {
            length = 3, cp = lead & 0x0F;
        } else if (lead >= 0xF0 && lead <= 0xF4) {
            length = 4, cp = lead & 0x07;
        } else {
            return std::nullopt;
        }
        if (i + length > text.size())
            return std::nullopt;
        for (std::size_t k = 1; k < length; ++k) {
            const auto c = static_cast<unsigned char>(text[i + k]);
            if ((c & 0xC0) != 0x80)
                return std::nullopt;
            cp = (cp << 6) | (c & 0x3F);
        }
        if ((length == 3 && cp < 0x800) || (length == 4 && (cp < 0x10000 || cp > 0x10FFFF))) {
            return std::nullopt;
        }
        if (cp >= 0x10000) {
            put(0xD800 + ((cp - 0x10000) >> 10));
            put(0xDC00 + ((cp - 0x10000) & 0x3FF));
        } else {
            put(cp);
        }
        i += length;
    }
    return bytes;
}

// --- Lines ---------------------------------------------------------------------------------

// Reads a quoted text starting at s[pos] == '"'; "\\" is a backslash and "\"" a quote (any
// other backslash stands for itself). On success pos is just past the closing quote.
std::optional<std::string> ReadQuoted(std::string_view s, std::size_t& pos) {
    std::string out;
    for (std::size_t i = pos + 1; i < s.size(); ++i) {
        const char c = s[i];
        if (c == '"') {
            pos = i + 1;
            return out;
        }
        if (c == '\\' && i + 1 < s.size() && (s[i + 1] == '\\' || s[i + 1] == '"')) {
            out += s[++i];
        } else {
            out += c;
        }
    }
    return std::nullopt;
}

// Follows the quotes of one more piece of a value line (quoted tells whether the piece starts
// inside a quoted text, and is left telling whether it ends inside one) and says whether the
// piece ends with a backslash outside quotes: the value goes on on the next line.
bool Continues(std::string_view piece, bool& quoted) {
    for (std::size_t i = 0; i < piece.size(); ++i) {
        const char c = piece[i];
        if (quoted) {
            if (c == '\\') {
                ++i;
            } else if (c == '"') {
                quoted = false;
            }
        } else if (c == '"') {
            quoted = true;
        }
    }
    piece = Trim(piece);
    return !quoted && !piece.empty() && piece.back() == '\\';
}

// The logical line that starts at pos: its physical line or, for a value line continued with
// a trailing backslash, every physical line it takes. Moves pos past it. Gives its content
// with the continuations joined: a view of the text, or of buffer when it was continued.
// Without a buffer only pos moves (and nothing is given for a continued line).
std::string_view NextLogicalLine(std::string_view text, std::size_t& pos, std::string* buffer) {
    auto endOf = [&](std::size_t from) {
        const std::size_t newline = text.find('\n', from);
        return newline == std::string_view::npos ? text.size() : newline + 1;
    };
    std::size_t end = endOf(pos);
    const std::string_view content = TrimLeft(Content(text.substr(pos, end - pos)));
    pos = end;
    if (content.empty() || (content.front() != '"' && content.front() != '@'))
        return content;
    bool quoted = false;
    bool more = Continues(content, quoted);
    if (!more || end == text.size())
        return content;
    if (buffer != nullptr)
        buffer->assign(content);
    while (more && end < text.size()) {
        if (buffer != nullptr)
            buffer->resize(buffer->find_last_not_of(" \t\r"));  // drops the backslash
        const std::size_t next = endOf(end);
        const std::string_view piece = TrimLeft(Content(text.substr(end, next - end)));
        if (buffer != nullptr)
            *buffer += piece;
        end = next;
        more = Continues(piece, quoted);
    }
    pos = end;
    return buffer != nullptr ? std::string_view(*buffer) : std::string_view();
}

// "xx,xx,..." into bytes; nothing when a byte is not hexadecimal.
std::optional<std::string> ReadHexBytes(std::string_view list) {
    std::string bytes;
    std::size_t i = 0;
    while (true) {
        while (i < list.size() && IsBlank(list[i]))
            ++i;
        if (i == list.size())
            break;
        const int high = HexDigit(list[i]);
        if (high < 0)
            return std::nullopt;
        int byte = high;
        ++i;
        if (i < list.size() && HexDigit(list[i]) >= 0)
            byte = byte * 16 + HexDigit(list[i++]);
        bytes += static_cast<char>(byte);
        while (i < list.size() && IsBlank(list[i]))
            ++i;
        if (i == list.size())
            break;
        if (list[i] != ',')
            return std::nullopt;
        ++i;
    }
    return bytes;
}

// The data of a value line (after "="); nothing when it is none of the known forms.
std::optional<Value> ReadValueData(std::string_view data, bool unicode) {
    data = Trim(data);
    if (!data.empty() && data.front() == '"') {
        std::size_t pos = 0;
        auto text = ReadQuoted(data, pos);
        if (!text || !Trim(data.substr(pos)).empty())
            return std::nullopt;
        Value value;
        value.type = RegistryStore::ValueType::String;
        value.data = std::move(*text);
        value.data += '\0';
        return value;
    }
    if (StartsWithNoCase(data, "dword:")) {
        const std::string_view digits = data.substr(6);
        if (digits.empty() || digits.size() > 8)
            return std::nullopt;
        uint32_t number = 0;
        for (char c : digits) {
            if (HexDigit(c) < 0)
                return std::nullopt;
            number = number * 16 + static_cast<uint32_t>(HexDigit(c));
        }
        return Value::Dword(number);
    }
    uint32_t type;
    std::string_view list;
    if (StartsWithNoCase(data, "hex:")) {
        type = RegistryStore::ValueType::Binary;
        list = data.substr(4);
    } else if (StartsWithNoCase(data, "hex(")) {
        const std::size_t close = data.find("):");
        if (close == std::string_view::npos || close == 4 || close > 12)
            return std::nullopt;
        type = 0;
        for (char c : data.substr(4, close - 4)) {
            if (HexDigit(c) < 0)
                return std::nullopt;
            type = type * 16 + static_cast<uint32_t>(HexDigit(c));
        }
        list = data.substr(close + 2);
    } else {
        return std::nullopt;
    }
    if (type == RegistryStore::ValueType::String) {
        // A string written as bytes (one that holds line breaks, or a length-0 string).
        if (auto bytes = ReadHexBytes(list)) {
            Value value;
            value.type = type;
            if (unicode) {
                bytes->resize(bytes->size() / 2 * 2);
                value.data = Utf16LeToText(*bytes);
            } else {
                value.data = *bytes;
            }
            return value;
        }
    }
    Value value;
    value.type = type;
    value.opaque = true;
    for (char c : list) {
        if (!IsBlank(c))
            value.data += c;
    }
    return value;
}

std::string HexList(std::string_view bytes, std::string_view prefix, const std::string& newline) {
    // Wrapped as an export wraps it: lines of at most about 80 characters, continued with
    // a trailing backslash and indented by two blanks.
    std::string out(prefix);
    std::size_t column = out.size();
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        char hex[4];
        std::snprintf(hex, sizeof hex, "%02x", static_cast<unsigned char>(bytes[i]));
        out += hex;
        column += 2;
        if (i + 1 < bytes.size()) {
            out += ',';
            ++column;
            if (column > 76) {
                out += "\\" + newline + "  ";
                column = 2;
            }
        }
    }
    return out;
}

std::string JoinPath(const KeyPath& path) {
    std::string out;
    for (const std::string& name : path) {
        if (!out.empty())
            out += '\\';
        out += name;
    }
    return out;
}

// True when prefix names the key path itself or one of its ancestors.
bool IsWithin(const KeyPath& path, const KeyPath& prefix) {
    if (prefix.size() > path.size())
        return false;
    for (std::size_t i = 0; i < prefix.size(); ++i) {
        if (!EqualsNoCase(path[i], prefix[i]))
            return false;
    }
    return true;
}

// --- The tree ------------------------------------------------------------------------------

// Notes kept in the tree while a batch is open: a value's line or a key's section end may be
// a line the batch adds (tagged with its number among the batch's new lines) or a section it
// adds at the end (tagged with the section's number).
constexpr std::size_t kNewLineTag = std::size_t(1) << 62;
constexpr std::size_t kNewSectionTag = std::size_t(1) << 61;
constexpr std::size_t kTags = kNewLineTag | kNewSectionTag;

bool Tagged(std::size_t at, std::size_t tag) {
    return at != kNoLine && (at & tag) != 0;
}

Key& EnsureKey(Key& root, const KeyPath& path) {
    Key* key = &root;
    for (const std::string& name : path) {
        auto it = key->subkeys.find(name);
        if (it == key->subkeys.end()) {
            it = key->subkeys.emplace(Fold(name), Key{}).first;
            it->second.name = name;
        }
        key = &it->second;
    }
    return *key;
}

template <typename K>  // Key or const Key
K* FindIn(K& root, const KeyPath& path) {
    K* key = &root;
    for (const std::string& name : path) {
        auto it = key->subkeys.find(name);
        if (it == key->subkeys.end())
            return nullptr;
        key = &it->second;
    }
    return key;
}

void RemoveKey(Key& root, const KeyPath& path) {
    if (path.empty())
        return;  // a root is never removed
    KeyPath parent(path.begin(), path.end() - 1);
    if (Key* key = FindIn(root, parent)) {
        if (auto it = key->subkeys.find(path.back()); it != key->subkeys.end())
            key->subkeys.erase(it);
    }
}

void SetIn(Key& key, std::string name, Value value, std::size_t line) {
    auto it = key.values.find(name);
    if (it == key.values.end()) {
        it = key.values.emplace(Fold(name), NamedValue{}).first;
        it->second.name = std::move(name);
    }
    it->second.value = std::move(value);
    it->second.line = line;
}

// Calls visit on every key of the tree (without recursion: a path may be very deep).
template <typename Visit>
void ForEachKey(Key& root, Visit&& visit) {
    std::vector<Key*> pending{&root};
    while (!pending.empty()) {
        Key* key = pending.back();
        pending.pop_back();
        visit(*key);
        for (auto& [folded, subkey] : key->subkeys)
            pending.push_back(&subkey);
    }
}

std::string SectionLine(const KeyPath& path, bool removal = false) {
    std::string section = removal ? "[-" : "[";
    section += kRootName;
    if (!path.empty())
        section += "\\" + JoinPath(path);
    return section + "]";
}

// The text's last line, from lastBegin on, is blank.
bool EndsWithBlankLine(const std::string& text, std::size_t lastBegin) {
    return Trim(Content(std::string_view(text).substr(lastBegin))).empty();
}

// Appends a section (and its one value line, when given) at the end of the text, whose last
// logical line starts at lastBegin: the last line gets a line end if it has none, and a
// blank line stands between it and the section unless it is blank itself.
void AppendSection(std::string& text, std::size_t lastBegin, const KeyPath& path,
                   const std::string& valueLine, const std::string& newline) {
    if (!text.empty()) {
        if (text.back() != '\n')
            text += newline;
        if (!EndsWithBlankLine(text, lastBegin))
            text += newline;
    }
    text += SectionLine(path) + newline;
    if (!valueLine.empty())
        text += valueLine + newline;
}

}  // namespace

// --- Values and names ----------------------------------------------------------------------

Value Value::String(const std::string& text) {
    Value value;
    value.type = RegistryStore::ValueType::String;
    value.data = text;
    value.data += '\0';
    return value;
}

Value Value::Dword(uint32_t number) {
    Value value;
    value.type = RegistryStore::ValueType::Dword;
    for (int i = 0; i < 4; ++i)
        value.data += static_cast<char>((number >> (8 * i)) & 0xFF);
    return value;
}

bool FoldedLess::operator()(std::string_view a, std::string_view b) const {
    const std::size_t common = std::min(a.size(), b.size());
    for (std::size_t i = 0; i < common; ++i) {
        const auto x = static_cast<unsigned char>(Upper(a[i]));
        const auto y = static_cast<unsigned char>(Upper(b[i]));
        if (x != y)
            return x < y;
    }
    return a.size() < b.size();
}

std::string Fold(std::string_view name) {
    std::string folded(name);
    for (char& c : folded)
        c = Upper(c);
    return folded;
}

KeyPath SplitKeyPath(std::string_view path) {
    KeyPath names;
    std::size_t start = 0;
    while (start <= path.size()) {
        std::size_t end = path.find('\\', start);
        if (end == std::string_view::npos)
            end = path.size();
        if (end > start)
            names.emplace_back(path.substr(start, end - start));
        start = end + 1;
    }
    return names;
}

bool SameContent(const Key& a, const Key& b) {
    if (a.subkeys.size() != b.subkeys.size() || a.values.size() != b.values.size())
        return false;
    for (const auto& [folded, value] : a.values) {
        auto other = b.values.find(folded);
        if (other == b.values.end() || !(other->second.value == value.value))
            return false;
    }
    for (const auto& [folded, subkey] : a.subkeys) {
        auto other = b.subkeys.find(folded);
        if (other == b.subkeys.end() || !SameContent(subkey, other->second))
            return false;
    }
    return true;
}

// --- Reading -------------------------------------------------------------------------------

Document Document::Parse(std::string_view bytes) {
    return Parse(std::string(bytes));
}

Document Document::Parse(std::string&& bytes) {
    const std::string_view view(bytes);
    auto begins = [&](std::string_view mark) { return view.substr(0, mark.size()) == mark; };
    if (begins("\xFF\xFE")) {
        if (view.size() % 2 != 0)
            return Unreadable();
        return FromText(Utf16LeToText(view.substr(2)), Encoding::Utf16Le, true);
    }
    if (begins("\xEF\xBB\xBF")) {
        bytes.erase(0, 3);
        return FromText(std::move(bytes), Encoding::Utf8, true);
    }
    // UTF-16LE without a byte-order mark: the header's first letter has a zero high byte.
    if (view.size() >= 2 && view[0] != '\0' && view[1] == '\0') {
        if (view.size() % 2 != 0)
            return Unreadable();
        return FromText(Utf16LeToText(view), Encoding::Utf16Le, false);
    }
    return FromText(std::move(bytes), Encoding::Utf8, false);
}

Document Document::Unreadable() {
    Document document;
    document.understood_ = false;
    return document;
}

Document Document::FromText(std::string text, Encoding encoding, bool byteOrderMark) {
    Document document;
    document.encoding_ = encoding;
    document.byteOrderMark_ = byteOrderMark;
    document.text_ = std::move(text);
    document.Read();
    return document;
}

bool Document::Reading::SaysTheSameAs(const Reading& other) const {
    if (line.kind != other.line.kind)
        return false;
    switch (line.kind) {
        case LineKind::Section:
        case LineKind::DeleteSection:
            return line.currentUser == other.line.currentUser && path == other.path;
        case LineKind::Value:
            return name == other.name && value == other.value;
        case LineKind::DeleteValue:
            return name == other.name;
        default:
            return true;
    }
}

Document::Reading Document::ReadLine(std::string_view text, std::size_t& pos, bool unicode) {
    Reading reading;
    Line& line = reading.line;
    line.begin = pos;
    std::string buffer;
    const std::string_view content = NextLogicalLine(text, pos, &buffer);
    if (Trim(content).empty()) {
        line.kind = LineKind::Blank;
    } else if (content.front() == ';') {
        line.kind = LineKind::Comment;
    } else if (content.front() == '[') {
        const std::string_view section = Trim(content);
        if (section.back() == ']' && section.size() > 2) {
            std::string_view inner = section.substr(1, section.size() - 2);
            const bool removal = inner.front() == '-';
            if (removal)
                inner.remove_prefix(1);
            KeyPath names = SplitKeyPath(inner);
            const std::string_view root = inner.substr(0, inner.find('\\'));
            line.kind = removal ? LineKind::DeleteSection : LineKind::Section;
            line.currentUser = EqualsNoCase(root, kRootName) || EqualsNoCase(root, kRootShort);
            if (!names.empty() && EqualsNoCase(names.front(), root))
                names.erase(names.begin());
            reading.path = std::move(names);
        }
    } else if (content.front() == '"' || content.front() == '@') {
        std::size_t at = 0;
        std::optional<std::string> name;
        if (content.front() == '@') {
            name = std::string();
            at = 1;
        } else {
            name = ReadQuoted(content, at);
        }
        const std::string_view rest = TrimLeft(content.substr(at));
        if (name && !rest.empty() && rest.front() == '=') {
            const std::string_view data = Trim(rest.substr(1));
            reading.name = std::move(*name);
            if (data == "-") {
                line.kind = LineKind::DeleteValue;
            } else if (auto value = ReadValueData(data, unicode)) {
                line.kind = LineKind::Value;
                reading.value = std::move(*value);
            }
        }
    }
    return reading;
}

void Document::Read() {
    lines_.clear();
    root_ = Key{};
    hasHeader_ = false;
    unicode_ = true;
    understood_ = true;
    const std::string_view text = text_;
    const std::size_t firstEnd = text.find('\n');
    newline_ = firstEnd != std::string_view::npos && firstEnd > 0 && text[firstEnd - 1] == '\r'
                   ? "\r\n"
                   : "\n";

    if (std::all_of(text.begin(), text.end(),
                    [](char c) { return IsBlank(c) || c == '\r' || c == '\n'; })) {
        // An empty store: it has no header yet and gets one on the first change.
        for (std::size_t pos = 0; pos < text.size();) {
            lines_.push_back(Line{pos, LineKind::Blank, false});
            const std::size_t end = text.find('\n', pos);
            pos = end == std::string_view::npos ? text.size() : end + 1;
        }
        return;
    }
    const std::size_t headerEnd = firstEnd == std::string_view::npos ? text.size() : firstEnd + 1;
    const std::string_view header = Trim(Content(text.substr(0, headerEnd)));
    if (EqualsNoCase(header, kHeader5)) {
        unicode_ = true;
    } else if (EqualsNoCase(header, kHeader4)) {
        unicode_ = false;
    } else {
        understood_ = false;
        text_.clear();
        text_.shrink_to_fit();
        return;
    }
    hasHeader_ = true;
    lines_.push_back(Line{0, LineKind::Header, false});
    Key* current = nullptr;  // the key whose section we are in, when it is one we read
    for (std::size_t pos = headerEnd; pos < text.size();) {
        Reading reading = ReadLine(text, pos, unicode_);
        const Line line = reading.line;
        Note(std::move(reading), lines_.size(), current);
        lines_.push_back(line);
    }
}

void Document::Note(Reading&& reading, std::size_t index, Key*& current) {
    switch (reading.line.kind) {
        case LineKind::Section:
            current = reading.line.currentUser ? &EnsureKey(root_, reading.path) : nullptr;
            if (current)
                current->sectionEnd = index;
            break;
        case LineKind::DeleteSection:
            if (reading.line.currentUser)
                RemoveKey(root_, reading.path);
            current = nullptr;
            break;
        case LineKind::Value:
            if (current) {
                SetIn(*current, std::move(reading.name), std::move(reading.value), index);
                current->sectionEnd = index;
            }
            break;
        case LineKind::DeleteValue:
            if (current) {
                if (auto value = current->values.find(reading.name); value != current->values.end())
                    current->values.erase(value);
                current->sectionEnd = index;
            }
            break;
        case LineKind::Other:
            if (current)
                current->sectionEnd = index;
            break;
        default:
            break;
    }
}

std::string_view Document::Raw(std::size_t line) const {
    const std::size_t begin = lines_[line].begin;
    const std::size_t end = line + 1 < lines_.size() ? lines_[line + 1].begin : text_.size();
    return std::string_view(text_).substr(begin, end - begin);
}

Document::Reading Document::Reread(std::size_t line) const {
    if (lines_[line].kind == LineKind::Header) {
        Reading reading;
        reading.line = lines_[line];
        return reading;
    }
    std::size_t pos = 0;
    Reading reading = ReadLine(Raw(line), pos, unicode_);
    reading.line.begin = lines_[line].begin;
    return reading;
}

const Key* Document::FindKey(const KeyPath& path) const {
    return FindIn(root_, path);
}

// --- Changing ------------------------------------------------------------------------------

std::string Document::HeaderLine() const {
    return std::string(kHeader5) + newline_;
}

std::string Document::RenderValueLine(const std::string& name, const Value& value) const {
    const std::string left = name.empty() ? "@=" : QuotedText(name) + "=";
    if (value.type == RegistryStore::ValueType::Dword && value.data.size() == 4) {
        uint32_t number = 0;
        for (int i = 3; i >= 0; --i)
            number = number << 8 | static_cast<unsigned char>(value.data[i]);
        return left + DwordText(number);
    }
    // A string: quoted when it can stand on one line with its single terminator, else as the
    // bytes of the stored string.
    const std::string& data = value.data;
    const bool quotable = !data.empty() && data.back() == '\0' &&
                          data.find_first_of(std::string("\r\n\0", 3)) == data.size() - 1;
    if (quotable)
        return left + QuotedText(std::string_view(data).substr(0, data.size() - 1));
    std::string bytes = data;
    if (unicode_)
        bytes = TextToUtf16Le(data).value_or(std::string());
    return HexList(bytes, left + "hex(1):", newline_);
}

std::string Document::ValueNameAt(std::size_t line) const {
    if (Tagged(line, kNewLineTag))
        return newLines_[line & ~kTags].meant.name;
    // The name stands at the start of the line, on its first physical line.
    const std::string_view content = TrimLeft(Content(Raw(line)));
    if (!content.empty() && content.front() == '@')
        return std::string();
    std::size_t at = 0;
    return ReadQuoted(content, at).value_or(std::string());
}

std::size_t Document::AddNewLine(std::string raw, Reading meant) {
    newLines_.push_back(NewLine{std::move(raw), std::move(meant)});
    return newLines_.size() - 1;
}

std::size_t Document::NewSectionFor(const KeyPath& path) {
    Reading meant;
    meant.line.kind = LineKind::Section;
    meant.line.currentUser = true;
    meant.path = path;
    NewSection section;
    section.lines.push_back(AddNewLine(SectionLine(path) + newline_, std::move(meant)));
    newSections_.push_back(std::move(section));
    return kNewSectionTag | (newSections_.size() - 1);
}

void Document::BeginBatch() {
    if (batch_)
        return;
    batch_ = true;
    modifiedBeforeBatch_ = modified_;
}

Status Document::EndBatch() {
    if (!batch_)
        return Code::Success;
    batch_ = false;
    if (newLines_.empty()) {
        Forget();
        return Code::Success;
    }
    if (SettleInPlace() || SettleAtTheEnd()) {
        Forget();
        modified_ = true;
        return Code::Success;
    }
    Undo();
    return Code::InvalidData;
}

void Document::Forget() {
    newLines_.clear();
    replaced_.clear();
    inserted_.clear();
    newSections_.clear();
    changedKeys_.clear();
    changedKeyNames_.clear();
}

void Document::Undo() {
    const bool modified = modifiedBeforeBatch_;
    Document original = FromText(std::move(text_), encoding_, byteOrderMark_);
    *this = std::move(original);
    modified_ = modified;
}

// The changed text, line by line: visit(expect, source, raw, addLineEnd) for each line in
// order, where source is the line (Same, SameButLineEnd) or the new line (Meant) it comes
// from, and addLineEnd tells that the line (the last one of the file, which has none) gets
// the file's line end because lines follow it now.
template <typename Visit>
void Document::PlanChangedText(Visit&& visit) const {
    bool written = false;   // something is written already
    bool lastBlank = true;  // the last line written is blank
    if (!hasHeader_) {
        const std::string header = HeaderLine();
        visit(Expect::Header, 0, std::string_view(header), false);
        written = true;
        lastBlank = false;
    }
    auto replacement = replaced_.begin();
    auto insertion = inserted_.begin();
    for (std::size_t i = 0; i < lines_.size(); ++i) {
        const bool insertsAfter = insertion != inserted_.end() && insertion->first == i;
        const bool followed = insertsAfter || (i + 1 == lines_.size() && !newSections_.empty());
        Expect expect = Expect::Same;
        std::size_t source = i;
        std::string_view raw = Raw(i);
        if (replacement != replaced_.end() && replacement->first == i) {
            expect = Expect::Meant;
            source = replacement->second;
            raw = newLines_[source].raw;
            ++replacement;
        }
        const bool addLineEnd = followed && (raw.empty() || raw.back() != '\n');
        if (addLineEnd && expect == Expect::Same)
            expect = Expect::SameButLineEnd;
        visit(expect, source, raw, addLineEnd);
        written = written || !raw.empty() || addLineEnd;
        lastBlank = Trim(Content(raw)).empty();
        if (insertsAfter) {
            for (const std::size_t n : insertion->second)
                visit(Expect::Meant, n, std::string_view(newLines_[n].raw), false);
            lastBlank = false;
            ++insertion;
        }
    }
    for (const NewSection& section : newSections_) {
        if (written && !lastBlank)
            visit(Expect::Blank, 0, std::string_view(newline_), false);
        for (const std::size_t n : section.lines)
            visit(Expect::Meant, n, std::string_view(newLines_[n].raw), false);
        written = true;
        lastBlank = false;
    }
}

// Writes the batch where each change belongs and reads the text back, line by line: every
// line the batch did not touch must span the same bytes it did (it then reads as it did),
// and every line it wrote must read as what it was written to say. Then the tree, which the
// changes already updated, is exactly what the new text gives.
bool Document::SettleInPlace() {
    if (encoding_ == Encoding::Utf16Le) {
        for (const NewLine& line : newLines_) {
            if (!TextToUtf16Le(line.raw))
                return false;
        }
    }
    std::size_t size = 0;
    std::size_t count = 0;
    PlanChangedText([&](Expect, std::size_t, std::string_view raw, bool addLineEnd) {
        size += raw.size() + (addLineEnd ? newline_.size() : 0);
        ++count;
    });
    std::string out;
    out.reserve(size);
    PlanChangedText([&](Expect, std::size_t, std::string_view raw, bool addLineEnd) {
        out += raw;
        if (addLineEnd)
            out += newline_;
    });

    // Read it back.
    const std::string_view text = out;
    const std::size_t firstEnd = text.find('\n');
    const std::size_t headerEnd = firstEnd == std::string_view::npos ? text.size() : firstEnd + 1;
    if (!EqualsNoCase(Trim(Content(text.substr(0, headerEnd))), unicode_ ? kHeader5 : kHeader4))
        return false;
    std::vector<Line> lines;
    lines.reserve(count);
    std::vector<std::size_t> newIndexOfNew(newLines_.size(), kNoLine);
    std::size_t pos = 0;
    bool same = true;
    PlanChangedText([&](Expect expect, std::size_t source, std::string_view raw, bool addLineEnd) {
        const std::size_t end = pos + raw.size() + (addLineEnd ? newline_.size() : 0);
        if (!same)
            return;
        if (lines.empty()) {
            // The header: the first physical line.
            same = end == headerEnd;
            lines.push_back(Line{0, LineKind::Header, false});
        } else if (expect == Expect::Same) {
            std::size_t next = pos;
            NextLogicalLine(text, next, nullptr);
            same = next == end;
            lines.push_back(Line{pos, lines_[source].kind, lines_[source].currentUser});
        } else {
            std::size_t next = pos;
            const Reading reading = ReadLine(text, next, unicode_);
            same = next == end;
            switch (expect) {
                case Expect::SameButLineEnd:
                    same = same && reading.SaysTheSameAs(Reread(source));
                    break;
                case Expect::Meant:
                    same = same && reading.SaysTheSameAs(newLines_[source].meant);
                    newIndexOfNew[source] = lines.size();
                    break;
                case Expect::Blank:
                    same = same && reading.line.kind == LineKind::Blank;
                    break;
                default:
                    same = false;  // only the first line is a header
                    break;
            }
            lines.push_back(reading.line);
        }
        pos = end;
    });
    if (!same || pos != text.size())
        return false;

    // The text stands: the tree's notes move to the new lines. A line of the old text moves
    // down by the lines added before it.
    std::vector<std::pair<std::size_t, std::size_t>> addedBefore;  // (line, lines added up to it)
    std::size_t added = hasHeader_ ? 0 : 1;
    for (const auto& [line, after] : inserted_) {
        added += after.size();
        addedBefore.emplace_back(line, added);
    }
    auto moved = [&](std::size_t line) {
        auto later = std::lower_bound(addedBefore.begin(), addedBefore.end(),
                                      std::make_pair(line, std::size_t(0)));
        return line + (later == addedBefore.begin() ? (hasHeader_ ? 0 : 1) : (later - 1)->second);
    };
    auto lineNow = [&](std::size_t at) {
        if (at == kNoLine)
            return kNoLine;
        if (Tagged(at, kNewLineTag))
            return newIndexOfNew[at & ~kTags];
        if (auto replacement = replaced_.find(at); replacement != replaced_.end())
            return newIndexOfNew[replacement->second];
        return moved(at);
    };
    auto sectionEndNow = [&](std::size_t at) {
        if (at == kNoLine)
            return kNoLine;
        if (Tagged(at, kNewSectionTag))
            return newIndexOfNew[newSections_[at & ~kTags].lines.back()];
        if (auto after = inserted_.find(at); after != inserted_.end())
            return newIndexOfNew[after->second.back()];
        return lineNow(at);
    };
    ForEachKey(root_, [&](Key& key) {
        key.sectionEnd = sectionEndNow(key.sectionEnd);
        for (auto& [folded, value] : key.values)
            value.line = lineNow(value.line);
    });
    text_ = std::move(out);
    lines_ = std::move(lines);
    hasHeader_ = true;
    return true;
}

// The plainer way, for a batch whose lines did not read back in place: every key the batch
// changed gets a section of its own at the end of the file with the values the batch set.
// The whole text is read again and must give exactly the changed tree.
bool Document::SettleAtTheEnd() {
    std::string out = hasHeader_ ? std::string() : HeaderLine();
    out += text_;
    std::size_t lastBegin = lines_.empty() ? 0 : lines_.back().begin + out.size() - text_.size();
    for (const KeyPath& path : changedKeys_) {
        const Key* key = FindIn(root_, path);
        if (key == nullptr)
            return false;
        std::string values;
        for (const auto& [folded, value] : key->values) {
            if (Tagged(value.line, kNewLineTag) || replaced_.count(value.line) != 0)
                values += RenderValueLine(value.name, value.value) + newline_;
        }
        const std::size_t sectionBegin = out.size();
        AppendSection(out, lastBegin, path, std::string(), newline_);
        out += values;
        const std::size_t lastLine = out.rfind('\n', out.size() - 2);
        lastBegin = std::max(sectionBegin, lastLine == std::string::npos ? 0 : lastLine + 1);
    }
    if (encoding_ == Encoding::Utf16Le && !TextToUtf16Le(out))
        return false;
    Document changed = FromText(std::move(out), encoding_, byteOrderMark_);
    if (!changed.understood_ || !SameContent(changed.root_, root_))
        return false;
    text_ = std::move(changed.text_);
    lines_ = std::move(changed.lines_);
    root_ = std::move(changed.root_);
    unicode_ = changed.unicode_;
    hasHeader_ = true;
    return true;
}

Status Document::Apply(const std::vector<std::string>& candidates, const Key& expected) {
    for (const std::string& text : candidates) {
        if (encoding_ == Encoding::Utf16Le && !TextToUtf16Le(text))
            continue;
        Document changed = FromText(text, encoding_, byteOrderMark_);
        if (!changed.understood_ || !SameContent(changed.root_, expected))
            continue;
        text_ = std::move(changed.text_);
        lines_ = std::move(changed.lines_);
        root_ = std::move(changed.root_);
        unicode_ = changed.unicode_;
        newline_ = changed.newline_;
        hasHeader_ = true;
        modified_ = true;
        return Code::Success;
    }
    return Code::InvalidData;
}

Status Document::SetValue(const KeyPath& keyPath, const std::string& name, const Value& value) {
    if (!understood_)
        return Code::BadDatabase;
    Key* key = FindIn(root_, keyPath);
    if (key == nullptr)
        return Code::KeyDeleted;
    auto existing = key->values.find(Fold(name));
    if (existing != key->values.end() && existing->second.value == value)
        return Code::Success;

    const bool ownBatch = !batch_;
    BeginBatch();
    Reading meant;
    meant.line.kind = LineKind::Value;
    meant.value = value;
    if (existing != key->values.end()) {
        // The line that gives the value now is rewritten, keeping its spelling of the name
        // and its line end.
        const std::size_t at = existing->second.line;
        meant.name = ValueNameAt(at);
        const std::string raw = RenderValueLine(meant.name, value);
        if (Tagged(at, kNewLineTag)) {
            NewLine& line = newLines_[at & ~kTags];
            line.raw = raw + LineEnd(line.raw);
            line.meant = std::move(meant);
        } else if (auto replacement = replaced_.find(at); replacement != replaced_.end()) {
            NewLine& line = newLines_[replacement->second];
            line.raw = raw + LineEnd(line.raw);
            line.meant = std::move(meant);
        } else {
            replaced_[at] = AddNewLine(raw + LineEnd(Raw(at)), std::move(meant));
        }
        existing->second.value = value;
    } else {
        // A new line at the end of the key's last section, or a new section at the end.
        meant.name = name;
        const std::size_t line = AddNewLine(RenderValueLine(name, value) + newline_, meant);
        if (key->sectionEnd == kNoLine)
            key->sectionEnd = NewSectionFor(keyPath);
        if (Tagged(key->sectionEnd, kNewSectionTag))
            newSections_[key->sectionEnd & ~kTags].lines.push_back(line);
        else
            inserted_[key->sectionEnd].push_back(line);
        SetIn(*key, name, value, kNewLineTag | line);
    }
    if (changedKeyNames_.insert(Fold(JoinPath(keyPath))).second)
        changedKeys_.push_back(keyPath);
    return ownBatch ? EndBatch() : Code::Success;
}

Status Document::CreateKey(const KeyPath& keyPath) {
    if (!understood_)
        return Code::BadDatabase;
    if (FindKey(keyPath) != nullptr)
        return Code::Success;
    const bool ownBatch = !batch_;
    BeginBatch();
    EnsureKey(root_, keyPath).sectionEnd = NewSectionFor(keyPath);
    if (changedKeyNames_.insert(Fold(JoinPath(keyPath))).second)
        changedKeys_.push_back(keyPath);
    return ownBatch ? EndBatch() : Code::Success;
}

Status Document::DeleteKey(const KeyPath& keyPath) {
    if (!understood_)
        return Code::BadDatabase;
    if (batch_) {
        const Status settled = EndBatch();
        BeginBatch();
        if (settled != Code::Success)
            return settled;
    }
    if (keyPath.empty())
        return Code::AccessDenied;
    const Key* key = FindKey(keyPath);
    if (key == nullptr)
        return Code::FileNotFound;
    if (!key->subkeys.empty())
        return Code::AccessDenied;
    Key expected = root_;
    RemoveKey(expected, keyPath);

    // Take out every section of the key and of anything below it (the ones that earlier
    // removals made dead too: any of them would bring the key back). A section's block ends
    // with its last value line and the blank lines after it; a comment that follows belongs
    // to what comes next and stays.
    std::vector<bool> drop(lines_.size(), false);
    for (std::size_t i = 0; i < lines_.size(); ++i) {
        const Line& line = lines_[i];
        if (line.kind != LineKind::Section || !line.currentUser ||
            !IsWithin(Reread(i).path, keyPath)) {
            continue;
        }
        std::size_t last = i;
        std::size_t next = i + 1;
        for (; next < lines_.size(); ++next) {
            const LineKind kind = lines_[next].kind;
            if (kind == LineKind::Section || kind == LineKind::DeleteSection)
                break;
            if (kind != LineKind::Blank && kind != LineKind::Comment)
                last = next;
        }
        std::size_t end = last + 1;
        while (end < next && lines_[end].kind == LineKind::Blank)
            ++end;
        std::fill(drop.begin() + static_cast<std::ptrdiff_t>(i),
                  drop.begin() + static_cast<std::ptrdiff_t>(end), true);
    }
    const std::string header = hasHeader_ ? std::string() : HeaderLine();
    std::string removed = header;
    std::size_t removedLast = 0;
    for (std::size_t i = 0; i < lines_.size(); ++i) {
        if (!drop[i]) {
            removedLast = removed.size();
            removed += Raw(i);
        }
    }
    // The parent may have existed only through the sections just taken out.
    std::string withParent = removed;
    AppendSection(withParent, removedLast, KeyPath(keyPath.begin(), keyPath.end() - 1),
                  std::string(), newline_);
    // Always right, if less tidy: a removal line at the end.
    std::string removalLine = header + text_;
    if (!removalLine.empty() && removalLine.back() != '\n')
        removalLine += newline_;
    const std::size_t lastBegin = lines_.empty() ? 0 : header.size() + lines_.back().begin;
    if (!EndsWithBlankLine(removalLine, std::min(lastBegin, removalLine.size())))
        removalLine += newline_;
    removalLine += SectionLine(keyPath, true) + newline_;
    return Apply({removed, withParent, removalLine}, expected);
}

std::optional<std::string> Document::Serialize() const {
    if (!understood_)
        return std::nullopt;
    if (encoding_ == Encoding::Utf8) {
        std::string bytes = byteOrderMark_ ? std::string("\xEF\xBB\xBF") : std::string();
        if (!hasHeader_)
            bytes += HeaderLine();
        bytes += text_;
        return bytes;
    }
    auto bytes = TextToUtf16Le(hasHeader_ ? text_ : HeaderLine() + text_);
    if (!bytes)
        return std::nullopt;
    return (byteOrderMark_ ? std::string("\xFF\xFE") : std::string()) + *bytes;
}

std::string QuotedText(std::string_view text) {
    std::string out = "\"";
    for (const char c : text) {
        if (c == '\\' || c == '"')
            out += '\\';
        out += c;
    }
    return out + "\"";
}

std::string DwordText(uint32_t value) {
    char digits[16];
    std::snprintf(digits, sizeof digits, "dword:%08x", value);
    return digits;
}

}  // namespace vtr::RegistryFile
