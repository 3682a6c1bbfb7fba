// Every dialog of the morph tools shows its whole text at its own default size: no label,
// button or tree row is cut, elided or wider than its column.
#include "sgcore/app/sgapp.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgobjreader.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/loaderui/sgconfigurationsaveoptionsdlg.h"
#include "sharedsource/loaderui/sgmorphloaderdlg.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"
#include "sharedsource/propertyui/sgcreatepropertydlg.h"
#include "sharedsource/propertyui/sgcreatepropertygroupdlg.h"
#include "tests/support/sgwidgetfit.h"

#include <QApplication>
#include <QComboBox>
#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <gtest/gtest.h>

#include <memory>

namespace {

std::string cut(QWidget *dialog) {
    return sgCutTexts(dialog).join('\n').toStdString();
}

const char *Triangle = "v 0 0 0\nv 1 0 0\nv 0 1 0\nf 1 2 3\n";

class DialogFit : public ::testing::Test {
protected:
    QTemporaryDir dir;
    void SetUp() override { sgApp->getScene()->clear(); }
    void TearDown() override { sgApp->getScene()->clear(); }
    QString target(const QString &name) {
        const QString path = dir.filePath(name);
        QFile file(path);
        EXPECT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(Triangle);
        return path;
    }
};

} // namespace

TEST_F(DialogFit, TargetImporterInBothModesWithSourcesExpanded) {
    auto *figure = new SgSkeleton("Figure");
    sgApp->getScene()->addNode(figure);
    SgMorphLoaderDlg files(nullptr, true, nullptr, figure);
    files.sourceList()->addFiles({target("smile.obj"), target("frown.obj")});
    files.show();
    EXPECT_EQ(cut(&files), "");
    // Expanding a source (and its dependent rows) keeps the "Item" column wide enough.
    files.sourceList()->expandAll();
    EXPECT_EQ(cut(&files), "");
    for (int i = 0; i < files.findChild<QComboBox *>("MorphLoaderNodes")->count(); ++i) {
        files.findChild<QComboBox *>("MorphLoaderNodes")->setCurrentIndex(i);
        EXPECT_EQ(cut(&files), "") << i;
    }

    SgObjReader reader;
    ASSERT_TRUE(reader.readBuffer(Triangle, qstrlen(Triangle), "Figure"));
    std::unique_ptr<SgPolyShape> shape(reader.takeShape("Figure"));
    SgMorphLoaderDlg bridge(nullptr, false, shape->getGeometry(), figure);
    bridge.show();
    bridge.sourceList()->expandAll();
    EXPECT_EQ(cut(&bridge), "");
    auto *actions = bridge.findChild<QComboBox *>("FcBridgehAction");
    for (int i = 0; i < actions->count(); ++i) {
        actions->setCurrentIndex(i);
        EXPECT_EQ(cut(&bridge), "") << i;
    }
}

TEST_F(DialogFit, SaveOptionsAndCreateGroupDialogs) {
    SgConfigurationSaveOptionsDlg options(nullptr);
    options.show();
    EXPECT_EQ(cut(&options), "");
    SgCreatePropertyGroupDlg group(nullptr, "TICreatePropGroup");
    group.setGroup("Morphs/Morph Loader");
    group.show();
    EXPECT_EQ(cut(&group), "");
}

TEST_F(DialogFit, CreatePropertyDialogOfEveryType) {
    for (bool single : {false, true}) {
        for (int type = SgCreatePropertyDlg::FloatType;
             type <= SgCreatePropertyDlg::NumericNodeType; ++type) {
            SgCreatePropertyDlg dialog(nullptr, "Fit", single, type, false, true);
            dialog.show();
            EXPECT_EQ(cut(&dialog), "") << "type " << type << (single ? " (single)" : "");
        }
    }
}
