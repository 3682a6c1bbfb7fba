#include "sgcore/geometry/sgsubdmesh.h"

SgSubDMesh::SgSubDMesh() = default;
SgSubDMesh::~SgSubDMesh() = default;

SgSubDMesh::SgSubDMesh(const SgSubDMesh &o)
    : SgVertexMesh(o), m_uvList(o.m_uvList ? std::make_unique<SgMap>(*o.m_uvList) : nullptr),
      m_vertexIndices(o.m_vertexIndices), m_uvIndices(o.m_uvIndices),
      m_thirdIndices(o.m_thirdIndices), m_materials(o.m_materials) {}

SgVertexMesh *SgSubDMesh::clone() const {
    return new SgSubDMesh(*this);
}

bool SgSubDMesh::addPatch(const int32_t vertex[4], const int32_t uv[4], const int32_t third[4],
                          int material) {
    for (int k = 0; k < 4; ++k) {
        if (vertex[k] < 0 || vertex[k] >= getVertexCount()) {
            return false;
        }
    }
    for (int k = 0; k < 4; ++k) {
        m_vertexIndices.push_back(vertex[k]);
        m_uvIndices.push_back(uv ? uv[k] : -1);
        m_thirdIndices.push_back(third ? third[k] : -1);
    }
    m_materials.push_back(static_cast<uint8_t>(material >= 0 && material <= 255 ? material : 255));
    return true;
}
