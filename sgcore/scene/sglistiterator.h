#pragma once

#include <QList>

// A forward iterator over a snapshot of a list of pointers, in the host's style:
//     SgNodeListIterator it = scene->nodeListIterator();
//     while (SgNode *node = it.next()) { ... }
// The snapshot is taken when the iterator is made, so changing the scene while iterating is
// safe (the iterator keeps showing the old list; do not use pointers that were deleted).
template <typename T> class SgTListIterator {
public:
    SgTListIterator() = default;
    explicit SgTListIterator(const QList<T *> &items) : m_items(items) {}

    // Whether another item follows.
    bool hasNext() const { return m_pos < m_items.size(); }
    // The next item, or null at the end.
    T *next() { return hasNext() ? m_items.at(m_pos++) : nullptr; }
    // The item that `next` returned last, or null before the first call.
    T *current() const {
        return m_pos > 0 && m_pos <= m_items.size() ? m_items.at(m_pos - 1) : nullptr;
    }
    // Back to the first item.
    void reset() { m_pos = 0; }
    int count() const { return static_cast<int>(m_items.size()); }
    const QList<T *> &items() const { return m_items; }

private:
    QList<T *> m_items;
    qsizetype m_pos = 0;
};

class SgNode;
class SgSkeleton;
class SgBone;
using SgNodeList = QList<SgNode *>;
using SgSkeletonList = QList<SgSkeleton *>;
using SgBoneList = QList<SgBone *>;
using SgNodeListIterator = SgTListIterator<SgNode>;
using SgSkeletonListIterator = SgTListIterator<SgSkeleton>;
