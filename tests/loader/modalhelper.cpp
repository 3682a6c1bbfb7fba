#include "modalhelper.h"

#include <QAbstractButton>
#include <QAction>
#include <QApplication>
#include <QMenu>
#include <QMessageBox>
#include <QPointer>
#include <QTest>
#include <QTimer>
#include <memory>

struct ModalAnswer::State {
    Handler handler;
    QTimer timer;
    int remainingMs = 0;
    bool answered = false;
    QWidget *ignoredModal = nullptr;
};

namespace {
void closeStrays() {
    while (QWidget *popup = QApplication::activePopupWidget())
        popup->close();
    if (QWidget *modal = QApplication::activeModalWidget())
        modal->close();
}
} // namespace

ModalAnswer::ModalAnswer(Handler handler, int timeoutMs) : m_state(new State) {
    m_state->handler = std::move(handler);
    m_state->remainingMs = timeoutMs;
    // A modal open before this answer was set up is not the one it answers.
    m_state->ignoredModal = QApplication::activeModalWidget();
    State *state = m_state;
    QObject::connect(&state->timer, &QTimer::timeout, [state] {
        QWidget *target = QApplication::activePopupWidget();
        if (!target) {
            QWidget *modal = QApplication::activeModalWidget();
            if (modal != state->ignoredModal)
                target = modal;
        }
        if (target && target->isVisible()) {
            state->timer.stop();
            state->answered = true;
            state->handler(target);
            return;
        }
        state->remainingMs -= 5;
        if (state->remainingMs <= 0) {
            state->timer.stop();
            closeStrays();
        }
    });
    state->timer.start(5);
}

ModalAnswer::~ModalAnswer() {
    delete m_state;
}

bool ModalAnswer::answered() const {
    return m_state->answered;
}

QStringList menuEntries(const QMenu *menu) {
    QStringList entries;
    for (const QAction *action : menu->actions())
        entries.append(action->isSeparator() ? QStringLiteral("-") : action->text());
    return entries;
}

ModalAnswer::Handler chooseMenuEntry(const QString &text, QStringList *seen) {
    return [text, seen](QWidget *widget) {
        auto *menu = qobject_cast<QMenu *>(widget);
        if (!menu) {
            widget->close();
            return;
        }
        if (seen)
            *seen = menuEntries(menu);
        for (QAction *action : menu->actions()) {
            if (!action->isSeparator() && action->text() == text) {
                menu->setActiveAction(action);
                QTest::keyClick(menu, Qt::Key_Return);
                return;
            }
        }
        menu->close();
    };
}

ModalAnswer::Handler closeMessageBox(QString *title, QString *text) {
    return [title, text](QWidget *widget) {
        auto *box = qobject_cast<QMessageBox *>(widget);
        if (!box) {
            widget->close();
            return;
        }
        if (title)
            *title = box->windowTitle();
        if (text)
            *text = box->text();
        const QList<QAbstractButton *> buttons = box->buttons();
        if (buttons.size() == 1)
            buttons.first()->click();
        else
            box->reject();
    };
}
