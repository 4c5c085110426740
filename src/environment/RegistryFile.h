#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "environment/RegistryStore.h"

// The registry-export text format, as a document that can be read, changed and written back
// without disturbing what is not changed.
//
//   Windows Registry Editor Version 5.00        (or REGEDIT4)
//
//   [HKEY_CURRENT_USER\Software\Vantori\Shared] (the short root HKCU is read too)
//   "AppPath"="C:\\Program Files\\Vantori\\"    (\\ is a backslash, \" a quote)
//   "PostInstall"=dword:00000001
//   @="default value"
//   "Other"=hex(2):43,00,3a,00,00,00            (other types: kept, not read)
//   ; a comment
//   [-HKEY_CURRENT_USER\Software\Old]           (removes a key and its subkeys)
//   "Gone"=-                                    (removes a value)
//
// The text is UTF-16LE with a byte-order mark (what a Windows export gives) or UTF-8 with or
// without one; lines may be continued with a trailing "\". Key and value names compare
// without regard to letter case. Removals apply in file order. Only the current user's root
// is read; sections of other roots are kept as they stand.
//
// A change rewrites as little as possible: the changed value's line, one line added at the
// end of the key's section, or one section added at the end of the file (written with the
// full root name). Every other line keeps its exact text, and the file keeps its encoding,
// byte-order mark, header and line ends. Each change is checked by reading the changed text
// back: it must give exactly the store as it was with that one change, or the change is
// refused.
namespace vtr::RegistryFile {

using RegistryStore::Status;
using KeyPath = std::vector<std::string>;

// A value as the store holds it.
struct Value {
    uint32_t type = 0;
    // Strings and DWORDs: the bytes a query returns (a string ends in its NUL; a DWORD is
    // four bytes, least significant first). Other types: their text as written.
    std::string data;
    // A type that is kept but not read (hex:..., hex(N):... other than strings).
    bool opaque = false;

    static Value String(const std::string& text);
    static Value Dword(uint32_t number);
    bool operator==(const Value&) const = default;
};

struct NamedValue {
    std::string name;  // as written
    Value value;
};

// A key of the store, with the values and subkeys that the file gives it.
struct Key {
    std::string name;                          // as first written
    std::map<std::string, Key> subkeys;        // by folded name: the order of enumeration
    std::map<std::string, NamedValue> values;  // by folded name
};

// Names compare without regard to letter case; this is the form they are compared in.
std::string Fold(std::string_view name);

// A value as the file writes it: a string quoted with "\" and """ escaped, and a dword as
// "dword:" and eight hex digits.
std::string QuotedText(std::string_view text);
std::string DwordText(uint32_t value);

// Splits "A\B\C" into its names (empty names are dropped).
KeyPath SplitKeyPath(std::string_view path);

// True when both keys hold the same subkeys and values (the spelling of names aside).
bool SameContent(const Key& a, const Key& b);

class Document {
  public:
    enum class Encoding { Utf8, Utf16Le };

    // Reads the file's bytes. Never fails: what cannot be read is left out. A text that is
    // not a registry export at all (no known header, undecodable) is not Understood; an
    // empty text is an empty store.
    static Document Parse(std::string_view bytes);
    // A store whose file could not be read: nothing in it, and it refuses every change.
    static Document Unreadable();

    // True when the text is a registry export (or empty). Only such a document is changed.
    bool Understood() const { return understood_; }
    // The current user's root.
    const Key& Root() const { return root_; }
    const Key* FindKey(const KeyPath& path) const;

    // Changes; each returns Success or the store's status code. A change that leaves the
    // store as it was changes nothing (Modified stays as it was).
    Status SetValue(const KeyPath& key, const std::string& name, const Value& value);
    Status CreateKey(const KeyPath& key);
    // Removes a key that has no subkeys.
    Status DeleteKey(const KeyPath& key);
    bool Modified() const { return modified_; }

    // The file's bytes, in its own encoding; nothing when the text cannot be encoded in it.
    std::optional<std::string> Serialize() const;

  private:
    enum class LineKind {
        Blank,
        Comment,
        Header,
        Section,
        DeleteSection,
        Value,
        DeleteValue,
        Other
    };

    // One logical line: a physical line, or several joined by continuation.
    struct Line {
        LineKind kind = LineKind::Other;
        std::string raw;  // the text exactly as in the file, line ends included
        // Section and DeleteSection:
        bool currentUser = false;
        KeyPath path;
        // Value and DeleteValue:
        std::string name;
        RegistryFile::Value value;
    };

    static Document FromText(std::string text, Encoding encoding, bool byteOrderMark);
    void Classify(const std::string& text);
    void Build();
    bool Unicode() const { return unicode_; }
    std::string Newline() const;
    std::string RenderValueLine(const std::string& name, const Value& value) const;
    std::vector<std::string> Raws() const;
    void AppendSection(std::vector<std::string>& raws, const KeyPath& path,
                       const std::string& valueLine) const;
    Status Commit(const std::vector<std::vector<std::string>>& candidates, const Key& expected);

    std::vector<Line> lines_;
    Key root_;
    Encoding encoding_ = Encoding::Utf8;
    bool byteOrderMark_ = false;
    bool unicode_ = true;  // "Version 5.00": hex(1) strings are UTF-16LE; REGEDIT4: bytes
    bool understood_ = true;
    bool hasHeader_ = false;
    bool modified_ = false;
};

}  // namespace vtr::RegistryFile
