#pragma once

#include <QPlainTextEdit>

// The main window's log pane: a read-only text view that appends each host log line and keeps
// the newest line in view. It keeps at most `kMaxLines` lines so a chatty run cannot grow it
// without bound.
class SgLogPane : public QPlainTextEdit {
    Q_OBJECT
public:
    static constexpr int kMaxLines = 5000;

    explicit SgLogPane(QWidget *parent = nullptr);

public slots:
    // Appends one line (a multi-line text shows as several lines).
    void appendLine(const QString &text);
};
