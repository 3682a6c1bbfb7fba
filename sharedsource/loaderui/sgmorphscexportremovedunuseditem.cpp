#include "sharedsource/loaderui/sgmorphscexportremovedunuseditem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphScExportRemovedUnusedItem::SgMorphScExportRemovedUnusedItem(QTreeWidgetItem *parent,
                                                                   SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader) {
    setText(0, tr("Removed Unused Vertices:"));
    setValue(loader->removedUnusedVertices());
}

void SgMorphScExportRemovedUnusedItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    loader()->setRemovedUnusedVertices(on);
}
