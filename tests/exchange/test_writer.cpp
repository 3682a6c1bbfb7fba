// The record the host sends: its exact bytes, its measured size and its material rules.

#include "exchangetestsupport.h"

#include "exchange/sgexchangewriter.h"
#include "exchange/sgmaterialblockwriter.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimagemgr.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/geometry/sgsubdmesh.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/materials/sgtexture.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgnode.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QImage>
#include <QRegularExpression>

#include <gtest/gtest.h>

#include <memory>

using namespace exchangetest;

namespace {

// Maps the material's "Bump Strength" to `texture` through the property, as the host does.
void mapBump(SgDefaultMaterial &material, SgTexture *texture) {
    material.getBumpControl()->setMapValue(texture);
    material.getBumpControl()->setMapped(true);
}

class ExchangeWriterTest : public ::testing::Test {
protected:
    void SetUp() override { clearLog(); }
};

// A prop node with one polygon shape; the node owns everything.
std::unique_ptr<SgNode> prop(const QString &label, SgPolyMesh *mesh,
                             const std::vector<SgMaterial *> &materials) {
    auto *shape = new SgPolyShape(label);
    shape->setPolyMesh(mesh);
    for (SgMaterial *material : materials)
        shape->addMaterial(material);
    return std::unique_ptr<SgNode>(sgTestAttach(new SgNode(label), shape));
}

QString writeImage(const QString &path, QColor color) {
    QDir().mkpath(QFileInfo(path).path());
    QImage image(4, 4, QImage::Format_RGB32);
    image.fill(color);
    EXPECT_TRUE(image.save(path, "PNG"));
    return path;
}

} // namespace

TEST_F(ExchangeWriterTest, WorkedRecordByteForByte) {
    SgPolyMesh *mesh = sgTestMesh({{0, 0, 0}, {10, 0, 0}, {0, 10, 0}});
    sgTestAddFacet(*mesh, 0, {{0, 0, 0}, {1, 0, 0}, {2, 0, 0}});
    auto node = prop("A", mesh, {new BareMaterial("M")});

    std::int32_t measured = 0;
    const QByteArray r = writeNode(node.get(), QString(), &measured);
    EXPECT_EQ(measured, 4257);
    ASSERT_EQ(r.size(), 165);

    const QByteArray expected = QByteArray::fromHex("01000000"
                                                    "41"                       // name "A" at 0
                                                    "03000000"                 // V at 5
                                                    "000000000000000000000000" // vertices at 9
                                                    "0000803f0000000000000000"
                                                    "000000000000803f00000000"
                                                    "00000000" // U at 45
                                                    "01000000" // materials block at 49
                                                    "6d"
                                                    "01000000"
                                                    "4d" // 'm', name M
                                                    "63"
                                                    "000000000000000000000000"
                                                    "00000000"
                                                    "00000000" // 'c', colour, two strings
                                                    "73"
                                                    "000000000000000000000000" // 's', colour
                                                    "67"
                                                    "00000000"
                                                    "74"
                                                    "00000000"
                                                    "62"
                                                    "00000000" // 'g', 't', 'b'
                                                    "00000000"
                                                    "00000000" // bump strings
                                                    "01000000" // F at 116
                                                    "54"
                                                    "00000000" // 'T', material 0 at 120
                                                    "000000000000000000000000"
                                                    "010000000000000000000000"
                                                    "020000000000000000000000"
                                                    "00000000"); // empty trailer at 161
    EXPECT_EQ(r.toHex(), expected.toHex());
}

