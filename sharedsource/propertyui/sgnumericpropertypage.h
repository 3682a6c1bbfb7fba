#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

// "Numeric Attributes": whether the value obeys the limits (shown for the float, int and
// numeric node types; the float step makes it the property's clamping).
class SgNumericPropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgNumericPropertyPage(QWidget *parent);

    bool obeyLimits() const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    SgBoolButton *m_obeyLimits = nullptr;
    bool m_saved = true;
};
