#include "app/sgobjexport.h"

#include "app/sgobjwriter.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/materials/sgmaterial.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

#include <vector>

namespace {

// Writes the facets of one kind, switching material lines as the material index changes.
// `corners(i)` and `count(i)` give facet i's corners; indices are shifted by `base`.
template <typename Corners, typename Count, typename Material>
void writeFacets(SgObjWriter &writer, int facets, Corners corners, Count count, Material material,
                 const SgShape *shape, int base, int &currentMaterial) {
    std::vector<int> indices;
    for (int i = 0; i < facets; ++i) {
        const int m = material(i);
        if (m != currentMaterial && shape != nullptr) {
            const SgMaterial *mat = shape->getMaterial(m);
            writer.material(mat ? mat->getName() : QStringLiteral("material%1").arg(m));
            currentMaterial = m;
        }
        const SgFaceCorner *c = corners(i);
        const int n = count(i);
        indices.resize(size_t(n));
        for (int k = 0; k < n; ++k)
            indices[size_t(k)] = c[k].vertex + base;
        writer.face(indices.data(), indices.size());
    }
}

// Appends one node's posed and morphed geometry as a group; returns its vertex count.
int writeNode(SgObjWriter &writer, SgNode *node, const QString &groupName, int base) {
    SgObject *object = node->getObject();
    if (object == nullptr || object->getCurrentShape() == nullptr)
        return 0;
    const SgShape *shape = object->getCurrentShape();
    SgVertexMesh *current = object->getCachedGeom();
    if (current == nullptr)
        return 0;
    writer.group(groupName);
    const int vertexCount = current->getVertexCount();
    writer.vertices(reinterpret_cast<const float *>(current->getVertices()), size_t(vertexCount));
    const auto *mesh = dynamic_cast<const SgPolyMesh *>(shape->getGeometry());
    if (mesh == nullptr)
        return vertexCount;
    int currentMaterial = -1;
    writeFacets(
        writer, mesh->getTriangleCount(), [&](int i) { return mesh->getTriangleCorners(i); },
        [](int) { return 3; }, [&](int i) { return int(mesh->getTriangleMaterial(i)); }, shape,
        base, currentMaterial);
    writeFacets(
        writer, mesh->getQuadCount(), [&](int i) { return mesh->getQuadCorners(i); },
        [](int) { return 4; }, [&](int i) { return int(mesh->getQuadMaterial(i)); }, shape, base,
        currentMaterial);
    writeFacets(
        writer, mesh->getPolygonCount(), [&](int i) { return mesh->getPolygonCorners(i); },
        [&](int i) { return mesh->getPolygonCornerCount(i); },
        [&](int i) { return int(mesh->getPolygonMaterial(i)); }, shape, base, currentMaterial);
    return vertexCount;
}

} // namespace

bool SgObjExport::exportNode(SgNode *node, const QString &path, QString *error) {
    auto fail = [error](const QString &message) {
        if (error)
            *error = message;
        return false;
    };
    if (node == nullptr)
        return fail(QStringLiteral("No node to export."));
    SgObjWriter writer;
    writer.comment(QStringLiteral("Scenara export of %1").arg(node->getLabel()));
    writer.object(node->getLabel());
    int written = 0;
    if (auto *figure = dynamic_cast<SgSkeleton *>(node)) {
        for (SgBone *bone : figure->getAllBones())
            written += writeNode(writer, bone, bone->getName(), written);
    } else {
        written = writeNode(writer, node, node->getLabel(), 0);
    }
    if (written == 0)
        return fail(QStringLiteral("%1 has no geometry to export.").arg(node->getLabel()));
    if (!writer.save(path))
        return fail(QStringLiteral("Could not write %1: %2").arg(path, writer.errorString()));
    return true;
}
