#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

// The "Clean Up Orphans:" row: whether morphs left without a link are removed when overwriting.
class SgMorphCleanUpItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Shows the loader's current value.
    SgMorphCleanUpItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 19; }
    QString settingKey() const override { return QStringLiteral("CleanUp"); }
};
