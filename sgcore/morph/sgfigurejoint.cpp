#include "sgcore/morph/sgfigurejoint.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/scene/sgbone.h"

int SgFigureJoint::findJoint(SgBone *bone) {
    return bone ? findJointIndex(bone->getObject()) : -1;
}

int SgFigureJoint::findJointIndex(const SgObject *object) {
    if (!object)
        return -1;
    const auto &modifiers = object->getModifiers();
    for (size_t i = 0; i < modifiers.size(); ++i) {
        if (dynamic_cast<const SgFigureJoint *>(modifiers[i]))
            return int(i);
    }
    return -1;
}