TEST_F(ExchangeWriterTest, RecordSizesAndScaling) {
    // No UVs, triangles only, one material: U = 0 and every facet a 41-byte 'T' record.
    SgPolyMesh *triangles = sgTestMesh({{10, 20, 30}, {0, 0, 0}, {1, 1, 1}, {2, 2, 2}});
    sgTestAddFacet(*triangles, 0, {{0}, {1}, {2}});
    sgTestAddFacet(*triangles, 0, {{1}, {2}, {3}});
    auto triNode = prop("T", triangles, {new BareMaterial("M")});
    const QByteArray t = writeNode(triNode.get(), "end");
    const qsizetype uAt = 9 + 4 * 12;
    EXPECT_EQ(i32At(t, uAt), 0);
    const qsizetype fAt = uAt + 4 + 67;
    EXPECT_EQ(i32At(t, fAt), 2);
    EXPECT_EQ(t.at(fAt + 4), 'T');
    EXPECT_EQ(t.at(fAt + 4 + 41), 'T');
    EXPECT_EQ(t.size(), fAt + 4 + 2 * 41 + 4 + 3);
    EXPECT_EQ(t.right(7), QByteArray("\x03\x00\x00\x00"
                                     "end",
                                     7));

    // A 7-corner polygon is 9 + 84 bytes; UVs are copied as they stand.
    std::vector<SgVec3> ring(7);
    SgPolyMesh *polygon = sgTestMesh(ring, {{0.25f, 0.5f}, {1.0f, 0.0f}});
    sgTestAddFacet(*polygon, 0, {{0, 1, 0}, {1, 0, 0}, {2}, {3}, {4}, {5}, {6, 1, 9}});
    auto polyNode = prop("P", polygon, {new BareMaterial("M")});
    const QByteArray p = writeNode(polyNode.get());
    const qsizetype pu = 9 + 7 * 12;
    EXPECT_EQ(i32At(p, pu), 2);
    EXPECT_FLOAT_EQ(f32At(p, pu + 4), 0.25f);
    EXPECT_FLOAT_EQ(f32At(p, pu + 8), 0.5f);
    const qsizetype pf = pu + 4 + 16 + 67;
    EXPECT_EQ(p.at(pf + 4), 'P');
    EXPECT_EQ(i32At(p, pf + 9), 7);
    EXPECT_EQ(i32At(p, pf + 13 + 6 * 12 + 8), 9); // third index of the last corner
    EXPECT_EQ(p.size(), pf + 4 + 9 + 84 + 4);

    // Polygons of the most corners the host holds stay inside the measured size.
    const int most = SgPolyMesh::kMaxPolygonCorners;
    SgPolyMesh *wide = sgTestMesh(std::vector<SgVec3>(size_t(most)));
    std::vector<std::vector<int>> corners;
    for (int i = 0; i < most; ++i)
        corners.push_back({i});
    for (int n = 0; n < 3; ++n)
        sgTestAddFacet(*wide, 0, corners);
    auto wideNode = prop("W", wide, {new BareMaterial("M")});
    std::int32_t measured = 0;
    const QByteArray w = writeNode(wideNode.get(), QString(), &measured);
    EXPECT_EQ(w.size(), 9 + most * 12 + 4 + 67 + 4 + 3 * (9 + most * 12) + 4);
    EXPECT_LE(w.size(), measured);
}

TEST_F(ExchangeWriterTest, FacetsGoInMaterialOrderAndUnknownMaterialsAreLeftOut) {
    SgPolyMesh *mesh = sgTestMesh({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {1, 1, 0}, {2, 2, 0}});
    sgTestAddFacet(*mesh, 1, {{0}, {1}, {2}});           // triangle of material 1 first
    sgTestAddFacet(*mesh, 0, {{0}, {1}, {3}, {2}});      // quad of material 0
    sgTestAddFacet(*mesh, 5, {{1}, {2}, {3}});           // material 5 of 2: left out
    sgTestAddFacet(*mesh, 0, {{3}, {2}, {1}});           // triangle of material 0
    sgTestAddFacet(*mesh, 1, {{0}, {1}, {2}, {3}, {4}}); // polygon of material 1
    auto node = prop("O", mesh, {new BareMaterial("a"), new BareMaterial("b")});
    const QByteArray r = writeNode(node.get());
    qsizetype at = 9 + 5 * 12 + 4 + 4 + 2 * 63;
    ASSERT_EQ(i32At(r, at), 4);
    at += 4;
    const struct {
        char type;
        int material;
        int firstVertex;
        int bytes;
    } expected[] = {{'T', 0, 3, 41}, {'Q', 0, 0, 53}, {'T', 1, 0, 41}, {'P', 1, 0, 69}};
    for (const auto &e : expected) {
        EXPECT_EQ(r.at(at), e.type);
        EXPECT_EQ(i32At(r, at + 1), e.material);
        EXPECT_EQ(i32At(r, at + (e.type == 'P' ? 9 : 5)), e.firstVertex);
        at += e.bytes;
    }
    EXPECT_EQ(at + 4, r.size());
}

