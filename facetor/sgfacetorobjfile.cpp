#include "facetor/sgfacetorobjfile.h"

#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/io/sgobjreader.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QHash>
#include <QTextStream>

#include <memory>

namespace {

// The materials of an MTL file by name: diffuse ("Kd") and specular ("Ks") colours, opacity
// ("d") and diffuse map ("map_Kd"). Lines it does not know, and a file that does not open, are
// passed over: the geometry matters more than its colours.
QHash<QString, SgExchangeNode::Material> readMtl(const QString &path) {
    QHash<QString, SgExchangeNode::Material> materials;
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly | QIODevice::Text))
        return materials;
    QTextStream in(&file);
    QString current;
    auto colour = [](const QStringList &parts, float *out) {
        for (int i = 0; i < 3; ++i)
            out[i] = parts[i + 1].toFloat();
    };
    while (!in.atEnd()) {
        const QString line = in.readLine().trimmed();
        const QStringList parts = line.split(QLatin1Char(' '), Qt::SkipEmptyParts);
        if (parts.isEmpty())
            continue;
        const QString &key = parts[0];
        if (key == QLatin1String("newmtl") && parts.size() > 1) {
            current = line.mid(7).trimmed();
            materials[current].name = current;
        } else if (current.isEmpty()) {
            continue;
        } else if (key == QLatin1String("Kd") && parts.size() >= 4) {
            colour(parts, materials[current].diffuse);
        } else if (key == QLatin1String("Ks") && parts.size() >= 4) {
            colour(parts, materials[current].specular);
        } else if (key == QLatin1String("d") && parts.size() >= 2) {
            materials[current].opacity = parts[1].toFloat();
        } else if (key == QLatin1String("map_Kd") && parts.size() >= 2) {
            materials[current].diffuseImageCopy = parts.last();
        }
    }
    return materials;
}

void appendFacets(SgExchangeNode &node, const SgFaceCorner *corners, int count, int material) {
    SgExchangeNode::Facet facet;
    facet.type = count == 3 ? 'T' : count == 4 ? 'Q' : 'P';
    facet.material = uint32_t(material);
    facet.firstCorner = uint32_t(node.corners.size());
    facet.cornerCount = uint32_t(count);
    for (int k = 0; k < count; ++k)
        node.corners.push_back({corners[k].vertex, corners[k].uv, -1});
    node.facets.push_back(facet);
}

} // namespace

bool SgFacetorObjFile::read(const QString &path, const QString &name, SgExchangeNode &node,
                            QString &error) {
    node = SgExchangeNode();
    SgObjReader reader;
    if (!reader.readFile(path)) {
        error = reader.getErrorString();
        return false;
    }
    const SgPolyMesh &mesh = *reader.getMesh();
    if (mesh.getVertexCount() == 0 || mesh.getFacetCount() == 0) {
        error =
            QStringLiteral("%1: no vertices or no faces (the file may be incomplete)").arg(path);
        return false;
    }
    SgExchangeNode result;
    result.name = !name.isEmpty()                     ? name
                  : !reader.getObjectName().isEmpty() ? reader.getObjectName()
                                                      : QFileInfo(path).completeBaseName();
    const auto *points = reinterpret_cast<const float *>(mesh.getVertices());
    result.vertices.assign(points, points + 3 * size_t(mesh.getVertexCount()));
    if (const SgMap *uvs = mesh.getUVList()) {
        const auto *values = reinterpret_cast<const float *>(uvs->values().data());
        result.uvs.assign(values, values + 2 * uvs->values().size());
    }
    QHash<QString, SgExchangeNode::Material> library;
    for (const QString &file : reader.getMaterialLibraries())
        library.insert(readMtl(QFileInfo(path).dir().filePath(file)));
    for (const QString &material : reader.getMaterialNames()) {
        SgExchangeNode::Material entry = library.value(material);
        entry.name = material;
        result.materials.append(entry);
    }
    result.corners.reserve(mesh.triangleCorners().size() + mesh.quadCorners().size() +
                           mesh.polygonCorners().size());
    result.facets.reserve(size_t(mesh.getFacetCount()));
    for (int i = 0; i < mesh.getTriangleCount(); ++i)
        appendFacets(result, mesh.getTriangleCorners(i), 3, mesh.getTriangleMaterial(i));
    for (int i = 0; i < mesh.getQuadCount(); ++i)
        appendFacets(result, mesh.getQuadCorners(i), 4, mesh.getQuadMaterial(i));
    for (int i = 0; i < mesh.getPolygonCount(); ++i)
        appendFacets(result, mesh.getPolygonCorners(i), mesh.getPolygonCornerCount(i),
                     mesh.getPolygonMaterial(i));
    node = std::move(result);
    return true;
}
