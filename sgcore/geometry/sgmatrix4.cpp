#include "sgcore/geometry/sgmatrix4.h"

#include <cmath>

void SgMatrix4::identity() {
    for (int r = 0; r < 4; ++r) {
        for (int c = 0; c < 4; ++c) {
            m_m[r][c] = r == c ? 1.0f : 0.0f;
        }
    }
    m_flags = IdentityFlag;
}

void SgMatrix4::setRow(int row, float a, float b, float c, float d) {
    m_m[row][0] = a;
    m_m[row][1] = b;
    m_m[row][2] = c;
    m_m[row][3] = d;
    m_flags = 0;
}

SgMatrix4 SgMatrix4::fromTranslation(const SgVec3 &t) {
    SgMatrix4 m;
    m.setRow(3, t.x, t.y, t.z, 1.0f);
    return m;
}

SgMatrix4 SgMatrix4::fromRotationTranslation(const SgQuat &q, const SgVec3 &t) {
    SgMatrix4 m;
    const SgVec3 ex = q.multPnt({1, 0, 0});
    const SgVec3 ey = q.multPnt({0, 1, 0});
    const SgVec3 ez = q.multPnt({0, 0, 1});
    m.setRow(0, ex.x, ex.y, ex.z, 0.0f);
    m.setRow(1, ey.x, ey.y, ey.z, 0.0f);
    m.setRow(2, ez.x, ez.y, ez.z, 0.0f);
    m.setRow(3, t.x, t.y, t.z, 1.0f);
    return m;
}

SgMatrix4 SgMatrix4::operator*(const SgMatrix4 &b) const {
    SgMatrix4 r;
    for (int i = 0; i < 4; ++i) {
        for (int j = 0; j < 4; ++j) {
            float s = 0.0f;
            for (int k = 0; k < 4; ++k) {
                s += m_m[i][k] * b.m_m[k][j];
            }
            r.m_m[i][j] = s;
        }
    }
    r.m_flags = (m_flags & b.m_flags & IdentityFlag);
    return r;
}

SgMatrix4 SgMatrix4::inverse() const {
    const float(*a)[4] = m_m;
    const float c00 = a[1][1] * a[2][2] - a[1][2] * a[2][1];
    const float c01 = a[1][2] * a[2][0] - a[1][0] * a[2][2];
    const float c02 = a[1][0] * a[2][1] - a[1][1] * a[2][0];
    const float det = a[0][0] * c00 + a[0][1] * c01 + a[0][2] * c02;
    SgMatrix4 r;
    if (det == 0.0f || !std::isfinite(det)) {
        return r;
    }
    const float id = 1.0f / det;
    r.m_m[0][0] = c00 * id;
    r.m_m[0][1] = (a[0][2] * a[2][1] - a[0][1] * a[2][2]) * id;
    r.m_m[0][2] = (a[0][1] * a[1][2] - a[0][2] * a[1][1]) * id;
    r.m_m[1][0] = c01 * id;
    r.m_m[1][1] = (a[0][0] * a[2][2] - a[0][2] * a[2][0]) * id;
    r.m_m[1][2] = (a[0][2] * a[1][0] - a[0][0] * a[1][2]) * id;
    r.m_m[2][0] = c02 * id;
    r.m_m[2][1] = (a[0][1] * a[2][0] - a[0][0] * a[2][1]) * id;
    r.m_m[2][2] = (a[0][0] * a[1][1] - a[0][1] * a[1][0]) * id;
    const SgVec3 t = r.multDir(getTranslation());
    r.m_m[3][0] = -t.x;
    r.m_m[3][1] = -t.y;
    r.m_m[3][2] = -t.z;
    r.m_flags = m_flags & IdentityFlag;
    return r;
}

bool SgMatrix4::operator==(const SgMatrix4 &o) const {
    for (int r = 0; r < 4; ++r) {
        for (int c = 0; c < 4; ++c) {
            if (m_m[r][c] != o.m_m[r][c]) {
                return false;
            }
        }
    }
    return true;
}
