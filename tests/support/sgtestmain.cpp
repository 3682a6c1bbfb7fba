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

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <string>
#include <thread>

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

// Ends the program when one test runs past the limit: a hang then fails with the test's name
// within seconds instead of waiting for ctest's time-out. It watches from a thread of its own,
// since the stuck test holds the main thread.
class StuckTestWatchdog : public ::testing::EmptyTestEventListener {
public:
    explicit StuckTestWatchdog(int seconds) : m_limitSeconds(seconds) {
        m_thread = std::thread([this] { watch(); });
    }
    ~StuckTestWatchdog() override {
        m_stop = true;
        m_thread.join();
    }
    void setLimit(int seconds) { m_limitSeconds = seconds; }

private:
    using Clock = std::chrono::steady_clock;
    void OnTestStart(const ::testing::TestInfo &test) override {
        std::lock_guard guard(m_mutex);
        m_test = std::string(test.test_suite_name()) + "." + test.name();
        m_start = Clock::now();
    }
    void OnTestEnd(const ::testing::TestInfo &) override {
        std::lock_guard guard(m_mutex);
        m_test.clear();
    }
    void watch() {
        while (!m_stop) {
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
            std::lock_guard guard(m_mutex);
            const int limit = m_limitSeconds;
            if (m_test.empty() || limit <= 0 ||
                Clock::now() - m_start < std::chrono::seconds(limit))
                continue;
            std::fprintf(stderr,
                         "[  STUCK   ] %s has run for more than %d s: a wait that should give up "
                         "never returned (SG_TEST_STUCK_SECONDS sets the limit)\n",
                         m_test.c_str(), limit);
            std::fflush(stderr);
            std::_Exit(1);
        }
    }

    std::atomic<int> m_limitSeconds;
    std::atomic<bool> m_stop{false};
    std::mutex m_mutex;
    std::string m_test;
    Clock::time_point m_start;
    std::thread m_thread;
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
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) {
        qputenv("QT_QPA_PLATFORM", "offscreen");
    }
    if (const char *t = std::getenv("SG_TEST_MODAL_TIMEOUT_MS")) {
        g_modalTimeoutMs = std::max(100, std::atoi(t));
    }
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
