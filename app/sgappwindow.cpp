#include "app/sgappwindow.h"

#include "app/sglogpane.h"
#include "app/sgmeshview.h"
#include "app/sgobjexport.h"
#include "app/sgpreferencesdlg.h"
#include "app/sgprogressview.h"
#include "app/sgpropertypanel.h"
#include "app/sgscenetree.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/io/sgscenefile.h"
#include "sgcore/plugin/sgaction.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"
#include "sharedsource/loaderui/sgmorphloaderdlg.h"

#include <QCloseEvent>
#include <QDockWidget>
#include <QFileDialog>
#include <QFileInfo>
#include <QMenuBar>
#include <QMessageBox>
#include <QStatusBar>
#include <QToolBar>

#include <algorithm>

SgAppWindow::SgAppWindow(QWidget *parent) : QMainWindow(parent) {
    setObjectName(QStringLiteral("SgAppWindow"));
    setWindowTitle(QStringLiteral("Scenara"));
    SgScene *scene = sgApp->getScene();

    m_view = new SgMeshView(scene, this);
    setCentralWidget(m_view);

    m_tree = new SgSceneTree(scene, this);
    auto *treeDock = new QDockWidget(tr("Scene"), this);
    treeDock->setObjectName(QStringLiteral("SgSceneDock"));
    treeDock->setWidget(m_tree);
    addDockWidget(Qt::LeftDockWidgetArea, treeDock);

    m_panel = new SgPropertyPanel(this);
    auto *panelDock = new QDockWidget(tr("Properties"), this);
    panelDock->setObjectName(QStringLiteral("SgPropertyDock"));
    panelDock->setWidget(m_panel);
    addDockWidget(Qt::RightDockWidgetArea, panelDock);

    m_log = new SgLogPane(this);
    auto *logDock = new QDockWidget(tr("Log"), this);
    logDock->setObjectName(QStringLiteral("SgLogDock"));
    logDock->setWidget(m_log);
    addDockWidget(Qt::BottomDockWidgetArea, logDock);

    SgMessageSink *sink = sgApp->getMessageSink();
    for (const QString &line : sink->logLines())
        m_log->appendLine(line);
    connect(sink, &SgMessageSink::logged, m_log, &SgLogPane::appendLine);
    connect(sink, &SgMessageSink::statusChanged, this, [this](const QString &text, bool now) {
        statusBar()->showMessage(text);
        if (now)
            statusBar()->repaint();
    });
    m_progress = new SgProgressView(sink, this);

    connect(scene, &SgScene::selectionChanged, this, &SgAppWindow::primaryChanged);
    connect(scene, &SgScene::nodeRemoved, this, [this](SgNode *node) {
        if (node == m_panelNode)
            primaryChanged();
    });
    connect(scene, &SgScene::sceneUpdated, m_panel, &SgPropertyPanel::refresh);
    connect(m_panel, &SgPropertyPanel::valueEdited, m_view, qOverload<>(&QWidget::update));
    for (auto signal : {&SgScene::nodeAdded, &SgScene::nodeRemoved})
        connect(scene, signal, this, &SgAppWindow::markModified);
    connect(scene, &SgScene::sceneUpdated, this, &SgAppWindow::markModified);
    connect(m_panel, &SgPropertyPanel::valueEdited, this, &SgAppWindow::markModified);

    buildMenus();
    statusBar()->showMessage(tr("Ready"));
    // Fits a 1280 x 800 screen with room for a task bar and the window frame.
    resize(1180, 680);
    resizeDocks({treeDock, panelDock}, {210, 300}, Qt::Horizontal);
    resizeDocks({logDock}, {150}, Qt::Vertical);
    updateTitle();
    sgApp->setInterface(this);
}

SgAppWindow::~SgAppWindow() {
    m_panel->showNode(nullptr);
    if (sgApp && sgApp->getInterface() == this)
        sgApp->setInterface(nullptr);
}

