#pragma once

#include <cstdint>
#include <vector>

class SgPolyMesh;

// The face groups of one target mesh, gathered in one pass over its facets the first time a
// group is asked for: the vertices of every group, each once, in ascending order. A run over a
// node list keeps one, so matching a hundred bones costs one pass over the facets instead of
// one per bone.
//
// The cache belongs to one run: it holds a reference on a reference-counted mesh, so that the
// mesh cannot be freed and its address taken by another mesh while the cache still describes
// it. A mesh that nobody holds a reference on (count 0: owned by its caller directly) is only
// borrowed, never freed by the cache: the caller keeps it alive for the run. Asking for a group
// of another mesh gathers that mesh's groups instead. Not copyable.
class SgFaceGroupCache {
public:
    SgFaceGroupCache() = default;
    ~SgFaceGroupCache();
    SgFaceGroupCache(const SgFaceGroupCache &) = delete;
    SgFaceGroupCache &operator=(const SgFaceGroupCache &) = delete;

    // The vertices of face group `group` of `mesh`; null for a group the mesh does not have.
    // Valid until the next call with another mesh or the cache's end.
    const std::vector<int32_t> *groupVertices(SgPolyMesh *mesh, int group);

private:
    void release();

    SgPolyMesh *m_mesh = nullptr;
    bool m_held = false; // whether the cache holds a reference on m_mesh
    std::vector<std::vector<int32_t>> m_groups;
};
