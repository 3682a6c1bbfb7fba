#include "sgcore/morph/sgmorphdeltas.h"

#include <algorithm>

void SgMorphDeltas::insertDelta(int vertex, const SgVec3 &delta, bool last) {
    if (vertex < 0)
        return;
    if (m_vertices.empty() || vertex > m_vertices.back()) {
        m_vertices.push_back(vertex);
        m_deltas.push_back(delta);
    } else {
        const auto it = std::lower_bound(m_vertices.begin(), m_vertices.end(), vertex);
        const auto at = it - m_vertices.begin();
        if (*it == vertex) {
            m_deltas[at] = delta;
        } else {
            m_vertices.insert(it, vertex);
            m_deltas.insert(m_deltas.begin() + at, delta);
        }
    }
    if (last) {
        m_vertices.shrink_to_fit();
        m_deltas.shrink_to_fit();
    }
}

int SgMorphDeltas::findEntry(int vertex) const {
    const auto it = std::lower_bound(m_vertices.begin(), m_vertices.end(), vertex);
    if (it == m_vertices.end() || *it != vertex)
        return -1;
    return int(it - m_vertices.begin());
}

void SgMorphDeltas::removeEntry(int entry) {
    if (entry < 0 || entry >= getNumEntries())
        return;
    m_vertices.erase(m_vertices.begin() + entry);
    m_deltas.erase(m_deltas.begin() + entry);
}

void SgMorphDeltas::rotate(const SgQuat &rotation) {
    for (SgVec3 &d : m_deltas)
        d = rotation.multPnt(d);
}

void SgMorphDeltas::apply(SgVec3 *points, int count, float weight) const {
    if (weight == 0.0f)
        return;
    const size_t n = m_vertices.size();
    for (size_t i = 0; i < n; ++i) {
        const int v = m_vertices[i];
        if (v < count)
            points[v] += m_deltas[i] * weight;
    }
}
