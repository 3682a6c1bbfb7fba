#pragma once

// What the end-to-end tests share: the bridge with the steps a user's clicks reach made
// callable, and the morph a return leaves on a node.

#include "bridge/sgfacbridge.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/scene/sgnode.h"

class E2eBridge : public SgFacBridge {
public:
    using SgFacBridge::closing;
    using SgFacBridge::executeAction;
    using SgFacBridge::importReturnedShape;
};

// The morph `name` on the node's object, or null.
inline SgMorph *e2eMorphOn(SgNode *node, const QString &name = QStringLiteral("MyMorph")) {
    return node && node->getObject()
               ? dynamic_cast<SgMorph *>(node->getObject()->findModifier(name))
               : nullptr;
}

inline int e2eModifierCount(const SgNode *node) {
    return node->getObject() ? node->getObject()->getModifierCount() : 0;
}
