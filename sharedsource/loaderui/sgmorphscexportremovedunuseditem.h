#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

// The "Removed Unused Vertices:" row: whether the exported figure left out unused vertices.
class SgMorphScExportRemovedUnusedItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Shows the loader's current value.
    SgMorphScExportRemovedUnusedItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 16; }
    QString settingKey() const override { return QStringLiteral("ScExportRemovedUnusedVerts"); }
};
