#include "enginetestsupport.h"

#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/morph/sgrigidskinbinding.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/script/sgscript.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloadlog.h"

#include <QTemporaryDir>

#include <cmath>
#include <memory>

using namespace enginetest;

namespace {

// A two-bone arm bound rigidly: upper at the origin, lower hanging from (0, 2, 0).
struct Arm {
    SgSkeleton *figure = new SgSkeleton("Arm");
    SgBone *upper = sgTestNode<SgBone>("upper", sgTestRowMesh(8));
    SgBone *lower = sgTestNode<SgBone>("lower", sgTestRowMesh(8, 0.5f));

    Arm() {
        lower->setOrigin(SgVec3(0, 2, 0));
        figure->addBone(upper);
        figure->addBone(lower, upper);
        sgApp->getScene()->addNode(figure);
        SgRigidSkinBinding::bindFigure(figure);
    }
    void pose() {
        upper->setLocalRot(SgQuat::fromAxisAngle(SgVec3(0, 0, 1), 0.5f));
        lower->setLocalRot(SgQuat::fromAxisAngle(SgVec3(1, 0, 0), 0.8f));
    }
};

} // namespace

class ReverseDeformations : public EngineTest {};

TEST_F(ReverseDeformations, LoadedSculptOfAPoseIsReproducedWhenPosedAgain) {
    for (bool afterJoint : {false, true}) {
        SCOPED_TRACE(afterJoint ? "after joint" : "before joint");
        Arm arm;
        arm.pose();
        // Sculpt the posed lower bone: two vertices pushed out.
        const auto sculpt = hold(sgTestCopyVertices(*arm.lower->getObject()->getCachedGeom()));
        sculpt->setVertex(2, sculpt->getVertex(2) + SgVec3(0.3f, -0.2f, 0.1f));
        sculpt->setVertex(6, sculpt->getVertex(6) + SgVec3(0.0f, 0.0f, 0.5f));

        SgMorphLoader loader;
        loader.setMorphName("Fix");
        loader.setCreateControl(false);
        loader.setReverseModifiers(true);
        loader.setApplyAfterJoint(afterJoint);
        SgMorphLoadLog log;
        loader.createMorphForNode(sculpt.get(), arm.lower, log);
        ASSERT_FALSE(log.hasProblems());

        auto *morph = dynamic_cast<SgMorph *>(arm.lower->getObject()->findModifier("Fix"));
        ASSERT_TRUE(morph);
        EXPECT_EQ(arm.lower->getObject()->getModifierIndex(morph), afterJoint ? 1 : 0);
        EXPECT_EQ(morph->getDeltas()->getNumEntries(), 2);

        morph->getValueChannel()->setValue(1.0f);
        const SgVertexMesh *shown = arm.lower->getObject()->getCachedGeom();
        for (int i = 0; i < sculpt->getVertexCount(); ++i)
            EXPECT_LT((shown->getVertex(i) - sculpt->getVertex(i)).length(), 1e-4f) << i;
    }
}

// A pose that does not load asks whether to go on without it (test_createmorphs).
TEST_F(ReverseDeformations, PoseFileRunsOnlyWithReverseDeformations) {
    Arm arm;
    QTemporaryDir dir;
    SgMorphLoader loader;
    loader.setPoseFile(sgTestWriteFile(dir.filePath("bend.sgs"),
                                       "scene.setRotation('lower', 90, 0, 0);\nprint('bent');\n"));
    EXPECT_TRUE(loader.applyPose()); // reverse deformations off: nothing runs
    EXPECT_TRUE(arm.lower->getLocalRot().isIdentity());

    loader.setReverseModifiers(true);
    EXPECT_TRUE(loader.applyPose());
    EXPECT_NEAR(arm.lower->getLocalRot().x, std::sqrt(0.5f), 1e-5);
    EXPECT_EQ(logLines().last(), QString("bent"));
    loader.setPoseFile("None");
    EXPECT_TRUE(loader.applyPose());
}
