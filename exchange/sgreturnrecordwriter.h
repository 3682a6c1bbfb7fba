#pragma once

#include "exchange/sgreturnmaterial.h"

#include <QByteArray>
#include <QString>

#include <cstddef>
#include <cstdint>
#include <vector>

class SgPolyMesh;

// Writes the exchange record that the modeler returns to the host: name, vertices, UVs, the
// returned materials block (per material 'm', name, 'c', diffuse colour, diffuse image path,
// 's', specular colour, 'g', 1 - glossiness, 't', 1 - opacity, 'b', bump strength, bump image
// path), the facets ordered by material, and the trailer.
//
// Vertices are written as they stand, in the modeler's units (the host scales them by 10).
// Facets whose material is not below the material count are left out; with no material the
// facets of material 0 are kept, since the host then gives the shape one "default" material.
class SgReturnRecordWriter {
public:
    // Keeps references to `mesh`, which must outlive the writer.
    SgReturnRecordWriter(const QString &name, const SgPolyMesh &mesh,
                         std::vector<SgReturnMaterial> materials, const QString &trailer);

    // The exact size of the record in bytes. One pass over the facets' materials.
    std::int64_t measuredSize() const;

    // Writes the record at `destination`, which holds `capacity` bytes, and returns the bytes
    // written; 0 (and nothing written past `capacity`) when the record does not fit or is
    // larger than a segment can be (2 GiB).
    std::int64_t write(void *destination, std::size_t capacity) const;

    // The record as a byte array (empty when it cannot be written).
    QByteArray toByteArray() const;

private:
    int keptMaterialCount() const;

    QByteArray m_name;
    const SgPolyMesh &m_mesh;
    std::vector<SgReturnMaterial> m_materials;
    QByteArray m_trailer;
};
