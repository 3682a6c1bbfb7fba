// Feeds arbitrary bytes to SgObjReader. A read either fails with a message that names the
// source and a line, or yields a mesh whose every index is inside its arrays; the mesh is then
// walked the way the welder and the exchange writer walk it. The same bytes with a blank before
// every line (which the reader's fast lines never take) must read the same.
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/io/sgobjreader.h"

#include <QString>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

void checkSameAsGeneralReader(const uint8_t *data, size_t size, const SgObjReader &fast, bool ok) {
    std::string indented = " ";
    for (size_t i = 0; i < size; ++i) {
        indented += char(data[i]);
        if (data[i] == '\n')
            indented += ' ';
    }
    SgObjReader general;
    const bool same =
        general.readBuffer(indented.data(), indented.size(), QStringLiteral("f.obj")) == ok &&
        general.getErrorString() == fast.getErrorString();
    if (!same || !ok) {
        if (!same) {
            std::fprintf(stderr, "fast and general lines differ\n");
            std::abort();
        }
        return;
    }
    const SgPolyMesh &a = *fast.getMesh(), &b = *general.getMesh();
    if (a.getVertexCount() != b.getVertexCount() ||
        (a.getVertexCount() > 0 && std::memcmp(a.getVertices(), b.getVertices(),
                                               sizeof(SgVec3) * size_t(a.getVertexCount())) != 0) ||
        a.getUVCount() != b.getUVCount() || a.triangleCorners() != b.triangleCorners() ||
        a.quadCorners() != b.quadCorners() || a.polygonCorners() != b.polygonCorners()) {
        std::fprintf(stderr, "fast and general lines read different meshes\n");
        std::abort();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    SgObjReader reader;
    const bool ok =
        reader.readBuffer(reinterpret_cast<const char *>(data), size, QStringLiteral("f.obj"));
    checkSameAsGeneralReader(data, size, reader, ok);
    if (!ok) {
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
