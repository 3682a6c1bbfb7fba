#pragma once

#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgvertexmesh.h"

#include <QHash>
#include <QString>

#include <cstdint>
#include <memory>
#include <vector>

// One corner of a facet: the vertex index, the UV index (into the mesh's UV list; -1 or any
// index outside the list means none) and a third index that the host carries along unchanged
// (the OBJ reader stores the normal index there, -1 for none). 12 packed bytes.
struct SgFaceCorner {
    int32_t vertex = 0;
    int32_t uv = -1;
    int32_t third = -1;
    bool operator==(const SgFaceCorner &o) const = default;
};
static_assert(sizeof(SgFaceCorner) == 12, "SgFaceCorner must be three packed int32");

// A polygon mesh: vertices, an optional UV list, and facets kept as triangles, quads and
// polygons (5 to 255 corners), each with an 8-bit material index and an optional face group.
//
// Storage is contiguous per facet kind (corner arrays, material arrays, group arrays), so a
// million-facet mesh is walked, copied or written in one sweep. Facet order within a kind is
// the order in which they were added.
//
// Building a mesh with the edit calls:
//   beginEdit(true); setVertexArray(n) and fill it; setUVList(map);
//   for each facet: activateMaterial(m); startFace(); addFaceEdge(v, uv) per corner; finishFace();
//   finishEdit();
// Readers that build big meshes may fill the arrays directly instead (triangleCorners() etc.)
// and then call `validate`.
class SgPolyMesh : public SgVertexMesh {
public:
    static constexpr int kMaxPolygonCorners = 255;
    enum FacetType { Triangle = 0, Quad = 1, Polygon = 2 };

    SgPolyMesh();
    ~SgPolyMesh() override;

    Kind getKind() const override { return PolyMeshKind; }
    SgVertexMesh *clone() const override;
    SgPolyMesh *clonePolyMesh() const { return static_cast<SgPolyMesh *>(clone()); }

    // ---- Edit calls -----------------------------------------------------------------------
    // Starts an edit; with `clear` the mesh is emptied first (vertices, UVs, facets, groups).
    // The active material and face group are reset to 0 and none.
    void beginEdit(bool clear = true);
    // Sizes the vertex array to `count` (at least 0) and returns its first element to fill.
    SgVec3 *setVertexArray(int count) { return setVertexCount(count); }
    // Gives the mesh its UV list (the mesh takes ownership; null removes it).
    void setUVList(SgMap *uvList);
    // The material index of the facets that follow; values outside 0 to 255 select 255.
    void activateMaterial(int index);
    int getActiveMaterial() const { return m_activeMaterial; }
    // The face group of the facets that follow (an index from addFaceGroup; -1 for none).
    void setActiveFaceGroup(int group);
    int getActiveFaceGroup() const { return m_activeGroup; }
    // Starts collecting the corners of one facet.
    void startFace();
    // Adds one corner to the facet being collected.
    void addFaceEdge(int vertex, int uv = -1, int third = -1);
    // Stores the collected facet as a triangle (3 corners), a quad (4) or a polygon (5 to 255)
    // with the active material and group, and returns true. A facet with fewer than 3 or more
    // than 255 corners, or with a vertex index outside the vertex array, is dropped (false).
    bool finishFace();
    // Ends the edit. Cheap; kept for symmetry with beginEdit.
    void finishEdit();
    bool isEditing() const { return m_editing; }

    // ---- UVs ------------------------------------------------------------------------------
    SgMap *getUVList() const { return m_uvList.get(); }
    int getUVCount() const { return m_uvList ? m_uvList->getValueCount() : 0; }

    // ---- Facets -----------------------------------------------------------------------------
    int getTriangleCount() const { return static_cast<int>(m_triMaterials.size()); }
    int getQuadCount() const { return static_cast<int>(m_quadMaterials.size()); }
    int getPolygonCount() const { return static_cast<int>(m_polyMaterials.size()); }
    int getFacetCount() const { return getTriangleCount() + getQuadCount() + getPolygonCount(); }

    // Corners of triangle i (3), quad i (4) and polygon i (getPolygonCornerCount(i)).
    // No range check: i must be below the count.
    const SgFaceCorner *getTriangleCorners(int i) const { return &m_triCorners[size_t(i) * 3]; }
    const SgFaceCorner *getQuadCorners(int i) const { return &m_quadCorners[size_t(i) * 4]; }
    const SgFaceCorner *getPolygonCorners(int i) const {
        return &m_polyCorners[m_polyStarts[size_t(i)]];
    }
    int getPolygonCornerCount(int i) const {
        return static_cast<int>(m_polyStarts[size_t(i) + 1] - m_polyStarts[size_t(i)]);
    }
    uint8_t getTriangleMaterial(int i) const { return m_triMaterials[size_t(i)]; }
    uint8_t getQuadMaterial(int i) const { return m_quadMaterials[size_t(i)]; }
    uint8_t getPolygonMaterial(int i) const { return m_polyMaterials[size_t(i)]; }
    int getTriangleGroup(int i) const { return m_triGroups[size_t(i)]; }
    int getQuadGroup(int i) const { return m_quadGroups[size_t(i)]; }
    int getPolygonGroup(int i) const { return m_polyGroups[size_t(i)]; }

