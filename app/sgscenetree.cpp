#include "app/sgscenetree.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QHeaderView>

namespace {
QString kindOf(const SgNode *node) {
    if (dynamic_cast<const SgSkeleton *>(node))
        return QStringLiteral("Figure");
    if (dynamic_cast<const SgBone *>(node))
        return QStringLiteral("Bone");
    return node->getObject() ? QStringLiteral("Prop") : QStringLiteral("Node");
}
} // namespace

SgSceneTree::SgSceneTree(SgScene *scene, QWidget *parent) : QTreeWidget(parent), m_scene(scene) {
    setObjectName(QStringLiteral("SgSceneTree"));
    setColumnCount(2);
    setHeaderLabels({tr("Node"), tr("Kind")});
    header()->setStretchLastSection(false);
    header()->setSectionResizeMode(0, QHeaderView::Stretch);
    setSelectionMode(QAbstractItemView::ExtendedSelection);
    connect(this, &QTreeWidget::itemSelectionChanged, this, &SgSceneTree::copySelectionToScene);
    connect(m_scene, &SgScene::nodeAdded, this, &SgSceneTree::rebuild);
    connect(m_scene, &SgScene::nodeRemoved, this, &SgSceneTree::rebuild);
    connect(m_scene, &SgScene::sceneUpdated, this, &SgSceneTree::rebuild);
    connect(m_scene, &SgScene::selectionChanged, this, &SgSceneTree::copySelectionFromScene);
    rebuild();
}

SgNode *SgSceneTree::nodeOf(const QTreeWidgetItem *item) {
    return item ? reinterpret_cast<SgNode *>(item->data(0, Qt::UserRole).value<quintptr>())
                : nullptr;
}

QTreeWidgetItem *SgSceneTree::addItem(SgNode *node) {
    QTreeWidgetItem *parentItem = m_items.value(node->getParent());
    auto *item = parentItem ? new QTreeWidgetItem(parentItem) : new QTreeWidgetItem(this);
    item->setText(0, node->getLabel());
    item->setText(1, kindOf(node));
    item->setData(0, Qt::UserRole, QVariant::fromValue(reinterpret_cast<quintptr>(node)));
    m_items.insert(node, item);
    return item;
}

void SgSceneTree::rebuild() {
    m_syncing = true;
    clear();
    m_items.clear();
    // Scene order puts a parent before the children added with it; a child listed before its
    // parent is placed once the parent has an item.
    SgNodeList pending = m_scene->getNodes();
    while (!pending.isEmpty()) {
        SgNodeList later;
        for (SgNode *node : pending) {
            if (node->getParent() && !m_items.contains(node->getParent()) &&
                m_scene->indexOf(node->getParent()) >= 0)
                later.append(node);
            else
                addItem(node);
        }
        if (later.size() == pending.size()) {
            for (SgNode *node : later)
                addItem(node);
            break;
        }
        pending = later;
    }
    expandToDepth(0);
    m_syncing = false;
    copySelectionFromScene();
}

void SgSceneTree::copySelectionToScene() {
    if (m_syncing)
        return;
    m_syncing = true;
    const QList<QTreeWidgetItem *> chosen = selectedItems();
    m_scene->clearSelection();
    for (QTreeWidgetItem *item : chosen)
        if (item != currentItem())
            m_scene->selectNode(nodeOf(item), true);
    // The current item is selected last, so it becomes the primary selection.
    if (currentItem() && currentItem()->isSelected())
        m_scene->selectNode(nodeOf(currentItem()), true);
    m_syncing = false;
}

void SgSceneTree::copySelectionFromScene() {
    if (m_syncing)
        return;
    m_syncing = true;
    clearSelection();
    for (SgNode *node : m_scene->getSelectedNodes())
        if (QTreeWidgetItem *item = m_items.value(node))
            item->setSelected(true);
    if (QTreeWidgetItem *primary = m_items.value(m_scene->getPrimarySelection()))
        setCurrentItem(primary, 0, QItemSelectionModel::NoUpdate);
    m_syncing = false;
}