TEST_F(ExchangeWriterTest, MaterialEntryRules) {
    auto *material = new SgDefaultMaterial("skin");
    material->setDiffuseColor(QColor(255, 128, 0));
    material->setSpecularColor(QColor(0, 0, 255));
    material->setGlossinessStrength(0.25f);
    material->setOpacityStrength(0.5f);
    material->setBumpStrength(0.3f);
    auto *mapped = new SgDefaultMaterial("mapped");
    mapped->setGlossinessStrength(0.25f);
    mapped->getGlossinessControl()->setMapped(true);
    mapped->setOpacityStrength(0.2f);
    mapped->getOpacityControl()->setMapped(true);
    auto *bare = new BareMaterial("bare");
    auto node = prop("X", sgTestMesh({}), {material, mapped, bare});
    const QByteArray r = writeNode(node.get());

    qsizetype at = 4 + 1 + 4 + 4 + 4; // name, V, U, M
    EXPECT_EQ(i32At(r, at - 4), 3);
    // skin: colour floats, two empty diffuse strings (not mapped), 1 - glossiness, opacity.
    at += 1 + 4 + 4 + 1;
    EXPECT_EQ(f32At(r, at), 1.0f);
    EXPECT_EQ(f32At(r, at + 4), 0.50196081f);
    EXPECT_EQ(f32At(r, at + 8), 0.0f);
    EXPECT_EQ(i32At(r, at + 12), 0);
    EXPECT_EQ(i32At(r, at + 16), 0);
    at += 20 + 1;
    EXPECT_EQ(f32At(r, at + 8), 1.0f);
    at += 12 + 1;
    EXPECT_FLOAT_EQ(f32At(r, at), 0.75f);
    EXPECT_FLOAT_EQ(f32At(r, at + 5), 0.5f);
    EXPECT_FLOAT_EQ(f32At(r, at + 10), 0.3f);
    at += 14 + 8;
    // mapped: a mapped glossiness counts as 0 (1.0 written), a mapped opacity as 1.0.
    at += 1 + 4 + 6 + 1 + 20 + 1 + 12 + 1;
    EXPECT_FLOAT_EQ(f32At(r, at), 1.0f);
    EXPECT_FLOAT_EQ(f32At(r, at + 5), 1.0f);
    at += 14 + 8;
    // bare: no property at all gives zero colours and strengths.
    at += 1 + 4 + 4 + 1;
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(f32At(r, at + 4 * i), 0.0f);
    at += 20 + 1 + 12 + 1;
    EXPECT_EQ(f32At(r, at), 0.0f);
    EXPECT_EQ(f32At(r, at + 5), 0.0f);
    EXPECT_EQ(f32At(r, at + 10), 0.0f);
}

