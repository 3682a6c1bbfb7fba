#pragma once

#include "sgcore/materials/sgmaterial.h"

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <cstdint>
#include <cstring>
#include <vector>

class SgNode;
class SgPolyMesh;
class SgShape;
struct SgVec2;
struct SgVec3;

// Helpers shared by the exchange tests.
namespace exchangetest {

// Makes the application (QApplication and SgApp) once per process, with settings and the
// temporary folder pointed into a fresh folder of its own.
void ensureApp();
// The host log so far, and forgetting it.
QStringList logLines();
void clearLog();
// The application's temporary folder for this test process.
QString tempPath();

// A material with none of the standard properties.
class BareMaterial : public SgMaterial {
public:
    explicit BareMaterial(const QString &name) : SgMaterial(name) {}
    SgMaterial *clone() const override { return new BareMaterial(getName()); }
};

// A polygon mesh with the given vertices and, when `uvs` is not empty, a UV list.
SgPolyMesh *makeMesh(const std::vector<SgVec3> &vertices, const std::vector<SgVec2> &uvs = {});
// Adds a facet of the given corners (vertex, uv, third) in material `material`.
void addFacet(SgPolyMesh &mesh, int material, const std::vector<std::vector<int>> &corners);
// A node labelled `label` whose object holds `shape` as its current shape (owned by the node).
SgNode *makeNode(const QString &label, SgShape *shape);

// Measures and writes the record of `node`; `measured` receives the measured size.
QByteArray writeNode(SgNode *node, const QString &trailer = QString(),
                     std::int32_t *measured = nullptr);

// The record the modeler would return for a host record: the same name, vertices, UVs, facets
// and trailer, with each host material entry turned into a returned entry (colours and
// strengths as sent, the image copy path as the diffuse image, no bump image).
QByteArray toReturnRecord(const QByteArray &hostRecord);

inline std::int32_t i32At(const QByteArray &bytes, qsizetype offset) {
    std::int32_t value;
    std::memcpy(&value, bytes.constData() + offset, 4);
    return value;
}
inline float f32At(const QByteArray &bytes, qsizetype offset) {
    float value;
    std::memcpy(&value, bytes.constData() + offset, 4);
    return value;
}

} // namespace exchangetest
