#pragma once

#include "sgcore/properties/sgproperty.h"

#include <QStringList>

#include <vector>

// An enumerated property: a list of items (label and integer value); the property's value and
// default are item indices.
class SgEnumProperty : public SgProperty {
public:
    SgEnumProperty() = default;
    explicit SgEnumProperty(const QString &name) : SgProperty(name) {}

    // Appends an item; `value` -1 gives the item its index as value. Returns the item's index.
    int addItem(const QString &label, int value = -1);
    // Removes the item at `index` (nothing outside the list); the value and default indices
    // are kept inside the list.
    void removeItem(int index);
    void clearItems();
    int getItemCount() const { return static_cast<int>(m_labels.size()); }
    QStringList getItems() const { return m_labels; }
    // The label and value of item `index`; empty and -1 outside the list.
    QString getItemLabel(int index) const;
    int getItemValue(int index) const;

    // The current item index (-1 when the list is empty); set outside the list is ignored.
    int getValue() const { return m_value; }
    void setValue(int index);
    QString getValueLabel() const { return getItemLabel(m_value); }
    int getDefaultValue() const { return m_default; }
    void setDefaultValue(int index);

private:
    QStringList m_labels;
    std::vector<int> m_values;
    int m_value = -1;
    int m_default = -1;
};
