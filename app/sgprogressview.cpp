#include "app/sgprogressview.h"

#include "sgcore/app/sgmessagesink.h"

#include <QProgressDialog>

SgProgressView::SgProgressView(SgMessageSink *sink, QWidget *window)
    : QObject(window), m_window(window) {
    connect(sink, &SgMessageSink::progressStarted, this, &SgProgressView::started);
    connect(sink, &SgMessageSink::progressStepped, this, &SgProgressView::stepped);
    connect(sink, &SgMessageSink::progressFinished, this, &SgProgressView::finished);
}

SgProgressView::~SgProgressView() {
    delete m_dialog;
}

void SgProgressView::started(const QString &text, int total) {
    finished();
    m_dialog = new QProgressDialog(text, QString(), 0, qMax(total, 0), m_window);
    m_dialog->setObjectName(QStringLiteral("SgProgressDialog"));
    m_dialog->setWindowTitle(tr("Progress"));
    m_dialog->setWindowModality(Qt::NonModal);
    m_dialog->setMinimumDuration(0);
    m_dialog->setAutoClose(false);
    m_dialog->setAutoReset(false);
    m_dialog->setValue(0);
    m_dialog->show();
}

void SgProgressView::stepped(int steps, int total) {
    if (m_dialog == nullptr)
        return;
    if (total != m_dialog->maximum())
        m_dialog->setMaximum(qMax(total, 0));
    m_dialog->setValue(qMin(steps, m_dialog->maximum()));
}

void SgProgressView::finished() {
    if (m_dialog == nullptr)
        return;
    m_dialog->close();
    m_dialog->deleteLater();
    m_dialog = nullptr;
}
