#pragma once

#include "sgcore/morph/sgfigurejoint.h"

class SgSkeleton;

// The simplest skin binding: every vertex of a bone's object follows that bone rigidly. With it
// in the stack, an object's cached geometry is its posed shape: each bone turns by its local
// rotation about its origin, below the rotations of its parent bones (the node's world-space
// transform).
//
// Frames: `apply` takes rest-position scene coordinates to posed world coordinates,
// p -> W(p - origin). `applyInverse` works in the node's local frame, where the caller has
// already taken the world-space transform out (inverse of W) and puts the origin back
// afterwards; a rigid binding adds no deformation of its own in that frame, so it leaves the
// mesh as it is. (A weighted binding would undo its joint bending there.)
class SgRigidSkinBinding : public SgFigureJoint {
public:
    SgRigidSkinBinding() : SgFigureJoint(QStringLiteral("Skin Binding")) {}

    // O(V).
    void apply(SgVertexMesh *mesh, SgNode *node) const override;
    // Nothing to undo in the local frame (see the class comment).
    void applyInverse(SgVertexMesh *mesh, SgNode *node) const override;

    // Appends a binding to the object of every bone of `figure` whose object has no joint yet;
    // returns how many were added.
    static int bindFigure(SgSkeleton *figure);
};
