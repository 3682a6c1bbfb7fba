#include "enginetestsupport.h"

#include "sgcore/io/sgscenefile.h"
#include "sgcore/morph/sgfigurejoint.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/morph/sgrigidskinbinding.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/script/sgscript.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloadlog.h"

#include <QFile>
#include <QTemporaryDir>

#include <cmath>
#include <memory>

using namespace enginetest;

namespace {

// A two-bone arm bound rigidly: upper at the origin, lower hanging from (0, 2, 0).
struct Arm {
    SgSkeleton *figure = new SgSkeleton("Arm");
    SgBone *upper = makeNodeWithMesh<SgBone>("upper", makeMesh(8));
    SgBone *lower = makeNodeWithMesh<SgBone>("lower", makeMesh(8, 0.5f));

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

float distance(const SgVec3 &a, const SgVec3 &b) {
    return (a - b).length();
}

} // namespace

class ReverseDeformations : public EngineTest {};

TEST_F(ReverseDeformations, PosingMovesBonesDownTheHierarchy) {
    Arm arm;
    EXPECT_EQ(SgFigureJoint::findJoint(arm.lower), 0);
    EXPECT_EQ(SgRigidSkinBinding::bindFigure(arm.figure), 0); // already bound
    const SgVec3 rest = baseOf(arm.lower)->getVertex(3);
    EXPECT_LT(distance(arm.lower->getObject()->getCachedGeom()->getVertex(3), rest), 1e-6f);

    // Turning the upper bone a quarter about Z carries the lower bone with it.
    arm.upper->setLocalRot(SgQuat::fromAxisAngle(SgVec3(0, 0, 1), float(M_PI / 2)));
    const SgVec3 posed = arm.lower->getObject()->getCachedGeom()->getVertex(3);
    EXPECT_LT(distance(posed, SgVec3(-rest.y, rest.x, rest.z)), 1e-4f);
}

TEST_F(ReverseDeformations, LoadedSculptOfAPoseIsReproducedWhenPosedAgain) {
    for (bool afterJoint : {false, true}) {
        SCOPED_TRACE(afterJoint ? "after joint" : "before joint");
        Arm arm;
        arm.pose();
        // Sculpt the posed lower bone: two vertices pushed out.
        std::unique_ptr<SgPolyMesh> sculpt(copyVertices(*arm.lower->getObject()->getCachedGeom()));
        sculpt->setVertex(2, sculpt->getVertex(2) + SgVec3(0.3f, -0.2f, 0.1f));
        sculpt->setVertex(6, sculpt->getVertex(6) + SgVec3(0.0f, 0.0f, 0.5f));

        SgMorphLoader loader;
        loader.setMorphName("Fix");
        loader.setCreateControl(false);
        loader.setReverseModifiers(true);
        loader.setApplyAfterJoint(afterJoint);
        SgMorphLoadLog log;
        sculpt->ref();
        loader.createMorphForNode(sculpt.get(), arm.lower, log);
        ASSERT_FALSE(log.hasProblems());

        auto *morph = dynamic_cast<SgMorph *>(arm.lower->getObject()->findModifier("Fix"));
        ASSERT_TRUE(morph);
        EXPECT_EQ(arm.lower->getObject()->getModifierIndex(morph), afterJoint ? 1 : 0);
        EXPECT_EQ(morph->getDeltas()->getNumEntries(), 2);

        morph->getValueChannel()->setValue(1.0f);
        const SgVertexMesh *shown = arm.lower->getObject()->getCachedGeom();
        for (int i = 0; i < sculpt->getVertexCount(); ++i)
            EXPECT_LT(distance(shown->getVertex(i), sculpt->getVertex(i)), 1e-4f) << i;
        sculpt.release()->unref();
    }
}

TEST_F(ReverseDeformations, PoseFileRunsOrAsksWhetherToGoOn) {
    Arm arm;
    QTemporaryDir dir;
    const QString pose = dir.filePath("bend.sgs");
    QFile file(pose);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("scene.setRotation('lower', 90, 0, 0);\nprint('bent');\n");
    file.close();

    SgMorphLoader loader;
    loader.setMorphName("Fix");
    loader.setPoseFile(pose);
    EXPECT_TRUE(loader.applyPose()); // reverse deformations off: nothing runs
    EXPECT_TRUE(arm.lower->getLocalRot().isIdentity());

    loader.setReverseModifiers(true);
    EXPECT_TRUE(loader.applyPose());
    EXPECT_NEAR(arm.lower->getLocalRot().x, std::sqrt(0.5f), 1e-5);
    EXPECT_EQ(logLines().last(), QString("bent"));

    const QString missing = dir.filePath("missing.sgs");
    loader.setPoseFile(missing);
    ScriptedQuestions questions;
    questions.poses = {false, true};
    loader.setQuestions(&questions);
    EXPECT_FALSE(loader.applyPose());
    EXPECT_TRUE(loader.applyPose());
    EXPECT_EQ(questions.askedAbout, QStringList({missing, missing}));

    // The default question is the host's box with its fixed texts.
    loader.setQuestions(nullptr);
    QStringList seen;
    answerMessageBox(QMessageBox::No, &seen);
    EXPECT_FALSE(loader.applyPose());
    EXPECT_EQ(seen, QStringList({"Pose File Error", "Failed to load the pose file: \n" + missing +
                                                        "\nFor the morph: Fix\n\nDo you wish to "
                                                        "continue loading this morph?"}));

    loader.setPoseFile("None");
    EXPECT_TRUE(loader.applyPose());
}

TEST_F(ReverseDeformations, ScriptsAreCheckedBeforeTheyRunAndReportTheirErrors) {
    Arm arm;
    EXPECT_TRUE(SgScript::isScriptFile("/a/pose.SGS"));
    EXPECT_TRUE(SgScript::isScriptFile("pose.js"));
    EXPECT_TRUE(SgScript::isScriptFile("pose.sgb"));
    EXPECT_FALSE(SgScript::isScriptFile("pose.obj"));

    QTemporaryDir dir;
    const auto write = [&](const QString &name, const QByteArray &text) {
        QFile file(dir.filePath(name));
        file.open(QIODevice::WriteOnly);
        file.write(text);
        return file.fileName();
    };
    SgScript script;
    // A syntax error fails the load without running the lines before it.
    EXPECT_FALSE(script.loadFromFile(
        write("broken.sgs", "scene.setRotation('lower', 90, 0, 0);\nscene.(;\n"), true));
    EXPECT_TRUE(arm.lower->getLocalRot().isIdentity());
    EXPECT_FALSE(script.execute());
    EXPECT_FALSE(script.loadFromFile(write("compiled.sgb", "scene.resetPose('Arm');"), true));

    // A script that throws stops there and names its line in the host log.
    ASSERT_TRUE(script.loadFromFile(
        write("throws.js", "scene.setMorph('lower', 'Fix', 1);\nnoSuchCall();\n"), true));
    EXPECT_FALSE(script.execute());
    EXPECT_TRUE(logLines().last().contains("line 2")) << logLines().last().toStdString();
}

TEST_F(ReverseDeformations, ExamplePoseFileRunsOnTheExampleFigure) {
    SgScene *scene = sgApp->getScene();
    scene->clear();
    SgSceneFile file;
    ASSERT_TRUE(file.load(QStringLiteral(SG_EXAMPLES_DIR "/scenes/figure.json"), scene))
        << file.getErrorString().toStdString();
    SgScript script;
    ASSERT_TRUE(
        script.loadFromFile(QStringLiteral(SG_EXAMPLES_DIR "/poses/lean-and-turn.sgs"), true));
    EXPECT_TRUE(script.execute()) << logLines().join('\n').toStdString();
    EXPECT_EQ(logLines().last(), QStringLiteral("pose applied"));
    EXPECT_FALSE(scene->findNodeByName(QStringLiteral("chest"))->getLocalRot().isIdentity());
    EXPECT_FALSE(scene->findNodeByName(QStringLiteral("head"))->getLocalRot().isIdentity());
    EXPECT_TRUE(scene->findNodeByName(QStringLiteral("hip"))->getLocalRot().isIdentity());
    scene->clear();
}
