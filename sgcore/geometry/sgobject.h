#pragma once

#include "sgcore/scene/sgelement.h"

#include <vector>

class SgModifier;
class SgNode;
class SgShape;
class SgVertexMesh;

// What a node shows: a list of shapes with one current shape, and a modifier stack that
// deforms the current shape's geometry. Owns its shapes and modifiers.
class SgObject : public SgElement {
public:
    SgObject();
    explicit SgObject(const QString &name);
    ~SgObject() override;

    // The node that holds this object (set by SgNode::setObject), or null.
    SgNode *getNode() const { return m_node; }
    void setNode(SgNode *node) { m_node = node; }

    // Inserts `shape` at `index` (-1 or past the end appends) and takes ownership: 0, or
    // SgResult::Failed for null or a shape already held. The first shape becomes current.
    int addShape(SgShape *shape, int index = -1);
    int getShapeCount() const { return static_cast<int>(m_shapes.size()); }
    SgShape *getShape(int index) const;
    // Removes and deletes `shape`: 0, or SgResult::Failed when not held.
    int removeShape(SgShape *shape);
    // The current shape (null without shapes).
    SgShape *getCurrentShape() const;
    int getCurrentShapeIndex() const { return m_current; }
    // Makes shape `index` current; an index outside the list is ignored.
    void setCurrentShape(int index);

    // Inserts `modifier` into the stack at `index` (-1 or past the end appends) and takes
    // ownership; its element parent becomes this object. 0, or SgResult::Failed for null or a
    // modifier already in a stack.
    int addModifier(SgModifier *modifier, int index = -1);
    // Removes `modifier` from the stack and deletes it: 0, or SgResult::Failed when absent.
    int removeModifier(SgModifier *modifier);
    // Removes `modifier` without deleting it (its parent becomes null); null when absent.
    SgModifier *takeModifier(SgModifier *modifier);
    int getModifierCount() const { return static_cast<int>(m_modifiers.size()); }
    SgModifier *getModifier(int index) const;
    int getModifierIndex(const SgModifier *modifier) const;
    const std::vector<SgModifier *> &getModifiers() const { return m_modifiers; }
    // The first modifier named `name`, or null.
    SgModifier *findModifier(const QString &name) const;

    // The current shape's geometry with every modifier applied in stack order, recomputed on
    // each call into a mesh that the object keeps (valid until the next call, a change of
    // shape, or the object's destruction; do not unref it). Null without geometry.
    // O(V x modifiers) plus a copy of the geometry.
    SgVertexMesh *getCachedGeom();

private:
    SgNode *m_node = nullptr;
    std::vector<SgShape *> m_shapes;
    std::vector<SgModifier *> m_modifiers;
    int m_current = -1;
    SgVertexMesh *m_cache = nullptr;
    const SgVertexMesh *m_cacheBase = nullptr;
};
