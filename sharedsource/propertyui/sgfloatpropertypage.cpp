#include "sharedsource/propertyui/sgfloatpropertypage.h"

#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/widgets/sgboolbutton.h"
#include "sgcore/widgets/sgfloatslider.h"
#include "sharedsource/propertyui/sgpropertyrange.h"

SgFloatPropertyPage::SgFloatPropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Float Attributes"), QStringLiteral("SgFloatAttribs")) {
    const auto slider = [this](const char *name) {
        auto *s = new SgFloatSlider(this, QLatin1String(name));
        s->setTextEditable(true);
        return s;
    };
    m_value = slider("SgFloatVal");
    m_default = slider("SgDefaultFloatVal");
    m_min = slider("SgFloatMinAttrib");
    m_max = slider("SgFloatMaxAttrib");
    m_sensitivity = slider("SgFloatSensitivityAttrib");
    m_displayAsPercent = newYesNoButton(QStringLiteral("SgDisplayAsPercentAttrib"));
    addRow(0, tr("Value:"), QStringLiteral("SgFloatValueLabel"), m_value);
    addRow(1, tr("Default Value:"), QStringLiteral("SgDefaultFloatValueLabel"), m_default);
    addRow(2, tr("Min:"), QStringLiteral("SgFloatMinPropertyLabel"), m_min);
    addRow(3, tr("Max:"), QStringLiteral("SgFloatMaxPropertyLabel"), m_max);
    addRow(4, tr("Sensitivity:"), QStringLiteral("SgFloatSensitivityPropertyLabel"), m_sensitivity);
    addRow(5, tr("Display As Percent:"), QStringLiteral("SgDisplayAsPercentLabel"),
           m_displayAsPercent);
}

SgFloatPropertyPage::Values SgFloatPropertyPage::current() const {
    return {m_value->getValue(), m_default->getValue(),     m_min->getValue(),
            m_max->getValue(),   m_sensitivity->getValue(), m_displayAsPercent->isOn()};
}

void SgFloatPropertyPage::show(const Values &values) {
    m_value->setValue(values.value);
    m_default->setValue(values.defaultValue);
    m_min->setValue(values.min);
    m_max->setValue(values.max);
    m_sensitivity->setValue(values.sensitivity);
    m_displayAsPercent->setOn(values.displayAsPercent);
}

bool SgFloatPropertyPage::checkRange(bool obeyLimits, QString &message) const {
    const Values v = current();
    return sgCheckPropertyRange(v.min, v.max, v.value, v.defaultValue, obeyLimits, message);
}

void SgFloatPropertyPage::configure(SgFloatProperty *property, bool obeyLimits) const {
    const Values v = current();
    property->setValue(v.value);
    property->setDefaultValue(v.defaultValue);
    property->setMin(v.min);
    property->setMax(v.max);
    property->setSensitivity(v.sensitivity);
    property->setDisplayAsPercent(v.displayAsPercent);
    property->setIsClamped(obeyLimits);
}

void SgFloatPropertyPage::restoreDefaults() {
    show(Values());
}

void SgFloatPropertyPage::saveValues() {
    m_saved = current();
}

void SgFloatPropertyPage::restoreValues() {
    show(m_saved);
}
