// Returned geometry imported through the "Target Importer" dialog (application setting
// "FacetorBridgeTools" not 0), with the real reference modeler as the second process.

#include "bridgetestsupport.h"
#include "facetorroundtrip.h"

#include "sgcore/app/sgappsettings.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/widgets/sgbasicdialog.h"

#include <QComboBox>
#include <QDialog>
#include <QDialogButtonBox>
#include <QMainWindow>
#include <QPushButton>
#include <QTextBrowser>

#include <gtest/gtest.h>

namespace {

const QString kTools = QStringLiteral("FacetorBridgeTools");

class ImportingBridge : public SgFacBridge {
public:
    using SgFacBridge::importReturnedShape;
};

SgMorph *firstMorphOn(SgNode *node) {
    SgObject *object = node ? node->getObject() : nullptr;
    return object && object->getModifierCount() > 0
               ? dynamic_cast<SgMorph *>(object->getModifier(0))
               : nullptr;
}

QPushButton *okButton(QWidget *dialog) {
    return static_cast<SgBasicDialog *>(dialog)->buttonBox()->button(QDialogButtonBox::Ok);
}

// Picks `action` in the dialog's "Action:" box.
void pickAction(QWidget *dialog, const QString &action) {
    auto *combo = dialog->findChild<QComboBox *>(QStringLiteral("FcBridgehAction"));
    ASSERT_NE(combo, nullptr) << dialog->windowTitle().toStdString();
    combo->setCurrentIndex(combo->findText(action));
    emit combo->textActivated(action);
}

class LoaderRoundTrip : public ::testing::Test {
protected:
    void SetUp() override {
        sgApp->getScene()->clear();
        sgApp->setInterface(&m_window);
        SgAppSettings().setInt(kTools, 1);
        m_cup = bridgetest::makeProp(QStringLiteral("Cup"));
        scene()->addNode(m_cup);
        m_skin = static_cast<SgDefaultMaterial *>(
            m_cup->getObject()->getCurrentShape()->findMaterial(QStringLiteral("Skin")));
        m_skin->setDiffuseColor(QColor(10, 20, 30));
        scene()->selectNode(m_cup);
    }
    void TearDown() override {
        EXPECT_EQ(bridgetest::cancelPendingAnswers(), 0) << "a dialog was never shown";
        SgAppSettings().remove(kTools);
        sgApp->setInterface(nullptr);
        sgApp->getScene()->clear();
    }
    SgScene *scene() const { return sgApp->getScene(); }
    int modifierCount() const { return m_cup->getObject()->getModifierCount(); }

    QMainWindow m_window;
    SgNode *m_cup = nullptr;
    SgDefaultMaterial *m_skin = nullptr;
};

} // namespace

TEST_F(LoaderRoundTrip, CancelLeavesTheSceneUnchangedAndMakesNoProp) {
    bool shown = false;
    bridgetest::answerModal([&shown](QWidget *modal) {
        shown = modal->windowTitle() == QStringLiteral("Target Importer");
        // Bridge mode: the one in-memory source, no file buttons.
        EXPECT_EQ(modal->findChild<QPushButton *>(QStringLiteral("MorphLoaderBrowseBtn")), nullptr);
        qobject_cast<QDialog *>(modal)->reject();
    });
    RoundTrip trip("diffuse=0,0,1;move=0,1,0");
    ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    EXPECT_TRUE(shown);
    EXPECT_EQ(modifierCount(), 0);
    EXPECT_EQ(m_skin->getDiffuseColor(), QColor(10, 20, 30));
    EXPECT_EQ(scene()->getNodeCount(), 1);
}

TEST_F(LoaderRoundTrip, MorphAndMaterialsMakeTheMorphInTheRunAndCopyAfterwards) {
    bool checkedRun = false;
    bridgetest::answerModal([this, &checkedRun](QWidget *modal) {
        pickAction(modal, QStringLiteral("Create Morph And Copy Materials"));
        okButton(modal)->click();
        // The run has made the morph and shows its log; the materials wait for the close.
        auto *log = modal->findChild<QTextBrowser *>(QStringLiteral("MorphLoaderLog"));
        ASSERT_NE(log, nullptr);
        EXPECT_TRUE(log->isVisible());
        EXPECT_FALSE(log->toPlainText().isEmpty());
        EXPECT_NE(firstMorphOn(m_cup), nullptr) << log->toPlainText().toStdString();
        EXPECT_EQ(m_skin->getDiffuseColor(), QColor(10, 20, 30));
        checkedRun = true;
        okButton(modal)->click();
    });
    RoundTrip trip("diffuse=0,1,0;move=0,1,0");
    ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    EXPECT_TRUE(checkedRun);
    EXPECT_EQ(m_skin->getDiffuseColor(), QColor(0, 255, 0));
    SgMorph *morph = firstMorphOn(m_cup);
    ASSERT_NE(morph, nullptr);
    EXPECT_EQ(morph->getDeltas()->getNumEntries(), 3);
    EXPECT_EQ(modifierCount(), 1);
    EXPECT_EQ(scene()->getNodeCount(), 1);
}

TEST_F(LoaderRoundTrip, CreatePropClosesAtOnceAndMakesAProp) {
    bridgetest::answerModal([](QWidget *modal) {
        pickAction(modal, QStringLiteral("Create Prop"));
        EXPECT_FALSE(
            modal->findChild<QWidget *>(QStringLiteral("MorphLoaderSourceList"))->isEnabled());
        okButton(modal)->click();
    });
    RoundTrip trip("move=0,1,0");
    ASSERT_TRUE(trip.run()) << trip.log().toStdString();
    EXPECT_EQ(modifierCount(), 0);
    ASSERT_EQ(scene()->getNodeCount(), 2);
    EXPECT_NE(scene()->findNodeByLabel(QStringLiteral("Cup (1)")), nullptr);
}

TEST_F(LoaderRoundTrip, ShapeWithoutGeometryOpensFileModeAndIsDealtWith) {
    bool fileMode = false;
    bridgetest::answerModal([&fileMode](QWidget *modal) {
        fileMode =
            modal->findChild<QPushButton *>(QStringLiteral("MorphLoaderBrowseBtn")) != nullptr &&
            modal->findChild<QComboBox *>(QStringLiteral("FcBridgehAction")) == nullptr;
        okButton(modal)->click(); // runs the empty list
        okButton(modal)->click();
    });
    SgPolyShape shape(QStringLiteral("Cup"));
    ImportingBridge bridge;
    EXPECT_TRUE(bridge.importReturnedShape(&shape, m_cup));
    EXPECT_TRUE(fileMode);
    EXPECT_EQ(modifierCount(), 0);
    EXPECT_EQ(scene()->getNodeCount(), 1);
}
