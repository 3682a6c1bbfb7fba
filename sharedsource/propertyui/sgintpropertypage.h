#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

class SgIntProperty;
class SgIntSlider;

// "Int Attributes": value, default, min, max (dragged only, it takes no typed text) and
// sensitivity. The sliders span a range that fits their values: min and max at least -1000 to
// 1000, value and default the current min to max, sensitivity at least 1 to 100, each widened
// to hold its own value, and refitted whenever min or max changes.
class SgIntPropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgIntPropertyPage(QWidget *parent);

    bool checkRange(bool obeyLimits, QString &message) const;
    // Value, default, min, max and sensitivity (obey limits is not applied to int properties).
    void configure(SgIntProperty *property) const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    struct Values {
        qint32 value = 0, defaultValue = 0, min = -1, max = 1, sensitivity = 1;
    };
    Values current() const;
    void show(const Values &values);
    void fitRanges();

    SgIntSlider *m_value = nullptr, *m_default = nullptr, *m_min = nullptr, *m_max = nullptr;
    SgIntSlider *m_sensitivity = nullptr;
    Values m_saved;
};
