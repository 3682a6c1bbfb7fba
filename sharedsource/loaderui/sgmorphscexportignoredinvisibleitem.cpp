#include "sharedsource/loaderui/sgmorphscexportignoredinvisibleitem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphScExportIgnoredInvisibleItem::SgMorphScExportIgnoredInvisibleItem(QTreeWidgetItem *parent,
                                                                         SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader) {
    setText(0, tr("Ignored Invisible Nodes:"));
    setValue(loader->ignoredInvisibleNodes());
}

void SgMorphScExportIgnoredInvisibleItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    loader()->setIgnoredInvisibleNodes(on);
}
