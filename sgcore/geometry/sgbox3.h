#pragma once

#include "sgcore/geometry/sgvec3.h"

#include <algorithm>
#include <limits>

// An axis-aligned bounding box; a default box is empty (min above max).
struct SgBox3 {
    SgVec3 min{std::numeric_limits<float>::max(), std::numeric_limits<float>::max(),
               std::numeric_limits<float>::max()};
    SgVec3 max{-std::numeric_limits<float>::max(), -std::numeric_limits<float>::max(),
               -std::numeric_limits<float>::max()};

    bool isEmpty() const { return min.x > max.x || min.y > max.y || min.z > max.z; }

    // Grows the box to contain `p`.
    void extend(const SgVec3 &p) {
        min = {std::min(min.x, p.x), std::min(min.y, p.y), std::min(min.z, p.z)};
        max = {std::max(max.x, p.x), std::max(max.y, p.y), std::max(max.z, p.z)};
    }

    // The centre of the box; (0, 0, 0) for an empty box.
    SgVec3 getCenter() const { return isEmpty() ? SgVec3() : (min + max) * 0.5f; }
    SgVec3 getSize() const { return isEmpty() ? SgVec3() : max - min; }
};
