#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

#include <QColor>

class SgColorProperty;
class SgColorWgt;

// "Color Attributes": the colour and the default colour, both black at first.
class SgColorPropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgColorPropertyPage(QWidget *parent);

    // The colour, and the default as a packed RGB value.
    void configure(SgColorProperty *property) const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    SgColorWgt *m_color = nullptr, *m_default = nullptr;
    QColor m_savedColor, m_savedDefault;
};
