#include "facetor/sgfacetorworkspace.h"

#include <QFile>
#include <QFileInfo>
#include <QHash>
#include <QSaveFile>
#include <QTextStream>

#include <cmath>

namespace {

constexpr int kMaxPolygonCorners = 255;

QString number(float value) {
    return QString::number(double(value), 'g', 9);
}

QString materialName(const SgExchangeNode &node, uint32_t index) {
    if (index < uint32_t(node.materials.size()) && !node.materials[int(index)].name.isEmpty())
        return node.materials[int(index)].name;
    return QStringLiteral("material%1").arg(index);
}

bool writeMtl(const QString &path, const SgExchangeNode &node) {
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly | QIODevice::Text))
        return false;
    QTextStream out(&file);
    out << "# Materials of " << node.name << "\n";
    for (int m = 0; m < node.materials.size(); ++m) {
        const SgExchangeNode::Material &material = node.materials[m];
        out << "\nnewmtl " << materialName(node, uint32_t(m)) << "\n";
        out << "Kd " << number(material.diffuse[0]) << ' ' << number(material.diffuse[1]) << ' '
            << number(material.diffuse[2]) << "\n";
        out << "Ks " << number(material.specular[0]) << ' ' << number(material.specular[1]) << ' '
            << number(material.specular[2]) << "\n";
        out << "Ns " << number((1.0f - material.invertedGlossiness) * 1000.0f) << "\n";
        out << "d " << number(material.opacity) << "\n";
        if (!material.diffuseImageCopy.isEmpty())
            out << "map_Kd " << material.diffuseImageCopy << "\n";
        if (!material.bumpImageCopy.isEmpty())
            out << "map_bump -bm " << number(material.bumpStrength) << ' ' << material.bumpImageCopy
                << "\n";
    }
    return file.commit();
}

bool writeObj(const QString &path, const QString &mtlName, const SgExchangeNode &node) {
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly | QIODevice::Text))
        return false;
    QTextStream out(&file);
    out << "# Facetor workspace copy of " << node.name << "\n";
    out << "mtllib " << mtlName << "\n";
    out << "o " << node.name << "\n";
    for (size_t i = 0; i + 2 < node.vertices.size(); i += 3)
        out << "v " << number(node.vertices[i]) << ' ' << number(node.vertices[i + 1]) << ' '
            << number(node.vertices[i + 2]) << "\n";
    for (size_t i = 0; i + 1 < node.uvs.size(); i += 2)
        out << "vt " << number(node.uvs[i]) << ' ' << number(node.uvs[i + 1]) << "\n";
    const bool withUvs = !node.uvs.empty();
    int64_t current = -1;
    for (const SgExchangeNode::Facet &facet : node.facets) {
        if (int64_t(facet.material) != current) {
            current = facet.material;
            out << "usemtl " << materialName(node, facet.material) << "\n";
        }
        out << 'f';
        for (uint32_t c = 0; c < facet.cornerCount; ++c) {
            const SgExchangeNode::Corner &corner = node.corners[facet.firstCorner + c];
            out << ' ' << corner.vertex + 1;
            if (withUvs)
                out << '/' << corner.uv + 1;
        }
        out << "\n";
    }
    return file.commit();
}

// Resolves an OBJ index (1-based, or negative from the end) against `count` items.
bool resolveIndex(const QStringView text, int count, int32_t &index) {
    bool ok = false;
    const int value = text.toInt(&ok);
    if (!ok || value == 0)
        return false;
    const int64_t resolved = value > 0 ? int64_t(value) - 1 : int64_t(count) + value;
    if (resolved < 0 || resolved >= count)
        return false;
    index = int32_t(resolved);
    return true;
}

QHash<QString, SgExchangeNode::Material> readMtl(const QString &path) {
    QHash<QString, SgExchangeNode::Material> materials;
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly | QIODevice::Text))
        return materials;
    QTextStream in(&file);
    QString current;
    while (!in.atEnd()) {
        const QString line = in.readLine().trimmed();
        const QStringList parts = line.split(QLatin1Char(' '), Qt::SkipEmptyParts);
        if (parts.isEmpty())
            continue;
        if (parts[0] == QLatin1String("newmtl") && parts.size() > 1) {
            current = line.mid(7).trimmed();
            materials[current].name = current;
        } else if (!current.isEmpty() && parts[0] == QLatin1String("Kd") && parts.size() >= 4) {
            for (int i = 0; i < 3; ++i)
                materials[current].diffuse[i] = parts[i + 1].toFloat();
        } else if (!current.isEmpty() && parts[0] == QLatin1String("Ks") && parts.size() >= 4) {
            for (int i = 0; i < 3; ++i)
                materials[current].specular[i] = parts[i + 1].toFloat();
        } else if (!current.isEmpty() && parts[0] == QLatin1String("d") && parts.size() >= 2) {
            materials[current].opacity = parts[1].toFloat();
        } else if (!current.isEmpty() && parts[0] == QLatin1String("map_Kd") && parts.size() >= 2) {
            materials[current].diffuseImageCopy = parts.last();
        }
    }
    return materials;
}

} // namespace

