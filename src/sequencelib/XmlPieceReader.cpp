#include "sequencelib/XmlPieceReader.h"

#include <algorithm>
#include <cstring>
#include <string>

#include "sequencelib/LoadFailure.h"

namespace vtr::seqlib::detail {

namespace {

constexpr std::size_t kMinPieceBytes = 16;

std::size_t PieceBytes(const XmlPieceReader::Options& options) {
    return std::max(options.pieceBytes, kMinPieceBytes);
}

// Blocks read from the source: a piece's worth, within reason, and no more than the file
// holds (the window holds a few blocks, which a small file need not pay for).
std::size_t ReadBytes(const XmlPieceReader::Options& options, const ByteSource& source) {
    constexpr std::size_t kLeast = 4096;
    const std::size_t bytes =
        std::clamp<std::size_t>(PieceBytes(options), kLeast, std::size_t{1} << 20);
    const std::uint64_t file = source.FileBytesTotal();
    return file > 0 && file < bytes ? std::max<std::size_t>(file + 1, kLeast) : bytes;
}

// An element that does not end within a thirty-second of a piece is entered rather than
// taken whole.
std::size_t DescendBytes(const XmlPieceReader::Options& options) {
    return std::max<std::size_t>(PieceBytes(options) / 32, 1);
}

// What the plain way reads beyond a piece: the last node of a piece may end past it.
constexpr int64_t kPlainMarginBytes = int64_t{64} << 10;

}  // namespace

XmlPieceReader::XmlPieceReader(ByteSource& source, Options options)
    : options_(std::move(options)),
      window_(source, ReadBytes(options_, source), options_.tick),
      lines_(window_),
      lexer_(window_, lines_),
      parser_(window_, lines_),
      open_(lines_),
      cuts_(window_, lexer_, lines_, PieceBytes(options_), DescendBytes(options_),
            options_.maxDepth) {
    // Room for the elements of a block of dense markup (an element in every 48 bytes, an
    // attribute in every 16) from the start, rather than growing to it copy by copy.
    const std::size_t bytes = window_.ReadBytes();
    elements_.Reserve(bytes / 48, bytes / 16);
}

void XmlPieceReader::Run(XmlPieceHandler& handler, const std::function<void()>& afterStep) {
    ReadProlog(handler);
    if (afterStep)
        afterStep();
    while (!open_.Empty()) {
        Step(handler);
        if (options_.tick)
            options_.tick();
        if (afterStep)
            afterStep();
    }
    ReadEpilog();
}

void XmlPieceReader::Release() {
    lines_.Rebase(pos_);
    window_.Drop(pos_);
}

bool XmlPieceReader::SkipBlanks() {
    for (;;) {
        const char* const start = window_.At(pos_);
        const char* const end = window_.At(window_.End());
        const char* p = start;
        while (p < end && MarkupLexer::IsSpace(*p))
            ++p;
        pos_ += p - start;
        if (p < end)
            return true;
        Release();
        if (!window_.ReadMore())
            return false;
    }
}

// --- Around the document element ---------------------------------------------------------

void XmlPieceReader::CheckPrologItem(int64_t at, const Lexed& item) {
    // pugixml judges declarations, processing instructions and DOCTYPEs; a comment is
    // whatever lies between its delimiters.
    if (item.kind == Markup::Comment) {
        const std::string_view text = window_.View(at, item.end);
        if (const void* nul = std::memchr(text.data(), 0, text.size())) {
            lines_.FailAt(at + (static_cast<const char*>(nul) - text.data()),
                          "a NUL character in the text");
        }
        return;
    }
    parser_.ParseNodes(at, item.end, elements_);
}

void XmlPieceReader::ReadProlog(XmlPieceHandler& handler) {
    window_.FillTo(2);
    if (window_.Have(1)) {
        const auto b0 = static_cast<unsigned char>(window_[0]);
        const auto b1 = static_cast<unsigned char>(window_[1]);
        if ((b0 == 0xFF && b1 == 0xFE) || (b0 == 0xFE && b1 == 0xFF))
            lines_.FailAt(0, "the text is UTF-16; a sequence file is UTF-8");
    }
    const int64_t textStart = window_.StartsWith(0, "\xEF\xBB\xBF") ? 3 : 0;
    pos_ = textStart;
    for (;;) {
        // What stands before the document element is checked and forgotten as it passes.
        if (!SkipBlanks())
            lines_.FailAt(pos_, "the document has no root element");
        if (window_[pos_] != '<')
            lines_.FailAt(pos_, "text before the root element");
        const Lexed item = lexer_.Lex(pos_);
        switch (item.kind) {
            case Markup::Truncated:
                lines_.FailAt(pos_, "the data ends inside this markup");
            case Markup::Pi:
                if (pos_ != textStart && lexer_.IsDeclaration(pos_))
                    lines_.FailAt(pos_, "the XML declaration is not at the start of the document");
                CheckPrologItem(pos_, item);
                break;
            case Markup::Comment:
            case Markup::Doctype:
                CheckPrologItem(pos_, item);
                break;
            case Markup::EndTag:
                lines_.FailAt(pos_, "an end tag before the root element");
            case Markup::CData:
            case Markup::Other:
                lines_.FailAt(pos_, "unexpected markup before the root element");
            case Markup::StartTag:
            case Markup::EmptyTag:
                EnterRoot(handler, pos_, item);
                return;
        }
        pos_ = item.end;
        Release();
    }
}

void XmlPieceReader::EnterRoot(XmlPieceHandler& handler, int64_t at, const Lexed& tag) {
    const std::string_view name = lexer_.NameAt(at + 1);
    const bool empty = tag.kind == Markup::EmptyTag;
    parser_.ParseStartTag(at, tag.end, empty, name, elements_);
    Enter(handler, at, tag.end);
    if (empty) {
        handler.LeaveElement();
        open_.Pop();
        return;
    }
    cuts_.Start(pos_);
}

void XmlPieceReader::ReadEpilog() {
    for (;;) {
        Release();
        if (!SkipBlanks())
            return;
        if (window_[pos_] != '<')
            lines_.FailAt(pos_, "text after the root element");
        const Lexed item = lexer_.Lex(pos_);
        if (item.kind == Markup::Comment ||
            (item.kind == Markup::Pi && !lexer_.IsDeclaration(pos_))) {
            pos_ = item.end;
            continue;
        }
        if (item.kind == Markup::Truncated)
            lines_.FailAt(pos_, "the data ends inside this markup");
        lines_.FailAt(pos_, "content after the end of the root element");
    }
}

// --- Inside the document element ---------------------------------------------------------

void XmlPieceReader::HandElements(XmlPieceHandler& handler) {
    if (!elements_.Empty())
        handler.CompleteElements(elements_);
}

void XmlPieceReader::Enter(XmlPieceHandler& handler, int64_t at, int64_t tagEnd) {
    open_.Push(elements_[0].name, at);
    handler.EnterElement(elements_);
    pos_ = tagEnd;
}

void XmlPieceReader::Leave(XmlPieceHandler& handler, int64_t at, int64_t tagEnd) {
    open_.CheckEndTag(window_.View(at, tagEnd), at);
    handler.LeaveElement();
    open_.Pop();
    pos_ = tagEnd;
}

void XmlPieceReader::HandNodes(XmlPieceHandler& handler, int64_t from, int64_t to) {
    // Text alone (blanks between elements, mostly) has nothing to parse: only its bytes are
    // checked.
    const std::string_view text = window_.View(from, to);
    if (std::memchr(text.data(), '<', text.size()) == nullptr) {
        if (const void* nul = std::memchr(text.data(), 0, text.size())) {
            lines_.FailAt(from + (static_cast<const char*>(nul) - text.data()),
                          "a NUL character in the text");
        }
        return;
    }
    if (options_.plainMarkup && plain_.Scan(text, from, elements_)) {
        HandElements(handler);
        return;
    }
    const pugi::xml_node misplaced = parser_.ParseNodes(from, to, elements_);
    HandElements(handler);
    if (misplaced.type() == pugi::node_declaration)
        parser_.Fail(misplaced, "an XML declaration is allowed only at the start of the document");
    if (misplaced.type() == pugi::node_doctype)
        parser_.Fail(misplaced, "a DOCTYPE is allowed only before the root element");
}

bool XmlPieceReader::PlainStep(XmlPieceHandler& handler) {
    // Where the plain way gave up, the general way reads at least a piece before it is tried
    // again: what the cut finder has read ahead is then forgotten only once a piece, and
    // every byte is still read a bounded number of times.
    if (!options_.plainMarkup || pos_ < plainFrom_)
        return false;
    const auto pieceBytes = static_cast<int64_t>(PieceBytes(options_));
    window_.FillTo(pos_ + pieceBytes + kPlainMarginBytes);
    PlainMarkup::Rules rules;
    rules.limit = pos_ + pieceBytes;
    rules.descendBytes = static_cast<int64_t>(DescendBytes(options_));
    rules.depthLeft = options_.maxDepth - static_cast<int64_t>(open_.Depth());
    int64_t scanned = pos_;
    const PlainMarkup::Cut cut =
        plain_.ScanContent(window_.View(pos_, window_.End()), pos_, rules, elements_, scanned);
    switch (cut.kind) {
        case PlainMarkup::Cut::Kind::NotPlain:
            plainFrom_ = std::max(scanned, pos_ + pieceBytes);
            return false;
        case PlainMarkup::Cut::Kind::Piece:
            HandElements(handler);
            // An element too large for the piece ends it, and is read again to be entered.
            readTwice_ += std::max<int64_t>(scanned - cut.at, 0);
            pos_ = cut.at;
            break;
        case PlainMarkup::Cut::Kind::Descend: {
            // The element's content up to `scanned` is read again from its start tag: only
            // while what is read twice stays within what has been read, so that deep nesting
            // of large elements cannot make it read the same bytes over and over.
            const int64_t again = scanned - cut.tagEnd;
            if (readTwice_ + again > pos_ + pieceBytes) {
                plainFrom_ = std::max(scanned, pos_ + pieceBytes);
                return false;
            }
            readTwice_ += again;
            Enter(handler, cut.at, cut.tagEnd);
            break;
        }
        case PlainMarkup::Cut::Kind::EndTag:
            HandElements(handler);
            Leave(handler, cut.at, cut.tagEnd);
            break;
    }
    // The cut finder's next cut depends only on the text from here on: it starts afresh.
    cuts_.Start(pos_);
    return true;
}

void XmlPieceReader::Step(XmlPieceHandler& handler) {
    Release();
    if (PlainStep(handler))
        return;
    const CutFinder::Cut cut = cuts_.Next(pos_, open_.Depth());
    switch (cut.kind) {
        case CutFinder::CutKind::Piece:
            HandNodes(handler, pos_, cut.at);
            pos_ = cut.at;
            break;
        case CutFinder::CutKind::EndTag:
            if (cut.at > pos_)
                HandNodes(handler, pos_, cut.at);
            Leave(handler, cut.at, cut.tag.end);
            break;
        case CutFinder::CutKind::Descend: {
            const std::string_view name = lexer_.NameAt(cut.at + 1);
            parser_.ParseStartTag(cut.at, cut.tag.end, false, name, elements_);
            Enter(handler, cut.at, cut.tag.end);
            break;
        }
        case CutFinder::CutKind::EndOfData:
            open_.FailUnclosed(cut.at);
    }
}

}  // namespace vtr::seqlib::detail
