#include "sharedsource/loaderui/sgmorphcleanupitem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphCleanUpItem::SgMorphCleanUpItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader) {
    setText(0, tr("Clean Up Orphans:"));
    setValue(loader->cleanUpOrphans());
}

void SgMorphCleanUpItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    loader()->setCleanUpOrphans(on);
}
