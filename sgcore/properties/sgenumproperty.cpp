#include "sgcore/properties/sgenumproperty.h"

#include <algorithm>

int SgEnumProperty::addItem(const QString &label, int value) {
    const int index = getItemCount();
    m_labels.append(label);
    m_values.push_back(value == -1 ? index : value);
    if (m_value < 0) {
        m_value = 0;
    }
    if (m_default < 0) {
        m_default = 0;
    }
    return index;
}

void SgEnumProperty::removeItem(int index) {
    if (index < 0 || index >= getItemCount()) {
        return;
    }
    m_labels.removeAt(index);
    m_values.erase(m_values.begin() + index);
    const int last = getItemCount() - 1;
    m_value = std::min(m_value, last);
    m_default = std::min(m_default, last);
}

void SgEnumProperty::clearItems() {
    m_labels.clear();
    m_values.clear();
    m_value = -1;
    m_default = -1;
}

QString SgEnumProperty::getItemLabel(int index) const {
    return index >= 0 && index < getItemCount() ? m_labels.at(index) : QString();
}

int SgEnumProperty::getItemValue(int index) const {
    return index >= 0 && index < getItemCount() ? m_values[size_t(index)] : -1;
}

void SgEnumProperty::setValue(int index) {
    if (index >= 0 && index < getItemCount()) {
        m_value = index;
    }
}

void SgEnumProperty::setDefaultValue(int index) {
    if (index >= 0 && index < getItemCount()) {
        m_default = index;
    }
}
