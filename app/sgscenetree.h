#pragma once

#include <QHash>
#include <QTreeWidget>

class SgNode;
class SgScene;

// The scene as a tree: every node by its label under its parent (figures with their bones),
// top-level nodes in scene order. Selecting items selects the nodes in the scene (the current
// item becomes the primary selection), and a selection made elsewhere (by a script or a
// plug-in) shows in the tree. The tree is rebuilt when nodes come and go or the scene updates.
class SgSceneTree : public QTreeWidget {
    Q_OBJECT
public:
    explicit SgSceneTree(SgScene *scene, QWidget *parent = nullptr);

    // The node an item stands for (null for none).
    static SgNode *nodeOf(const QTreeWidgetItem *item);
    // The item of `node`, or null.
    QTreeWidgetItem *itemOf(const SgNode *node) const { return m_items.value(node); }

public slots:
    // Rebuilds every item from the scene, keeping the selection.
    void rebuild();

private:
    void copySelectionToScene();
    void copySelectionFromScene();
    QTreeWidgetItem *addItem(SgNode *node);

    SgScene *m_scene;
    QHash<const SgNode *, QTreeWidgetItem *> m_items;
    bool m_syncing = false;
};
