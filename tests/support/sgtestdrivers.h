#pragma once

// Drivers of offscreen dialogs and popup menus (part of the `sgtestmain` library): each acts
// on the window it is handed as a user would. They are the handlers for the modal answerer,
// called from inside the window's own event loop.

#include <QMessageBox>
#include <QString>
#include <QStringList>
#include <QWidget>

#include <gtest/gtest.h>

#include <functional>

class QAbstractItemView;
class QLineEdit;
class QMenu;

using SgTestHandler = std::function<void(QWidget *)>;

// Chooses the entry `path` in a popup menu, one text per menu level: sub-menus open with the
// keyboard and the last entry is activated with Return. An empty path, or an entry that is not
// there (a test failure), closes the menu. `seen` receives the entries of the top menu.
SgTestHandler sgTestChooseMenu(const QStringList &path, QStringList *seen = nullptr);

// The entries of `menu`: their texts, separators as "-"; with `withData` as "text=data".
QStringList sgTestMenuEntries(const QMenu *menu, bool withData = false);

// The open in-place editor of `view`, or null (closed editors are deleted first).
QLineEdit *sgTestOpenEditor(const QAbstractItemView *view);

// Records the title and text of a message box and presses `button`; NoButton presses its only
// button, or rejects a box of several.
SgTestHandler sgTestPressButton(QMessageBox::StandardButton button = QMessageBox::NoButton,
                                QString *title = nullptr, QString *text = nullptr);

// Chooses `path` in a file dialog (an empty path cancels it); `folder` receives the folder the
// dialog opened in, `typed` the file name it offered.
SgTestHandler sgTestChooseFile(const QString &path, QString *folder = nullptr,
                               QString *typed = nullptr);

// A handler for a window of type T (a dialog class): `act` gets it; any other window fails the
// test and is closed.
template <typename T> SgTestHandler sgTestAs(std::function<void(T *)> act) {
    return [act](QWidget *widget) {
        if (T *window = qobject_cast<T *>(widget)) {
            act(window);
            return;
        }
        ADD_FAILURE() << "unexpected window " << widget->metaObject()->className() << " \""
                      << widget->windowTitle().toStdString() << "\"";
        widget->close();
    };
}
