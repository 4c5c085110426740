#include "sequencelib/MarkupLexer.h"

#include "sequencelib/ByteScan.h"
#include "sequencelib/LoadFailure.h"
#include "sequencelib/TextPlaces.h"
#include "sequencelib/TextWindow.h"

namespace vtr::seqlib::detail {

Lexed MarkupLexer::Lex(int64_t at) {
    start_ = at;
    stop_ = at + static_cast<int64_t>(kMaxMarkupBytes);
    const Lexed lexed = LexItem(at);
    if (lexed.kind != Markup::Truncated && lexed.end - at > static_cast<int64_t>(kMaxMarkupBytes))
        TooLong();
    return lexed;
}

void MarkupLexer::TooLong() const {
    lines_.FailAt(start_, "a tag, comment or other markup item is longer than " +
                              ByteCountText(kMaxMarkupBytes));
}

Lexed MarkupLexer::Until(Markup kind, int64_t from, char c) {
    const int64_t hit = window_.Find(from, c, stop_);
    if (hit != TextWindow::npos)
        return {kind, hit + 1};
    if (window_.End() >= stop_)
        TooLong();
    return {};
}

Lexed MarkupLexer::Until(Markup kind, int64_t from, std::string_view text) {
    const int64_t hit = window_.Find(from, text, stop_);
    if (hit != TextWindow::npos)
        return {kind, hit + static_cast<int64_t>(text.size())};
    if (window_.End() >= stop_)
        TooLong();
    return {};
}

Lexed MarkupLexer::LexItem(int64_t at) {
    if (!window_.Have(at + 1))
        return {};
    const char c = window_[at + 1];
    if (c == '/')
        return Until(Markup::EndTag, at + 2, '>');
    if (c == '?')
        return Until(Markup::Pi, at + 2, "?>");
    if (c == '!') {
        if (window_.StartsWith(at, "<!--"))
            return Until(Markup::Comment, at + 4, "-->");
        if (window_.StartsWith(at, "<![CDATA["))
            return Until(Markup::CData, at + 9, "]]>");
        if (window_.StartsWith(at, "<!DOCTYPE"))
            return LexDoctype(at);
        return Until(Markup::Other, at + 2, '>');
    }
    return LexStartTag(at);
}

Lexed MarkupLexer::LexStartTag(int64_t at) {
    int64_t j = at + 1;
    char quote = 0;  // inside a quoted value: its quote
    for (;;) {
        // The held bytes are searched directly; more are read when they run out.
        const char* const start = window_.At(j);
        const char* const end = window_.At(window_.End());
        const char* const p = FindTagEnd(start, end, quote);
        if (p != end) {
            j += p - start;
            const bool empty = j > at + 1 && window_[j - 1] == '/';
            return {empty ? Markup::EmptyTag : Markup::StartTag, j + 1};
        }
        j = window_.End();
        if (j >= stop_)
            TooLong();
        if (!window_.ReadMore())
            return {};
    }
}

Lexed MarkupLexer::LexDoctype(int64_t at) {
    int64_t j = at + 9;
    int depth = 0;
    for (;;) {
        if (j >= stop_)
            TooLong();
        if (!window_.Have(j))
            return {};
        const char c = window_[j];
        if (c == '"' || c == '\'') {
            const Lexed quoted = Until(Markup::Doctype, j + 1, c);
            if (quoted.kind == Markup::Truncated)
                return {};
            j = quoted.end;
            continue;
        }
        if (c == '<' && window_.StartsWith(j, "<!--")) {
            const Lexed comment = Until(Markup::Doctype, j + 4, "-->");
            if (comment.kind == Markup::Truncated)
                return {};
            j = comment.end;
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

std::string_view MarkupLexer::NameAt(int64_t at) const {
    int64_t end = at;
    while (end < window_.End() && !IsSpace(window_[end]) && window_[end] != '/' &&
           window_[end] != '>')
        ++end;
    return window_.View(at, end);
}

bool MarkupLexer::IsDeclaration(int64_t at) {
    return window_.StartsWith(at, "<?xml") && window_.Have(at + 5) &&
           (IsSpace(window_[at + 5]) || window_[at + 5] == '?');
}

}  // namespace vtr::seqlib::detail
