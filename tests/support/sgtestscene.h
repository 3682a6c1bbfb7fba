#pragma once

// Meshes, nodes and figures made in code for the tests (part of the `sgtestmain` library).
// Every builder returns a new object that the caller (or the node it is given to) owns; meshes
// start with reference count 0, as the host's own readers hand them out.

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/geometry/sgvec3.h"

#include <QString>
#include <QStringList>

#include <gtest/gtest.h>

#include <vector>

class SgSkeleton;

// A test fixture that starts and ends with an empty scene, and starts with an empty host log.
class SgTestCleanScene : public ::testing::Test {
protected:
    void SetUp() override;
    void TearDown() override;
};

// A mesh with `vertices` and, when `uvs` is not empty, a UV list; no facets.
SgPolyMesh *sgTestMesh(const std::vector<SgVec3> &vertices, const std::vector<SgVec2> &uvs = {});

// Adds one facet in `material` whose corners are {vertex[, uv[, third]]} (-1: none).
void sgTestAddFacet(SgPolyMesh &mesh, int material, const std::vector<std::vector<int>> &corners);

// A mesh of `vertices` with one facet over all of them, in material 0.
SgPolyMesh *sgTestPolygon(const std::vector<SgVec3> &vertices);

// `count` vertices at (i + offset, 2i, 3i) with a quad over each run of four.
SgPolyMesh *sgTestRowMesh(int count, float offset = 0.0f);

// A copy of the vertices of `mesh`, without facets.
SgPolyMesh *sgTestCopyVertices(const SgVertexMesh &mesh);

// A shape named `name` that holds `mesh` and one default material per name in `materials`.
SgPolyShape *sgTestShape(const QString &name, SgVertexMesh *mesh,
                         const QStringList &materials = {QStringLiteral("Skin")});

// Gives `node` an object named like it whose current shape is `shape`; returns `node`.
template <typename Node> Node *sgTestAttach(Node *node, SgShape *shape) {
    auto *object = new SgObject(node->getName());
    object->addShape(shape);
    node->setObject(object);
    return node;
}

// A node (or bone, or figure) named `name` whose object shows `mesh` (material "Skin").
template <typename Node = SgNode> Node *sgTestNode(const QString &name, SgVertexMesh *mesh) {
    return sgTestAttach(new Node(name), sgTestShape(name, mesh));
}

// A prop named `name` showing the triangle (at, at + (10, 0, 0), at + (0, 10, 0)).
SgNode *sgTestProp(const QString &name, SgVec3 at = SgVec3());

// The base geometry of a node made by these builders (its object's current shape).
SgVertexMesh *sgTestGeometry(SgNode *node);

// A figure (not added to any scene) whose bones form a chain: bone i ("bone<i>", label
// "Bone <i>") covers the strip x in [i, i + 1], y in [0, rows], as `rows` quads. Its vertices
// are the left column (x = i, y = 0 .. rows) followed by the right column (x = i + 1),
// 2 * (rows + 1) vertices, each with its own UV. Neighbouring bones share their seam column:
// the same positions, duplicated in each bone, exactly as a figure split into bones carries
// them. Even bones use material "Skin", odd bones "Cloth" (each bone's shape has both
// materials, in that order). Bone i's origin is (i, 0, 0); bone 0 hangs below the figure, each
// further bone below the one before. With `unusedVertex` each bone gets one more vertex at
// (i + 0.5, -1, 0) that no facet uses.
SgSkeleton *sgTestFigure(const QString &name, int bones, int rows, bool unusedVertex = false);
