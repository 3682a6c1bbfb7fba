#include "sgcore/scene/sgnode.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

#include <algorithm>

SgNode::SgNode() = default;
SgNode::SgNode(const QString &name) : SgElement(name) {}

SgNode::~SgNode() {
    setParent(nullptr);
    for (SgNode *c : m_children) {
        c->m_parent = nullptr;
    }
    delete m_object;
}

void SgNode::setObject(SgObject *object) {
    if (object == m_object) {
        return;
    }
    delete m_object;
    m_object = object;
    if (m_object) {
        m_object->setNode(this);
    }
}

bool SgNode::setParent(SgNode *parent) {
    for (SgNode *p = parent; p; p = p->m_parent) {
        if (p == this) {
            return false;
        }
    }
    if (m_parent) {
        auto &sibs = m_parent->m_children;
        sibs.erase(std::remove(sibs.begin(), sibs.end(), this), sibs.end());
    }
    m_parent = parent;
    if (parent) {
        parent->m_children.push_back(this);
    }
    return true;
}

void SgNode::getNodeChildren(SgNodeList &list, bool recursive) const {
    for (SgNode *c : m_children) {
        list.append(c);
        if (recursive) {
            c->getNodeChildren(list, true);
        }
    }
}

void SgNode::setOrigin(const SgVec3 &origin, bool moveChildren) {
    const SgVec3 offset = origin - m_origin;
    m_origin = origin;
    if (moveChildren) {
        SgNodeList below;
        getNodeChildren(below, true);
        for (SgNode *n : below) {
            n->m_origin += offset;
        }
    }
}

SgMatrix4 SgNode::getWSTransform() const {
    SgMatrix4 w = SgMatrix4::fromRotationTranslation(m_rotation, m_origin + m_translation);
    if (m_parent) {
        // The parent's transform applies to coordinates relative to the parent's origin.
        const SgMatrix4 toParent = SgMatrix4::fromTranslation(-m_parent->m_origin);
        w = w * toParent * m_parent->getWSTransform();
    }
    return w;
}

bool SgSkeleton::addBone(SgBone *bone, SgNode *parent) {
    if (!bone || (parent && parent != this && parent->getSkeleton() != this)) {
        return false;
    }
    if (!bone->setParent(parent ? parent : this)) {
        return false;
    }
    bone->setSkeleton(this);
    return true;
}

SgBoneList SgSkeleton::getAllBones() const {
    SgNodeList below;
    getNodeChildren(below, true);
    SgBoneList bones;
    for (SgNode *n : below) {
        auto *b = dynamic_cast<SgBone *>(n);
        if (b && b->getSkeleton() == this) {
            bones.append(b);
        }
    }
    return bones;
}

SgBone *SgSkeleton::findBone(const QString &name) const {
    const SgBoneList bones = getAllBones();
    for (SgBone *b : bones) {
        if (b->getName() == name) {
            return b;
        }
    }
    for (SgBone *b : bones) {
        if (b->getLabel() == name) {
            return b;
        }
    }
    return nullptr;
}
