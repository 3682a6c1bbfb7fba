#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

// Copies `count` floats from `from` to `to` (either may be unaligned record bytes), each
// multiplied by `factor` in double precision and rounded back to float, exactly as
// float(double(value) * factor) one at a time; four at a time in vector registers. Returns
// whether any result is infinite or not a number.
inline bool sgScaleFloats(const void *from, void *to, std::size_t count, double factor) {
    using Float4 = float __attribute__((vector_size(16)));
    using Double4 = double __attribute__((vector_size(32)));
    using Bits4 = std::uint32_t __attribute__((vector_size(16)));
    constexpr std::uint32_t kExponent = 0x7F800000u; // all set: infinite or not a number
    const auto *in = static_cast<const unsigned char *>(from);
    auto *out = static_cast<unsigned char *>(to);
    Bits4 bad = {0, 0, 0, 0};
    std::size_t i = 0;
    for (; i + 4 <= count; i += 4) {
        Float4 value;
        std::memcpy(&value, in + 4 * i, sizeof value);
        const Float4 scaled =
            __builtin_convertvector(__builtin_convertvector(value, Double4) * factor, Float4);
        Bits4 bits;
        std::memcpy(&bits, &scaled, sizeof bits);
        bad |= (bits & kExponent) == kExponent;
        std::memcpy(out + 4 * i, &scaled, sizeof scaled);
    }
    std::uint32_t any = bad[0] | bad[1] | bad[2] | bad[3];
    for (; i < count; ++i) {
        float value;
        std::memcpy(&value, in + 4 * i, 4);
        const auto scaled = float(double(value) * factor);
        std::uint32_t bits;
        std::memcpy(&bits, &scaled, 4);
        any |= std::uint32_t((bits & kExponent) == kExponent);
        std::memcpy(out + 4 * i, &scaled, 4);
    }
    return any != 0;
}
