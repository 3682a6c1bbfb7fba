#pragma once

#include <QObject>
#include <QStringList>

// Where the application's log, status line and progress go. The application window shows
// them (through the signals); tests read them back (through the getters). Every entry is
// also kept in memory until `clear`.
class SgMessageSink : public QObject {
    Q_OBJECT
public:
    // One progress run as started, with how far it got.
    struct Progress {
        QString text;
        int total = 0;
        int steps = 0;
        bool canCancel = false;
        bool showDialog = false;
        bool finished = false;
    };

    explicit SgMessageSink(QObject *parent = nullptr) : QObject(parent) {}

    // Every log line and status line so far, oldest first.
    QStringList logLines() const { return m_log; }
    QStringList statusLines() const { return m_status; }
    // The status line now shown (the last one), empty when none.
    QString currentStatus() const { return m_status.isEmpty() ? QString() : m_status.last(); }
    // Every progress run so far, oldest first.
    QList<Progress> progressRuns() const { return m_progress; }
    bool isProgressActive() const { return !m_progress.isEmpty() && !m_progress.last().finished; }
    // Forgets everything recorded (the signals are not affected).
    void clear();

    // Called by SgApp.
    void addLog(const QString &text);
    void addStatus(const QString &text, bool immediate);
    void startProgress(const QString &text, int total, bool canCancel, bool showDialog);
    bool stepProgress(int steps);
    void finishProgress();

signals:
    void logged(const QString &text);
    void statusChanged(const QString &text, bool immediate);
    void progressStarted(const QString &text, int total);
    void progressStepped(int steps, int total);
    void progressFinished();

private:
    QStringList m_log;
    QStringList m_status;
    QList<Progress> m_progress;
};
