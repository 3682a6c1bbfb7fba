#pragma once

#include "sgcore/geometry/sgpolymesh.h"

#include <algorithm>
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
// exponent; an index has one to seven digits and is not 0 (on lines of up to 64 bytes leading
// zeros are read as the general reader reads them, on longer ones they are left to it); blanks
// are spaces, tabs and '\r'.
//
// Each function reads one line from just after its keyword, sets `next` to the start of the
// next line and returns true, or returns false when the line is not in its plain form (anything
// else: comments, signs, exponents, extra values, errors). False takes nothing, so the caller
// reads the line again with its general reader, which accepts every plain line with the same
// result; numbers convert exactly as std::from_chars does (correctly rounded). `next` comes
// from the line's shape alone, not from its numbers, so that the next line's reading need not
// wait for this line's numbers: the checks end in a branch that is predicted.
//
// Speed: a run of lines keeps its last line's shape (NumberShape, FaceShape): a line that
// matches its pattern (see LinePattern) skips the scans and checks and only converts its
// digits. Another line of up to 64 bytes is classified in one sweep of 16-byte compares into
// bit masks (digits, points, signs, slashes, blanks, line end), and the numbers' and indices'
// places come from the masks, not from the bytes read before them, so their conversions
// overlap. Numbers convert two at a time in SSE2 registers. Longer faces, and faces with an empty
// index ("v//vn"), go through a word-at-a-time scan. Every read stays below `limit`, which must
// leave kReadAhead readable bytes behind it: the caller calls only while the line starts before
// `limit`.
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

constexpr double kInversePowersOfTen[] = {1e0,  1e-1, 1e-2,  1e-3,  1e-4,  1e-5,  1e-6,  1e-7,
                                          1e-8, 1e-9, 1e-10, 1e-11, 1e-12, 1e-13, 1e-14, 1e-15};

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

// Digits, blanks, the line's end and up to two marks (none when 0) among 64 bytes, one bit per
// byte; only up to the 16-byte block that holds the first line end.
struct Masks {
    std::uint64_t digit = 0, blank = 0, end = 0, mark = 0, mark2 = 0;
};

template <char Mark, char Mark2 = Mark>
[[gnu::always_inline]] inline Masks classify(const char *p) {
    Masks m;
#if defined(__SSE2__)
    const __m128i zero = _mm_set1_epi8('0'), nine = _mm_set1_epi8(9);
    const __m128i space = _mm_set1_epi8(' '), tab = _mm_set1_epi8('\t');
    const __m128i cr = _mm_set1_epi8('\r'), newline = _mm_set1_epi8('\n');
    const __m128i mark = _mm_set1_epi8(Mark), mark2 = _mm_set1_epi8(Mark2);
#pragma GCC unroll 4
    for (int i = 0; i < 64; i += 16) {
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i *>(p + i));
        const __m128i d = _mm_sub_epi8(v, zero);
        const __m128i blank = _mm_or_si128(
            _mm_or_si128(_mm_cmpeq_epi8(v, space), _mm_cmpeq_epi8(v, tab)), _mm_cmpeq_epi8(v, cr));
        const auto bits = [i](__m128i x) {
            return std::uint64_t(std::uint16_t(_mm_movemask_epi8(x))) << i;
        };
        m.digit |= bits(_mm_cmpeq_epi8(_mm_min_epu8(d, nine), d));
        m.blank |= bits(blank);
        if constexpr (Mark != 0)
            m.mark |= bits(_mm_cmpeq_epi8(v, mark));
        if constexpr (Mark2 != Mark)
            m.mark2 |= bits(_mm_cmpeq_epi8(v, mark2));
        m.end |= bits(_mm_cmpeq_epi8(v, newline));
        if (m.end)
            break;
    }
