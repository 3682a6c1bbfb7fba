// The record the host sends: its exact bytes, its measured size and its material rules.

#include "exchangetestsupport.h"

#include "exchange/sgexchangenodereader.h"
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

// A prop node with one polygon shape; the node owns everything.
std::unique_ptr<SgNode> prop(const QString &label, SgPolyMesh *mesh,
                             const std::vector<SgMaterial *> &materials) {
    auto *shape = new SgPolyShape(label);
    shape->setPolyMesh(mesh);
    for (SgMaterial *material : materials)
        shape->addMaterial(material);
    return std::unique_ptr<SgNode>(sgTestAttach(new SgNode(label), shape));
}

// The record of `node` as the modeler reads it, to its last byte.
SgExchangeNode decode(SgNode *node, const QString &trailer = QString()) {
    const QByteArray r = writeNode(node, trailer);
    SgExchangeNode decoded;
    SgExchangeNodeReader reader(r.constData(), size_t(r.size()));
    EXPECT_TRUE(reader.read(decoded)) << reader.errorString().toStdString();
    EXPECT_EQ(reader.bytesRead(), size_t(r.size()));
    return decoded;
}

// The facets of a decoded record, each as "<type><material>:<first vertex>/<corners>".
QStringList facetsOf(const SgExchangeNode &n) {
    QStringList out;
    for (const SgExchangeNode::Facet &f : n.facets)
        out << QStringLiteral("%1%2:%3/%4")
                   .arg(QChar(f.type))
                   .arg(f.material)
                   .arg(n.corners[f.firstCorner].vertex)
                   .arg(f.cornerCount);
    return out;
}

QString writeImage(const QString &path, QColor color) {
    QDir().mkpath(QFileInfo(path).path());
    QImage image(4, 4, QImage::Format_RGB32);
    image.fill(color);
    EXPECT_TRUE(image.save(path, "PNG"));
    return path;
}

} // namespace

TEST(ExchangeWriterTest, WorkedRecordByteForByteAndNeverPastItsDestination) {
    SgPolyMesh *mesh = sgTestMesh({{0, 0, 0}, {10, 0, 0}, {0, 10, 0}});
    sgTestAddFacet(*mesh, 0, {{0, 0, 0}, {1, 0, 0}, {2, 0, 0}});
    auto node = prop("A", mesh, {new BareMaterial("M")});

    std::int32_t measured = 0;
    const QByteArray r = writeNode(node.get(), QString(), &measured);
    EXPECT_EQ(measured, 4257);
    ASSERT_EQ(r.size(), 165);
    // Name "A" at 0, V at 5 and the vertices at 9, U at 45, the materials block at 49, F at 116,
    // the facet at 120, the empty trailer at 161.
    const QByteArray expected = QByteArray::fromHex(
        "0100000041"
        "030000000000000000000000000000000000803f0000000000000000000000000000803f00000000"
        "00000000010000006d010000004d"                   // U, M, 'm' and name "M"
        "630000000000000000000000000000000000000000"     // 'c', colour, two strings
        "73000000000000000000000000"                     // 's', colour
        "6700000000740000000062000000000000000000000000" // 'g', 't', 'b' and two strings
        "010000005400000000"                             // F, 'T' in material 0
        "000000000000000000000000010000000000000000000000020000000000000000000000"
        "00000000");
    EXPECT_EQ(r.toHex(), expected.toHex());

    // Every capacity short of the record fails, logged, without a byte past it; the exact one
    // fits.
    SgExchangeWriter writer(node.get(), QString());
    for (int capacity = 0; capacity < r.size(); ++capacity) {
        clearLog();
        QByteArray buffer(200, '\x7f');
        ASSERT_EQ(writer.write(buffer.data(), capacity), 0) << capacity;
        ASSERT_EQ(buffer.mid(capacity), QByteArray(200 - capacity, '\x7f')) << capacity;
        EXPECT_EQ(logLines().isEmpty(), capacity == 0) << capacity;
    }
    QByteArray whole(200, '\x7f');
    EXPECT_EQ(writer.write(whole.data(), r.size()), r.size());
    EXPECT_EQ(whole.left(r.size()), r);
    // A string that does not fit says so too.
    clearLog();
    EXPECT_EQ(writer.write(whole.data(), 2), 0);
    EXPECT_EQ(logLines(), (QStringList{"Error writting string to shared memory map.",
                                       "Error writting node to shared memory map."}));
}

