#pragma once

#include "sgcore/geometry/sgvec3.h"

// A 3x3 matrix, row-major; points are row vectors (p' = p * M).
class SgMatrix3 {
public:
    SgMatrix3() { identity(); }

    // Element access by row and column (0 to 2).
    float &operator()(int row, int col) { return m_m[row][col]; }
    float operator()(int row, int col) const { return m_m[row][col]; }
    float value(int row, int col) const { return m_m[row][col]; }
    // A pointer to the three elements of `row`.
    float *operator[](int row) { return m_m[row]; }
    const float *operator[](int row) const { return m_m[row]; }

    void identity() {
        for (int r = 0; r < 3; ++r) {
            for (int c = 0; c < 3; ++c) {
                m_m[r][c] = r == c ? 1.0f : 0.0f;
            }
        }
        m_flags = IdentityFlag;
    }
    void setRow(int row, float a, float b, float c) {
        m_m[row][0] = a;
        m_m[row][1] = b;
        m_m[row][2] = c;
        m_flags = 0;
    }
    // Free-use flags; `IdentityFlag` is set by `identity()` and cleared by `setRow`.
    enum : unsigned { IdentityFlag = 1u };
    unsigned getFlags() const { return m_flags; }
    void setFlags(unsigned flags) { m_flags = flags; }

    SgVec3 multPnt(const SgVec3 &p) const {
        return {p.x * m_m[0][0] + p.y * m_m[1][0] + p.z * m_m[2][0],
                p.x * m_m[0][1] + p.y * m_m[1][1] + p.z * m_m[2][1],
                p.x * m_m[0][2] + p.y * m_m[1][2] + p.z * m_m[2][2]};
    }

private:
    float m_m[3][3];
    unsigned m_flags = IdentityFlag;
};
