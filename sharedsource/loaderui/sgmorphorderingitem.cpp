#include "sharedsource/loaderui/sgmorphorderingitem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphOrderingItem::SgMorphOrderingItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader) {
    setText(0, tr("Apply After Joint Binding:"));
    setValue(loader->applyAfterJoint());
}

void SgMorphOrderingItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    loader()->setApplyAfterJoint(on);
}
