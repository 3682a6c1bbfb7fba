#pragma once

#include "sgcore/scene/sgelement.h"

// Base of the materials of a shape: a named element whose properties describe its look.
class SgMaterial : public SgElement {
public:
    SgMaterial() = default;
    explicit SgMaterial(const QString &name) : SgElement(name) {}

    // A deep copy (name, label and property values); the copy has no parent.
    virtual SgMaterial *clone() const = 0;
};
