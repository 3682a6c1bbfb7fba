#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/materials/sgmaterial.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgfigurewelder.h"
#include "sgcore/scene/sgskeleton.h"
#include "tests/support/sgtestscene.h"

#include <gtest/gtest.h>

#include <memory>

namespace {

// The group extraction the morph engine applies to a bone: the vertices used by the bone's
// face group, each once, in ascending order.
std::vector<SgVec3> extract(const SgPolyMesh &mesh, const QString &group) {
    std::vector<SgVec3> out;
    const int g = mesh.findFaceGroup(group);
    if (g >= 0)
        for (int32_t v : mesh.getFaceGroupVertices(g))
            out.push_back(mesh.getVertex(v));
    return out;
}

std::unique_ptr<SgPolyMesh> unweld(const SgFigureWelder &w, const SgVertexMesh &edited) {
    SgVertexMesh *out = w.unWeld(&edited);
    return std::unique_ptr<SgPolyMesh>(dynamic_cast<SgPolyMesh *>(out));
}

} // namespace

TEST(HostWelder, UnweldingTheUnchangedWeldGivesEveryBoneExactlyItsOwnVertices) {
    std::unique_ptr<SgSkeleton> figure(sgTestFigure(QStringLiteral("Fig"), 4, 3, true));
    figure->setLabel(QStringLiteral("Fig 1"));
    for (bool removeUnused : {true, false}) {
        SgFigureWelder welder(figure.get(), false, true, removeUnused, true);
        const SgPolyMesh *welded = welder.getGeometry();
        // 4 bones of 8 vertices (+1 unused), 3 seams of 4 shared vertices.
        EXPECT_EQ(welded->getVertexCount(), 4 * 8 - 3 * 4 + (removeUnused ? 0 : 4));
        EXPECT_EQ(welded->getQuadCount(), 12);
        EXPECT_EQ(welded->getFaceGroupCount(), 4);
        EXPECT_EQ(welder.getShape()->getName(), QStringLiteral("Fig 1"));
        ASSERT_EQ(welder.getShape()->getMaterialCount(), 2);
        EXPECT_EQ(welder.getShape()->getMaterial(1)->getName(), QStringLiteral("Cloth"));
        EXPECT_EQ(welder.getSubDTextureMap(), (std::vector<int32_t>{0, 1}));
        EXPECT_EQ(welded->getQuadMaterial(3), 1); // the first quad of bone 1
        EXPECT_EQ(welded->getUVCount(), 4 * 8);
        // Each bone's facets keep their own UVs: the first quad of bone 3 starts at (0, 0).
        const SgFaceCorner &corner = welded->getQuadCorners(9)[0];
        EXPECT_EQ(corner.uv, 3 * 8);
        EXPECT_EQ(welded->getUVList()->getValue(corner.uv), SgVec2(0, 0));
        QString why;
        EXPECT_TRUE(welded->validate(&why)) << why.toStdString();

        auto result = unweld(welder, *welded);
        ASSERT_TRUE(result);
        EXPECT_TRUE(result->validate(&why)) << why.toStdString();
        for (SgBone *bone : figure->getAllBones()) {
            const std::vector<SgVec3> own = sgTestGeometry(bone)->vertices();
            EXPECT_EQ(extract(*result, bone->getName()), own) << bone->getName().toStdString();
        }
    }
}

TEST(HostWelder, OnlyVerticesOfDifferentBonesWeld) {
    // Bone 0 carries a second vertex on its seam corner (1, 0, 0), used by a facet of its own.
    std::unique_ptr<SgSkeleton> figure(sgTestFigure(QStringLiteral("Fig"), 2, 1));
    const SgBoneList bones = figure->getAllBones();
    auto *first = static_cast<SgPolyMesh *>(sgTestGeometry(bones[0]));
    first->vertices().push_back(SgVec3(1, 0, 0));
    sgTestAddFacet(*first, 0, {{0}, {4}, {1}});
    SgFigureWelder welder(figure.get(), false, true, true, true);
    EXPECT_EQ(welder.getGeometry()->getVertexCount(), 5 + 4 - 2);
    auto result = unweld(welder, *welder.getGeometry());
    ASSERT_TRUE(result);
    for (SgBone *bone : bones)
        EXPECT_EQ(extract(*result, bone->getName()), sgTestGeometry(bone)->vertices());
}

