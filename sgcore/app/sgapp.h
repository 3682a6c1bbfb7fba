#pragma once

#include <QMainWindow>
#include <QObject>
#include <QPointer>
#include <QStringList>

#include <memory>

class QWidget;
class SgHelpMgr;
class SgImageMgr;
class SgImportMgr;
class SgMessageSink;
class SgScene;

// The host application: one per process, reachable through the global `sgApp` (set by the
// constructor, cleared by the destructor). It holds the scene, the managers, the paths and the
// command arguments, and routes the log, the status line and progress to its message sink.
// A QApplication must exist before it is made.
class SgApp : public QObject {
    Q_OBJECT
public:
    // `arguments` are the command arguments (without the program name) that plug-ins read.
    explicit SgApp(const QStringList &arguments = QStringList(), QObject *parent = nullptr);
    ~SgApp() override;

    // The parent for dialogs and message boxes: the main window when there is one, else the
    // active window, else null.
    QWidget *getDialogParent() const;
    // The main window, or null in headless use.
    QMainWindow *getInterface() const { return m_mainWindow; }
    void setInterface(QMainWindow *mainWindow) { m_mainWindow = mainWindow; }

    SgScene *getScene() const { return m_scene; }
    SgHelpMgr *getHelpMgr() const { return m_helpMgr.get(); }
    SgImportMgr *getImportMgr() const { return m_importMgr.get(); }
    SgImageMgr *getImageMgr() const { return m_imageMgr.get(); }
    // Where the log, status line and progress go (tests read them back here).
    SgMessageSink *getMessageSink() const { return m_sink; }

    // The folder for temporary files, without a trailing slash (default: the system's
    // temporary folder followed by "/scenara"); made on first request if missing.
    QString getTempPath() const;
    void setTempPath(const QString &path) { m_tempPath = path; }
    // The user's documents folder for the application (default: the system's documents
    // folder followed by "/Scenara"), without a trailing slash.
    QString getDocumentsPath() const;
    void setDocumentsPath(const QString &path) { m_documentsPath = path; }
    QStringList getCommandArguments() const { return m_arguments; }
    void setCommandArguments(const QStringList &arguments) { m_arguments = arguments; }

    // Appends one line to the application log.
    void log(const QString &text);
    // Shows `text` on the status line; with `immediate` the display is brought up to date at
    // once instead of on the next event loop pass.
    void statusLine(const QString &text, bool immediate = false);
    // Starts a progress run of `total` steps with a caption; `canCancel` offers a cancel
    // button, `showDialog` asks for a progress dialog rather than the status bar. A run still
    // active is finished first.
    void startProgress(const QString &text, int total, bool canCancel = false,
                       bool showDialog = false);
    // Advances the active run by `steps`; false when no run is active.
    bool stepProgress(int steps = 1);
    void finishProgress();
    bool isProgressActive() const;

    // Emit `starting()` (the application has finished starting up) and `closing()` (it is
    // about to shut down). The application's main code calls them.
    void emitStarting() { emit starting(); }
    void emitClosing() { emit closing(); }

signals:
    void starting();
    void closing();

private:
    QStringList m_arguments;
    QPointer<QMainWindow> m_mainWindow;
    SgScene *m_scene = nullptr;
    SgMessageSink *m_sink = nullptr;
    std::unique_ptr<SgHelpMgr> m_helpMgr;
    std::unique_ptr<SgImportMgr> m_importMgr;
    std::unique_ptr<SgImageMgr> m_imageMgr;
    QString m_tempPath;
    QString m_documentsPath;
};

// The application instance (null while none exists).
extern SgApp *sgApp;
