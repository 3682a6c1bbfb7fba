#pragma once

#include "sgcore/properties/sgnumericproperty.h"

#include <cmath>

// An integer property. Values are kept in the numeric base as floats (exact for integers up
// to 2^24); the int accessors round to the nearest integer. Defaults: range 0 to 100,
// sensitivity 1.
class SgIntProperty : public SgNumericProperty {
public:
    SgIntProperty() { init(); }
    explicit SgIntProperty(const QString &name) : SgNumericProperty(name) { init(); }

    using SgNumericProperty::setDefaultValue;
    using SgNumericProperty::setMax;
    using SgNumericProperty::setMin;
    using SgNumericProperty::setSensitivity;
    using SgNumericProperty::setValue;

    int getIntValue() const { return static_cast<int>(std::lround(getValue())); }
    void setValue(int value) { SgNumericProperty::setValue(static_cast<float>(value)); }
    void setDefaultValue(int value) {
        SgNumericProperty::setDefaultValue(static_cast<float>(value));
    }
    void setMin(int value) { SgNumericProperty::setMin(static_cast<float>(value)); }
    void setMax(int value) { SgNumericProperty::setMax(static_cast<float>(value)); }
    void setSensitivity(int value) { SgNumericProperty::setSensitivity(static_cast<float>(value)); }

private:
    void init() {
        SgNumericProperty::setMax(100.0f);
        SgNumericProperty::setSensitivity(1.0f);
    }
};
