#pragma once

#include "sgcore/geometry/sgbox3.h"
#include "sgcore/geometry/sgmatrix4.h"
#include "sgcore/geometry/sgrefcounteditem.h"
#include "sgcore/geometry/sgvec3.h"

#include <vector>

// Geometry that is a list of vertex positions, in a fixed order that morphs address by index.
// Reference counted (see SgRefCountedItem). Subclasses add facets (SgPolyMesh, SgSubDMesh).
class SgVertexMesh : public SgRefCountedItem {
public:
    enum Kind { VertexMeshKind, PolyMeshKind, SubDMeshKind };

    SgVertexMesh() = default;
    ~SgVertexMesh() override = default;

    virtual Kind getKind() const { return VertexMeshKind; }
    // A deep copy of the same class (vertices, and facets for subclasses), reference count 0.
    virtual SgVertexMesh *clone() const;

    int getVertexCount() const { return static_cast<int>(m_vertices.size()); }
    // Sizes the vertex list to `count` (new vertices at the origin); returns the first vertex.
    SgVec3 *setVertexCount(int count);
    // The vertex at `index`; (0, 0, 0) outside the list.
    SgVec3 getVertex(int index) const {
        return index >= 0 && index < getVertexCount() ? m_vertices[size_t(index)] : SgVec3();
    }
    // Sets one vertex; an index outside the list is ignored.
    void setVertex(int index, const SgVec3 &p) {
        if (index >= 0 && index < getVertexCount()) {
            m_vertices[size_t(index)] = p;
        }
    }
    // The contiguous vertex array (12 bytes per vertex), for bulk reading and writing.
    SgVec3 *getVertices() { return m_vertices.data(); }
    const SgVec3 *getVertices() const { return m_vertices.data(); }
    std::vector<SgVec3> &vertices() { return m_vertices; }
    const std::vector<SgVec3> &vertices() const { return m_vertices; }

    // The box around all vertices (empty without vertices). O(V), computed on each call.
    SgBox3 getBoundingBox() const;
    // Transforms every vertex by `m`. O(V).
    void transform(const SgMatrix4 &m);
    // Moves every vertex by `offset`. O(V).
    void translate(const SgVec3 &offset);

protected:
    SgVertexMesh(const SgVertexMesh &) = default;

private:
    std::vector<SgVec3> m_vertices;
};
