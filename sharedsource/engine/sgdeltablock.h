#pragma once

#include <cstddef>

// Writes the deltas (`morph` minus `base`, three floats per vertex) and the vertex indices of
// the `count` vertices that start at vertex `first`, then keeps only the moved ones at the start
// of the output, in vertex order, and returns how many it kept. A vertex moved when any
// component of its delta exceeds `threshold` in magnitude or is not a number. Sets `invalid`
// when a delta component is not finite (such a vertex always counts as moved) and leaves it
// alone otherwise.
//
// The outputs must have room for `count` indices and `3 * count` floats; the inputs must not
// overlap them. Cost: straight vector passes over the block, plus one scalar compaction pass
// when some of its vertices did not move; blocks of a few dozen vertices stay in the L1 cache.
std::size_t sgWriteDeltaBlock(const float *morph, const float *base, std::size_t first,
                              std::size_t count, int *vertexOut, float *deltaOut, float threshold,
                              bool &invalid);
