#pragma once

#include <QDateTime>
#include <QElapsedTimer>
#include <QHash>
#include <QObject>
#include <QString>

class QTimer;

// Watches the workspace files the modeler wrote and tells once per save, when the file has
// settled, whatever way the editor saved it: truncated and written in place in one write or in
// several chunks with pauses, or written to a temporary file renamed over the original.
//
// Every `checkMs` it looks at each watched file's size, modification time and status-change
// time (a rename over the file changes them). A look that differs from the one before marks a
// change and restarts the file's settle clock; once the file has looked the same for
// `settleMs`, and differs from the last state already handled (the modeler's own write, or the
// last save reported), `settled(path)` is emitted once and that state counts as handled. A
// file that disappears (the moment between an editor's delete and its rename) waits for its
// return. Cost per check: one stat per watched file.
class SgFacetorSaveSettler : public QObject {
    Q_OBJECT
public:
    explicit SgFacetorSaveSettler(int settleMs, QObject *parent = nullptr);

    // Starts watching `path` in its present state (counted as handled).
    void watch(const QString &path);
    // Counts the file's present state as handled, e.g. after the modeler wrote it again.
    void markHandled(const QString &path);
    int settleMs() const { return m_settleMs; }

signals:
    void settled(const QString &path);

private slots:
    void check();

private:
    struct Look {
        bool exists = false;
        qint64 size = -1;
        QDateTime modified;
        QDateTime changed;
        bool operator==(const Look &o) const = default;
    };
    struct Watched {
        Look handled;       // the state last handled
        Look seen;          // the state at the last check
        QElapsedTimer same; // since when `seen` has not changed
    };
    static Look lookAt(const QString &path);

    int m_settleMs;
    QTimer *m_timer = nullptr;
    QHash<QString, Watched> m_files;
};
