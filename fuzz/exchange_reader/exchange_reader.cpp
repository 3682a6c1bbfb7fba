// Feeds arbitrary bytes to the returned-record reader as a segment of exactly that size.
// Whatever it accepts must hold together: indices in range, a material for every facet,
// finite coordinates.

#include "exchange/sgexchangereader.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"

#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <vector>

namespace {

void require(bool condition) {
    if (!condition)
        std::abort();
}

void checkShape(const SgPolyShape &shape) {
    const SgPolyMesh *mesh = shape.getPolyMesh();
    require(mesh != nullptr);
    require(mesh->validate());
    // A coordinate that is not a finite number never reaches the host.
    for (int i = 0; i < mesh->getVertexCount(); ++i) {
        const SgVec3 v = mesh->getVertex(i);
        require(std::isfinite(v.x) && std::isfinite(v.y) && std::isfinite(v.z));
    }
    const int materials = shape.getMaterialCount();
    require(materials >= 1);
    for (const auto *kind :
         {&mesh->triangleMaterials(), &mesh->quadMaterials(), &mesh->polygonMaterials()})
        for (const std::uint8_t m : *kind)
            require(m < materials);
    const int uvs = mesh->getUVCount();
    for (const auto *kind :
         {&mesh->triangleCorners(), &mesh->quadCorners(), &mesh->polygonCorners()})
        for (const SgFaceCorner &corner : *kind)
            require(corner.uv == -1 || (corner.uv >= 0 && corner.uv < uvs));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    // A heap block of exactly the segment's size, so that any read past it is caught.
    std::vector<std::uint8_t> segment(data, data + size);
    QString trailer;
    SgExchangeReader reader(segment.empty() ? nullptr : segment.data(), segment.size());
    std::unique_ptr<SgPolyShape> shape(reader.readShape(trailer));
    if (shape)
        checkShape(*shape);
    return 0;
}
