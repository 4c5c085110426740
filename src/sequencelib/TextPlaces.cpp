#include "sequencelib/TextPlaces.h"

#include <algorithm>
#include <cstring>
#include <string_view>

#include "sequencelib/LoadFailure.h"
#include "sequencelib/TextWindow.h"

namespace vtr::seqlib::detail {

namespace {

// The number of '\n' bytes, eight at a time.
int64_t CountNewlines(const char* p, std::size_t n) {
    constexpr uint64_t kNewlines = 0x0A0A0A0A0A0A0A0Aull;
    constexpr uint64_t kLow7 = 0x7F7F7F7F7F7F7F7Full;
    int64_t count = 0;
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8) {
        uint64_t word;
        std::memcpy(&word, p + i, 8);
        const uint64_t x = word ^ kNewlines;  // a zero byte where there is a newline
        const uint64_t nonzero = ((x & kLow7) + kLow7) | x;
        // One bit (the top one) per newline byte; gather them into the low byte.
        const uint64_t marks = ~(nonzero | kLow7) >> 7;
        count += static_cast<int64_t>((marks * 0x0101010101010101ull) >> 56);
    }
    for (; i < n; ++i)
        count += p[i] == '\n';
    return count;
}

}  // namespace

std::string PlaceText(const TextPlace& place) {
    return "line " + std::to_string(place.line) + ", column " + std::to_string(place.column);
}

TextPlace LineCounter::PlaceAt(int64_t offset) const {
    offset = std::clamp<int64_t>(offset, baseOffset_, std::max(baseOffset_, window_.End()));
    if (cursorOffset_ < baseOffset_ || cursorOffset_ > offset) {
        cursorOffset_ = baseOffset_;
        cursorLine_ = baseLine_;
        cursorLineStart_ = baseLineStart_;
    }
    if (offset > cursorOffset_) {
        const char* from = window_.At(cursorOffset_);
        const auto n = static_cast<std::size_t>(offset - cursorOffset_);
        if (const int64_t lines = CountNewlines(from, n); lines > 0) {
            cursorLine_ += lines;
            cursorLineStart_ =
                cursorOffset_ + static_cast<int64_t>(std::string_view(from, n).rfind('\n')) + 1;
        }
        cursorOffset_ = offset;
    }
    return {cursorLine_, offset - cursorLineStart_ + 1};
}

void LineCounter::Rebase(int64_t offset) {
    if (offset <= baseOffset_)
        return;
    const TextPlace place = PlaceAt(offset);
    baseOffset_ = cursorOffset_;
    baseLine_ = place.line;
    baseLineStart_ = cursorLineStart_;
}

void LineCounter::FailAt(int64_t offset, std::string cause) const {
    FailLoad(PlaceText(PlaceAt(offset)), std::move(cause));
}

}  // namespace vtr::seqlib::detail
