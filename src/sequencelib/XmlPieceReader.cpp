#include "sequencelib/XmlPieceReader.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <string_view>

#include "sequencelib/LoadFailure.h"

namespace vtr::seqlib::detail {

namespace {

constexpr std::size_t npos = static_cast<std::size_t>(-1);

// Pieces are parsed as fragments; declarations and DOCTYPEs are kept as nodes so that one
// standing between two elements is seen and refused.
constexpr unsigned kPieceFlags =
    pugi::parse_default | pugi::parse_fragment | pugi::parse_declaration | pugi::parse_doctype;
constexpr unsigned kTagFlags = pugi::parse_default | pugi::parse_declaration | pugi::parse_doctype;

// The number of '\n' bytes, eight at a time.
int64_t CountNewlines(const char* p, std::size_t n) {
    constexpr uint64_t kNewlines = 0x0A0A0A0A0A0A0A0Aull;
    constexpr uint64_t kLow7 = 0x7F7F7F7F7F7F7F7Full;
    int64_t count = 0;
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) {
        uint64_t word;
        std::memcpy(&word, p + i, 8);
        const uint64_t x = word ^ kNewlines;  // a zero byte where there is a newline
        const uint64_t nonzero = ((x & kLow7) + kLow7) | x;
        // One bit (the top one) per newline byte; gather them into the low byte.
        const uint64_t marks = ~(nonzero | kLow7) >> 7;
        count += static_cast<int64_t>((marks * 0x0101010101010101ull) >> 56);
    }
    for (; i < n; ++i)
        count += p[i] == '\n';
    return count;
}

std::string ParserMessage(const char* description) {
    std::string text = description;
    if (!text.empty())
        text[0] = static_cast<char>(std::tolower(static_cast<unsigned char>(text[0])));
    return "the XML is not well-formed (" + text + ")";
}

}  // namespace

std::string PlaceText(const TextPlace& place) {
    return "line " + std::to_string(place.line) + ", column " + std::to_string(place.column);
}

XmlPieceReader::XmlPieceReader(ByteSource& source, std::size_t pieceBytes)
    : source_(source), pieceBytes_(std::max<std::size_t>(pieceBytes, 16)) {
    capacity_ = pieceBytes_ * 2 + 64;
    buffer_.reset(new char[capacity_]);
}

XmlPieceReader::~XmlPieceReader() = default;

void XmlPieceReader::Run(XmlPieceHandler& handler, const std::function<void()>& afterStep) {
    ReadHead(handler);
    if (afterStep)
        afterStep();
    while (!open_.empty()) {
        Step(handler);
        if (afterStep)
            afterStep();
    }
    ReadEpilog();
}

// --- Places ---------------------------------------------------------------------------

TextPlace XmlPieceReader::PlaceAt(int64_t offset) const {
    offset = std::clamp<int64_t>(offset, base_, base_ + static_cast<int64_t>(size_));
    if (cursorOffset_ < base_ || cursorOffset_ > offset) {
        cursorOffset_ = base_;
        cursorLine_ = baseLine_;
        cursorLineStart_ = baseLineStart_;
    }
    const char* from = buffer_.get() + (cursorOffset_ - base_);
    const auto n = static_cast<std::size_t>(offset - cursorOffset_);
    if (const int64_t lines = CountNewlines(from, n); lines > 0) {
        cursorLine_ += lines;
        cursorLineStart_ =
            cursorOffset_ + static_cast<int64_t>(std::string_view(from, n).rfind('\n')) + 1;
    }
    cursorOffset_ = offset;
    return {cursorLine_, offset - cursorLineStart_ + 1};
}

TextPlace XmlPieceReader::PlaceInScratch(const char* p) const {
    const char* begin = scratch_.data();
    std::size_t at =
        (p >= begin && p <= begin + scratch_.size()) ? static_cast<std::size_t>(p - begin) : 0;
    at = std::min(at, scratchTextSize_);
    return PlaceAt(scratchOffset_ + static_cast<int64_t>(at));
}

