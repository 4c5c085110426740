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
        lines_.FailAt(OffsetInCopy(copy_.data() + result.offset),
                      ParserMessage(result.description()));
    }
}

pugi::xml_node PieceParser::ParseNodes(int64_t from, int64_t to, XmlElements& out) {
    out.Clear();
    Copy(from, to);
    Parse(kPieceFlags);
    for (pugi::xml_node node = doc_.first_child(); node; node = node.next_sibling()) {
        switch (node.type()) {
            case pugi::node_element:
                Flatten(node, false, out);
                break;
            case pugi::node_declaration:
            case pugi::node_doctype:
                return node;
            default:
                break;
        }
    }
    return {};
}

void PieceParser::ParseStartTag(int64_t at, int64_t end, bool emptyTag, std::string_view name,
                                XmlElements& out) {
    out.Clear();
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
    Flatten(element, true, out);
}

void PieceParser::Flatten(const pugi::xml_node& element, bool alone, XmlElements& out) const {
    // Depth first, without recursion: a piece may nest elements thousands deep.
    std::vector<uint32_t> open;
    pugi::xml_node node = element;
    for (;;) {
        const uint32_t index = out.Open(node.name(), OffsetOf(node));
        for (pugi::xml_attribute a = node.first_attribute(); a; a = a.next_attribute())
            out.AddAttribute(a.name(), a.value(), OffsetInCopy(a.name()));
        pugi::xml_node child = alone ? pugi::xml_node() : node.first_child();
        while (child && child.type() != pugi::node_element)
            child = child.next_sibling();
        if (child) {
            open.push_back(index);
            node = child;
            continue;
        }
        out.Close(index);
        // On to the next element after this one, closing the elements that end here.
        for (;;) {
            if (node == element)
                return;
            pugi::xml_node next = node.next_sibling();
            while (next && next.type() != pugi::node_element)
                next = next.next_sibling();
            if (next) {
                node = next;
                break;
            }
            node = node.parent();
            out.Close(open.back());
            open.pop_back();
        }
    }
}

int64_t PieceParser::OffsetInCopy(const char* p) const {
    const char* begin = copy_.data();
    std::size_t at =
        (p >= begin && p <= begin + copy_.size()) ? static_cast<std::size_t>(p - begin) : 0;
    at = std::min(at, copiedBytes_);
    return copyOffset_ + static_cast<int64_t>(at);
}

int64_t PieceParser::OffsetOf(const pugi::xml_node& node) const {
    const ptrdiff_t offset = node.offset_debug();
    if (offset < 0)
        return copyOffset_;
    // Elements are found by their name, one byte after the "<".
    const ptrdiff_t back = node.type() == pugi::node_element && offset > 0 ? 1 : 0;
    return OffsetInCopy(copy_.data() + offset - back);
}

void PieceParser::Fail(const pugi::xml_node& node, std::string cause) const {
    lines_.FailAt(OffsetOf(node), std::move(cause));
}

}  // namespace vtr::seqlib::detail
