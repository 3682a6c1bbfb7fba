#include "sgcore/geometry/sgpolymesh.h"

#include <algorithm>

SgPolyMesh::SgPolyMesh() = default;
SgPolyMesh::~SgPolyMesh() = default;

SgPolyMesh::SgPolyMesh(const SgPolyMesh &o)
    : SgVertexMesh(o), m_uvList(o.m_uvList ? std::make_unique<SgMap>(*o.m_uvList) : nullptr),
      m_triCorners(o.m_triCorners), m_quadCorners(o.m_quadCorners), m_polyCorners(o.m_polyCorners),
      m_polyStarts(o.m_polyStarts), m_triMaterials(o.m_triMaterials),
      m_quadMaterials(o.m_quadMaterials), m_polyMaterials(o.m_polyMaterials),
      m_triGroups(o.m_triGroups), m_quadGroups(o.m_quadGroups), m_polyGroups(o.m_polyGroups),
      m_groupNames(o.m_groupNames), m_groupIndex(o.m_groupIndex) {}

SgVertexMesh *SgPolyMesh::clone() const {
    return new SgPolyMesh(*this);
}

void SgPolyMesh::beginEdit(bool clear) {
    if (clear) {
        setVertexCount(0);
        m_uvList.reset();
        clearFacets();
        m_groupNames.clear();
        m_groupIndex.clear();
    }
    m_activeMaterial = 0;
    m_activeGroup = -1;
    m_pending.clear();
    m_editing = true;
}

void SgPolyMesh::setUVList(SgMap *uvList) {
    m_uvList.reset(uvList);
}

void SgPolyMesh::activateMaterial(int index) {
    m_activeMaterial = static_cast<uint8_t>(index >= 0 && index <= 255 ? index : 255);
}

void SgPolyMesh::setActiveFaceGroup(int group) {
    m_activeGroup = group >= 0 && group < getFaceGroupCount() ? group : -1;
}

void SgPolyMesh::startFace() {
    m_pending.clear();
}

void SgPolyMesh::addFaceEdge(int vertex, int uv, int third) {
    if (m_pending.size() <= size_t(kMaxPolygonCorners)) {
        m_pending.push_back({vertex, uv, third});
    } else {
        // Remember that the facet overflowed without growing without bound.
        m_pending.back().vertex = -1;
    }
}

bool SgPolyMesh::finishFace() {
    const size_t n = m_pending.size();
    bool ok = n >= 3 && n <= size_t(kMaxPolygonCorners);
    const int vcount = getVertexCount();
    for (const SgFaceCorner &c : m_pending) {
        ok = ok && c.vertex >= 0 && c.vertex < vcount;
    }
    if (ok) {
        if (n == 3) {
            m_triCorners.insert(m_triCorners.end(), m_pending.begin(), m_pending.end());
            m_triMaterials.push_back(m_activeMaterial);
            m_triGroups.push_back(m_activeGroup);
        } else if (n == 4) {
            m_quadCorners.insert(m_quadCorners.end(), m_pending.begin(), m_pending.end());
            m_quadMaterials.push_back(m_activeMaterial);
            m_quadGroups.push_back(m_activeGroup);
        } else {
            m_polyCorners.insert(m_polyCorners.end(), m_pending.begin(), m_pending.end());
            m_polyStarts.push_back(static_cast<uint32_t>(m_polyCorners.size()));
            m_polyMaterials.push_back(m_activeMaterial);
            m_polyGroups.push_back(m_activeGroup);
        }
    }
    m_pending.clear();
    return ok;
}

void SgPolyMesh::finishEdit() {
    m_pending.clear();
    m_editing = false;
}

void SgPolyMesh::reserveFacets(int triangles, int quads, int polygons, int polygonCorners) {
    m_triCorners.reserve(size_t(std::max(triangles, 0)) * 3);
    m_triMaterials.reserve(size_t(std::max(triangles, 0)));
    m_triGroups.reserve(size_t(std::max(triangles, 0)));
    m_quadCorners.reserve(size_t(std::max(quads, 0)) * 4);
    m_quadMaterials.reserve(size_t(std::max(quads, 0)));
    m_quadGroups.reserve(size_t(std::max(quads, 0)));
    m_polyStarts.reserve(size_t(std::max(polygons, 0)) + 1);
    m_polyMaterials.reserve(size_t(std::max(polygons, 0)));
    m_polyGroups.reserve(size_t(std::max(polygons, 0)));
    m_polyCorners.reserve(size_t(std::max(polygonCorners, 0)));
}

void SgPolyMesh::clearFacets() {
    m_triCorners.clear();
    m_quadCorners.clear();
    m_polyCorners.clear();
    m_polyStarts.assign(1, 0);
    m_triMaterials.clear();
    m_quadMaterials.clear();
    m_polyMaterials.clear();
    m_triGroups.clear();
    m_quadGroups.clear();
    m_polyGroups.clear();
}

