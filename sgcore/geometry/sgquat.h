#pragma once

#include "sgcore/geometry/sgvec3.h"

// A rotation as a unit quaternion (x, y, z, w); the identity is (0, 0, 0, 1).
struct SgQuat {
    float x = 0.0f;
    float y = 0.0f;
    float z = 0.0f;
    float w = 1.0f;

    constexpr SgQuat() = default;
    constexpr SgQuat(float ax, float ay, float az, float aw) : x(ax), y(ay), z(az), w(aw) {}

    // The rotation by `radians` about `axis` (normalised here; a zero axis gives the identity).
    static SgQuat fromAxisAngle(const SgVec3 &axis, float radians);

    // The inverse rotation of a unit quaternion: (-x, -y, -z, w).
    constexpr SgQuat inverse() const { return {-x, -y, -z, w}; }

    // The composition: (a * b) rotates by b first, then by a.
    constexpr SgQuat operator*(const SgQuat &b) const {
        return {w * b.x + x * b.w + y * b.z - z * b.y, w * b.y - x * b.z + y * b.w + z * b.x,
                w * b.z + x * b.y - y * b.x + z * b.w, w * b.w - x * b.x - y * b.y - z * b.z};
    }

    // Rotates the point `p` about the origin.
    constexpr SgVec3 multPnt(const SgVec3 &p) const {
        const SgVec3 q(x, y, z);
        const SgVec3 t = q.cross(p) * 2.0f;
        return p + t * w + q.cross(t);
    }

    constexpr bool isIdentity() const { return x == 0.0f && y == 0.0f && z == 0.0f; }
    constexpr bool operator==(const SgQuat &o) const = default;
};
