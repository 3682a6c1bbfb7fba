#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgobjreader.h"
#include "tests/support/sgtestmain.h"

#include <gtest/gtest.h>

#include <charconv>
#include <cstring>
#include <string>

namespace {

bool read(SgObjReader &r, const std::string &text) {
    return r.readBuffer(text.data(), text.size(), QStringLiteral("t.obj"));
}

} // namespace

TEST(HostObjReader, KeepsVertexOrderPolygonsGroupsAndMaterials) {
    SgObjReader r;
    ASSERT_TRUE(read(r, "# comment\n"
                        "mtllib a.mtl\n"
                        "v 3 0 0\nv 1 0 0\nv 2 0 0\nv 0 1 0\nv 0 2 0\r\n"
                        "vt 0.5 0.25\nvt 1\n"
                        "vn 0 0 1\n"
                        "f 1 2 3\n"
                        "g arm\n"
                        "usemtl Skin\n"
                        "f 1/1 2/2 3/1 4/2\n"
                        "usemtl Nails\n"
                        "f 1//1 2//1 3//1 4//1 5//1\n"
                        "g\n"
                        "usemtl Skin\n"
                        "f -1/-1/-1 -2/-2/1 -3/1/1\n"))
        << r.getErrorString().toStdString();
    const SgPolyMesh *m = r.getMesh();
    ASSERT_NE(m, nullptr);
    ASSERT_EQ(m->getVertexCount(), 5);
    EXPECT_EQ(m->getVertex(0), SgVec3(3, 0, 0));
    EXPECT_EQ(m->getVertex(4), SgVec3(0, 2, 0));
    ASSERT_EQ(m->getUVCount(), 2);
    EXPECT_EQ(m->getUVList()->getValue(1), SgVec2(1, 0));

    ASSERT_EQ(m->getTriangleCount(), 2);
    ASSERT_EQ(m->getQuadCount(), 1);
    ASSERT_EQ(m->getPolygonCount(), 1);
    EXPECT_EQ(m->getPolygonCornerCount(0), 5);
    // Negative indices count back from the last item read so far.
    EXPECT_EQ(m->triangleCorners(),
              (std::vector<SgFaceCorner>{
                  {0, -1, -1}, {1, -1, -1}, {2, -1, -1}, {4, 1, 0}, {3, 0, 0}, {2, 0, 0}}));
    EXPECT_EQ(m->quadCorners(),
              (std::vector<SgFaceCorner>{{0, 0, -1}, {1, 1, -1}, {2, 0, -1}, {3, 1, -1}}));
    EXPECT_EQ(m->getPolygonCorners(0)[4], (SgFaceCorner{4, -1, 0}));

    // Faces before any usemtl use "default"; names are indexed in order of first use.
    EXPECT_EQ(r.getMaterialNames(), (QStringList{QStringLiteral("default"), QStringLiteral("Skin"),
                                                 QStringLiteral("Nails")}));
    EXPECT_EQ(m->triangleMaterials(), (std::vector<uint8_t>{0, 1}));
    EXPECT_EQ(m->quadMaterials(), std::vector<uint8_t>{1});
    EXPECT_EQ(m->polygonMaterials(), std::vector<uint8_t>{2});

    ASSERT_EQ(m->getFaceGroupCount(), 1);
    EXPECT_EQ(m->getFaceGroupName(0), QStringLiteral("arm"));
    EXPECT_EQ(m->triangleGroups(), (std::vector<int32_t>{-1, -1}));
    EXPECT_EQ(m->quadGroups(), std::vector<int32_t>{0});
    EXPECT_EQ(m->getFaceGroupVertices(0), (std::vector<int32_t>{0, 1, 2, 3, 4}));
    QString why;
    EXPECT_TRUE(m->validate(&why)) << why.toStdString();

    SgPolyShape *shape = r.takeShape(QStringLiteral("body"));
    ASSERT_NE(shape, nullptr);
    EXPECT_EQ(shape->getMaterialCount(), 3);
    EXPECT_NE(shape->findMaterial(QStringLiteral("Nails")), nullptr);
    EXPECT_EQ(r.getMesh(), nullptr);
    delete shape;
}