namespace {
const std::vector<uint8_t> &materialsOf(const SgPolyMesh &m, SgPolyMesh::FacetType type) {
    switch (type) {
    case SgPolyMesh::Triangle:
        return m.triangleMaterials();
    case SgPolyMesh::Quad:
        return m.quadMaterials();
    default:
        return m.polygonMaterials();
    }
}
} // namespace

std::vector<int32_t> SgPolyMesh::getFacetCountsByMaterial(FacetType type) const {
    std::vector<int32_t> counts(256, 0);
    for (uint8_t m : materialsOf(*this, type)) {
        ++counts[m];
    }
    return counts;
}

std::vector<int32_t> SgPolyMesh::getFacetOrderByMaterial(FacetType type) const {
    const std::vector<uint8_t> &mats = materialsOf(*this, type);
    std::vector<int32_t> start = getFacetCountsByMaterial(type);
    int32_t sum = 0;
    for (int32_t &s : start) {
        const int32_t c = s;
        s = sum;
        sum += c;
    }
    std::vector<int32_t> order(mats.size());
    for (size_t i = 0; i < mats.size(); ++i) {
        order[size_t(start[mats[i]]++)] = static_cast<int32_t>(i);
    }
    return order;
}

bool SgPolyMesh::validate(QString *why) const {
    auto fail = [why](const QString &text) {
        if (why) {
            *why = text;
        }
        return false;
    };
    const size_t t = m_triMaterials.size(), q = m_quadMaterials.size(), p = m_polyMaterials.size();
    if (m_triCorners.size() != t * 3 || m_triGroups.size() != t || m_quadCorners.size() != q * 4 ||
        m_quadGroups.size() != q || m_polyGroups.size() != p || m_polyStarts.size() != p + 1 ||
        m_polyStarts.front() != 0 || m_polyStarts.back() != m_polyCorners.size()) {
        return fail(QStringLiteral("facet arrays disagree in length"));
    }
    for (size_t i = 0; i < p; ++i) {
        const uint32_t n = m_polyStarts[i + 1] - m_polyStarts[i];
        if (m_polyStarts[i + 1] < m_polyStarts[i] || n < 5 || n > uint32_t(kMaxPolygonCorners)) {
            return fail(QStringLiteral("polygon %1 has %2 corners").arg(i).arg(int(n)));
        }
    }
    const uint32_t vcount = static_cast<uint32_t>(getVertexCount());
    for (const auto *corners : {&m_triCorners, &m_quadCorners, &m_polyCorners}) {
        for (const SgFaceCorner &c : *corners) {
            if (static_cast<uint32_t>(c.vertex) >= vcount) {
                return fail(QStringLiteral("vertex index %1 outside 0 to %2")
                                .arg(c.vertex)
                                .arg(int(vcount) - 1));
            }
        }
    }
    const int groups = getFaceGroupCount();
    for (const auto *g : {&m_triGroups, &m_quadGroups, &m_polyGroups}) {
        for (int32_t v : *g) {
            if (v < -1 || v >= groups) {
                return fail(QStringLiteral("face group index %1 unknown").arg(v));
            }
        }
    }
    return true;
}

QString SgPolyMesh::getFaceGroupName(int index) const {
    return index >= 0 && index < getFaceGroupCount() ? m_groupNames[size_t(index)] : QString();
}

int SgPolyMesh::findFaceGroup(const QString &name) const {
    return m_groupIndex.value(name, -1);
}

int SgPolyMesh::addFaceGroup(const QString &name) {
    const int found = findFaceGroup(name);
    if (found >= 0) {
        return found;
    }
    m_groupNames.push_back(name);
    const int index = getFaceGroupCount() - 1;
    m_groupIndex.insert(name, index);
    return index;
}

std::vector<int32_t> SgPolyMesh::getFaceGroupVertices(int group) const {
    std::vector<int32_t> out;
    if (group < 0 || group >= getFaceGroupCount()) {
        return out;
    }
    auto collect = [&](const std::vector<int32_t> &groups, auto cornersOf) {
        for (size_t i = 0; i < groups.size(); ++i) {
            if (groups[i] == group) {
                cornersOf(i);
            }
        }
    };
    collect(m_triGroups, [&](size_t i) {
        for (size_t k = 0; k < 3; ++k) {
            out.push_back(m_triCorners[i * 3 + k].vertex);
        }
    });
    collect(m_quadGroups, [&](size_t i) {
        for (size_t k = 0; k < 4; ++k) {
            out.push_back(m_quadCorners[i * 4 + k].vertex);
        }
    });
    collect(m_polyGroups, [&](size_t i) {
        for (uint32_t k = m_polyStarts[i]; k < m_polyStarts[i + 1]; ++k) {
            out.push_back(m_polyCorners[k].vertex);
        }
    });
    std::sort(out.begin(), out.end());
    out.erase(std::unique(out.begin(), out.end()), out.end());
    return out;
}

