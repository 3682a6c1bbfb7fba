#pragma once

#include <QByteArray>
#include <QString>

#include <cstdint>
#include <memory>

class SgFigureWelder;
class SgNode;
class SgPolyMesh;
class SgRecordOutput;
class SgShape;
class SgSubDMesh;
class SgVertexMesh;

// Measures and writes the exchange record that sends one scene node to the modeler: name,
// vertices scaled by 0.1, UVs, the materials block (with JPEG copies of the images), the
// facets ordered by material, and the trailer string.
//
// A figure is sent as one welded mesh (through SgFigureWelder, the fourth flag set when the
// application setting "FacetorBridgeTools" is 0); any other node as the geometry of its current
// shape with its morphs applied (SgFigureWelder::getMorphOnlyGeom).
//
// Writing goes straight into the destination (the mapped data segment) and never past the
// measured size: a record that would not fit is not written (0 and a log line).
class SgExchangeWriter {
public:
    // Gathers the node's shape and geometry and measures the record. O(materials); a polygon
    // mesh costs nothing more, welding a figure costs what the welder costs.
    SgExchangeWriter(SgNode *node, const QString &trailer);
    // Deletes the welder if there is one, else drops the reference on the geometry.
    ~SgExchangeWriter();
    SgExchangeWriter(const SgExchangeWriter &) = delete;
    SgExchangeWriter &operator=(const SgExchangeWriter &) = delete;

    // The bytes that the data segment must have: an upper bound of the record, at least the
    // materials allowance (name + 4158 per material) + (trailer + 4) + (name + 8) + 12 V + 4,
    // + 8 U + 4 with a UV list, + 41 triangles + 4 + 53 quads + 3069 polygons for a polygon
    // mesh or 53 patches + 4 for a subdivision mesh, and never below the size that the real
    // image path strings need. 0 when the node has nothing to send or the record would exceed
    // 2 GiB.
    std::int32_t getMeasuredSize() const { return m_measuredSize; }

    // Writes the record at `destination`, which must hold getMeasuredSize() bytes, and returns
    // the bytes written. 0 (with "Error writting node to shared memory map." in the host log)
    // when it fails; 0 without a message when the node, shape, geometry or destination is
    // missing. Cost: about two sweeps over the facets and one over the vertices, plus one JPEG
    // export per image not yet copied.
    std::int32_t write(void *destination) const;

    // The shape and geometry that are sent (null when the node has nothing to send).
    SgShape *getShape() const { return m_shape; }
    SgVertexMesh *getGeometry() const { return m_geometry; }

private:
    void gather();
    std::int64_t measure() const;
    std::int64_t writeMesh(SgRecordOutput &output) const;
    void writeVertices(SgRecordOutput &output) const;
    void writeUVs(SgRecordOutput &output) const;
    void writeSubDPatches(const SgSubDMesh &mesh, SgRecordOutput &output) const;

    SgNode *m_node;
    std::unique_ptr<SgFigureWelder> m_welder;
    SgShape *m_shape = nullptr;
    SgVertexMesh *m_geometry = nullptr;
    QByteArray m_trailer;
    QByteArray m_name;
    std::int32_t m_measuredSize = 0;
};
