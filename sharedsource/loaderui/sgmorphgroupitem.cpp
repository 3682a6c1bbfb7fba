#include "sharedsource/loaderui/sgmorphgroupitem.h"

#include "sharedsource/engine/sgmorphloader.h"

// The chooser menus belong to the property UI of the same library; a build without it
// offers no chooser.
#if __has_include("sharedsource/propertyui/sgpropertygroupmenu.h")
#include "sharedsource/propertyui/sgpropertygroupmenu.h"
#define SG_HAS_CHOOSER_MENU 1
#endif

SgMorphGroupItem::SgMorphGroupItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Property Group:"));
    setText(1, loader->morphGroup());
}

void SgMorphGroupItem::showEditor(const QPoint &position, int) {
#ifdef SG_HAS_CHOOSER_MENU
    SgPropertyGroupMenu menu(menuParent(), QString());
    setValueText(menu.chooseGroup(text(1), position));
#else
    Q_UNUSED(position);
#endif
}

void SgMorphGroupItem::setValueText(const QString &text) {
    setText(1, text);
    loader()->setMorphGroup(text);
}
