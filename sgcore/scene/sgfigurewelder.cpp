#include "sgcore/scene/sgfigurewelder.h"

#include "sgcore/geometry/sgbatchappender.h"
#include "sgcore/geometry/sgbox3.h"
#include "sgcore/geometry/sgmodifier.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgmaterial.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgskeleton.h"

#include <QHash>

#include <bit>
#include <cstring>
#include <limits>
#include <numeric>
#include <unordered_set>

// What the welder remembers of one bone.
struct SgFigureWelder::BoneSlice {
    SgBone *bone = nullptr;
    SgPolyMesh *base = nullptr;        // the bone's base geometry (one reference held)
    std::vector<SgVec3> morphedSource; // the positions welded when morphs apply
    const SgVec3 *source = nullptr;    // the positions welded (base, or morphedSource)
    std::vector<int32_t> weldIndex;    // per bone vertex: welded vertex, or -1 when left out
    std::vector<int32_t> unused;       // bone vertices that none of its facets use
    std::vector<uint8_t> materialMap;  // bone material index -> figure material index
    int32_t uvOffset = 0;              // where the bone's UVs start in the welded UV list
    int32_t outStart = 0;              // where the bone's vertices start in unWeld's result
    bool hasMorphs = false;
};

namespace {

SgPolyMesh *polyMeshOf(SgNode *node) {
    SgObject *object = node ? node->getObject() : nullptr;
    SgShape *shape = object ? object->getCurrentShape() : nullptr;
    return shape ? dynamic_cast<SgPolyMesh *>(shape->getGeometry()) : nullptr;
}

SgShape *shapeOf(SgNode *node) {
    SgObject *object = node ? node->getObject() : nullptr;
    return object ? object->getCurrentShape() : nullptr;
}

bool hasMorphModifiers(const SgNode *node) {
    const SgObject *object = node ? node->getObject() : nullptr;
    if (!object) {
        return false;
    }
    for (const SgModifier *m : object->getModifiers()) {
        if (m->isMorphModifier()) {
            return true;
        }
    }
    return false;
}

// Open-addressing table from exact positions to welded vertices. Each slot keeps the
// position next to the index, so a probe touches one cache line.
class PositionTable {
public:
    explicit PositionTable(size_t expected) {
        size_t cap = 16;
        while (cap < expected * 2) {
            cap <<= 1;
        }
        m_slots.resize(cap);
        m_mask = cap - 1;
    }

    // A welded vertex at one position and the last bone slice that joined it.
    struct Slot {
        SgVec3 position;
        int32_t index = -1;
        int32_t lastBone = -1;
    };

    // The slot of exactly `p`: its welded vertex, or a free slot (index -1) that the caller
    // fills for the vertex it adds.
    Slot &slotFor(const SgVec3 &p) {
        size_t i = hash(p) & m_mask;
        while (true) {
            Slot &s = m_slots[i];
            if (s.index < 0 || s.position == p) {
                return s;
            }
            i = (i + 1) & m_mask;
        }
    }

private:
    static size_t hash(const SgVec3 &p) {
        // Adding 0 turns -0 into +0, so both zeros hash alike (they compare equal).
        const uint32_t x = std::bit_cast<uint32_t>(p.x + 0.0f);
        const uint32_t y = std::bit_cast<uint32_t>(p.y + 0.0f);
        const uint32_t z = std::bit_cast<uint32_t>(p.z + 0.0f);
        uint64_t h = (uint64_t(x) << 32 | y) ^ (uint64_t(z) * 0x9E3779B97F4A7C15ull);
        // A full 64-bit finaliser: float bits of round numbers differ only in their high bits.
        h ^= h >> 30;
        h *= 0xBF58476D1CE4E5B9ull;
        h ^= h >> 27;
        h *= 0x94D049BB133111EBull;
        h ^= h >> 31;
        return size_t(h);
    }

