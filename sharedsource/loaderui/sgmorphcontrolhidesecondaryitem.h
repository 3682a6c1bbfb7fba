#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

// The "Hide Secondary Properties:" row: whether the secondary properties of the control are hidden.
class SgMorphControlHideSecondaryItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Shows the loader's current value.
    SgMorphControlHideSecondaryItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 9; }
    QString settingKey() const override { return QStringLiteral("HideSecondaryProperties"); }
};
