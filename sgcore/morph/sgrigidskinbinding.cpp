#include "sgcore/morph/sgrigidskinbinding.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

void SgRigidSkinBinding::apply(SgVertexMesh *mesh, SgNode *node) const {
    if (!mesh || !node)
        return;
    const SgMatrix4 posing =
        SgMatrix4::fromTranslation(-node->getOrigin()) * node->getWSTransform();
    mesh->transform(posing);
}

void SgRigidSkinBinding::applyInverse(SgVertexMesh *, SgNode *) const {}

int SgRigidSkinBinding::bindFigure(SgSkeleton *figure) {
    if (!figure)
        return 0;
    int added = 0;
    for (SgBone *bone : figure->getAllBones()) {
        SgObject *object = bone->getObject();
        if (object && findJointIndex(object) < 0 &&
            object->addModifier(new SgRigidSkinBinding, -1) == 0)
            ++added;
    }
    return added;
}
