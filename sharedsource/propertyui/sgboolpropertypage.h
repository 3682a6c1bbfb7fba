#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

class SgBoolProperty;

// "Bool Attributes": the value and the default, each an Off/On button.
class SgBoolPropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgBoolPropertyPage(QWidget *parent);

    // The value, and the default as 1 (on) or 0.
    void configure(SgBoolProperty *property) const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    SgBoolButton *m_value = nullptr, *m_default = nullptr;
    bool m_savedValue = false, m_savedDefault = false;
};
