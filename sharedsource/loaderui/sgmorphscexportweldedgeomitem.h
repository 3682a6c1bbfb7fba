#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

// The "Used Bone Welds:" row: whether the exported figure was welded at the bone seams.
class SgMorphScExportWeldedGeomItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Shows the loader's current value.
    SgMorphScExportWeldedGeomItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 15; }
    QString settingKey() const override { return QStringLiteral("ScExportWeldedGeom"); }
};
