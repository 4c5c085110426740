#pragma once

#include <pugixml.hpp>

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>

#include "sequencelib/ByteSource.h"
#include "sequencelib/CutFinder.h"
#include "sequencelib/MarkupLexer.h"
#include "sequencelib/OpenElements.h"
#include "sequencelib/PieceParser.h"
#include "sequencelib/PlainMarkup.h"
#include "sequencelib/TextPlaces.h"
#include "sequencelib/TextWindow.h"
#include "sequencelib/XmlElements.h"

namespace vtr::seqlib::detail {

// Told the document in pieces, front to back.
class XmlPieceHandler {
  public:
    virtual ~XmlPieceHandler() = default;
    // The document element, or an element too large for one piece: its start tag alone
    // (tag[0], with its attributes). Its content follows, then LeaveElement.
    virtual void EnterElement(const XmlElements& tag) = 0;
    // Whole elements, children of the innermost element entered: elements[0], then the one
    // at elements[0].end, and so on, each followed by its descendants.
    virtual void CompleteElements(const XmlElements& elements) = 0;
    virtual void LeaveElement() = 0;
};

// Reads an XML document of any size while holding the parse tree of one piece of about
// pieceBytes at a time, in time proportional to its size however its elements nest. Its
// parts:
//
//   TextWindow    the bytes being read, and nothing more
//   LineCounter   line and column of any of them, for messages
//   MarkupLexer   where each tag, comment or other markup item ends
//   CutFinder     where the content of the innermost open element is cut: between whole
//                 nodes, or at a start tag that is entered, or at its end tag
//   PlainMarkup   one piece written plainly, as sequence files are, read in one pass
//   PieceParser   pugixml over any other piece, and over each start tag entered
//   OpenElements  the elements entered, each end tag checked against its start tag
//
// The reader itself checks what stands around the document element: nothing but blanks,
// comments, processing instructions and one DOCTYPE before it (an XML declaration only at
// the very start), only comments and processing instructions after it; inside it, a
// declaration or DOCTYPE is refused. A document that is not well-formed is refused with
// the place of the fault, whatever the size of the pieces.
class XmlPieceReader {
  public:
    struct Options {
        std::size_t pieceBytes = std::size_t{1} << 20;
        // The deepest nesting accepted (the document element is at 1).
        int32_t maxDepth = 100000;
        // Called after each read from the source and each piece (the load's clock).
        std::function<void()> tick;
        // Pieces of plain markup are read without pugixml (off: pugixml reads them all,
        // to compare).
        bool plainMarkup = true;
    };

    XmlPieceReader(ByteSource& source, Options options);
    XmlPieceReader(const XmlPieceReader&) = delete;
    XmlPieceReader& operator=(const XmlPieceReader&) = delete;

    // Reads the document to its end. afterStep is called after each piece.
    void Run(XmlPieceHandler& handler, const std::function<void()>& afterStep);

    // Where the text offset of an element or attribute handed to the handler stands (valid
    // while the handler runs).
    TextPlace PlaceAt(int64_t offset) const { return lines_.PlaceAt(offset); }
    // Refuses the document with the place of that text offset.
    [[noreturn]] void FailAt(int64_t offset, std::string cause) const {
        lines_.FailAt(offset, std::move(cause));
    }

    // The most text the reader has held at once, in bytes.
    std::size_t BufferBytes() const { return window_.Capacity(); }

    // The longest single tag, comment or other markup item accepted.
    static constexpr std::size_t kMaxMarkupBytes = MarkupLexer::kMaxMarkupBytes;

  private:
    void ReadProlog(XmlPieceHandler& handler);
    void EnterRoot(XmlPieceHandler& handler, int64_t at, const Lexed& tag);
    void Step(XmlPieceHandler& handler);
    void ReadEpilog();
    // Hands the elements read over, if there are any.
    void HandElements(XmlPieceHandler& handler);
    // Enters the element read alone into elements_, whose start tag is [at, tagEnd).
    void Enter(XmlPieceHandler& handler, int64_t at, int64_t tagEnd);
    // Leaves the innermost open element at its end tag [at, tagEnd), checked against it.
    void Leave(XmlPieceHandler& handler, int64_t at, int64_t tagEnd);
    // One step the plain way, when the content from pos_ on is plain markup; false to take
    // it the general way.
    bool PlainStep(XmlPieceHandler& handler);
    void HandNodes(XmlPieceHandler& handler, int64_t from, int64_t to);
    void CheckPrologItem(int64_t at, const Lexed& item);
    // Forgets the text before pos_.
    void Release();
    // Moves pos_ past blanks, forgetting them; false when the text ends first.
    bool SkipBlanks();

    Options options_;
    TextWindow window_;
    LineCounter lines_;
    MarkupLexer lexer_;
    PlainMarkup plain_;
    PieceParser parser_;
    XmlElements elements_;
    OpenElements open_;
    CutFinder cuts_;
    int64_t pos_ = 0;        // the first byte not yet handed over
    int64_t plainFrom_ = 0;  // where the plain way may be tried again
    int64_t readTwice_ = 0;  // bytes the plain way has read again after entering an element
};

}  // namespace vtr::seqlib::detail
