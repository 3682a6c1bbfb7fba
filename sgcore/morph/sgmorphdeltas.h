#pragma once

#include "sgcore/geometry/sgquat.h"
#include "sgcore/geometry/sgvec3.h"

#include <vector>

// The sparse per-vertex offsets of one morph: entries (vertex index, delta) in ascending vertex
// order, over a mesh of `getVertCount()` vertices. A morph at value w moves vertex i by
// w * delta(i).
class SgMorphDeltas {
public:
    SgMorphDeltas() = default;

    // The vertex count of the mesh the deltas belong to. Entries must index below it.
    void setVertCount(int count) { m_vertCount = count; }
    int getVertCount() const { return m_vertCount; }

    // Adds the entry (vertex, delta). Appending in ascending vertex order is O(1) amortised; an
    // index at or below the last one is put in its sorted place (O(entries)), replacing an entry
    // of the same vertex. `last` marks the final entry of a series: the table then gives back
    // its spare capacity. Negative indices are ignored.
    void addDelta(int vertex, const SgVec3 &delta, bool last) {
        if (!last && vertex >= 0 && (m_vertices.empty() || vertex > m_vertices.back())) {
            m_vertices.push_back(vertex);
            m_deltas.push_back(delta);
            return;
        }
        insertDelta(vertex, delta, last);
    }

    // Reserves room for `count` entries without adding any.
    void reserve(int count) {
        m_vertices.reserve(size_t(count));
        m_deltas.reserve(size_t(count));
    }

    int getNumEntries() const { return int(m_vertices.size()); }
    bool isEmpty() const { return m_vertices.empty(); }
    // Entry `entry` (0 <= entry < getNumEntries()).
    int getVertex(int entry) const { return m_vertices[entry]; }
    const SgVec3 &getDelta(int entry) const { return m_deltas[entry]; }
    void setDelta(int entry, const SgVec3 &delta) { m_deltas[entry] = delta; }

    // The entry of `vertex`, or -1. O(log entries).
    int findEntry(int vertex) const;
    bool hasVertex(int vertex) const { return findEntry(vertex) >= 0; }

    // Removes entry `entry`. O(entries).
    void removeEntry(int entry);
    // Keeps only the entries for which `keep(vertex)` is true, in order. O(entries).
    template <typename Keep> void filter(Keep keep) {
        size_t out = 0;
        for (size_t i = 0; i < m_vertices.size(); ++i) {
            if (keep(m_vertices[i])) {
                m_vertices[out] = m_vertices[i];
                m_deltas[out] = m_deltas[i];
                ++out;
            }
        }
        m_vertices.resize(out);
        m_deltas.resize(out);
    }

    // Rotates every delta by `rotation`. O(entries).
    void rotate(const SgQuat &rotation);

    // Adds weight * delta to points[vertex] for every entry whose vertex is below `count`.
    void apply(SgVec3 *points, int count, float weight) const;

    // Raw entry arrays (parallel, ascending vertex order), for fast readers.
    const std::vector<int> &vertices() const { return m_vertices; }
    const std::vector<SgVec3> &deltas() const { return m_deltas; }
    // The same arrays for fast producers that fill many entries at once: whoever writes them
    // keeps them parallel, in strictly ascending vertex order and below the vertex count.
    std::vector<int> &vertexArray() { return m_vertices; }
    std::vector<SgVec3> &deltaArray() { return m_deltas; }

private:
    void insertDelta(int vertex, const SgVec3 &delta, bool last);

    int m_vertCount = 0;
    std::vector<int> m_vertices;
    std::vector<SgVec3> m_deltas;
};
