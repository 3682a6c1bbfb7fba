#include "sharedsource/loaderui/sgmorphnameitem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphNameItem::SgMorphNameItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Name:"));
    setText(1, loader->morphName());
}

void SgMorphNameItem::setValueText(const QString &text) {
    setText(1, text);
    loader()->setMorphName(text);
}

void SgMorphNameItem::okRename(int column) {
    if (column == 1)
        loader()->setMorphName(text(1));
}
