#pragma once

#include "sgcore/geometry/sgmodifier.h"

#include <memory>

class SgFloatProperty;
class SgMorphDeltas;

// A morph: a modifier that moves vertices by its deltas times the value of its value channel.
//
// The value channel is a float property owned by the morph (its owner is the morph), named and
// labelled like the morph when the morph is made; controllers on it (ERC links) drive it from
// other properties. The channel's value is read, controllers included, each time the morph is
// applied.
//
// Frame: a morph that sits before the object's figure joint (or on an object without one) moves
// rest-position vertices, so its deltas are in the figure's rest frame. A morph placed after the
// joint moves posed vertices in the joint's frame: its deltas turn with the node's local
// rotation (the inverse of what the morph loader's "apply after joint" does to them).
class SgMorph : public SgModifier {
public:
    // A morph named `name` on `deltas` (taken; may be null for an empty morph).
    explicit SgMorph(const QString &name = QString(), SgMorphDeltas *deltas = nullptr);
    ~SgMorph() override;

    // Renames the morph; the value channel keeps the morph's name.
    void setName(const QString &name) override;

    // The value channel (never null; owned by the morph as one of its properties).
    SgFloatProperty *getValueChannel() const { return m_channel; }

    // The deltas (null for an empty morph). Owned.
    SgMorphDeltas *getDeltas() const { return m_deltas.get(); }
    // Replaces the deltas (taken; the old ones are deleted).
    void setDeltas(SgMorphDeltas *deltas);

    // Adds value x delta to each vertex that has an entry (see the class comment for the frame).
    // Entries beyond the mesh's vertex count are skipped. O(entries).
    void apply(SgVertexMesh *mesh, SgNode *node) const override;
    // Subtracts what `apply` adds. O(entries).
    void applyInverse(SgVertexMesh *mesh, SgNode *node) const override;
    bool isMorphModifier() const override { return true; }

    // True when the morph sits after the figure joint in its object's modifier stack.
    bool isAfterJoint() const;

private:
    void applyWeighted(SgVertexMesh *mesh, SgNode *node, float sign) const;

    SgFloatProperty *m_channel = nullptr;
    std::unique_ptr<SgMorphDeltas> m_deltas;
};
