// Returned geometry imported through the real reference modeler: the bridge in this process,
// the modeler as a second process that edits what it receives and sends it straight back.

#include "app/sgobjexport.h"
#include "bridge/sgfacbridge.h"
#include "bridgetestsupport.h"
#include "facetorroundtrip.h"

#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgobjreader.h"
#include "sgcore/io/sgscenefile.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

#include <QAbstractButton>
#include <QComboBox>
#include <QElapsedTimer>
#include <QFile>
#include <QMainWindow>
#include <QMessageBox>
#include <QTemporaryDir>

#include <gtest/gtest.h>

namespace {

SgMorph *morphOn(SgNode *node, const QString &name = QStringLiteral("MyMorph")) {
    return node && node->getObject()
               ? dynamic_cast<SgMorph *>(node->getObject()->findModifier(name))
               : nullptr;
}

int modifierCount(const SgNode *node) {
    return node->getObject() ? node->getObject()->getModifierCount() : 0;
}

// Answers the next "Changed Geometry" question with `button`, recording that it was asked.
void answerChangedGeometry(QMessageBox::StandardButton button, int *asked) {
    bridgetest::answerModal([button, asked](QWidget *modal) {
        auto *box = qobject_cast<QMessageBox *>(modal);
        ASSERT_NE(box, nullptr);
        EXPECT_EQ(box->windowTitle(), QStringLiteral("Changed Geometry"));
        ++*asked;
        box->button(button)->click();
    });
}

// Picks `action` in the bridge morph dialog and accepts it.
void answerMorphDialog(const QString &action) {
    bridgetest::answerModal([action](QWidget *modal) {
        auto *combo = modal->findChild<QComboBox *>(QStringLiteral("FcBridgehAction"));
        ASSERT_NE(combo, nullptr) << modal->windowTitle().toStdString();
        combo->setCurrentIndex(combo->findText(action));
        emit combo->textActivated(action);
        qobject_cast<QDialog *>(modal)->accept();
    });
}

class ImportRoundTrip : public ::testing::Test {
protected:
    void SetUp() override { sgApp->getScene()->clear(); }
    void TearDown() override {
        EXPECT_EQ(bridgetest::cancelPendingAnswers(), 0) << "a question was never asked";
        sgApp->setInterface(nullptr);
        sgApp->getScene()->clear();
    }
    SgScene *scene() const { return sgApp->getScene(); }
};

} // namespace

TEST_F(ImportRoundTrip, EditedFigureGivesOneMorphPerMovedBoneDrivenByItsControl) {
    SgSkeleton *figure = bridgetest::makeFigure(QStringLiteral("Body"));
    scene()->addNode(figure);
    scene()->selectNode(figure);
    // Vertex 0 of the welded figure is the hip's first vertex; 0.5 modeler units are 5 host units.
    RoundTrip trip("vertex=0,0,0,0.5");
    ASSERT_TRUE(trip.run()) << trip.log().toStdString();

    SgNode *hip = scene()->findNodeByLabel(QStringLiteral("hip"));
    SgNode *thigh = scene()->findNodeByLabel(QStringLiteral("thigh"));
    SgMorph *morph = morphOn(hip);
    ASSERT_NE(morph, nullptr) << sgApp->getMessageSink()->logLines().join('\n').toStdString();
    EXPECT_EQ(morphOn(thigh), nullptr);
    EXPECT_EQ(morph->getDeltas()->getNumEntries(), 1);
    EXPECT_EQ(morph->getValueChannel()->getLabel(), QStringLiteral("p_MyMorph"));
    EXPECT_TRUE(morph->getValueChannel()->isHidden());
    EXPECT_EQ(morph->getValueChannel()->getControllerCount(), 1);

    auto *control =
        dynamic_cast<SgFloatProperty *>(figure->findProperty(QStringLiteral("MyMorph")));
    ASSERT_NE(control, nullptr);
    EXPECT_FLOAT_EQ(control->getValue(), 1.0f);
    EXPECT_FLOAT_EQ(control->getMin(), -1.0f);
    EXPECT_FLOAT_EQ(control->getMax(), 1.0f);
    EXPECT_TRUE(control->isClamped());
    EXPECT_EQ(control->getPath(), QStringLiteral("Morphs"));
    EXPECT_EQ(scene()->getNodeCount(), 3); // no prop

    // Exported at value 1 the figure is the edited shape; at 0 it is the original again.
    const QString file = trip.path(QStringLiteral("body.obj"));
    ASSERT_TRUE(SgObjExport::exportNode(figure, file));
    SgObjReader reader;
    ASSERT_TRUE(reader.readFile(file)) << reader.getErrorString().toStdString();
    const SgPolyMesh *out = reader.getMesh();
    ASSERT_EQ(out->getVertexCount(), 6);
    const SgVec3 moved = out->getVertex(0);
    EXPECT_NEAR(moved.x, 0.0f, 1e-4);
    EXPECT_NEAR(moved.y, 100.0f, 1e-4);
    EXPECT_NEAR(moved.z, 8.25f, 1e-4);
    for (int i = 1; i < 6; ++i) {
        const SgNode *bone = i < 3 ? hip : thigh;
        const SgVec3 rest = bone->getObject()->getCurrentShape()->getGeometry()->getVertex(i % 3);
        EXPECT_NEAR(out->getVertex(i).x, rest.x, 1e-4) << i;
        EXPECT_NEAR(out->getVertex(i).y, rest.y, 1e-4) << i;
        EXPECT_NEAR(out->getVertex(i).z, rest.z, 1e-4) << i;
    }
    control->setValue(0.0f);
    EXPECT_NEAR(hip->getObject()->getCachedGeom()->getVertex(0).z, 3.25f, 1e-4);
}

