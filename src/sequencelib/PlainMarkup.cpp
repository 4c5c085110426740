#include "sequencelib/PlainMarkup.h"

#include <algorithm>
#include <array>
#include <cstdint>

#include "sequencelib/ByteScan.h"

namespace vtr::seqlib::detail {

namespace {

enum : uint8_t {
    kNameStart = 1,  // may start a name (FindNameEnd finds where it ends)
    kSpace = 2,      // a blank between markup
};

constexpr std::array<uint8_t, 256> MakeClasses() {
    std::array<uint8_t, 256> classes{};
    for (int c = 0; c < 256; ++c) {
        uint8_t k = 0;
        const bool letter = (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z');
        if (letter || c == '_' || c == ':')
            k |= kNameStart;
        if (c == ' ' || c == '\t' || c == '\r' || c == '\n')
            k |= kSpace;
        classes[static_cast<std::size_t>(c)] = k;
    }
    return classes;
}

constexpr std::array<uint8_t, 256> kClasses = MakeClasses();

inline bool Is(char c, uint8_t kind) {
    return (kClasses[static_cast<unsigned char>(c)] & kind) != 0;
}

inline void SkipSpace(const char*& p, const char* end) {
    while (p < end && Is(*p, kSpace))
        ++p;
}

// A name from p on, p moved past it; empty when p does not start one.
inline std::string_view Name(const char*& p, const char* end) {
    const char* const first = p;
    if (p < end && Is(*p, kNameStart))
        p = FindNameEnd(p + 1, end);
    return {first, static_cast<std::size_t>(p - first)};
}

// Text up to the next '<' (or the end); false when it holds what plain text may not.
inline bool Text(const char*& p, const char* end) {
    p = FindFirstOf(p, end, '<', '&', '\0');
    return p == end || *p == '<';
}

// The end tag "</name>" (blanks allowed before the '>') at p, p moved past it.
inline bool EndTag(const char*& p, const char* end, std::string_view name) {
    p += 2;
    if (Name(p, end) != name)
        return false;
    SkipSpace(p, end);
    if (p == end || *p != '>')
        return false;
    ++p;
    return true;
}

}  // namespace

PlainMarkup::Read PlainMarkup::Element(const char*& where, const char* stop, int64_t depthLeft,
                                       XmlElements& out) {
    const auto offsetOf = [this](const char* q) { return offset_ + (q - begin_); };
    const char* const end = end_;
    // Read through a local pointer, which the compiler keeps in a register.
    const char* p = where;
    const auto finish = [&](Read read) {
        where = p;
        return read;
    };
    open_.clear();
    for (;;) {
        // p is at a '<' inside the element (or at its start tag).
        if (p >= stop)
            return finish(Read::TooFar);
        if (end - p < 2)
            return finish(Read::NotPlain);
        if (p[1] == '/') {
            if (open_.empty() || !EndTag(p, end, out[open_.back()].name))
                return finish(Read::NotPlain);
            out.Close(open_.back());
            open_.pop_back();
        } else {
            const char* const tag = p++;
            const std::string_view name = Name(p, end);
            if (name.empty() || static_cast<int64_t>(open_.size()) >= depthLeft)
                return finish(Read::NotPlain);
            const uint32_t element = out.Open(name, offsetOf(tag));
            for (;;) {
                const char* const blank = p;
                if (p != end && *p == ' ')
                    ++p;  // the one blank usually between attributes
                SkipSpace(p, end);
                if (p == end)
                    return finish(Read::NotPlain);
                if (*p == '>') {
                    ++p;
                    if (open_.empty())
                        startTagEnd_ = offsetOf(p);
                    open_.push_back(element);
                    break;
                }
                if (*p == '/') {
                    if (end - p < 2 || p[1] != '>')
                        return finish(Read::NotPlain);
                    p += 2;
                    out.Close(element);
                    break;
                }
                if (p == blank)
                    return finish(Read::NotPlain);  // attributes are set apart by blanks
                const char* const attributeAt = p;
                const std::string_view attributeName = Name(p, end);
                if (attributeName.empty())
                    return finish(Read::NotPlain);
                if (end - p >= 2 && p[0] == '=' && (p[1] == '"' || p[1] == '\'')) {
                    ++p;  // as markup is usually written: name="value"
                } else {
                    SkipSpace(p, end);
                    if (p == end || *p != '=')
                        return finish(Read::NotPlain);
                    ++p;
                    SkipSpace(p, end);
                    if (p == end || (*p != '"' && *p != '\''))
                        return finish(Read::NotPlain);
                }
                const char quote = *p++;
                const char* const value = p;
                for (;;) {
                    p = FindValueStop(p, end);
                    if (p == end || *p == quote || (*p != '"' && *p != '\''))
                        break;
                    ++p;  // the other quote
                }
                if (p == end || *p != quote)
                    return finish(Read::NotPlain);
                out.AddAttribute(attributeName,
                                 std::string_view(value, static_cast<std::size_t>(p - value)),
                                 offsetOf(attributeAt));
                ++p;
            }
        }
        if (open_.empty())
            return finish(Read::Whole);
        if (!Text(p, end) || p == end)
            return finish(Read::NotPlain);
    }
}

bool PlainMarkup::Scan(std::string_view text, int64_t offset, XmlElements& out) {
    out.Clear();
    begin_ = text.data();
    end_ = begin_ + text.size();
    offset_ = offset;
    const char* p = begin_;
    for (;;) {
        if (!Text(p, end_))
            return false;
        if (p == end_)
            return true;
        if (Element(p, end_, INT64_MAX, out) != Read::Whole)
            return false;
    }
}

PlainMarkup::Cut PlainMarkup::ScanContent(std::string_view text, int64_t offset, const Rules& rules,
                                          XmlElements& out, int64_t& scanned) {
    out.Clear();
    begin_ = text.data();
    end_ = begin_ + text.size();
    offset_ = offset;
    const auto at = [&](const char* q) { return offset + (q - begin_); };
    const char* p = begin_;
    const char* boundary = begin_;  // the last node boundary
    const auto notPlain = [&]() -> Cut {
        scanned = at(p);
        return {};
    };
    for (;;) {
        if (!Text(p, end_))
            return notPlain();
        if (at(p) >= rules.limit) {
            // The text after the last node goes with the next piece.
            if (boundary == begin_)
                return notPlain();
            return {Cut::Kind::Piece, at(boundary), 0};
        }
        if (p == end_)
            return notPlain();  // the text ends first
        boundary = p;
        if (end_ - p >= 2 && p[1] == '/') {
            // Whose end tag it is, the open elements judge.
            const char* const tag = p;
            p = FindByte(tag + 2, end_, '>');
            if (p == end_)
                return notPlain();
            return {Cut::Kind::EndTag, at(tag), at(p + 1)};
        }
        const uint32_t elements = out.Size();
        const uint32_t attributes = out.AttributeCount();
        const int64_t room = std::min(rules.limit - at(p), rules.descendBytes);
        const char* const stop = room < end_ - p ? p + room : end_;
        switch (Element(p, stop, rules.depthLeft, out)) {
            case Read::Whole:
                boundary = p;
                break;
            case Read::TooFar:
                // An element that does not end soon enough is entered; what comes before it
                // is a piece of its own.
                scanned = at(p);
                if (boundary != begin_) {
                    out.Truncate(elements, attributes);
                    return {Cut::Kind::Piece, at(boundary), 0};
                }
                out.Truncate(1, out[0].attributeCount);
                out.Close(0);
                return {Cut::Kind::Descend, at(boundary), startTagEnd_};
            case Read::NotPlain:
                return notPlain();
        }
    }
}

}  // namespace vtr::seqlib::detail
