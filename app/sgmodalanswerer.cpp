#include "app/sgmodalanswerer.h"

#include "app/sgscriptrunner.h"

#include <QAbstractButton>
#include <QApplication>
#include <QInputDialog>
#include <QMessageBox>
#include <QPushButton>

#include <cstdio>

SgModalAnswerer::SgModalAnswerer(SgScriptRunner *runner, QObject *parent)
    : QObject(parent), m_runner(runner) {
    m_timer.setInterval(10);
    connect(&m_timer, &QTimer::timeout, this, &SgModalAnswerer::answerActiveModal);
}

void SgModalAnswerer::setWatching(bool on) {
    if (on)
        m_timer.start();
    else
        m_timer.stop();
}

QString SgModalAnswerer::askHandler(const QString &title, const QString &text) {
    if (!m_handler.isCallable())
        return QString();
    const QJSValue answer = m_handler.call({QJSValue(title), QJSValue(text)});
    if (answer.isError()) {
        m_runner->fail(QStringLiteral("question handler: %1").arg(answer.toString()));
        return QString();
    }
    return answer.isUndefined() || answer.isNull() ? QString() : answer.toString();
}

void SgModalAnswerer::answerActiveModal() {
    QWidget *modal = QApplication::activeModalWidget();
    if (auto *box = qobject_cast<QMessageBox *>(modal)) {
        const QString title = box->windowTitle();
        const QString wanted = askHandler(title, box->text());
        QAbstractButton *press = nullptr;
        for (QAbstractButton *button : box->buttons()) {
            if (!wanted.isEmpty() && button->text().remove(QLatin1Char('&')) == wanted)
                press = button;
        }
        if (press == nullptr)
            press = box->defaultButton();
        if (press == nullptr && !box->buttons().isEmpty())
            press = box->buttons().constFirst();
        const QString pressed = press ? press->text().remove(QLatin1Char('&')) : QString();
        std::printf("Question \"%s\" answered %s\n", qPrintable(title), qPrintable(pressed));
        std::fflush(stdout);
        if (press)
            press->click();
        else
            box->reject();
    } else if (auto *input = qobject_cast<QInputDialog *>(modal)) {
        const QString title = input->windowTitle();
        const QString wanted = askHandler(title, input->labelText());
        std::printf("Question \"%s\" answered %s\n", qPrintable(title),
                    wanted.isEmpty() ? "Cancel" : qPrintable(wanted));
        std::fflush(stdout);
        if (wanted.isEmpty()) {
            input->reject();
        } else {
            input->setTextValue(wanted);
            input->accept();
        }
    } else if (auto *dialog = qobject_cast<QDialog *>(modal)) {
        // Any other dialog (a chooser or a settings dialog) is accepted with what it shows.
        std::printf("Dialog \"%s\" accepted\n", qPrintable(dialog->windowTitle()));
        std::fflush(stdout);
        dialog->accept();
    }
}
