#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "sequencelib/TextPlaces.h"

namespace vtr::seqlib::detail {

// The elements the reader has entered (the document element first): their names and where
// they start, so that each end tag is checked against the element it closes and a document
// that ends too soon names the element left open. The names are kept together in one
// string; all of them together may not pass kMaxNameBytes.
class OpenElements {
  public:
    static constexpr std::size_t kMaxNameBytes = std::size_t{64} << 20;

    explicit OpenElements(const LineCounter& lines) : lines_(lines) {}

    bool Empty() const { return places_.empty(); }
    std::size_t Depth() const { return places_.size(); }

    // Enters the element named `name` whose start tag is at `at`.
    void Push(std::string_view name, int64_t at);
    void Pop();

    std::string_view InnermostName() const;
    const TextPlace& InnermostPlace() const { return places_.back(); }

    // Checks that the end tag `tag` ("</name>", with blanks before the '>' allowed), at
    // `at`, closes the innermost element.
    void CheckEndTag(std::string_view tag, int64_t at) const;

    // The text ends at `at` with the innermost element still open.
    [[noreturn]] void FailUnclosed(int64_t at) const;

  private:
    std::string OpenedText() const;

    const LineCounter& lines_;
    std::string names_;
    std::vector<std::size_t> nameStarts_;
    std::vector<TextPlace> places_;
};

}  // namespace vtr::seqlib::detail
