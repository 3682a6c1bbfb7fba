#include "sgcore/geometry/sgvertexmesh.h"

SgVertexMesh *SgVertexMesh::clone() const {
    return new SgVertexMesh(*this);
}

SgVec3 *SgVertexMesh::setVertexCount(int count) {
    m_vertices.resize(count > 0 ? size_t(count) : 0);
    return m_vertices.data();
}

SgBox3 SgVertexMesh::getBoundingBox() const {
    SgBox3 box;
    for (const SgVec3 &p : m_vertices) {
        box.extend(p);
    }
    return box;
}

void SgVertexMesh::transform(const SgMatrix4 &m) {
    for (SgVec3 &p : m_vertices) {
        p = m.multPnt(p);
    }
}

void SgVertexMesh::translate(const SgVec3 &offset) {
    for (SgVec3 &p : m_vertices) {
        p += offset;
    }
}
