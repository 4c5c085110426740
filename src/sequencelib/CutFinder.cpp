#include "sequencelib/CutFinder.h"

#include <algorithm>
#include <string>

#include "sequencelib/TextPlaces.h"
#include "sequencelib/TextWindow.h"

namespace vtr::seqlib::detail {

CutFinder::CutFinder(TextWindow& window, MarkupLexer& lexer, const LineCounter& lines,
                     std::size_t pieceBytes, std::size_t descendBytes, int32_t maxDepth)
    : window_(window),
      lexer_(lexer),
      lines_(lines),
      pieceBytes_(static_cast<int64_t>(std::max<std::size_t>(pieceBytes, 1))),
      descendBytes_(static_cast<int64_t>(std::max<std::size_t>(descendBytes, 1))),
      maxDepth_(static_cast<std::size_t>(std::max(maxDepth, 1))) {}

void CutFinder::Start(int64_t at) {
    scan_ = boundary_ = at;
    ClearAhead();
}

CutFinder::Cut CutFinder::Piece(int64_t at) {
    return {CutKind::Piece, at, {}};
}

CutFinder::Cut CutFinder::TextEnds(int64_t pos) {
    const int64_t end = window_.End();
    if (NoneAhead() && end == pos)
        return {CutKind::EndOfData, end, {}};
    // What is left goes to the parser, which refuses an element left open or a markup item
    // cut short; the reader then finds the end of the data.
    ClearAhead();
    scan_ = boundary_ = end;
    return Piece(end);
}

CutFinder::Cut CutFinder::Next(int64_t pos, std::size_t openDepth) {
    const int64_t limit = pos + pieceBytes_;
    for (;;) {
        int64_t stop = limit;
        if (NoneAhead()) {
            if (scan_ >= limit) {
                if (boundary_ > pos)
                    return Piece(boundary_);
                boundary_ = limit;  // a text longer than a piece
                return Piece(limit);
            }
        } else {
            const Ahead& first = ahead_[first_];
            stop = std::min(limit, first.start + descendBytes_);
            if (scan_ >= stop) {
                // The element does not end soon enough (or the piece is full): what comes
                // before it goes first, then it is entered.
                if (boundary_ > pos)
                    return Piece(boundary_);
                const Cut enter{CutKind::Descend, first.start, {Markup::StartTag, first.tagEnd}};
                boundary_ = first.boundary;
                if (++first_ == ahead_.size()) {
                    ClearAhead();
                } else if (first_ >= 1024 && first_ * 2 >= ahead_.size()) {
                    ahead_.erase(ahead_.begin(),
                                 ahead_.begin() + static_cast<std::ptrdiff_t>(first_));
                    first_ = 0;
                }
                return enter;
            }
        }

        const int64_t lt = window_.Find(scan_, '<', stop);
        if (lt == TextWindow::npos) {
            if (window_.Exhausted() && window_.End() < stop)
                return TextEnds(pos);
            scan_ = stop;
            continue;
        }
        scan_ = lt;
        Boundary() = lt;
        const Lexed item = lexer_.Lex(lt);
        switch (item.kind) {
            case Markup::Truncated:
                return TextEnds(pos);
            case Markup::EndTag:
                if (NoneAhead()) {
                    scan_ = boundary_ = item.end;
                    return {CutKind::EndTag, lt, item};
                }
                ahead_.pop_back();
                if (NoneAhead())
                    ClearAhead();
                break;
            case Markup::StartTag:
            case Markup::EmptyTag:
                if (openDepth + (ahead_.size() - first_) + 1 > maxDepth_) {
                    lines_.FailAt(lt, "the elements are nested more than " +
                                          std::to_string(maxDepth_) + " levels deep");
                }
                if (item.kind == Markup::StartTag) {
                    ahead_.push_back({lt, item.end, item.end});
                    scan_ = item.end;
                    continue;
                }
                break;
            default:
                break;
        }
        scan_ = item.end;
        Boundary() = item.end;
    }
}

}  // namespace vtr::seqlib::detail
