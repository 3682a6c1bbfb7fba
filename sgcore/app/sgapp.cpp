#include "sgcore/app/sgapp.h"

#include "sgcore/app/sghelpmgr.h"
#include "sgcore/app/sgimagemgr.h"
#include "sgcore/app/sgimportmgr.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/widgets/sgstyle.h"

#include <QApplication>
#include <QDir>
#include <QMainWindow>
#include <QStandardPaths>

SgApp *sgApp = nullptr;

SgApp::SgApp(const QStringList &arguments, QObject *parent)
    : QObject(parent), m_arguments(arguments), m_scene(new SgScene(this)),
      m_sink(new SgMessageSink(this)), m_helpMgr(std::make_unique<SgHelpMgr>()),
      m_importMgr(std::make_unique<SgImportMgr>()), m_imageMgr(std::make_unique<SgImageMgr>()) {
    sgApp = this;
    // The host's widgets are drawn in the host's style (its pixmaps and dialog spacing).
    if (qobject_cast<QApplication *>(QCoreApplication::instance()) &&
        !qobject_cast<SgStyle *>(QApplication::style()))
        QApplication::setStyle(new SgStyle);
}

SgApp::~SgApp() {
    // Nodes may refer to textures and importers; the scene goes first.
    delete m_scene;
    m_scene = nullptr;
    if (sgApp == this) {
        sgApp = nullptr;
    }
}

QWidget *SgApp::getDialogParent() const {
    if (m_mainWindow) {
        return m_mainWindow.data();
    }
    return QApplication::activeWindow();
}

QString SgApp::getTempPath() const {
    QString path = m_tempPath;
    if (path.isEmpty()) {
        path = QDir::tempPath() + QStringLiteral("/scenara");
    }
    QDir().mkpath(path);
    return QDir::cleanPath(path);
}

QString SgApp::getDocumentsPath() const {
    if (!m_documentsPath.isEmpty()) {
        return QDir::cleanPath(m_documentsPath);
    }
    return QStandardPaths::writableLocation(QStandardPaths::DocumentsLocation) +
           QStringLiteral("/Scenara");
}

void SgApp::log(const QString &text) {
    m_sink->addLog(text);
}

void SgApp::statusLine(const QString &text, bool immediate) {
    m_sink->addStatus(text, immediate);
}

void SgApp::startProgress(const QString &text, int total, bool canCancel, bool showDialog) {
    m_sink->startProgress(text, total, canCancel, showDialog);
}

bool SgApp::stepProgress(int steps) {
    return m_sink->stepProgress(steps);
}

void SgApp::finishProgress() {
    m_sink->finishProgress();
}

bool SgApp::isProgressActive() const {
    return m_sink->isProgressActive();
}