#else
    for (int i = 0; i < 64 && !m.end; ++i) {
        const char c = p[i];
        const std::uint64_t bit = std::uint64_t(1) << i;
        m.digit |= static_cast<unsigned>(c - '0') < 10 ? bit : 0;
        m.blank |= (c == ' ' || c == '\t' || c == '\r') ? bit : 0;
        m.mark |= (Mark != 0 && c == Mark) ? bit : 0;
        m.mark2 |= (Mark2 != Mark && c == Mark2) ? bit : 0;
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

// The bytes of a line of up to 64 bytes (its end excluded) as a mask, and its length; 0 when the
// line is longer.
[[gnu::always_inline]] inline std::uint64_t lineBytes(const Masks &m, int &length) {
    if (m.end == 0)
        return 0;
    length = std::countr_zero(m.end);
    return (std::uint64_t(1) << length) - 1;
}

// The value of the eight digits of `word` (in memory order, leading zeros included).
[[gnu::always_inline]] inline std::uint32_t eightDigits(std::uint64_t word) {
    word = ((word & 0x0F0F0F0F0F0F0F0Fu) * 2561) >> 8;
    word = ((word & 0x00FF00FF00FF00FFu) * 6553601) >> 16;
    return static_cast<std::uint32_t>(((word & 0x0000FFFF0000FFFFu) * 42949672960001u) >> 32);
}

// A plain line as a pattern that the following lines of a run are matched against: a line of
// up to 64 bytes matches when it has a digit wherever the pattern's line has one and the same
// byte everywhere else up to and including the line end (bytes past it are free). Such a line
// has the pattern's line's masks (see classify), so its checks and its numbers' or indices'
// places are those of the pattern's line: only its digits are converted. Consecutive lines of a
// big file mostly match (numbers printed with the same digits, indices of the same lengths).
// Cost: four 16-byte compares per match, the line's end included; setting it about as much.
struct LinePattern {
    // '0' at the line's digits and the line's byte elsewhere; past the line's end anything.
    alignas(16) std::uint8_t base[64];
    // What a byte may exceed `base` by: 9 at digits, 0 at the line's other bytes, 255 past its
    // end.
    alignas(16) std::uint8_t range[64];
    // The line's length, its end excluded; -1 for no pattern (matches no line).
    int length = -1;

    [[gnu::always_inline]] inline bool matches(const char *p) const {
#if defined(__SSE2__)
        __m128i ok = _mm_set1_epi8(-1);
#pragma GCC unroll 4
        for (int i = 0; i < 64; i += 16) {
            const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i *>(p + i));
            const __m128i d =
                _mm_sub_epi8(v, _mm_load_si128(reinterpret_cast<const __m128i *>(base + i)));
            const __m128i r = _mm_load_si128(reinterpret_cast<const __m128i *>(range + i));
            ok = _mm_and_si128(ok, _mm_cmpeq_epi8(_mm_min_epu8(d, r), d));
        }
        return length >= 0 && _mm_movemask_epi8(ok) == 0xFFFF;
#else
        bool ok = length >= 0;
        for (int i = 0; i < 64; ++i)
            ok &= std::uint8_t(std::uint8_t(p[i]) - base[i]) <= range[i];
        return ok;
#endif
    }

    // Makes the line at `p`, of `length` (0 to 63) bytes before its '\n', the pattern.
    inline void set(const char *p, int lineLength) {
        length = lineLength;
        for (int i = 0; i < 64; ++i) {
            const auto c = std::uint8_t(p[i]);
            const bool digit = std::uint8_t(c - '0') < 10;
            base[i] = i > length ? 0 : digit ? '0' : c;
            range[i] = i > length ? 255 : digit ? 9 : 0;
        }
    }
};

// What a plain line of numbers' masks say about each number.
struct NumberShape {
    struct Number {
        std::uint64_t low;  // the bytes of the integer digits, or all bytes without a point
        int digitsAt;       // the first digit
        int shift;          // the bits that put the digits at the top of a word
        int fractionDigits; // digits after the point
        bool negative;
    };
    LinePattern pattern;
    Number numbers[3];
    // The same numbers for numberPair, the last one repeated up to four: the first digit's
    // place, the digits' bytes in the word there and in the word one byte further on, the
    // power of ten that scales the digits' word value to the number, and the sign bit.
    alignas(16) std::uint64_t pairLow[4], pairHigh[4];
    alignas(16) double pairScale[4];
    alignas(16) std::int32_t pairAt[4];
    alignas(16) std::uint32_t pairSign[4];
};

// The bytes below `count` (0 to 8) of a word.
constexpr std::uint64_t kLowBytes[9] = {0,
                                        0xFF,
                                        0xFFFF,
                                        0xFFFFFF,
                                        0xFFFFFFFF,
                                        0xFFFFFFFFFF,
                                        0xFFFFFFFFFFFF,
                                        0xFFFFFFFFFFFFFF,
                                        ~std::uint64_t(0)};

