#include "sequencelib/TextPlaces.h"

#include <algorithm>
#include <cstring>
#include <string_view>

#include "sequencelib/ByteScan.h"
#include "sequencelib/LoadFailure.h"
#include "sequencelib/TextWindow.h"

namespace vtr::seqlib::detail {

namespace {

// The number of '\n' bytes, sixteen at a time where the processor allows.
int64_t CountNewlines(const char* p, std::size_t n) {
    int64_t count = 0;
    std::size_t i = 0;
#ifdef VTR_SCAN_SSE2
    // Each newline compares as 0xFF, that is -1: subtracting the comparisons counts them,
    // a byte per lane, summed every 255 blocks before a lane can overflow.
    const __m128i newline = _mm_set1_epi8('\n');
    while (i + 16 <= n) {
        __m128i lanes = _mm_setzero_si128();
        for (int blocks = 0; blocks < 255 && i + 16 <= n; ++blocks, i += 16) {
            const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i));
            lanes = _mm_sub_epi8(lanes, _mm_cmpeq_epi8(v, newline));
        }
        const __m128i sums = _mm_sad_epu8(lanes, _mm_setzero_si128());
        count += _mm_cvtsi128_si32(sums) + _mm_extract_epi16(sums, 4);
    }
#endif
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
