// Pictures of the Target Importer as a user sees it, kept as test artefacts (SG_TEST_ARTIFACTS,
// else the temporary folder): file mode with sources expanded, bridge mode, and the log page
// after a run.
#include "sgcore/app/sgapp.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgobjreader.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/loaderui/sgmorphloaderdlg.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"

#include <QApplication>
#include <QComboBox>
#include <QDir>
#include <QFile>
#include <QImage>
#include <QTextBrowser>
#include <gtest/gtest.h>

namespace {

const char *HeadObj = "v 0 2 0\nv 1 2 0\nv 0 3 0\nf 1 2 3\n";
const char *NeckObj = "v 0 1 0\nv 1 1 0\nv 0 2 0\nf 1 2 3\n";

SgObject *objectFrom(const char *obj, const QString &name) {
    SgObjReader reader;
    EXPECT_TRUE(reader.readBuffer(obj, qstrlen(obj), name));
    auto *object = new SgObject(name);
    object->addShape(reader.takeShape(name));
    return object;
}

// Saves the widget as it is drawn; true when a picture of its size was written.
bool saveShot(QWidget *widget, const QString &name) {
    QApplication::processEvents();
    const QString folder = qEnvironmentVariable("SG_TEST_ARTIFACTS", QDir::tempPath());
    QDir().mkpath(folder);
    const QImage image = widget->grab().toImage();
    return !image.isNull() && image.size() == widget->size() &&
           image.save(QDir(folder).filePath(name));
}

class TargetImporterPictures : public ::testing::Test {
protected:
    // The sample targets live in a folder of a stable name, so that the pictures show the same
    // paths on every run.
    QDir dir{QDir::tempPath() + QStringLiteral("/Targets")};
    SgScene *scene = sgApp->getScene();
    SgSkeleton *figure = new SgSkeleton("Figure");

    void SetUp() override {
        dir.mkpath(QStringLiteral("."));
        scene->clear();
        auto *neck = new SgBone("neck");
        auto *head = new SgBone("head");
        figure->addBone(neck);
        figure->addBone(head, neck);
        neck->setObject(objectFrom(NeckObj, "neck"));
        head->setObject(objectFrom(HeadObj, "head"));
        scene->addNode(figure);
        scene->selectNode(figure);
    }
    void TearDown() override { scene->clear(); }

    QString writeTarget(const QString &name, double lift) {
        const QString path = dir.filePath(name);
        QFile file(path);
        EXPECT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(QStringLiteral("v 0 %1 0\nv 1 2 0\nv 0 3 0\nv 0 1 0\nv 1 1 0\nv 0 2 0\n"
                                  "g head\nf 1 2 3\ng neck\nf 4 5 6\n")
                       .arg(2 + lift)
                       .toLatin1());
        return path;
    }
};

} // namespace

TEST_F(TargetImporterPictures, FileModeAndItsLogPage) {
    SgMorphLoaderDlg dialog(nullptr, true, nullptr, figure);
    dialog.findChild<QComboBox *>("MorphLoaderNodes")->setCurrentIndex(0);
    SgMorphSourceList *list = dialog.sourceList();
    list->addFiles({writeTarget("smile.obj", 0.25), writeTarget("blink.obj", 0.5),
                    writeTarget("frown.obj", -0.25)});
    ASSERT_EQ(list->topLevelItemCount(), 3);
    list->topLevelItem(0)->setExpanded(true);
    list->topLevelItem(1)->setExpanded(true);
    dialog.show(); // at its default size
    EXPECT_TRUE(saveShot(&dialog, "target-importer-file-mode.png"));

    dialog.accept();
    auto *log = dialog.findChild<QTextBrowser *>("MorphLoaderLog");
    ASSERT_TRUE(log->isVisible());
    EXPECT_TRUE(log->toPlainText().contains("Created morph successfully."));
    EXPECT_FALSE(log->toPlainText().contains("Warning"));
    EXPECT_TRUE(saveShot(&dialog, "target-importer-log.png"));
    dialog.accept();
    EXPECT_EQ(dialog.result(), QDialog::Accepted);
}

TEST_F(TargetImporterPictures, BridgeMode) {
    SgObjReader reader;
    ASSERT_TRUE(reader.readBuffer(HeadObj, qstrlen(HeadObj), "Figure"));
    SgPolyShape *shape = reader.takeShape("Figure");
    SgMorphLoaderDlg dialog(nullptr, false, shape->getGeometry(), figure);
    dialog.show(); // at its default size
    EXPECT_TRUE(saveShot(&dialog, "target-importer-bridge-mode.png"));
    dialog.reject();
    delete shape;
}
