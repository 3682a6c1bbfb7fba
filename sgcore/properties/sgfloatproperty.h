#pragma once

#include "sgcore/properties/sgnumericproperty.h"

// A float property (sliders, morph value channels, control properties). Defaults: value 0,
// default 0, range 0 to 1 without clamping, sensitivity 0.01.
class SgFloatProperty : public SgNumericProperty {
public:
    SgFloatProperty() = default;
    explicit SgFloatProperty(const QString &name) : SgNumericProperty(name) {}
};
