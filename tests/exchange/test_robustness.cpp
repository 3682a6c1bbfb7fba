// Returned records cut short at every byte, with bad counts and indices, and with values out of
// range (random corruption is the fuzz target's).
// This file is also built with AddressSanitizer and UndefinedBehaviorSanitizer.

#include "exchangetestsupport.h"

#include "exchange/sgexchangereader.h"
#include "exchange/sgreturnrecordwriter.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/properties/sgfloatproperty.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <memory>
#include <vector>

using namespace exchangetest;

namespace {

// A record with every kind of field: UVs, two materials with images, 'T', 'Q' and 'P'.
QByteArray validRecord() {
    std::vector<SgVec3> points;
    for (int i = 0; i < 6; ++i)
        points.emplace_back(float(i), float(i * i), -float(i));
    std::unique_ptr<SgPolyMesh> mesh(sgTestMesh(points, {{0, 0}, {1, 0}, {0, 1}}));
    sgTestAddFacet(*mesh, 1, {{0, 0}, {1, 1}, {2, 2}});
    sgTestAddFacet(*mesh, 0, {{0, 0}, {1, 1}, {3, 2}, {2, -1}});
    sgTestAddFacet(*mesh, 1, {{0}, {1}, {2}, {3}, {4}, {5}});
    SgReturnMaterial a, b;
    a.name = "a";
    a.diffuseImage = "/nowhere/a.jpg";
    b.name = "bb";
    b.bumpImage = "/nowhere/b.jpg";
    return SgReturnRecordWriter("robust", *mesh, {a, b}, "t").toByteArray();
}

void putInt(QByteArray &bytes, qsizetype at, std::int32_t value) {
    std::memcpy(bytes.data() + at, &value, 4);
}

} // namespace

TEST(ExchangeRobustnessTest, EveryPrefixAndBadCountsAndIndicesAreRejectedCleanly) {
    const QByteArray record = validRecord();
    ASSERT_GT(record.size(), 100);
    ASSERT_TRUE(readRecord(record));
    for (qsizetype n = 0; n < record.size(); ++n) {
        clearLog();
        EXPECT_FALSE(readRecord(record.left(n))) << "prefix of " << n << " bytes";
        EXPECT_EQ(logLines(), QStringList{"Error reading memory map"}) << n;
    }
    QString trailer = "kept";
    EXPECT_EQ(SgExchangeReader(nullptr, 100).readShape(trailer), nullptr);
    EXPECT_EQ(trailer, "kept");

    // Bad counts and indices, and values that are not finite.
    const qsizetype v = 4 + 6;                                 // vertex count
    const qsizetype u = v + 4 + 6 * 12;                        // UV count
    const qsizetype m = u + 4 + 3 * 8;                         // material count
    const qsizetype f = m + 4 + (54 + 1 + 14) + (54 + 2 + 14); // facet count
    const qsizetype quad = f + 4;                              // material 0's quad comes first
    ASSERT_EQ(record.at(quad), 'Q');
    const qsizetype triangle = quad + 53;
    ASSERT_EQ(record.at(triangle), 'T');
    const qsizetype polygon = triangle + 41;
    ASSERT_EQ(record.at(polygon), 'P');

    const struct {
        qsizetype at;
        std::int32_t value;
    } cases[] = {
        {0, -1},         // negative name length
        {0, 0x7fffffff}, // name longer than the record
        {v, -3},         // negative vertex count
        {v, 0x7fffffff}, // vertex bytes overflow 32 bits and exceed the record
        {v, 0x15555556}, // 12 x count wraps to a small number in 32 bits
        {u, 0x20000001}, // 8 x count wraps
        {m, -1},
        {m, 0x7fffffff},
        {f, 0x7fffffff},
        {quad + 5, 6}, // vertex index = vertex count
        {quad + 5, -1},
        {polygon + 5, 256}, // more corners than a polygon can have
        {polygon + 5, -1},
        {polygon + 5, 7}, // more corners than the record holds
        {polygon + 9, 6}, // a polygon's vertex index = vertex count
        // Values that are not finite numbers, or become infinite in host units.
        {v + 4, 0x7fc00000},
        {v + 8, 0x7f800000},
        {v + 12, 0x7ef00000},
        {u + 4 + 3 * 8 - 4, 0x7fc00000}, // the last UV's v
    };
    for (const auto &c : cases) {
        QByteArray bad = record;
        putInt(bad, c.at, c.value);
        clearLog();
        EXPECT_FALSE(readRecord(bad)) << "at " << c.at << " value " << c.value;
        EXPECT_EQ(logLines(), QStringList{"Error reading memory map"});
    }
}

TEST(ExchangeRobustnessTest, IndicesOutsideTheReturnedListsAndNonFiniteStrengthsAreKept) {
    // A modeler that returns fewer materials or UVs than its facets name keeps the edit: the
    // facet falls back to material 0, the corner to no UV. Strengths that are not numbers are
    // dropped.
    std::unique_ptr<SgPolyMesh> mesh(
        sgTestMesh({{0, 0, 0}, {1, 0, 0}, {0, 1, 0}, {1, 1, 0}, {2, 2, 0}}, {{0, 0}}));
    sgTestAddFacet(*mesh, 0, {{0, 0}, {1, 0}, {2, 0}});
    sgTestAddFacet(*mesh, 0, {{0, 0}, {1, 0}, {3, 0}, {4, 0}, {2, 0}});
    SgReturnMaterial odd;
    odd.name = "odd";
    odd.glossiness = std::numeric_limits<float>::quiet_NaN();
    odd.opacity = std::numeric_limits<float>::infinity();
    QByteArray record = SgReturnRecordWriter("few", *mesh, {odd}, "").toByteArray();
    const qsizetype polygon = record.size() - 4 - 69;
    const qsizetype triangle = polygon - 41;
    ASSERT_EQ(record.at(triangle), 'T');
    ASSERT_EQ(record.at(polygon), 'P');
    for (const auto &[at, value] : {std::pair{triangle + 1, 300},
                                    {triangle + 9, 1},
                                    {triangle + 21, -2},
                                    {triangle + 33, 0x7fffffff},
                                    {polygon + 13, 1}})
        putInt(record, at, value);
    auto shape = readRecord(record);
    ASSERT_TRUE(shape) << logLines().join('\n').toStdString();
    const SgPolyMesh *back = shape->getPolyMesh();
    ASSERT_EQ(back->getTriangleCount(), 1);
    EXPECT_EQ(back->getTriangleMaterial(0), 0);
    for (int corner = 0; corner < 3; ++corner)
        EXPECT_EQ(back->getTriangleCorners(0)[corner].uv, -1);
    ASSERT_EQ(back->getPolygonCount(), 1);
    EXPECT_EQ(back->getPolygonCorners(0)[0].uv, -1);
    EXPECT_EQ(back->getPolygonCorners(0)[1].uv, 0);
    auto *material = dynamic_cast<SgDefaultMaterial *>(shape->getMaterial(0));
    ASSERT_TRUE(material);
    EXPECT_TRUE(std::isfinite(material->getGlossinessStrength()));
    EXPECT_FLOAT_EQ(material->getOpacityControl()->getValue(), 1.0f);
}
