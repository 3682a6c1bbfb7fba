#pragma once

#include <QJSEngine>
#include <QJSValue>
#include <QObject>
#include <QString>

// Runs one JavaScript file in the host's script engine (headless mode). The script may start
// waits (see `beginWait`): the runner keeps the Qt event loop running until every wait has
// ended, so that timers (the bridge's poll, for one) keep firing while the script waits.
class SgScriptRunner : public QObject {
    Q_OBJECT
public:
    explicit SgScriptRunner(QObject *parent = nullptr);
    ~SgScriptRunner() override;

    // The engine the script runs in; callers register globals and classes on it before `run`.
    QJSEngine *engine() { return &m_engine; }

    // Makes `object` (owned by C++, never collected by the engine) a global named `name`.
    void addGlobal(const QString &name, QObject *object);

    // Evaluates the file, then runs the event loop until no wait is pending. Returns the process
    // exit status: 0 when the script and every callback finished without an error, 1 when the
    // file could not be read, the script threw, a callback threw or `fail` was called; the reason
    // goes to stderr as "file:line: message".
    int run(const QString &path);

    // Registers a pending wait; the event loop keeps running until each has been ended.
    void beginWait();
    // Ends one pending wait started with `beginWait`.
    void endWait();

    // Calls a script function with `args`; an exception thrown by it counts as a script failure.
    void callBack(QJSValue function, const QJSValueList &args);

    // Marks the run as failed with `message`; the run still lets pending waits end.
    void fail(const QString &message);

    // Asks the run to end with `status` once the current step returns, pending waits or not.
    void exit(int status);

    // Whether the run has failed so far.
    bool failed() const { return m_failed; }

private:
    // Turns a script error value into "file:line: message".
    QString describeError(const QJSValue &error) const;
    void quitWhenIdle();

    QJSEngine m_engine;
    QString m_path;
    int m_pending = 0;
    bool m_failed = false;
    bool m_exitRequested = false;
    int m_exitStatus = 0;
    bool m_looping = false;
};
