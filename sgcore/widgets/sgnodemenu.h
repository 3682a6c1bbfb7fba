#pragma once

#include <QComboBox>
#include <QList>

class SgNode;

// The host's node chooser: a drop-down list of nodes by label. With `offerNone` the list starts
// with a "None" entry that stands for no node; the current node is then null. Node pointers are
// not owned.
class SgNodeMenu : public QComboBox {
    Q_OBJECT
public:
    SgNodeMenu(QWidget *parent = nullptr, const QString &name = QString(), bool offerNone = true);
    ~SgNodeMenu() override;

    // Replaces the listed nodes by `nodes` (in order, null entries skipped). The current node
    // stays current when it is still listed, else the current node becomes none (the "None"
    // entry, or no entry at all without it). O(nodes).
    void setNodes(const QList<SgNode *> &nodes);
    QList<SgNode *> getNodes() const { return m_nodes; }

    // The current node, or null.
    SgNode *getCurrentNode() const;
    // Makes `node` current; null (or a node that is not listed) selects "None", or nothing at all
    // without that entry. Returns whether the node is now current.
    bool setCurrentNode(SgNode *node);

signals:
    void nodeChosen(SgNode *node);

private:
    int offset() const { return m_offerNone ? 1 : 0; }

    bool m_offerNone = true;
    QList<SgNode *> m_nodes;
};
