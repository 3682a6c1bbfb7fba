// Writes the checked-in seed corpus of the exchange reader fuzzer: small returned records made
// by the return-direction writer, plus a few hand-edited variants.
// Usage: exchange_reader_corpus <folder>

#include "exchange/sgreturnrecordwriter.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgpolymesh.h"

#include <QByteArray>
#include <QDir>
#include <QFile>

#include <cstdio>
#include <cstring>
#include <memory>

namespace {

std::unique_ptr<SgPolyMesh> mesh(int vertices, int uvs) {
    auto m = std::make_unique<SgPolyMesh>();
    m->beginEdit(true);
    SgVec3 *v = m->setVertexArray(vertices);
    for (int i = 0; i < vertices; ++i)
        v[i] = SgVec3(float(i), float(i % 3), float(i % 5) * 0.5f);
    if (uvs > 0) {
        auto *map = new SgMap(SgMap::UVMap);
        for (int i = 0; i < uvs; ++i)
            map->appendPnt2Value(float(i) / float(uvs), 1.0f - float(i) / float(uvs));
        m->setUVList(map);
    }
    return m;
}

void face(SgPolyMesh &m, int material, std::initializer_list<int> vertices, bool withUVs) {
    m.activateMaterial(material);
    m.startFace();
    for (const int v : vertices)
        m.addFaceEdge(v, withUVs ? v : -1);
    m.finishFace();
}

SgReturnMaterial material(const char *name, const char *image, const char *bump) {
    SgReturnMaterial m;
    m.name = QString::fromLatin1(name);
    m.diffuse[0] = 1.0f;
    m.diffuse[1] = 0.50196081f;
    m.glossiness = 0.25f;
    m.opacity = 0.75f;
    m.bumpStrength = 0.5f;
    m.diffuseImage = QString::fromLatin1(image);
    m.bumpImage = QString::fromLatin1(bump);
    return m;
}

bool save(const QString &folder, const char *name, const QByteArray &bytes) {
    QFile file(folder + QLatin1Char('/') + QLatin1String(name));
    return !bytes.isEmpty() && file.open(QIODevice::WriteOnly) && file.write(bytes) == bytes.size();
}

} // namespace

int main(int argc, char **argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: %s <folder>\n", argv[0]);
        return 2;
    }
    const QString folder = QString::fromLocal8Bit(argv[1]);
    QDir().mkpath(folder);
    bool ok = true;

    auto empty = mesh(0, 0);
    ok &=
        save(folder, "empty", SgReturnRecordWriter(QString(), *empty, {}, QString()).toByteArray());

    auto triangle = mesh(3, 0);
    face(*triangle, 0, {0, 1, 2}, false);
    ok &= save(
        folder, "triangle",
        SgReturnRecordWriter("A", *triangle, {material("M", "", "")}, QString()).toByteArray());
    ok &= save(folder, "default-material",
               SgReturnRecordWriter("A", *triangle, {}, "trailer").toByteArray());

    auto mixed = mesh(8, 8);
    face(*mixed, 1, {0, 1, 2}, true);
    face(*mixed, 0, {0, 1, 3, 2}, true);
    face(*mixed, 1, {0, 1, 2, 3, 4, 5, 6}, true);
    face(*mixed, 0, {4, 5, 6}, false);
    const std::vector<SgReturnMaterial> two = {material("skin", "/maps/skin.jpg", ""),
                                               material("cloth", "", "/maps/bump.jpg")};
    const QByteArray mixedRecord = SgReturnRecordWriter("Prop", *mixed, two, "t").toByteArray();
    ok &= save(folder, "mixed", mixedRecord);

    // An unknown facet type: the quad of material 0 (first facet) relabelled 'X' and left
    // with no corners (a type the reader does not know has none).
    QByteArray unknown = mixedRecord;
    const qsizetype quad = unknown.indexOf(QByteArray("Q\0\0\0\0", 5));
    if (quad > 0) {
        unknown[quad] = 'X';
        unknown.remove(quad + 5, 48);
    }
    ok &= save(folder, "unknown-type", unknown);

    // A polygon record of two corners (an empty face).
    auto thin = mesh(3, 0);
    face(*thin, 0, {0, 1, 2}, false);
    QByteArray shortPolygon =
        SgReturnRecordWriter("thin", *thin, {material("M", "", "")}, QString()).toByteArray();
    const qsizetype t = shortPolygon.indexOf(QByteArray("T\0\0\0\0", 5));
    if (t > 0) {
        const std::int32_t two = 2;
        shortPolygon[t] = 'P';
        shortPolygon.insert(t + 5, reinterpret_cast<const char *>(&two), 4);
        shortPolygon.remove(t + 9 + 24, 12);
    }
    ok &= save(folder, "short-polygon", shortPolygon);

    std::puts(ok ? "corpus written" : "corpus incomplete");
    return ok ? 0 : 1;
}
