#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <set>
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
// byte-order mark, header and line ends. Changes are checked by reading the changed text
// back: it must give exactly the store as it was with those changes, or they are refused.
// Many changes can be made as one batch, which is checked once: a batch of n changes costs
// the size of the store plus n, not n times the size of the store.
//
// The document keeps the file's text once, and its lines as places in that text.
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

// The document's own note of a line of its file (lines are counted from 0); kNoLine when
// there is none.
inline constexpr std::size_t kNoLine = static_cast<std::size_t>(-1);

// Orders names without regard to letter case, as their folded forms order. The maps below
// keep folded names and find a name in any spelling without making a folded copy of it.
struct FoldedLess {
    using is_transparent = void;
    bool operator()(std::string_view a, std::string_view b) const;
};

struct NamedValue {
    std::string name;  // as written
    Value value;
    std::size_t line = kNoLine;  // the line that gives the value
};

// A key of the store, with the values and subkeys that the file gives it.
struct Key {
    std::string name;                                // as first written
    std::map<std::string, Key, FoldedLess> subkeys;  // by folded name: the order of enumeration
    std::map<std::string, NamedValue, FoldedLess> values;  // by folded name
    // The last line of the key's last section that nothing removed afterwards: a new value
    // of the key is written after it. kNoLine when the key has no such section (it exists
    // through a subkey's section only).
    std::size_t sectionEnd = kNoLine;
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
    static Document Parse(std::string&& bytes);  // takes the bytes over
    static Document Parse(const char* bytes) { return Parse(std::string_view(bytes)); }
    // A store whose file could not be read: nothing in it, and it refuses every change.
    static Document Unreadable();

    // True when the text is a registry export (or empty). Only such a document is changed.
    bool Understood() const { return understood_; }
    // The current user's root.
    const Key& Root() const { return root_; }
    const Key* FindKey(const KeyPath& path) const;

    // Changes; each returns Success or the store's status code, and queries see it at once.
    // Outside a batch a change is checked as it is made: one that cannot be written so that
    // it reads back exactly is refused and changes nothing. A change that leaves the store as
    // it was changes nothing (Modified stays as it was).
    Status SetValue(const KeyPath& key, const std::string& name, const Value& value);
    Status CreateKey(const KeyPath& key);
    // Removes a key that has no subkeys. Inside a batch it first checks the changes made so
    // far (EndBatch), which then stand whatever becomes of the rest of the batch.
    Status DeleteKey(const KeyPath& key);
    bool Modified() const { return modified_; }
    // The document is now what its file holds: Modified becomes false.
    void Saved() { modified_ = false; }

    // A batch: the changes from BeginBatch to EndBatch are checked once, at EndBatch, which
    // keeps them all or, when their text does not read back exactly, undoes them all and
    // returns the failure. Serialize gives the text without the changes of an open batch.
    void BeginBatch();
    Status EndBatch();

    // The file's bytes, in its own encoding; nothing when the text cannot be encoded in it.
    std::optional<std::string> Serialize() const;

  private:
    enum class LineKind : uint8_t {
        Blank,
        Comment,
        Header,
        Section,
        DeleteSection,
        Value,
        DeleteValue,
        Other
    };

    // One logical line (a physical line, or several joined by continuation): where it starts
    // in the text (it ends where the next one starts) and what it is.
    struct Line {
        std::size_t begin = 0;
        LineKind kind = LineKind::Other;
        bool currentUser = false;  // a section (or removal) of the current user's root
    };

    // A logical line as read: the line and what it says.
    struct Reading {
        Line line;
        KeyPath path;               // Section and DeleteSection
        std::string name;           // Value and DeleteValue
        RegistryFile::Value value;  // Value
        bool SaysTheSameAs(const Reading& other) const;
    };

    // A line written by a change that is not checked yet, with what it must read as.
    struct NewLine {
        std::string raw;
        Reading meant;
    };
    // A section added at the end of the file by the open batch.
    struct NewSection {
        std::vector<std::size_t> lines;  // its NewLines: the section line, then values
    };

    // How a line of the changed text must read back (see SettleInPlace).
    enum class Expect : uint8_t { Same, SameButLineEnd, Meant, Blank, Header };

    static Document FromText(std::string text, Encoding encoding, bool byteOrderMark);
    // Reads the logical line that starts at pos (after the header) and moves pos past it.
    static Reading ReadLine(std::string_view text, std::size_t& pos, bool unicode);
    void Read();
    void Note(Reading&& reading, std::size_t index, Key*& current);
    template <typename Visit>
    void PlanChangedText(Visit&& visit) const;
    Reading Reread(std::size_t line) const;
    std::string_view Raw(std::size_t line) const;
    std::string RenderValueLine(const std::string& name, const Value& value) const;
    std::string HeaderLine() const;
    std::string ValueNameAt(std::size_t line) const;

    Status Apply(const std::vector<std::string>& candidates, const Key& expected);
    bool SettleInPlace();
    bool SettleAtTheEnd();
    void Undo();
    void Forget();
    std::size_t AddNewLine(std::string raw, Reading meant);
    std::size_t NewSectionFor(const KeyPath& path);

    std::string text_;
    std::vector<Line> lines_;
    Key root_;
    std::string newline_ = "\n";  // the file's line end, for the lines a change adds
    Encoding encoding_ = Encoding::Utf8;
    bool byteOrderMark_ = false;
    bool unicode_ = true;  // "Version 5.00": hex(1) strings are UTF-16LE; REGEDIT4: bytes
    bool understood_ = true;
    bool hasHeader_ = false;
    bool modified_ = false;

    // The open batch (nothing is open when batch_ is false and these are empty).
    bool batch_ = false;
    bool modifiedBeforeBatch_ = false;
    std::vector<NewLine> newLines_;
    std::map<std::size_t, std::size_t> replaced_;               // line -> its new line
    std::map<std::size_t, std::vector<std::size_t>> inserted_;  // line -> new lines after it
    std::vector<NewSection> newSections_;
    std::vector<KeyPath> changedKeys_;       // in the order of their first change in the batch
    std::set<std::string> changedKeyNames_;  // the same, folded and joined
};

}  // namespace vtr::RegistryFile
