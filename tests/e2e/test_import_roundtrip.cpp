// Returned geometry imported through the real reference modeler: the bridge in this process,
// the modeler as a second process that edits what it receives and sends it straight back. The
// returns go through the bridge's own questions, or through the "Target Importer" dialog when
// the application setting "FacetorBridgeTools" is not 0.

#include "tests/e2e/e2etestbridge.h"
#include "tests/support/sgtestmodal.h"
#include "tests/support/sgtestprocess.h"
#include "tests/support/sgtestscene.h"

#include "sgcore/app/sgappsettings.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sgcore/widgets/sgbasicdialog.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QMainWindow>
#include <QMessageBox>
#include <QPushButton>
#include <QTextBrowser>

#include <gtest/gtest.h>

namespace {

// One round trip: the selected nodes go to the modeler, which applies `edit` and quits once
// its returns have been read; `answers` answer the windows the import opens meanwhile.
class RoundTrip : public SgTestModeler {
public:
    explicit RoundTrip(const QByteArray &edit)
        : SgTestModeler(
              FACETOR_BIN_DIR,
              {{"FACETOR_EXPECT", "1"}, {"FACETOR_QUIT_WHEN_DONE", "1"}, {"FACETOR_EDIT", edit}}) {}
    // Sends the selection and runs the event loop until the modeler has quit and every return
    // has been imported; true when it did, and every answer was used.
    bool run(QList<SgTestHandler> answers = {}) {
        SgTestModalAnswer answer(answers, 30000);
        E2eBridge bridge;
        bridge.executeAction();
        const bool done = bridge.isActive() && bridge.settles(30000);
        EXPECT_EQ(answer.answered(), answers.size()) << "a window was never opened";
        return done;
    }
};

// Answers the "Changed Geometry" question with `button`.
SgTestHandler changedGeometry(QMessageBox::StandardButton button) {
    return sgTestAs<QMessageBox>([button](QMessageBox *box) {
        EXPECT_EQ(box->windowTitle(), QStringLiteral("Changed Geometry"));
        box->button(button)->click();
    });
}

// Picks `action` in the dialog's "Action:" box.
void pickAction(QWidget *dialog, const QString &action) {
    auto *combo = dialog->findChild<QComboBox *>(QStringLiteral("FcBridgehAction"));
    ASSERT_NE(combo, nullptr) << dialog->windowTitle().toStdString();
    combo->setCurrentIndex(combo->findText(action));
    emit combo->textActivated(action);
}

// Picks `action` in the bridge morph dialog and accepts it.
SgTestHandler morphDialog(const QString &action) {
    return [action](QWidget *modal) {
        pickAction(modal, action);
        qobject_cast<QDialog *>(modal)->accept();
    };
}

QPushButton *okButton(QWidget *dialog) {
    return static_cast<SgBasicDialog *>(dialog)->buttonBox()->button(QDialogButtonBox::Ok);
}

class ImportRoundTrip : public ::testing::Test {
protected:
    void SetUp() override { sgApp->getScene()->clear(); }
    void TearDown() override {
        SgAppSettings().remove(QStringLiteral("FacetorBridgeTools"));
        sgApp->setInterface(nullptr);
        sgApp->getScene()->clear();
    }
    SgScene *scene() const { return sgApp->getScene(); }
    // A selected prop "Cup" whose material "Skin" has the diffuse colour (10, 20, 30).
    SgDefaultMaterial *selectedCup() {
        scene()->addNode(sgTestProp(QStringLiteral("Cup"), {1, 2, 3}));
        m_cup = scene()->findNodeByLabel(QStringLiteral("Cup"));
        scene()->selectNode(m_cup);
        auto *skin = static_cast<SgDefaultMaterial *>(
            m_cup->getObject()->getCurrentShape()->findMaterial(QStringLiteral("Skin")));
        skin->setDiffuseColor(QColor(10, 20, 30));
        return skin;
    }
    QMainWindow m_window;
    SgNode *m_cup = nullptr;
};

} // namespace

TEST_F(ImportRoundTrip, AReturnThatCannotBeAMorphAsksWhetherToMakeAProp) {
    SgSkeleton *figure = sgTestFigure(QStringLiteral("Body"), 2, 1);
    scene()->addNode(figure);
    scene()->selectNode(figure);
    // Unchanged: no morph; "No" keeps the scene as it was, the control property included.
    ASSERT_TRUE(RoundTrip("move=0,0,0").run({changedGeometry(QMessageBox::No)}));
    EXPECT_EQ(scene()->getNodeCount(), 3);
    for (SgBone *bone : figure->getAllBones())
        EXPECT_EQ(e2eModifierCount(bone), 0);
    EXPECT_EQ(figure->findProperty(QStringLiteral("MyMorph")), nullptr);
    ASSERT_TRUE(RoundTrip("move=0,0,0").run({changedGeometry(QMessageBox::Yes)}));
    EXPECT_NE(scene()->findNodeByLabel(QStringLiteral("Body (1)")), nullptr);
    EXPECT_EQ(figure->findProperty(QStringLiteral("MyMorph")), nullptr);
    scene()->clear();

    // A fourth vertex: "Yes" makes a prop of the returned shape and leaves the sent one alone.
    selectedCup();
    ASSERT_TRUE(RoundTrip("extra=0,0,5").run({changedGeometry(QMessageBox::Yes)}));
    EXPECT_EQ(e2eModifierCount(m_cup), 0);
    EXPECT_EQ(sgTestGeometry(m_cup)->getVertexCount(), 3);
    SgNode *prop = scene()->findNodeByLabel(QStringLiteral("Cup (1)"));
    ASSERT_NE(prop, nullptr);
    const SgVertexMesh *mesh = sgTestGeometry(prop);
    ASSERT_EQ(mesh->getVertexCount(), 4);
    EXPECT_NEAR(mesh->getVertex(3).z, 50.0f, 1e-4);
    scene()->clear();

    // Namesakes are tried in scene order: the first Cup has four vertices, the one sent three.
    auto *first = sgTestNode(QStringLiteral("Cup"),
                             sgTestPolygon({{0, 0, 0}, {1, 0, 0}, {1, 1, 0}, {0, 1, 0}}));
    scene()->addNode(first);
    scene()->addNode(sgTestProp(QStringLiteral("Cup")));
    SgNode *second = scene()->getNode(1);
    scene()->selectNode(second);
    ASSERT_TRUE(RoundTrip("move=0.5,0,0").run({changedGeometry(QMessageBox::Yes)}));
    EXPECT_EQ(e2eModifierCount(first), 0);
    EXPECT_EQ(scene()->getNodeCount(), 2);
    // The prop's morph moves it by the edit: 0.5 modeler units are 5 host units.
    ASSERT_NE(e2eMorphOn(second), nullptr);
    e2eMorphOn(second)->getValueChannel()->setValue(1.0f);
    EXPECT_NEAR(second->getObject()->getCachedGeom()->getVertex(0).x, 5.0f, 1e-4);
}

