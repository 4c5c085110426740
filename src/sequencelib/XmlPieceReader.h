#pragma once

#include <pugixml.hpp>

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "sequencelib/ByteSource.h"

namespace vtr::seqlib::detail {

// A place in the text, both counted from 1 (the column in bytes).
struct TextPlace {
    int64_t line = 1;
    int64_t column = 1;
};

// "line 3, column 5"
std::string PlaceText(const TextPlace& place);

// Told the document in pieces, front to back.
class XmlPieceHandler {
  public:
    virtual ~XmlPieceHandler() = default;
    // The document element, or an element too large for one piece: its start tag (the
    // node has its attributes and no children). Its content follows, then LeaveElement.
    virtual void EnterElement(const pugi::xml_node& startTag) = 0;
    // A whole element, child of the innermost element entered.
    virtual void CompleteElement(const pugi::xml_node& element) = 0;
    virtual void LeaveElement() = 0;
};

// Reads an XML document of any size while holding the parse tree of one piece of about
// pieceBytes at a time. The document is cut between sibling nodes; each piece is parsed
// by pugixml on its own, and the tags around the pieces (the document element and any
// element that does not close within a thirty-second of a piece, which is entered rather than
// taken whole) are checked as they pass, so a document that is not well-formed is refused
// with the place of the fault. Beyond what pugixml checks, the document must have one root
// element with nothing but comments and processing instructions around it, an XML
// declaration only at its start, a DOCTYPE only before the root and no NUL byte.
//
// A cut is first guessed: after the last end tag of the kind of child last seen, or
// else after the last end tag or empty-element tag before the current element's own end
// tag. The guess holds exactly when the piece parses as complete nodes, since a parse that
// starts between nodes reads the same bytes the same way whatever comes after them. When
// the guess fails, the markup is scanned tag by tag (quoted attribute values, comments,
// CDATA sections, processing instructions) to find a true cut.
class XmlPieceReader {
  public:
    XmlPieceReader(ByteSource& source, std::size_t pieceBytes);
    ~XmlPieceReader();
    XmlPieceReader(const XmlPieceReader&) = delete;
    XmlPieceReader& operator=(const XmlPieceReader&) = delete;

    // Reads the document to its end. afterStep is called after each piece.
    void Run(XmlPieceHandler& handler, const std::function<void()>& afterStep);

    // Where a node or attribute handed to the handler stands (valid while the handler
    // runs).
    TextPlace PlaceOf(const pugi::xml_node& node) const;
    TextPlace PlaceOf(const pugi::xml_attribute& attribute) const;

    // The longest single tag, comment or other markup item accepted.
    static constexpr std::size_t kMaxMarkupBytes = std::size_t{64} << 20;

  private:
    enum class Markup { StartTag, EmptyTag, EndTag, Comment, CData, Pi, Doctype, Other, Truncated };
    struct Lexed {
        Markup kind = Markup::Truncated;
        std::size_t end = 0;  // index one past the markup
    };
    enum class CutKind { Piece, EndTag, Descend, EndOfData };
    struct Cut {
        CutKind kind = CutKind::Piece;
        std::size_t at = 0;  // end of the piece before it
        std::size_t tagStart = 0;
        Lexed tag;
    };
    struct OpenElement {
        std::string name;
        TextPlace place;
        std::string childName;  // the last child element seen that had content
        int guessPause = 0;     // steps to go without guessing, after a wrong guess
    };

    void ReadHead(XmlPieceHandler& handler);
    void Step(XmlPieceHandler& handler);
    void ReadEpilog();

    bool TryGuessedPiece(XmlPieceHandler& handler, bool& largeChildNext);
    std::size_t GuessCut(std::size_t from, std::size_t limit, bool& largeChildNext) const;
    Cut ScanContent(bool largeChildNext);
    bool ParsePiece(std::size_t from, std::size_t to, bool guessed);
    void HandlePiece(XmlPieceHandler& handler);
    pugi::xml_node ParseStartTag(std::size_t from, std::size_t tagStart, const Lexed& tag);
    void CheckEndTag(std::size_t tagStart, const Lexed& tag);

    Lexed LexMarkup(std::size_t at);
    Lexed LexItem(std::size_t at);
    Lexed LexStartTag(std::size_t at);
    Lexed LexDoctype(std::size_t at);
    std::string NameAt(std::size_t at) const;

    // Buffer management; indices are into buffer_.
    bool Have(std::size_t index);
    bool ReadMore();
    void FillTo(std::size_t index);
    void Compact();
    std::size_t FindChar(std::size_t from, char c, std::size_t stop);
    std::size_t FindText(std::size_t from, const char* text, std::size_t length);
    bool StartsWith(std::size_t at, const char* text, std::size_t length);
    bool IsSpace(char c) const { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

    TextPlace PlaceAt(int64_t offset) const;
    TextPlace PlaceInScratch(const char* p) const;
    [[noreturn]] void Fail(const TextPlace& place, std::string cause) const;
    [[noreturn]] void FailAt(std::size_t index, std::string cause) const;

    ByteSource& source_;
    std::size_t pieceBytes_;

    std::unique_ptr<char[]> buffer_;
    std::size_t capacity_ = 0;
    std::size_t pos_ = 0;   // first byte not yet handed over
    std::size_t size_ = 0;  // bytes held
    int64_t base_ = 0;      // text offset of buffer_[0]
    bool eof_ = false;
    std::size_t markupStart_ = static_cast<std::size_t>(-1);  // the item being read

    // Lines: exact at base_, and a cursor that moves forward through the buffer.
    int64_t baseLine_ = 1;
    int64_t baseLineStart_ = 0;
    mutable int64_t cursorOffset_ = 0;
    mutable int64_t cursorLine_ = 1;
    mutable int64_t cursorLineStart_ = 0;

    std::vector<char> scratch_;
    int64_t scratchOffset_ = 0;
    std::size_t scratchTextSize_ = 0;  // bytes of scratch_ that come from the text
    pugi::xml_document doc_;

    std::vector<OpenElement> open_;
};

}  // namespace vtr::seqlib::detail
