#include "sharedsource/propertyui/sgintpropertypage.h"

#include "sgcore/properties/sgintproperty.h"
#include "sgcore/widgets/sgintslider.h"
#include "sharedsource/propertyui/sgpropertyrange.h"

#include <algorithm>

namespace {

constexpr int LimitSpan = 1000;
constexpr int MaxSensitivity = 100;

// `slider`'s span from `low` to `high`, widened to hold its value.
void spanOver(SgIntSlider *slider, int low, int high) {
    const int value = slider->getValue();
    slider->setRange(std::min(low, value), std::max(high, value));
}

} // namespace

SgIntPropertyPage::SgIntPropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Int Attributes"), QStringLiteral("SgIntAttribs")) {
    const auto slider = [this](const char *name, bool typed) {
        auto *s = new SgIntSlider(this, QLatin1String(name));
        s->setTextEditable(typed);
        return s;
    };
    m_value = slider("SgIntVal", true);
    m_default = slider("SgDefaultIntVal", true);
    m_min = slider("SgIntMinAttrib", true);
    m_max = slider("SgIntMaxAttrib", false);
    m_sensitivity = slider("SgIntSensitivityAttrib", true);
    addRow(0, tr("Value:"), QStringLiteral("SgIntValueLabel"), m_value);
    addRow(1, tr("Default Value:"), QStringLiteral("SgDefaultIntValueLabel"), m_default);
    addRow(2, tr("Min:"), QStringLiteral("SgIntMinPropertyLabel"), m_min);
    addRow(3, tr("Max:"), QStringLiteral("SgIntMaxPropertyLabel"), m_max);
    addRow(4, tr("Sensitivity:"), QStringLiteral("SgIntSensitivityPropertyLabel"), m_sensitivity);
    for (SgIntSlider *s : {m_value, m_default, m_min, m_max, m_sensitivity})
        connect(s, &SgIntSlider::valueChanged, this, &SgIntPropertyPage::fitRanges);
    fitRanges();
}

void SgIntPropertyPage::fitRanges() {
    const int min = m_min->getValue();
    const int max = m_max->getValue();
    spanOver(m_min, -LimitSpan, LimitSpan);
    spanOver(m_max, -LimitSpan, LimitSpan);
    const int low = min < max ? min : -LimitSpan;
    const int high = min < max ? max : LimitSpan;
    spanOver(m_value, low, high);
    spanOver(m_default, low, high);
    spanOver(m_sensitivity, 1, MaxSensitivity);
}

SgIntPropertyPage::Values SgIntPropertyPage::current() const {
    return {m_value->getValue(), m_default->getValue(), m_min->getValue(), m_max->getValue(),
            m_sensitivity->getValue()};
}

void SgIntPropertyPage::show(const Values &values) {
    m_min->setValue(values.min);
    m_max->setValue(values.max);
    m_value->setValue(values.value);
    m_default->setValue(values.defaultValue);
    m_sensitivity->setValue(values.sensitivity);
    fitRanges();
}

bool SgIntPropertyPage::checkRange(bool obeyLimits, QString &message) const {
    const Values v = current();
    return sgCheckPropertyRange(v.min, v.max, v.value, v.defaultValue, obeyLimits, message);
}

void SgIntPropertyPage::configure(SgIntProperty *property) const {
    const Values v = current();
    property->setValue(v.value);
    property->setDefaultValue(v.defaultValue);
    property->setMin(v.min);
    property->setMax(v.max);
    property->setSensitivity(v.sensitivity);
}

void SgIntPropertyPage::restoreDefaults() {
    show(Values());
}

void SgIntPropertyPage::saveValues() {
    m_saved = current();
}

void SgIntPropertyPage::restoreValues() {
    show(m_saved);
}