TextPlace XmlPieceReader::PlaceOf(const pugi::xml_node& node) const {
    const ptrdiff_t offset = node.offset_debug();
    if (offset < 0)
        return PlaceAt(scratchOffset_);
    // Elements are found by their name, one byte after the "<".
    const ptrdiff_t back = node.type() == pugi::node_element && offset > 0 ? 1 : 0;
    return PlaceInScratch(scratch_.data() + offset - back);
}

TextPlace XmlPieceReader::PlaceOf(const pugi::xml_attribute& attribute) const {
    return PlaceInScratch(attribute.name());
}

void XmlPieceReader::Fail(const TextPlace& place, std::string cause) const {
    FailLoad(PlaceText(place), std::move(cause));
}

void XmlPieceReader::FailAt(std::size_t index, std::string cause) const {
    Fail(PlaceAt(base_ + static_cast<int64_t>(index)), std::move(cause));
}

// --- Buffer ----------------------------------------------------------------------------

bool XmlPieceReader::ReadMore() {
    if (eof_)
        return false;
    // Beyond a piece, only a markup item being read (or the text before the root) is held.
    if (markupStart_ != npos && size_ - markupStart_ >= kMaxMarkupBytes) {
        FailAt(markupStart_, "a tag, comment or other markup item is longer than " +
                                 ByteCountText(kMaxMarkupBytes));
    }
    if (size_ == capacity_) {
        const std::size_t grown = capacity_ * 2;
        std::unique_ptr<char[]> bigger(new char[grown]);
        std::memcpy(bigger.get(), buffer_.get(), size_);
        buffer_ = std::move(bigger);
        capacity_ = grown;
    }
    const std::size_t got = source_.Read(buffer_.get() + size_, capacity_ - size_);
    if (got == 0) {
        eof_ = true;
        return false;
    }
    size_ += got;
    return true;
}

bool XmlPieceReader::Have(std::size_t index) {
    while (index >= size_) {
        if (!ReadMore())
            return false;
    }
    return true;
}

void XmlPieceReader::FillTo(std::size_t index) {
    while (size_ < index && ReadMore()) {
    }
}

void XmlPieceReader::Compact() {
    if (pos_ < pieceBytes_)
        return;
    const TextPlace place = PlaceAt(base_ + static_cast<int64_t>(pos_));
    baseLine_ = place.line;
    baseLineStart_ = cursorLineStart_;
    std::memmove(buffer_.get(), buffer_.get() + pos_, size_ - pos_);
    base_ += static_cast<int64_t>(pos_);
    size_ -= pos_;
    pos_ = 0;
    markupStart_ = npos;
}

std::size_t XmlPieceReader::FindChar(std::size_t from, char c, std::size_t stop) {
    std::size_t i = from;
    for (;;) {
        const std::size_t end = std::min(size_, stop);
        if (i < end) {
            const char* b = buffer_.get();
            if (const void* hit = std::memchr(b + i, c, end - i)) {
                return static_cast<std::size_t>(static_cast<const char*>(hit) - b);
            }
            i = end;
        }
        if (i >= stop || !ReadMore())
            return npos;
    }
}

std::size_t XmlPieceReader::FindText(std::size_t from, const char* text, std::size_t length) {
    std::size_t i = from;
    for (;;) {
        if (size_ >= i + length) {
            const std::string_view held(buffer_.get(), size_);
            const std::size_t hit = held.find(std::string_view(text, length), i);
            if (hit != std::string_view::npos)
                return hit;
            i = size_ - length + 1;
        }
        if (!ReadMore())
            return npos;
    }
}

bool XmlPieceReader::StartsWith(std::size_t at, const char* text, std::size_t length) {
    return Have(at + length - 1) && std::memcmp(buffer_.get() + at, text, length) == 0;
}

// --- Markup ----------------------------------------------------------------------------

XmlPieceReader::Lexed XmlPieceReader::LexMarkup(std::size_t at) {
    markupStart_ = at;
    const Lexed lexed = LexItem(at);
    markupStart_ = npos;
    if (lexed.kind != Markup::Truncated && lexed.end - at > kMaxMarkupBytes) {
        FailAt(at, "a tag, comment or other markup item is longer than " +
                       ByteCountText(kMaxMarkupBytes));
    }
    return lexed;
}

