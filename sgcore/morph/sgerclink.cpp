#include "sgcore/morph/sgerclink.h"

#include "sgcore/properties/sgnumericproperty.h"

#include <cmath>

SgERCLink::SgERCLink(int type, SgNumericProperty *property, float scale, float offset)
    : m_type(type), m_scale(scale), m_offset(offset) {
    setProperty(property);
}

void SgERCLink::setProperty(SgNumericProperty *property) {
    m_property = property;
    m_propertyLife = property ? property->getLifeToken() : std::weak_ptr<const void>();
}

SgNumericProperty *SgERCLink::getLinkProperty() const {
    return (m_property && !m_propertyLife.expired()) ? m_property : nullptr;
}

QString SgERCLink::typeName(int type) {
    switch (type) {
    case DeltaAdd:
        return QStringLiteral("ERC[DeltaAdd]");
    case DivideInto:
        return QStringLiteral("ERC[DivideInto]");
    case DivideBy:
        return QStringLiteral("ERC[DivideBy]");
    case Multiply:
        return QStringLiteral("ERC[Multiply]");
    case Subtract:
        return QStringLiteral("ERC[Subtract]");
    case Add:
        return QStringLiteral("ERC[Add]");
    default:
        return QStringLiteral("ERC[Unknown]");
    }
}

float SgERCLink::evaluate(float value, const SgNumericProperty &) const {
    const SgNumericProperty *control = getLinkProperty();
    if (!control)
        return value;
    const float c = control->getValue();
    float result = value;
    switch (m_type) {
    case DeltaAdd:
        result = value + m_scale * (c - m_offset);
        break;
    case DivideInto:
        result = c / value;
        break;
    case DivideBy:
        result = value / c;
        break;
    case Multiply:
        result = value * c;
        break;
    case Subtract:
        result = value - c;
        break;
    case Add:
        result = value + c;
        break;
    default:
        break;
    }
    return std::isfinite(result) ? result : value;
}
