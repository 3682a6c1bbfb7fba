// The application window with the real plug-in: it opens offscreen, the plug-in's action sits
// in its category's menu and tool bar and its class reaches script engines, the tree drives the
// scene's selection, the property panel sets values, the preferences are kept, and a screenshot
// is kept as a test artefact.

#include "app/sgappwindow.h"
#include "app/sglogpane.h"
#include "app/sgmeshview.h"
#include "app/sgpluginhost.h"
#include "app/sgpreferencesdlg.h"
#include "app/sgpropertypanel.h"
#include "app/sgscenetree.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/app/sghelpmgr.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/io/sgscenefile.h"
#include "sgcore/morph/sgerclink.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/plugin/sgaction.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "tests/support/sgtestdrivers.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestmodal.h"
#include "tests/support/sgwidgetfit.h"

#include <QApplication>
#include <QCheckBox>
#include <QDialog>
#include <QDir>
#include <QDoubleSpinBox>
#include <QFile>
#include <QFileInfo>
#include <QJSEngine>
#include <QLineEdit>
#include <QMenu>
#include <QMenuBar>
#include <QMessageBox>
#include <QPushButton>
#include <QToolBar>

#include <memory>

#include <gtest/gtest.h>

namespace {

QMenu *submenu(const QList<QAction *> &actions, const QString &title) {
    for (QAction *action : actions)
        if (action->menu() && action->text() == title)
            return action->menu();
    return nullptr;
}

QAction *actionNamed(const SgAppWindow &window, const char *name) {
    return window.findChild<QAction *>(QLatin1String(name));
}

// A morph of the figure's first bone driven by a control property "Grow" on the figure, as the
// bridge makes them.
SgFloatProperty *addMorph(SgSkeleton *figure) {
    auto *control = new SgFloatProperty(QStringLiteral("Grow"));
    control->setPath(QStringLiteral("Morphs"));
    control->setMin(-1);
    control->setMax(1);
    control->setIsClamped(true);
    figure->addProperty(control);
    SgBone *bone = figure->getAllBones().front();
    auto *deltas = new SgMorphDeltas;
    deltas->setVertCount(bone->getObject()->getCurrentShape()->getGeometry()->getVertexCount());
    deltas->addDelta(0, SgVec3(0, 50, 0), true);
    auto *morph = new SgMorph(QStringLiteral("Grow"), deltas);
    morph->getValueChannel()->insertController(new SgERCLink(SgERCLink::DeltaAdd, control, 1, 0));
    bone->getObject()->addModifier(morph);
    figure->getScene()->update();
    return control;
}

} // namespace