XmlPieceReader::Lexed XmlPieceReader::LexItem(std::size_t at) {
    if (!Have(at + 1))
        return {};
    const char c = buffer_[at + 1];
    if (c == '/') {
        const std::size_t gt = FindChar(at + 2, '>', npos);
        return gt == npos ? Lexed{} : Lexed{Markup::EndTag, gt + 1};
    }
    if (c == '?') {
        const std::size_t end = FindText(at + 2, "?>", 2);
        return end == npos ? Lexed{} : Lexed{Markup::Pi, end + 2};
    }
    if (c == '!') {
        if (StartsWith(at, "<!--", 4)) {
            const std::size_t end = FindText(at + 4, "-->", 3);
            return end == npos ? Lexed{} : Lexed{Markup::Comment, end + 3};
        }
        if (StartsWith(at, "<![CDATA[", 9)) {
            const std::size_t end = FindText(at + 9, "]]>", 3);
            return end == npos ? Lexed{} : Lexed{Markup::CData, end + 3};
        }
        if (StartsWith(at, "<!DOCTYPE", 9))
            return LexDoctype(at);
        const std::size_t gt = FindChar(at + 2, '>', npos);
        return gt == npos ? Lexed{} : Lexed{Markup::Other, gt + 1};
    }
    return LexStartTag(at);
}

XmlPieceReader::Lexed XmlPieceReader::LexStartTag(std::size_t at) {
    std::size_t j = at + 1;
    for (;;) {
        const char* b = buffer_.get();
        while (j < size_ && b[j] != '>' && b[j] != '"' && b[j] != '\'')
            ++j;
        if (j >= size_) {
            if (!ReadMore())
                return {};
            continue;
        }
        const char c = b[j];
        if (c == '>') {
            const bool empty = j > at + 1 && b[j - 1] == '/';
            return {empty ? Markup::EmptyTag : Markup::StartTag, j + 1};
        }
        const std::size_t close = FindChar(j + 1, c, npos);
        if (close == npos)
            return {};
        j = close + 1;
    }
}

XmlPieceReader::Lexed XmlPieceReader::LexDoctype(std::size_t at) {
    std::size_t j = at + 9;
    int depth = 0;
    for (;;) {
        if (!Have(j))
            return {};
        const char c = buffer_[j];
        if (c == '"' || c == '\'') {
            const std::size_t close = FindChar(j + 1, c, npos);
            if (close == npos)
                return {};
            j = close + 1;
            continue;
        }
        if (c == '<' && StartsWith(j, "<!--", 4)) {
            const std::size_t end = FindText(j + 4, "-->", 3);
            if (end == npos)
                return {};
            j = end + 3;
            continue;
        }
        if (c == '[') {
            ++depth;
        } else if (c == ']') {
            --depth;
        } else if (c == '>' && depth <= 0) {
            return {Markup::Doctype, j + 1};
        }
        ++j;
    }
}

std::string XmlPieceReader::NameAt(std::size_t at) const {
    std::size_t end = at;
    while (end < size_ && !IsSpace(buffer_[end]) && buffer_[end] != '/' && buffer_[end] != '>')
        ++end;
    return std::string(buffer_.get() + at, end - at);
}

// --- Document structure ------------------------------------------------------------------

