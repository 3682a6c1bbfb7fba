#include "sharedsource/loaderui/sgmorphscexportitem.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphscexportignoredinvisibleitem.h"
#include "sharedsource/loaderui/sgmorphscexportremovedunuseditem.h"
#include "sharedsource/loaderui/sgmorphscexportweldedgeomitem.h"

SgMorphScExportItem::SgMorphScExportItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceBoolItem(parent, loader),
      m_removedUnused(new SgMorphScExportRemovedUnusedItem(this, loader)),
      m_weldedGeom(new SgMorphScExportWeldedGeomItem(this, loader)),
      m_ignoredInvisible(new SgMorphScExportIgnoredInvisibleItem(this, loader)) {
    setText(0, tr("Scenara Exported:"));
    setValue(loader->scenaraExported());
}

void SgMorphScExportItem::setValue(bool on) {
    SgMorphSourceBoolItem::setValue(on);
    loader()->setScenaraExported(on);
    m_removedUnused->setEnabled(on);
    m_weldedGeom->setEnabled(on);
    m_ignoredInvisible->setEnabled(on);
}
