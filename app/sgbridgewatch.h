#pragma once

#include <QElapsedTimer>
#include <QJSValue>
#include <QObject>
#include <QPointer>
#include <QTimer>

class SgScriptRunner;

// Watches one bridge action for a headless script until the modeler's geometry has been dealt
// with or the modeler has quit, or a time-out passes. The host knows the plug-in's action only
// as a QObject, so it watches what it can see from outside: the action's signal
// returnHandled(QString) when it has one ("imported", "declined" or "refused"), else the scene's
// changes (an import updates the scene); and the action's poll timer (a child QTimer that the
// bridge stops when the link ends). The outcome is one of "imported", "declined", "refused",
// "quit", "timeout".
class SgBridgeWatch : public QObject {
    Q_OBJECT
public:
    // Starts watching at once; `resolve` and `callback` (both optional) are called with the
    // outcome; the runner keeps its event loop running until then.
    SgBridgeWatch(SgScriptRunner *runner, QObject *bridge, int timeoutMs, QJSValue resolve,
                  QJSValue callback, QObject *parent = nullptr);

public slots:
    // The scene reports a change: for a bridge that does not report its returns, the import
    // is done.
    void sceneChanged();
    // The bridge has dealt with a return.
    void returnHandled(const QString &outcome);

private:
    void check();
    void finish(const QString &outcome);

    SgScriptRunner *m_runner;
    QPointer<QObject> m_bridge;
    QJSValue m_resolve;
    QJSValue m_callback;
    QTimer m_ticker;
    QElapsedTimer m_clock;
    int m_timeoutMs;
    bool m_hearsOutcome = false;
    bool m_done = false;
};
