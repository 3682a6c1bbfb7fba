#pragma once

#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgvertexmesh.h"

#include <cstdint>
#include <memory>
#include <vector>

// A subdivision mesh: vertices, an optional UV list and quad patches. Each patch has four
// corners, given by three index arrays of four entries per patch (vertex, UV, third), and an
// 8-bit material index.
class SgSubDMesh : public SgVertexMesh {
public:
    SgSubDMesh();
    ~SgSubDMesh() override;

    Kind getKind() const override { return SubDMeshKind; }
    SgVertexMesh *clone() const override;

    // Appends one patch; returns false (and adds nothing) when a vertex index is outside the
    // vertex array. `uv` and `third` may be null (stored as -1).
    bool addPatch(const int32_t vertex[4], const int32_t uv[4], const int32_t third[4],
                  int material);
    int getPatchCount() const { return static_cast<int>(m_materials.size()); }
    // The three index arrays (4 entries per patch) and the material per patch.
    const std::vector<int32_t> &getVertexIndices() const { return m_vertexIndices; }
    const std::vector<int32_t> &getUVIndices() const { return m_uvIndices; }
    const std::vector<int32_t> &getThirdIndices() const { return m_thirdIndices; }
    const std::vector<uint8_t> &getPatchMaterials() const { return m_materials; }
    uint8_t getPatchMaterial(int i) const { return m_materials[size_t(i)]; }

    void setUVList(SgMap *uvList) { m_uvList.reset(uvList); }
    SgMap *getUVList() const { return m_uvList.get(); }

private:
    SgSubDMesh(const SgSubDMesh &other);

    std::unique_ptr<SgMap> m_uvList;
    std::vector<int32_t> m_vertexIndices, m_uvIndices, m_thirdIndices;
    std::vector<uint8_t> m_materials;
};
