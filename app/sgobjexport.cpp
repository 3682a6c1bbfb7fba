#include "app/sgobjexport.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/io/sgmtlwriter.h"
#include "sgcore/io/sgobjwriter.h"
#include "sgcore/materials/sgmaterial.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

#include <QFileInfo>

namespace {

// Where the next node's indices start in the file.
struct Offsets {
    int vertices = 0;
    int uvs = 0;
};

// Appends one node's posed and morphed geometry as a group, with its UVs and facets, and adds
// its materials to the library.
void writeNode(SgObjWriter &writer, SgMtlWriter &library, SgNode *node, const QString &groupName,
               Offsets &at) {
    SgObject *object = node->getObject();
    if (object == nullptr || object->getCurrentShape() == nullptr)
        return;
    const SgShape *shape = object->getCurrentShape();
    SgVertexMesh *current = object->getCachedGeom();
    if (current == nullptr)
        return;
    writer.group(groupName);
    const int vertexCount = current->getVertexCount();
    writer.vertices(reinterpret_cast<const float *>(current->getVertices()), size_t(vertexCount));
    library.add(shape->getAllMaterials());
    const auto *mesh = dynamic_cast<const SgPolyMesh *>(shape->getGeometry());
    if (mesh != nullptr) {
        if (const SgMap *uvs = mesh->getUVList())
            writer.uvs(reinterpret_cast<const float *>(uvs->values().data()), uvs->values().size());
        QStringList materials;
        for (const SgMaterial *material : shape->getAllMaterials())
            materials.append(material->getName());
        writer.facets(*mesh, materials, at.vertices, at.uvs, false);
        at.uvs += mesh->getUVCount();
    }
    at.vertices += vertexCount;
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
    const QFileInfo info(path);
    const QString mtlName = info.completeBaseName() + QStringLiteral(".mtl");
    SgObjWriter writer;
    SgMtlWriter library(info.absoluteDir());
    writer.comment(QStringLiteral("Scenara export of %1").arg(node->getLabel()));
    writer.materialLibrary(mtlName);
    writer.object(node->getLabel());
    Offsets written;
    if (auto *figure = dynamic_cast<SgSkeleton *>(node)) {
        for (SgBone *bone : figure->getAllBones())
            writeNode(writer, library, bone, bone->getName(), written);
    } else {
        writeNode(writer, library, node, node->getLabel(), written);
    }
    if (written.vertices == 0)
        return fail(QStringLiteral("%1 has no geometry to export.").arg(node->getLabel()));
    const QString mtlPath = info.absoluteDir().filePath(mtlName);
    if (!library.save(mtlPath))
        return fail(QStringLiteral("Could not write %1: %2").arg(mtlPath, library.errorString()));
    if (!writer.save(path))
        return fail(QStringLiteral("Could not write %1: %2").arg(path, writer.errorString()));
    return true;
}
