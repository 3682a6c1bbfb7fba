#pragma once

#include <cmath>
#include <cstdint>

// A point or direction in 3D: three packed floats (12 bytes, no padding), so that arrays of
// them can be copied to and from files and shared memory as plain float triples.
struct SgVec3 {
    float x = 0.0f;
    float y = 0.0f;
    float z = 0.0f;

    constexpr SgVec3() = default;
    constexpr SgVec3(float ax, float ay, float az) : x(ax), y(ay), z(az) {}

    constexpr float operator[](int i) const { return i == 0 ? x : (i == 1 ? y : z); }

    constexpr SgVec3 operator+(const SgVec3 &o) const { return {x + o.x, y + o.y, z + o.z}; }
    constexpr SgVec3 operator-(const SgVec3 &o) const { return {x - o.x, y - o.y, z - o.z}; }
    constexpr SgVec3 operator-() const { return {-x, -y, -z}; }
    constexpr SgVec3 operator*(float s) const { return {x * s, y * s, z * s}; }
    constexpr SgVec3 &operator+=(const SgVec3 &o) {
        x += o.x;
        y += o.y;
        z += o.z;
        return *this;
    }
    constexpr SgVec3 &operator-=(const SgVec3 &o) {
        x -= o.x;
        y -= o.y;
        z -= o.z;
        return *this;
    }
    constexpr SgVec3 &operator*=(float s) {
        x *= s;
        y *= s;
        z *= s;
        return *this;
    }
    // Exact component-wise comparison.
    constexpr bool operator==(const SgVec3 &o) const = default;

    constexpr float dot(const SgVec3 &o) const { return x * o.x + y * o.y + z * o.z; }
    constexpr SgVec3 cross(const SgVec3 &o) const {
        return {y * o.z - z * o.y, z * o.x - x * o.z, x * o.y - y * o.x};
    }
    float length() const { return std::sqrt(dot(*this)); }
};
static_assert(sizeof(SgVec3) == 12, "SgVec3 must be three packed floats");

// A texture coordinate (u, v): two packed floats.
struct SgVec2 {
    float u = 0.0f;
    float v = 0.0f;

    constexpr SgVec2() = default;
    constexpr SgVec2(float au, float av) : u(au), v(av) {}
    constexpr bool operator==(const SgVec2 &o) const = default;
};
static_assert(sizeof(SgVec2) == 8, "SgVec2 must be two packed floats");
