#pragma once

#include "sgcore/properties/sgproperty.h"

// A boolean property; the default is stored as an integer (0 off, anything else on).
class SgBoolProperty : public SgProperty {
public:
    SgBoolProperty() = default;
    explicit SgBoolProperty(const QString &name) : SgProperty(name) {}

    bool getBoolValue() const { return m_value; }
    void setBoolValue(bool value) { m_value = value; }
    int getDefaultValue() const { return m_default; }
    void setDefaultValue(int value) { m_default = value; }

private:
    bool m_value = false;
    int m_default = 0;
};