    std::vector<Slot> m_slots;
    size_t m_mask = 0;
};

template <typename F> void forEachCorner(const SgPolyMesh &m, F &&f) {
    for (const SgFaceCorner &c : m.triangleCorners()) {
        f(c);
    }
    for (const SgFaceCorner &c : m.quadCorners()) {
        f(c);
    }
    for (const SgFaceCorner &c : m.polygonCorners()) {
        f(c);
    }
}

SgFaceCorner remapCorner(const SgFaceCorner &c, int32_t vertex, int32_t uvCount, int32_t uvOffset) {
    SgFaceCorner out = c;
    out.vertex = vertex;
    out.uv = c.uv >= 0 && c.uv < uvCount ? c.uv + uvOffset : -1;
    return out;
}

// Appends `from[i]` mapped by `map` to `to` for every i, a chunk at a time: each chunk is added
// to the vector (its default values stay in the first-level cache) and overwritten there, so
// that the vector's memory is written once and nothing is copied twice. The map is taken by
// value and holds values, not references: the stores could otherwise alias what it refers to,
// and the compiler would load it again for every item.
template <typename T, typename U, typename Map>
void appendMapped(std::vector<T> &to, const std::vector<U> &from, Map map) {
    constexpr size_t kChunk = 512;
    for (size_t start = 0; start < from.size(); start += kChunk) {
        const size_t n = std::min(kChunk, from.size() - start);
        const size_t at = to.size();
        to.resize(at + n);
        T *out = to.data() + at;
        const U *in = from.data() + start;
        for (size_t i = 0; i < n; ++i) {
            out[i] = map(in[i]);
        }
    }
}

// Appends `bone`'s facets to `out` with vertex indices mapped by `vertexOf`.
template <typename V>
void appendFacets(SgPolyMesh &out, const SgPolyMesh &bone, const std::vector<uint8_t> &materialMap,
                  int32_t group, int32_t uvOffset, V vertexOf) {
    const int32_t uvCount = bone.getUVCount();
    auto copyCorners = [&](const std::vector<SgFaceCorner> &from, std::vector<SgFaceCorner> &to) {
        appendMapped(to, from, [vertexOf, uvCount, uvOffset](const SgFaceCorner &c) {
            return remapCorner(c, vertexOf(c.vertex), uvCount, uvOffset);
        });
    };
    const uint8_t *materials = materialMap.data();
    const size_t materialCount = materialMap.size();
    auto copyFacets = [&](const std::vector<uint8_t> &mats, std::vector<uint8_t> &toMats,
                          std::vector<int32_t> &toGroups) {
        appendMapped(toMats, mats, [materials, materialCount](uint8_t local) {
            return local < materialCount ? materials[local] : uint8_t(255);
        });
        toGroups.insert(toGroups.end(), mats.size(), group);
    };
    copyCorners(bone.triangleCorners(), out.triangleCorners());
    copyFacets(bone.triangleMaterials(), out.triangleMaterials(), out.triangleGroups());
    copyCorners(bone.quadCorners(), out.quadCorners());
    copyFacets(bone.quadMaterials(), out.quadMaterials(), out.quadGroups());
    const uint32_t polyBase = static_cast<uint32_t>(out.polygonCorners().size());
    copyCorners(bone.polygonCorners(), out.polygonCorners());
    for (size_t i = 1; i < bone.polygonStarts().size(); ++i) {
        out.polygonStarts().push_back(polyBase + bone.polygonStarts()[i]);
    }
    copyFacets(bone.polygonMaterials(), out.polygonMaterials(), out.polygonGroups());
}

// Reserves room in `out` for the facets of every bone of `slices` plus `extraPolygons`.
template <typename Slices> void reserveFor(SgPolyMesh &out, const Slices &slices) {
    size_t t = 0, q = 0, p = 0, pc = 0;
    for (const auto &s : slices) {
        t += size_t(s.base->getTriangleCount());
        q += size_t(s.base->getQuadCount());
        p += size_t(s.base->getPolygonCount()) + s.unused.size() / 3 + 1;
        pc += s.base->polygonCorners().size() + s.unused.size() + 2;
    }
    out.reserveFacets(int(t), int(q), int(p), int(pc));
}

// Adds degenerate facets of `group` that use each of `vertices` (for the group extraction).
void appendCarriers(SgPolyMesh &out, const std::vector<int32_t> &vertices, int32_t offset,
                    int32_t group) {
    const size_t chunk = size_t(SgPolyMesh::kMaxPolygonCorners);
    for (size_t start = 0; start < vertices.size(); start += chunk) {
        const size_t n = std::min(chunk, vertices.size() - start);
        std::vector<SgFaceCorner> corners;
        for (size_t k = 0; k < n; ++k) {
            corners.push_back({vertices[start + k] + offset, -1, -1});
        }
        while (corners.size() < 3) {
            corners.push_back(corners.back());
        }
        if (corners.size() == 3) {
            out.triangleCorners().insert(out.triangleCorners().end(), corners.begin(),
                                         corners.end());
            out.triangleMaterials().push_back(0);
            out.triangleGroups().push_back(group);
        } else if (corners.size() == 4) {
            out.quadCorners().insert(out.quadCorners().end(), corners.begin(), corners.end());
            out.quadMaterials().push_back(0);
            out.quadGroups().push_back(group);
        } else {
            out.polygonCorners().insert(out.polygonCorners().end(), corners.begin(), corners.end());
            out.polygonStarts().push_back(static_cast<uint32_t>(out.polygonCorners().size()));
            out.polygonMaterials().push_back(0);
            out.polygonGroups().push_back(group);
        }
    }
}

// Four floats that the compiler keeps in one vector register.
using Float4 = float __attribute__((vector_size(16)));

// The box around `n` positions. Four positions (twelve floats, three vectors) at a time into
// running minima and maxima per lane, folded into the box at the end: a vector pass instead of
// a chain of scalar comparisons. A coordinate that is not a number extends nothing, as with
// SgBox3::extend.
SgBox3 boxOf(const SgVec3 *positions, size_t n) {
    constexpr float kMax = std::numeric_limits<float>::max();
    Float4 low[3] = {{kMax, kMax, kMax, kMax}, {kMax, kMax, kMax, kMax}, {kMax, kMax, kMax, kMax}};
    Float4 high[3] = {-low[0], -low[1], -low[2]};
    const auto *f = reinterpret_cast<const float *>(positions);
    size_t i = 0;
    for (; i + 4 <= n; i += 4) {
        for (size_t k = 0; k < 3; ++k) {
            Float4 v;
            std::memcpy(&v, f + 3 * i + 4 * k, sizeof v);
            low[k] = v < low[k] ? v : low[k];
            high[k] = v > high[k] ? v : high[k];
        }
    }
    // Lane l of vector k holds float 4k + l of each block of twelve: coordinate (4k + l) % 3.
    float lowOf[3] = {kMax, kMax, kMax}, highOf[3] = {-kMax, -kMax, -kMax};
    for (size_t k = 0; k < 3; ++k) {
        for (size_t l = 0; l < 4; ++l) {
            const size_t axis = (4 * k + l) % 3;
            lowOf[axis] = std::min(lowOf[axis], low[k][l]);
            highOf[axis] = std::max(highOf[axis], high[k][l]);
        }
    }
    SgBox3 box;
    box.min = {lowOf[0], lowOf[1], lowOf[2]};
    box.max = {highOf[0], highOf[1], highOf[2]};
    for (; i < n; ++i) {
        box.extend(positions[i]);
    }
    return box;
}

// The vertices of `mesh` that none of its facets use, in ascending order.
std::vector<int32_t> unusedVertices(const SgPolyMesh &mesh) {
    const size_t n = size_t(mesh.getVertexCount());
    std::vector<uint8_t> used(n, 0);
    forEachCorner(mesh, [&](const SgFaceCorner &c) { used[size_t(c.vertex)] = 1; });
    std::vector<int32_t> unused;
    for (const uint8_t *at = used.data(), *end = at + n;
         (at = static_cast<const uint8_t *>(std::memchr(at, 0, size_t(end - at)))) != nullptr;
         ++at) {
        unused.push_back(int32_t(at - used.data()));
    }
    return unused;
}

// For each bone, where its vertices can meet another bone's: the overlaps of its bounding box
// with the other bones' boxes. A vertex outside all of them equals no vertex of another bone,
// so it needs no probe of the position table, and welds exactly as before without one (the
// table then holds only the vertices near seams, small enough to stay in the caches).
// The bones' own boxes are left in `boxes`.
template <typename Slices>
std::vector<std::vector<SgBox3>> seamRegions(const Slices &slices, std::vector<SgBox3> &boxes) {
    boxes.assign(slices.size(), SgBox3());
    for (size_t b = 0; b < slices.size(); ++b) {
        boxes[b] = boxOf(slices[b].source, size_t(slices[b].base->getVertexCount()));
    }
    std::vector<std::vector<SgBox3>> regions(slices.size());
    for (size_t b = 0; b < slices.size(); ++b) {
        for (size_t c = 0; c < slices.size(); ++c) {
            SgBox3 overlap;
            overlap.min = {std::max(boxes[b].min.x, boxes[c].min.x),
                           std::max(boxes[b].min.y, boxes[c].min.y),
                           std::max(boxes[b].min.z, boxes[c].min.z)};
            overlap.max = {std::min(boxes[b].max.x, boxes[c].max.x),
                           std::min(boxes[b].max.y, boxes[c].max.y),
                           std::min(boxes[b].max.z, boxes[c].max.z)};
            if (c != b && !overlap.isEmpty()) {
                regions[b].push_back(overlap);
            }
        }
    }
    return regions;
}

// A seam region of a bone: its box, and the axis along which it covers least of the bone's
// box, tested first.
struct SeamRegion {
    SgBox3 box;
    int axis = 0;
    float low = 0.0f, high = 0.0f; // the box along that axis

