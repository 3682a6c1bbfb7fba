#include "sgcore/materials/sgdefaultmaterial.h"

#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/properties/sgfloatproperty.h"

namespace {
const QString kDiffuse = QStringLiteral("Diffuse Color");
const QString kSpecular = QStringLiteral("Specular Color");
const QString kGloss = QStringLiteral("Glossiness");
const QString kOpacity = QStringLiteral("Opacity Strength");
const QString kBump = QStringLiteral("Bump Strength");

SgColorProperty *makeColor(const QString &name, const QColor &c) {
    auto *p = new SgColorProperty(name);
    p->setColorValue(c);
    p->setDefaultValue(c.rgb());
    return p;
}

SgFloatProperty *makeFloat(const QString &name, float value) {
    auto *p = new SgFloatProperty(name);
    p->setValue(value);
    p->setDefaultValue(value);
    return p;
}

void unmapOrMap(SgProperty *p, SgTexture *texture) {
    if (!p) {
        return;
    }
    p->setMapValue(texture);
    p->setMapped(texture != nullptr);
}
} // namespace

SgDefaultMaterial::SgDefaultMaterial(const QString &name) : SgMaterial(name) {
    addProperty(makeColor(kDiffuse, Qt::white));
    addProperty(makeColor(kSpecular, Qt::black));
    addProperty(makeFloat(kGloss, 0.0f));
    addProperty(makeFloat(kOpacity, 1.0f));
    SgFloatProperty *bump = makeFloat(kBump, 0.0f);
    bump->setMin(-1.0f);
    addProperty(bump);
}

SgMaterial *SgDefaultMaterial::clone() const {
    auto *copy = new SgDefaultMaterial(getName());
    copy->setLabel(getLabel());
    const SgColorProperty *colors[2] = {getDiffuseColorProperty(), getSpecularColorProperty()};
    SgColorProperty *copyColors[2] = {copy->getDiffuseColorProperty(),
                                      copy->getSpecularColorProperty()};
    for (int i = 0; i < 2; ++i) {
        if (colors[i]) {
            copyColors[i]->setColorValue(colors[i]->getColorValue());
            copyColors[i]->setDefaultValue(colors[i]->getDefaultValue());
            copyColors[i]->setMapValue(colors[i]->getMapValue());
            copyColors[i]->setMapped(colors[i]->isMapped());
        }
    }
    const SgFloatProperty *floats[3] = {getGlossinessControl(), getOpacityControl(),
                                        getBumpControl()};
    SgFloatProperty *copyFloats[3] = {copy->getGlossinessControl(), copy->getOpacityControl(),
                                      copy->getBumpControl()};
    for (int i = 0; i < 3; ++i) {
        if (floats[i]) {
            copyFloats[i]->setValue(floats[i]->getRawValue());
            copyFloats[i]->setDefaultValue(floats[i]->getDefaultValue());
            copyFloats[i]->setMin(floats[i]->getMin());
            copyFloats[i]->setMax(floats[i]->getMax());
            copyFloats[i]->setMapValue(floats[i]->getMapValue());
            copyFloats[i]->setMapped(floats[i]->isMapped());
        }
    }
    return copy;
}

SgColorProperty *SgDefaultMaterial::getDiffuseColorProperty() const {
    return dynamic_cast<SgColorProperty *>(findProperty(kDiffuse));
}
SgColorProperty *SgDefaultMaterial::getSpecularColorProperty() const {
    return dynamic_cast<SgColorProperty *>(findProperty(kSpecular));
}
SgFloatProperty *SgDefaultMaterial::getGlossinessControl() const {
    return dynamic_cast<SgFloatProperty *>(findProperty(kGloss));
}
SgFloatProperty *SgDefaultMaterial::getOpacityControl() const {
    return dynamic_cast<SgFloatProperty *>(findProperty(kOpacity));
}
SgFloatProperty *SgDefaultMaterial::getBumpControl() const {
    return dynamic_cast<SgFloatProperty *>(findProperty(kBump));
}

void SgDefaultMaterial::setDiffuseColor(const QColor &color) {
    if (SgColorProperty *p = getDiffuseColorProperty()) {
        p->setColorValue(color);
    }
}
QColor SgDefaultMaterial::getDiffuseColor() const {
    const SgColorProperty *p = getDiffuseColorProperty();
    return p ? p->getColorValue() : QColor();
}
void SgDefaultMaterial::setColorMap(SgTexture *texture) {
    unmapOrMap(getDiffuseColorProperty(), texture);
}
SgTexture *SgDefaultMaterial::getColorMap() const {
    const SgColorProperty *p = getDiffuseColorProperty();
    return p ? p->getMapValue() : nullptr;
}
void SgDefaultMaterial::setSpecularColor(const QColor &color) {
    if (SgColorProperty *p = getSpecularColorProperty()) {
        p->setColorValue(color);
    }
}
QColor SgDefaultMaterial::getSpecularColor() const {
    const SgColorProperty *p = getSpecularColorProperty();
    return p ? p->getColorValue() : QColor();
}
void SgDefaultMaterial::setGlossinessStrength(float value) {
    if (SgFloatProperty *p = getGlossinessControl()) {
        p->setValue(value);
    }
}
float SgDefaultMaterial::getGlossinessStrength() const {
    const SgFloatProperty *p = getGlossinessControl();
    return p ? p->getValue() : 0.0f;
}
void SgDefaultMaterial::setOpacityStrength(float value) {
    if (SgFloatProperty *p = getOpacityControl()) {
        p->setValue(value);
    }
}
float SgDefaultMaterial::getOpacityStrength() const {
    const SgFloatProperty *p = getOpacityControl();
    return p ? p->getValue() : 0.0f;
}
void SgDefaultMaterial::setBumpStrength(float value) {
    if (SgFloatProperty *p = getBumpControl()) {
        p->setValue(value);
    }
}
float SgDefaultMaterial::getBumpStrength() const {
    const SgFloatProperty *p = getBumpControl();
    return p ? p->getValue() : 0.0f;
}
SgTexture *SgDefaultMaterial::getBumpMap() const {
    const SgFloatProperty *p = getBumpControl();
    return p ? p->getMapValue() : nullptr;
}
