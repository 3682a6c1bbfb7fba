#pragma once

#include "sgcore/geometry/sgquat.h"
#include "sgcore/geometry/sgvec3.h"

// A 4x4 affine transform, row-major; points are row vectors (p' = p * M), so the translation
// sits in row 3 and `a * b` applies a first, then b.
class SgMatrix4 {
public:
    SgMatrix4() { identity(); }

    float &operator()(int row, int col) { return m_m[row][col]; }
    float operator()(int row, int col) const { return m_m[row][col]; }
    float value(int row, int col) const { return m_m[row][col]; }
    float *operator[](int row) { return m_m[row]; }
    const float *operator[](int row) const { return m_m[row]; }

    void identity();
    void setRow(int row, float a, float b, float c, float d);
    enum : unsigned { IdentityFlag = 1u };
    unsigned getFlags() const { return m_flags; }
    void setFlags(unsigned flags) { m_flags = flags; }

    // The transform that rotates by `rotation` and then translates by `translation`.
    static SgMatrix4 fromRotationTranslation(const SgQuat &rotation, const SgVec3 &translation);
    static SgMatrix4 fromTranslation(const SgVec3 &translation);

    // Applies a first, then b.
    SgMatrix4 operator*(const SgMatrix4 &b) const;

    // The inverse of an affine transform (the last column taken as 0, 0, 0, 1); a singular
    // 3x3 part gives the identity.
    SgMatrix4 inverse() const;

    // Transforms a point (with translation) and a direction (without).
    SgVec3 multPnt(const SgVec3 &p) const {
        return {p.x * m_m[0][0] + p.y * m_m[1][0] + p.z * m_m[2][0] + m_m[3][0],
                p.x * m_m[0][1] + p.y * m_m[1][1] + p.z * m_m[2][1] + m_m[3][1],
                p.x * m_m[0][2] + p.y * m_m[1][2] + p.z * m_m[2][2] + m_m[3][2]};
    }
    SgVec3 multDir(const SgVec3 &p) const {
        return {p.x * m_m[0][0] + p.y * m_m[1][0] + p.z * m_m[2][0],
                p.x * m_m[0][1] + p.y * m_m[1][1] + p.z * m_m[2][1],
                p.x * m_m[0][2] + p.y * m_m[1][2] + p.z * m_m[2][2]};
    }
    SgVec3 getTranslation() const { return {m_m[3][0], m_m[3][1], m_m[3][2]}; }

    bool operator==(const SgMatrix4 &o) const;

private:
    float m_m[4][4];
    unsigned m_flags = IdentityFlag;
};
