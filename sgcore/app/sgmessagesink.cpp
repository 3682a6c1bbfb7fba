#include "sgcore/app/sgmessagesink.h"

void SgMessageSink::clear() {
    m_log.clear();
    m_status.clear();
    m_progress.clear();
}

void SgMessageSink::addLog(const QString &text) {
    m_log.append(text);
    emit logged(text);
}

void SgMessageSink::addStatus(const QString &text, bool immediate) {
    m_status.append(text);
    emit statusChanged(text, immediate);
}

void SgMessageSink::startProgress(const QString &text, int total, bool canCancel, bool showDialog) {
    if (isProgressActive()) {
        m_progress.last().finished = true;
    }
    Progress p;
    p.text = text;
    p.total = total;
    p.canCancel = canCancel;
    p.showDialog = showDialog;
    m_progress.append(p);
    emit progressStarted(text, total);
}

bool SgMessageSink::stepProgress(int steps) {
    if (!isProgressActive()) {
        return false;
    }
    m_progress.last().steps += steps;
    emit progressStepped(m_progress.last().steps, m_progress.last().total);
    return true;
}

void SgMessageSink::finishProgress() {
    if (!isProgressActive()) {
        return;
    }
    m_progress.last().finished = true;
    emit progressFinished();
}
