#include "sharedsource/propertyui/sgboolpropertypage.h"

#include "sgcore/properties/sgboolproperty.h"
#include "sgcore/widgets/sgboolbutton.h"

SgBoolPropertyPage::SgBoolPropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Bool Attributes"), QStringLiteral("SgBoolAttribs")) {
    m_value = newStateButton(QStringLiteral("SgBoolValueAttrib"), tr("Off"), tr("On"));
    m_default = newStateButton(QStringLiteral("SgDefaultBoolValueAttrib"), tr("Off"), tr("On"));
    addRow(0, tr("Value:"), QStringLiteral("SgBoolValueLabel"), m_value);
    addRow(1, tr("Default Value:"), QStringLiteral("SgDefaultBoolValueLabel"), m_default);
}

void SgBoolPropertyPage::configure(SgBoolProperty *property) const {
    property->setBoolValue(m_value->isOn());
    property->setDefaultValue(m_default->isOn() ? 1 : 0);
}

void SgBoolPropertyPage::restoreDefaults() {
    m_value->setOn(false);
    m_default->setOn(false);
}

void SgBoolPropertyPage::saveValues() {
    m_savedValue = m_value->isOn();
    m_savedDefault = m_default->isOn();
}

void SgBoolPropertyPage::restoreValues() {
    m_value->setOn(m_savedValue);
    m_default->setOn(m_savedDefault);
}
