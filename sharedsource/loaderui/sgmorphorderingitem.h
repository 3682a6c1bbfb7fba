#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

// The "Apply After Joint Binding:" row: whether the morph is applied after the joint binding.
class SgMorphOrderingItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Shows the loader's current value.
    SgMorphOrderingItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 12; }
    QString settingKey() const override { return QStringLiteral("ApplyAfterJointBinding"); }
};