TEST(AppWindow, ShowsThePluginActionTheSceneItsPropertiesAndThePreferences) {
    SgPluginHost plugins;
    ASSERT_EQ(plugins.loadFolder(QStringLiteral(FACBRIDGE_PLUGIN_DIR)), 1)
        << sgApp->getMessageSink()->logLines().join('\n').toStdString();
    ASSERT_EQ(plugins.actions().size(), 1);
    SgAction *bridge = plugins.actions().first();
    EXPECT_TRUE(sgApp->getHelpMgr()->isRegistered(bridge));
    // The poll slot is reachable through the meta-object, as the host's timers reach slots.
    EXPECT_TRUE(QMetaObject::invokeMethod(bridge, "checkSharedMap"));
    // Each script engine gets a constructor of bridges that C++ keeps.
    for (int i = 0; i < 2; ++i) {
        QJSEngine engine;
        plugins.registerClasses(&engine);
        std::unique_ptr<QObject> made(engine.evaluate("new SgFacBridge()").toQObject());
        ASSERT_NE(made, nullptr);
        EXPECT_TRUE(made->inherits("SgFacBridge"));
        EXPECT_EQ(QJSEngine::objectOwnership(made.get()), QJSEngine::CppOwnership);
    }

    SgAppWindow window;
    EXPECT_EQ(sgApp->getInterface(), &window);
    window.addPluginAction(bridge);
    window.show();

    // Menu path "&Scripts/Plug-ins", then the category "Facetor Bridge".
    QMenu *category = submenu(window.menuBar()->actions(), QStringLiteral("&Scripts"));
    for (const char *title : {"Plug-ins", "Facetor Bridge"}) {
        ASSERT_NE(category, nullptr) << title;
        category = submenu(category->actions(), QString::fromLatin1(title));
    }
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
    window.sceneTree()->setCurrentItem(item);
    EXPECT_EQ(scene->getPrimarySelection(), figure);
    EXPECT_EQ(scene->getSelectedNodes().size(), 1);
    // A selection made elsewhere shows in the tree.
    SgNode *box = scene->findNodeByLabel(QStringLiteral("Box"));
    scene->selectNode(box);
    EXPECT_TRUE(window.sceneTree()->itemOf(box)->isSelected());
    EXPECT_FALSE(item->isSelected());

    // A control property on the figure shows in the panel and is set from it.
    SgFloatProperty *slider = addMorph(static_cast<SgSkeleton *>(figure));
    scene->selectNode(figure);
    EXPECT_EQ(window.propertyPanel()->node(), figure);
    auto *spin =
        window.propertyPanel()->findChild<QDoubleSpinBox *>(QStringLiteral("SgPropertyValue_Grow"));
    ASSERT_NE(spin, nullptr);
    spin->setValue(0.5);
    EXPECT_FLOAT_EQ(slider->getValue(), 0.5f);
    spin->setValue(7.0); // clamped by the spin box's range
    EXPECT_FLOAT_EQ(slider->getValue(), 1.0f);

    // "&Tools" opens the "Target Importer" for the selection, in file mode.
    QAction *importer = actionNamed(window, "SgTargetImporterAction");
    EXPECT_TRUE(submenu(window.menuBar()->actions(), QStringLiteral("&Tools"))
                    ->actions()
                    .contains(importer));
    bool fileMode = false;
    sgTestAnswering({[&](QWidget *dialog) {
                        fileMode = dialog->findChild<QPushButton *>(
                                       QStringLiteral("MorphLoaderBrowseBtn")) != nullptr;
                        qobject_cast<QDialog *>(dialog)->reject();
                    }},
                    [&] { importer->trigger(); });
    EXPECT_TRUE(fileMode);

    // The host log reaches the log pane.
    sgApp->log(QStringLiteral("window smoke test"));
    EXPECT_TRUE(window.logPane()->toPlainText().contains(QStringLiteral("window smoke test")));

    // The picture at the default size, with a long property label in the panel: every menu
    // title, tree row and tool button fits.
    auto *named = new SgFloatProperty(QStringLiteral("BellySmootherLeft"));
    named->setLabel(QStringLiteral("Belly Smoother Left"));
    named->setPath(QStringLiteral("Morphs/Body"));
    figure->addProperty(named);
    scene->update();
    window.meshView()->frameAll();
    QApplication::processEvents();
    const QString artifacts = qEnvironmentVariable("SG_TEST_ARTIFACTS", QDir::tempPath());
    QDir().mkpath(artifacts);
    const QString shot = QDir(artifacts).filePath(QStringLiteral("scenara-main-window.png"));
    EXPECT_TRUE(window.grab().save(shot)) << shot.toStdString();
    EXPECT_EQ(sgCutTexts(&window), QStringList());
    scene->clear();

    // The preferences hold the modeler's path and the road returns take.
    SgTestModalAnswer answer(sgTestAs<SgPreferencesDlg>([](SgPreferencesDlg *dialog) {
        EXPECT_EQ(sgCutTexts(dialog), QStringList());
        dialog->installPathEdit()->setText(QStringLiteral("/opt/facetor"));
        dialog->bridgeToolsBox()->setChecked(true);
        dialog->accept();
    }));
    actionNamed(window, "SgPreferencesAction")->trigger();
    SgAppSettings settings;
    EXPECT_EQ(settings.getString(QStringLiteral("FacetorInstallPath")),
              QStringLiteral("/opt/facetor"));
    EXPECT_EQ(settings.getInt(QStringLiteral("FacetorBridgeTools")), 1);
    // Shown again as stored; "Cancel" keeps them.
    SgPreferencesDlg again(&window);
    EXPECT_EQ(again.installPathEdit()->text(), QStringLiteral("/opt/facetor"));
    EXPECT_TRUE(again.bridgeToolsBox()->isChecked());
    again.bridgeToolsBox()->setChecked(false);
    again.reject();
    EXPECT_EQ(settings.getInt(QStringLiteral("FacetorBridgeTools")), 1);
    settings.remove(QStringLiteral("FacetorBridgeTools"));
    settings.remove(QStringLiteral("FacetorInstallPath"));
}

