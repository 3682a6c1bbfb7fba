#pragma once

// Helpers for driving modal dialogs and popup menus from inside their own event loops.

#include <QAbstractButton>
#include <QApplication>
#include <QElapsedTimer>
#include <QKeyEvent>
#include <QMenu>
#include <QMessageBox>
#include <QString>
#include <QTimer>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <ostream>

inline void PrintTo(const QString &text, std::ostream *out) {
    *out << '"' << text.toStdString() << '"';
}

namespace uitest {

// Runs `handler` on the next modal widget (other than `previous`) once it appears, polling for up
// to two seconds; records a failure when none appears.
inline void onNextModal(std::function<void(QWidget *)> handler, QWidget *previous = nullptr) {
    auto *clock = new QElapsedTimer;
    clock->start();
    auto poll = std::make_shared<std::function<void()>>();
    *poll = [handler, previous, clock, poll]() {
        QWidget *modal = QApplication::activeModalWidget();
        if (modal && modal != previous && modal->isVisible()) {
            delete clock;
            handler(modal);
            *poll = nullptr;
            return;
        }
        if (clock->elapsed() > 2000) {
            delete clock;
            ADD_FAILURE() << "no modal widget appeared";
            *poll = nullptr;
            return;
        }
        QTimer::singleShot(10, *poll);
    };
    QTimer::singleShot(0, *poll);
}

// The same for the next popup menu.
inline void onNextPopup(std::function<void(QMenu *)> handler) {
    auto *clock = new QElapsedTimer;
    clock->start();
    auto poll = std::make_shared<std::function<void()>>();
    *poll = [handler, clock, poll]() {
        auto *menu = qobject_cast<QMenu *>(QApplication::activePopupWidget());
        if (menu && menu->isVisible()) {
            delete clock;
            handler(menu);
            *poll = nullptr;
            return;
        }
        if (clock->elapsed() > 2000) {
            delete clock;
            ADD_FAILURE() << "no popup menu appeared";
            *poll = nullptr;
            return;
        }
        QTimer::singleShot(10, *poll);
    };
    QTimer::singleShot(0, *poll);
}

// Answers the next message box by its button `buttonText`, storing its text in `text`.
inline void answerMessageBox(QString *text, const QString &buttonText = QStringLiteral("Ok"),
                             QWidget *previous = nullptr) {
    onNextModal(
        [text, buttonText](QWidget *modal) {
            auto *box = qobject_cast<QMessageBox *>(modal);
            if (!box) {
                ADD_FAILURE() << "the modal widget is no message box";
                modal->close();
                return;
            }
            if (text)
                *text = box->text();
            for (QAbstractButton *button : box->buttons()) {
                if (button->text() == buttonText) {
                    button->click();
                    return;
                }
            }
            ADD_FAILURE() << "no button " << buttonText.toStdString();
            box->close();
        },
        previous);
}

// Picks the entry `path` (texts, one per menu level) in `menu`: sub-menus are opened with the
// keyboard and the last entry is activated with Return, as a user would.
inline void chooseInMenu(QMenu *menu, QStringList path) {
    const QString text = path.takeFirst();
    QAction *target = nullptr;
    for (QAction *action : menu->actions()) {
        if (action->text() == text && !target)
            target = action;
    }
    if (!target) {
        ADD_FAILURE() << "no menu entry " << text.toStdString();
        menu->close();
        return;
    }
    menu->setActiveAction(target);
    if (path.isEmpty()) {
        QKeyEvent press(QEvent::KeyPress, Qt::Key_Return, Qt::NoModifier);
        QApplication::sendEvent(menu, &press);
        return;
    }
    QMenu *subMenu = target->menu();
    if (!subMenu) {
        ADD_FAILURE() << "entry " << text.toStdString() << " has no sub-menu";
        menu->close();
        return;
    }
    QKeyEvent right(QEvent::KeyPress, Qt::Key_Right, Qt::NoModifier);
    QApplication::sendEvent(menu, &right);
    chooseInMenu(subMenu, path);
}

// The entries of `menu` as "text=id" (separators as "-"), for checking a menu's build.
inline QStringList menuEntries(const QMenu *menu) {
    QStringList entries;
    for (const QAction *action : menu->actions()) {
        if (action->isSeparator())
            entries.append(QStringLiteral("-"));
        else
            entries.append(action->text() + QLatin1Char('=') +
                           QString::number(action->data().toInt()));
    }
    return entries;
}

} // namespace uitest
