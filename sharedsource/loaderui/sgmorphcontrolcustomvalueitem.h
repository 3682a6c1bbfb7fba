#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

class SgMorphControlValueItem;

// The "Use Custom Value:" row, with its dependent "Value:" row.
class SgMorphControlCustomValueItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Creates the "Value:" row below it and shows the loader's current choice.
    SgMorphControlCustomValueItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Enables "Value:" with the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 5; }
    QString settingKey() const override { return QStringLiteral("UseCustom"); }

    SgMorphControlValueItem *valueItem() const { return m_valueItem; }

private:
    SgMorphControlValueItem *m_valueItem;
};
