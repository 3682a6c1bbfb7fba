#pragma once

// One round trip through the real reference modeler, started as a second process that edits
// what it receives and sends it straight back.

#include "bridge/sgfacbridge.h"
#include "bridgetestsupport.h"

#include <QByteArray>
#include <QFile>
#include <QStringList>
#include <QTemporaryDir>

namespace {

class TestBridge : public SgFacBridge {
public:
    using SgFacBridge::executeAction;
};

// One round trip: the selected nodes go to the modeler, which applies `edit` (or returns the
// OBJ files of `returns`) and quits once its returns have been read.
class RoundTrip {
public:
    RoundTrip(const QByteArray &edit, const QStringList &returns = {}) {
        qputenv("FACETOR_INSTALL_PATH", FACETOR_BIN_DIR);
        qputenv("FACETOR_WORKSPACE", m_dir.filePath("workspace").toUtf8());
        qputenv("FACETOR_LOG", m_dir.filePath("facetor.log").toUtf8());
        qputenv("FACETOR_EXPECT", "1");
        qputenv("FACETOR_QUIT_WHEN_DONE", "1");
        qputenv("FACETOR_EDIT", edit);
        qputenv("FACETOR_RETURN", returns.join(':').toUtf8());
    }
    ~RoundTrip() {
        for (const char *name :
             {"FACETOR_INSTALL_PATH", "FACETOR_WORKSPACE", "FACETOR_LOG", "FACETOR_EXPECT",
              "FACETOR_QUIT_WHEN_DONE", "FACETOR_EDIT", "FACETOR_RETURN"})
            qunsetenv(name);
    }
    // Sends the selection and runs the event loop until the modeler has quit and every
    // return has been imported.
    bool run() {
        TestBridge bridge;
        bridge.executeAction();
        if (!bridge.isActive())
            return false;
        return bridgetest::waitUntil(
            [&] { return !bridge.isActive() && bridge.pendingImports() == 0; }, 30000);
    }
    QString log() const {
        QFile file(m_dir.filePath("facetor.log"));
        file.open(QIODevice::ReadOnly);
        return QString::fromUtf8(file.readAll());
    }
    QString path(const QString &name) const { return m_dir.filePath(name); }

private:
    QTemporaryDir m_dir;
};

} // namespace
