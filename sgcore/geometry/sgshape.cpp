#include "sgcore/geometry/sgshape.h"

#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgmaterial.h"

SgShape::SgShape() = default;
SgShape::SgShape(const QString &name) : SgElement(name) {}

SgShape::~SgShape() {
    setGeometry(nullptr);
    clearMaterials();
}

void SgShape::setGeometry(SgVertexMesh *geometry) {
    if (geometry == m_geometry) {
        return;
    }
    if (geometry) {
        geometry->ref();
    }
    SgVertexMesh *old = m_geometry;
    m_geometry = geometry;
    if (old) {
        old->unref();
    }
}

SgMaterial *SgShape::getMaterial(int index) const {
    return index >= 0 && index < getMaterialCount() ? m_materials[size_t(index)] : nullptr;
}

SgMaterial *SgShape::findMaterial(const QString &name) const {
    return getMaterial(findMaterialIndex(name));
}

int SgShape::findMaterialIndex(const QString &name) const {
    for (size_t i = 0; i < m_materials.size(); ++i) {
        if (m_materials[i]->getName() == name) {
            return static_cast<int>(i);
        }
    }
    return -1;
}

int SgShape::addMaterial(SgMaterial *material) {
    if (!material) {
        return -1;
    }
    material->setElementParent(this);
    m_materials.push_back(material);
    return getMaterialCount() - 1;
}

void SgShape::clearMaterials() {
    for (SgMaterial *m : m_materials) {
        delete m;
    }
    m_materials.clear();
}

SgPolyMesh *SgPolyShape::getPolyMesh() const {
    return dynamic_cast<SgPolyMesh *>(getGeometry());
}

void SgPolyShape::setPolyMesh(SgPolyMesh *mesh) {
    setGeometry(mesh);
}
