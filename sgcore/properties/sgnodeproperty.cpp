#include "sgcore/properties/sgnodeproperty.h"

#include "sgcore/properties/sgskeletonproperty.h"
#include "sgcore/scene/sgskeleton.h"

bool SgNodeProperty::setValue(SgNode *node) {
    if (!accepts(node)) {
        return false;
    }
    m_value = node;
    return true;
}

bool SgNodeProperty::setDefaultValue(SgNode *node) {
    if (!accepts(node)) {
        return false;
    }
    m_default = node;
    return true;
}

bool SgNodeProperty::accepts(SgNode *) const {
    return true;
}

bool SgSkeletonProperty::accepts(SgNode *node) const {
    return !node || dynamic_cast<SgSkeleton *>(node) != nullptr;
}
