#include "tests/support/sgtestscene.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

SgPolyMesh *sgTestMesh(const std::vector<SgVec3> &vertices, const std::vector<SgVec2> &uvs) {
    auto *mesh = new SgPolyMesh;
    mesh->beginEdit(true);
    std::copy(vertices.begin(), vertices.end(), mesh->setVertexArray(int(vertices.size())));
    if (!uvs.empty()) {
        auto *map = new SgMap(SgMap::UVMap);
        for (const SgVec2 &uv : uvs)
            map->appendPnt2Value(uv.u, uv.v);
        mesh->setUVList(map);
    }
    mesh->finishEdit();
    return mesh;
}

void sgTestAddFacet(SgPolyMesh &mesh, int material, const std::vector<std::vector<int>> &corners) {
    mesh.beginEdit(false);
    mesh.activateMaterial(material);
    mesh.startFace();
    for (const std::vector<int> &c : corners)
        mesh.addFaceEdge(c.at(0), c.size() > 1 ? c[1] : -1, c.size() > 2 ? c[2] : -1);
    mesh.finishFace();
    mesh.finishEdit();
}

SgPolyMesh *sgTestPolygon(const std::vector<SgVec3> &vertices) {
    SgPolyMesh *mesh = sgTestMesh(vertices);
    std::vector<std::vector<int>> corners;
    for (int i = 0; i < int(vertices.size()); ++i)
        corners.push_back({i});
    sgTestAddFacet(*mesh, 0, corners);
    return mesh;
}

SgPolyMesh *sgTestRowMesh(int count, float offset) {
    std::vector<SgVec3> vertices;
    for (int i = 0; i < count; ++i)
        vertices.emplace_back(float(i) + offset, 2.0f * float(i), 3.0f * float(i));
    SgPolyMesh *mesh = sgTestMesh(vertices);
    for (int i = 0; i + 3 < count; i += 4)
        sgTestAddFacet(*mesh, 0, {{i}, {i + 1}, {i + 2}, {i + 3}});
    return mesh;
}

SgPolyMesh *sgTestCopyVertices(const SgVertexMesh &mesh) {
    auto *copy = new SgPolyMesh;
    const int count = mesh.getVertexCount();
    std::copy(mesh.getVertices(), mesh.getVertices() + count, copy->setVertexArray(count));
    return copy;
}

SgPolyShape *sgTestShape(const QString &name, SgVertexMesh *mesh, const QStringList &materials) {
    auto *shape = new SgPolyShape(name);
    shape->setGeometry(mesh);
    for (const QString &material : materials)
        shape->addMaterial(new SgDefaultMaterial(material));
    return shape;
}

SgNode *sgTestProp(const QString &name, SgVec3 at) {
    return sgTestNode(name, sgTestPolygon({at, at + SgVec3(10, 0, 0), at + SgVec3(0, 10, 0)}));
}

SgVertexMesh *sgTestGeometry(SgNode *node) {
    return node->getObject()->getCurrentShape()->getGeometry();
}

SgSkeleton *sgTestFigure(const QString &name, int bones, int rows, bool unusedVertex) {
    auto *figure = new SgSkeleton(name);
    SgNode *parent = figure;
    const int column = rows + 1;
    for (int b = 0; b < bones; ++b) {
        auto *bone = new SgBone(QStringLiteral("bone%1").arg(b));
        bone->setLabel(QStringLiteral("Bone %1").arg(b));
        bone->setOrigin(SgVec3(float(b), 0, 0));
        figure->addBone(bone, parent);
        parent = bone;

        std::vector<SgVec3> vertices;
        std::vector<SgVec2> uvs;
        for (int side = 0; side < 2; ++side) {
            for (int r = 0; r <= rows; ++r) {
                vertices.emplace_back(float(b + side), float(r), 0.0f);
                uvs.push_back({float(side), float(r) / float(rows)});
            }
        }
        if (unusedVertex)
            vertices.emplace_back(float(b) + 0.5f, -1.0f, 0.0f);
        SgPolyMesh *mesh = sgTestMesh(vertices, uvs);
        for (int r = 0; r < rows; ++r)
            sgTestAddFacet(*mesh, b % 2,
                           {{r, r},
                            {column + r, column + r},
                            {column + r + 1, column + r + 1},
                            {r + 1, r + 1}});
        sgTestAttach(bone, sgTestShape(bone->getName(), mesh,
                                       {QStringLiteral("Skin"), QStringLiteral("Cloth")}));
    }
    return figure;
}

void SgTestCleanScene::SetUp() {
    sgApp->getScene()->clear();
    sgApp->getMessageSink()->clear();
}

void SgTestCleanScene::TearDown() {
    sgApp->getScene()->clear();
}