TEST_F(ImportRoundTrip, UnchangedFigureGivesNoMorphAndAnswersDecideAboutAProp) {
    SgSkeleton *figure = bridgetest::makeFigure(QStringLiteral("Body"));
    scene()->addNode(figure);
    scene()->selectNode(figure);
    int asked = 0;
    {
        RoundTrip trip("move=0,0,0");
        answerChangedGeometry(QMessageBox::No, &asked);
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    EXPECT_EQ(asked, 1);
    EXPECT_EQ(scene()->getNodeCount(), 3);
    for (SgBone *bone : figure->getAllBones())
        EXPECT_EQ(modifierCount(bone), 0);
    // The figure is as it was: the import took its control property back.
    EXPECT_EQ(figure->findProperty(QStringLiteral("MyMorph")), nullptr);

    {
        RoundTrip trip("move=0,0,0");
        answerChangedGeometry(QMessageBox::Yes, &asked);
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    EXPECT_EQ(asked, 2);
    EXPECT_NE(scene()->findNodeByLabel(QStringLiteral("Body (1)")), nullptr);
    EXPECT_EQ(figure->findProperty(QStringLiteral("MyMorph")), nullptr);
}

TEST_F(ImportRoundTrip, EditedPropGetsAMorph) {
    scene()->addNode(bridgetest::makeProp(QStringLiteral("Cup"), {1, 2, 3}));
    SgNode *cup = scene()->findNodeByLabel(QStringLiteral("Cup"));
    scene()->selectNode(cup);
    {
        RoundTrip trip("move=0,0.25,0");
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    SgMorph *morph = morphOn(cup);
    ASSERT_NE(morph, nullptr);
    EXPECT_EQ(morph->getDeltas()->getNumEntries(), 3);
    morph->getValueChannel()->setValue(1.0f);
    EXPECT_NEAR(cup->getObject()->getCachedGeom()->getVertex(0).y, 4.5f, 1e-4);
    EXPECT_EQ(scene()->getNodeCount(), 1);
}

TEST_F(ImportRoundTrip, ChangedVertexCountAsksAndYesMakesAProp) {
    scene()->addNode(bridgetest::makeProp(QStringLiteral("Cup"), {1, 2, 3}));
    SgNode *cup = scene()->findNodeByLabel(QStringLiteral("Cup"));
    scene()->selectNode(cup);
    int asked = 0;
    // The modeler adds a fourth vertex (with a triangle over it): no morph can be made.
    {
        RoundTrip trip("extra=0,0,5");
        answerChangedGeometry(QMessageBox::No, &asked);
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    EXPECT_EQ(asked, 1);
    EXPECT_EQ(scene()->getNodeCount(), 1);
    EXPECT_EQ(modifierCount(cup), 0);
    EXPECT_EQ(cup->getObject()->getCurrentShape()->getGeometry()->getVertexCount(), 3);

    {
        RoundTrip trip("extra=0,0,5");
        answerChangedGeometry(QMessageBox::Yes, &asked);
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    EXPECT_EQ(asked, 2);
    EXPECT_EQ(modifierCount(cup), 0);
    SgNode *prop = scene()->findNodeByLabel(QStringLiteral("Cup (1)"));
    ASSERT_NE(prop, nullptr);
    const SgVertexMesh *mesh = prop->getObject()->getCurrentShape()->getGeometry();
    ASSERT_EQ(mesh->getVertexCount(), 4);
    EXPECT_NEAR(mesh->getVertex(3).z, 50.0f, 1e-4);
    EXPECT_EQ(scene()->getNodeCount(), 2);
}

TEST_F(ImportRoundTrip, SameLabelsAreTriedInSceneOrder) {
    // The first Cup in scene order has four vertices; the one sent has three.
    auto *first = new SgNode(QStringLiteral("Cup"));
    auto *object = new SgObject(QStringLiteral("Cup"));
    object->addShape(bridgetest::makeShape(
        QStringLiteral("Cup"), bridgetest::makeMesh({{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}})));
    first->setObject(object);
    scene()->addNode(first);
    scene()->addNode(bridgetest::makeProp(QStringLiteral("Cup")));
    SgNode *second = scene()->getNode(1);
    scene()->selectNode(second);
    int asked = 0;
    RoundTrip trip("move=0.5,0,0");
    answerChangedGeometry(QMessageBox::Yes, &asked);
    ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    EXPECT_EQ(asked, 1);
    EXPECT_EQ(modifierCount(first), 0);
    ASSERT_NE(morphOn(second), nullptr);
    EXPECT_EQ(scene()->getNodeCount(), 2);
}

TEST_F(ImportRoundTrip, DialogChoosesMaterialsOrMorphAndMaterials) {
    QMainWindow window;
    sgApp->setInterface(&window);
    scene()->addNode(bridgetest::makeProp(QStringLiteral("Cup")));
    SgNode *cup = scene()->getNode(0);
    auto *skin = static_cast<SgDefaultMaterial *>(
        cup->getObject()->getCurrentShape()->findMaterial(QStringLiteral("Skin")));
    ASSERT_NE(skin, nullptr);
    skin->setDiffuseColor(QColor(10, 20, 30));
    const QColor specular = skin->getSpecularColor();
    scene()->selectNode(cup);
    {
        RoundTrip trip("diffuse=1,0,0;move=0,1,0");
        answerMorphDialog(QStringLiteral("Copy Materials"));
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    EXPECT_EQ(skin->getDiffuseColor(), QColor(255, 0, 0));
    EXPECT_EQ(skin->getSpecularColor(), specular);
    EXPECT_EQ(modifierCount(cup), 0);
    EXPECT_EQ(scene()->getNodeCount(), 1);

    skin->setDiffuseColor(QColor(10, 20, 30));
    {
        RoundTrip trip("diffuse=0,1,0;move=0,1,0");
        answerMorphDialog(QStringLiteral("Create Morph And Copy Materials"));
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    EXPECT_EQ(skin->getDiffuseColor(), QColor(0, 255, 0));
    ASSERT_NE(morphOn(cup, QStringLiteral("My Morph")), nullptr);
    EXPECT_EQ(morphOn(cup, QStringLiteral("My Morph"))->getValueChannel()->getPath(),
              QStringLiteral("Morphs/FacetorBridge"));

    // A cancelled dialog leaves everything as it was.
    {
        RoundTrip trip("diffuse=0,0,1;move=0,1,0");
        bridgetest::answerModal([](QWidget *modal) { qobject_cast<QDialog *>(modal)->reject(); });
        ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    }
    EXPECT_EQ(skin->getDiffuseColor(), QColor(0, 255, 0));
    EXPECT_EQ(modifierCount(cup), 1);
    EXPECT_EQ(scene()->getNodeCount(), 1);
}

TEST_F(ImportRoundTrip, ExampleFigureAndPropComeBackAsMorphsInTime) {
    SgSceneFile file;
    ASSERT_TRUE(file.load(QStringLiteral(SG_EXAMPLES_DIR "/demo/scene.json"), scene()))
        << file.getErrorString().toStdString();
    SgNode *figure = scene()->findNodeByLabel(QStringLiteral("Blobby"));
    SgNode *box = scene()->findNodeByLabel(QStringLiteral("Box"));
    ASSERT_NE(figure, nullptr);
    ASSERT_NE(box, nullptr);
    scene()->selectNode(figure);
    scene()->selectNode(box, true);
    RoundTrip trip("move=0,0.5,0");
    qputenv("FACETOR_EXPECT", "2");
    // From the send (the modeler's launch included) to each node's morph.
    QElapsedTimer clock;
    clock.start();
    TestBridge bridge;
    bridge.executeAction();
    qint64 figureMs = -1;
    qint64 boxMs = -1;
    SgNode *hip = scene()->findNodeByLabel(QStringLiteral("hip"));
    ASSERT_TRUE(bridgetest::waitUntil(
        [&] {
            if (figureMs < 0 && morphOn(hip))
                figureMs = clock.elapsed();
            if (boxMs < 0 && morphOn(box))
                boxMs = clock.elapsed();
            return !bridge.isActive();
        },
        30000))
        << trip.log().toStdString();
    ASSERT_GE(figureMs, 0) << trip.log().toStdString();
    ASSERT_GE(boxMs, 0) << trip.log().toStdString();
    for (SgBone *bone : static_cast<SgSkeleton *>(figure)->getAllBones())
        EXPECT_NE(morphOn(bone), nullptr) << bone->getLabel().toStdString();
    std::printf("round trip from send to morph: figure %lld ms, prop %lld ms (modeler launch "
                "included)\n",
                figureMs, boxMs);
}