TEST_F(ExchangeWriterTest, ImagesAreCopiedAsJpegOncePerImageFileUnderSafeUniqueNames) {
    const QString source = writeImage(tempPath() + "/images/a/wood.png", Qt::red);
    const QString other = writeImage(tempPath() + "/images/b/wood.png", Qt::blue);
    SgTexture *wood = sgApp->getImageMgr()->getImage(source);
    SgTexture *otherWood = sgApp->getImageMgr()->getImage(other);

    // A copy that an earlier run left under the plain base name is another image's: unused.
    QDir().mkpath(tempPath() + "/FacetorMaps");
    const QString stale = tempPath() + "/FacetorMaps/wood.jpg";
    ASSERT_TRUE(QImage(4, 4, QImage::Format_RGB32).save(stale, "JPEG"));

    auto *first = new SgDefaultMaterial("first");
    first->setColorMap(wood);
    auto *second = new SgDefaultMaterial("second");
    second->setColorMap(wood);
    mapBump(*second, otherWood);
    auto node = prop("W", sgTestMesh({}), {first, second});

    const QString copy = SgMaterialBlockWriter::jpegCopyPath(wood);
    EXPECT_TRUE(QRegularExpression(".*/FacetorMaps/wood-[0-9a-f]{8}\\.jpg").match(copy).hasMatch())
        << copy.toStdString();
    QFile::remove(copy);
    const QByteArray r = writeNode(node.get());
    ASSERT_FALSE(r.isEmpty());
    EXPECT_FALSE(r.contains("/FacetorMaps/wood.jpg"));
    EXPECT_GT(QImage(copy).pixelColor(1, 1).red(), 200);
    // Both materials name the same copy; its folder string is the image's folder.
    const QByteArray folder = (tempPath() + "/images/a").toLatin1();
    EXPECT_EQ(r.count(copy.toLatin1()), 2);
    EXPECT_EQ(r.count(folder), 2);
    // The other image of the same base name gets a copy of its own, not the red one.
    const QString otherCopy = SgMaterialBlockWriter::jpegCopyPath(otherWood);
    EXPECT_NE(otherCopy, copy);
    EXPECT_TRUE(r.contains(otherCopy.toLatin1()));
    const QColor otherPixel = QImage(otherCopy).pixelColor(1, 1);
    EXPECT_GT(otherPixel.blue(), 200);
    EXPECT_LT(otherPixel.red(), 60);

    // An existing copy that is not older than its image is not written again.
    QFile::resize(copy, 3);
    EXPECT_EQ(SgMaterialBlockWriter::exportTextureAsJpeg(wood), copy);
    EXPECT_EQ(QFileInfo(copy).size(), 3);
    // One older than its image (the image was edited since) is written again.
    {
        QFile older(copy);
        ASSERT_TRUE(older.open(QIODevice::ReadWrite));
        older.setFileTime(QFileInfo(source).lastModified().addSecs(-60),
                          QFileDevice::FileModificationTime);
    }
    EXPECT_EQ(SgMaterialBlockWriter::exportTextureAsJpeg(wood), copy);
    EXPECT_GT(QFileInfo(copy).size(), 3);

    // A name beyond 8 bits travels as an ASCII name the modeler can open.
    const QString accented =
        writeImage(tempPath() + QString::fromUtf8("/images/c/\u00e9t\u00e9 \u6728.png"), Qt::green);
    const QString safe =
        SgMaterialBlockWriter::exportTextureAsJpeg(sgApp->getImageMgr()->getImage(accented));
    EXPECT_TRUE(QRegularExpression(".*/FacetorMaps/_t___-[0-9a-f]{8}\\.jpg").match(safe).hasMatch())
        << safe.toStdString();
    EXPECT_TRUE(QFile::exists(safe));

    // An image that cannot be read gives an empty copy path.
    SgTexture missing(tempPath() + "/images/none.png");
    EXPECT_EQ(SgMaterialBlockWriter::exportTextureAsJpeg(&missing), QString());
}

TEST_F(ExchangeWriterTest, LongImagePathsStayInsideTheMeasuredSize) {
    QString deep = tempPath() + "/images";
    while (deep.size() < 1400)
        deep += "/" + QString(60, QLatin1Char('d'));
    const QString source =
        writeImage(deep + "/" + QString(200, QLatin1Char('n')) + ".png", Qt::green);
    auto *material = new SgDefaultMaterial("long");
    material->setColorMap(sgApp->getImageMgr()->getImage(source));
    mapBump(*material, sgApp->getImageMgr()->getImage(source));
    auto node = prop("L", sgTestMesh({}), {material});

    SgExchangeWriter writer(node.get(), QString());
    QByteArray buffer(writer.getSize() + 16, '\x7f');
    const std::int32_t written = writer.write(buffer.data());
    ASSERT_GT(written, 0);
    EXPECT_LE(written, writer.getSize());
    EXPECT_TRUE(buffer.contains(deep.toLatin1()));
    EXPECT_EQ(buffer.right(16), QByteArray(16, '\x7f'));
}

TEST_F(ExchangeWriterTest, EmptyNodesAndShapesWithoutMaterialsOrUVs) {
    // Nothing to send measures zero and writes nothing.
    SgNode bare("empty");
    SgExchangeWriter writer(&bare, QString());
    EXPECT_EQ(writer.getSize(), 0);
    char byte = 0;
    EXPECT_EQ(writer.write(&byte), 0);
    EXPECT_EQ(SgExchangeWriter(nullptr, QString()).write(&byte), 0);

    // A shape without materials or UVs still fits its measure.
    SgPolyMesh *mesh = sgTestMesh({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}});
    sgTestAddFacet(*mesh, 0, {{0}, {1}, {2}});
    auto node = prop("N", mesh, {});
    std::int32_t measured = 0;
    const QByteArray r = writeNode(node.get(), QString(), &measured);
    ASSERT_FALSE(r.isEmpty());
    EXPECT_LE(r.size(), measured);
    EXPECT_EQ(i32At(r, r.size() - 8), 0); // F = 0: no facet has a material to go with
}