TEST(ExchangeWriterTest, FacetKindsOrderUVsTrailerAndTheMeasure) {
    // Vertices in modeler units, no UVs, a trailer.
    SgPolyMesh *triangles = sgTestMesh({{10, 20, 30}, {0, 0, 0}, {1, 1, 1}, {2, 2, 2}});
    sgTestAddFacet(*triangles, 0, {{0}, {1}, {2}});
    sgTestAddFacet(*triangles, 0, {{1}, {2}, {3}});
    auto triNode = prop("T", triangles, {new BareMaterial("M")});
    const SgExchangeNode t = decode(triNode.get(), "end");
    EXPECT_EQ(std::vector<float>(t.vertices.begin(), t.vertices.begin() + 3),
              (std::vector<float>{1, 2, 3}));
    EXPECT_EQ(t.uvCount(), 0);
    EXPECT_EQ(facetsOf(t), (QStringList{"T0:0/3", "T0:1/3"}));
    EXPECT_EQ(t.trailer, "end");

    // UVs are copied as they stand; a polygon's corners keep all three indices.
    std::vector<SgVec3> ring(7);
    SgPolyMesh *polygon = sgTestMesh(ring, {{0.25f, 0.5f}, {1.0f, 0.0f}});
    sgTestAddFacet(*polygon, 0, {{0, 1, 0}, {1, 0, 0}, {2, 0}, {3, 0}, {4, 0}, {5, 0}, {6, 1, 9}});
    auto polyNode = prop("P", polygon, {new BareMaterial("M")});
    const SgExchangeNode p = decode(polyNode.get());
    EXPECT_EQ(p.uvs, (std::vector<float>{0.25f, 0.5f, 1.0f, 0.0f}));
    ASSERT_EQ(facetsOf(p), QStringList{"P0:0/7"});
    EXPECT_EQ(p.corners[6].uv, 1);
    EXPECT_EQ(p.corners[6].third, 9);

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

    // Facets go in material order, kinds in turn; facets of unknown materials are left out.
    SgPolyMesh *mixed = sgTestMesh({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {1, 1, 0}, {2, 2, 0}});
    sgTestAddFacet(*mixed, 1, {{0}, {1}, {2}});           // triangle of material 1 first
    sgTestAddFacet(*mixed, 0, {{0}, {1}, {3}, {2}});      // quad of material 0
    sgTestAddFacet(*mixed, 5, {{1}, {2}, {3}});           // material 5 of 2: left out
    sgTestAddFacet(*mixed, 0, {{3}, {2}, {1}});           // triangle of material 0
    sgTestAddFacet(*mixed, 1, {{0}, {1}, {2}, {3}, {4}}); // polygon of material 1
    auto mixedNode = prop("O", mixed, {new BareMaterial("a"), new BareMaterial("b")});
    EXPECT_EQ(facetsOf(decode(mixedNode.get())),
              (QStringList{"T0:3/3", "Q0:0/4", "T1:0/3", "P1:0/5"}));

    // Nothing to send measures zero and writes nothing.
    SgNode bare("empty");
    SgExchangeWriter writer(&bare, QString());
    EXPECT_EQ(writer.getSize(), 0);
    char byte = 0;
    EXPECT_EQ(writer.write(&byte), 0);
    EXPECT_EQ(SgExchangeWriter(nullptr, QString()).write(&byte), 0);

    // A shape without materials or UVs still fits its measure, with no facet (none has a
    // material to go with).
    SgPolyMesh *plain = sgTestMesh({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}});
    sgTestAddFacet(*plain, 0, {{0}, {1}, {2}});
    auto plainNode = prop("N", plain, {});
    EXPECT_LE(writeNode(plainNode.get(), QString(), &measured).size(), measured);
    EXPECT_TRUE(decode(plainNode.get()).facets.empty());
}

