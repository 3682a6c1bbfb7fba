#include "tests/support/sgtestdrivers.h"

#include <QAbstractButton>
#include <QAction>
#include <QApplication>
#include <QFileDialog>
#include <QFileInfo>
#include <QKeyEvent>
#include <QLineEdit>
#include <QMenu>
#include <QTest>

#include <gtest/gtest.h>

namespace {

void choosePath(QMenu *menu, QStringList path) {
    const QString text = path.takeFirst();
    QAction *target = nullptr;
    for (QAction *action : menu->actions()) {
        if (!target && !action->isSeparator() && action->text() == text)
            target = action;
    }
    if (!target || (!path.isEmpty() && !target->menu())) {
        ADD_FAILURE() << "no menu entry " << text.toStdString();
        menu->close();
        return;
    }
    menu->setActiveAction(target);
    if (path.isEmpty()) {
        QTest::keyClick(menu, Qt::Key_Return);
        return;
    }
    QTest::keyClick(menu, Qt::Key_Right);
    choosePath(target->menu(), path);
}

} // namespace

SgTestHandler sgTestChooseMenu(const QStringList &path, QStringList *seen) {
    return [path, seen](QWidget *widget) {
        auto *menu = qobject_cast<QMenu *>(widget);
        if (menu && seen)
            *seen = sgTestMenuEntries(menu);
        if (!menu || path.isEmpty())
            widget->close();
        else
            choosePath(menu, path);
    };
}

QStringList sgTestMenuEntries(const QMenu *menu, bool withData) {
    QStringList entries;
    for (const QAction *action : menu->actions()) {
        if (action->isSeparator())
            entries << QStringLiteral("-");
        else if (withData)
            entries << action->text() + QLatin1Char('=') + QString::number(action->data().toInt());
        else
            entries << action->text();
    }
    return entries;
}

SgTestHandler sgTestPressButton(QMessageBox::StandardButton button, QString *title, QString *text) {
    return sgTestAs<QMessageBox>([button, title, text](QMessageBox *box) {
        if (title)
            *title = box->windowTitle();
        if (text)
            *text = box->text();
        QAbstractButton *pressed =
            button == QMessageBox::NoButton
                ? (box->buttons().size() == 1 ? box->buttons().first() : nullptr)
                : box->button(button);
        if (pressed)
            pressed->click();
        else
            box->reject();
    });
}

SgTestHandler sgTestChooseFile(const QString &path, QString *folder, QString *typed) {
    return sgTestAs<QFileDialog>([path, folder, typed](QFileDialog *dialog) {
        auto *name = dialog->findChild<QLineEdit *>(QStringLiteral("fileNameEdit"));
        ASSERT_NE(name, nullptr) << "a file dialog without its name field";
        if (folder)
            *folder = dialog->directory().absolutePath();
        if (typed)
            *typed = name->text();
        if (path.isEmpty()) {
            dialog->reject();
            return;
        }
        // Typed as a user would: selectFile leaves the name alone while its field has focus.
        dialog->setDirectory(QFileInfo(path).absolutePath());
        name->setText(QFileInfo(path).fileName());
        static_cast<QDialog *>(dialog)->accept();
    });
}
