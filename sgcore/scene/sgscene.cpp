#include "sgcore/scene/sgscene.h"

#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgskeleton.h"

#include <algorithm>
#include <unordered_set>

SgScene::SgScene(QObject *parent) : QObject(parent) {}

SgScene::~SgScene() {
    clear();
}

SgNodeList SgScene::getNodes() const {
    return SgNodeList(m_nodes.begin(), m_nodes.end());
}

SgNodeList SgScene::getSelectedNodes() const {
    SgNodeList out;
    for (SgNode *n : m_nodes) {
        if (isSelected(n)) {
            out.append(n);
        }
    }
    return out;
}

SgSkeletonList SgScene::getSkeletons() const {
    SgSkeletonList out;
    for (SgNode *n : m_nodes) {
        if (auto *s = dynamic_cast<SgSkeleton *>(n)) {
            out.append(s);
        }
    }
    return out;
}

SgNodeListIterator SgScene::nodeListIterator() const {
    return SgNodeListIterator(getNodes());
}
SgNodeListIterator SgScene::selectedNodeListIterator() const {
    return SgNodeListIterator(getSelectedNodes());
}
SgSkeletonListIterator SgScene::skeletonListIterator() const {
    return SgSkeletonListIterator(getSkeletons());
}

SgNode *SgScene::getNode(int index) const {
    return index >= 0 && index < getNodeCount() ? m_nodes[size_t(index)] : nullptr;
}

int SgScene::indexOf(const SgNode *node) const {
    auto it = std::find(m_nodes.begin(), m_nodes.end(), node);
    return it == m_nodes.end() ? -1 : static_cast<int>(it - m_nodes.begin());
}

SgNode *SgScene::findNodeByLabel(const QString &label) const {
    for (SgNode *n : m_nodes) {
        if (n->getLabel() == label) {
            return n;
        }
    }
    return nullptr;
}

SgNode *SgScene::findNodeByName(const QString &name) const {
    for (SgNode *n : m_nodes) {
        if (n->getName() == name) {
            return n;
        }
    }
    return nullptr;
}

bool SgScene::addNode(SgNode *node, bool withChildren) {
    if (!node) {
        return false;
    }
    SgNodeList todo{node};
    if (withChildren) {
        node->getNodeChildren(todo, true);
    }
    for (SgNode *n : todo) {
        if (n->getScene() == this) {
            continue;
        }
        n->setScene(this);
        m_nodes.push_back(n);
        emit nodeAdded(n);
    }
    return true;
}

void SgScene::takeNodesFrom(SgScene &other) {
    if (&other == this) {
        return;
    }
    std::vector<SgNode *> moved;
    moved.swap(other.m_nodes);
    const bool otherHadSelection = !other.m_selected.empty();
    other.m_selected.clear();
    other.m_primary = nullptr;
    for (SgNode *n : moved) {
        n->setScene(this);
        m_nodes.push_back(n);
    }
    if (otherHadSelection) {
        emit other.selectionChanged();
    }
    for (SgNode *n : moved) {
        emit nodeAdded(n);
    }
}

void SgScene::removeNode(SgNode *node) {
    if (!node || node->getScene() != this) {
        return;
    }
    SgNodeList doomed{node};
    node->getNodeChildren(doomed, true);
    std::unordered_set<SgNode *> gone(doomed.begin(), doomed.end());
    bool selectionChanged = false;
    for (SgNode *n : doomed) {
        if (isSelected(n)) {
            selectionChanged = true;
        }
    }
    std::erase_if(m_selected, [&](SgNode *n) { return gone.count(n) != 0; });
    if (gone.count(m_primary)) {
        m_primary = m_selected.empty() ? nullptr : m_selected.back();
    }
    std::erase_if(m_nodes, [&](SgNode *n) { return gone.count(n) != 0; });
    for (SgNode *n : m_nodes) {
        if (auto *s = dynamic_cast<SgSkeleton *>(n)) {
            if (gone.count(s->getFollowTarget())) {
                s->setFollowTarget(nullptr);
            }
        }
    }
    for (SgNode *n : doomed) {
        emit nodeRemoved(n);
    }
    // Delete leaves first so no node outlives the parent it points to.
    for (auto it = doomed.rbegin(); it != doomed.rend(); ++it) {
        (*it)->setScene(nullptr);
        delete *it;
    }
    if (selectionChanged) {
        emit this->selectionChanged();
    }
}

void SgScene::clear() {
    const bool hadSelection = !m_selected.empty();
    m_selected.clear();
    m_primary = nullptr;
    std::vector<SgNode *> nodes;
    nodes.swap(m_nodes);
    for (SgNode *n : nodes) {
        emit nodeRemoved(n);
    }
    for (SgNode *n : nodes) {
        n->setParent(nullptr);
    }
    for (SgNode *n : nodes) {
        n->setScene(nullptr);
        delete n;
    }
    if (hadSelection) {
        emit selectionChanged();
    }
}

void SgScene::selectNode(SgNode *node, bool add) {
    if (!node || node->getScene() != this) {
        return;
    }
    if (!add) {
        m_selected.clear();
    }
    std::erase(m_selected, node);
    m_selected.push_back(node);
    m_primary = node;
    emit selectionChanged();
}

void SgScene::deselectNode(SgNode *node) {
    if (!isSelected(node)) {
        return;
    }
    std::erase(m_selected, node);
    if (m_primary == node) {
        m_primary = m_selected.empty() ? nullptr : m_selected.back();
    }
    emit selectionChanged();
}

void SgScene::clearSelection() {
    m_selected.clear();
    m_primary = nullptr;
    emit selectionChanged();
}

bool SgScene::isSelected(const SgNode *node) const {
    return std::find(m_selected.begin(), m_selected.end(), node) != m_selected.end();
}

void SgScene::setPrimarySelection(SgNode *node) {
    if (!node) {
        m_primary = nullptr;
        emit selectionChanged();
        return;
    }
    if (!isSelected(node)) {
        selectNode(node, true);
        return;
    }
    m_primary = node;
    emit selectionChanged();
}

void SgScene::update() {
    emit sceneUpdated();
}
