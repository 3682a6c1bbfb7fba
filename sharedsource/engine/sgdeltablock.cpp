#include "sharedsource/engine/sgdeltablock.h"

#include <cmath>
#include <cstdint>

namespace {

// Vertices whose per-component flags are gathered on the stack at a time.
constexpr std::size_t kFlagChunk = 64;

// 1 at the first component of each vertex of a chunk, 0 at the other two.
struct VertexStarts {
    std::uint8_t at[3 * kFlagChunk];
    constexpr VertexStarts() : at() {
        for (std::size_t k = 0; k < 3 * kFlagChunk; ++k)
            at[k] = k % 3 == 0;
    }
};
constexpr VertexStarts kVertexStarts;

// Counts the moved vertices of a block whose deltas are written. A vertex is quiet when its
// three components are: with a flag per component, the AND of each flag with its next two
// neighbours, taken at vertex starts only, counts the quiet vertices in straight vector passes.
std::size_t countMoved(const float *deltas, std::size_t count, float threshold) {
    std::size_t quietVertices = 0;
    std::uint8_t quiet[3 * kFlagChunk + 2];
    for (std::size_t from = 0; from < count; from += kFlagChunk) {
        const std::size_t n = count - from < kFlagChunk ? count - from : kFlagChunk;
        const float *d = deltas + 3 * from;
        for (std::size_t k = 0; k < 3 * n; ++k)
            quiet[k] = std::fabs(d[k]) <= threshold;
        quiet[3 * n] = quiet[3 * n + 1] = 0;
        unsigned sum = 0;
        for (std::size_t k = 0; k < 3 * n; ++k)
            sum += quiet[k] & quiet[k + 1] & quiet[k + 2] & kVertexStarts.at[k];
        quietVertices += sum;
    }
    return count - quietVertices;
}

// Keeps the moved vertices at the start of the outputs. Every vertex is copied down; only a
// moved one advances the output (no branch to mispredict when about half of a block moves).
std::size_t compact(std::size_t count, int *vertexOut, float *deltaOut, float threshold) {
    std::size_t kept = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const float x = deltaOut[3 * i], y = deltaOut[3 * i + 1], z = deltaOut[3 * i + 2];
        vertexOut[kept] = vertexOut[i];
        deltaOut[3 * kept] = x;
        deltaOut[3 * kept + 1] = y;
        deltaOut[3 * kept + 2] = z;
        kept +=
            !(std::fabs(x) <= threshold && std::fabs(y) <= threshold && std::fabs(z) <= threshold);
    }
    return kept;
}

} // namespace

std::size_t sgWriteDeltaBlock(const float *morph, const float *base, std::size_t first,
                              std::size_t count, int *vertexOut, float *deltaOut, float threshold,
                              bool &invalid) {
    const std::size_t floats = count * 3;
    int notFinite = 0;
    for (std::size_t k = 0; k < floats; ++k) {
        const float d = morph[k] - base[k];
        deltaOut[k] = d;
        notFinite |= !(d - d == 0.0f); // d - d is a number only when d is finite
    }
    if (notFinite)
        invalid = true;
    for (std::size_t i = 0; i < count; ++i)
        vertexOut[i] = int(first + i);
    if (countMoved(deltaOut, count, threshold) == count)
        return count;
    return compact(count, vertexOut, deltaOut, threshold);
}
