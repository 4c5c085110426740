#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "sequencelib/MarkupLexer.h"

namespace vtr::seqlib::detail {

class LineCounter;
class TextWindow;

// Decides where the content of the innermost open element is cut into pieces of whole
// nodes. It reads the markup once, front to back, and remembers what it has seen ahead of
// the reader, so every byte is looked at once however the elements nest:
//
// - a piece ends at the last node boundary once it holds pieceBytes (a text longer than
//   that is cut inside);
// - an element that does not end within descendBytes of its start tag is entered rather
//   than taken whole: the pieces before it end, and its start tag is handed over alone;
// - the end tag of the innermost open element ends its content.
//
// Nesting is counted as the tags pass: an element deeper than maxDepth (the root at 1) is
// refused at its start tag.
class CutFinder {
  public:
    enum class CutKind {
        Piece,      // the nodes from the reader's position to `at`
        EndTag,     // the innermost open element ends with `tag` at `at`
        Descend,    // enter the element whose start tag `tag` is at `at`
        EndOfData,  // the text ends before the innermost open element does
    };
    struct Cut {
        CutKind kind = CutKind::Piece;
        int64_t at = 0;
        Lexed tag;
    };

    CutFinder(TextWindow& window, MarkupLexer& lexer, const LineCounter& lines,
              std::size_t pieceBytes, std::size_t descendBytes, int32_t maxDepth);

    // Reading starts at `at`, a node boundary in the content of the innermost open element,
    // with nothing known of what follows: the content of the root element starts there, or
    // the reader has gone on without the finder. What the finder remembers only spares it
    // reading again, so its cuts from `at` on are the same either way.
    void Start(int64_t at);

    // The next cut after `pos`, a node boundary in the content of the innermost of the
    // `openDepth` elements entered. The finder assumes the reader follows it: a piece
    // handed over, the element ended or entered.
    Cut Next(int64_t pos, std::size_t openDepth);

  private:
    // An element started ahead of the reader and not yet ended: where its start tag is,
    // and the last node boundary seen inside it.
    struct Ahead {
        int64_t start;
        int64_t tagEnd;
        int64_t boundary;
    };

    bool NoneAhead() const { return first_ == ahead_.size(); }
    // The last boundary at the level being read.
    int64_t& Boundary() { return NoneAhead() ? boundary_ : ahead_.back().boundary; }
    void ClearAhead() {
        ahead_.clear();
        first_ = 0;
    }
    Cut Piece(int64_t at);
    Cut TextEnds(int64_t pos);

    TextWindow& window_;
    MarkupLexer& lexer_;
    const LineCounter& lines_;
    int64_t pieceBytes_;
    int64_t descendBytes_;
    std::size_t maxDepth_;

    int64_t scan_ = 0;      // where reading goes on
    int64_t boundary_ = 0;  // the last node boundary in the innermost open element
    // The elements started ahead, outermost first, from ahead_[first_] on (entering the
    // outermost one moves first_ on).
    std::vector<Ahead> ahead_;
    std::size_t first_ = 0;
};

}  // namespace vtr::seqlib::detail
