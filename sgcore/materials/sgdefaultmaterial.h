#pragma once

#include "sgcore/materials/sgmaterial.h"

#include <QColor>

class SgColorProperty;
class SgFloatProperty;
class SgTexture;

// The host's standard material. It is made with five properties, found by name:
//   "Diffuse Color"    colour, mappable (the colour map); default white (255, 255, 255)
//   "Specular Color"   colour, mappable; default black
//   "Glossiness"       float 0 to 1, mappable; default 0
//   "Opacity Strength" float 0 to 1, mappable; default 1 (the opacity control)
//   "Bump Strength"    float, mappable (the bump map); default 0
// The setters below write those properties. There is no bump-map setter: a bump map is
// mapped through the "Bump Strength" property itself (`getBumpControl`).
class SgDefaultMaterial : public SgMaterial {
public:
    explicit SgDefaultMaterial(const QString &name = QString());
    SgMaterial *clone() const override;

    void setDiffuseColor(const QColor &color);
    QColor getDiffuseColor() const;
    // Maps "Diffuse Color" to `texture` (null unmaps it).
    void setColorMap(SgTexture *texture);
    SgTexture *getColorMap() const;
    void setSpecularColor(const QColor &color);
    QColor getSpecularColor() const;
    void setGlossinessStrength(float value);
    float getGlossinessStrength() const;
    void setOpacityStrength(float value);
    float getOpacityStrength() const;
    void setBumpStrength(float value);
    float getBumpStrength() const;
    // The image "Bump Strength" is mapped to, or null.
    SgTexture *getBumpMap() const;

    // The five properties (null only if a caller removed them).
    SgColorProperty *getDiffuseColorProperty() const;
    SgColorProperty *getSpecularColorProperty() const;
    SgFloatProperty *getGlossinessControl() const;
    SgFloatProperty *getOpacityControl() const;
    SgFloatProperty *getBumpControl() const;
};
