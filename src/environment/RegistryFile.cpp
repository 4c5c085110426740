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

bool EndsWithNewline(const std::string& raw) {
    return !raw.empty() && raw.back() == '\n';
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
        return Value::String(*text);
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

bool SamePath(const KeyPath& a, const KeyPath& b) {
    if (a.size() != b.size())
        return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        if (!EqualsNoCase(a[i], b[i]))
            return false;
    }
    return true;
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

Key& EnsureKey(Key& root, const KeyPath& path) {
    Key* key = &root;
    for (const std::string& name : path) {
        auto [it, added] = key->subkeys.try_emplace(Fold(name));
        if (added)
            it->second.name = name;
        key = &it->second;
    }
    return *key;
}

template <typename K>  // Key or const Key
K* FindIn(K& root, const KeyPath& path) {
    K* key = &root;
    for (const std::string& name : path) {
        auto it = key->subkeys.find(Fold(name));
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
    if (Key* key = FindIn(root, parent))
        key->subkeys.erase(Fold(path.back()));
}

void SetIn(Key& key, const std::string& name, const Value& value) {
    auto [it, added] = key.values.try_emplace(Fold(name));
    if (added)
        it->second.name = name;
    it->second.value = value;
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
    auto begins = [&](std::string_view mark) { return bytes.substr(0, mark.size()) == mark; };
    if (begins("\xFF\xFE")) {
        bytes.remove_prefix(2);
        if (bytes.size() % 2 != 0)
            return Unreadable();
        return FromText(Utf16LeToText(bytes), Encoding::Utf16Le, true);
    }
    if (begins("\xEF\xBB\xBF")) {
        return FromText(std::string(bytes.substr(3)), Encoding::Utf8, true);
    }
    // UTF-16LE without a byte-order mark: the header's first letter has a zero high byte.
    if (bytes.size() >= 2 && bytes[0] != '\0' && bytes[1] == '\0') {
        if (bytes.size() % 2 != 0)
            return Unreadable();
        return FromText(Utf16LeToText(bytes), Encoding::Utf16Le, false);
    }
    return FromText(std::string(bytes), Encoding::Utf8, false);
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
    document.Classify(text);
    if (document.understood_)
        document.Build();
    return document;
}

void Document::Classify(const std::string& text) {
    std::vector<std::string> physical;
    for (std::size_t start = 0; start < text.size();) {
        std::size_t end = text.find('\n', start);
        end = (end == std::string::npos) ? text.size() : end + 1;
        physical.push_back(text.substr(start, end - start));
        start = end;
    }

    if (std::all_of(text.begin(), text.end(),
                    [](char c) { return IsBlank(c) || c == '\r' || c == '\n'; })) {
        // An empty store: it has no header yet and gets one on the first change.
        for (const std::string& raw : physical) {
            Line line;
            line.kind = LineKind::Blank;
            line.raw = raw;
            lines_.push_back(std::move(line));
        }
        return;
    }
    const std::string_view header = Trim(Content(physical.front()));
    if (EqualsNoCase(header, kHeader5)) {
        unicode_ = true;
    } else if (EqualsNoCase(header, kHeader4)) {
        unicode_ = false;
    } else {
        understood_ = false;
        return;
    }
    hasHeader_ = true;
    Line headerLine;
    headerLine.kind = LineKind::Header;
    headerLine.raw = physical.front();
    lines_.push_back(std::move(headerLine));

    for (std::size_t i = 1; i < physical.size(); ++i) {
        Line line;
        line.raw = physical[i];
        const std::string_view content = TrimLeft(Content(physical[i]));
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
                const std::size_t rootEnd = inner.find('\\');
                const std::string_view root = inner.substr(0, rootEnd);
                line.kind = removal ? LineKind::DeleteSection : LineKind::Section;
                line.currentUser = EqualsNoCase(root, kRootName) || EqualsNoCase(root, kRootShort);
                if (!names.empty() && EqualsNoCase(names.front(), root)) {
                    names.erase(names.begin());
                }
                line.path = std::move(names);
            }
        } else if (content.front() == '"' || content.front() == '@') {
            // Join continued lines into one logical line.
            std::string joined(content);
            bool quoted = false;
            bool more = Continues(joined, quoted);
            while (more && i + 1 < physical.size()) {
                joined.resize(joined.find_last_not_of(" \t\r"));  // drops the backslash
                line.raw += physical[++i];
                const std::string_view piece = TrimLeft(Content(physical[i]));
                joined += piece;
                more = Continues(piece, quoted);
            }
            std::size_t pos = 0;
            std::optional<std::string> name;
            if (joined.front() == '@') {
                name = std::string();
                pos = 1;
            } else {
                name = ReadQuoted(joined, pos);
            }
            const std::string_view rest = TrimLeft(std::string_view(joined).substr(pos));
            if (name && !rest.empty() && rest.front() == '=') {
                const std::string_view data = Trim(rest.substr(1));
                line.name = *name;
                if (data == "-") {
                    line.kind = LineKind::DeleteValue;
                } else if (auto value = ReadValueData(data, unicode_)) {
                    line.kind = LineKind::Value;
                    line.value = std::move(*value);
                }
            }
        }
        lines_.push_back(std::move(line));
    }
}

