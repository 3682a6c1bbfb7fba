#pragma once

#include <QObject>
#include <QStringList>

class SgModalAnswerer;
class SgPluginHost;
class SgScriptApp;
class SgScriptRunner;
class SgScriptScene;
class SgScriptSelection;

// Headless mode: runs one script with the globals `app`, `scene` and `selection` and every
// plug-in class (so `new SgFacBridge()` works), answers modal questions through the script's
// handler, and echoes the host log and status line to stdout (status lines prefixed with
// "Status: ") so that the run can be followed. There is no main window.
class SgScriptHost : public QObject {
    Q_OBJECT
public:
    // `plugins` must outlive the host; `scriptArguments` become `app.arguments`.
    SgScriptHost(const SgPluginHost *plugins, const QStringList &scriptArguments,
                 QObject *parent = nullptr);
    ~SgScriptHost() override;

    // Runs the script file; returns the process exit status (0 success, non-zero failure).
    int run(const QString &path);

    SgScriptRunner *runner() const { return m_runner; }

private:
    SgScriptRunner *m_runner;
    SgModalAnswerer *m_answerer;
    SgScriptApp *m_app;
    SgScriptScene *m_scene;
    SgScriptSelection *m_selection;
};
