#pragma once

#include <array>
#include <cstdint>

class SgPolyMesh;
class SgRecordOutput;
class SgSubDMesh;

// Writes the facet block of an exchange record: the i32 facet count F, then the facet records
// ordered by material (for each material: its triangles 'T', then its quads 'Q', then its
// polygons 'P', each kind in mesh order). Facets whose material is not below the material count
// are left out and not counted.
//
// Cost: one counting pass over the facets' material bytes, then one pass that copies each kept
// facet straight to its place in the destination (one write position per material and kind),
// so the cost does not grow with the number of materials beyond O(materials).
class SgFacetBlockWriter {
public:
    // Bytes of a triangle, quad and polygon record (the polygon without its corners).
    static constexpr std::int64_t kTriangleBytes = 1 + 4 + 3 * 12;
    static constexpr std::int64_t kQuadBytes = 1 + 4 + 4 * 12;
    static constexpr std::int64_t kPolygonHeadBytes = 1 + 4 + 4;
    static constexpr std::int64_t kCornerBytes = 12;

    // Writes F and the facets of `mesh` with `materialCount` materials. Throws SgRecordOverflow
    // before writing any facet when the destination has too little room. Returns F.
    static std::int32_t writePolyMesh(const SgPolyMesh &mesh, int materialCount,
                                      SgRecordOutput &output);

    // The exact bytes writePolyMesh takes (F included). One pass over the facets' materials.
    static std::int64_t measurePolyMesh(const SgPolyMesh &mesh, int materialCount);

    // Writes F and the patches of `mesh` as 'Q' records. A patch belongs to material
    // `materialOf[its own material index]`; values not below `materialCount` (or negative)
    // leave it out. F is the number of patches written. Throws like writePolyMesh.
    static std::int32_t writeSubDMesh(const SgSubDMesh &mesh,
                                      const std::array<int, 256> &materialOf, int materialCount,
                                      SgRecordOutput &output);

    // The table that keeps each patch's own material index.
    static std::array<int, 256> identityMaterials();
};
