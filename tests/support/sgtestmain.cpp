#include "tests/support/sgtestmain.h"

#include "sgcore/app/sgappsettings.h"

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

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <string>

#include <unistd.h>

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
        if (!w)
            w = QApplication::activePopupWidget();
        if (w != m_watched) {
            m_watched = w;
            m_since.restart();
            return;
        }
        if (!w || m_since.elapsed() < g_modalTimeoutMs)
            return;
        ADD_FAILURE() << "A modal window stayed open for more than " << g_modalTimeoutMs
                      << " ms and was closed: \"" << w->windowTitle().toStdString() << "\" ("
                      << w->metaObject()->className() << ")";
        if (auto *dialog = qobject_cast<QDialog *>(w))
            dialog->reject();
        else
            w->close();
        m_watched = nullptr;
    }

    QTimer m_timer;
    QPointer<QWidget> m_watched;
    QElapsedTimer m_since;
};

// Ends the program when one test runs past the limit: a hang then fails with the test's name
// within seconds instead of waiting for ctest's time-out. An alarm signal does it, since the
// stuck test holds the main thread; its handler only writes the prepared message and exits.
class StuckTestWatchdog : public ::testing::EmptyTestEventListener {
public:
    explicit StuckTestWatchdog(int seconds) : m_limitSeconds(seconds) {
        std::signal(SIGALRM, [](int) {
            [[maybe_unused]] const ssize_t n = write(STDERR_FILENO, s_message, s_length);
            std::_Exit(1);
        });
    }
    // Restarts the running test's clock with the new limit (0: none).
    void setLimit(int seconds) {
        m_limitSeconds = seconds;
        if (!m_test.empty())
            arm();
    }

private:
    void OnTestStart(const ::testing::TestInfo &test) override {
        m_test = std::string(test.test_suite_name()) + "." + test.name();
        arm();
    }
    void OnTestEnd(const ::testing::TestInfo &) override {
        m_test.clear();
        alarm(0);
    }
    void arm() {
        alarm(0);
        s_length = size_t(std::max(
            0, std::snprintf(s_message, sizeof s_message,
                             "[  STUCK   ] %s has run for more than %d s: a wait that should give "
                             "up never returned (SG_TEST_STUCK_SECONDS sets the limit)\n",
                             m_test.c_str(), m_limitSeconds)));
        s_length = std::min(s_length, sizeof s_message - 1);
        alarm(unsigned(std::max(0, m_limitSeconds)));
    }

    static inline char s_message[1024];
    static inline size_t s_length = 0;
    int m_limitSeconds;
    std::string m_test;
};

StuckTestWatchdog *g_watchdog = nullptr;

} // namespace

void sgTestSetStuckLimit(int seconds) {
    if (g_watchdog)
        g_watchdog->setLimit(seconds);
}

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

int main(int argc, char **argv) {
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    if (const char *t = std::getenv("SG_TEST_MODAL_TIMEOUT_MS"))
        g_modalTimeoutMs = std::max(100, std::atoi(t));
    ::testing::InitGoogleTest(&argc, argv);
    const char *stuck = std::getenv("SG_TEST_STUCK_SECONDS");
    g_watchdog = new StuckTestWatchdog(stuck ? std::atoi(stuck) : 30);
    ::testing::UnitTest::GetInstance()->listeners().Append(g_watchdog); // owned by gtest
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
