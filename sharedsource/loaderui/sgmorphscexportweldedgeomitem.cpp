#include "sharedsource/loaderui/sgmorphscexportweldedgeomitem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphScExportWeldedGeomItem::SgMorphScExportWeldedGeomItem(QTreeWidgetItem *parent,
                                                             SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader) {
    setText(0, tr("Used Bone Welds:"));
    setValue(loader->weldedGeometry());
}

void SgMorphScExportWeldedGeomItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    loader()->setWeldedGeometry(on);
}
