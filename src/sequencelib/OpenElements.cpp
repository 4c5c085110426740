#include "sequencelib/OpenElements.h"

#include "sequencelib/LoadFailure.h"
#include "sequencelib/MarkupLexer.h"

namespace vtr::seqlib::detail {

void OpenElements::Push(std::string_view name, int64_t at) {
    if (names_.size() + name.size() > kMaxNameBytes) {
        lines_.FailAt(at, "the names of the elements open here are longer than " +
                              ByteCountText(kMaxNameBytes) + " in all");
    }
    places_.push_back(lines_.PlaceAt(at));
    nameStarts_.push_back(names_.size());
    names_ += name;
}

void OpenElements::Pop() {
    names_.resize(nameStarts_.back());
    nameStarts_.pop_back();
    places_.pop_back();
}

std::string_view OpenElements::InnermostName() const {
    return std::string_view(names_).substr(nameStarts_.back());
}

std::string OpenElements::OpenedText() const {
    return "<" + std::string(InnermostName()) + "> opened at " + PlaceText(InnermostPlace());
}

void OpenElements::CheckEndTag(std::string_view tag, int64_t at) const {
    // "</", the name, blanks, ">"
    const std::size_t last = tag.size() - 1;
    std::size_t i = 2;
    while (i < last && !MarkupLexer::IsSpace(tag[i]))
        ++i;
    const std::string_view name = tag.substr(2, i - 2);
    while (i < last && MarkupLexer::IsSpace(tag[i]))
        ++i;
    if (name != InnermostName()) {
        lines_.FailAt(at,
                      "the end tag </" + std::string(name) + "> does not match " + OpenedText());
    }
    if (i != last)
        lines_.FailAt(at, "the end tag </" + std::string(name) + "> is malformed");
}

void OpenElements::FailUnclosed(int64_t at) const {
    lines_.FailAt(at, "the data ends before the end tag of <" + std::string(InnermostName()) +
                          "> (opened at " + PlaceText(InnermostPlace()) + ")");
}

}  // namespace vtr::seqlib::detail
