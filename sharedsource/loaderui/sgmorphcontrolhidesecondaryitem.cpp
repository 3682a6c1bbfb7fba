#include "sharedsource/loaderui/sgmorphcontrolhidesecondaryitem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphControlHideSecondaryItem::SgMorphControlHideSecondaryItem(QTreeWidgetItem *parent,
                                                                 SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader) {
    setText(0, tr("Hide Secondary Properties:"));
    setValue(loader->hideSecondary());
}

void SgMorphControlHideSecondaryItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    loader()->setHideSecondary(on);
}