// Finds and checks `count` blank-separated short numbers of a line of up to 64 bytes from its
// masks ('.' the mark, '-' the second mark) into `shape`; false when the line is not plain.
inline bool numberShape(const Masks &m, int count, NumberShape &shape) {
    int length = 0;
    const std::uint64_t line = lineBytes(m, length);
    const std::uint64_t words = ~m.blank & line;
    std::uint64_t starts = words & ~(words << 1);
    const std::uint64_t stops = m.blank | m.end;
    int k = 0;
    for (; starts != 0 && k < count; ++k, starts &= starts - 1) {
        NumberShape::Number &n = shape.numbers[k];
        int at = std::countr_zero(starts);
        n.negative = bitAt(m.mark2, at);
        at += n.negative;
        n.digitsAt = at;
        const int integerDigits = runLength(m.digit, at);
        at += integerDigits;
        const bool point = bitAt(m.mark, at);
        at += point;
        n.fractionDigits = point ? runLength(m.digit, at) : 0;
        at += n.fractionDigits;
        const int allDigits = integerDigits + n.fractionDigits;
        if (!bitAt(stops, at) | (unsigned(allDigits - 1) > 7u) | (n.fractionDigits > 7))
            return false;
        // The digits on both sides of the point make one word: the integer digits from the
        // word at the first digit, the rest from the word one byte further on.
        n.low = point ? kLowBytes[integerDigits] : ~std::uint64_t(0);
        n.shift = 8 * (8 - allDigits);
        // Read as a word with the digits from its first byte on and zeros behind them, whose
        // value is the number times 10^(8 - allDigits + fractionDigits).
        shape.pairAt[k] = n.digitsAt;
        shape.pairLow[k] = kLowBytes[integerDigits];
        shape.pairHigh[k] = kLowBytes[allDigits] ^ kLowBytes[integerDigits];
        shape.pairScale[k] = kInversePowersOfTen[8 - allDigits + n.fractionDigits];
        shape.pairSign[k] = n.negative ? 0x80000000u : 0;
    }
    for (int i = k; i < 4 && k > 0; ++i) {
        shape.pairAt[i] = shape.pairAt[k - 1];
        shape.pairLow[i] = shape.pairLow[k - 1];
        shape.pairHigh[i] = shape.pairHigh[k - 1];
        shape.pairScale[i] = shape.pairScale[k - 1];
        shape.pairSign[i] = shape.pairSign[k - 1];
    }
    return k == count && starts == 0 && line;
}

#if defined(__SSE2__)
// The shape's numbers `i` and `i + 1` (i is 0 or 2) of a line of its form, as the two low
// floats of the result, converted side by side: the digits' word value (as wordValue gives it)
// times the rounded inverse power of ten, rounded to float. That is the float std::from_chars
// gives for every short number: for up to seven digits by toFloat's argument, and for eight
// (whose digits may exceed 2^24) as checked for every value, point place and digit count.
[[gnu::always_inline]] inline __m128 numberPair(const char *p, const NumberShape &s, int i) {
    const auto words = [&](int offset) {
        const __m128i first =
            _mm_loadl_epi64(reinterpret_cast<const __m128i *>(p + s.pairAt[i] + offset));
        return _mm_castpd_si128(
            _mm_loadh_pd(_mm_castsi128_pd(first),
                         reinterpret_cast<const double *>(p + s.pairAt[i + 1] + offset)));
    };
    const auto load = [](const void *x) {
        return _mm_load_si128(reinterpret_cast<const __m128i *>(x));
    };
    __m128i w = _mm_or_si128(_mm_and_si128(words(0), load(s.pairLow + i)),
                             _mm_and_si128(words(1), load(s.pairHigh + i)));
    // Digits to values, then pairs, fours and eights of them combined (see wordValue).
    w = _mm_and_si128(w, _mm_set1_epi8(0x0F));
    w = _mm_add_epi16(_mm_and_si128(_mm_mullo_epi16(w, _mm_set1_epi16(10)), _mm_set1_epi16(0xFF)),
                      _mm_srli_epi16(w, 8));
    w = _mm_madd_epi16(w, _mm_set1_epi32(0x00010064));
    w = _mm_add_epi64(_mm_mul_epu32(w, _mm_set1_epi64x(10000)), _mm_srli_epi64(w, 32));
    const __m128i values = _mm_shuffle_epi32(w, _MM_SHUFFLE(3, 3, 2, 0));
    const __m128d scaled = _mm_mul_pd(_mm_cvtepi32_pd(values), _mm_load_pd(s.pairScale + i));
    return _mm_xor_ps(
        _mm_cvtpd_ps(scaled),
        _mm_castsi128_ps(_mm_loadl_epi64(reinterpret_cast<const __m128i *>(s.pairSign + i))));
}
#endif