TEST_F(ExchangeWriterTest, SubdivisionPatchesAreWrittenAsQuads) {
    auto *subd = new SgSubDMesh;
    SgVec3 *v = subd->setVertexCount(6);
    for (int i = 0; i < 6; ++i)
        v[i] = SgVec3(float(i), 0, 0);
    const int32_t first[4] = {0, 1, 2, 3}, second[4] = {2, 3, 4, 5}, uv[4] = {0, 1, 2, 3};
    ASSERT_TRUE(subd->addPatch(second, uv, nullptr, 1));
    ASSERT_TRUE(subd->addPatch(first, uv, uv, 0));
    ASSERT_TRUE(subd->addPatch(first, nullptr, nullptr, 7)); // no such material
    auto *shape = new SgShape("S");
    shape->setGeometry(subd);
    shape->addMaterial(new BareMaterial("a"));
    shape->addMaterial(new BareMaterial("b"));
    std::unique_ptr<SgNode> node(sgTestAttach(new SgNode("S"), shape));

    std::int32_t measured = 0;
    const QByteArray r = writeNode(node.get(), QString(), &measured);
    const qsizetype f = 9 + 6 * 12 + 4 + 4 + 2 * 63;
    // The count says what follows: the patch without a material is not announced.
    ASSERT_EQ(i32At(r, f), 2);
    EXPECT_EQ(r.at(f + 4), 'Q');
    EXPECT_EQ(i32At(r, f + 5), 0);
    EXPECT_EQ(i32At(r, f + 9), 0);
    EXPECT_EQ(i32At(r, f + 9 + 4), 0); // UV of corner 0
    EXPECT_EQ(i32At(r, f + 9 + 8), 0); // third of corner 0
    EXPECT_EQ(r.at(f + 4 + 53), 'Q');
    EXPECT_EQ(i32At(r, f + 4 + 53 + 1), 1);
    EXPECT_EQ(i32At(r, f + 4 + 53 + 5), 2);
    EXPECT_EQ(i32At(r, f + 4 + 53 + 5 + 8), -1);
    EXPECT_EQ(r.size(), f + 4 + 2 * 53 + 4);
    EXPECT_LE(r.size(), measured);
}

TEST_F(ExchangeWriterTest, ADestinationTooSmallIsNeverOverrun) {
    SgPolyMesh *mesh = sgTestMesh({{0, 0, 0}, {10, 0, 0}, {0, 10, 0}});
    sgTestAddFacet(*mesh, 0, {{0}, {1}, {2}});
    auto node = prop("A", mesh, {new BareMaterial("a-long-material-name")});
    SgExchangeWriter writer(node.get(), QString());
    // Every capacity short of the record fails without a byte past it; the exact one fits.
    QByteArray whole(200, '\x7f');
    const std::int32_t size = writer.write(whole.data(), 200);
    ASSERT_GT(size, 100);
    for (int capacity = 0; capacity < size; ++capacity) {
        clearLog();
        QByteArray buffer(200, '\x7f');
        ASSERT_EQ(writer.write(buffer.data(), capacity), 0) << capacity;
        ASSERT_EQ(buffer.mid(capacity), QByteArray(200 - capacity, '\x7f')) << capacity;
        EXPECT_EQ(logLines().isEmpty(), capacity == 0) << capacity; // the failure is logged
    }
    EXPECT_EQ(writer.write(whole.data(), size), size);
    // A string that does not fit says so too.
    clearLog();
    QByteArray buffer(200, '\x7f');
    EXPECT_EQ(writer.write(buffer.data(), 2), 0);
    EXPECT_EQ(logLines(), (QStringList{"Error writting string to shared memory map.",
                                       "Error writting node to shared memory map."}));
}
