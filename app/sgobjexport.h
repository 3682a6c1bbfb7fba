#pragma once

#include <QString>

class SgNode;

// "File > Export OBJ...": writes a node's current geometry, that is its shape with the object's
// modifier stack applied (morphs at their current values, poses), as a Wavefront OBJ file with
// its UVs, and the node's materials as an MTL file of the same base name beside it ("mtllib").
// A figure is written bone by bone, each bone's geometry as a face group named after the bone,
// in the figure's bone order; any other node as one group named after its label. Vertex order
// inside each group is the node's own, so the file can be compared vertex by vertex.
class SgObjExport {
public:
    // Writes `node` to `path`. False, with `error` set, when the node has no geometry to
    // write or the file cannot be written. Cost: linear in vertices and facet corners.
    static bool exportNode(SgNode *node, const QString &path, QString *error = nullptr);
};