std::vector<std::vector<int32_t>> SgPolyMesh::getAllFaceGroupVertices() const {
    const size_t groups = static_cast<size_t>(getFaceGroupCount());
    std::vector<std::vector<int32_t>> out(groups);
    auto forEachFacet = [&](auto &&visit) {
        for (size_t i = 0; i < m_triGroups.size(); ++i) {
            visit(m_triGroups[i], &m_triCorners[i * 3], size_t(3));
        }
        for (size_t i = 0; i < m_quadGroups.size(); ++i) {
            visit(m_quadGroups[i], &m_quadCorners[i * 4], size_t(4));
        }
        for (size_t i = 0; i < m_polyGroups.size(); ++i) {
            visit(m_polyGroups[i], &m_polyCorners[m_polyStarts[i]],
                  size_t(m_polyStarts[i + 1] - m_polyStarts[i]));
        }
    };
    // Each group's corners, lowest and highest vertex.
    std::vector<size_t> count(groups, 0);
    std::vector<int32_t> low(groups, INT32_MAX), high(groups, -1);
    forEachFacet([&](int32_t group, const SgFaceCorner *c, size_t n) {
        if (group >= 0 && size_t(group) < groups) {
            // The facet's own range first, in registers: one update of the group's per facet
            // instead of a chain of loads and stores per corner.
            int32_t facetLow = c[0].vertex, facetHigh = c[0].vertex;
            for (size_t k = 1; k < n; ++k) {
                facetLow = std::min(facetLow, c[k].vertex);
                facetHigh = std::max(facetHigh, c[k].vertex);
            }
            count[size_t(group)] += n;
            low[size_t(group)] = std::min(low[size_t(group)], facetLow);
            high[size_t(group)] = std::max(high[size_t(group)], facetHigh);
        }
    });
    // A group whose span of vertices is not much wider than its corners (as with a figure's
    // bones) marks its vertices in a byte per vertex of the span, read back in order; any other
    // group collects its corners to be sorted. Linear in the corners either way, and the marks
    // take at most four bytes per corner.
    constexpr size_t kSorted = SIZE_MAX;
    std::vector<size_t> marksAt(groups, kSorted), cornersAt(groups + 1, 0);
    size_t markBytes = 0;
    for (size_t g = 0; g < groups; ++g) {
        const size_t span = count[g] ? size_t(high[g] - low[g]) + 1 : 0;
        if (count[g] && span <= 4 * count[g]) {
            marksAt[g] = markBytes;
            markBytes += span;
        } else {
            cornersAt[g + 1] = count[g];
        }
    }
    for (size_t g = 0; g < groups; ++g) {
        cornersAt[g + 1] += cornersAt[g];
    }
    std::vector<uint8_t> marks(markBytes, 0);
    std::vector<int32_t> corners(cornersAt[groups]);
    std::vector<size_t> next(cornersAt.begin(), cornersAt.end() - 1);
    forEachFacet([&](int32_t group, const SgFaceCorner *c, size_t n) {
        if (group < 0 || size_t(group) >= groups) {
            return;
        }
        const size_t g = size_t(group);
        if (marksAt[g] != kSorted) {
            uint8_t *mark = marks.data() + marksAt[g] - size_t(low[g]);
            for (size_t k = 0; k < n; ++k) {
                mark[size_t(c[k].vertex)] = 1;
            }
        } else {
            for (size_t k = 0; k < n; ++k) {
                corners[next[g]++] = c[k].vertex;
            }
        }
    });
    for (size_t g = 0; g < groups; ++g) {
        std::vector<int32_t> &list = out[g];
        if (marksAt[g] != kSorted) {
            const size_t span = size_t(high[g] - low[g]) + 1;
            const uint8_t *mark = marks.data() + marksAt[g];
            list.reserve(span);
            for (size_t i = 0; i < span; ++i) {
                if (mark[i]) {
                    list.push_back(low[g] + int32_t(i));
                }
            }
        } else if (count[g]) {
            list.assign(corners.data() + cornersAt[g], corners.data() + cornersAt[g + 1]);
            std::sort(list.begin(), list.end());
            list.erase(std::unique(list.begin(), list.end()), list.end());
        }
    }
    return out;
}

SgPolyMesh *SgPolyMesh::createFaceGroupMesh(int group) const {
    if (group < 0 || group >= getFaceGroupCount()) {
        return nullptr;
    }
    const std::vector<int32_t> used = getFaceGroupVertices(group);
    auto *mesh = new SgPolyMesh;
    SgVec3 *dst = mesh->setVertexArray(static_cast<int>(used.size()));
    const SgVec3 *src = getVertices();
    for (size_t i = 0; i < used.size(); ++i) {
        dst[i] = src[used[i]];
    }
    return mesh;
}
