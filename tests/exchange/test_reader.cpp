// The record the modeler returns: reading it into a host shape, and the round trip.

#include "exchangetestsupport.h"

#include "exchange/sgexchangenodereader.h"
#include "exchange/sgexchangereader.h"
#include "exchange/sgexchangewriter.h"
#include "exchange/sgreturnrecordwriter.h"
#include "facetor/sgfacetorreturn.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/materials/sgtexture.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>

using namespace exchangetest;

namespace {

SgDefaultMaterial *materialAt(const SgShape &shape, int index) {
    return dynamic_cast<SgDefaultMaterial *>(shape.getMaterial(index));
}

// A facet as (material, [vertex, uv] per corner), for comparing orders.
using Facet = std::pair<int, std::vector<std::pair<int, int>>>;

// The facets by material, each material's in kind order (triangles, quads, polygons) and in
// mesh order within a kind: the order in which the record carries them.
std::vector<Facet> facetsByMaterial(const SgPolyMesh &mesh) {
    std::vector<Facet> facets;
    auto add = [&](int material, const SgFaceCorner *corners, int n) {
        Facet facet{material, {}};
        for (int k = 0; k < n; ++k)
            facet.second.emplace_back(corners[k].vertex, corners[k].uv);
        facets.push_back(facet);
    };
    for (int i = 0; i < mesh.getTriangleCount(); ++i)
        add(mesh.getTriangleMaterial(i), mesh.getTriangleCorners(i), 3);
    for (int i = 0; i < mesh.getQuadCount(); ++i)
        add(mesh.getQuadMaterial(i), mesh.getQuadCorners(i), 4);
    for (int i = 0; i < mesh.getPolygonCount(); ++i)
        add(mesh.getPolygonMaterial(i), mesh.getPolygonCorners(i), mesh.getPolygonCornerCount(i));
    std::stable_sort(facets.begin(), facets.end(),
                     [](const Facet &a, const Facet &b) { return a.first < b.first; });
    return facets;
}

} // namespace

