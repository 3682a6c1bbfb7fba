#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

class SgMorphControlSecondaryLabelItem;

// The "Use Secondary Label:" row, with its dependent "Label:" row.
class SgMorphControlCustomLabelItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Creates the "Label:" row below it and shows the loader's current choice.
    SgMorphControlCustomLabelItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Enables "Label:" with the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 7; }
    QString settingKey() const override { return QStringLiteral("UseSecondaryLabel"); }

private:
    SgMorphControlSecondaryLabelItem *m_labelItem;
};
