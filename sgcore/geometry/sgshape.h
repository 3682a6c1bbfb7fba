#pragma once

#include "sgcore/scene/sgelement.h"

#include <vector>

class SgMaterial;
class SgVertexMesh;

// One shape of an object: a name, a geometry (shared, reference counted) and the materials
// that the geometry's facets address by index.
class SgShape : public SgElement {
public:
    SgShape();
    explicit SgShape(const QString &name);
    ~SgShape() override;

    // The geometry (null when none). The shape holds one reference on it.
    SgVertexMesh *getGeometry() const { return m_geometry; }
    // Replaces the geometry: takes a reference on the new one, drops it on the old one.
    virtual void setGeometry(SgVertexMesh *geometry);

    // Materials in index order (facet material indices address this list). Owned.
    const std::vector<SgMaterial *> &getAllMaterials() const { return m_materials; }
    int getMaterialCount() const { return static_cast<int>(m_materials.size()); }
    SgMaterial *getMaterial(int index) const;
    // The first material named `name` (exact), or null. O(materials).
    SgMaterial *findMaterial(const QString &name) const;
    // The index of the first material named `name`, or -1.
    int findMaterialIndex(const QString &name) const;
    // Appends `material` and takes ownership (its parent becomes this shape); returns its
    // index, or -1 for null.
    int addMaterial(SgMaterial *material);
    // Removes and deletes every material.
    void clearMaterials();

private:
    SgVertexMesh *m_geometry = nullptr;
    std::vector<SgMaterial *> m_materials;
};
