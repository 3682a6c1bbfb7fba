#include "exchange/sgexchangereader.h"

#include "exchange/sgfacetblockwriter.h"
#include "exchange/sgmaterialblockreader.h"
#include "exchange/sgrecordinput.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace {

// Host coordinates are ten times the modeler's.
constexpr double kToHostUnits = 10.0;

// A mesh under construction; deleted unless handed on.
struct MeshUnderConstruction {
    SgPolyMesh *mesh = new SgPolyMesh;
    ~MeshUnderConstruction() { delete mesh; }
    SgPolyMesh *release() { return std::exchange(mesh, nullptr); }
};

// A coordinate that is not a finite number, or becomes one only in host units, would tear
// any morph made from the record: the record is refused.
float toHostUnits(float value) {
    const auto scaled = float(value * kToHostUnits);
    if (!std::isfinite(scaled))
        throw SgRecordError("vertex coordinate not finite");
    return scaled;
}

void readVertices(SgRecordInput &input, SgPolyMesh &mesh) {
    const std::int32_t count = input.count(12);
    SgVec3 *vertices = mesh.setVertexArray(count);
    const unsigned char *source = input.take(size_t(count) * 12);
    for (std::int32_t i = 0; i < count; ++i) {
        float xyz[3];
        std::memcpy(xyz, source + size_t(i) * 12, 12);
        vertices[i] = SgVec3(toHostUnits(xyz[0]), toHostUnits(xyz[1]), toHostUnits(xyz[2]));
    }
}

void readUVs(SgRecordInput &input, SgPolyMesh &mesh) {
    const std::int32_t count = input.count(8);
    if (count == 0)
        return;
    auto *uvList = new SgMap(SgMap::UVMap);
    mesh.setUVList(uvList);
    uvList->values().resize(size_t(count));
    std::memcpy(uvList->values().data(), input.take(size_t(count) * 8), size_t(count) * 8);
    for (const SgVec2 &uv : uvList->values())
        if (!std::isfinite(uv.u) || !std::isfinite(uv.v))
            throw SgRecordError("UV value not finite");
}

// Reads facet records into the mesh's arrays, checking every index first. A bad vertex index
// refuses the record; a material index outside the usable materials stands for material 0 and a
// UV index outside the UV list for none, so that a modeler that returns fewer materials or UVs
// does not lose the user's edit.
class FacetReader {
public:
    FacetReader(SgPolyMesh &mesh, int materialCount)
        : m_mesh(mesh), m_vertexCount(std::uint32_t(mesh.getVertexCount())),
          m_uvCount(std::uint32_t(mesh.getUVCount())), m_materialCount(materialCount) {}

    void read(SgRecordInput &input) {
        const std::int32_t count = input.count(5);
        reserve(count, input.remaining());
        for (std::int32_t i = 0; i < count; ++i)
            readFacet(input);
    }

private:
    void reserve(std::int32_t count, size_t bytes) {
        const size_t triangles =
            std::min(size_t(count), bytes / size_t(SgFacetBlockWriter::kTriangleBytes));
        const size_t quads =
            std::min(size_t(count), bytes / size_t(SgFacetBlockWriter::kQuadBytes));
        m_mesh.triangleCorners().reserve(triangles * 3);
        m_mesh.triangleMaterials().reserve(triangles);
        m_mesh.triangleGroups().reserve(triangles);
        m_mesh.quadCorners().reserve(quads * 4);
        m_mesh.quadMaterials().reserve(quads);
        m_mesh.quadGroups().reserve(quads);
    }

    void readFacet(SgRecordInput &input) {
        const std::uint8_t type = input.byte();
        std::uint32_t material = input.uint32();
        if (material >= std::uint32_t(m_materialCount))
            material = 0;
        std::uint32_t corners = 0;
        if (type == 'T')
            corners = 3;
        else if (type == 'Q')
            corners = 4;
        else if (type == 'P')
            corners = input.uint32();
        if (corners > std::uint32_t(SgPolyMesh::kMaxPolygonCorners))
            throw SgRecordError("too many facet corners");
        const unsigned char *source = input.take(corners * 12);
        store(source, corners, std::uint8_t(material));
    }

    SgFaceCorner readCorner(const unsigned char *source) const {
        std::int32_t indices[2];
        std::memcpy(indices, source, 8);
        if (std::uint32_t(indices[0]) >= m_vertexCount)
            throw SgRecordError("vertex index out of range");
        SgFaceCorner corner;
        corner.vertex = indices[0];
        // Without a UV list the UV indices mean nothing; -1 is the host's "no UV".
        if (std::uint32_t(indices[1]) < m_uvCount)
            corner.uv = indices[1];
        return corner;
    }

    // A facet of fewer than three corners (an unknown type gives none) is an empty face: the
    // host keeps nothing of it. A bad corner throws; the mesh is then discarded whole.
    void store(const unsigned char *source, std::uint32_t corners, std::uint8_t material) {
        if (corners == 3) {
            append(m_mesh.triangleCorners(), source, 3);
            m_mesh.triangleMaterials().push_back(material);
            m_mesh.triangleGroups().push_back(-1);
        } else if (corners == 4) {
            append(m_mesh.quadCorners(), source, 4);
            m_mesh.quadMaterials().push_back(material);
            m_mesh.quadGroups().push_back(-1);
        } else if (corners >= 5) {
            append(m_mesh.polygonCorners(), source, corners);
            m_mesh.polygonStarts().push_back(std::uint32_t(m_mesh.polygonCorners().size()));
            m_mesh.polygonMaterials().push_back(material);
            m_mesh.polygonGroups().push_back(-1);
        }
    }

    void append(std::vector<SgFaceCorner> &to, const unsigned char *source, std::uint32_t n) const {
        for (std::uint32_t k = 0; k < n; ++k)
            to.push_back(readCorner(source + 12 * k));
    }
    SgPolyMesh &m_mesh;
    std::uint32_t m_vertexCount;
    std::uint32_t m_uvCount;
    int m_materialCount;
};

} // namespace

SgPolyShape *SgExchangeReader::readShape(QString &trailer) const {
    if (!m_record)
        return nullptr;
    try {
        return readRecord(trailer).release();
    } catch (...) {
        if (sgApp)
            sgApp->log(QStringLiteral("Error reading memory map"));
        return nullptr;
    }
}

std::unique_ptr<SgPolyShape> SgExchangeReader::readRecord(QString &trailer) const {
    SgRecordInput input(m_record, m_size);
    const QString name = QString::fromLatin1(input.string());

    MeshUnderConstruction building;
    SgPolyMesh &mesh = *building.mesh;
    mesh.beginEdit(true);
    readVertices(input, mesh);
    readUVs(input, mesh);
    SgMaterialBlockReader materials;
    materials.read(input);
    FacetReader(mesh, materials.usableMaterialCount()).read(input);
    mesh.finishEdit();
    const QString trailerText = QString::fromLatin1(input.string());

    // The whole record is sound: only now are host objects made.
    auto shape = std::make_unique<SgPolyShape>();
    shape->setName(name);
    materials.applyTo(*shape);
    shape->setPolyMesh(building.release());
    trailer = trailerText;
    return shape;
}