void Document::Build() {
    root_ = Key{};
    Key* current = nullptr;  // the key whose section we are in, when it is one we read
    for (const Line& line : lines_) {
        switch (line.kind) {
            case LineKind::Section:
                current = line.currentUser ? &EnsureKey(root_, line.path) : nullptr;
                break;
            case LineKind::DeleteSection:
                if (line.currentUser)
                    RemoveKey(root_, line.path);
                current = nullptr;
                break;
            case LineKind::Value:
                if (current)
                    SetIn(*current, line.name, line.value);
                break;
            case LineKind::DeleteValue:
                if (current)
                    current->values.erase(Fold(line.name));
                break;
            default:
                break;
        }
    }
}

const Key* Document::FindKey(const KeyPath& path) const {
    return FindIn(root_, path);
}

// --- Changing ------------------------------------------------------------------------------

std::string Document::Newline() const {
    for (const Line& line : lines_) {
        if (EndsWithNewline(line.raw)) {
            return line.raw.size() >= 2 && line.raw[line.raw.size() - 2] == '\r' ? "\r\n" : "\n";
        }
    }
    return "\n";
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
    return HexList(bytes, left + "hex(1):", Newline());
}

std::vector<std::string> Document::Raws() const {
    std::vector<std::string> raws;
    raws.reserve(lines_.size() + 4);
    for (const Line& line : lines_)
        raws.push_back(line.raw);
    if (!hasHeader_) {
        // A store without a header yet (empty): it starts with one.
        raws.insert(raws.begin(), std::string(kHeader5) + Newline());
    }
    return raws;
}

void Document::AppendSection(std::vector<std::string>& raws, const KeyPath& path,
                             const std::string& valueLine) const {
    const std::string newline = Newline();
    if (!raws.empty()) {
        if (!EndsWithNewline(raws.back()))
            raws.back() += newline;
        if (!Trim(Content(raws.back())).empty())
            raws.push_back(newline);
    }
    std::string section = "[" + std::string(kRootName);
    if (!path.empty())
        section += "\\" + JoinPath(path);
    raws.push_back(section + "]" + newline);
    if (!valueLine.empty())
        raws.push_back(valueLine + newline);
}

Status Document::Commit(const std::vector<std::vector<std::string>>& candidates,
                        const Key& expected) {
    for (const std::vector<std::string>& raws : candidates) {
        std::string text;
        for (const std::string& raw : raws)
            text += raw;
        Document changed = FromText(std::move(text), encoding_, byteOrderMark_);
        if (!changed.understood_ || !SameContent(changed.root_, expected) || !changed.Serialize()) {
            continue;
        }
        lines_ = std::move(changed.lines_);
        root_ = std::move(changed.root_);
        unicode_ = changed.unicode_;
        hasHeader_ = true;
        modified_ = true;
        return Code::Success;
    }
    return Code::InvalidData;
}

