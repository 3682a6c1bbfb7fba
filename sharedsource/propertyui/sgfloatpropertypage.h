#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

class SgFloatProperty;
class SgFloatSlider;

// "Float Attributes": value, default, min, max, sensitivity and display as percent (the float
// and numeric node types).
class SgFloatPropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgFloatPropertyPage(QWidget *parent);

    // The range lines of the float type's validation (see sgCheckPropertyRange).
    bool checkRange(bool obeyLimits, QString &message) const;
    // The float step: value, default, min, max, sensitivity, display as percent and, from the
    // numeric page, clamping.
    void configure(SgFloatProperty *property, bool obeyLimits) const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    struct Values {
        float value = 0, defaultValue = 0, min = -1, max = 1, sensitivity = 0.04f;
        bool displayAsPercent = true;
    };
    Values current() const;
    void show(const Values &values);

    SgFloatSlider *m_value = nullptr, *m_default = nullptr, *m_min = nullptr, *m_max = nullptr;
    SgFloatSlider *m_sensitivity = nullptr;
    SgBoolButton *m_displayAsPercent = nullptr;
    Values m_saved;
};
