#pragma once

#include "sgcore/scene/sgelement.h"

class SgNode;
class SgVertexMesh;

// A deformer in an object's modifier stack (morphs, skin bindings). The object's cached
// geometry is its base geometry with every modifier's `apply` run in stack order; reverse
// deformation runs `applyInverse` from the last modifier to the first.
// A modifier's element parent is the object that holds it.
class SgModifier : public SgElement {
public:
    SgModifier() = default;
    explicit SgModifier(const QString &name) : SgElement(name) {}

    // Deforms `mesh` (the object's geometry so far, same vertex order as the base geometry)
    // for `node` (the node that owns the object; may be null).
    virtual void apply(SgVertexMesh *mesh, SgNode *node) const = 0;
    // Undoes `apply` on `mesh`, as far as the deformation can be undone.
    virtual void applyInverse(SgVertexMesh *mesh, SgNode *node) const = 0;
    // True for modifiers that only change the shape (morphs), false for those that pose it
    // (skin bindings). Morph-only geometry applies only the former.
    virtual bool isMorphModifier() const { return false; }
};