void SgAppWindow::buildMenus() {
    QMenu *file = menuAt(tr("&File"));
    QAction *open = file->addAction(tr("Open Scene..."), this, &SgAppWindow::openSceneDialog);
    open->setObjectName(QStringLiteral("SgOpenSceneAction"));
    open->setShortcut(QKeySequence::Open);
    QAction *save = file->addAction(tr("Save Scene"), this, [this] { saveScene(); });
    save->setObjectName(QStringLiteral("SgSaveSceneAction"));
    save->setShortcut(QKeySequence::Save);
    QAction *saveAs =
        file->addAction(tr("Save Scene As..."), this, &SgAppWindow::saveSceneAsDialog);
    saveAs->setObjectName(QStringLiteral("SgSaveSceneAsAction"));
    saveAs->setShortcut(QKeySequence::SaveAs);
    QAction *exportObj = file->addAction(tr("Export OBJ..."), this, &SgAppWindow::exportObjDialog);
    exportObj->setObjectName(QStringLiteral("SgExportObjAction"));
    exportObj->setShortcut(QKeySequence(Qt::CTRL | Qt::Key_E));
    file->addSeparator();
    QAction *preferences =
        file->addAction(tr("Preferences..."), this, &SgAppWindow::preferencesDialog);
    preferences->setObjectName(QStringLiteral("SgPreferencesAction"));
    file->addSeparator();
    QAction *quit = file->addAction(tr("Quit"), this, &QWidget::close);
    quit->setShortcut(QKeySequence::Quit);

    QMenu *edit = menuAt(tr("&Edit"));
    QAction *remove = edit->addAction(tr("Delete"), this, [this] { deleteSelection(); });
    remove->setObjectName(QStringLiteral("SgDeleteAction"));
    remove->setShortcut(QKeySequence::Delete);

    QMenu *view = menuAt(tr("&View"));
    QAction *frame = view->addAction(tr("Frame Selection"), m_view, &SgMeshView::frameSelection);
    frame->setObjectName(QStringLiteral("SgFrameSelectionAction"));
    frame->setShortcut(QKeySequence(Qt::Key_F));
    QAction *frameAll = view->addAction(tr("Frame All"), m_view, &SgMeshView::frameAll);
    frameAll->setObjectName(QStringLiteral("SgFrameAllAction"));
    frameAll->setShortcut(QKeySequence(Qt::Key_A));

    QMenu *tools = menuAt(tr("&Tools"));
    QAction *importer =
        tools->addAction(tr("Target Importer..."), this, &SgAppWindow::openTargetImporter);
    importer->setObjectName(QStringLiteral("SgTargetImporterAction"));
}

QMenu *SgAppWindow::menuAt(const QString &path) {
    QMenu *menu = nullptr;
    for (const QString &title : path.split(QLatin1Char('/'), Qt::SkipEmptyParts)) {
        const QList<QAction *> siblings = menu ? menu->actions() : menuBar()->actions();
        QMenu *found = nullptr;
        for (QAction *action : siblings)
            if (action->menu() && action->text() == title)
                found = action->menu();
        if (found == nullptr)
            found = menu ? menu->addMenu(title) : menuBar()->addMenu(title);
        menu = found;
    }
    return menu;
}

void SgAppWindow::addPluginAction(SgAction *action) {
    const QString category = action->getActionGroup();
    QString menuPath = action->getDefaultMenuPath();
    if (menuPath.isEmpty())
        menuPath = QStringLiteral("&Scripts/Plug-ins");
    QMenu *menu = menuAt(menuPath + QLatin1Char('/') + category);
    menu->addAction(action);

    const QString barName =
        action->getDefaultToolBar().isEmpty() ? category : action->getDefaultToolBar();
    auto *bar = findChild<QToolBar *>(QStringLiteral("SgToolBar_") + barName);
    if (bar == nullptr) {
        bar = addToolBar(barName);
        bar->setObjectName(QStringLiteral("SgToolBar_") + barName);
    }
    bar->addAction(action);
    if (!action->getDefaultAccel().isEmpty())
        action->setShortcut(QKeySequence(action->getDefaultAccel()));
    action->init();
}

