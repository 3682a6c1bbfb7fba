#pragma once

#include "sgcore/properties/sgnodeproperty.h"

// A node property that only takes figures (SgSkeleton) or null.
class SgSkeletonProperty : public SgNodeProperty {
public:
    SgSkeletonProperty() = default;
    explicit SgSkeletonProperty(const QString &name) : SgNodeProperty(name) {}

protected:
    bool accepts(SgNode *node) const override;
};