TEST(ExchangeWriterTest, MaterialEntryRules) {
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
    const QList<SgExchangeNode::Material> m = decode(node.get()).materials;
    ASSERT_EQ(m.size(), 3);
    // skin: colours as floats, no image strings (not mapped), 1 - glossiness, opacity.
    EXPECT_EQ(std::vector<float>(m[0].diffuse, m[0].diffuse + 3),
              (std::vector<float>{1.0f, 0.50196081f, 0.0f}));
    EXPECT_TRUE(m[0].diffuseImageFolder.isEmpty() && m[0].diffuseImageCopy.isEmpty());
    EXPECT_EQ(m[0].specular[2], 1.0f);
    EXPECT_FLOAT_EQ(m[0].invertedGlossiness, 0.75f);
    EXPECT_FLOAT_EQ(m[0].opacity, 0.5f);
    EXPECT_FLOAT_EQ(m[0].bumpStrength, 0.3f);
    // mapped: a mapped glossiness counts as 0 (1.0 written), a mapped opacity as 1.0.
    EXPECT_FLOAT_EQ(m[1].invertedGlossiness, 1.0f);
    EXPECT_FLOAT_EQ(m[1].opacity, 1.0f);
    // bare: no property at all gives zero colours and strengths.
    for (float value : {m[2].diffuse[0], m[2].diffuse[1], m[2].diffuse[2], m[2].specular[2],
                        m[2].invertedGlossiness, m[2].opacity, m[2].bumpStrength})
        EXPECT_EQ(value, 0.0f);
}

TEST(ExchangeWriterTest, ImagesAreCopiedAsJpegOncePerImageFileUnderSafeUniqueMeasuredNames) {
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
    second->getBumpControl()->setMapValue(otherWood); // mapped through the property
    second->getBumpControl()->setMapped(true);
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

    // Long image paths stay inside the measured size.
    QString deep = tempPath() + "/images";
    while (deep.size() < 1400)
        deep += "/" + QString(60, QLatin1Char('d'));
    SgTexture *longImage = sgApp->getImageMgr()->getImage(
        writeImage(deep + "/" + QString(200, QLatin1Char('n')) + ".png", Qt::green));
    auto *material = new SgDefaultMaterial("long");
    material->setColorMap(longImage);
    material->getBumpControl()->setMapValue(longImage);
    material->getBumpControl()->setMapped(true);
    auto longNode = prop("L", sgTestMesh({}), {material});
    SgExchangeWriter writer(longNode.get(), QString());
    QByteArray buffer(writer.getSize() + 16, '\x7f');
    const std::int32_t written = writer.write(buffer.data());
    ASSERT_GT(written, 0);
    EXPECT_LE(written, writer.getSize());
    EXPECT_TRUE(buffer.contains(deep.toLatin1()));
    EXPECT_EQ(buffer.right(16), QByteArray(16, '\x7f'));
}

TEST(ExchangeWriterTest, SubdivisionPatchesAreWrittenAsQuads) {
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
    EXPECT_LE(writeNode(node.get(), QString(), &measured).size(), measured);
    const SgExchangeNode n = decode(node.get());
    // The count says what follows: the patch without a material is not announced.
    ASSERT_EQ(facetsOf(n), (QStringList{"Q0:0/4", "Q1:2/4"}));
    EXPECT_EQ(n.corners[0].uv, 0);
    EXPECT_EQ(n.corners[0].third, 0);
    EXPECT_EQ(n.corners[4].third, -1);
}
