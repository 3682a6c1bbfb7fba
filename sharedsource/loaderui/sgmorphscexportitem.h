#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

class SgMorphScExportIgnoredInvisibleItem;
class SgMorphScExportWeldedGeomItem;
class SgMorphScExportRemovedUnusedItem;

// The "Scenara Exported:" row: whether the source is a figure that the host exported as one
// welded mesh, with the three rows that describe how it was exported, enabled only while it
// is yes.
class SgMorphScExportItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Creates the three export rows and shows the loader's current choice.
    SgMorphScExportItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Writes the value into the loader and enables the export rows with it.
    void setValue(bool on) override;
    int settingType() const override { return 13; }
    QString settingKey() const override { return QStringLiteral("ScenaraExported"); }

private:
    SgMorphScExportRemovedUnusedItem *m_removedUnused;
    SgMorphScExportWeldedGeomItem *m_weldedGeom;
    SgMorphScExportIgnoredInvisibleItem *m_ignoredInvisible;
};
