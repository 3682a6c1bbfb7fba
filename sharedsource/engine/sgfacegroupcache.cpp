#include "sharedsource/engine/sgfacegroupcache.h"

#include "sgcore/geometry/sgpolymesh.h"

SgFaceGroupCache::~SgFaceGroupCache() {
    release();
}

void SgFaceGroupCache::release() {
    if (m_mesh)
        m_mesh->unref();
    m_mesh = nullptr;
    m_groups.clear();
}

const std::vector<int32_t> *SgFaceGroupCache::groupVertices(SgPolyMesh *mesh, int group) {
    if (!mesh)
        return nullptr;
    if (mesh != m_mesh) {
        mesh->ref(); // before the release: the old and the new mesh may be the same object
        release();
        m_mesh = mesh;
        m_groups = mesh->getAllFaceGroupVertices();
    }
    if (group < 0 || size_t(group) >= m_groups.size())
        return nullptr;
    return &m_groups[size_t(group)];
}