    // Direct access to the arrays (for fast readers, writers and the welder). Triangle corners
    // hold 3 entries per triangle, quad corners 4 per quad; polygon i owns the corners from
    // polygonStarts()[i] to polygonStarts()[i + 1] (polygonStarts() has getPolygonCount() + 1
    // entries and starts with 0). Materials and groups hold one entry per facet. Whoever
    // fills these directly keeps them consistent and calls `validate`.
    std::vector<SgFaceCorner> &triangleCorners() { return m_triCorners; }
    std::vector<SgFaceCorner> &quadCorners() { return m_quadCorners; }
    std::vector<SgFaceCorner> &polygonCorners() { return m_polyCorners; }
    std::vector<uint32_t> &polygonStarts() { return m_polyStarts; }
    std::vector<uint8_t> &triangleMaterials() { return m_triMaterials; }
    std::vector<uint8_t> &quadMaterials() { return m_quadMaterials; }
    std::vector<uint8_t> &polygonMaterials() { return m_polyMaterials; }
    std::vector<int32_t> &triangleGroups() { return m_triGroups; }
    std::vector<int32_t> &quadGroups() { return m_quadGroups; }
    std::vector<int32_t> &polygonGroups() { return m_polyGroups; }
    const std::vector<SgFaceCorner> &triangleCorners() const { return m_triCorners; }
    const std::vector<SgFaceCorner> &quadCorners() const { return m_quadCorners; }
    const std::vector<SgFaceCorner> &polygonCorners() const { return m_polyCorners; }
    const std::vector<uint32_t> &polygonStarts() const { return m_polyStarts; }
    const std::vector<uint8_t> &triangleMaterials() const { return m_triMaterials; }
    const std::vector<uint8_t> &quadMaterials() const { return m_quadMaterials; }
    const std::vector<uint8_t> &polygonMaterials() const { return m_polyMaterials; }
    const std::vector<int32_t> &triangleGroups() const { return m_triGroups; }
    const std::vector<int32_t> &quadGroups() const { return m_quadGroups; }
    const std::vector<int32_t> &polygonGroups() const { return m_polyGroups; }

    // Reserves room for facets (a hint; no effect on contents).
    void reserveFacets(int triangles, int quads, int polygons, int polygonCorners);
    // Removes every facet (and keeps vertices, UVs and face group names).
    void clearFacets();

    // The indices of the facets of one kind, ordered by material index and, within a
    // material, in facet order (a stable counting sort: O(facets + 256)).
    std::vector<int32_t> getFacetOrderByMaterial(FacetType type) const;
    // The number of facets of one kind per material index (256 entries).
    std::vector<int32_t> getFacetCountsByMaterial(FacetType type) const;

    // Checks that every corner's vertex index is inside the vertex array, that polygon corner
    // counts are 5 to 255, that the per-facet arrays agree in length and that every group
    // index is -1 or a known group. On failure returns false and, with `why`, says what.
    bool validate(QString *why = nullptr) const;

    // ---- Face groups --------------------------------------------------------------------------
    int getFaceGroupCount() const { return static_cast<int>(m_groupNames.size()); }
    // The name of group `index`; empty outside the list.
    QString getFaceGroupName(int index) const;
    // The index of the group named `name` (exact), -1 when there is none. O(1).
    int findFaceGroup(const QString &name) const;
    // The index of the group named `name`, adding it when it is new.
    int addFaceGroup(const QString &name);
    // The vertices used by the facets of group `group`, each once, in ascending index order.
    // O(F + k log k) for k corners in the group.
    std::vector<int32_t> getFaceGroupVertices(int group) const;
    // The same for every group at once (one list per group index), in O(F + C log C).
    std::vector<std::vector<int32_t>> getAllFaceGroupVertices() const;
    // A new mesh (reference count 0) holding only the vertices of `getFaceGroupVertices(group)`,
    // in that order, and no facets; null for an unknown group.
    SgPolyMesh *createFaceGroupMesh(int group) const;

private:
    SgPolyMesh(const SgPolyMesh &other);

    std::unique_ptr<SgMap> m_uvList;
    std::vector<SgFaceCorner> m_triCorners, m_quadCorners, m_polyCorners;
    std::vector<uint32_t> m_polyStarts{0};
    std::vector<uint8_t> m_triMaterials, m_quadMaterials, m_polyMaterials;
    std::vector<int32_t> m_triGroups, m_quadGroups, m_polyGroups;
    std::vector<QString> m_groupNames;
    QHash<QString, int> m_groupIndex;

    std::vector<SgFaceCorner> m_pending;
    uint8_t m_activeMaterial = 0;
    int32_t m_activeGroup = -1;
    bool m_editing = false;
};
