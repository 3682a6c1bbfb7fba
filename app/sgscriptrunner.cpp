#include "app/sgscriptrunner.h"

#include <QCoreApplication>
#include <QFile>
#include <QFileInfo>
#include <QTimer>

#include <cstdio>

SgScriptRunner::SgScriptRunner(QObject *parent) : QObject(parent) {
    m_engine.installExtensions(QJSEngine::ConsoleExtension);
}

SgScriptRunner::~SgScriptRunner() = default;

void SgScriptRunner::addGlobal(const QString &name, QObject *object) {
    QJSEngine::setObjectOwnership(object, QJSEngine::CppOwnership);
    m_engine.globalObject().setProperty(name, m_engine.newQObject(object));
}

int SgScriptRunner::run(const QString &path) {
    m_path = path;
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        std::fprintf(stderr, "%s: cannot read the script: %s\n", qPrintable(path),
                     qPrintable(file.errorString()));
        return 1;
    }
    const QString source = QString::fromUtf8(file.readAll());
    const QJSValue result = m_engine.evaluate(source, QFileInfo(path).absoluteFilePath());
    if (result.isError())
        fail(describeError(result));
    if (m_engine.hasError())
        fail(describeError(m_engine.catchError()));

    // Promise reactions and timers run from the event loop, so the loop runs at least once.
    if (!m_exitRequested) {
        m_looping = true;
        QTimer::singleShot(0, this, &SgScriptRunner::quitWhenIdle);
        QCoreApplication::exec();
        m_looping = false;
    }
    if (m_exitRequested)
        return m_exitStatus != 0 ? m_exitStatus : (m_failed ? 1 : 0);
    return m_failed ? 1 : 0;
}

void SgScriptRunner::beginWait() {
    ++m_pending;
}

void SgScriptRunner::endWait() {
    if (m_pending > 0)
        --m_pending;
    // Let the promise reactions that this end triggers run before deciding to stop.
    QTimer::singleShot(0, this, &SgScriptRunner::quitWhenIdle);
}

void SgScriptRunner::callBack(QJSValue function, const QJSValueList &args) {
    if (!function.isCallable())
        return;
    const QJSValue result = function.call(args);
    if (result.isError())
        fail(describeError(result));
}

void SgScriptRunner::fail(const QString &message) {
    m_failed = true;
    std::fprintf(stderr, "%s\n", qPrintable(message));
    std::fflush(stderr);
}

void SgScriptRunner::exit(int status) {
    m_exitRequested = true;
    m_exitStatus = status;
    if (m_looping)
        QTimer::singleShot(0, qApp, &QCoreApplication::quit);
}

QString SgScriptRunner::describeError(const QJSValue &error) const {
    const QString file = error.property(QStringLiteral("fileName")).toString();
    const int line = error.property(QStringLiteral("lineNumber")).toInt();
    return QStringLiteral("%1:%2: %3")
        .arg(file.isEmpty() || file == QLatin1String("undefined") ? m_path : file)
        .arg(line)
        .arg(error.toString());
}

void SgScriptRunner::quitWhenIdle() {
    if (m_looping && (m_pending == 0 || m_exitRequested))
        QCoreApplication::quit();
}
