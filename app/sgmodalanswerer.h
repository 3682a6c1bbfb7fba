#pragma once

#include <QJSValue>
#include <QObject>
#include <QTimer>

class SgScriptRunner;

// Answers the modal questions that come up while a headless script runs, since no user is there
// to do it. Every few milliseconds it looks for an active modal message box or input dialog; a
// script handler (`setHandler`) gets (title, text) and returns the text of the button to press
// (or, for an input dialog, the text to enter; an empty answer cancels it). Without a handler, or
// when the handler names no button of the box, the box's default button is pressed and an input
// dialog is cancelled. Every answer is printed to stdout so that the run shows what was decided.
class SgModalAnswerer : public QObject {
    Q_OBJECT
public:
    explicit SgModalAnswerer(SgScriptRunner *runner, QObject *parent = nullptr);

    // Starts or stops watching for modal widgets (10 ms period).
    void setWatching(bool on);

    // The script function asked for each answer; a non-callable value removes the handler.
    void setHandler(const QJSValue &handler) { m_handler = handler; }

private:
    void answerActiveModal();
    QString askHandler(const QString &title, const QString &text);

    SgScriptRunner *m_runner;
    QJSValue m_handler;
    QTimer m_timer;
};
