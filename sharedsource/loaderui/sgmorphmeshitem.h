#pragma once

#include "sharedsource/loaderui/sgmorphfileitem.h"

class SgNode;
class SgVertexMesh;

// A top-level row of the source list for geometry held in memory (returned by the modeler),
// shown as "FacMorph". It keeps a reference on the geometry and the node it came from, starts
// expanded, and presets the rows for a figure exported as one welded mesh: "Scenara Exported:",
// "Used Bone Welds:", "Removed Unused Vertices:" and "Reverse Deformations:" yes, "Ignored
// Invisible Nodes:" no.
class SgMorphMeshItem : public SgMorphFileItem {
public:
    static constexpr int Type = 52430;

    // Takes a reference on `mesh` (may be null); `node` is not owned.
    SgMorphMeshItem(QTreeWidget *list, SgVertexMesh *mesh, SgNode *node);
    // Drops the reference on the geometry.
    ~SgMorphMeshItem() override;

    SgVertexMesh *mesh() const { return m_mesh; }
    SgNode *node() const { return m_node; }

private:
    void presetSettingRows();

    SgVertexMesh *m_mesh;
    SgNode *m_node;
};
