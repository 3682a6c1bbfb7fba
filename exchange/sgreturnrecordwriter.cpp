#include "exchange/sgreturnrecordwriter.h"

#include "exchange/sgfacetblockwriter.h"
#include "exchange/sgrecordoutput.h"
#include "sgcore/geometry/sgpolymesh.h"

#include <algorithm>

namespace {

// The fixed bytes of a returned entry plus its three string counts.
constexpr std::int64_t kEntryFixedBytes = 42 + 3 * 4;

void putColor(SgRecordOutput &output, const float (&color)[3]) {
    for (const float channel : color)
        output.putFloat(channel);
}

void putEntry(SgRecordOutput &output, const SgReturnMaterial &material) {
    output.putByte('m');
    output.putString(material.name.toLatin1());
    output.putByte('c');
    putColor(output, material.diffuse);
    output.putString(material.diffuseImage.toLatin1());
    output.putByte('s');
    putColor(output, material.specular);
    output.putByte('g');
    output.putFloat(1.0f - material.glossiness);
    output.putByte('t');
    output.putFloat(1.0f - material.opacity);
    output.putByte('b');
    output.putFloat(material.bumpStrength);
    output.putString(material.bumpImage.toLatin1());
}

} // namespace

SgReturnRecordWriter::SgReturnRecordWriter(const QString &name, const SgPolyMesh &mesh,
                                           std::vector<SgReturnMaterial> materials,
                                           const QString &trailer)
    : m_name(name.toLatin1()), m_mesh(mesh), m_materials(std::move(materials)),
      m_trailer(trailer.toLatin1()) {}

int SgReturnRecordWriter::keptMaterialCount() const {
    return std::max<int>(1, int(std::min<size_t>(m_materials.size(), 256)));
}

std::int64_t SgReturnRecordWriter::measuredSize() const {
    std::int64_t bytes = 4 + m_name.size();
    bytes += 4 + 12 * std::int64_t(m_mesh.getVertexCount());
    bytes += 4 + 8 * std::int64_t(m_mesh.getUVCount());
    bytes += 4;
    for (const SgReturnMaterial &material : m_materials)
        bytes += kEntryFixedBytes + material.name.size() + material.diffuseImage.size() +
                 material.bumpImage.size();
    bytes += SgFacetBlockWriter::measurePolyMesh(m_mesh, keptMaterialCount());
    bytes += 4 + m_trailer.size();
    return bytes;
}

std::int64_t SgReturnRecordWriter::write(void *destination, std::size_t capacity) const {
    if (!destination || measuredSize() > INT32_MAX)
        return 0;
    try {
        SgRecordOutput output(destination, capacity);
        output.putString(m_name);
        output.putInt32(m_mesh.getVertexCount());
        output.putBytes(m_mesh.getVertices(), size_t(m_mesh.getVertexCount()) * 12);
        output.putInt32(m_mesh.getUVCount());
        if (m_mesh.getUVCount() > 0)
            output.putBytes(m_mesh.getUVList()->values().data(), size_t(m_mesh.getUVCount()) * 8);
        output.putInt32(std::int32_t(m_materials.size()));
        for (const SgReturnMaterial &material : m_materials)
            putEntry(output, material);
        SgFacetBlockWriter::writePolyMesh(m_mesh, keptMaterialCount(), output);
        output.putString(m_trailer);
        return std::int64_t(output.written());
    } catch (const SgRecordOverflow &) {
        return 0;
    }
}

QByteArray SgReturnRecordWriter::toByteArray() const {
    const std::int64_t size = measuredSize();
    if (size > INT32_MAX)
        return QByteArray();
    QByteArray bytes(qsizetype(size), '\0');
    if (write(bytes.data(), size_t(size)) != size)
        return QByteArray();
    return bytes;
}
