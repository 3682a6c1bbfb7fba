#include "exchange/sgfacetblockwriter.h"

#include "exchange/sgrecordoutput.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgsubdmesh.h"

#include <algorithm>
#include <cstring>
#include <vector>

#if defined(__linux__)
#include <unistd.h>
#endif

namespace {

using Tally = std::array<std::int64_t, 256>;

// How far ahead of its write position each material's stream of records is fetched. The
// fetched lines of all streams must wait in the second-level cache until they are written, so
// the distance is that cache's size shared by the streams in use, an eighth of it in all (512
// bytes for 256 streams and 1 MiB), between two and sixteen lines. The cache size is read
// from the system once; measured on this kind of machine against 64 to 1024 bytes.
size_t prefetchDistance(int streams) {
    static const size_t cache = [] {
#if defined(__linux__) && defined(_SC_LEVEL2_CACHE_SIZE)
        const long bytes = sysconf(_SC_LEVEL2_CACHE_SIZE);
        if (bytes > 0)
            return size_t(bytes);
#endif
        return size_t(512 * 1024);
    }();
    const size_t share = cache / 8 / size_t(std::max(streams, 1));
    return std::clamp<size_t>(share / 64 * 64, 128, 1024);
}

// Facet records and their bytes per material, for each of the three kinds.
struct MaterialTally {
    Tally triangles{};
    Tally quads{};
    Tally polygons{};
    Tally polygonBytes{};
    int materialCount = 0;

    std::int64_t facetCount() const {
        std::int64_t n = 0;
        for (int m = 0; m < materialCount; ++m)
            n += triangles[size_t(m)] + quads[size_t(m)] + polygons[size_t(m)];
        return n;
    }
    std::int64_t byteCount() const {
        std::int64_t n = 0;
        for (int m = 0; m < materialCount; ++m)
            n += SgFacetBlockWriter::kTriangleBytes * triangles[size_t(m)] +
                 SgFacetBlockWriter::kQuadBytes * quads[size_t(m)] + polygonBytes[size_t(m)];
        return n;
    }
};

void countMaterials(const std::vector<std::uint8_t> &materials, Tally &counts) {
    for (const std::uint8_t m : materials)
        ++counts[m];
}

MaterialTally tallyPolyMesh(const SgPolyMesh &mesh, int materialCount) {
    MaterialTally tally;
    tally.materialCount = std::clamp(materialCount, 0, 256);
    countMaterials(mesh.triangleMaterials(), tally.triangles);
    countMaterials(mesh.quadMaterials(), tally.quads);
    countMaterials(mesh.polygonMaterials(), tally.polygons);
    const auto &starts = mesh.polygonStarts();
    const auto &materials = mesh.polygonMaterials();
    for (size_t i = 0; i < materials.size(); ++i)
        tally.polygonBytes[materials[i]] +=
            SgFacetBlockWriter::kPolygonHeadBytes +
            SgFacetBlockWriter::kCornerBytes * std::int64_t(starts[i + 1] - starts[i]);
    return tally;
}

// Where the next record of each material goes, for one kind of facet.
using Cursors = std::array<unsigned char *, 256>;

void putHead(unsigned char *at, char type, std::uint32_t material) {
    at[0] = static_cast<unsigned char>(type);
    std::memcpy(at + 1, &material, 4);
}

// Copies fixed-size facets (`corners` per facet) to their material's cursor. The record size
// is a constant, so that each copy is a few moves.
template <int cornersPerFacet>
void scatterFixed(const std::vector<std::uint8_t> &materials, const SgFaceCorner *corners,
                  char type, int materialCount, int streams, Cursors &cursors) {
    constexpr size_t cornerBytes = size_t(cornersPerFacet) * sizeof(SgFaceCorner);
    constexpr size_t recordBytes = 5 + cornerBytes;
    const size_t ahead = prefetchDistance(streams);
    const size_t count = materials.size();
    for (size_t i = 0; i < count; ++i) {
        const std::uint8_t m = materials[i];
        if (m >= materialCount)
            continue;
        unsigned char *at = cursors[m];
        cursors[m] = at + recordBytes;
        // Each material's records form a stream of its own; fetching the stream's next lines
        // ahead keeps many streams nearly as cheap as one.
        __builtin_prefetch(at + ahead, 1);
        putHead(at, type, m);
        std::memcpy(at + 5, corners + i * size_t(cornersPerFacet), cornerBytes);
    }
}

// The materials below `materialCount` that have facets in `counts`.
int streamsIn(const Tally &counts, int materialCount) {
    int streams = 0;
    for (int m = 0; m < materialCount; ++m)
        streams += counts[size_t(m)] != 0;
    return streams;
}

void scatterPolygons(const SgPolyMesh &mesh, int materialCount, Cursors &cursors) {
    const auto &materials = mesh.polygonMaterials();
    const auto &starts = mesh.polygonStarts();
    const SgFaceCorner *corners = mesh.polygonCorners().data();
    for (size_t i = 0; i < materials.size(); ++i) {
        const std::uint8_t m = materials[i];
        if (m >= materialCount)
            continue;
        const std::uint32_t n = starts[i + 1] - starts[i];
        unsigned char *at = cursors[m];
        cursors[m] = at + SgFacetBlockWriter::kPolygonHeadBytes + n * sizeof(SgFaceCorner);
        putHead(at, 'P', m);
        std::memcpy(at + 5, &n, 4);
        std::memcpy(at + 9, corners + starts[i], n * sizeof(SgFaceCorner));
    }
}

} // namespace