bool SgAppWindow::openScene(const QString &path, bool quiet) {
    // The file is read into a scratch scene first: one that does not load leaves the user's
    // scene as it was.
    SgScene loaded;
    SgSceneFile file;
    if (!file.load(path, &loaded)) {
        sgApp->log(QStringLiteral("Could not open the scene: %1").arg(file.getErrorString()));
        if (!quiet)
            QMessageBox::warning(this, tr("Open Scene"), file.getErrorString(), QMessageBox::Ok);
        return false;
    }
    SgScene *scene = sgApp->getScene();
    m_panel->showNode(nullptr);
    m_panelNode = nullptr;
    scene->clear();
    scene->takeNodesFrom(loaded);
    sgApp->log(QStringLiteral("Opened %1 (%2 nodes).")
                   .arg(QFileInfo(path).fileName())
                   .arg(file.getAddedNodeCount()));
    sgApp->statusLine(tr("Opened %1").arg(QFileInfo(path).fileName()));
    scene->update();
    m_scenePath = QFileInfo(path).absoluteFilePath();
    setModified(false);
    m_view->frameAll();
    return true;
}

bool SgAppWindow::saveScene(const QString &path, bool quiet) {
    const QString target = path.isEmpty() ? m_scenePath : path;
    if (target.isEmpty())
        return quiet ? false : saveSceneAsDialog();
    SgSceneFile file;
    if (!file.save(target, sgApp->getScene())) {
        sgApp->log(QStringLiteral("Could not save the scene: %1").arg(file.getErrorString()));
        if (!quiet)
            QMessageBox::warning(this, tr("Save Scene"), file.getErrorString(), QMessageBox::Ok);
        return false;
    }
    sgApp->log(QStringLiteral("Saved %1 (%2 nodes).")
                   .arg(QFileInfo(target).fileName())
                   .arg(sgApp->getScene()->getNodeCount()));
    sgApp->statusLine(tr("Saved %1").arg(QFileInfo(target).fileName()));
    m_scenePath = QFileInfo(target).absoluteFilePath();
    setModified(false);
    return true;
}

bool SgAppWindow::saveSceneAsDialog() {
    SgAppSettings settings(QStringLiteral("Scenara"));
    const QString start =
        m_scenePath.isEmpty() ? settings.getString(QStringLiteral("SceneDirectory")) : m_scenePath;
    QString path = QFileDialog::getSaveFileName(this, tr("Save Scene As"), start,
                                                tr("Scenes (*.json);;All files (*)"));
    if (path.isEmpty())
        return false;
    if (QFileInfo(path).suffix().isEmpty())
        path += QStringLiteral(".json");
    settings.setString(QStringLiteral("SceneDirectory"), QFileInfo(path).absolutePath());
    return saveScene(path);
}

bool SgAppWindow::maybeSaveChanges() {
    if (!m_modified)
        return true;
    const QString name =
        m_scenePath.isEmpty() ? tr("The scene") : QFileInfo(m_scenePath).fileName();
    const auto answer = QMessageBox::question(
        this, tr("Unsaved Changes"),
        tr("%1 has unsaved changes.\nDo you want to save them?").arg(name),
        QMessageBox::Save | QMessageBox::Discard | QMessageBox::Cancel, QMessageBox::Save);
    if (answer == QMessageBox::Save)
        return saveScene();
    return answer == QMessageBox::Discard;
}

void SgAppWindow::closeEvent(QCloseEvent *event) {
    if (maybeSaveChanges())
        event->accept();
    else
        event->ignore();
}

