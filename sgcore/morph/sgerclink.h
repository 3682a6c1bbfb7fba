#pragma once

#include "sgcore/properties/sgcontroller.h"

#include <memory>

class SgNumericProperty;

// An expression link (ERC): a controller that drives a channel (the numeric property holding
// the link) from a control property. With v the channel's value so far (its raw value, or the
// result of the controllers before this one), c the control property's value as readers see it
// (its own controllers and clamping included), s the scale and o the offset:
//
//   type 0 "ERC[DeltaAdd]":    v + s * (c - o)  the channel follows the control's change from
//                                               the rest value o, scaled by s (the morph loader
//                                               passes o = 0, so a control at 1 adds s)
//   type 1 "ERC[DivideInto]":  c / v            the channel's value divides into the control's
//   type 2 "ERC[DivideBy]":    v / c            the channel's value divided by the control's
//   type 3 "ERC[Multiply]":    v * c            the control scales the channel
//   type 4 "ERC[Subtract]":    v - c            the control is taken off the channel
//   type 5 "ERC[Add]":         v + c            the control is added to the channel as it is
//
// Scale and offset matter to DeltaAdd only. A division by zero, any other non-finite result, a
// type outside 0 to 5 and a control property that no longer exists leave v unchanged.
class SgERCLink : public SgController {
public:
    enum Type : int {
        DeltaAdd = 0,
        DivideInto = 1,
        DivideBy = 2,
        Multiply = 3,
        Subtract = 4,
        Add = 5
    };

    // A link of `type` reading `property` (not owned; the link notices when it is destroyed).
    SgERCLink(int type, SgNumericProperty *property, float scale, float offset);

    float evaluate(float value, const SgNumericProperty &channel) const override;
    // The control property, or null once it has been destroyed.
    SgNumericProperty *getLinkProperty() const override;
    // "ERC[DeltaAdd]" ... "ERC[Add]"; "ERC[Unknown]" outside 0 to 5.
    QString getTypeName() const override { return typeName(m_type); }

    // The control property the link reads now (same as getLinkProperty).
    SgNumericProperty *getProperty() const { return getLinkProperty(); }
    void setProperty(SgNumericProperty *property);
    int getType() const { return m_type; }
    void setType(int type) { m_type = type; }
    float getScale() const { return m_scale; }
    void setScale(float scale) { m_scale = scale; }
    float getOffset() const { return m_offset; }
    void setOffset(float offset) { m_offset = offset; }

    static QString typeName(int type);

private:
    int m_type;
    SgNumericProperty *m_property = nullptr;
    std::weak_ptr<const void> m_propertyLife;
    float m_scale;
    float m_offset;
};
