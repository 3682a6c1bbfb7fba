#pragma once

#include <QObject>
#include <QPointer>
#include <QProgressDialog>

class QWidget;
class SgMessageSink;

// Shows the host's progress runs (SgApp's progress calls) in a progress dialog over the main
// window: a run's start opens it with the run's text and total, each step advances it, the
// finish closes it. The dialog is not modal, so the poll and the rest of the window go on.
class SgProgressView : public QObject {
    Q_OBJECT
public:
    SgProgressView(SgMessageSink *sink, QWidget *window);
    ~SgProgressView() override;

    // The dialog of the active run, or null.
    QProgressDialog *dialog() const { return m_dialog; }

private:
    void started(const QString &text, int total);
    void stepped(int steps, int total);
    void finished();

    QWidget *m_window;
    QPointer<QProgressDialog> m_dialog;
};
