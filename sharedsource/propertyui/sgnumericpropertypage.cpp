#include "sharedsource/propertyui/sgnumericpropertypage.h"

#include "sgcore/widgets/sgboolbutton.h"

#include <QGridLayout>

SgNumericPropertyPage::SgNumericPropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Numeric Attributes"), QStringLiteral("SgNumericPropertyAttribs")) {
    m_obeyLimits = newYesNoButton(QStringLiteral("SgObeyLimitsAttrib"));
    addRow(0, tr("Obey Limits:"), QStringLiteral("SgObeyLimitsPropertyLabel"), m_obeyLimits);
    grid()->addWidget(new QWidget(this), 1, 1);
}

bool SgNumericPropertyPage::obeyLimits() const {
    return m_obeyLimits->isOn();
}

void SgNumericPropertyPage::restoreDefaults() {
    m_obeyLimits->setOn(true);
}

void SgNumericPropertyPage::saveValues() {
    m_saved = m_obeyLimits->isOn();
}

void SgNumericPropertyPage::restoreValues() {
    m_obeyLimits->setOn(m_saved);
}