    SeamRegion(const SgBox3 &region, const SgBox3 &bone) : box(region) {
        float least = 2.0f;
        for (int a = 0; a < 3; ++a) {
            const float extent = bone.max[a] - bone.min[a];
            const float share = extent > 0.0f ? (region.max[a] - region.min[a]) / extent : 1.0f;
            if (share < least) {
                least = share;
                axis = a;
            }
        }
        low = box.min[axis];
        high = box.max[axis];
    }

    // Whether `p` lies in the box. Most vertices of a bone lie outside along the first axis
    // tested, so that the other comparisons are rarely made.
    bool contains(const SgVec3 &p) const {
        const float c = reinterpret_cast<const float *>(&p)[axis];
        return c >= low && c <= high && p.x >= box.min.x && p.x <= box.max.x && p.y >= box.min.y &&
               p.y <= box.max.y && p.z >= box.min.z && p.z <= box.max.z;
    }
};

// For each bone, its vertices inside its seam regions, in ascending order (the only ones the
// weld probes); `count` is their number in all.
template <typename Slices>
std::vector<std::vector<int32_t>>
seamVertices(const Slices &slices, const std::vector<SgBox3> &boxes,
             const std::vector<std::vector<SgBox3>> &regions, size_t &count) {
    std::vector<std::vector<int32_t>> seams(slices.size());
    count = 0;
    for (size_t b = 0; b < slices.size(); ++b) {
        std::vector<SeamRegion> tests;
        for (const SgBox3 &region : regions[b]) {
            tests.emplace_back(region, boxes[b]);
        }
        const SgVec3 *source = slices[b].source;
        const int32_t n = slices[b].base->getVertexCount();
        for (int32_t i = 0; i < n && !tests.empty(); ++i) {
            bool inside = false;
            for (const SeamRegion &test : tests) {
                inside = inside || test.contains(source[size_t(i)]);
            }
            if (inside) {
                seams[b].push_back(i);
            }
        }
        count += seams[b].size();
    }
    return seams;
}

} // namespace

