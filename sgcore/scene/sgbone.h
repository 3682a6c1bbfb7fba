#pragma once

#include "sgcore/scene/sgnode.h"

// A bone of a figure: a node whose figure is set when it is added to a skeleton
// (SgSkeleton::addBone). A bone's parent is another bone of the figure or the figure itself.
class SgBone : public SgNode {
public:
    SgBone() = default;
    explicit SgBone(const QString &name) : SgNode(name) {}

    SgSkeleton *getSkeleton() const override { return m_skeleton; }
    void setSkeleton(SgSkeleton *skeleton) { m_skeleton = skeleton; }

private:
    SgSkeleton *m_skeleton = nullptr;
};