void XmlPieceReader::ReadHead(XmlPieceHandler& handler) {
    FillTo(pieceBytes_);
    if (Have(1)) {
        const auto b0 = static_cast<unsigned char>(buffer_[0]);
        const auto b1 = static_cast<unsigned char>(buffer_[1]);
        if ((b0 == 0xFF && b1 == 0xFE) || (b0 == 0xFE && b1 == 0xFF)) {
            FailAt(0, "the text is UTF-16; a sequence file is UTF-8");
        }
    }
    const std::size_t textStart = StartsWith(0, "\xEF\xBB\xBF", 3) ? 3 : 0;
    std::size_t i = textStart;
    for (;;) {
        while (Have(i) && IsSpace(buffer_[i]))
            ++i;
        if (!Have(i))
            FailAt(i, "the document has no root element");
        if (i >= kMaxMarkupBytes) {
            FailAt(i, "the text before the root element is longer than " +
                          ByteCountText(kMaxMarkupBytes));
        }
        if (buffer_[i] != '<')
            FailAt(i, "text before the root element");
        const Lexed m = LexMarkup(i);
        switch (m.kind) {
            case Markup::Truncated:
                FailAt(i, "the data ends inside this markup");
            case Markup::Pi:
                if (i != textStart && StartsWith(i, "<?xml", 5) && Have(i + 5) &&
                    (IsSpace(buffer_[i + 5]) || buffer_[i + 5] == '?')) {
                    FailAt(i, "the XML declaration is not at the start of the document");
                }
                break;
            case Markup::Comment:
            case Markup::Doctype:
                break;
            case Markup::EndTag:
                FailAt(i, "an end tag before the root element");
            case Markup::CData:
            case Markup::Other:
                FailAt(i, "unexpected markup before the root element");
            case Markup::StartTag:
            case Markup::EmptyTag: {
                const TextPlace place = PlaceAt(base_ + static_cast<int64_t>(i));
                const pugi::xml_node root = ParseStartTag(0, i, m);
                const std::string name = root.name();
                handler.EnterElement(root);
                pos_ = m.end;
                if (m.kind == Markup::EmptyTag) {
                    handler.LeaveElement();
                } else {
                    open_.push_back({name, place, {}});
                }
                return;
            }
        }
        i = m.end;
    }
}

void XmlPieceReader::Step(XmlPieceHandler& handler) {
    Compact();
    FillTo(pos_ + pieceBytes_);
    bool largeChildNext = false;
    if (open_.back().guessPause > 0) {
        --open_.back().guessPause;
    } else if (TryGuessedPiece(handler, largeChildNext)) {
        return;
    }
    const Cut cut = ScanContent(largeChildNext);
    switch (cut.kind) {
        case CutKind::Piece:
            if (ParsePiece(pos_, cut.at, false))
                HandlePiece(handler);
            pos_ = cut.at;
            break;
        case CutKind::EndTag:
            if (cut.at > pos_ && ParsePiece(pos_, cut.at, false))
                HandlePiece(handler);
            pos_ = cut.at;
            CheckEndTag(cut.tagStart, cut.tag);
            handler.LeaveElement();
            // The parent's next guess looks for the end of a sibling of this kind.
            if (open_.size() >= 2)
                open_[open_.size() - 2].childName = std::move(open_.back().name);
            open_.pop_back();
            pos_ = cut.tag.end;
            break;
        case CutKind::Descend: {
            const TextPlace place = PlaceAt(base_ + static_cast<int64_t>(cut.tagStart));
            const pugi::xml_node element = ParseStartTag(cut.tagStart, cut.tagStart, cut.tag);
            const std::string name = element.name();
            handler.EnterElement(element);
            open_.push_back({name, place, {}});
            pos_ = cut.tag.end;
            break;
        }
        case CutKind::EndOfData:
            FailAt(size_, "the data ends before the end tag of <" + open_.back().name +
                              "> (opened at " + PlaceText(open_.back().place) + ")");
    }
}

void XmlPieceReader::ReadEpilog() {
    for (;;) {
        if (pos_ >= pieceBytes_)
            Compact();
        if (!Have(pos_))
            return;
        const char c = buffer_[pos_];
        if (IsSpace(c)) {
            ++pos_;
            continue;
        }
        if (c != '<')
            FailAt(pos_, "text after the root element");
        const Lexed m = LexMarkup(pos_);
        const bool declaration = StartsWith(pos_, "<?xml", 5) && Have(pos_ + 5) &&
                                 (IsSpace(buffer_[pos_ + 5]) || buffer_[pos_ + 5] == '?');
        if (m.kind == Markup::Comment || (m.kind == Markup::Pi && !declaration)) {
            pos_ = m.end;
            continue;
        }
        if (m.kind == Markup::Truncated)
            FailAt(pos_, "the data ends inside this markup");
        FailAt(pos_, "content after the end of the root element");
    }
}

// --- Pieces ----------------------------------------------------------------------------

bool XmlPieceReader::TryGuessedPiece(XmlPieceHandler& handler, bool& largeChildNext) {
    const std::size_t limit = std::min(size_, pos_ + pieceBytes_);
    const std::size_t cut = GuessCut(pos_, limit, largeChildNext);
    if (cut == npos || cut <= pos_)
        return false;
    if (!ParsePiece(pos_, cut, true)) {
        open_.back().guessPause = 8;
        return false;
    }
    HandlePiece(handler);
    pos_ = cut;
    return true;
}