std::int64_t SgFacetBlockWriter::measurePolyMesh(const SgPolyMesh &mesh, int materialCount) {
    return 4 + tallyPolyMesh(mesh, materialCount).byteCount();
}

std::int32_t SgFacetBlockWriter::writePolyMesh(const SgPolyMesh &mesh, int materialCount,
                                               SgRecordOutput &output) {
    const MaterialTally tally = tallyPolyMesh(mesh, materialCount);
    const auto facets = static_cast<std::int32_t>(tally.facetCount());
    const std::int64_t bytes = tally.byteCount();
    if (std::uint64_t(bytes) + 4 > output.remaining())
        throw SgRecordOverflow();
    output.putInt32(facets);
    unsigned char *next = output.claim(size_t(bytes));

    // Lay the block out: material 0's triangles, quads, polygons, then material 1's, ...
    Cursors triangles{}, quads{}, polygons{};
    for (int m = 0; m < tally.materialCount; ++m) {
        const size_t i = size_t(m);
        triangles[i] = next;
        next += kTriangleBytes * tally.triangles[i];
        quads[i] = next;
        next += kQuadBytes * tally.quads[i];
        polygons[i] = next;
        next += tally.polygonBytes[i];
    }
    scatterFixed<3>(mesh.triangleMaterials(), mesh.triangleCorners().data(), 'T',
                    tally.materialCount, streamsIn(tally.triangles, tally.materialCount),
                    triangles);
    scatterFixed<4>(mesh.quadMaterials(), mesh.quadCorners().data(), 'Q', tally.materialCount,
                    streamsIn(tally.quads, tally.materialCount), quads);
    scatterPolygons(mesh, tally.materialCount, polygons);
    return facets;
}

std::array<int, 256> SgFacetBlockWriter::identityMaterials() {
    std::array<int, 256> table{};
    for (int i = 0; i < 256; ++i)
        table[size_t(i)] = i;
    return table;
}

std::int32_t SgFacetBlockWriter::writeSubDMesh(const SgSubDMesh &mesh,
                                               const std::array<int, 256> &materialOf,
                                               int materialCount, SgRecordOutput &output) {
    const auto &own = mesh.getPatchMaterials();
    const int kept = std::clamp(materialCount, 0, 256);
    Tally counts{};
    for (const std::uint8_t m : own) {
        const int target = materialOf[m];
        if (target >= 0 && target < kept)
            ++counts[size_t(target)];
    }
    std::int64_t facets = 0;
    for (int m = 0; m < kept; ++m)
        facets += counts[size_t(m)];
    if (std::uint64_t(facets * kQuadBytes) + 4 > output.remaining())
        throw SgRecordOverflow();
    output.putInt32(static_cast<std::int32_t>(facets));
    unsigned char *next = output.claim(size_t(facets * kQuadBytes));

    Cursors cursors{};
    for (int m = 0; m < kept; ++m) {
        cursors[size_t(m)] = next;
        next += kQuadBytes * counts[size_t(m)];
    }
    const auto &vertices = mesh.getVertexIndices();
    const auto &uvs = mesh.getUVIndices();
    const auto &thirds = mesh.getThirdIndices();
    for (size_t i = 0; i < own.size(); ++i) {
        const int target = materialOf[own[i]];
        if (target < 0 || target >= kept)
            continue;
        unsigned char *at = cursors[size_t(target)];
        cursors[size_t(target)] = at + kQuadBytes;
        putHead(at, 'Q', std::uint32_t(target));
        for (size_t k = 0; k < 4; ++k) {
            const std::int32_t corner[3] = {vertices[4 * i + k], uvs[4 * i + k], thirds[4 * i + k]};
            std::memcpy(at + 5 + 12 * k, corner, 12);
        }
    }
    return static_cast<std::int32_t>(facets);
}
