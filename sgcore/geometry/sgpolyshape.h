#pragma once

#include "sgcore/geometry/sgshape.h"

class SgPolyMesh;

// A shape whose geometry is a polygon mesh.
class SgPolyShape : public SgShape {
public:
    SgPolyShape() = default;
    explicit SgPolyShape(const QString &name) : SgShape(name) {}

    // The geometry as a polygon mesh (null when none or of another kind).
    SgPolyMesh *getPolyMesh() const;
    // Same as setGeometry (takes a reference; null clears).
    void setPolyMesh(SgPolyMesh *mesh);
};
