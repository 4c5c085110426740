#include "sequencelib/PieceParser.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <string>

#include "sequencelib/LoadFailure.h"
#include "sequencelib/TextWindow.h"

namespace vtr::seqlib::detail {

namespace {

// Pieces are parsed as fragments; declarations and DOCTYPEs are kept as nodes so that one
// standing between two elements is seen and refused.
constexpr unsigned kPieceFlags =
    pugi::parse_default | pugi::parse_fragment | pugi::parse_declaration | pugi::parse_doctype;
constexpr unsigned kTagFlags = pugi::parse_default | pugi::parse_declaration | pugi::parse_doctype;

std::string ParserMessage(const char* description) {
    std::string text = description;
    if (!text.empty())
        text[0] = static_cast<char>(std::tolower(static_cast<unsigned char>(text[0])));
    return "the XML is not well-formed (" + text + ")";
}

}  // namespace

void PieceParser::Copy(int64_t from, int64_t to) {
    const char* text = window_.At(from);
    copy_.assign(text, text + (to - from));
    copyOffset_ = from;
    copiedBytes_ = static_cast<std::size_t>(to - from);
}

void PieceParser::Parse(unsigned flags) {
    if (const void* nul = std::memchr(copy_.data(), 0, copy_.size()))
        lines_.FailAt(copyOffset_ + (static_cast<const char*>(nul) - copy_.data()),
                      "a NUL character in the text");
    const pugi::xml_parse_result result =
        doc_.load_buffer_inplace(copy_.data(), copy_.size(), flags, pugi::encoding_utf8);
    if (!result) {
        FailLoad(PlaceText(PlaceInCopy(copy_.data() + result.offset)),
                 ParserMessage(result.description()));
    }
}

const pugi::xml_document& PieceParser::ParseNodes(int64_t from, int64_t to) {
    Copy(from, to);
    Parse(kPieceFlags);
    return doc_;
}

pugi::xml_node PieceParser::ParseStartTag(int64_t at, int64_t end, bool emptyTag,
                                          std::string_view name) {
    Copy(at, end);
    if (!emptyTag) {
        copy_.push_back('<');
        copy_.push_back('/');
        copy_.insert(copy_.end(), name.begin(), name.end());
        copy_.push_back('>');
    }
    Parse(kTagFlags);
    const pugi::xml_node element = doc_.last_child();
    if (element.type() != pugi::node_element || name != element.name())
        lines_.FailAt(at, "the start tag is malformed");
    return element;
}

TextPlace PieceParser::PlaceInCopy(const char* p) const {
    const char* begin = copy_.data();
    std::size_t at =
        (p >= begin && p <= begin + copy_.size()) ? static_cast<std::size_t>(p - begin) : 0;
    at = std::min(at, copiedBytes_);
    return lines_.PlaceAt(copyOffset_ + static_cast<int64_t>(at));
}

TextPlace PieceParser::PlaceOf(const pugi::xml_node& node) const {
    const ptrdiff_t offset = node.offset_debug();
    if (offset < 0)
        return lines_.PlaceAt(copyOffset_);
    // Elements are found by their name, one byte after the "<".
    const ptrdiff_t back = node.type() == pugi::node_element && offset > 0 ? 1 : 0;
    return PlaceInCopy(copy_.data() + offset - back);
}

TextPlace PieceParser::PlaceOf(const pugi::xml_attribute& attribute) const {
    return PlaceInCopy(attribute.name());
}

void PieceParser::Fail(const pugi::xml_node& node, std::string cause) const {
    FailLoad(PlaceText(PlaceOf(node)), std::move(cause));
}

}  // namespace vtr::seqlib::detail
