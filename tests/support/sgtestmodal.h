#pragma once

// The modal answerer of the tests (part of the `sgtestmain` library).
//
// SgTestModalAnswer answers the popup menus and modal windows that open while it lives, from
// inside their own event loops: the first window that opens goes to the first handler, the
// next one to the second, and so on (a window open before the answer was made is not one of
// them). A window that opens after the handlers are used up is closed. It looks every 5 ms;
// `timeoutMs` after the last answer (or after its start) it stops looking and closes the popups
// and modal windows still open, failing the test with their titles, so that a broken test
// fails within seconds instead of hanging.
// The handlers are usually the drivers of sgtestdrivers.h.

#include "tests/support/sgtestdrivers.h"
#include "tests/support/sgtestmain.h"

#include <QList>
#include <QPointer>
#include <QStringList>
#include <QTimer>
#include <QWidget>

class SgTestModalAnswer {
public:
    explicit SgTestModalAnswer(SgTestHandler handler, int timeoutMs = 3000);
    explicit SgTestModalAnswer(QList<SgTestHandler> handlers, int timeoutMs = 3000);
    SgTestModalAnswer(const SgTestModalAnswer &) = delete;
    SgTestModalAnswer &operator=(const SgTestModalAnswer &) = delete;

    // How many windows were handed to a handler.
    int answered() const { return m_answered; }
    // The titles of the windows seen, in order (popup menus have none), closed ones included.
    QStringList titles() const { return m_titles; }

private:
    void look();

    QList<SgTestHandler> m_handlers;
    QTimer m_timer;
    QPointer<QWidget> m_before;
    QPointer<QWidget> m_last;
    QStringList m_titles;
    int m_answered = 0;
    int m_timeoutMs = 0;
    int m_idleMs = 0;
};

// Runs `action` while `handlers` answer the windows it opens; returns what `action` returns.
template <typename Action> auto sgTestAnswering(QList<SgTestHandler> handlers, Action action) {
    SgTestModalAnswer answer(std::move(handlers));
    return action();
}
