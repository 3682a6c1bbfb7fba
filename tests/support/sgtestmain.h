#pragma once

// Support for the project's GoogleTest programs (library `sgtestmain`, linked by sg_add_gtest).
//
// The library provides main(). Before any test runs it:
//   - makes a QApplication (platform "offscreen" unless QT_QPA_PLATFORM says otherwise);
//   - makes a fresh temporary folder (removed at exit) and points the application settings
//     file (SgAppSettings::setFileName) at "<folder>/settings.ini";
//   - makes the application object `sgApp` (SgApp) with its temporary path "<folder>/temp"
//     and its documents path "<folder>/documents" (both created);
//   - starts a watchdog: a test that runs longer than SG_TEST_STUCK_SECONDS (default 30; 0
//     turns it off) is reported as stuck, with its name, and the program ends with status 1,
//     so that a wait that should give up but never does fails fast instead of hanging;
//   - starts a fail-safe: a modal dialog or popup that stays open for more than a few seconds
//     (5 s; SG_TEST_MODAL_TIMEOUT_MS overrides) is closed, and the running test fails with its
//     window title, so a broken test fails instead of hanging.
//
// What the code under test reported is read back from sgApp->getMessageSink(); tests that fill
// the scene (sgApp->getScene()) clear it when done.

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"

#include <QByteArray>
#include <QString>

#include <ostream>

// The fresh temporary folder of this test program (no trailing slash).
QString sgTestFolder();

// A path inside that folder ("<folder>/<name>").
QString sgTestPath(const QString &name);

// Writes `bytes` to the file `path`, making its folders; returns `path` (a file that cannot be
// written fails the test).
QString sgTestWriteFile(const QString &path, const QByteArray &bytes);

// The whole content of the file `path` (empty when it cannot be read).
QByteArray sgTestReadFile(const QString &path);

// Changes the watchdog's limit for the running test and those after it (seconds; 0: none).
void sgTestSetStuckLimit(int seconds);

// Readable QString values in test failure messages.
inline void PrintTo(const QString &text, std::ostream *out) {
    *out << '"' << text.toStdString() << '"';
}