TEST(ExchangeReaderTest, ReturnedRecordBecomesAShape) {
    SgPolyMesh *mesh = sgTestMesh({{1, 2, 3}, {0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {1, 1, 0}},
                                  {{0.5f, 0.25f}, {1, 1}});
    sgTestAddFacet(*mesh, 1, {{0, 1}, {1, 0}, {2, -1}});
    sgTestAddFacet(*mesh, 0, {{1, 0}, {2, 0}, {4, 1}, {3, 1}});
    std::unique_ptr<SgPolyMesh> owner(mesh);
    SgReturnMaterial skin;
    skin.name = "skin";
    skin.diffuse[0] = 1.0f;
    skin.diffuse[1] = 0.50196081f;
    skin.diffuseImage = tempPath() + "/back/skin.jpg";
    skin.glossiness = 0.25f;
    skin.opacity = 0.75f;
    skin.bumpStrength = 0.5f;
    skin.bumpImage = tempPath() + "/back/bump.jpg";
    SgReturnMaterial cloth;
    cloth.name = "cloth";
    cloth.specular[2] = 2.0f; // out of range: held to 255
    const QByteArray record =
        SgReturnRecordWriter("Prop", *mesh, {skin, cloth}, "tail").toByteArray();
    ASSERT_FALSE(record.isEmpty());

    QString trailer;
    auto shape = readRecord(record, &trailer);
    ASSERT_TRUE(shape);
    EXPECT_EQ(shape->getName(), "Prop");
    EXPECT_EQ(trailer, "tail");
    const SgPolyMesh *back = shape->getPolyMesh();
    ASSERT_TRUE(back);
    EXPECT_EQ(back->getVertex(0), SgVec3(10, 20, 30));
    ASSERT_TRUE(back->getUVList());
    EXPECT_EQ(back->getUVList()->getValue(0), SgVec2(0.5f, 0.25f));
    // Material 0's quad comes first in the record, then material 1's triangle.
    ASSERT_EQ(back->getQuadCount(), 1);
    ASSERT_EQ(back->getTriangleCount(), 1);
    EXPECT_EQ(back->getTriangleMaterial(0), 1);
    EXPECT_EQ(back->triangleCorners(),
              (std::vector<SgFaceCorner>{{0, 1, -1}, {1, 0, -1}, {2, -1, -1}}));

    ASSERT_EQ(shape->getMaterialCount(), 2);
    SgDefaultMaterial *m0 = materialAt(*shape, 0);
    ASSERT_TRUE(m0);
    EXPECT_EQ(m0->getName(), "skin");
    EXPECT_EQ(m0->getDiffuseColor(), QColor(255, 128, 0));
    EXPECT_FLOAT_EQ(m0->getGlossinessStrength(), 0.25f);
    EXPECT_FLOAT_EQ(m0->getOpacityControl()->getValue(), 0.75f);
    EXPECT_FLOAT_EQ(m0->getBumpStrength(), 0.5f);
    ASSERT_TRUE(m0->getColorMap());
    EXPECT_TRUE(m0->getColorMap()->getFileName().endsWith("skin.jpg"));
    // The returned bump image is ignored: nothing is mapped to the bump strength.
    EXPECT_FALSE(m0->getBumpControl()->isMapped());
    EXPECT_FALSE(m0->getBumpControl()->getMapValue());
    EXPECT_EQ(materialAt(*shape, 1)->getSpecularColor(), QColor(0, 0, 255));
    EXPECT_FALSE(materialAt(*shape, 1)->getColorMap());
}

TEST(ExchangeReaderTest, EmptyBlocksAndUnknownFacetTypes) {
    clearLog();
    // name "E", V = 3, U = 0, M = 0, F = 4: 'X' (no corners), 'T' in material 1 of 1 (read as
    // 0), a 'P' of 2 corners, a 'P' of 5 corners in material 1; trailer.
    const QByteArray record = QByteArray::fromHex(
        "0100000045" // name "E"
        "030000000000803f000000400000404000000000000000000000000000000000000000000000803f"
        "000000000000000004000000" // U, M, F
        "5800000000"               // 'X'
        "5401000000000000000700000009000000010000000000000000000000020000000000000000000000"
        "500000000002000000000000000000000000000000010000000000000000000000"
        "500100000005000000000000000000000000000000010000000000000000000000"
        "020000000000000000000000000000000000000000000000010000000000000000000000"
        "00000000"); // trailer
    auto shape = readRecord(record);
    ASSERT_TRUE(shape);
    const SgPolyMesh *mesh = shape->getPolyMesh();
    EXPECT_EQ(mesh->getVertex(0), SgVec3(10, 20, 30));
    EXPECT_FALSE(mesh->getUVList());
    ASSERT_EQ(mesh->getFacetCount(), 2);
    EXPECT_EQ(mesh->getTriangleCorners(0)[0], (SgFaceCorner{0, -1, -1})); // UV means nothing
    EXPECT_EQ(mesh->getTriangleMaterial(0), 0);
    ASSERT_EQ(mesh->getPolygonCount(), 1);
    EXPECT_EQ(mesh->getPolygonMaterial(0), 0);
    ASSERT_EQ(shape->getMaterialCount(), 1);
    EXPECT_EQ(shape->getMaterial(0)->getName(), "default");
    EXPECT_TRUE(logLines().isEmpty());
}

TEST(ExchangeReaderTest, FigureRoundTripKeepsVerticesUVsAndFacetOrder) {
    SgAppSettings().setInt("FacetorBridgeTools", 1); // weld the base geometry
    // Two bones that share a seam, each with quads of one material and a triangle of the other,
    // partly mapped (-1 is "no UV").
    std::unique_ptr<SgSkeleton> figure(sgTestFigure("Body", 2, 2));
    figure->setLabel("Body");
    const SgBoneList bones = figure->getAllBones();
    for (int b = 0; b < 2; ++b)
        sgTestAddFacet(*static_cast<SgPolyMesh *>(sgTestGeometry(bones[b])), 1 - b,
                       {{0, 0}, {4, -1}, {1, 1}});

    SgExchangeWriter writer(figure.get(), QString());
    ASSERT_GT(writer.getSize(), 0);
    QByteArray sent(writer.getSize(), '\0');
    sent.truncate(writer.write(sent.data()));
    ASSERT_FALSE(sent.isEmpty());
    // The modeler reads the record and sends its geometry back unchanged.
    SgExchangeNode node;
    ASSERT_TRUE(SgExchangeNodeReader(sent.constData(), size_t(sent.size())).read(node));
    auto shape = readRecord(SgFacetorReturn::encode(node));
    ASSERT_TRUE(shape);
    EXPECT_EQ(shape->getName(), "Body");

    const auto *welded = static_cast<const SgPolyMesh *>(writer.getGeometry());
    const SgPolyMesh *back = shape->getPolyMesh();
    ASSERT_EQ(back->getVertexCount(), welded->getVertexCount());
    for (int i = 0; i < welded->getVertexCount(); ++i) {
        const SgVec3 a = welded->getVertex(i), b = back->getVertex(i);
        for (int k = 0; k < 3; ++k)
            EXPECT_NEAR(b[k], a[k], 1e-5 * std::max(1.0f, std::abs(a[k])));
    }
    ASSERT_TRUE(back->getUVList());
    EXPECT_EQ(back->getUVList()->values(), welded->getUVList()->values());

    // Same facets; by material, triangles before quads, each kind in welded order.
    EXPECT_EQ(facetsByMaterial(*back), facetsByMaterial(*welded));
    SgAppSettings().remove("FacetorBridgeTools");
}
