#include "sharedsource/engine/sgfacegroupcache.h"

#include "sgcore/geometry/sgpolymesh.h"

SgFaceGroupCache::~SgFaceGroupCache() {
    release();
}

void SgFaceGroupCache::release() {
    if (m_mesh && m_held)
        m_mesh->unref();
    m_mesh = nullptr;
    m_held = false;
    m_groups.clear();
}

const std::vector<int32_t> *SgFaceGroupCache::groupVertices(SgPolyMesh *mesh, int group) {
    if (!mesh)
        return nullptr;
    if (mesh != m_mesh) {
        // Referenced before the release: the old and the new mesh may be the same object.
        const bool held = mesh->getRefCount() > 0;
        if (held)
            mesh->ref();
        release();
        m_mesh = mesh;
        m_held = held;
        m_groups = mesh->getAllFaceGroupVertices();
    }
    if (group < 0 || size_t(group) >= m_groups.size())
        return nullptr;
    return &m_groups[size_t(group)];
}
