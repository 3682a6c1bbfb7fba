#include "facetor/sgfacetorworkspace.h"

#include <QFile>
#include <QFileInfo>
#include <QSaveFile>
#include <QTextStream>

#include <cmath>

namespace {

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
