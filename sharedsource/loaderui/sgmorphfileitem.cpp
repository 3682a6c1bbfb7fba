#include "sharedsource/loaderui/sgmorphfileitem.h"

#include "sgcore/io/sgfileio.h"
#include "sharedsource/loaderui/sgmorphcontrolitem.h"
#include "sharedsource/loaderui/sgmorphgroupitem.h"
#include "sharedsource/loaderui/sgmorphnameitem.h"
#include "sharedsource/loaderui/sgmorphorderingitem.h"
#include "sharedsource/loaderui/sgmorphoverrideitem.h"
#include "sharedsource/loaderui/sgmorphreverseitem.h"
#include "sharedsource/loaderui/sgmorphscexportitem.h"

#include <QTreeWidget>

SgMorphFileItem::SgMorphFileItem(QTreeWidget *list, const QString &path)
    : SgMorphFileItem(list, path, Type) {}

SgMorphFileItem::SgMorphFileItem(QTreeWidget *list, const QString &path, int type)
    : QTreeWidgetItem(type) {
    if (list)
        list->insertTopLevelItem(0, this);
    setText(0, SgFileIO::getShortFileName(path));
    setText(1, path);
    m_loader.setFilename(path);
    m_loader.setMorphName(SgFileIO::getBaseFileName(path));
    m_loader.setMorphGroup(QStringLiteral("Morphs/Morph Loader"));
    createSettingRows();
}

SgMorphFileItem::~SgMorphFileItem() {
    qDeleteAll(takeChildren());
}

void SgMorphFileItem::createSettingRows() {
    // Each row goes in front of the rows made before it: the last made is shown first.
    new SgMorphOverrideItem(this, &m_loader);
    new SgMorphOrderingItem(this, &m_loader);
    new SgMorphReverseItem(this, &m_loader);
    new SgMorphControlItem(this, &m_loader);
    new SgMorphGroupItem(this, &m_loader);
    new SgMorphNameItem(this, &m_loader);
    new SgMorphScExportItem(this, &m_loader);
}