Status Document::SetValue(const KeyPath& keyPath, const std::string& name, const Value& value) {
    if (!understood_)
        return Code::BadDatabase;
    const Key* key = FindKey(keyPath);
    if (key == nullptr)
        return Code::KeyDeleted;
    auto existing = key->values.find(Fold(name));
    if (existing != key->values.end() && existing->second.value == value)
        return Code::Success;

    Key expected = root_;
    SetIn(*FindIn(expected, keyPath), name, value);

    // Where the value stands now: its last assignment that nothing removed afterwards;
    // otherwise the end of the key's last section that nothing removed afterwards.
    constexpr std::size_t kNone = static_cast<std::size_t>(-1);
    std::size_t assignment = kNone;
    std::size_t insertAt = kNone;
    bool inKey = false;
    for (std::size_t i = 0; i < lines_.size(); ++i) {
        const Line& line = lines_[i];
        switch (line.kind) {
            case LineKind::Section:
                inKey = line.currentUser && SamePath(line.path, keyPath);
                if (inKey)
                    insertAt = i + 1;
                break;
            case LineKind::DeleteSection:
                inKey = false;
                if (line.currentUser && IsWithin(keyPath, line.path) && !line.path.empty()) {
                    assignment = kNone;
                    insertAt = kNone;
                }
                break;
            case LineKind::Value:
                if (inKey) {
                    if (EqualsNoCase(line.name, name))
                        assignment = i;
                    insertAt = i + 1;
                }
                break;
            case LineKind::DeleteValue:
                if (inKey) {
                    if (EqualsNoCase(line.name, name))
                        assignment = kNone;
                    insertAt = i + 1;
                }
                break;
            case LineKind::Other:
                if (inKey)
                    insertAt = i + 1;
                break;
            default:
                break;
        }
    }

    std::vector<std::vector<std::string>> candidates;
    const std::size_t offset = hasHeader_ ? 0 : 1;
    if (assignment != kNone) {
        std::vector<std::string> raws = Raws();
        std::string& raw = raws[assignment + offset];
        raw = RenderValueLine(lines_[assignment].name, value) + LineEnd(raw);
        candidates.push_back(std::move(raws));
    } else if (insertAt != kNone) {
        std::vector<std::string> raws = Raws();
        const std::size_t at = insertAt + offset;
        if (!EndsWithNewline(raws[at - 1]))
            raws[at - 1] += Newline();
        raws.insert(raws.begin() + static_cast<std::ptrdiff_t>(at),
                    RenderValueLine(name, value) + Newline());
        candidates.push_back(std::move(raws));
    }
    std::vector<std::string> appended = Raws();
    AppendSection(appended, keyPath, RenderValueLine(name, value));
    candidates.push_back(std::move(appended));
    return Commit(candidates, expected);
}

Status Document::CreateKey(const KeyPath& keyPath) {
    if (!understood_)
        return Code::BadDatabase;
    if (FindKey(keyPath) != nullptr)
        return Code::Success;
    Key expected = root_;
    EnsureKey(expected, keyPath);
    std::vector<std::string> raws = Raws();
    AppendSection(raws, keyPath, std::string());
    return Commit({raws}, expected);
}

Status Document::DeleteKey(const KeyPath& keyPath) {
    if (!understood_)
        return Code::BadDatabase;
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
        if (line.kind != LineKind::Section || !line.currentUser || !IsWithin(line.path, keyPath)) {
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
    std::vector<std::string> removed;
    const std::vector<std::string> raws = Raws();
    const std::size_t offset = raws.size() - lines_.size();
    for (std::size_t i = 0; i < raws.size(); ++i) {
        if (i < offset || !drop[i - offset])
            removed.push_back(raws[i]);
    }
    // The parent may have existed only through the sections just taken out.
    std::vector<std::string> withParent = removed;
    AppendSection(withParent, KeyPath(keyPath.begin(), keyPath.end() - 1), std::string());
    // Always right, if less tidy: a removal line at the end.
    std::vector<std::string> removalLine = raws;
    const std::string newline = Newline();
    if (!EndsWithNewline(removalLine.back()))
        removalLine.back() += newline;
    if (!Trim(Content(removalLine.back())).empty())
        removalLine.push_back(newline);
    removalLine.push_back("[-" + std::string(kRootName) + "\\" + JoinPath(keyPath) + "]" + newline);
    return Commit({removed, withParent, removalLine}, expected);
}

std::optional<std::string> Document::Serialize() const {
    if (!understood_)
        return std::nullopt;
    std::string text;
    for (const std::string& raw : Raws())
        text += raw;
    if (encoding_ == Encoding::Utf8)
        return (byteOrderMark_ ? "\xEF\xBB\xBF" : "") + text;
    auto bytes = TextToUtf16Le(text);
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
