#pragma once

#include <bit>
#include <cstddef>
#include <cstring>

#if defined(__SSE2__) || defined(_M_X64)
#include <emmintrin.h>
#define VTR_SCAN_SSE2 1
#endif

namespace vtr::seqlib::detail {

// Searches of held bytes for the markup lexer and the cut finder, sixteen bytes at a time
// where the processor allows. Markup is dense: the byte sought is usually a few bytes on,
// where a library call costs more than the search.

// The first byte in [p, end) equal to a, b or c; end when there is none.
inline const char* FindFirstOf(const char* p, const char* end, char a, char b, char c) {
#ifdef VTR_SCAN_SSE2
    const __m128i va = _mm_set1_epi8(a);
    const __m128i vb = _mm_set1_epi8(b);
    const __m128i vc = _mm_set1_epi8(c);
    for (; end - p >= 16; p += 16) {
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        const __m128i hits = _mm_or_si128(
            _mm_or_si128(_mm_cmpeq_epi8(v, va), _mm_cmpeq_epi8(v, vb)), _mm_cmpeq_epi8(v, vc));
        if (const auto mask = static_cast<unsigned>(_mm_movemask_epi8(hits)); mask != 0)
            return p + std::countr_zero(mask);
    }
#endif
    while (p < end && *p != a && *p != b && *p != c)
        ++p;
    return p;
}

// The end of a tag whose bytes from p on are held up to end: the '>' outside quoted
// values, found sixteen bytes at a time, every quote in the block handled from the same
// three masks. `quote` carries an open quoted value from one call to the next. Returns end
// when the tag goes on past it.
inline const char* FindTagEnd(const char* p, const char* end, char& quote) {
#ifdef VTR_SCAN_SSE2
    const __m128i gt = _mm_set1_epi8('>');
    const __m128i dq = _mm_set1_epi8('"');
    const __m128i sq = _mm_set1_epi8('\'');
    for (; end - p >= 16; p += 16) {
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        const auto gts = static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(v, gt)));
        const auto dqs = static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(v, dq)));
        const auto sqs = static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(v, sq)));
        unsigned seen = 0;  // the bits up to the last one handled
        for (;;) {
            const unsigned sought = quote == 0 ? (gts | dqs | sqs) : quote == '"' ? dqs : sqs;
            const unsigned ahead = sought & ~seen;
            if (ahead == 0)
                break;
            const int at = std::countr_zero(ahead);
            seen = (2u << at) - 1;
            if (quote != 0) {
                quote = 0;
            } else if (p[at] == '>') {
                return p + at;
            } else {
                quote = p[at];
            }
        }
    }
#endif
    for (; p < end; ++p) {
        if (quote != 0) {
            if (*p == quote)
                quote = 0;
        } else if (*p == '>') {
            return p;
        } else if (*p == '"' || *p == '\'') {
            quote = *p;
        }
    }
    return end;
}

// The first byte in [p, end) that is a control character (below 0x20), a quote, '<' or
// '&': where a plain attribute value ends, or stops being plain. End when there is none.
inline const char* FindValueStop(const char* p, const char* end) {
#ifdef VTR_SCAN_SSE2
    const __m128i control = _mm_set1_epi8(0x1F);
    const __m128i dq = _mm_set1_epi8('"');
    const __m128i sq = _mm_set1_epi8('\'');
    const __m128i lt = _mm_set1_epi8('<');
    const __m128i amp = _mm_set1_epi8('&');
    for (; end - p >= 16; p += 16) {
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        const __m128i low = _mm_cmpeq_epi8(_mm_min_epu8(v, control), v);
        const __m128i hits =
            _mm_or_si128(_mm_or_si128(low, _mm_cmpeq_epi8(v, dq)),
                         _mm_or_si128(_mm_cmpeq_epi8(v, sq),
                                      _mm_or_si128(_mm_cmpeq_epi8(v, lt), _mm_cmpeq_epi8(v, amp))));
        if (const auto mask = static_cast<unsigned>(_mm_movemask_epi8(hits)); mask != 0)
            return p + std::countr_zero(mask);
    }
#endif
    while (p < end && static_cast<unsigned char>(*p) >= 0x20 && *p != '"' && *p != '\'' &&
           *p != '<' && *p != '&')
        ++p;
    return p;
}

// True for the bytes that may go on in a plain name: ASCII letters, digits, '_', '-', '.'
// and ':'.
inline bool IsPlainNameByte(char c) {
    const auto u = static_cast<unsigned char>(c);
    return static_cast<unsigned char>((u | 0x20u) - 'a') <= 25 ||
           static_cast<unsigned char>(u - '0') <= 9 || c == '_' || c == '-' || c == '.' || c == ':';
}
// The first byte in [p, end) that cannot go on in a plain name; end when there is none.
inline const char* FindNameEnd(const char* p, const char* end) {
#ifdef VTR_SCAN_SSE2
    const __m128i caseBit = _mm_set1_epi8(0x20);
    const __m128i a = _mm_set1_epi8('a');
    const __m128i z = _mm_set1_epi8(25);
    const __m128i zero = _mm_set1_epi8('0');
    const __m128i nine = _mm_set1_epi8(9);
    for (; end - p >= 16; p += 16) {
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        const __m128i letter = _mm_sub_epi8(_mm_or_si128(v, caseBit), a);
        const __m128i digit = _mm_sub_epi8(v, zero);
        const __m128i named =
            _mm_or_si128(_mm_or_si128(_mm_cmpeq_epi8(_mm_min_epu8(letter, z), letter),
                                      _mm_cmpeq_epi8(_mm_min_epu8(digit, nine), digit)),
                         _mm_or_si128(_mm_or_si128(_mm_cmpeq_epi8(v, _mm_set1_epi8('_')),
                                                   _mm_cmpeq_epi8(v, _mm_set1_epi8('-'))),
                                      _mm_or_si128(_mm_cmpeq_epi8(v, _mm_set1_epi8('.')),
                                                   _mm_cmpeq_epi8(v, _mm_set1_epi8(':')))));
        const auto others = static_cast<unsigned>(_mm_movemask_epi8(named)) ^ 0xFFFFu;
        if (others != 0)
            return p + std::countr_zero(others);
    }
#endif
    while (p < end && IsPlainNameByte(*p))
        ++p;
    return p;
}

// The first `c` in [p, end); end when there is none. Long runs go to memchr.
inline const char* FindByte(const char* p, const char* end, char c) {
    const char* const near = end - p > 64 ? p + 64 : end;
    const char* hit = FindFirstOf(p, near, c, c, c);
    if (hit != near || near == end)
        return hit;
    const void* far = std::memchr(near, c, static_cast<std::size_t>(end - near));
    return far != nullptr ? static_cast<const char*>(far) : end;
}

}  // namespace vtr::seqlib::detail
