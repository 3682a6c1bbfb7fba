#pragma once

// Helpers of the tests that run a second process (part of the `sgtestmain` library): waiting on
// the event loop, whether a process has ended, the segment files a key leaves in /dev/shm, and
// the reference modeler's launch settings.

#include "tests/support/sgtestmain.h"

#include <QByteArray>
#include <QString>
#include <QStringList>
#include <QTemporaryDir>

#include <functional>
#include <initializer_list>
#include <utility>

// Runs the event loop until `done` holds or `timeoutMs` passes; returns `done()`.
bool sgTestWaitUntil(const std::function<bool()> &done, int timeoutMs);

// Runs the event loop for `milliseconds`.
void sgTestIdle(int milliseconds);

// Whether the process has ended (a zombie that nobody has reaped yet counts as ended).
bool sgTestProcessGone(qint64 pid);

// Kills the process (SIGKILL) and waits up to five seconds for it to end; true once it has.
bool sgTestKill(qint64 pid);

// The files of a segment key in /dev/shm (data, "-ref" and "-lock" objects) of this user and of
// this test namespace (SG_SHM_TEST_NAMESPACE). Looking at the folder, rather than opening the
// segment, leaves no handle behind.
QStringList sgTestSegmentFiles(const char *key);

// Whether the data object of a segment key exists.
bool sgTestSegmentExists(const char *key);

// The files of the bridge's three keys (control, data, host link) left in /dev/shm.
QStringList sgTestLeftovers();

// The reference modeler's settings for one test, through its environment (the bridge passes it
// only "-sgl"): its program folder, a fresh workspace and log file, and the named settings
// (FACETOR_EDIT, FACETOR_EXPECT, ...). Every variable it set is removed when it goes.
class SgTestModeler {
public:
    explicit SgTestModeler(
        const char *programFolder,
        std::initializer_list<std::pair<const char *, QByteArray>> settings = {});
    ~SgTestModeler();
    SgTestModeler(const SgTestModeler &) = delete;
    SgTestModeler &operator=(const SgTestModeler &) = delete;

    // Sets (or, with an empty value, removes) one more variable.
    void set(const char *name, const QByteArray &value);
    // Starts a new log file (the next modeler's); returns its path.
    QString newLog();
    QString log() const;
    QString workspace() const { return path(QStringLiteral("workspace")); }
    QString path(const QString &name) const { return m_dir.filePath(name); }

private:
    QTemporaryDir m_dir;
    QString m_log;
    QList<QByteArray> m_names;
    int m_logs = 0;
};
