// Every dialog of the morph tools shows its whole text at its own default size: no label,
// button or tree row is cut, elided or wider than its column. Pictures of the Target Importer
// as a user sees it are kept as test artefacts (SG_TEST_ARTIFACTS, else the temporary folder).
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/loaderui/sgconfigurationsaveoptionsdlg.h"
#include "sharedsource/loaderui/sgmorphloaderdlg.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"
#include "sharedsource/propertyui/sgcreatepropertydlg.h"
#include "sharedsource/propertyui/sgcreatepropertygroupdlg.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestscene.h"
#include "tests/support/sgwidgetfit.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QDir>
#include <QImage>
#include <QLabel>
#include <QPushButton>
#include <QTest>
#include <QTextBrowser>
#include <gtest/gtest.h>

namespace {

// Checks that the shown `dialog` cuts no text and, given a picture name, saves it as drawn.
void expectWhole(QWidget *dialog, const char *picture = nullptr) {
    EXPECT_EQ(sgCutTexts(dialog).join('\n').toStdString(), "")
        << dialog->windowTitle().toStdString();
    if (!picture)
        return;
    const QString folder = qEnvironmentVariable("SG_TEST_ARTIFACTS", sgTestFolder());
    QDir().mkpath(folder);
    const QImage image = dialog->grab().toImage();
    EXPECT_TRUE(image.save(QDir(folder).filePath(QLatin1String(picture))));
}

class DialogFit : public ::testing::Test {
protected:
    // The targets live in a folder of a stable name, so that the pictures show the same paths.
    QDir dir{QDir::tempPath() + QStringLiteral("/Targets")};
    SgSkeleton *figure = sgTestFigure("Figure", 2, 1);

    void SetUp() override {
        dir.mkpath(QStringLiteral("."));
        sgApp->getScene()->clear();
        sgApp->getScene()->addNode(figure);
        sgApp->getScene()->selectNode(figure);
    }
    void TearDown() override { sgApp->getScene()->clear(); }

    // A target with one face group per bone, its first vertex lifted by `lift`.
    QString target(const QString &name, float lift) {
        QByteArray vertices, faces;
        int next = 1;
        for (SgBone *bone : figure->getAllBones()) {
            const SgVertexMesh *mesh = sgTestGeometry(bone);
            faces += "g " + bone->getName().toLatin1() + "\nf";
            for (int i = 0; i < mesh->getVertexCount(); ++i, ++next) {
                const SgVec3 v = mesh->getVertex(i) + SgVec3(0, next == 1 ? lift : 0.0f, 0);
                vertices += QStringLiteral("v %1 %2 %3\n").arg(v.x).arg(v.y).arg(v.z).toLatin1();
                faces += ' ' + QByteArray::number(next);
            }
            faces += '\n';
        }
        return sgTestWriteFile(dir.filePath(name), vertices + faces);
    }
};

} // namespace

TEST_F(DialogFit, TargetImporterInBothModesAndItsLogPage) {
    SgMorphLoaderDlg files(nullptr, true, nullptr, figure);
    SgMorphSourceList *list = files.sourceList();
    list->addFiles(
        {target("smile.obj", 0.25f), target("blink.obj", 0.5f), target("frown.obj", -0.25f)});
    files.show();
    auto *nodes = files.findChild<QComboBox *>("MorphLoaderNodes");
    for (int i = nodes->count() - 1; i >= 0; --i) {
        nodes->setCurrentIndex(i);
        expectWhole(&files);
    }
    // Expanding sources (and their dependent rows) keeps the "Item" column wide enough.
    list->topLevelItem(0)->setExpanded(true);
    list->topLevelItem(1)->setExpanded(true);
    expectWhole(&files, "target-importer-file-mode.png");
    list->expandAll();
    expectWhole(&files);

    files.buttonBox()->button(QDialogButtonBox::Ok)->click();
    auto *log = files.findChild<QTextBrowser *>("MorphLoaderLog");
    ASSERT_TRUE(log->isVisible());
    EXPECT_TRUE(log->toPlainText().contains("Created morph successfully."));
    EXPECT_FALSE(log->toPlainText().contains("Warning"));
    EXPECT_EQ(files.findChild<QLabel *>("MorphLoaderLogHeading")->text(), "Morphs Loaded:");
    EXPECT_EQ(sgApp->getMessageSink()->currentStatus(), "Morphs loaded.");
    EXPECT_TRUE(figure->getAllBones().first()->getObject()->findModifier("smile"));
    expectWhole(&files, "target-importer-log.png");
    // After the run Escape (or the close box) ends the dialog as the second "Ok" does.
    QTest::keyClick(&files, Qt::Key_Escape);
    EXPECT_FALSE(files.isVisible());
    EXPECT_EQ(files.result(), QDialog::Accepted);

    SgPolyMesh *returned = sgTestCopyVertices(*sgTestGeometry(figure->getAllBones().first()));
    returned->ref();
    {
        SgMorphLoaderDlg bridge(nullptr, false, returned, figure);
        bridge.show();
        expectWhole(&bridge, "target-importer-bridge-mode.png");
        bridge.sourceList()->expandAll();
        auto *actions = bridge.findChild<QComboBox *>("FcBridgehAction");
        for (int i = 0; i < actions->count(); ++i) {
            actions->setCurrentIndex(i);
            expectWhole(&bridge);
        }
    }
    returned->unref();
}

TEST_F(DialogFit, SaveOptionsCreateGroupAndCreatePropertyOfEveryType) {
    SgConfigurationSaveOptionsDlg options(nullptr);
    options.show();
    expectWhole(&options);
    SgCreatePropertyGroupDlg group(nullptr, "TICreatePropGroup");
    group.setGroup("Morphs/Morph Loader");
    group.show();
    expectWhole(&group);
    for (bool single : {false, true}) {
        for (int type = SgCreatePropertyDlg::FloatType;
             type <= SgCreatePropertyDlg::NumericNodeType; ++type) {
            SCOPED_TRACE(testing::Message() << "type " << type << (single ? " (single)" : ""));
            SgCreatePropertyDlg dialog(nullptr, "Fit", single, type, false, true);
            dialog.show();
            const bool pictured = !single && (type == SgCreatePropertyDlg::FloatType ||
                                              type == SgCreatePropertyDlg::EnumType);
            expectWhole(&dialog, !pictured ? nullptr
                                 : type == SgCreatePropertyDlg::FloatType
                                     ? "create-property-float.png"
                                     : "create-property-enum.png");
        }
    }
}
