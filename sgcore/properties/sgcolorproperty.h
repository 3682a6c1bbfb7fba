#pragma once

#include "sgcore/properties/sgproperty.h"

#include <QColor>

// A colour property (material colours); can be mapped to an image (see SgProperty).
class SgColorProperty : public SgProperty {
public:
    SgColorProperty() = default;
    explicit SgColorProperty(const QString &name) : SgProperty(name) {}

    QColor getColorValue() const { return m_value; }
    void setColorValue(const QColor &color) { m_value = color; }
    // The default as a packed RGB integer (QColor::rgb).
    QRgb getDefaultValue() const { return m_default; }
    void setDefaultValue(QRgb rgb) { m_default = rgb; }

private:
    QColor m_value{Qt::black};
    QRgb m_default = qRgb(0, 0, 0);
};