TEST(HostObjReader, RejectsMalformedInputWithFileAndLine) {
    // A polygon of more than 255 corners cannot be stored; more than 256 materials do not fit
    // the 8-bit material index.
    std::string big = "v 0 0 0\nf";
    for (int i = 0; i < 256; ++i)
        big += " 1";
    std::string many = "v 0 0 0\n";
    for (int i = 0; i < 257; ++i)
        many += "usemtl m" + std::to_string(i) + "\n";
    struct Case {
        std::string text;
        int line;
        const char *words;
    };
    // On the fast lines (files longer than their read-ahead), a line shaped like the one before
    // it but for one byte or one index 0 still fails on its own line.
    const std::string pad = std::string(100, '#') + "\n";
    const std::string faces = "v 0 0 0\nv 0 0 0\nv 0 0 0\nvt 0 0\nusemtl m\nf 1/1 2/1 3/1\n";
    const Case cases[] = {
        {big, 2, "255"},
        {many, 258, "more than 256 materials"},
        {"v 1 2 3\nv 1 2\n", 2, "three coordinates"},
        {"v 1 2 x\n", 1, "bad number"},
        {"v 1 2-3\n", 1, "bad number"},
        {"v 1 2 3e99999\n", 1, "out of range"},
        {"v 0 0 0\nv 1 0 0\nf 1 2\n", 3, "three corners"},
        {"v 0 0 0\nf 1 2 0\n", 2, "index 0"},
        {"v 0 0 0\nv 0 0 0\nv 0 0 0\nf 1 2 -4\n", 4, "before the first"},
        {"v 0 0 0\nv 0 0 0\nv 0 0 0\nf 1 2 3\nf 1 2 4\n", 5, "out of range"}, // one past
        {"v 0 0 0\nv 0 0 0\nv 0 0 0\nf 1/4 2 3\n", 4, "texture index"},
        {"v 0 0 0\nv 0 0 0\nv 0 0 0\nf 1//2 2 3\n", 4, "normal index"},
        {"v 0 0 0\nv 0 0 0\nv 0 0 0\nf 1/a 2 3\n", 4, "bad texture"},
        {"v 0 0 0\nv 0 0 0\nv 0 0 0\nf 1x 2 3\n", 4, "bad face corner"},
        {"v 0 0 0\nv 0 0 0\nv 0 0 0\nf 99999999999 2 3\n", 4, "too large"},
        {"\n\nbogus 1 2\n", 3, "unknown statement"},
        {"v 0 0 0\n\x01\x02garbage\n", 2, "control character"},
        {"usemtl\n", 1, "material name"},
        {"vt\n", 1, "texture coordinate"},
        {"vn 1 2\n", 1, "normal"},
        {"v 1.5 2.5 3.5\nv 1.5 2.5 3-5\n" + pad, 2, "bad number"},
        {"vt 0.25 0.75\nvt 0.25 0.7x\n" + pad, 2, "bad number"},
        {faces + "f 1/1 2/1 3x1\n" + pad, 7, "bad face corner"},
        {faces + "f 1/1 0/1 3/1\n" + pad, 7, "index 0"},
    };
    for (const Case &c : cases) {
        SgObjReader r;
        EXPECT_FALSE(read(r, c.text)) << c.text;
        EXPECT_EQ(r.getErrorLine(), c.line) << c.text;
        EXPECT_TRUE(r.getErrorString().startsWith(QStringLiteral("t.obj:%1: ").arg(c.line)))
            << r.getErrorString().toStdString();
        EXPECT_TRUE(r.getErrorString().contains(QLatin1String(c.words)))
            << r.getErrorString().toStdString();
        EXPECT_EQ(r.getMesh(), nullptr);
    }

    SgObjReader r;
    EXPECT_FALSE(r.readFile(QStringLiteral("/nonexistent/x.obj")));
    EXPECT_TRUE(r.getErrorString().startsWith(QStringLiteral("/nonexistent/x.obj:0: ")));
}

TEST(HostObjReader, ReadsFilesOddButValidTextAndExactNumbers) {
    // No final newline, tabs, a w component, a forward reference and ignored statements.
    const QString path = sgTestWriteFile(sgTestPath(QStringLiteral("a.obj")),
                                         "o thing\ns 1\nf 1 2 3\nv\t+1.5 -2 3 1\nv 1e-50 0 0\nv .5 "
                                         "0 0 0.2 0.3 0.4\nl 1 2\nf 1 2 3 # tail");
    SgObjReader r;
    ASSERT_TRUE(r.readFile(path)) << r.getErrorString().toStdString();
    const SgPolyMesh *m = r.getMesh();
    EXPECT_EQ(m->getVertexCount(), 3);
    EXPECT_EQ(m->getVertex(0), SgVec3(1.5f, -2, 3));
    EXPECT_EQ(m->getVertex(1).x, 0.0f);
    EXPECT_EQ(m->getTriangleCount(), 2);

    // An empty file is an empty mesh.
    EXPECT_TRUE(read(r, ""));
    EXPECT_EQ(r.getMesh()->getVertexCount(), 0);

    // Numbers on the reader's fast lines are the floats std::from_chars gives (the fuzzer checks
    // that the fast lines read as the general reader does).
    const char *numbers[] = {"0.1",        "-0.0",      "16777217",  "16777219",
                             "0.33333334", "123.45678", "9999999.5", "1.0000001"};
    std::string text;
    for (const char *n : numbers)
        text += std::string("v ") + n + " " + n + " " + n + "\n";
    text += std::string(100, '#') + "\n";
    ASSERT_TRUE(read(r, text));
    for (size_t i = 0; i < std::size(numbers); ++i) {
        float expected = 0.0f;
        std::from_chars(numbers[i], numbers[i] + std::strlen(numbers[i]), expected);
        EXPECT_EQ(0, std::memcmp(&expected, &r.getMesh()->getVertices()[i].x, 4)) << numbers[i];
    }

    // Plain faces of every form read as the general reader reads them (on indented lines).
    const std::string faces =
        "v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 0\nvt 1 0\nvn 0 0 1\nusemtl m\n"
        "f 1 2 3\nf 1/1 2/2 3/1\nf 1/1/1 2/2/1 003/1/1 1/2/1\nf 3//1 2//1 1//1\n" +
        std::string(100, '#') + "\n";
    std::string indented = " ";
    for (char c : faces)
        indented += c == '\n' ? std::string("\n ") : std::string(1, c);
    SgObjReader general;
    ASSERT_TRUE(read(r, faces) && read(general, indented));
    EXPECT_EQ(r.getMesh()->triangleCorners(), general.getMesh()->triangleCorners());
    EXPECT_EQ(r.getMesh()->quadCorners(), general.getMesh()->quadCorners());
    EXPECT_EQ(r.getMesh()->getTriangleCount(), 3);
}