SgFigureWelder::SgFigureWelder(SgSkeleton *figure, bool ignoreInvisible, bool weldGeometry,
                               bool removeUnused, bool morphedGeometry)
    : m_morphed(morphedGeometry) {
    if (figure) {
        m_bones = figure->getAllBones();
    }
    build(figure, ignoreInvisible, weldGeometry, removeUnused);
}

SgFigureWelder::SgFigureWelder(const SgBoneList &bones, bool ignoreInvisible, bool weldGeometry,
                               bool removeUnused, bool morphedGeometry, int /*flags*/)
    : m_morphed(morphedGeometry) {
    std::unordered_set<SgBone *> seen;
    for (SgBone *b : bones) {
        if (b && seen.insert(b).second) {
            m_bones.append(b);
        }
    }
    build(m_bones.isEmpty() ? nullptr : m_bones.first()->getSkeleton(), ignoreInvisible,
          weldGeometry, removeUnused);
}

SgFigureWelder::~SgFigureWelder() {
    delete m_shape;
    for (BoneSlice &s : m_slices) {
        if (s.base) {
            s.base->unref();
        }
    }
}

SgPolyShape *SgFigureWelder::getShape() const {
    complete();
    return m_shape;
}

SgPolyMesh *SgFigureWelder::getGeometry() const {
    complete();
    return m_shape->getPolyMesh();
}

