#include "tests/support/sgtestprocess.h"

#include "exchange/shm/sgcontrolrecord.h"

#include <QApplication>
#include <QDir>
#include <QElapsedTimer>
#include <QFile>

#include <cerrno>
#include <csignal>

#include <unistd.h>

bool sgTestWaitUntil(const std::function<bool()> &done, int timeoutMs) {
    QElapsedTimer timer;
    timer.start();
    while (!done() && timer.elapsed() < timeoutMs)
        QApplication::processEvents(QEventLoop::AllEvents, 5);
    return done();
}

void sgTestIdle(int milliseconds) {
    sgTestWaitUntil([] { return false; }, milliseconds);
}

bool sgTestProcessGone(qint64 pid) {
    if (pid <= 0 || (::kill(pid_t(pid), 0) != 0 && errno == ESRCH))
        return true;
    QFile stat(QStringLiteral("/proc/%1/stat").arg(pid));
    if (!stat.open(QIODevice::ReadOnly))
        return true;
    const QByteArray line = stat.readAll();
    const qsizetype close = line.lastIndexOf(')');
    return close > 0 && line.size() > close + 2 && line[close + 2] == 'Z';
}

bool sgTestKill(qint64 pid) {
    if (pid > 0)
        ::kill(pid_t(pid), SIGKILL);
    return sgTestWaitUntil([pid] { return sgTestProcessGone(pid); }, 5000);
}

QStringList sgTestSegmentFiles(const char *key) {
    const QString prefix =
        QStringLiteral("sgsharedmemory-") + QString::fromLatin1(QByteArray(key).toHex());
    const QByteArray space = qgetenv("SG_SHM_TEST_NAMESPACE");
    const QString suffix = QStringLiteral("-u%1").arg(geteuid()) +
                           (space.isEmpty() ? QString() : "-" + QString::fromUtf8(space));
    QStringList files;
    for (const QString &file :
         QDir(QStringLiteral("/dev/shm")).entryList({prefix + QLatin1Char('*')}, QDir::Files))
        if (file.endsWith(suffix))
            files << file;
    return files;
}

bool sgTestSegmentExists(const char *key) {
    for (const QString &file : sgTestSegmentFiles(key))
        if (!file.contains(QLatin1String("-ref")) && !file.contains(QLatin1String("-lock")))
            return true;
    return false;
}

QStringList sgTestLeftovers() {
    return sgTestSegmentFiles(kSgControlSegmentKey) + sgTestSegmentFiles(kSgDataSegmentKey) +
           sgTestSegmentFiles(kSgHostLinkKey);
}

SgTestModeler::SgTestModeler(const char *programFolder,
                             std::initializer_list<std::pair<const char *, QByteArray>> settings) {
    set("FACETOR_INSTALL_PATH", programFolder);
    set("FACETOR_WORKSPACE", workspace().toUtf8());
    set("FACETOR_LOG", newLog().toUtf8());
    for (const auto &[name, value] : settings)
        set(name, value);
}

SgTestModeler::~SgTestModeler() {
    for (const QByteArray &name : m_names)
        qunsetenv(name.constData());
}

void SgTestModeler::set(const char *name, const QByteArray &value) {
    if (!m_names.contains(name))
        m_names << name;
    if (value.isEmpty())
        qunsetenv(name);
    else
        qputenv(name, value);
}

QString SgTestModeler::newLog() {
    m_log = path(QStringLiteral("facetor-%1.log").arg(++m_logs));
    if (m_logs > 1)
        set("FACETOR_LOG", m_log.toUtf8());
    return m_log;
}

QString SgTestModeler::log() const {
    return QString::fromUtf8(sgTestReadFile(m_log));
}
