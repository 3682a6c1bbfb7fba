#include "sgcore/widgets/sgboolbutton.h"

SgBoolButton::SgBoolButton(QWidget *parent, const QString &name, const QString &offText,
                           const QString &onText)
    : QPushButton(parent), m_offText(offText), m_onText(onText) {
    setObjectName(name);
    setCheckable(true);
    connect(this, &QPushButton::toggled, this, &SgBoolButton::showStateText);
    showStateText();
}

SgBoolButton::~SgBoolButton() = default;

void SgBoolButton::setStateTexts(const QString &offText, const QString &onText) {
    m_offText = offText;
    m_onText = onText;
    showStateText();
}

void SgBoolButton::showStateText() {
    setText(isChecked() ? m_onText : m_offText);
}