SgMap *SgFigureWelder::joinedUVs() const {
    // Room for all at once: a list grown by doubling is copied again and again.
    size_t total = 0;
    for (const BoneSlice &s : m_slices) {
        if (const SgMap *uvs = s.base->getUVList()) {
            total += size_t(std::max(uvs->getValueCount(), 0));
        }
    }
    SgMap *uvList = nullptr;
    for (const BoneSlice &s : m_slices) {
        if (const SgMap *uvs = s.base->getUVList(); uvs && uvs->getValueCount() > 0) {
            if (!uvList) {
                uvList = new SgMap(SgMap::UVMap);
                uvList->values().reserve(total);
            }
            uvList->values().insert(uvList->values().end(), uvs->values().begin(),
                                    uvs->values().end());
        }
    }
    return uvList;
}

void SgFigureWelder::complete() const {
    if (m_complete) {
        return;
    }
    m_complete = true;
    SgPolyMesh *welded = m_shape->getPolyMesh();
    welded->setUVList(joinedUVs());
    // Facets, one face group per bone.
    reserveFor(*welded, m_slices);
    for (const BoneSlice &s : m_slices) {
        const int32_t group = welded->addFaceGroup(s.bone->getName());
        appendFacets(*welded, *s.base, s.materialMap, group, s.uvOffset,
                     [weldIndex = s.weldIndex.data()](int32_t v) { return weldIndex[size_t(v)]; });
    }
}

