#include "sgcore/io/sgobjwriter.h"

#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/io/sgfileio.h"

#include <charconv>

void SgObjWriter::comment(const QString &text) {
    m_text += "# ";
    m_text += text.toUtf8();
    m_text += '\n';
}

void SgObjWriter::object(const QString &name) {
    m_text += "o ";
    m_text += name.toUtf8();
    m_text += '\n';
}

void SgObjWriter::appendFloat(float value) {
    char buffer[32];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    m_text.append(buffer, result.ptr - buffer);
}

void SgObjWriter::appendInt(long long value) {
    char buffer[24];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    m_text.append(buffer, result.ptr - buffer);
}

void SgObjWriter::vertices(const float *xyz, std::size_t count) {
    m_text.reserve(m_text.size() + qsizetype(count) * 36);
    for (std::size_t i = 0; i < count; ++i) {
        m_text += "v ";
        appendFloat(xyz[3 * i]);
        m_text += ' ';
        appendFloat(xyz[3 * i + 1]);
        m_text += ' ';
        appendFloat(xyz[3 * i + 2]);
        m_text += '\n';
    }
}

void SgObjWriter::materialLibrary(const QString &fileName) {
    m_text += "mtllib ";
    m_text += fileName.toUtf8();
    m_text += '\n';
}

void SgObjWriter::uvs(const float *uv, std::size_t count) {
    m_text.reserve(m_text.size() + qsizetype(count) * 24);
    for (std::size_t i = 0; i < count; ++i) {
        m_text += "vt ";
        appendFloat(uv[2 * i]);
        m_text += ' ';
        appendFloat(uv[2 * i + 1]);
        m_text += '\n';
    }
}

void SgObjWriter::group(const QString &name) {
    m_text += "g ";
    m_text += name.toUtf8();
    m_text += '\n';
}

void SgObjWriter::material(const QString &name) {
    m_text += "usemtl ";
    m_text += name.toUtf8();
    m_text += '\n';
}

void SgObjWriter::face(const int *indices, std::size_t count) {
    m_text += 'f';
    for (std::size_t i = 0; i < count; ++i) {
        m_text += ' ';
        appendInt(static_cast<long long>(indices[i]) + 1);
    }
    m_text += '\n';
}

void SgObjWriter::face(const SgFaceCorner *corners, std::size_t count, int vertexBase, int uvBase,
                       int uvCount) {
    m_text += 'f';
    for (std::size_t i = 0; i < count; ++i) {
        m_text += ' ';
        appendInt(static_cast<long long>(corners[i].vertex) + vertexBase + 1);
        if (corners[i].uv >= 0 && corners[i].uv < uvCount) {
            m_text += '/';
            appendInt(static_cast<long long>(corners[i].uv) + uvBase + 1);
        }
    }
    m_text += '\n';
}

void SgObjWriter::facets(const SgPolyMesh &mesh, const QStringList &materials, int vertexBase,
                         int uvBase, bool withGroups) {
    const int uvCount = mesh.getUVCount();
    int material = -1;
    int group = -2;
    auto one = [&](const SgFaceCorner *corners, int count, int facetMaterial, int facetGroup) {
        if (withGroups && facetGroup != group) {
            group = facetGroup;
            if (group >= 0)
                this->group(mesh.getFaceGroupName(group));
            else
                m_text += "g\n";
        }
        if (facetMaterial != material) {
            material = facetMaterial;
            this->material(material < materials.size()
                               ? materials.at(material)
                               : QStringLiteral("material%1").arg(material));
        }
        face(corners, size_t(count), vertexBase, uvBase, uvCount);
    };
    for (int i = 0; i < mesh.getTriangleCount(); ++i)
        one(mesh.getTriangleCorners(i), 3, mesh.getTriangleMaterial(i), mesh.getTriangleGroup(i));
    for (int i = 0; i < mesh.getQuadCount(); ++i)
        one(mesh.getQuadCorners(i), 4, mesh.getQuadMaterial(i), mesh.getQuadGroup(i));
    for (int i = 0; i < mesh.getPolygonCount(); ++i)
        one(mesh.getPolygonCorners(i), mesh.getPolygonCornerCount(i), mesh.getPolygonMaterial(i),
            mesh.getPolygonGroup(i));
}

bool SgObjWriter::save(const QString &path) {
    m_error.clear();
    return SgFileIO::writeWholeFile(path, m_text, &m_error);
}
