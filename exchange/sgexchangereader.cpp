#include "exchange/sgexchangereader.h"

#include "exchange/sgfacetblockwriter.h"
#include "exchange/sgmaterialblockreader.h"
#include "exchange/sgrecordinput.h"
#include "exchange/sgscaledfloats.h"
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

// Whether the float bits `bits` are infinite or not a number (all exponent bits set).
inline std::uint32_t notFinite(std::uint32_t bits) {
    return std::uint32_t((bits & 0x7F800000u) == 0x7F800000u);
}

// A coordinate that is not a finite number, or becomes one only in host units, would tear
// any morph made from the record: the record is refused. The check runs over all coordinates
// in vector code and tells once, at the end.
void readVertices(SgRecordInput &input, SgPolyMesh &mesh) {
    const std::int32_t count = input.count(12);
    static_assert(sizeof(SgVec3) == 12);
    auto *to = mesh.setVertexArray(count);
    const unsigned char *source = input.take(size_t(count) * 12);
    if (sgScaleFloats(source, to, size_t(count) * 3, kToHostUnits))
        throw SgRecordError("vertex coordinate not finite");
}

void readUVs(SgRecordInput &input, SgPolyMesh &mesh) {
    const std::int32_t count = input.count(8);
    if (count == 0)
        return;
    auto *uvList = new SgMap(SgMap::UVMap);
    mesh.setUVList(uvList);
    uvList->values().resize(size_t(count));
    std::memcpy(uvList->values().data(), input.take(size_t(count) * 8), size_t(count) * 8);
    const auto *bits = reinterpret_cast<const std::uint32_t *>(uvList->values().data());
    std::uint32_t bad = 0;
    for (size_t i = 0; i < size_t(count) * 2; ++i)
        bad |= notFinite(bits[i]);
    if (bad)
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
        for (std::int32_t done = 0; done < count;) {
            // Runs of triangles or quads go in batches; anything else one facet at a time.
            std::int32_t run = readRun<3>(input, count - done, 'T', m_mesh.triangleCorners(),
                                          m_mesh.triangleMaterials(), m_mesh.triangleGroups());
            if (run == 0)
                run = readRun<4>(input, count - done, 'Q', m_mesh.quadCorners(),
                                 m_mesh.quadMaterials(), m_mesh.quadGroups());
            if (run == 0) {
                readFacet(input);
                run = 1;
            }
            done += run;
        }
    }

private:
    // Facets per batch of readRun: its corners are gathered on the stack, then appended.
    static constexpr size_t kBatch = 256;

    // Reads up to `limit` facets of `corners` corners each that follow as a run of `type`
    // records, up to a batch; returns how many (0 when the next facet is not of the kind).
    // The same checks as readFacet, made branch-free over the batch.
    template <size_t corners>
    std::int32_t readRun(SgRecordInput &input, std::int32_t limit, unsigned char type,
                         std::vector<SgFaceCorner> &toCorners,
                         std::vector<std::uint8_t> &toMaterials,
                         std::vector<std::int32_t> &toGroups) {
        constexpr size_t recordBytes = 5 + 12 * corners;
        const size_t available = std::min({input.remaining() / recordBytes, size_t(limit), kBatch});
        if (available == 0)
            return 0;
        const unsigned char *source = input.take(0);
        // Storage that is not filled with default corners first: each corner is written once.
        union Batch {
            Batch() {}
            SgFaceCorner items[kBatch * corners];
        } stack;
        SgFaceCorner *batch = stack.items;
        std::uint8_t materials[kBatch];
        std::uint32_t bad = 0;
        size_t n = 0;
        for (; n < available; ++n) {
            const unsigned char *record = source + n * recordBytes;
            if (record[0] != type)
                break;
            std::uint32_t material;
            std::memcpy(&material, record + 1, 4);
            materials[n] = material < std::uint32_t(m_materialCount) ? std::uint8_t(material) : 0;
            for (size_t k = 0; k < corners; ++k) {
                std::int32_t indices[2];
                std::memcpy(indices, record + 5 + 12 * k, 8);
                bad |= std::uint32_t(std::uint32_t(indices[0]) >= m_vertexCount);
                SgFaceCorner &corner = batch[n * corners + k];
                corner.vertex = indices[0];
                // Without a UV list the UV indices mean nothing; -1 is the host's "no UV".
                corner.uv = std::uint32_t(indices[1]) < m_uvCount ? indices[1] : -1;
                corner.third = -1;
            }
        }
        if (bad)
            throw SgRecordError("vertex index out of range");
        input.skip(n * recordBytes);
        toCorners.insert(toCorners.end(), batch, batch + n * corners);
        toMaterials.insert(toMaterials.end(), materials, materials + n);
        toGroups.insert(toGroups.end(), n, -1);
        return std::int32_t(n);
    }

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
