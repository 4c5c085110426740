#pragma once

#include <cstdint>
#include <string>

namespace vtr::seqlib::detail {

class TextWindow;

// A place in the text, both counted from 1 (the column in bytes).
struct TextPlace {
    int64_t line = 1;
    int64_t column = 1;
};

// "line 3, column 5"
std::string PlaceText(const TextPlace& place);

// The line and column of any held offset of a text window. Lines are known exactly at a
// starting point, which follows the reader forward (Rebase, before the window forgets the
// bytes behind it); a cursor moves forward from there, so asking for places in increasing
// order costs one pass over the bytes.
class LineCounter {
  public:
    explicit LineCounter(const TextWindow& window) : window_(window) {}

    // The place of the offset, which must be at or after the starting point and held (an
    // offset outside is taken as the nearest one inside).
    TextPlace PlaceAt(int64_t offset) const;

    // Makes `offset` the starting point; the window may then forget the bytes before it.
    void Rebase(int64_t offset);

    // Raises the load failure with the place of the offset.
    [[noreturn]] void FailAt(int64_t offset, std::string cause) const;

  private:
    const TextWindow& window_;
    int64_t baseOffset_ = 0;
    int64_t baseLine_ = 1;
    int64_t baseLineStart_ = 0;  // offset of the first byte of the base's line
    mutable int64_t cursorOffset_ = 0;
    mutable int64_t cursorLine_ = 1;
    mutable int64_t cursorLineStart_ = 0;
};

}  // namespace vtr::seqlib::detail
