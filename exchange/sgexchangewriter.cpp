#include "exchange/sgexchangewriter.h"

#include "exchange/sgfacetblockwriter.h"
#include "exchange/sgmaterialblockwriter.h"
#include "exchange/sgrecordoutput.h"
#include "exchange/sgscaledfloats.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/geometry/sgsubdmesh.h"
#include "sgcore/scene/sgfigurewelder.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgskeleton.h"

#include <QDebug>

#include <algorithm>
#include <cstring>

namespace {

// Modeler coordinates are a tenth of the host's.
constexpr double kToModelerUnits = 0.1;

const SgMap *uvListOf(const SgVertexMesh *geometry) {
    switch (geometry->getKind()) {
    case SgVertexMesh::PolyMeshKind:
        return static_cast<const SgPolyMesh *>(geometry)->getUVList();
    case SgVertexMesh::SubDMeshKind:
        return static_cast<const SgSubDMesh *>(geometry)->getUVList();
    default:
        return nullptr;
    }
}

void logText(const char *text) {
    if (sgApp)
        sgApp->log(QString::fromLatin1(text));
}

} // namespace

SgExchangeWriter::SgExchangeWriter(SgNode *node, const QString &trailer)
    : m_node(node), m_trailer(trailer.toLatin1()) {
    gather();
    const std::int64_t size = m_geometry && m_shape ? measure() : 0;
    m_measuredSize = size > INT32_MAX ? 0 : static_cast<std::int32_t>(size);
}

SgExchangeWriter::~SgExchangeWriter() {
    if (!m_welder && m_geometry)
        m_geometry->unref();
}

void SgExchangeWriter::gather() {
    if (!m_node)
        return;
    if (auto *figure = dynamic_cast<SgSkeleton *>(m_node)) {
        const int tools = SgAppSettings().getInt(QStringLiteral("FacetorBridgeTools"), 0);
        m_welder = std::make_unique<SgFigureWelder>(figure, false, true, true, tools == 0);
        m_shape = m_welder->getShape();
        m_geometry = m_welder->getGeometry();
        m_name = figure->getLabel().toLatin1();
        return;
    }
    SgObject *object = m_node->getObject();
    if (!object)
        return;
    m_shape = object->getCurrentShape();
    m_geometry = SgFigureWelder::getMorphOnlyGeom(m_node);
    if (m_geometry)
        m_geometry->ref();
    m_name = m_node->getLabel().toLatin1();
}

std::int64_t SgExchangeWriter::measure() const {
    const std::int64_t vertices = m_geometry->getVertexCount();
    const SgMap *uvList = uvListOf(m_geometry);
    const std::int64_t uvs = uvList ? uvList->getValueCount() : 0;
    std::int64_t facets = 4;
    if (m_geometry->getKind() == SgVertexMesh::PolyMeshKind) {
        const auto *mesh = static_cast<const SgPolyMesh *>(m_geometry);
        facets += SgFacetBlockWriter::kTriangleBytes * mesh->getTriangleCount() +
                  SgFacetBlockWriter::kQuadBytes * mesh->getQuadCount() +
                  (SgFacetBlockWriter::kPolygonHeadBytes +
                   SgFacetBlockWriter::kCornerBytes * SgPolyMesh::kMaxPolygonCorners) *
                      mesh->getPolygonCount();
    } else if (m_geometry->getKind() == SgVertexMesh::SubDMeshKind) {
        facets += SgFacetBlockWriter::kQuadBytes *
                  static_cast<const SgSubDMesh *>(m_geometry)->getPatchCount();
    }
    const std::int64_t common = (m_trailer.size() + 4) + 12 * vertices + facets;
    // The designed bound: the materials allowance has room for the count fields it leaves out.
    const std::int64_t designed = SgMaterialBlockWriter::allowance(*m_shape) + common +
                                  (m_name.size() + 8) + 4 + (uvList ? 8 * uvs + 4 : 0);
    // The bound from the real strings: holds for image paths of any length and for a shape
    // without materials, where the designed bound has no room for the material count.
    const std::int64_t fromStrings = SgMaterialBlockWriter::measureStrings(*m_shape) + common +
                                     (m_name.size() + 4) + 4 + (8 * uvs + 4);
    return std::max(designed, fromStrings);
}

std::int32_t SgExchangeWriter::write(void *destination) const {
    return write(destination, m_measuredSize);
}

std::int32_t SgExchangeWriter::write(void *destination, std::int64_t capacity) const {
    if (!m_node || !m_shape || !m_geometry || !destination || m_measuredSize == 0 || capacity <= 0)
        return 0;
    SgRecordOutput output(
        destination, static_cast<std::size_t>(std::min<std::int64_t>(capacity, m_measuredSize)));
    if (writeMesh(output) == 0)
        return 0;
    try {
        output.putString(m_trailer);
    } catch (...) {
        logText("Error writting string to shared memory map.");
        return 0;
    }
    return static_cast<std::int32_t>(output.written());
}

std::int64_t SgExchangeWriter::writeMesh(SgRecordOutput &output) const {
    try {
        output.putString(m_name);
        writeVertices(output);
        writeUVs(output);
        SgMaterialBlockWriter::write(*m_shape, output);
        switch (m_geometry->getKind()) {
        case SgVertexMesh::PolyMeshKind:
            SgFacetBlockWriter::writePolyMesh(*static_cast<const SgPolyMesh *>(m_geometry),
                                              m_shape->getMaterialCount(), output);
            break;
        case SgVertexMesh::SubDMeshKind:
            writeSubDPatches(*static_cast<const SgSubDMesh *>(m_geometry), output);
            break;
        default:
            output.putInt32(0); // a bare vertex list has no facets
            break;
        }
        return static_cast<std::int64_t>(output.written());
    } catch (const SgRecordOverflow &overflow) {
        if (overflow.inString())
            logText("Error writting string to shared memory map.");
    } catch (...) {
    }
    logText("Error writting node to shared memory map.");
    return 0;
}

void SgExchangeWriter::writeVertices(SgRecordOutput &output) const {
    const int count = m_geometry->getVertexCount();
    output.putInt32(count);
    unsigned char *to = output.claim(static_cast<std::size_t>(count) * 12);
    static_assert(sizeof(SgVec3) == 12);
    sgScaleFloats(m_geometry->getVertices(), to, static_cast<std::size_t>(count) * 3,
                  kToModelerUnits);
}

void SgExchangeWriter::writeUVs(SgRecordOutput &output) const {
    const SgMap *uvList = uvListOf(m_geometry);
    const int count = uvList ? uvList->getValueCount() : 0;
    output.putInt32(count);
    if (count > 0)
        output.putBytes(uvList->values().data(), static_cast<std::size_t>(count) * 8);
}

void SgExchangeWriter::writeSubDPatches(const SgSubDMesh &mesh, SgRecordOutput &output) const {
    std::array<int, 256> materialOf = SgFacetBlockWriter::identityMaterials();
    if (m_welder) {
        // A figure's patches take their material through the welder's texture map; an index
        // outside the map takes its first entry.
        const std::vector<int32_t> &map = m_welder->getSubDTextureMap();
        for (size_t i = 0; i < materialOf.size(); ++i)
            materialOf[i] = i < map.size() ? map[i] : (map.empty() ? -1 : map.front());
    }
    const std::int32_t written =
        SgFacetBlockWriter::writeSubDMesh(mesh, materialOf, m_shape->getMaterialCount(), output);
    if (written != mesh.getPatchCount())
        qDebug() << "Error sending subd to facetor.";
}
