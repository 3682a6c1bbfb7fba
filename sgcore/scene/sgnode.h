#pragma once

#include "sgcore/geometry/sgmatrix4.h"
#include "sgcore/geometry/sgquat.h"
#include "sgcore/geometry/sgvec3.h"
#include "sgcore/scene/sgelement.h"
#include "sgcore/scene/sglistiterator.h"

#include <vector>

class SgObject;
class SgScene;
class SgSkeleton;

// A scene node: a named, labelled element in a parent/child hierarchy, with an origin (the
// pivot of its rotation), a local rotation, a translation, a hidden flag and an optional
// object (its geometry). A node owns its object; the scene owns its nodes.
//
// Geometry of an object is stored in rest position in scene coordinates. The world-space
// transform maps origin-relative coordinates to the world:
//     W(node) = R(localRot) * T(origin + translation) * T(-parent origin) * W(parent)
// (row vectors: the leftmost factor applies first; without a parent the last two drop out)
// so an unposed node (no rotation, no translation, no parent) has W = T(origin), and
// "inverse of W, then translate by the origin" gives back rest-position coordinates.
class SgNode : public SgElement {
public:
    SgNode();
    explicit SgNode(const QString &name);
    ~SgNode() override;

    // The node's object (null when none). Owned.
    SgObject *getObject() const { return m_object; }
    // Replaces the object (the old one is deleted) and takes ownership of the new one.
    void setObject(SgObject *object);

    // The figure this node belongs to: for a bone its figure, for a figure itself, otherwise
    // null.
    virtual SgSkeleton *getSkeleton() const { return nullptr; }

    // Hierarchy. Setting a parent appends this node to the parent's children (and removes
    // it from the old parent's); null detaches it. A node cannot become its own ancestor
    // (such a call is ignored and returns false).
    SgNode *getParent() const { return m_parent; }
    bool setParent(SgNode *parent);
    const std::vector<SgNode *> &getChildren() const { return m_children; }
    // Appends the node's children to `list`, with `recursive` all descendants depth first
    // (each child followed by its own descendants). O(descendants).
    void getNodeChildren(SgNodeList &list, bool recursive) const;

    SgVec3 getOrigin() const { return m_origin; }
    // Sets the origin. With `moveChildren` the origins of all descendants move by the same
    // offset (so a figure's bones keep their layout when the figure's origin moves).
    void setOrigin(const SgVec3 &origin, bool moveChildren = false);
    SgQuat getLocalRot() const { return m_rotation; }
    void setLocalRot(const SgQuat &rotation) { m_rotation = rotation; }
    SgVec3 getTranslation() const { return m_translation; }
    void setTranslation(const SgVec3 &translation) { m_translation = translation; }
    // See the class comment. O(depth).
    SgMatrix4 getWSTransform() const;

    bool isHidden() const { return m_hidden; }
    void setHidden(bool hidden) { m_hidden = hidden; }

    // The scene holding the node (set by SgScene::addNode), or null.
    SgScene *getScene() const { return m_scene; }
    void setScene(SgScene *scene) { m_scene = scene; }

private:
    SgObject *m_object = nullptr;
    SgNode *m_parent = nullptr;
    std::vector<SgNode *> m_children;
    SgScene *m_scene = nullptr;
    SgVec3 m_origin;
    SgVec3 m_translation;
    SgQuat m_rotation;
    bool m_hidden = false;
};
