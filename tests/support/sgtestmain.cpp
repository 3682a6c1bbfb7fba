#include "tests/support/sgtestmain.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/scene/sgscene.h"

#include <gtest/gtest.h>

#include <QApplication>
#include <QDialog>
#include <QDir>
#include <QElapsedTimer>
#include <QFile>
#include <QFileInfo>
#include <QPointer>
#include <QTemporaryDir>
#include <QTimer>
#include <QWidget>

#include <cstdlib>
#include <memory>

namespace {

QTemporaryDir *g_folder = nullptr;
int g_modalTimeoutMs = 5000;

// Closes a modal dialog or popup that stays up for longer than the time-out.
class StrayModalGuard : public QObject {
public:
    StrayModalGuard() {
        connect(&m_timer, &QTimer::timeout, this, [this] { check(); });
        m_timer.start(100);
    }

private:
    void check() {
        QWidget *w = QApplication::activeModalWidget();
        if (!w) {
            w = QApplication::activePopupWidget();
        }
        if (w != m_watched) {
            m_watched = w;
            m_since.restart();
            return;
        }
        if (!w || m_since.elapsed() < g_modalTimeoutMs) {
            return;
        }
        ADD_FAILURE() << "A modal window stayed open for more than " << g_modalTimeoutMs
                      << " ms and was closed: \"" << w->windowTitle().toStdString() << "\" ("
                      << w->metaObject()->className() << ")";
        if (auto *dialog = qobject_cast<QDialog *>(w)) {
            dialog->reject();
        } else {
            w->close();
        }
        m_watched = nullptr;
    }

    QTimer m_timer;
    QPointer<QWidget> m_watched;
    QElapsedTimer m_since;
};

} // namespace

QString sgTestFolder() {
    return g_folder ? g_folder->path() : QDir::tempPath();
}

QString sgTestPath(const QString &name) {
    return sgTestFolder() + QLatin1Char('/') + name;
}

QString sgTestWriteFile(const QString &path, const QByteArray &bytes) {
    QDir().mkpath(QFileInfo(path).absolutePath());
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate) || file.write(bytes) != bytes.size())
        ADD_FAILURE() << "cannot write " << path.toStdString();
    return path;
}

QByteArray sgTestReadFile(const QString &path) {
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

void sgTestSetModalTimeout(int milliseconds) {
    g_modalTimeoutMs = milliseconds;
}

int main(int argc, char **argv) {
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) {
        qputenv("QT_QPA_PLATFORM", "offscreen");
    }
    if (const char *t = std::getenv("SG_TEST_MODAL_TIMEOUT_MS")) {
        g_modalTimeoutMs = std::max(100, std::atoi(t));
    }
    ::testing::InitGoogleTest(&argc, argv);
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("scenara-tests"));

    QTemporaryDir folder(QDir::tempPath() + QStringLiteral("/sgtest-XXXXXX"));
    if (!folder.isValid()) {
        fprintf(stderr, "cannot make a temporary folder\n");
        return 2;
    }
    g_folder = &folder;
    QDir(folder.path()).mkpath(QStringLiteral("temp"));
    QDir(folder.path()).mkpath(QStringLiteral("documents"));
    SgAppSettings::setFileName(folder.path() + QStringLiteral("/settings.ini"));

    int result = 0;
    {
        SgApp sg;
        sg.setTempPath(folder.path() + QStringLiteral("/temp"));
        sg.setDocumentsPath(folder.path() + QStringLiteral("/documents"));
        StrayModalGuard guard;
        result = RUN_ALL_TESTS();
    }
    g_folder = nullptr;
    return result;
}