void SgFigureWelder::build(SgSkeleton *figure, bool ignoreInvisible, bool weldGeometry,
                           bool removeUnused) {
    m_shape = new SgPolyShape(figure ? figure->getLabel() : QString());
    auto *welded = new SgPolyMesh;
    m_shape->setPolyMesh(welded);

    // Bones that take part, with their geometry and figure material indices.
    SgBoneList kept;
    QHash<QString, int> figureMaterials;
    size_t totalVertices = 0;
    for (SgBone *bone : m_bones) {
        SgPolyMesh *mesh = polyMeshOf(bone);
        if (!mesh || (ignoreInvisible && bone->isHidden())) {
            continue;
        }
        kept.append(bone);
        BoneSlice slice;
        slice.bone = bone;
        slice.base = mesh;
        mesh->ref();
        slice.hasMorphs = m_morphed && hasMorphModifiers(bone);
        for (SgMaterial *m : shapeOf(bone)->getAllMaterials()) {
            auto it = figureMaterials.constFind(m->getName());
            int index = it == figureMaterials.constEnd() ? -1 : it.value();
            if (index < 0) {
                index = m_shape->addMaterial(m->clone());
                figureMaterials.insert(m->getName(), index);
            }
            slice.materialMap.push_back(static_cast<uint8_t>(std::min(index, 255)));
        }
        totalVertices += size_t(mesh->getVertexCount());
        m_slices.push_back(std::move(slice));
    }
    m_bones = kept;
    for (int i = 0; i < m_shape->getMaterialCount(); ++i) {
        m_subdMap.push_back(i);
    }

    // Welded vertices.
    std::vector<SgVec3> &wv = welded->vertices();
    wv.reserve(totalVertices);
    for (BoneSlice &s : m_slices) {
        if (s.hasMorphs) {
            SgVertexMesh *morphed = getMorphOnlyGeom(s.bone);
            s.morphedSource = morphed->vertices();
            s.source = s.morphedSource.data();
            if (morphed != s.base) {
                delete morphed;
            }
        } else {
            s.source = s.base->getVertices();
        }
    }
    size_t seamCount = 0;
    std::vector<std::vector<int32_t>> seams(m_slices.size());
    if (weldGeometry) {
        std::vector<SgBox3> boxes;
        const std::vector<std::vector<SgBox3>> regions = seamRegions(m_slices, boxes);
        seams = seamVertices(m_slices, boxes, regions, seamCount);
    }
    PositionTable table(seamCount);
    int32_t outStart = 0;
    int32_t uvOffset = 0;
    for (size_t b = 0; b < m_slices.size(); ++b) {
        BoneSlice &s = m_slices[b];
        const int32_t n = s.base->getVertexCount();
        s.unused = unusedVertices(*s.base);
        s.weldIndex.reserve(size_t(n));
        const int32_t *seam = seams[b].data();
        const int32_t *seamEnd = seam + seams[b].size();
        const int32_t *unused = s.unused.data();
        const int32_t *unusedEnd = unused + s.unused.size();
        auto nextWelded = static_cast<int32_t>(wv.size()); // the index of the next new one
        for (int32_t i = 0; i < n; ++i) {
            // Up to the next seam or unused vertex each vertex is a new welded one: that run
            // goes in with block moves.
            const int32_t nextSeam = seam != seamEnd ? *seam : n;
            const int32_t nextUnused = unused != unusedEnd ? *unused : n;
            const int32_t runEnd = std::min(nextSeam, nextUnused);
            if (runEnd > i) {
                wv.insert(wv.end(), s.source + i, s.source + runEnd);
                const size_t from = s.weldIndex.size();
                s.weldIndex.resize(from + size_t(runEnd - i));
                std::iota(s.weldIndex.begin() + std::ptrdiff_t(from), s.weldIndex.end(),
                          nextWelded);
                nextWelded += runEnd - i;
                i = runEnd;
                if (i == n) {
                    break;
                }
            }
            const bool onSeam = nextSeam == i;
            seam += onSeam;
            const bool isUnused = nextUnused == i;
            unused += isUnused;
            if (isUnused && removeUnused) {
                s.weldIndex.push_back(-1);
                continue;
            }
            const SgVec3 &p = s.source[size_t(i)];
            int32_t w = nextWelded;
            if (onSeam) {
                PositionTable::Slot &slot = table.slotFor(p);
                if (slot.index < 0) {
                    slot = {p, nextWelded, int32_t(b)};
                } else if (slot.lastBone != int32_t(b)) {
                    w = slot.index;
                    slot.lastBone = int32_t(b);
                }
            }
            if (w == nextWelded) {
                wv.push_back(p);
                ++nextWelded;
            }
            s.weldIndex.push_back(w);
        }
        s.outStart = outStart;
        outStart += n;
        s.uvOffset = uvOffset;
        if (const SgMap *uvs = s.base->getUVList()) {
            uvOffset += uvs->getValueCount();
        }
    }
}

std::vector<int32_t> SgFigureWelder::getWeldCounts() const {
    std::vector<int32_t> counts(size_t(m_shape->getPolyMesh()->getVertexCount()), 0);
    for (const BoneSlice &s : m_slices) {
        for (int32_t w : s.weldIndex) {
            if (w >= 0) {
                ++counts[size_t(w)];
            }
        }
    }
    return counts;
}