int SgAppWindow::deleteSelection(bool ask) {
    SgScene *scene = sgApp->getScene();
    const SgNodeList selected = scene->getSelectedNodes();
    auto chosen = [&](const SgNode *node) {
        return std::find(selected.begin(), selected.end(), node) != selected.end() &&
               dynamic_cast<const SgBone *>(node) == nullptr;
    };
    // A node that goes with a chosen ancestor is not removed a second time.
    SgNodeList doomed;
    QStringList labels;
    for (SgNode *node : selected) {
        if (!chosen(node))
            continue;
        bool underChosen = false;
        for (SgNode *up = node->getParent(); up && !underChosen; up = up->getParent())
            underChosen = chosen(up);
        if (!underChosen) {
            doomed.push_back(node);
            labels.append(node->getLabel());
        }
    }
    if (doomed.empty()) {
        sgApp->statusLine(tr("Select a prop or a figure to delete (a bone goes with its figure)."));
        return 0;
    }
    if (ask && QMessageBox::question(sgApp->getDialogParent(), tr("Delete"),
                                     tr("Delete %1?").arg(labels.join(QStringLiteral(", "))),
                                     QMessageBox::Yes | QMessageBox::No,
                                     QMessageBox::Yes) != QMessageBox::Yes)
        return 0;
    for (SgNode *node : doomed)
        scene->removeNode(node);
    sgApp->log(QStringLiteral("Deleted %1.").arg(labels.join(QStringLiteral(", "))));
    scene->update();
    return int(doomed.size());
}

void SgAppWindow::preferencesDialog() {
    SgPreferencesDlg dialog(this);
    dialog.exec();
}

void SgAppWindow::markModified() {
    setModified(true);
}

void SgAppWindow::setModified(bool modified) {
    if (m_modified == modified)
        return;
    m_modified = modified;
    updateTitle();
}

void SgAppWindow::updateTitle() {
    const QString name = m_scenePath.isEmpty() ? tr("Untitled") : QFileInfo(m_scenePath).fileName();
    setWindowTitle(
        QStringLiteral("Scenara - %1%2").arg(name, m_modified ? QStringLiteral("*") : QString()));
}

bool SgAppWindow::exportSelection(const QString &path, bool quiet) {
    QString error;
    SgNode *node = sgApp->getScene()->getPrimarySelection();
    if (!SgObjExport::exportNode(node, path, &error)) {
        sgApp->log(error);
        if (!quiet)
            QMessageBox::warning(this, tr("Export OBJ"), error, QMessageBox::Ok);
        return false;
    }
    sgApp->log(QStringLiteral("Exported %1 to %2.").arg(node->getLabel(), path));
    return true;
}

void SgAppWindow::openSceneDialog() {
    if (!maybeSaveChanges())
        return;
    SgAppSettings settings(QStringLiteral("Scenara"));
    const QString path = QFileDialog::getOpenFileName(
        this, tr("Open Scene"), settings.getString(QStringLiteral("SceneDirectory")),
        tr("Scenes (*.json);;All files (*)"));
    if (path.isEmpty())
        return;
    settings.setString(QStringLiteral("SceneDirectory"), QFileInfo(path).absolutePath());
    openScene(path);
}

void SgAppWindow::exportObjDialog() {
    SgNode *node = sgApp->getScene()->getPrimarySelection();
    if (node == nullptr) {
        QMessageBox::warning(this, tr("Export OBJ"), tr("Select a node to export first."),
                             QMessageBox::Ok);
        return;
    }
    const QString path = QFileDialog::getSaveFileName(this, tr("Export OBJ"),
                                                      node->getLabel() + QStringLiteral(".obj"),
                                                      tr("Wavefront OBJ (*.obj)"));
    if (!path.isEmpty())
        exportSelection(path);
}

void SgAppWindow::openTargetImporter() {
    SgScene *scene = sgApp->getScene();
    SgMorphLoaderDlg dialog(this, true, nullptr, scene->getPrimarySelection());
    dialog.exec();
    // The run may have added morphs and control properties to the selection.
    scene->update();
}

void SgAppWindow::primaryChanged() {
    SgNode *primary = sgApp->getScene()->getPrimarySelection();
    if (primary == m_panelNode)
        return;
    m_panelNode = primary;
    m_panel->showNode(primary);
}