std::size_t XmlPieceReader::GuessCut(std::size_t from, std::size_t limit,
                                     bool& largeChildNext) const {
    largeChildNext = false;
    std::string_view view(buffer_.get() + from, limit - from);
    const std::string& child = open_.back().childName;
    if (!child.empty()) {
        // After the last end tag of the kind of child seen last, looked for only near the end
        // of reach: a child that ends further back is one that would be entered anyway.
        const std::size_t reach = std::max<std::size_t>(pieceBytes_ / 16, 64);
        const std::size_t stop = view.size() > reach ? view.size() - reach : 0;
        std::size_t end = view.size();
        while (end > stop) {
            const std::size_t lt = view.rfind('<', end - 1);
            if (lt == std::string_view::npos)
                break;
            const std::size_t after = lt + 2 + child.size();
            if (after < view.size() && view[lt + 1] == '/' &&
                view.compare(lt + 2, child.size(), child) == 0 &&
                (view[after] == '>' || IsSpace(view[after]))) {
                const std::size_t gt = view.find('>', after);
                if (gt != std::string_view::npos)
                    return from + gt + 1;
            }
            end = lt;
        }
        // No such child ends near: the next one is large.
        largeChildNext = true;
        return npos;
    }
    // After the last end tag or empty-element tag, but never past the end tag of the element
    // whose content this is (a large element's last piece).
    const std::string endTag = "</" + open_.back().name;
    for (std::size_t at = 0;;) {
        const std::size_t match = view.find(endTag, at);
        if (match == std::string_view::npos)
            break;
        const std::size_t after = match + endTag.size();
        if (after == view.size() || view[after] == '>' || IsSpace(view[after])) {
            view = view.substr(0, match);
            break;
        }
        at = match + 1;
    }
    std::size_t end = view.size();
    for (int tries = 0; tries < 64 && end > 0; ++tries) {
        const std::size_t gt = view.rfind('>', end - 1);
        if (gt == std::string_view::npos)
            return npos;
        if (gt > 0 && view[gt - 1] == '/')
            return from + gt + 1;
        const std::size_t lt = view.rfind('<', gt);
        if (lt == std::string_view::npos)
            return npos;
        if (lt + 1 < view.size() && view[lt + 1] == '/')
            return from + gt + 1;
        end = lt;
    }
    return npos;
}

XmlPieceReader::Cut XmlPieceReader::ScanContent(bool largeChildNext) {
    const std::size_t limit = pos_ + pieceBytes_;
    // An element that does not end within this much is entered rather than taken whole (at
    // once when the element is expected to be large).
    const std::size_t descendAt =
        pos_ + (largeChildNext ? 1 : std::max<std::size_t>(pieceBytes_ / 32, 1));
    std::size_t i = pos_;
    std::size_t lastCut = pos_;
    std::size_t firstTag = pos_;
    Lexed first;
    int64_t depth = 0;
    const auto piece = [](std::size_t at) { return Cut{CutKind::Piece, at, 0, {}}; };
    const auto descend = [&] {
        return lastCut > pos_ ? piece(lastCut) : Cut{CutKind::Descend, pos_, firstTag, first};
    };
    for (;;) {
        const std::size_t stop = depth > 0 ? std::max(descendAt, i + 1) : limit;
        const std::size_t lt = FindChar(i, '<', stop);
        if (lt == npos) {
            if (eof_ && size_ < stop) {
                // The data ends: the rest is text, or an element left open that the parse
                // of the piece reports.
                if (depth == 0 && size_ == pos_)
                    return Cut{CutKind::EndOfData, pos_, 0, {}};
                return piece(size_);
            }
            if (depth == 0)
                return piece(lastCut > pos_ ? lastCut : limit);
            return descend();
        }
        if (depth == 0)
            lastCut = lt;
        const Lexed m = LexMarkup(lt);
        if (m.kind == Markup::Truncated)
            return piece(size_);
        if (m.kind == Markup::EndTag) {
            if (depth == 0)
                return Cut{CutKind::EndTag, lt, lt, m};
            --depth;
        } else if (m.kind == Markup::StartTag) {
            if (depth == 0) {
                firstTag = lt;
                first = m;
            }
            ++depth;
        }
        i = m.end;
        if (depth == 0) {
            lastCut = i;
            if (i >= limit)
                return piece(i);
        } else if (i >= limit || i >= descendAt) {
            return descend();
        }
    }
}

