#include "sharedsource/loaderui/sgmorphreverseitem.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphposeitem.h"

SgMorphReverseItem::SgMorphReverseItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader), m_pose(new SgMorphPoseItem(this, loader)) {
    setText(0, tr("Reverse Deformations:"));
    m_pose->setEnabled(false);
    m_pose->setDragEnabled(false);
    m_pose->setDropEnabled(false);
    setValue(loader->reverseModifiers());
}

void SgMorphReverseItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    m_pose->setEnabled(on);
    m_pose->setDragEnabled(on);
    m_pose->setDropEnabled(on);
    loader()->setReverseModifiers(on);
}
