#pragma once

#include <pugixml.hpp>

#include <cstdint>
#include <string_view>
#include <vector>

#include "sequencelib/TextPlaces.h"
#include "sequencelib/XmlElements.h"

namespace vtr::seqlib::detail {

class TextWindow;

// Parses held parts of the text with pugixml: a run of whole nodes, or a start tag alone.
// The bytes are copied first (pugixml parses in place), so the window keeps the text as it
// was, for the places of what the parse finds. A NUL byte, which pugixml would take for the
// end of the text, and every parse error are refused with their place.
class PieceParser {
  public:
    PieceParser(const TextWindow& window, const LineCounter& lines)
        : window_(window), lines_(lines) {}
    PieceParser(const PieceParser&) = delete;
    PieceParser& operator=(const PieceParser&) = delete;

    // The elements of the nodes of [from, to), parsed as a fragment, into `out`. A
    // declaration or DOCTYPE among the nodes ends them: it is returned (the elements before
    // it are in `out`), for the caller to refuse; else an empty node.
    pugi::xml_node ParseNodes(int64_t from, int64_t to, XmlElements& out);

    // The element of the start tag [at, end) named `name`, parsed alone (closed by its end
    // tag unless it is an empty-element tag), into `out`: its attributes, no children.
    void ParseStartTag(int64_t at, int64_t end, bool emptyTag, std::string_view name,
                       XmlElements& out);

    [[noreturn]] void Fail(const pugi::xml_node& node, std::string cause) const;

  private:
    void Copy(int64_t from, int64_t to);
    void Parse(unsigned flags);
    // The text offsets of what the last parse found.
    int64_t OffsetInCopy(const char* p) const;
    int64_t OffsetOf(const pugi::xml_node& node) const;
    // Appends the element, and its descendant elements unless `alone`, to `out`.
    void Flatten(const pugi::xml_node& element, bool alone, XmlElements& out) const;

    const TextWindow& window_;
    const LineCounter& lines_;
    std::vector<char> copy_;
    int64_t copyOffset_ = 0;       // the text offset of copy_[0]
    std::size_t copiedBytes_ = 0;  // bytes of copy_ that come from the text
    pugi::xml_document doc_;
};

}  // namespace vtr::seqlib::detail
