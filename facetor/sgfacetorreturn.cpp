#include "facetor/sgfacetorreturn.h"

#include <QtEndian>

namespace {

// Appends little-endian values and exchange strings to a record.
class RecordBytes {
public:
    void byte(char value) { m_bytes.append(value); }
    void int32(int32_t value) { append(qToLittleEndian(value)); }
    void uint32(uint32_t value) { append(qToLittleEndian(value)); }
    void float32(float value) { append(qToLittleEndian(value)); }
    void string(const QString &text) {
        const QByteArray latin1 = text.toLatin1();
        int32(int32_t(latin1.size()));
        m_bytes.append(latin1);
    }
    QByteArray take() { return std::move(m_bytes); }
    void reserve(qsizetype bytes) { m_bytes.reserve(bytes); }

private:
    template <typename T> void append(T value) {
        m_bytes.append(reinterpret_cast<const char *>(&value), sizeof(T));
    }
    QByteArray m_bytes;
};

void writeMaterial(RecordBytes &out, const SgExchangeNode::Material &m) {
    out.byte('m');
    out.string(m.name);
    out.byte('c');
    for (float c : m.diffuse)
        out.float32(c);
    out.string(m.diffuseImageCopy);
    out.byte('s');
    for (float c : m.specular)
        out.float32(c);
    out.byte('g');
    out.float32(m.invertedGlossiness);
    out.byte('t');
    out.float32(1.0f - m.opacity); // the returned entry carries the inverted opacity
    out.byte('b');
    out.float32(m.bumpStrength);
    out.string(m.bumpImageCopy);
}

} // namespace

QByteArray SgFacetorReturn::encode(const SgExchangeNode &node) {
    RecordBytes out;
    out.reserve(qsizetype(64 + node.vertices.size() * 4 + node.uvs.size() * 4 +
                          node.facets.size() * 9 + node.corners.size() * 12));
    out.string(node.name);
    out.int32(int32_t(node.vertexCount()));
    for (size_t i = 0; i < size_t(node.vertexCount()) * 3; ++i)
        out.float32(node.vertices[i]);
    out.int32(int32_t(node.uvCount()));
    for (size_t i = 0; i < size_t(node.uvCount()) * 2; ++i)
        out.float32(node.uvs[i]);
    out.int32(int32_t(node.materials.size()));
    for (const SgExchangeNode::Material &material : node.materials)
        writeMaterial(out, material);
    out.int32(int32_t(node.facets.size()));
    const bool withUvs = node.uvCount() > 0;
    for (const SgExchangeNode::Facet &facet : node.facets) {
        out.byte(facet.type);
        out.uint32(facet.material);
        if (facet.type == 'P')
            out.uint32(facet.cornerCount);
        for (uint32_t c = 0; c < facet.cornerCount; ++c) {
            const SgExchangeNode::Corner &corner = node.corners[facet.firstCorner + c];
            out.int32(corner.vertex);
            out.int32(withUvs ? (corner.uv >= 0 ? corner.uv : 0) : corner.uv);
            out.int32(corner.third);
        }
    }
    out.string(node.trailer);
    return out.take();
}
