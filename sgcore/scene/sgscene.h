#pragma once

#include "sgcore/scene/sglistiterator.h"

#include <QObject>

#include <vector>

class SgNode;
class SgSkeleton;

// The scene: every node in scene order (the order in which nodes were added), the selection
// and the primary selection. The scene owns its nodes.
class SgScene : public QObject {
    Q_OBJECT
public:
    explicit SgScene(QObject *parent = nullptr);
    ~SgScene() override;

    // Iterators over snapshots, in scene order: all nodes, the selected nodes, the figures.
    SgNodeListIterator nodeListIterator() const;
    SgNodeListIterator selectedNodeListIterator() const;
    SgSkeletonListIterator skeletonListIterator() const;
    SgNodeList getNodes() const;
    SgNodeList getSelectedNodes() const;
    SgSkeletonList getSkeletons() const;

    int getNodeCount() const { return static_cast<int>(m_nodes.size()); }
    // The node at scene position `index`, or null outside the scene.
    SgNode *getNode(int index) const;
    // The scene position of `node`, or -1. O(nodes).
    int indexOf(const SgNode *node) const;
    // The first node (scene order) whose label equals `label` exactly, or null when the label
    // is free. O(nodes).
    SgNode *findNodeByLabel(const QString &label) const;
    // The first node whose name equals `name` exactly, or null.
    SgNode *findNodeByName(const QString &name) const;

    // Appends `node` to the scene and takes ownership; with `withChildren` its descendants
    // that are not in the scene yet follow it, depth first. A node already in the scene is
    // left where it is. Emits nodeAdded for each node added. Returns false for null.
    bool addNode(SgNode *node, bool withChildren = true);
    // Removes `node` and its descendants from the scene and deletes them; they leave the
    // selection, and figures that followed a removed figure follow none.
    void removeNode(SgNode *node);
    // Removes and deletes every node; emits nodeRemoved for each, as removeNode does.
    void clear();
    // Moves every node of `other` to the end of this scene, in `other`'s scene order (nodes
    // with their hierarchy; `other` ends empty, without selection). Emits nodeAdded for each.
    // Lets a caller load a file into a scratch scene and keep the user's scene when it fails.
    void takeNodesFrom(SgScene &other);

    // Selection. `selectNode` with `add` false replaces the selection; the node becomes the
    // primary selection. Nodes outside the scene are ignored.
    void selectNode(SgNode *node, bool add = false);
    void deselectNode(SgNode *node);
    void clearSelection();
    bool isSelected(const SgNode *node) const;
    // The primary selection (the node selected last that is still selected), or null.
    SgNode *getPrimarySelection() const { return m_primary; }
    // Makes `node` primary (selecting it as well); null clears the primary selection only.
    void setPrimarySelection(SgNode *node);

    // Tells views that the scene changed (emits sceneUpdated).
    void update();

signals:
    void nodeAdded(SgNode *node);
    // Emitted for every node that leaves the scene, whatever removed it (removeNode, clear,
    // loading another scene, the scene's destruction), after it has left the node list and
    // the selection and before it is deleted: a holder of the pointer drops it here.
    void nodeRemoved(SgNode *node);
    void selectionChanged();
    void sceneUpdated();

private:
    std::vector<SgNode *> m_nodes;
    std::vector<SgNode *> m_selected; // in selection order
    SgNode *m_primary = nullptr;
};
