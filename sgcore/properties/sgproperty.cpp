#include "sgcore/properties/sgproperty.h"

SgProperty::SgProperty() : m_life(std::make_shared<int>(0)) {}
SgProperty::SgProperty(const QString &name) : SgBase(name), m_life(std::make_shared<int>(0)) {}
SgProperty::~SgProperty() = default;

void SgProperty::setMapValue(SgTexture *texture) {
    m_map = texture;
    if (texture) {
        m_mapped = true;
    }
}