// One number of a line of the shape's form.
[[gnu::always_inline]] inline bool numberOf(const char *p, const NumberShape::Number &n,
                                            float &out) {
    std::uint64_t before = 0, after = 0;
    std::memcpy(&before, p + n.digitsAt, 8);
    std::memcpy(&after, p + n.digitsAt + 1, 8);
    const std::uint64_t word = (before & n.low) | (after & ~n.low);
    return toFloat(n.negative, eightDigits(word << n.shift), n.fractionDigits, out);
}

// Reads `count` blank-separated short numbers of a line of up to 64 bytes; `shape` is the last
// line's.
[[gnu::always_inline]] inline bool numbersInWindow(const char *p, float *out, int count,
                                                   const char *&next, NumberShape &shape) {
    if (!shape.pattern.matches(p)) {
        const Masks m = classify<'.', '-'>(p);
        shape.pattern.length = -1;
        if (!numberShape(m, count, shape))
            return false;
        shape.pattern.set(p, std::countr_zero(m.end));
    }
    next = p + shape.pattern.length + 1;
#if defined(__SSE2__)
    _mm_storel_pi(reinterpret_cast<__m64 *>(out), numberPair(p, shape, 0));
    if (count == 3)
        _mm_store_ss(out + 2, numberPair(p, shape, 2));
    return true;
#else
    bool ok = true;
#pragma GCC unroll 3
    for (int k = 0; k < count; ++k)
        ok &= numberOf(p, shape.numbers[k], out[k]);
    return ok;
#endif
}

// The bytes just after the digit runs that start at the bits of `starts`: adding a run's first
// bit to the digit mask carries through the run to the byte behind it.
[[gnu::always_inline]] inline std::uint64_t behindRuns(std::uint64_t digit, std::uint64_t starts) {
    return (digit + starts) & ~digit;
}

// What a plain face line's masks say about its indices: `K` slashes to the corner, and where
// each index's digits start and the shift that puts them at the top of a word, corner by
// corner.
struct FaceShape {
    LinePattern pattern;
    int k = 0, count = 0;
    // A line of 64 bytes holds at most 31 indices.
    std::int8_t first[32], shift[32];
};

// The runs of one index of every corner: they start at the bits of `starts` and end at those of
// `ends`; every `step`-th place of the shape from `at` on.
inline void runsOf(std::uint64_t starts, std::uint64_t ends, int at, int step, FaceShape &shape) {
    for (; starts != 0; starts &= starts - 1, ends &= ends - 1, at += step) {
        const int first = __builtin_ctzll(starts), last = __builtin_ctzll(ends);
        shape.first[at] = std::int8_t(first);
        shape.shift[at] = std::int8_t(8 * (7 - last + first));
    }
}

// Checks a face line of up to 64 bytes whose corners all have the same form, "v", "v/vt" or
// "v/vt/vn" (no empty index), on its masks ('/' the mark), and finds its indices' runs: only
// digits, blanks and slashes; every slash between two digits; runs of at most seven digits;
// behind the first index of every corner a slash or of none, and so on; three corners or more.
inline bool faceShape(const Masks &m, FaceShape &shape) {
    int length = 0;
    const std::uint64_t line = lineBytes(m, length);
    const std::uint64_t digit = m.digit & line, slash = m.mark & line;
    std::uint64_t eight = digit & (digit >> 1);
    eight &= eight >> 2;
    eight &= eight >> 4;
    if (line == 0 || ((digit | slash | m.blank) & line) != line ||
        (slash & ~((digit << 1) & (digit >> 1))) != 0 || eight != 0)
        return false;
    // The runs that follow a blank (byte 0, the blank after the keyword, is not a digit).
    std::uint64_t starts[3] = {digit & ~((digit | slash) << 1), 0, 0};
    std::uint64_t behind[3] = {behindRuns(digit, starts[0]), 0, 0};
    int k = 0;
    // Every slash follows a run and is followed by one, so the slashes behind the first runs,
    // then behind the runs after those, account for all of them.
    while (k < 2 && (behind[k] & slash) != 0) {
        if ((behind[k] & ~slash) != 0)
            return false;
        starts[k + 1] = behind[k] << 1;
        behind[k + 1] = behindRuns(digit, starts[k + 1]);
        ++k;
    }
    if ((behind[k] & slash) != 0)
        return false;
    shape.k = k;
    shape.count = 0;
    for (std::uint64_t s = starts[0]; s != 0; s &= s - 1)
        ++shape.count;
    for (int i = 0; i <= k; ++i)
        runsOf(starts[i], behind[i] >> 1, i, k + 1, shape);
    return shape.count >= 3;
}

