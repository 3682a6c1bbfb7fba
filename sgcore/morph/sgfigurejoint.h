#pragma once

#include "sgcore/geometry/sgmodifier.h"

class SgBone;
class SgObject;

// Base of the modifiers that pose a figure's bone (its joint). A bone's object holds at most
// one joint in its modifier stack; morphs are placed before it (they shape the rest position)
// or, with "apply after joint", right after it.
class SgFigureJoint : public SgModifier {
public:
    SgFigureJoint() = default;
    explicit SgFigureJoint(const QString &name) : SgModifier(name) {}

    // The index of the bone's joint in its object's modifier stack; -1 for null, a bone
    // without an object, or an object without a joint. O(modifiers).
    static int findJoint(SgBone *bone);
    // The same for an object. O(modifiers).
    static int findJointIndex(const SgObject *object);
};
