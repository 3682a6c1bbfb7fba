#include "app/sglogpane.h"

SgLogPane::SgLogPane(QWidget *parent) : QPlainTextEdit(parent) {
    setObjectName(QStringLiteral("SgLogPane"));
    setReadOnly(true);
    setMaximumBlockCount(kMaxLines);
    setLineWrapMode(QPlainTextEdit::NoWrap);
}

void SgLogPane::appendLine(const QString &text) {
    appendPlainText(text);
}
