#pragma once

#include <pugixml.hpp>

#include <cstdint>
#include <string_view>
#include <vector>

#include "sequencelib/TextPlaces.h"

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

    // The nodes of [from, to), parsed as a fragment (declarations and DOCTYPEs are kept as
    // nodes, so that one where it does not belong is seen).
    const pugi::xml_document& ParseNodes(int64_t from, int64_t to);

    // The element of the start tag [at, end) named `name`, parsed alone (closed by its end
    // tag unless it is an empty-element tag): its attributes, no children.
    pugi::xml_node ParseStartTag(int64_t at, int64_t end, bool emptyTag, std::string_view name);

    // Where a node or attribute of the last parse stands (valid until the next parse, and
    // while the window holds its text).
    TextPlace PlaceOf(const pugi::xml_node& node) const;
    TextPlace PlaceOf(const pugi::xml_attribute& attribute) const;

    [[noreturn]] void Fail(const pugi::xml_node& node, std::string cause) const;

  private:
    void Copy(int64_t from, int64_t to);
    void Parse(unsigned flags);
    TextPlace PlaceInCopy(const char* p) const;

    const TextWindow& window_;
    const LineCounter& lines_;
    std::vector<char> copy_;
    int64_t copyOffset_ = 0;       // the text offset of copy_[0]
    std::size_t copiedBytes_ = 0;  // bytes of copy_ that come from the text
    pugi::xml_document doc_;
};

}  // namespace vtr::seqlib::detail
