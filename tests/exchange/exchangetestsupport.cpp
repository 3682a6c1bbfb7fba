#include "exchangetestsupport.h"

#include "exchange/sgexchangewriter.h"
#include "exchange/sgrecordinput.h"
#include "exchange/sgrecordoutput.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/scene/sgnode.h"

#include <QApplication>
#include <QTemporaryDir>

namespace exchangetest {

namespace {
QTemporaryDir *folder = nullptr;
}

void ensureApp() {
    if (sgApp)
        return;
    static int argc = 1;
    static char name[] = "exchange-test";
    static char *argv[] = {name, nullptr};
    new QApplication(argc, argv);
    folder = new QTemporaryDir;
    SgAppSettings::setFileName(folder->filePath(QStringLiteral("scenara.ini")));
    new SgApp;
    sgApp->setTempPath(folder->filePath(QStringLiteral("temp")));
}

QStringList logLines() {
    return sgApp->getMessageSink()->logLines();
}
void clearLog() {
    sgApp->getMessageSink()->clear();
}
QString tempPath() {
    return sgApp->getTempPath();
}

SgPolyMesh *makeMesh(const std::vector<SgVec3> &vertices, const std::vector<SgVec2> &uvs) {
    auto *mesh = new SgPolyMesh;
    mesh->beginEdit(true);
    SgVec3 *to = mesh->setVertexArray(int(vertices.size()));
    std::copy(vertices.begin(), vertices.end(), to);
    if (!uvs.empty()) {
        auto *map = new SgMap(SgMap::UVMap);
        for (const SgVec2 &uv : uvs)
            map->appendPnt2Value(uv.u, uv.v);
        mesh->setUVList(map);
    }
    mesh->finishEdit();
    return mesh;
}

void addFacet(SgPolyMesh &mesh, int material, const std::vector<std::vector<int>> &corners) {
    mesh.beginEdit(false);
    mesh.activateMaterial(material);
    mesh.startFace();
    for (const auto &c : corners)
        mesh.addFaceEdge(c[0], c.size() > 1 ? c[1] : -1, c.size() > 2 ? c[2] : -1);
    mesh.finishFace();
    mesh.finishEdit();
}

SgNode *makeNode(const QString &label, SgShape *shape) {
    auto *node = new SgNode(label);
    auto *object = new SgObject(label);
    object->addShape(shape);
    node->setObject(object);
    return node;
}

QByteArray writeNode(SgNode *node, const QString &trailer, std::int32_t *measured) {
    SgExchangeWriter writer(node, trailer);
    if (measured)
        *measured = writer.getMeasuredSize();
    QByteArray bytes(writer.getMeasuredSize(), '\x7f');
    const std::int32_t written = writer.write(bytes.data());
    bytes.truncate(written);
    return bytes;
}

QByteArray toReturnRecord(const QByteArray &hostRecord) {
    SgRecordInput in(hostRecord.constData(), size_t(hostRecord.size()));
    QByteArray out(hostRecord.size() + 64, '\0');
    SgRecordOutput put(out.data(), size_t(out.size()));
    put.putString(in.string());
    const std::int32_t vertices = in.count(12);
    put.putInt32(vertices);
    put.putBytes(in.take(size_t(vertices) * 12), size_t(vertices) * 12);
    const std::int32_t uvs = in.count(8);
    put.putInt32(uvs);
    put.putBytes(in.take(size_t(uvs) * 8), size_t(uvs) * 8);
    const std::int32_t materials = in.int32();
    put.putInt32(materials);
    for (std::int32_t i = 0; i < materials; ++i) {
        put.putByte(in.byte()); // m
        put.putString(in.string());
        put.putByte(in.byte()); // c
        put.putBytes(in.take(12), 12);
        in.string(); // image folder
        put.putString(in.string());
        put.putByte(in.byte()); // s
        put.putBytes(in.take(12), 12);
        put.putBytes(in.take(15), 15); // g, t, b with their floats
        in.string();
        in.string();
        put.putString(QByteArray());
    }
    const size_t rest = in.remaining();
    put.putBytes(in.take(rest), rest); // facets and trailer as they stand
    out.truncate(qsizetype(put.written()));
    return out;
}

} // namespace exchangetest
