#include "sharedsource/loaderui/sgmorphcontrolcustomvalueitem.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphcontrolvalueitem.h"

SgMorphControlCustomValueItem::SgMorphControlCustomValueItem(QTreeWidgetItem *parent,
                                                             SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader),
      m_valueItem(new SgMorphControlValueItem(this, loader)) {
    setText(0, tr("Use Custom Value:"));
    setValue(loader->useCustomValue());
}

void SgMorphControlCustomValueItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    m_valueItem->setEnabled(on);
    loader()->setUseCustomValue(on);
}