SgVertexMesh *SgFigureWelder::unWeld(const SgVertexMesh *edited) const {
    SgPolyMesh *out = unWeldVertices(edited);
    if (!out) {
        return nullptr;
    }
    out->setUVList(joinedUVs());
    reserveFor(*out, m_slices);
    for (const BoneSlice &s : m_slices) {
        const int32_t group = out->addFaceGroup(s.bone->getName());
        const int32_t offset = s.outStart;
        appendFacets(*out, *s.base, s.materialMap, group, s.uvOffset,
                     [offset](int32_t v) { return v + offset; });
        appendCarriers(*out, s.unused, s.outStart, group);
    }
    return out;
}

SgPolyMesh *SgFigureWelder::unWeldVertices(const SgVertexMesh *edited) const {
    const SgPolyMesh *welded = m_shape->getPolyMesh();
    if (!edited || edited->getVertexCount() != welded->getVertexCount()) {
        return nullptr;
    }
    auto *out = new SgPolyMesh;
    int32_t total = 0;
    for (const BoneSlice &s : m_slices) {
        total += static_cast<int32_t>(s.weldIndex.size());
    }
    SgVec3 *dst = out->setVertexArray(total);
    const SgVec3 *src = edited->getVertices();
    for (const BoneSlice &s : m_slices) {
        SgVec3 *block = dst + s.outStart;
        for (size_t i = 0; i < s.weldIndex.size(); ++i) {
            const int32_t w = s.weldIndex[i];
            block[i] = w >= 0 ? src[w] : s.source[i];
        }
        if (s.hasMorphs) {
            // Take the bone's morphs back out, last modifier first.
            SgVertexMesh temp;
            temp.vertices().assign(block, block + s.weldIndex.size());
            const auto &mods = s.bone->getObject()->getModifiers();
            for (auto it = mods.rbegin(); it != mods.rend(); ++it) {
                if ((*it)->isMorphModifier()) {
                    (*it)->applyInverse(&temp, s.bone);
                }
            }
            std::copy(temp.vertices().begin(), temp.vertices().end(), block);
        }
    }
    return out;
}

SgVertexMesh *SgFigureWelder::getMorphOnlyGeom(SgNode *node) {
    SgShape *shape = shapeOf(node);
    SgVertexMesh *base = shape ? shape->getGeometry() : nullptr;
    if (!base || !hasMorphModifiers(node)) {
        return base;
    }
    SgVertexMesh *copy = base->clone();
    for (const SgModifier *m : node->getObject()->getModifiers()) {
        if (m->isMorphModifier()) {
            m->apply(copy, node);
        }
    }
    return copy;
}

SgBoneList SgFigureWelder::getOrderedBones(const SgNodeList &nodes) {
    QList<SgSkeleton *> figures;
    QHash<SgSkeleton *, bool> wholeFigure;
    std::unordered_set<SgBone *> wanted;
    SgBoneList loose;
    for (SgNode *n : nodes) {
        if (auto *bone = dynamic_cast<SgBone *>(n)) {
            SgSkeleton *fig = bone->getSkeleton();
            if (!fig) {
                if (!loose.contains(bone)) {
                    loose.append(bone);
                }
                continue;
            }
            if (!figures.contains(fig)) {
                figures.append(fig);
            }
            wanted.insert(bone);
        } else if (auto *fig = dynamic_cast<SgSkeleton *>(n)) {
            if (!figures.contains(fig)) {
                figures.append(fig);
            }
            wholeFigure.insert(fig, true);
        }
    }
    SgBoneList out;
    for (SgSkeleton *fig : figures) {
        const bool all = wholeFigure.value(fig, false);
        for (SgBone *b : fig->getAllBones()) {
            if (all || wanted.count(b)) {
                out.append(b);
            }
        }
    }
    out.append(loose);
    return out;
}
