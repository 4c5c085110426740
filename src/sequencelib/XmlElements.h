#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace vtr::seqlib::detail {

struct XmlAttribute {
    std::string_view name;
    std::string_view value;  // as the document means it (references replaced)
    int64_t at = 0;          // the text offset of the name
};

struct XmlElement {
    std::string_view name;
    int64_t at = 0;  // the text offset of its '<'
    uint32_t firstAttribute = 0;
    uint32_t attributeCount = 0;
    uint32_t end = 0;  // the index one past its last descendant
};

// The elements of a part of the document, flat and in document order: each element is
// followed by its descendants, and its attributes are in a run of their own. Names and
// values view text the reader holds, valid until the reader moves on.
class XmlElements {
  public:
    void Clear() {
        elements_.clear();
        attributes_.clear();
    }
    void Reserve(std::size_t elements, std::size_t attributes) {
        elements_.reserve(elements);
        attributes_.reserve(attributes);
    }
    bool Empty() const { return elements_.empty(); }
    uint32_t Size() const { return static_cast<uint32_t>(elements_.size()); }
    uint32_t AttributeCount() const { return static_cast<uint32_t>(attributes_.size()); }
    const XmlElement& operator[](uint32_t index) const { return elements_[index]; }
    // Forgets the elements and attributes from those counts on.
    void Truncate(uint32_t elements, uint32_t attributes) {
        elements_.resize(elements);
        attributes_.resize(attributes);
    }

    // Appends an element; its attributes follow (before any of its children), and Close
    // ends it after its descendants.
    uint32_t Open(std::string_view name, int64_t at) {
        elements_.push_back({name, at, static_cast<uint32_t>(attributes_.size()), 0, 0});
        return Size() - 1;
    }
    void AddAttribute(std::string_view name, std::string_view value, int64_t at) {
        attributes_.push_back({name, value, at});
        ++elements_.back().attributeCount;
    }
    void Close(uint32_t index) { elements_[index].end = Size(); }

    // The attributes of an element, for range-for.
    struct Attributes {
        const XmlAttribute* first;
        const XmlAttribute* last;
        const XmlAttribute* begin() const { return first; }
        const XmlAttribute* end() const { return last; }
    };
    Attributes AttributesOf(const XmlElement& element) const {
        const XmlAttribute* first = attributes_.data() + element.firstAttribute;
        return {first, first + element.attributeCount};
    }
    // The value of the first attribute of that name, or nullptr.
    const XmlAttribute* Find(const XmlElement& element, std::string_view name) const {
        for (const XmlAttribute& attribute : AttributesOf(element)) {
            if (attribute.name == name)
                return &attribute;
        }
        return nullptr;
    }

  private:
    std::vector<XmlElement> elements_;
    std::vector<XmlAttribute> attributes_;
};

}  // namespace vtr::seqlib::detail
