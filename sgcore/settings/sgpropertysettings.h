#pragma once

#include "sgcore/settings/sgsettings.h"

// The attribute set of one property, as `SgProperty::getAttributes` fills it and
// `SgProperty::setAttributes` applies it: named values under the keys below. A key that is absent
// leaves the attribute as it is when applied, so a set can be partial. Written to and read from
// DOM elements through `SgSettings::toDOM`/`fromDOM`.
class SgPropertySettings : public SgSettings {
public:
    // Every property.
    static constexpr const char *Name = "Name";                 // String
    static constexpr const char *Label = "Label";               // String
    static constexpr const char *Path = "Path";                 // String
    static constexpr const char *Hidden = "Hidden";             // Bool
    static constexpr const char *Locked = "Locked";             // Bool
    static constexpr const char *CanAnimate = "CanAnimate";     // Bool
    static constexpr const char *UserProperty = "UserProperty"; // Bool
    // Numeric properties (float, int, numeric node).
    static constexpr const char *Value = "Value";                       // Float (the raw value)
    static constexpr const char *DefaultValue = "DefaultValue";         // Float
    static constexpr const char *Min = "Min";                           // Float
    static constexpr const char *Max = "Max";                           // Float
    static constexpr const char *Clamped = "Clamped";                   // Bool
    static constexpr const char *Sensitivity = "Sensitivity";           // Float
    static constexpr const char *DisplayAsPercent = "DisplayAsPercent"; // Bool
    // Numeric node properties.
    static constexpr const char *MustHaveNode = "MustHaveNode"; // Bool

    SgPropertySettings();
    ~SgPropertySettings() override;
};
