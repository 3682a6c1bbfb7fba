// The application window with the real plug-in: it opens offscreen, the plug-in's action sits
// in its category's menu and tool bar, the tree drives the scene's selection, the property
// panel sets values, and a screenshot is kept as a test artefact.

#include "app/sgappwindow.h"
#include "app/sglogpane.h"
#include "app/sgpluginhost.h"
#include "app/sgpropertypanel.h"
#include "app/sgscenetree.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/plugin/sgaction.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QApplication>
#include <QDialog>
#include <QDir>
#include <QDoubleSpinBox>
#include <QMenu>
#include <QMenuBar>
#include <QPushButton>
#include <QTimer>
#include <QToolBar>

#include <gtest/gtest.h>

namespace {

QMenu *submenu(const QList<QAction *> &actions, const QString &title) {
    for (QAction *action : actions)
        if (action->menu() && action->text() == title)
            return action->menu();
    return nullptr;
}

} // namespace

TEST(AppWindow, ShowsThePluginActionTheSceneAndItsProperties) {
    SgPluginHost plugins;
    ASSERT_EQ(plugins.loadFolder(QStringLiteral(FACBRIDGE_PLUGIN_DIR)), 1)
        << sgApp->getMessageSink()->logLines().join('\n').toStdString();
    ASSERT_EQ(plugins.actions().size(), 1);
    SgAction *bridge = plugins.actions().first();
    EXPECT_EQ(bridge->text(), QStringLiteral("Send to Facetor..."));

    SgAppWindow window;
    EXPECT_EQ(sgApp->getInterface(), &window);
    window.addPluginAction(bridge);
    window.show();
    QApplication::processEvents();

    // Menu path "&Scripts/Plug-ins", then the category "Facetor Bridge".
    QMenu *scripts = submenu(window.menuBar()->actions(), QStringLiteral("&Scripts"));
    ASSERT_NE(scripts, nullptr);
    QMenu *plugIns = submenu(scripts->actions(), QStringLiteral("Plug-ins"));
    ASSERT_NE(plugIns, nullptr);
    QMenu *category = submenu(plugIns->actions(), QStringLiteral("Facetor Bridge"));
    ASSERT_NE(category, nullptr);
    EXPECT_TRUE(category->actions().contains(bridge));
    auto *bar = window.findChild<QToolBar *>(QStringLiteral("SgToolBar_Facetor Bridge"));
    ASSERT_NE(bar, nullptr);
    EXPECT_TRUE(bar->actions().contains(bridge));

    // The example scene in the tree; picking the figure selects it in the scene.
    ASSERT_TRUE(window.openScene(QStringLiteral(SG_EXAMPLES_DIR "/demo/scene.json"), true));
    SgScene *scene = sgApp->getScene();
    SgNode *figure = scene->findNodeByLabel(QStringLiteral("Blobby"));
    ASSERT_NE(figure, nullptr);
    QTreeWidgetItem *item = window.sceneTree()->itemOf(figure);
    ASSERT_NE(item, nullptr);
    EXPECT_EQ(item->childCount(), 1); // hip, with chest and head below it
    window.sceneTree()->setCurrentItem(item);
    EXPECT_EQ(scene->getPrimarySelection(), figure);
    EXPECT_EQ(scene->getSelectedNodes().size(), 1);
    // A selection made elsewhere shows in the tree.
    scene->selectNode(scene->findNodeByLabel(QStringLiteral("Box")));
    EXPECT_TRUE(
        window.sceneTree()->itemOf(scene->findNodeByLabel(QStringLiteral("Box")))->isSelected());
    EXPECT_FALSE(item->isSelected());

    // A control property on the figure shows in the panel and is set from it.
    auto *slider = new SgFloatProperty(QStringLiteral("Grow"));
    slider->setMin(-1);
    slider->setMax(1);
    slider->setIsClamped(true);
    ASSERT_EQ(figure->addProperty(slider), 0);
    scene->selectNode(figure);
    scene->update();
    EXPECT_EQ(window.propertyPanel()->node(), figure);
    auto *spin =
        window.propertyPanel()->findChild<QDoubleSpinBox *>(QStringLiteral("SgPropertyValue_Grow"));
    ASSERT_NE(spin, nullptr);
    spin->setValue(0.5);
    EXPECT_FLOAT_EQ(slider->getValue(), 0.5f);
    spin->setValue(7.0); // clamped by the spin box's range
    EXPECT_FLOAT_EQ(slider->getValue(), 1.0f);

    // The host log reaches the log pane.
    sgApp->log(QStringLiteral("window smoke test"));
    EXPECT_TRUE(window.logPane()->toPlainText().contains(QStringLiteral("window smoke test")));

    const QString artifacts = qEnvironmentVariable("SG_TEST_ARTIFACTS", QDir::tempPath());
    QDir().mkpath(artifacts);
    const QString shot = QDir(artifacts).filePath(QStringLiteral("scenara-window.png"));
    EXPECT_TRUE(window.grab().save(shot)) << shot.toStdString();
    scene->clear();
}

TEST(AppWindow, ToolsMenuOpensTheTargetImporterInFileMode) {
    SgAppWindow window;
    SgScene *scene = sgApp->getScene();
    auto *figure = new SgSkeleton(QStringLiteral("Blobby"));
    scene->addNode(figure);
    scene->selectNode(figure);

    QMenu *tools = submenu(window.menuBar()->actions(), QStringLiteral("&Tools"));
    ASSERT_NE(tools, nullptr);
    QAction *importer = window.findChild<QAction *>(QStringLiteral("SgTargetImporterAction"));
    ASSERT_NE(importer, nullptr);
    EXPECT_TRUE(tools->actions().contains(importer));
    EXPECT_EQ(importer->text(), QStringLiteral("Target Importer..."));

    QString title;
    bool fileMode = false;
    QTimer answer;
    QObject::connect(&answer, &QTimer::timeout, [&] {
        auto *dialog = qobject_cast<QDialog *>(QApplication::activeModalWidget());
        if (!dialog)
            return;
        answer.stop();
        title = dialog->windowTitle();
        fileMode =
            dialog->findChild<QPushButton *>(QStringLiteral("MorphLoaderBrowseBtn")) != nullptr;
        dialog->reject();
    });
    answer.start(10);
    importer->trigger();
    EXPECT_FALSE(answer.isActive()) << "the dialog never opened";
    EXPECT_EQ(title, QStringLiteral("Target Importer"));
    EXPECT_TRUE(fileMode);
    scene->clear();
}
