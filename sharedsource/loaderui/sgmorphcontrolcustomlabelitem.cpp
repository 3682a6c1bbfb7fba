#include "sharedsource/loaderui/sgmorphcontrolcustomlabelitem.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphcontrolsecondarylabelitem.h"

SgMorphControlCustomLabelItem::SgMorphControlCustomLabelItem(QTreeWidgetItem *parent,
                                                             SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader),
      m_labelItem(new SgMorphControlSecondaryLabelItem(this, loader)) {
    setText(0, tr("Use Secondary Label:"));
    setValue(loader->useCustomLabel());
}

void SgMorphControlCustomLabelItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    m_labelItem->setEnabled(on);
    loader()->setUseCustomLabel(on);
}
