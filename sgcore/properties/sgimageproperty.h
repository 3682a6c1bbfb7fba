#pragma once

#include "sgcore/properties/sgproperty.h"

class SgTexture;

// A property whose value is an image (a texture of the image manager, not owned; may be null).
class SgImageProperty : public SgProperty {
public:
    SgImageProperty() = default;
    explicit SgImageProperty(const QString &name) : SgProperty(name) {}

    SgTexture *getValue() const { return m_value; }
    void setValue(SgTexture *texture) { m_value = texture; }

private:
    SgTexture *m_value = nullptr;
};
