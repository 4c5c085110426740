#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace vtr::seqlib::detail {

class LineCounter;
class TextWindow;

// The kinds of markup item, told apart by their first bytes.
enum class Markup { StartTag, EmptyTag, EndTag, Comment, CData, Pi, Doctype, Other, Truncated };

struct Lexed {
    Markup kind = Markup::Truncated;
    int64_t end = 0;  // offset one past the item
};

// Finds where each markup item ends: a start, empty-element or end tag (quoted attribute
// values may hold any byte but their own quote), a comment, a CDATA section, a processing
// instruction, a DOCTYPE (with its internal subset, quotes and comments) or any other "<!"
// item up to its '>'. It reads only as far as the item goes and never looks inside further
// than that: whether the item is well-formed is pugixml's to judge.
class MarkupLexer {
  public:
    // The longest single tag, comment or other markup item accepted.
    static constexpr std::size_t kMaxMarkupBytes = std::size_t{64} << 20;

    MarkupLexer(TextWindow& window, const LineCounter& lines) : window_(window), lines_(lines) {}

    // The item whose '<' is at `at`: its kind and end, Truncated when the text ends inside
    // it. An item longer than kMaxMarkupBytes is refused as it is read.
    Lexed Lex(int64_t at);

    // The element name that starts at `at`, up to a blank, '/' or '>' (held bytes only).
    std::string_view NameAt(int64_t at) const;

    // True for the XML declaration "<?xml" followed by a blank or "?" at `at`.
    bool IsDeclaration(int64_t at);

    static bool IsSpace(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

  private:
    Lexed LexItem(int64_t at);
    Lexed LexStartTag(int64_t at);
    Lexed LexDoctype(int64_t at);
    // The end of the next `c` or `text` (one past it) within the item, or Truncated.
    Lexed Until(Markup kind, int64_t from, char c);
    Lexed Until(Markup kind, int64_t from, std::string_view text);
    [[noreturn]] void TooLong() const;

    TextWindow& window_;
    const LineCounter& lines_;
    int64_t start_ = 0;  // the item being read
    int64_t stop_ = 0;   // where it becomes too long
};

}  // namespace vtr::seqlib::detail