SgFacetorWorkspace::SgFacetorWorkspace(const QString &folder) : m_folder(folder) {
    m_folder.mkpath(QStringLiteral("."));
}

QString SgFacetorWorkspace::fileBaseName(const QString &nodeName) {
    QString base = nodeName;
    for (QChar &c : base)
        if (!c.isLetterOrNumber() && c != QLatin1Char('-') && c != QLatin1Char('_') &&
            c != QLatin1Char('.'))
            c = QLatin1Char('_');
    if (base.isEmpty() || base.startsWith(QLatin1Char('.')))
        base.prepend(QLatin1String("node"));
    return base;
}

QString SgFacetorWorkspace::writeNode(const SgExchangeNode &node) {
    const QString base = fileBaseName(node.name);
    const QString objPath = m_folder.filePath(base + QLatin1String(".obj"));
    const QString mtlName = base + QLatin1String(".mtl");
    if (!writeMtl(m_folder.filePath(mtlName), node) || !writeObj(objPath, mtlName, node))
        return QString();
    m_nodeByPath.insert(QFileInfo(objPath).absoluteFilePath(), node.name);
    return objPath;
}

QString SgFacetorWorkspace::nodeNameOf(const QString &objPath) const {
    return m_nodeByPath.value(QFileInfo(objPath).absoluteFilePath());
}

bool SgFacetorWorkspace::readObj(const QString &path, const QString &name, SgExchangeNode &node,
                                 QString &error) {
    node = SgExchangeNode();
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly | QIODevice::Text)) {
        error = QStringLiteral("Cannot open %1.").arg(path);
        return false;
    }
    SgExchangeNode result;
    result.name = name.isEmpty() ? QFileInfo(path).completeBaseName() : name;
    QHash<QString, SgExchangeNode::Material> library;
    QHash<QString, int> materialIndex;
    int activeMaterial = -1;
    QTextStream in(&file);
    int lineNumber = 0;
    while (!in.atEnd()) {
        const QString line = in.readLine();
        ++lineNumber;
        const QStringList parts = line.split(QLatin1Char(' '), Qt::SkipEmptyParts);
        if (parts.isEmpty() || parts[0].startsWith(QLatin1Char('#')))
            continue;
        const QString &key = parts[0];
        if (key == QLatin1String("v") && parts.size() >= 4) {
            for (int i = 1; i <= 3; ++i)
                result.vertices.push_back(parts[i].toFloat());
        } else if (key == QLatin1String("vt") && parts.size() >= 3) {
            result.uvs.push_back(parts[1].toFloat());
            result.uvs.push_back(parts[2].toFloat());
        } else if (key == QLatin1String("o") && name.isEmpty() && parts.size() > 1) {
            result.name = line.trimmed().mid(2).trimmed();
        } else if (key == QLatin1String("mtllib") && parts.size() > 1) {
            library = readMtl(QFileInfo(path).dir().filePath(line.trimmed().mid(7).trimmed()));
        } else if (key == QLatin1String("usemtl") && parts.size() > 1) {
            const QString materialName = line.trimmed().mid(7).trimmed();
            if (!materialIndex.contains(materialName)) {
                SgExchangeNode::Material material = library.value(materialName);
                material.name = materialName;
                materialIndex.insert(materialName, int(result.materials.size()));
                result.materials.append(material);
            }
            activeMaterial = materialIndex.value(materialName);
        } else if (key == QLatin1String("f")) {
            const int cornerCount = int(parts.size()) - 1;
            if (cornerCount < 3 || cornerCount > kMaxPolygonCorners) {
                error = QStringLiteral("Line %1: a face with %2 corners.")
                            .arg(lineNumber)
                            .arg(cornerCount);
                return false;
            }
            if (activeMaterial < 0) {
                SgExchangeNode::Material material;
                material.name = QStringLiteral("default");
                materialIndex.insert(material.name, int(result.materials.size()));
                activeMaterial = int(result.materials.size());
                result.materials.append(material);
            }
            SgExchangeNode::Facet facet;
            facet.type = cornerCount == 3 ? 'T' : cornerCount == 4 ? 'Q' : 'P';
            facet.material = uint32_t(activeMaterial);
            facet.firstCorner = uint32_t(result.corners.size());
            facet.cornerCount = uint32_t(cornerCount);
            for (int c = 1; c <= cornerCount; ++c) {
                const QStringList indices = parts[c].split(QLatin1Char('/'));
                SgExchangeNode::Corner corner;
                corner.uv = -1;
                corner.third = -1;
                if (!resolveIndex(indices[0], result.vertexCount(), corner.vertex) ||
                    (indices.size() > 1 && !indices[1].isEmpty() &&
                     !resolveIndex(indices[1], result.uvCount(), corner.uv))) {
                    error = QStringLiteral("Line %1: a corner refers to nothing.").arg(lineNumber);
                    return false;
                }
                result.corners.push_back(corner);
            }
            result.facets.push_back(facet);
        }
    }
    node = std::move(result);
    return true;
}
