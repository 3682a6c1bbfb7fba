// Feeds arbitrary bytes to SgObjReader. A read either fails with a message that names the
// source and a line, or yields a mesh whose every index is inside its arrays; the mesh is then
// walked the way the welder and the exchange writer walk it.
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/io/sgobjreader.h"

#include <QString>

#include <cstdio>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    SgObjReader reader;
    if (!reader.readBuffer(reinterpret_cast<const char *>(data), size, QStringLiteral("f.obj"))) {
        if (!reader.getErrorString().startsWith(QStringLiteral("f.obj:")) || reader.getMesh()) {
            std::fprintf(stderr, "bad failure report\n");
            std::abort();
        }
        return 0;
    }
    const SgPolyMesh *mesh = reader.getMesh();
    QString why;
    if (!mesh->validate(&why)) {
        std::fprintf(stderr, "invalid mesh: %s\n", qPrintable(why));
        std::abort();
    }
    if (mesh->getFacetCount() > 0 && reader.getMaterialNames().isEmpty()) {
        std::fprintf(stderr, "facets without materials\n");
        std::abort();
    }
    for (int i = 0; i < mesh->getTriangleCount(); ++i) {
        if (mesh->getTriangleMaterial(i) >= reader.getMaterialNames().size()) {
            std::abort();
        }
    }
    const auto groups = mesh->getAllFaceGroupVertices();
    for (int g = 0; g < mesh->getFaceGroupCount(); ++g) {
        if (mesh->getFaceGroupVertices(g) != groups[size_t(g)]) {
            std::abort();
        }
    }
    (void)mesh->getFacetOrderByMaterial(SgPolyMesh::Polygon);
    (void)mesh->getBoundingBox();
    return 0;
}
