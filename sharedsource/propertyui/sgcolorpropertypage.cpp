#include "sharedsource/propertyui/sgcolorpropertypage.h"

#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/widgets/sgcolorwgt.h"

SgColorPropertyPage::SgColorPropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Color Attributes"), QStringLiteral("SgColorAttribs")) {
    m_color = new SgColorWgt(this, QStringLiteral("SgColorAttrib"));
    m_default = new SgColorWgt(this, QStringLiteral("SgDefaultColorAttrib"));
    m_color->setColor(Qt::black);
    m_default->setColor(Qt::black);
    addRow(0, tr("Color:"), QStringLiteral("SgColorLabel"), m_color);
    addRow(1, tr("Default Color:"), QStringLiteral("SgDefaultColorLabel"), m_default);
}

void SgColorPropertyPage::configure(SgColorProperty *property) const {
    property->setColorValue(m_color->getColor());
    property->setDefaultValue(m_default->getColor().rgb());
}

void SgColorPropertyPage::restoreDefaults() {
    m_color->setColor(Qt::black);
    m_default->setColor(Qt::black);
}

void SgColorPropertyPage::saveValues() {
    m_savedColor = m_color->getColor();
    m_savedDefault = m_default->getColor();
}

void SgColorPropertyPage::restoreValues() {
    m_color->setColor(m_savedColor);
    m_default->setColor(m_savedDefault);
}
