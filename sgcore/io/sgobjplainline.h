#pragma once

#include "sgcore/geometry/sgpolymesh.h"

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

// The three lines that make up nearly all of a big OBJ file, in their plain forms, read at word
// speed for SgObjReader:
//   "v x y z"        three short numbers
//   "vt u v"         two short numbers
//   "f a/b/c ..."    3 to 255 corners of positive indices (v, v/vt, v//vn, v/vt/vn)
// A short number is [-]digits[.digits] with at most eight digits (seven after the point) and no
// exponent;
// an index has one to seven digits and no leading zero; blanks are spaces, tabs and '\r'.
//
// Each function reads one line from just after its keyword and returns the start of the next
// line, or null when the line is not in its plain form (anything else: comments, signs,
// exponents, extra values, errors). Null takes nothing, so the caller reads the line again with
// its general reader, which accepts every plain line with the same result; numbers convert
// exactly as std::from_chars does (correctly rounded).
//
// Speed: a line of up to 64 bytes is classified in one sweep of 16-byte compares into bit masks
// (digits, points, signs, slashes, blanks, line end); the numbers' places then come from the
// masks, not from the bytes read before them, so their conversions overlap. Longer faces go
// through a word-at-a-time scan. Every read stays below `limit`, which must leave kReadAhead
// readable bytes behind it: the caller calls only while the line starts before `limit`.
namespace SgObjPlainLine {

constexpr std::ptrdiff_t kReadAhead = 96;

// The largest index of each kind on a face line (0 when the kind is absent).
struct FaceIndexMax {
    std::uint32_t vertex = 0, uv = 0, normal = 0;
};

namespace detail {

constexpr double kPowersOfTen[] = {1e0, 1e1, 1e2,  1e3,  1e4,  1e5,  1e6,  1e7,
                                   1e8, 1e9, 1e10, 1e11, 1e12, 1e13, 1e14, 1e15};

// The value of the first `count` (1 to 8) decimal digits of the word `chunk` (in memory
// order).
[[gnu::always_inline]] inline std::uint32_t wordValue(std::uint64_t chunk, int count) {
    // The digits to the top of the word and zeros below them make eight digits with leading
    // zeros, combined pairwise.
    chunk <<= 8 * (8 - count);
    chunk = ((chunk & 0x0F0F0F0F0F0F0F0Fu) * 2561) >> 8;
    chunk = ((chunk & 0x00FF00FF00FF00FFu) * 6553601) >> 16;
    return static_cast<std::uint32_t>(((chunk & 0x0000FFFF0000FFFFu) * 42949672960001u) >> 32);
}

// The value of the `count` (1 to 8) decimal digits at `p`; `p` must have 8 readable bytes.
[[gnu::always_inline]] inline std::uint32_t digitsValue(const char *p, int count) {
    std::uint64_t chunk = 0;
    std::memcpy(&chunk, p, 8);
    return wordValue(chunk, count);
}

// How many decimal digits start at `p` (8 when the run may go on); `p` must have 8 readable
// bytes. A digit byte (0x30 to 0x39) keeps 3 in its high nibble after adding 6, every other
// byte does not (a carry out of a non-digit only reaches the bytes after it).
[[gnu::always_inline]] inline int digitCount(const char *p) {
    std::uint64_t chunk = 0;
    std::memcpy(&chunk, p, 8);
    const std::uint64_t nibbles = (chunk & 0xF0F0F0F0F0F0F0F0u) |
                                  (((chunk + 0x0606060606060606u) & 0xF0F0F0F0F0F0F0F0u) >> 4);
    const std::uint64_t others = nibbles ^ 0x3333333333333333u;
    return others ? std::countr_zero(others) / 8 : 8;
}

constexpr double kInversePowersOfTen[] = {1e0, 1e-1, 1e-2, 1e-3, 1e-4, 1e-5, 1e-6, 1e-7};

// The float nearest to ±mantissa / 10^fractionDigits (mantissa below 10^15, at most fifteen
// fraction digits), as std::from_chars rounds it; false in the one case this cannot decide.
[[gnu::always_inline]] inline bool toFloat(bool negative, std::uint64_t mantissa,
                                           int fractionDigits, float &out) {
    if (mantissa <= (1u << 24) && fractionDigits <= 7) {
        // A double product with the rounded inverse is within 2^-52 of the quotient, relative,
        // while such a quotient lies at least 2^-48 (relative) from any point halfway between
        // two floats (it would need 25 significant bits for a mantissa of at most 24), so it
        // rounds to the same float.
        const float value = float(double(mantissa) * kInversePowersOfTen[fractionDigits]);
        out = negative ? -value : value;
        return true;
    }
    // Otherwise one division of exact values (a mantissa of at most 53 bits, a power of ten
    // up to 10^22) rounds the double correctly, and rounding that
    // to float is correct unless it lies exactly halfway between two floats (its 29 bits
    // beyond a float's 24 are exactly one half).
    const double value = double(mantissa) / kPowersOfTen[fractionDigits];
    std::uint64_t bits = 0;
    std::memcpy(&bits, &value, sizeof bits);
    if ((bits & 0x1FFFFFFFu) == 0x10000000u)
        return false;
    out = negative ? -float(value) : float(value);
    return true;
}

// Digits, blanks and the line's end among 64 bytes, one bit per byte; only up to the 16-byte
// block that holds the first line end.
struct Masks {
    std::uint64_t digit = 0, blank = 0, end = 0;
};

inline Masks classify(const char *p) {
    Masks m;
#if defined(__SSE2__)
    const __m128i zero = _mm_set1_epi8('0'), nine = _mm_set1_epi8(9);
    const __m128i space = _mm_set1_epi8(' '), tab = _mm_set1_epi8('\t');
    const __m128i cr = _mm_set1_epi8('\r'), newline = _mm_set1_epi8('\n');
    for (int i = 0; i < 64; i += 16) {
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i *>(p + i));
        const __m128i d = _mm_sub_epi8(v, zero);
        const __m128i blank = _mm_or_si128(
            _mm_or_si128(_mm_cmpeq_epi8(v, space), _mm_cmpeq_epi8(v, tab)), _mm_cmpeq_epi8(v, cr));
        m.digit |= std::uint64_t(
                       std::uint16_t(_mm_movemask_epi8(_mm_cmpeq_epi8(_mm_min_epu8(d, nine), d))))
                   << i;
        m.blank |= std::uint64_t(std::uint16_t(_mm_movemask_epi8(blank))) << i;
        m.end |= std::uint64_t(std::uint16_t(_mm_movemask_epi8(_mm_cmpeq_epi8(v, newline)))) << i;
        if (m.end)
            break;
    }
#else
    for (int i = 0; i < 64 && !m.end; ++i) {
        const char c = p[i];
        const std::uint64_t bit = std::uint64_t(1) << i;
        m.digit |= static_cast<unsigned>(c - '0') < 10 ? bit : 0;
        m.blank |= (c == ' ' || c == '\t' || c == '\r') ? bit : 0;
        m.end |= c == '\n' ? bit : 0;
    }
#endif
    return m;
}

// The length of the run of set bits of `mask` from bit `at` (below 64).
[[gnu::always_inline]] inline int runLength(std::uint64_t mask, int at) {
    return std::countr_one(mask >> at);
}

[[gnu::always_inline]] inline bool bitAt(std::uint64_t mask, int at) {
    return (mask >> at) & 1u;
}

// The first byte of each blank-separated word of a line of up to 64 bytes; 0 when the line is
// longer.
[[gnu::always_inline]] inline std::uint64_t wordStarts(const Masks &m, int &length) {
    if (m.end == 0)
        return 0;
    length = std::countr_zero(m.end);
    const std::uint64_t words = ~m.blank & ((std::uint64_t(1) << length) - 1);
    return words & ~(words << 1);
}

// Reads `count` blank-separated short numbers of a line of up to 64 bytes from the masks.
inline const char *numbersInWindow(const char *p, float *out, int count) {
    const Masks m = classify(p);
    int length = 0;
    std::uint64_t starts = wordStarts(m, length);
    const std::uint64_t stops = m.blank | m.end;
    int k = 0;
    for (; starts != 0 && k < count; ++k, starts &= starts - 1) {
        int at = std::countr_zero(starts);
        const bool negative = p[at] == '-';
        at += negative;
        const char *digits = p + at;
        const int integerDigits = runLength(m.digit, at);
        at += integerDigits;
        const bool point = p[at] == '.';
        at += point;
        const int fractionDigits = point ? runLength(m.digit, at) : 0;
        at += fractionDigits;
        const int allDigits = integerDigits + fractionDigits;
        if (!bitAt(stops, at) || allDigits == 0 || allDigits > 8 || fractionDigits > 7)
            return nullptr;
        // The digits on both sides of the point as one word: the integer digits from the
        // word at the first digit, the rest from the word one byte further on.
        std::uint64_t before = 0, after = 0;
        std::memcpy(&before, digits, 8);
        std::memcpy(&after, digits + 1, 8);
        const std::uint64_t low = integerDigits ? ~std::uint64_t(0) >> (64 - 8 * integerDigits) : 0;
        const std::uint64_t word = point ? (before & low) | (after & ~low) : before;
        std::uint32_t mantissa = wordValue(word, allDigits);
        if (!toFloat(negative, mantissa, fractionDigits, out[k]))
            return nullptr;
    }
    return k == count && starts == 0 && m.end ? p + length + 1 : nullptr;
}

// One index of a face from the masks: one to seven digits, no leading zero.
[[gnu::always_inline]] inline bool indexInWindow(const char *p, const Masks &m, int &at,
                                                 std::int32_t &out, std::uint32_t &max) {
    const int digits = runLength(m.digit, at);
    if (digits == 0 || digits > 7 || p[at] == '0')
        return false;
    const std::uint32_t value = digitsValue(p + at, digits);
    max = value > max ? value : max;
    out = std::int32_t(value) - 1;
    at += digits;
    return true;
}

inline const char *faceInWindow(const char *p, SgFaceCorner *corners, int &count,
                                FaceIndexMax &max) {
    const Masks m = classify(p);
    int length = 0;
    const std::uint64_t stops = m.blank | m.end;
    count = 0;
    for (std::uint64_t starts = wordStarts(m, length); starts != 0; starts &= starts - 1) {
        SgFaceCorner &c = corners[count++];
        c.uv = -1;
        c.third = -1;
        int at = std::countr_zero(starts);
        if (!indexInWindow(p, m, at, c.vertex, max.vertex))
            return nullptr;
        if (p[at] == '/') {
            ++at;
            if (p[at] != '/' && !indexInWindow(p, m, at, c.uv, max.uv))
                return nullptr;
            if (p[at] == '/' && !indexInWindow(p, m, ++at, c.third, max.normal))
                return nullptr;
        }
        if (!bitAt(stops, at))
            return nullptr;
    }
    return m.end ? p + length + 1 : nullptr;
}

[[gnu::always_inline]] inline bool isBlank(char c) {
    return c == ' ' || c == '\t' || c == '\r';
}

// One index of a face, a word at a time.
[[gnu::always_inline]] inline const char *indexInWords(const char *p, std::int32_t &out,
                                                       std::uint32_t &max) {
    const int digits = digitCount(p);
    if (digits == 0 || digits == 8 || *p == '0')
        return nullptr;
    const std::uint32_t value = digitsValue(p, digits);
    max = value > max ? value : max;
    out = std::int32_t(value) - 1;
    return p + digits;
}

// A face line longer than the window, a word at a time.
inline const char *faceInWords(const char *p, const char *limit, SgFaceCorner *corners, int &count,
                               FaceIndexMax &max) {
    count = 0;
    while (p < limit && isBlank(*p))
        ++p;
    while (p < limit && *p != '\n') {
        if (count == SgPolyMesh::kMaxPolygonCorners)
            return nullptr;
        SgFaceCorner &c = corners[count++];
        c = SgFaceCorner();
        if (!(p = indexInWords(p, c.vertex, max.vertex)))
            return nullptr;
        if (*p == '/') {
            ++p;
            if (*p != '/' && !(p = indexInWords(p, c.uv, max.uv)))
                return nullptr;
            if (*p == '/' && !(p = indexInWords(p + 1, c.third, max.normal)))
                return nullptr;
        }
        if (!isBlank(*p) && *p != '\n')
            return nullptr;
        while (p < limit && isBlank(*p))
            ++p;
    }
    return p < limit ? p + 1 : nullptr;
}

} // namespace detail

// "v": `p` just after the keyword.
inline const char *vertex(const char *p, float out[3]) {
    return detail::numbersInWindow(p, out, 3);
}

// "vt": `p` just after the keyword.
inline const char *uv(const char *p, float out[2]) {
    return detail::numbersInWindow(p, out, 2);
}

// "f": `p` just after the keyword; `corners` has room for 255. Sets the corner count (3 or
// more on success) and the line's largest indices.
inline const char *face(const char *p, const char *limit, SgFaceCorner *corners, int &count,
                        FaceIndexMax &max) {
    max = FaceIndexMax();
    const char *next = detail::faceInWindow(p, corners, count, max);
    if (!next) {
        max = FaceIndexMax();
        next = detail::faceInWords(p, limit, corners, count, max);
    }
    return next && count >= 3 ? next : nullptr;
}

} // namespace SgObjPlainLine
