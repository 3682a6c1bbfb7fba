#pragma once

#include "sgcore/scene/sgnode.h"

class SgBone;

// A figure: a node whose bones hang below it in a hierarchy. A figure can follow another
// figure (clothing that follows a body).
class SgSkeleton : public SgNode {
public:
    SgSkeleton() = default;
    explicit SgSkeleton(const QString &name) : SgNode(name) {}

    SgSkeleton *getSkeleton() const override { return const_cast<SgSkeleton *>(this); }

    // Makes `bone` a bone of this figure under `parent` (a bone of this figure, or null for
    // the figure itself). The bone is not added to any scene here (SgScene::addNode with its
    // children does that). Returns false for null or a parent of another figure.
    bool addBone(SgBone *bone, SgNode *parent = nullptr);
    // Every bone of the figure in hierarchy order: depth first, a bone before its children,
    // children in adding order. O(descendants).
    SgBoneList getAllBones() const;
    // The first bone named `name` (exact; failing that, labelled `name`), or null.
    SgBone *findBone(const QString &name) const;

    // The figure this one follows, or null.
    SgSkeleton *getFollowTarget() const { return m_followTarget; }
    void setFollowTarget(SgSkeleton *target) { m_followTarget = target; }

private:
    SgSkeleton *m_followTarget = nullptr;
};