TEST_F(ImportRoundTrip, TheImportDialogsChooseMaterialsMorphOrProp) {
    sgApp->setInterface(&m_window);
    SgDefaultMaterial *skin = selectedCup();
    const QColor specular = skin->getSpecularColor();
    ASSERT_TRUE(RoundTrip("diffuse=1,0,0;move=0,1,0").run({morphDialog("Copy Materials")}));
    EXPECT_EQ(skin->getDiffuseColor(), QColor(255, 0, 0));
    EXPECT_EQ(skin->getSpecularColor(), specular);
    EXPECT_EQ(e2eModifierCount(m_cup), 0);
    ASSERT_TRUE(RoundTrip("diffuse=0,1,0;move=0,1,0")
                    .run({morphDialog("Create Morph And Copy Materials")}));
    EXPECT_EQ(skin->getDiffuseColor(), QColor(0, 255, 0));
    ASSERT_NE(e2eMorphOn(m_cup, QStringLiteral("My Morph")), nullptr);
    EXPECT_EQ(e2eMorphOn(m_cup, QStringLiteral("My Morph"))->getValueChannel()->getPath(),
              QStringLiteral("Morphs/FacetorBridge"));
    // A cancelled dialog leaves everything as it was.
    ASSERT_TRUE(RoundTrip("diffuse=0,0,1;move=0,1,0").run({[](QWidget *modal) {
        qobject_cast<QDialog *>(modal)->reject();
    }}));
    EXPECT_EQ(skin->getDiffuseColor(), QColor(0, 255, 0));
    EXPECT_EQ(e2eModifierCount(m_cup), 1);
    EXPECT_EQ(scene()->getNodeCount(), 1);
    scene()->clear();

    // With the application setting the "Target Importer" takes the returns, in bridge mode: one
    // in-memory source, no file buttons; cancelled, nothing changes.
    SgAppSettings().setInt(QStringLiteral("FacetorBridgeTools"), 1);
    skin = selectedCup();
    ASSERT_TRUE(RoundTrip("diffuse=0,0,1;move=0,1,0").run({[](QWidget *modal) {
        EXPECT_EQ(modal->windowTitle(), QStringLiteral("Target Importer"));
        EXPECT_EQ(modal->findChild<QPushButton *>(QStringLiteral("MorphLoaderBrowseBtn")), nullptr);
        qobject_cast<QDialog *>(modal)->reject();
    }}));
    EXPECT_EQ(e2eModifierCount(m_cup), 0);
    EXPECT_EQ(skin->getDiffuseColor(), QColor(10, 20, 30));
    // Morph and materials: the run makes the morph and shows its log; the materials are copied
    // when the dialog closes.
    ASSERT_TRUE(RoundTrip("diffuse=0,1,0;move=0,1,0").run({[&](QWidget *modal) {
        pickAction(modal, QStringLiteral("Create Morph And Copy Materials"));
        okButton(modal)->click();
        auto *log = modal->findChild<QTextBrowser *>(QStringLiteral("MorphLoaderLog"));
        ASSERT_NE(log, nullptr);
        EXPECT_TRUE(log->isVisible());
        EXPECT_EQ(e2eModifierCount(m_cup), 1) << log->toPlainText().toStdString();
        EXPECT_EQ(skin->getDiffuseColor(), QColor(10, 20, 30));
        okButton(modal)->click();
    }}));
    EXPECT_EQ(skin->getDiffuseColor(), QColor(0, 255, 0));
    ASSERT_EQ(e2eModifierCount(m_cup), 1);
    EXPECT_EQ(
        static_cast<SgMorph *>(m_cup->getObject()->getModifier(0))->getDeltas()->getNumEntries(),
        3);
    // "Create Prop" closes at once and makes a prop.
    ASSERT_TRUE(RoundTrip("move=0,1,0").run({[](QWidget *modal) {
        pickAction(modal, QStringLiteral("Create Prop"));
        okButton(modal)->click();
    }}));
    EXPECT_EQ(e2eModifierCount(m_cup), 1);
    EXPECT_NE(scene()->findNodeByLabel(QStringLiteral("Cup (1)")), nullptr);
}