// The index at the shape's place `i` of a line, as a corner's 0-based index; its value goes
// into `max`, and the sign bit of `zero` is set for an index 0.
[[gnu::always_inline]] inline std::int32_t indexOf(const char *p, const FaceShape &shape, int i,
                                                   std::uint32_t &max, std::uint32_t &zero) {
    std::uint64_t chunk = 0;
    std::memcpy(&chunk, p + shape.first[i], 8);
    const std::uint32_t value = eightDigits(chunk << shape.shift[i]);
    max = value > max ? value : max;
    zero |= value - 1;
    return std::int32_t(value - 1);
}

// The corners of a line of the shape's form, which has `K` slashes to the corner; false for an
// index 0.
template <int K>
[[gnu::always_inline]] inline bool cornersOf(const char *p, const FaceShape &shape,
                                             SgFaceCorner *corners, FaceIndexMax &max) {
    std::uint32_t zero = 0, maxVertex = 0, maxUV = 0, maxNormal = 0;
    for (int i = 0, at = 0; i < shape.count; ++i, at += K + 1) {
        SgFaceCorner &c = corners[i];
        c.vertex = indexOf(p, shape, at, maxVertex, zero);
        c.uv = K >= 1 ? indexOf(p, shape, at + (K >= 1), maxUV, zero) : -1;
        c.third = K == 2 ? indexOf(p, shape, at + 2 * (K == 2), maxNormal, zero) : -1;
    }
    max = {maxVertex, maxUV, maxNormal};
    // Indices have at most seven digits: only an index 0 sets the sign bit.
    return std::int32_t(zero) >= 0;
}

// A face line of up to 64 bytes in a plain form (see faceShape); `shape` is the last line's.
[[gnu::always_inline]] inline bool faceInWindow(const char *p, SgFaceCorner *corners, int &count,
                                                FaceIndexMax &max, const char *&next,
                                                FaceShape &shape) {
    if (!shape.pattern.matches(p)) {
        const Masks m = classify<'/'>(p);
        shape.pattern.length = -1;
        if (!faceShape(m, shape))
            return false;
        shape.pattern.set(p, std::countr_zero(m.end));
    }
    next = p + shape.pattern.length + 1;
    count = shape.count;
    return shape.k == 0   ? cornersOf<0>(p, shape, corners, max)
           : shape.k == 1 ? cornersOf<1>(p, shape, corners, max)
                          : cornersOf<2>(p, shape, corners, max);
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

// What a run of lines of one kind keeps of its last line, so that a line of the same shape is
// read without the scans and checks (see LinePattern); one per run, starting empty.
using NumberShape = detail::NumberShape;
using FaceShape = detail::FaceShape;

// "v": `p` just after the keyword.
[[gnu::always_inline]] inline bool vertex(const char *p, float out[3], const char *&next,
                                          NumberShape &shape) {
    return detail::numbersInWindow(p, out, 3, next, shape);
}

// "vt": `p` just after the keyword.
[[gnu::always_inline]] inline bool uv(const char *p, float out[2], const char *&next,
                                      NumberShape &shape) {
    return detail::numbersInWindow(p, out, 2, next, shape);
}

// "f": `p` just after the keyword; `corners` has room for 255. Sets the corner count (3 or
// more on success) and the line's largest indices.
[[gnu::always_inline]] inline bool face(const char *p, const char *limit, SgFaceCorner *corners,
                                        int &count, FaceIndexMax &max, const char *&next,
                                        FaceShape &shape) {
    if (detail::faceInWindow(p, corners, count, max, next, shape))
        return true;
    max = FaceIndexMax();
    next = detail::faceInWords(p, limit, corners, count, max);
    return next && count >= 3;
}

} // namespace SgObjPlainLine