bool XmlPieceReader::ParsePiece(std::size_t from, std::size_t to, bool guessed) {
    if (to <= from) {
        doc_.reset();
        return true;
    }
    scratch_.assign(buffer_.get() + from, buffer_.get() + to);
    scratchOffset_ = base_ + static_cast<int64_t>(from);
    scratchTextSize_ = to - from;
    if (const void* nul = std::memchr(scratch_.data(), 0, scratch_.size())) {
        if (guessed)
            return false;
        Fail(PlaceInScratch(static_cast<const char*>(nul)), "a NUL character in the text");
    }
    const pugi::xml_parse_result result = doc_.load_buffer_inplace(
        scratch_.data(), scratch_.size(), kPieceFlags, pugi::encoding_utf8);
    if (result)
        return true;
    if (guessed)
        return false;
    Fail(PlaceInScratch(scratch_.data() + result.offset), ParserMessage(result.description()));
}

void XmlPieceReader::HandlePiece(XmlPieceHandler& handler) {
    pugi::xml_node lastWithContent;
    for (pugi::xml_node node = doc_.first_child(); node; node = node.next_sibling()) {
        switch (node.type()) {
            case pugi::node_element:
                handler.CompleteElement(node);
                if (node.first_child())
                    lastWithContent = node;
                break;
            case pugi::node_declaration:
                Fail(PlaceOf(node),
                     "an XML declaration is allowed only at the start of the document");
            case pugi::node_doctype:
                Fail(PlaceOf(node), "a DOCTYPE is allowed only before the root element");
            default:
                break;
        }
    }
    if (lastWithContent)
        open_.back().childName = lastWithContent.name();
}

pugi::xml_node XmlPieceReader::ParseStartTag(std::size_t from, std::size_t tagStart,
                                             const Lexed& tag) {
    // The text from `from` through the start tag, closed by a matching end tag.
    const std::string name = NameAt(tagStart + 1);
    scratch_.assign(buffer_.get() + from, buffer_.get() + tag.end);
    scratchOffset_ = base_ + static_cast<int64_t>(from);
    scratchTextSize_ = tag.end - from;
    if (tag.kind == Markup::StartTag) {
        const std::string close = "</" + name + ">";
        scratch_.insert(scratch_.end(), close.begin(), close.end());
    }
    if (const void* nul = std::memchr(scratch_.data(), 0, scratch_.size())) {
        Fail(PlaceInScratch(static_cast<const char*>(nul)), "a NUL character in the text");
    }
    const pugi::xml_parse_result result =
        doc_.load_buffer_inplace(scratch_.data(), scratch_.size(), kTagFlags, pugi::encoding_utf8);
    if (!result) {
        Fail(PlaceInScratch(scratch_.data() + result.offset), ParserMessage(result.description()));
    }
    const pugi::xml_node element = doc_.last_child();
    if (element.type() != pugi::node_element || name != element.name()) {
        FailAt(tagStart, "the start tag is malformed");
    }
    return element;
}

void XmlPieceReader::CheckEndTag(std::size_t tagStart, const Lexed& tag) {
    const char* b = buffer_.get();
    std::size_t i = tagStart + 2;
    const std::size_t last = tag.end - 1;  // the '>'
    while (i < last && !IsSpace(b[i]))
        ++i;
    const std::string name(b + tagStart + 2, i - (tagStart + 2));
    while (i < last && IsSpace(b[i]))
        ++i;
    const OpenElement& open = open_.back();
    if (name != open.name) {
        FailAt(tagStart, "the end tag </" + name + "> does not match <" + open.name +
                             "> opened at " + PlaceText(open.place));
    }
    if (i != last)
        FailAt(tagStart, "the end tag </" + name + "> is malformed");
}

}  // namespace vtr::seqlib::detail
