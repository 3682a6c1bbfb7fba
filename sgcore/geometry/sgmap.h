#pragma once

#include "sgcore/geometry/sgvec3.h"

#include <vector>

// A texture coordinate list: (u, v) pairs addressed by the UV index of facet corners.
class SgMap {
public:
    // Map types; 1 is a UV list, the only kind this host uses.
    enum MapType { UVMap = 1 };

    explicit SgMap(int mapType = UVMap) : m_mapType(mapType) {}

    int getMapType() const { return m_mapType; }
    void setMapType(int mapType) { m_mapType = mapType; }

    // Appends one (u, v) pair; amortised O(1).
    void appendPnt2Value(float u, float v) { m_values.emplace_back(u, v); }
    int getValueCount() const { return static_cast<int>(m_values.size()); }
    // The pair at `index`; (0, 0) outside the list.
    SgVec2 getValue(int index) const {
        return index >= 0 && index < getValueCount() ? m_values[size_t(index)] : SgVec2();
    }
    // The contiguous pairs, for bulk reading and writing.
    std::vector<SgVec2> &values() { return m_values; }
    const std::vector<SgVec2> &values() const { return m_values; }

private:
    int m_mapType;
    std::vector<SgVec2> m_values;
};
