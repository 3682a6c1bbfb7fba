#include "tests/support/sgtestfigure.h"

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

SgSkeleton *sgTestMakeFigure(const QString &name, int bones, int rows, bool unusedVertex) {
    auto *figure = new SgSkeleton(name);
    SgNode *parent = figure;
    for (int b = 0; b < bones; ++b) {
        auto *bone = new SgBone(QStringLiteral("bone%1").arg(b));
        bone->setLabel(QStringLiteral("Bone %1").arg(b));
        bone->setOrigin(SgVec3(float(b), 0, 0));
        figure->addBone(bone, parent);
        parent = bone;

        auto *mesh = new SgPolyMesh;
        mesh->beginEdit(true);
        const int column = rows + 1;
        SgVec3 *v = mesh->setVertexArray(2 * column + (unusedVertex ? 1 : 0));
        auto *uvs = new SgMap(SgMap::UVMap);
        for (int side = 0; side < 2; ++side) {
            for (int r = 0; r <= rows; ++r) {
                v[side * column + r] = SgVec3(float(b + side), float(r), 0);
                uvs->appendPnt2Value(float(side), float(r) / float(rows));
            }
        }
        if (unusedVertex) {
            v[2 * column] = SgVec3(float(b) + 0.5f, -1, 0);
        }
        mesh->setUVList(uvs);
        mesh->activateMaterial(b % 2);
        for (int r = 0; r < rows; ++r) {
            mesh->startFace();
            mesh->addFaceEdge(r, r);
            mesh->addFaceEdge(column + r, column + r);
            mesh->addFaceEdge(column + r + 1, column + r + 1);
            mesh->addFaceEdge(r + 1, r + 1);
            mesh->finishFace();
        }
        mesh->finishEdit();

        auto *shape = new SgPolyShape(bone->getName());
        shape->setPolyMesh(mesh);
        shape->addMaterial(new SgDefaultMaterial(QStringLiteral("Skin")));
        shape->addMaterial(new SgDefaultMaterial(QStringLiteral("Cloth")));
        auto *object = new SgObject(bone->getName());
        object->addShape(shape);
        bone->setObject(object);
    }
    return figure;
}
