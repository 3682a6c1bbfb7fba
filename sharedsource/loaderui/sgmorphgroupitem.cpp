#include "sharedsource/loaderui/sgmorphgroupitem.h"

#include "sharedsource/engine/sgmorphloader.h"

#include "sharedsource/propertyui/sgpropertygroupmenu.h"

SgMorphGroupItem::SgMorphGroupItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Property Group:"));
    setText(1, loader->morphGroup());
}

void SgMorphGroupItem::showEditor(const QPoint &position, int) {
    SgPropertyGroupMenu menu(menuParent(), QString());
    setValueText(menu.chooseGroup(text(1), position));
}

void SgMorphGroupItem::setValueText(const QString &text) {
    setText(1, text);
    loader()->setMorphGroup(text);
}
