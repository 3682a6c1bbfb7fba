#include "tests/support/sgtestmodal.h"

#include <QApplication>

SgTestModalAnswer::SgTestModalAnswer(SgTestHandler handler, int timeoutMs)
    : SgTestModalAnswer(QList<SgTestHandler>{std::move(handler)}, timeoutMs) {}

SgTestModalAnswer::SgTestModalAnswer(QList<SgTestHandler> handlers, int timeoutMs)
    : m_handlers(std::move(handlers)), m_before(QApplication::activeModalWidget()),
      m_timeoutMs(timeoutMs) {
    QObject::connect(&m_timer, &QTimer::timeout, [this] { look(); });
    m_timer.start(5);
}

void SgTestModalAnswer::look() {
    // A popup first; a modal window when no new popup is up (a dialog opened from a menu entry
    // runs while its menu may still count as the active popup).
    const auto isNew = [this](QWidget *w) { return w && w->isVisible() && w != m_last; };
    QWidget *window = QApplication::activePopupWidget();
    if (!isNew(window) && QApplication::activeModalWidget() != m_before)
        window = QApplication::activeModalWidget();
    if (isNew(window)) {
        m_last = window;
        m_idleMs = 0;
        m_titles << window->windowTitle();
        SgTestHandler handler = m_answered < m_handlers.size()
                                    ? m_handlers[m_answered++]
                                    : [](QWidget *extra) { extra->close(); };
        // Run from a call of its own: a window that the handler opens in turn runs its loop
        // inside the handler, and this timer does not fire while its own slot runs.
        QPointer<QWidget> target(window);
        QTimer::singleShot(0, qApp, [handler, target] {
            if (target)
                handler(target);
        });
        return;
    }
    if ((m_idleMs += 5) < m_timeoutMs)
        return;
    m_timer.stop();
    // A window still up this long after its answer is stuck: the test fails, naming it.
    const auto closeStuck = [this](QWidget *window) {
        ADD_FAILURE() << "a window stayed open " << m_timeoutMs << " ms after its answer and was "
                      << "closed: \"" << window->windowTitle().toStdString() << "\" ("
                      << window->metaObject()->className() << ")";
        window->close();
    };
    while (QWidget *popup = QApplication::activePopupWidget())
        closeStuck(popup);
    if (QWidget *modal = QApplication::activeModalWidget(); modal && modal != m_before)
        closeStuck(modal);
}
