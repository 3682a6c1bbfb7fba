#pragma once

#include "sgcore/scene/sglistiterator.h"

#include <cstdint>
#include <memory>
#include <vector>

class SgBone;
class SgNode;
class SgMap;
class SgPolyMesh;
class SgPolyShape;
class SgSkeleton;
class SgVertexMesh;

// Welds the bones of a figure into one polygon mesh and turns an edited copy of that mesh
// back into per-bone geometry.
//
// The welded mesh holds the bones in welder order (see getOrderedBones), each bone's facets
// in a face group named after the bone (SgBase::getName), with the bone's UVs and with
// material indices into the figure's materials: every material name used by the bones' shapes,
// in order of first appearance (bone order, then each shape's material order). The welder's
// shape carries a copy of those materials and is named after the figure's label.
//
// The flags, in constructor order:
//   ignoreInvisible   Hidden bones (SgNode::isHidden) are left out of the weld. Their
//                     geometry is not in the welded mesh and `unWeld` gives them no group.
//   weldGeometry      Vertices of different bones at exactly the same position (seam
//                     vertices) become one welded vertex, so that an edit moves the seam on
//                     every bone that shares it. A vertex joins the first vertex of an earlier
//                     bone at its position; vertices of one bone are never joined to each
//                     other (the bone keeps its own vertex count). Off: the welded mesh is the
//                     bones' geometry side by side.
//   removeUnused      Vertices that none of the bone's own facets use are left out of the
//                     welded mesh; `unWeld` gives them back at their own position.
//                     Off: they are kept as loose welded vertices and follow edits.
//   morphedGeometry   Each bone's geometry is taken with its morphs applied (the modifiers
//                     whose isMorphModifier() is true: getMorphOnlyGeom), so that the user
//                     edits what the figure shows; `unWeld` takes the same morphs back out, so
//                     the result is again relative to the bones' base geometry. Off: the
//                     bones' base geometry as stored.
// Bones without an object, a current shape or polygon-mesh geometry contribute nothing.
//
// Round trip contract: for each bone B of the weld, the face group named after B in
// `unWeld(edited)` uses exactly B's vertices, so that the group extraction "vertices used by
// the group's facets, each once, in ascending index order" yields B's vertex count and order,
// and each such vertex is the edited position of its welded vertex (or B's own position for a
// vertex left out of the weld). Unweld of an unchanged welded mesh therefore gives every bone
// exactly its own vertices, and moving one welded vertex changes exactly that vertex in each
// bone that shares it. (Each bone's vertices form one block of the result, in bone order;
// vertices that none of the bone's facets use are carried by extra degenerate facets of the
// group, so that the extraction still finds them.)
//
// The welder keeps pointers to the bones and a reference on each bone's geometry: use it while
// the figure exists and its geometry is not edited.
//
// Cost: building and unWeld are O(total vertices + total corners) (a hash on positions for
// welding), independent of the number of bones.
class SgFigureWelder {
public:
    // Welds every bone of `figure` (hierarchy order).
    SgFigureWelder(SgSkeleton *figure, bool ignoreInvisible, bool weldGeometry, bool removeUnused,
                   bool morphedGeometry);
    // Welds the given bones in the given order (use getOrderedBones for welder order). `flags`
    // is reserved and must be 0. Null entries and repeated bones are skipped.
    SgFigureWelder(const SgBoneList &bones, bool ignoreInvisible, bool weldGeometry,
                   bool removeUnused, bool morphedGeometry, int flags = 0);
    ~SgFigureWelder();
    SgFigureWelder(const SgFigureWelder &) = delete;
    SgFigureWelder &operator=(const SgFigureWelder &) = delete;

    // The welded shape (owned by the welder): named after the figure's label, holding the
    // welded mesh and the figure's materials.
    SgPolyShape *getShape() const;
    // The welded mesh (owned by the welder through its shape); never null, possibly empty.
    SgPolyMesh *getGeometry() const;
    // The bones of the weld, in welder order (after leaving out invisible ones).
    const SgBoneList &getBones() const { return m_bones; }
    // Material index map for subdivision patches: entry i is the welded material index that a
    // patch of material index i belongs to. This welder welds polygon meshes only, so the map
    // is the identity over the figure's materials.
    const std::vector<int32_t> &getSubDTextureMap() const { return m_subdMap; }
    // For each welded vertex, how many bone vertices it stands for (>= 1).
    std::vector<int32_t> getWeldCounts() const;

    // Turns `edited` (the welded mesh with moved vertices; only its positions are used) back
    // into per-bone geometry as described above: a new SgPolyMesh (reference count 0) with one
    // face group per bone. Null when `edited` is null or its vertex count differs from the
    // welded mesh's. O(total vertices + total corners).
    SgVertexMesh *unWeld(const SgVertexMesh *edited) const;

    // The geometry of `node`'s current shape with the object's morph modifiers applied in
    // stack order: the base geometry itself when no morph modifier exists, otherwise a new
    // copy (reference count 0; the caller references or deletes it). Null without geometry.
    static SgVertexMesh *getMorphOnlyGeom(SgNode *node);
    // The bones that `nodes` stand for, in welder order: a figure stands for all its bones, a
    // bone for itself, other nodes for nothing; the result lists each figure's bones in the
    // figure's hierarchy order (figures in order of first mention), each bone once.
    static SgBoneList getOrderedBones(const SgNodeList &nodes);

private:
    struct BoneSlice;
    // unWeld's vertices alone (null like unWeld).
    SgPolyMesh *unWeldVertices(const SgVertexMesh *edited) const;
    // The bones' UV lists one after the other (null when none has UVs).
    SgMap *joinedUVs() const;
    // Gives the welded mesh its UVs and facets, once: an un-weld alone needs neither, so they
    // are made only when the welded shape or mesh is asked for.
    void complete() const;
    void build(SgSkeleton *figure, bool ignoreInvisible, bool weldGeometry, bool removeUnused);

    SgBoneList m_bones;
    SgPolyShape *m_shape = nullptr;
    std::vector<int32_t> m_subdMap;
    std::vector<BoneSlice> m_slices;
    bool m_morphed = false;
    mutable bool m_complete = false;
};
