#include "sharedsource/loaderui/sgmorphcontrolitem.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphcontrolcustomlabelitem.h"
#include "sharedsource/loaderui/sgmorphcontrolhidesecondaryitem.h"
#include "sharedsource/loaderui/sgmorphcontrolnodeitem.h"
#include "sharedsource/loaderui/sgmorphcontrolpropertyitem.h"
#include "sharedsource/loaderui/sgmorpherctypeitem.h"

SgMorphControlItem::SgMorphControlItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader),
      m_hideSecondary(new SgMorphControlHideSecondaryItem(this, loader)),
      m_customLabel(new SgMorphControlCustomLabelItem(this, loader)),
      m_property(new SgMorphControlPropertyItem(this, loader)),
      m_node(new SgMorphControlNodeItem(this, loader)),
      m_ercType(new SgMorphErcTypeItem(this, loader)) {
    setText(0, tr("Create Control Property:"));
    setValue(loader->createControl());
}

void SgMorphControlItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    m_hideSecondary->setEnabled(on);
    m_customLabel->setEnabled(on);
    m_property->setEnabled(on);
    m_node->setEnabled(on);
    m_ercType->setEnabled(on);
    m_ercType->updateDependents(on);
    loader()->setCreateControl(on);
}
