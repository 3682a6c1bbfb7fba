#pragma once

#include <QJSValue>
#include <QObject>
#include <QStringList>
#include <QVariant>

class SgModalAnswerer;
class SgNode;
class SgPluginHost;
class SgScriptRunner;

// The global `app` of a headless script: the command arguments, printing, the plug-ins'
// actions, waiting for the bridge, OBJ export, application settings and the answers to modal
// questions.
class SgScriptApp : public QObject {
    Q_OBJECT
    // The arguments after "--" on the command line.
    Q_PROPERTY(QStringList arguments READ arguments CONSTANT)
    // Every command argument (what plug-ins see through getCommandArguments).
    Q_PROPERTY(QStringList hostArguments READ hostArguments CONSTANT)
public:
    SgScriptApp(SgScriptRunner *runner, SgModalAnswerer *answerer, const SgPluginHost *plugins,
                const QStringList &arguments, QObject *parent = nullptr);

    QStringList arguments() const { return m_arguments; }
    QStringList hostArguments() const;

    // Writes `text` and a newline to stdout.
    Q_INVOKABLE void print(const QString &text) const;
    // The plug-in action whose text (or object or class name) is `name`, or null.
    Q_INVOKABLE QObject *action(const QString &name) const;
    // The texts of every plug-in action.
    Q_INVOKABLE QStringList actionNames() const;
    // Waits for a bridge action until the modeler's geometry has been dealt with, the link has
    // ended, or `timeoutMs` passed (negative: no limit). Returns a promise of the outcome
    // ("imported", "declined" (the user kept the scene as it was), "refused" (the return was
    // unusable), "quit" or "timeout"); `callback`, when given, is called with it as well, and
    // an exception it throws fails the script. The event loop runs while waiting. A bridge
    // made by the script is adopted by the host (destroyed when the run ends).
    Q_INVOKABLE QJSValue waitForBridge(QObject *bridge, int timeoutMs = 60000,
                                       const QJSValue &callback = QJSValue());
    // Calls `callback` after `ms` milliseconds with the event loop running meanwhile.
    Q_INVOKABLE void later(int ms, const QJSValue &callback);
    // Writes the current geometry of the node labelled `label` as OBJ; false (with a log line)
    // when there is no such node or nothing to write.
    Q_INVOKABLE bool exportObj(const QString &label, const QString &path) const;
    // Application settings of the default group.
    Q_INVOKABLE QVariant setting(const QString &key,
                                 const QVariant &defaultValue = QVariant()) const;
    Q_INVOKABLE void setSetting(const QString &key, const QVariant &value) const;
    // The function asked to answer modal questions: (title, text) -> button text.
    Q_INVOKABLE void onQuestion(const QJSValue &handler);
    // The host log so far, oldest first.
    Q_INVOKABLE QStringList logLines() const;
    // The host's temporary folder.
    Q_INVOKABLE QString tempPath() const;
    // Makes the run fail with `message` (exit status 1).
    Q_INVOKABLE void fail(const QString &message) const;
    // Ends the run with `status` once the current callback returns.
    Q_INVOKABLE void exit(int status) const;
    // Hands a script-made object to the host, which destroys it when the run ends (the
    // plug-ins' own actions stay with their loaders).
    Q_INVOKABLE void adopt(QObject *object);

private:
    SgScriptRunner *m_runner;
    SgModalAnswerer *m_answerer;
    const SgPluginHost *m_plugins;
    QStringList m_arguments;
};

// The global `scene` of a headless script: loading scene files and reading and setting what
// the scene holds. Nodes are named by label (the first in scene order wins).
class SgScriptScene : public QObject {
    Q_OBJECT
public:
    explicit SgScriptScene(QObject *parent = nullptr);

    // Replaces the scene with the file's nodes; false (reason in `lastError`) on failure.
    Q_INVOKABLE bool load(const QString &path);
    // Saves the scene as a scene file (geometry beside it); false (reason in `lastError`).
    Q_INVOKABLE bool save(const QString &path);
    Q_INVOKABLE QString lastError() const { return m_error; }
    // Every node's label in scene order, and the labels of the figures.
    Q_INVOKABLE QStringList labels() const;
    Q_INVOKABLE QStringList figures() const;
    // A description of the node labelled `label` (null when none): label, name, kind
    // ("figure", "bone", "prop" or "node"), parent, hidden, vertexCount, origin, bones (for a
    // figure), properties (each numeric property of the node, its object and its modifiers:
    // name, label, owner, value, min, max, clamped, path, hidden, controllers) and modifiers
    // (name, label, morph; for a morph also its value channel's label, value, hidden flag,
    // path and controller count, and its delta count).
    Q_INVOKABLE QJSValue node(const QString &label) const;
    // Sets the numeric property named (or labelled) `property` on the node, its object or one
    // of its modifiers; false when there is none.
    Q_INVOKABLE bool setValue(const QString &label, const QString &property, double value) const;
    // The value a numeric property reads now (controllers applied); NaN when there is none.
    Q_INVOKABLE double value(const QString &label, const QString &property) const;
    // Tells views the scene changed.
    Q_INVOKABLE void update() const;

private:
    QString m_error;
};

// The global `selection` of a headless script.
class SgScriptSelection : public QObject {
    Q_OBJECT
public:
    explicit SgScriptSelection(QObject *parent = nullptr);

    // Selects the node labelled `label` (replacing the selection, or added with `add`); it
    // becomes the primary selection. False when there is no such node.
    Q_INVOKABLE bool select(const QString &label, bool add = false) const;
    Q_INVOKABLE void clear() const;
    // Labels of the selected nodes, and of the primary selection ("" for none).
    Q_INVOKABLE QStringList labels() const;
    Q_INVOKABLE QString primary() const;
};

// The node labelled `label` in the host's scene (first in scene order), or null.
SgNode *sgFindNodeByLabel(const QString &label);
