#include "sharedsource/loaderui/sgmorphsourceitem.h"

#include <QAction>
#include <QMenu>
#include <QTreeWidget>

SgMorphSourceItem::SgMorphSourceItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : QTreeWidgetItem(Type), m_loader(loader), m_flags(Qt::ItemIsEnabled | Qt::ItemIsEditable) {
    QTreeWidgetItem::setFlags(m_flags);
    if (parent)
        parent->insertChild(0, this);
}

SgMorphSourceItem::~SgMorphSourceItem() = default;

void SgMorphSourceItem::showEditor(const QPoint &, int column) {
    if (renameEnabled(column))
        startRename(column);
}

void SgMorphSourceItem::setValueText(const QString &) {}

bool SgMorphSourceItem::renameEnabled(int) const {
    return false;
}

void SgMorphSourceItem::activate() {
    if (renameEnabled(1) && treeWidget() && treeWidget()->currentItem() == this)
        startRename(1);
}

void SgMorphSourceItem::okRename(int) {}

void SgMorphSourceItem::dropped(QDropEvent *) {}

void SgMorphSourceItem::setEnabled(bool enabled) {
    setRowFlag(Qt::ItemIsEnabled, enabled);
}

void SgMorphSourceItem::setDropEnabled(bool enabled) {
    setRowFlag(Qt::ItemIsDropEnabled, enabled);
}

void SgMorphSourceItem::setDragEnabled(bool enabled) {
    setRowFlag(Qt::ItemIsDragEnabled, enabled);
}

void SgMorphSourceItem::startRename(int column) {
    if (QTreeWidget *tree = treeWidget())
        tree->editItem(this, column);
}

int SgMorphSourceItem::runMenu(QMenu &menu, const QPoint &position) {
    const QAction *chosen = menu.exec(position);
    return chosen ? chosen->data().toInt() : -1;
}

void SgMorphSourceItem::addMenuItem(QMenu &menu, const QString &text, int id) {
    menu.addAction(text)->setData(id);
}

QWidget *SgMorphSourceItem::menuParent() const {
    return treeWidget();
}

void SgMorphSourceItem::setRowFlag(Qt::ItemFlag flag, bool on) {
    m_flags.setFlag(flag, on);
    QTreeWidgetItem::setFlags(m_flags);
}
