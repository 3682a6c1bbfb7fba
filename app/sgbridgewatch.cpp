#include "app/sgbridgewatch.h"

#include "app/sgscriptrunner.h"

#include <QApplication>

SgBridgeWatch::SgBridgeWatch(SgScriptRunner *runner, QObject *bridge, int timeoutMs,
                             QJSValue resolve, QJSValue callback, QObject *parent)
    : QObject(parent), m_runner(runner), m_bridge(bridge), m_resolve(std::move(resolve)),
      m_callback(std::move(callback)), m_timeoutMs(timeoutMs) {
    m_runner->beginWait();
    if (bridge != nullptr && bridge->metaObject()->indexOfSignal("returnHandled(QString)") >= 0)
        m_hearsOutcome =
            connect(bridge, SIGNAL(returnHandled(QString)), this, SLOT(returnHandled(QString)));
    m_clock.start();
    m_ticker.setInterval(10);
    connect(&m_ticker, &QTimer::timeout, this, &SgBridgeWatch::check);
    m_ticker.start();
}

void SgBridgeWatch::sceneChanged() {
    if (!m_done && !m_hearsOutcome)
        finish(QStringLiteral("imported"));
}

void SgBridgeWatch::returnHandled(const QString &outcome) {
    if (!m_done)
        finish(outcome);
}

void SgBridgeWatch::check() {
    if (m_done)
        return;
    const QTimer *poll =
        m_bridge ? m_bridge->findChild<QTimer *>(QString(), Qt::FindDirectChildrenOnly) : nullptr;
    if (poll == nullptr) {
        finish(QStringLiteral("quit"));
    } else if (!poll->isActive()) {
        // A return read just before the link ended is imported from a queued call, and its
        // dialog may still be open: its outcome comes first.
        QCoreApplication::sendPostedEvents(m_bridge, QEvent::MetaCall);
        if (!m_done && QApplication::activeModalWidget() == nullptr)
            finish(QStringLiteral("quit"));
    } else if (m_timeoutMs >= 0 && m_clock.elapsed() > m_timeoutMs)
        finish(QStringLiteral("timeout"));
}

void SgBridgeWatch::finish(const QString &outcome) {
    m_done = true;
    m_ticker.stop();
    if (m_resolve.isCallable())
        m_resolve.call({QJSValue(outcome)});
    m_runner->callBack(m_callback, {QJSValue(outcome)});
    m_runner->endWait();
    deleteLater();
}