// An edited seam vertex goes to each bone sharing it: the morph engine's welded-figure test
// checks that through the morphs it makes.
TEST(HostWelder, TheFirstWeldedVertexUnweldsAsEditedAndOtherCountsAreRefused) {
    std::unique_ptr<SgSkeleton> figure(sgTestFigure(QStringLiteral("Fig"), 3, 2));
    SgFigureWelder welder(figure.get(), false, true, true, true);
    std::unique_ptr<SgVertexMesh> edited(welder.getGeometry()->clone());
    edited->setVertex(0, SgVec3(0, 0, 0.25f));
    auto result = unweld(welder, *edited);
    ASSERT_TRUE(result);
    EXPECT_EQ(extract(*result, QStringLiteral("bone0"))[0], SgVec3(0, 0, 0.25f));

    // A mesh of another vertex count cannot be unwelded.
    for (int change : {1, -2}) {
        edited->setVertexCount(edited->getVertexCount() + change);
        EXPECT_EQ(welder.unWeld(edited.get()), nullptr) << change;
    }
    EXPECT_EQ(welder.unWeld(nullptr), nullptr);
}

TEST(HostWelder, FlagsSelectBonesSeamsAndMorphedGeometry) {
    std::unique_ptr<SgSkeleton> figure(sgTestFigure(QStringLiteral("Fig"), 3, 2));
    const SgBoneList bones = figure->getAllBones();

    // Without welding the bones sit side by side.
    SgFigureWelder apart(figure.get(), false, false, true, true);
    EXPECT_EQ(apart.getGeometry()->getVertexCount(), 3 * 6);

    // A hidden bone is left out only when invisible bones are ignored.
    bones[1]->setHidden(true);
    SgFigureWelder visible(figure.get(), true, true, true, true);
    EXPECT_EQ(visible.getBones().size(), 2);
    EXPECT_EQ(visible.getGeometry()->getVertexCount(), 12);
    auto result = unweld(visible, *visible.getGeometry());
    EXPECT_EQ(result->findFaceGroup(QStringLiteral("bone1")), -1);
    EXPECT_EQ(extract(*result, QStringLiteral("bone2")), sgTestGeometry(bones[2])->vertices());
    SgFigureWelder all(figure.get(), false, true, true, true);
    EXPECT_EQ(all.getBones().size(), 3);
    bones[1]->setHidden(false);

    // Morphed geometry: the weld shows the morph, unwelding takes it out again.
    auto *lift = new SgMorphDeltas;
    lift->setVertCount(sgTestGeometry(bones[0])->getVertexCount());
    lift->addDelta(0, SgVec3(0, 0, 2), true);
    auto *morph = new SgMorph(QStringLiteral("lift"), lift);
    morph->getValueChannel()->setValue(1.0f);
    bones[0]->getObject()->addModifier(morph);
    SgFigureWelder morphed(figure.get(), false, true, true, true);
    EXPECT_EQ(morphed.getGeometry()->getVertex(0), SgVec3(0, 0, 2));
    result = unweld(morphed, *morphed.getGeometry());
    EXPECT_EQ(extract(*result, QStringLiteral("bone0")), sgTestGeometry(bones[0])->vertices());
    SgFigureWelder bare(figure.get(), false, true, true, false);
    EXPECT_EQ(bare.getGeometry()->getVertex(0), SgVec3(0, 0, 0));

    SgVertexMesh *morphOnly = SgFigureWelder::getMorphOnlyGeom(bones[0]);
    ASSERT_NE(morphOnly, sgTestGeometry(bones[0]));
    EXPECT_EQ(morphOnly->getVertex(0), SgVec3(0, 0, 2));
    EXPECT_EQ(morphOnly->getVertex(1), SgVec3(0, 1, 0));
    EXPECT_EQ(static_cast<SgPolyMesh *>(morphOnly)->getQuadCount(), 2);
    delete morphOnly;
    EXPECT_EQ(SgFigureWelder::getMorphOnlyGeom(bones[1]), sgTestGeometry(bones[1]));
}

TEST(HostWelder, OrderedBonesFollowTheFigureHierarchy) {
    std::unique_ptr<SgSkeleton> a(sgTestFigure(QStringLiteral("A"), 3, 1));
    std::unique_ptr<SgSkeleton> b(sgTestFigure(QStringLiteral("B"), 2, 1));
    const SgBoneList ab = a->getAllBones();
    const SgBoneList bb = b->getAllBones();
    SgNode prop(QStringLiteral("prop"));
    const SgBoneList ordered =
        SgFigureWelder::getOrderedBones({ab[2], &prop, b.get(), ab[0], ab[2]});
    EXPECT_EQ(ordered, (SgBoneList{ab[0], ab[2], bb[0], bb[1]}));

    // A welder built on a list of bones welds them in that order, each once.
    SgFigureWelder w(SgBoneList{ab[1], ab[0], ab[1], nullptr}, false, true, true, true, 0);
    EXPECT_EQ(w.getBones(), (SgBoneList{ab[1], ab[0]}));
    EXPECT_EQ(w.getGeometry()->getFaceGroupName(0), QStringLiteral("bone1"));
    EXPECT_EQ(w.getGeometry()->getVertexCount(), 4 + 4 - 2);
}
