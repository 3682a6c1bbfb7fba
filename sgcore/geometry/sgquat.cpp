#include "sgcore/geometry/sgquat.h"

SgQuat SgQuat::fromAxisAngle(const SgVec3 &axis, float radians) {
    const float len = axis.length();
    if (len == 0.0f) {
        return {};
    }
    const float s = std::sin(radians * 0.5f) / len;
    return {axis.x * s, axis.y * s, axis.z * s, std::cos(radians * 0.5f)};
}
