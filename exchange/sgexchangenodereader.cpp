#include "exchange/sgexchangenodereader.h"

#include <QtEndian>

#include <cstring>

namespace {
// The shortest facet record: a type byte, the material, a corner count and one corner.
constexpr std::size_t kShortestFacet = 1 + 4 + 4 + 12;
constexpr std::size_t kCornerBytes = 12;
constexpr uint32_t kMaxPolygonCorners = 255;
} // namespace

SgExchangeNodeReader::SgExchangeNodeReader(const void *data, std::size_t size)
    : m_data(static_cast<const unsigned char *>(data)), m_size(data ? size : 0) {}

bool SgExchangeNodeReader::fail(const QString &why) {
    m_error = why;
    return false;
}

bool SgExchangeNodeReader::need(std::size_t bytes) {
    if (bytes > m_size - m_pos)
        return fail(QStringLiteral("The record ends early at byte %1.").arg(m_pos));
    return true;
}

bool SgExchangeNodeReader::readByte(char &value) {
    if (!need(1))
        return false;
    value = char(m_data[m_pos++]);
    return true;
}

bool SgExchangeNodeReader::readInt(int32_t &value) {
    if (!need(4))
        return false;
    value = qFromLittleEndian<qint32>(m_data + m_pos);
    m_pos += 4;
    return true;
}

bool SgExchangeNodeReader::readUInt(uint32_t &value) {
    if (!need(4))
        return false;
    value = qFromLittleEndian<quint32>(m_data + m_pos);
    m_pos += 4;
    return true;
}

bool SgExchangeNodeReader::readFloats(float *values, std::size_t count) {
    if (count == 0)
        return true;
    if (!need(count * 4))
        return false;
    qFromLittleEndian<float>(m_data + m_pos, qsizetype(count), values);
    m_pos += count * 4;
    return true;
}

bool SgExchangeNodeReader::readString(QString &value) {
    int32_t length = 0;
    if (!readCount(length, 1, "string length"))
        return false;
    value = QString::fromLatin1(reinterpret_cast<const char *>(m_data + m_pos), length);
    m_pos += std::size_t(length);
    return true;
}

bool SgExchangeNodeReader::readCount(int32_t &count, std::size_t bytesPerItem, const char *what) {
    if (!readInt(count))
        return false;
    if (count < 0)
        return fail(QStringLiteral("Negative %1 at byte %2.").arg(QLatin1String(what)).arg(m_pos));
    // Each item needs at least bytesPerItem bytes, so a count that cannot fit is refused before
    // anything is allocated for it.
    if (std::size_t(count) > (m_size - m_pos) / bytesPerItem)
        return fail(QStringLiteral("The %1 %2 does not fit in the record.")
                        .arg(QLatin1String(what))
                        .arg(count));
    return true;
}

bool SgExchangeNodeReader::readMaterial(SgExchangeNode::Material &m) {
    char tag = 0;
    return readByte(tag) && readString(m.name) && readByte(tag) && readFloats(m.diffuse, 3) &&
           readString(m.diffuseImageFolder) && readString(m.diffuseImageCopy) && readByte(tag) &&
           readFloats(m.specular, 3) && readByte(tag) && readFloats(&m.invertedGlossiness, 1) &&
           readByte(tag) && readFloats(&m.opacity, 1) && readByte(tag) &&
           readFloats(&m.bumpStrength, 1) && readString(m.bumpImageFolder) &&
           readString(m.bumpImageCopy);
}

bool SgExchangeNodeReader::readFacets(SgExchangeNode &node) {
    int32_t facetCount = 0;
    if (!readCount(facetCount, kShortestFacet, "facet count"))
        return false;
    node.facets.reserve(std::size_t(facetCount));
    const auto vertexCount = uint32_t(node.vertexCount());
    const auto uvCount = uint32_t(node.uvCount());
    const auto materialCount = uint32_t(node.materials.size());
    for (int32_t f = 0; f < facetCount; ++f) {
        SgExchangeNode::Facet facet;
        if (!readByte(facet.type) || !readUInt(facet.material))
            return false;
        if (facet.type == 'T') {
            facet.cornerCount = 3;
        } else if (facet.type == 'Q') {
            facet.cornerCount = 4;
        } else if (facet.type == 'P') {
            if (!readUInt(facet.cornerCount))
                return false;
            if (facet.cornerCount < 1 || facet.cornerCount > kMaxPolygonCorners)
                return fail(
                    QStringLiteral("Polygon %1 has %2 corners.").arg(f).arg(facet.cornerCount));
        } else {
            return fail(
                QStringLiteral("Facet %1 has the unknown type %2.").arg(f).arg(int(facet.type)));
        }
        if (facet.material >= materialCount)
            return fail(QStringLiteral("Facet %1 uses material %2 of %3.")
                            .arg(f)
                            .arg(facet.material)
                            .arg(materialCount));
        if (!need(std::size_t(facet.cornerCount) * kCornerBytes))
            return false;
        facet.firstCorner = uint32_t(node.corners.size());
        for (uint32_t c = 0; c < facet.cornerCount; ++c) {
            SgExchangeNode::Corner corner;
            readInt(corner.vertex);
            readInt(corner.uv);
            readInt(corner.third);
            if (uint32_t(corner.vertex) >= vertexCount)
                return fail(QStringLiteral("Facet %1 refers to vertex %2 of %3.")
                                .arg(f)
                                .arg(corner.vertex)
                                .arg(vertexCount));
            // -1 is the host's "no UV": a partly mapped mesh sends it beside a UV list.
            if (uvCount > 0 && corner.uv != -1 && uint32_t(corner.uv) >= uvCount)
                return fail(QStringLiteral("Facet %1 refers to UV %2 of %3.")
                                .arg(f)
                                .arg(corner.uv)
                                .arg(uvCount));
            node.corners.push_back(corner);
        }
        node.facets.push_back(facet);
    }
    return true;
}

bool SgExchangeNodeReader::read(SgExchangeNode &node) {
    node = SgExchangeNode();
    m_pos = 0;
    m_error.clear();
    if (!m_data)
        return fail(QStringLiteral("There is no record to read."));
    SgExchangeNode result;
    int32_t count = 0;
    bool ok = readString(result.name) && readCount(count, 12, "vertex count");
    if (ok) {
        result.vertices.resize(std::size_t(count) * 3);
        ok = readFloats(result.vertices.data(), result.vertices.size()) &&
             readCount(count, 8, "UV count");
    }
    if (ok) {
        result.uvs.resize(std::size_t(count) * 2);
        ok = readFloats(result.uvs.data(), result.uvs.size()) &&
             readCount(count, 42 + 5 * 4, "material count");
    }
    for (int32_t m = 0; ok && m < count; ++m) {
        SgExchangeNode::Material material;
        ok = readMaterial(material);
        result.materials.append(material);
    }
    ok = ok && readFacets(result) && readString(result.trailer);
    if (!ok)
        return false;
    node = std::move(result);
    return true;
}
