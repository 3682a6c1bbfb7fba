#pragma once

#include <QString>
#include <QStringList>
#include <functional>
#include <ostream>

class QMenu;
class QMessageBox;
class QWidget;

// Answers the next popup menu or modal window that opens, from inside its own event loop.
// The check runs every few milliseconds; after `timeoutMs` without one the handler is dropped
// and every stray popup and modal is closed, so that a broken test fails instead of hanging.
// `answered()` tells whether the handler ran.
class ModalAnswer {
public:
    using Handler = std::function<void(QWidget *)>;
    explicit ModalAnswer(Handler handler, int timeoutMs = 3000);
    ~ModalAnswer();
    bool answered() const;

private:
    struct State;
    State *m_state;
};

// Handlers for the common answers.
// Chooses the entry with `text` in the popup menu (or dismisses it when `text` is empty).
ModalAnswer::Handler chooseMenuEntry(const QString &text, QStringList *seen = nullptr);
// Records the text and title of a message box and presses its only button.
ModalAnswer::Handler closeMessageBox(QString *title, QString *text);
// The texts of a menu's entries, separators as "-".
QStringList menuEntries(const QMenu *menu);

// Readable QString values in test failure messages.
inline void PrintTo(const QString &text, std::ostream *out) {
    *out << '"' << text.toStdString() << '"';
}