TEST(AppWindow, SavesReopensDeletesAndNeverLosesChangesSilently) {
    SgAppWindow window;
    window.show();
    SgScene *scene = sgApp->getScene();
    ASSERT_TRUE(window.openScene(QStringLiteral(SG_EXAMPLES_DIR "/demo/scene.json"), true));
    EXPECT_FALSE(window.isSceneModified());
    EXPECT_EQ(window.windowTitle(), QStringLiteral("Scenara - scene.json"));
    auto *figure = static_cast<SgSkeleton *>(scene->findNodeByLabel(QStringLiteral("Blobby")));
    SgFloatProperty *grow = addMorph(figure);
    EXPECT_TRUE(window.isSceneModified());
    EXPECT_EQ(window.windowTitle(), QStringLiteral("Scenara - scene.json*"));

    // The view keeps its framing while the morph moves; "Frame Selection" reframes.
    SgMeshView *view = window.meshView();
    view->frameAll();
    const SgBox3 framed = view->framedBox();
    scene->selectNode(figure);
    window.propertyPanel()->setValue(grow, 1.0);
    QApplication::processEvents();
    EXPECT_EQ(view->framedBox().max, framed.max);
    actionNamed(window, "SgFrameSelectionAction")->trigger();
    EXPECT_GT(view->framedBox().max.y, framed.max.y); // the grown figure alone

    // Closing asks, in a box whose texts fit; "Cancel" keeps the window and the changes.
    QString question;
    EXPECT_FALSE(sgTestAnswering({sgTestAs<QMessageBox>([&question](QMessageBox *box) {
                                     question = box->text();
                                     EXPECT_EQ(sgCutTexts(box), QStringList());
                                     box->button(QMessageBox::Cancel)->click();
                                 })},
                                 [&] { return window.close(); }));
    EXPECT_TRUE(question.contains(QStringLiteral("scene.json has unsaved changes")));
    EXPECT_TRUE(window.isVisible());

    // "Save Scene As..." writes the scene and its geometry and makes it the current file.
    const QString saved = sgTestPath(QStringLiteral("session/work.json"));
    QDir().mkpath(sgTestPath(QStringLiteral("session")));
    sgTestAnswering({sgTestChooseFile(saved)},
                    [&] { actionNamed(window, "SgSaveSceneAsAction")->trigger(); });
    EXPECT_TRUE(QFile::exists(saved));
    EXPECT_TRUE(QFile::exists(sgTestPath(QStringLiteral("session/work-geometry/Blobby-hip.obj"))));
    EXPECT_FALSE(window.isSceneModified());
    EXPECT_EQ(window.windowTitle(), QStringLiteral("Scenara - work.json"));

    // Opening another scene with changes asks first; "Discard" goes on to the file dialog.
    window.propertyPanel()->setValue(grow, 0.25);
    sgTestAnswering({sgTestPressButton(QMessageBox::Discard), sgTestChooseFile(QString())},
                    [&] { actionNamed(window, "SgOpenSceneAction")->trigger(); });
    QApplication::processEvents();
    EXPECT_EQ(scene->findNodeByLabel(QStringLiteral("Blobby")), figure) << "cancelled: kept";

    // A file that does not load leaves the scene as it was.
    const QString bad = sgTestWriteFile(
        sgTestPath(QStringLiteral("session/bad.json")),
        R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "X", "geometry": "none.obj"}]})");
    const int nodes = scene->getNodeCount();
    EXPECT_FALSE(window.openScene(bad, true));
    EXPECT_EQ(scene->getNodeCount(), nodes);
    EXPECT_EQ(scene->findNodeByLabel(QStringLiteral("Blobby")), figure);
    EXPECT_EQ(window.scenePath(), QFileInfo(saved).absoluteFilePath());

    // The saved file reopens with the morph at its saved control value.
    ASSERT_TRUE(window.openScene(saved, true));
    figure = static_cast<SgSkeleton *>(scene->findNodeByLabel(QStringLiteral("Blobby")));
    auto *reopened = static_cast<SgFloatProperty *>(figure->findProperty(QStringLiteral("Grow")));
    ASSERT_NE(reopened, nullptr);
    EXPECT_EQ(reopened->getValue(), 1.0f);

    // Export writes the MTL beside the OBJ.
    SgNode *box = scene->findNodeByLabel(QStringLiteral("Box"));
    scene->selectNode(box);
    ASSERT_TRUE(window.exportSelection(sgTestPath(QStringLiteral("session/box.obj")), true));
    EXPECT_TRUE(sgTestReadFile(sgTestPath(QStringLiteral("session/box.mtl"))).contains("newmtl "));

    // "Delete" never removes a lone bone; a prop goes after the question, and the bone
    // selected with it stays.
    const int before = scene->getNodeCount();
    SgNode *hip = scene->findNodeByLabel(QStringLiteral("hip"));
    scene->selectNode(hip);
    EXPECT_EQ(window.deleteSelection(false), 0);
    scene->selectNode(box, true);
    ASSERT_EQ(window.propertyPanel()->node(), box);
    sgTestAnswering({sgTestPressButton(QMessageBox::Yes, nullptr, &question)},
                    [&] { actionNamed(window, "SgDeleteAction")->trigger(); });
    EXPECT_EQ(question, QStringLiteral("Delete Box?"));
    EXPECT_EQ(scene->findNodeByLabel(QStringLiteral("Box")), nullptr);
    EXPECT_EQ(window.sceneTree()->itemOf(box), nullptr);
    EXPECT_EQ(window.propertyPanel()->node(), hip); // the primary selection now
    EXPECT_EQ(scene->getNodeCount(), before - 1);
    EXPECT_TRUE(window.isSceneModified());

    // Changed again, closing with "Save" saves to the current file and closes.
    window.propertyPanel()->setValue(reopened, -0.5);
    EXPECT_TRUE(
        sgTestAnswering({sgTestPressButton(QMessageBox::Save)}, [&] { return window.close(); }));
    SgScene check;
    ASSERT_TRUE(SgSceneFile().load(saved, &check));
    SgNode *checked = check.findNodeByLabel(QStringLiteral("Blobby"));
    EXPECT_EQ(
        static_cast<SgFloatProperty *>(checked->findProperty(QStringLiteral("Grow")))->getValue(),
        -0.5f);
    // A figure goes with its bones.
    scene->selectNode(figure);
    scene->selectNode(hip, true);
    EXPECT_EQ(window.deleteSelection(false), 1);
    EXPECT_EQ(scene->getNodeCount(), 0);
}
