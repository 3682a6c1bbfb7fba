#include "sgcore/io/sgobjreader.h"

#include "sgcore/geometry/sgbatchappender.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/io/sgobjplainline.h"
#include "sgcore/materials/sgdefaultmaterial.h"

#include <QFile>
#include <QHash>

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <string_view>
#include <type_traits>

#if defined(__linux__)
#include <sys/mman.h>
#endif

namespace {

constexpr int kMaxMaterials = 256;

inline bool isSpace(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\f' || c == '\v';
}

// Statements of the format that carry nothing this reader keeps.
bool isIgnoredStatement(std::string_view k) {
    static constexpr std::string_view ignored[] = {
        "o",        "s",    "l",          "p",         "vp",    "usemap", "maplib", "cstype",
        "deg",      "bmat", "step",       "curv",      "curv2", "surf",   "parm",   "trim",
        "hole",     "scrv", "sp",         "end",       "con",   "mg",     "bevel",  "c_interp",
        "d_interp", "lod",  "shadow_obj", "trace_obj", "ctech", "stech",  "call",   "csh"};
    for (std::string_view s : ignored) {
        if (k == s) {
            return true;
        }
    }
    return false;
}

// The common short forms of an OBJ number ("-0.125", "12", "3.000000": at most 15 digits, no
// exponent) to the float std::from_chars gives, correctly rounded (see
// SgObjPlainLine::detail::toFloat), in a few instructions. Returns the end of the number, or
// null when the text needs the general parser (other forms, and the one case toFloat leaves).
const char *parseShortDecimal(const char *p, const char *end, float &out) {
    const bool negative = p < end && *p == '-';
    p += negative;
    std::uint64_t mantissa = 0;
    const char *digits = p;
    while (p < end && static_cast<unsigned>(*p - '0') < 10)
        mantissa = mantissa * 10 + static_cast<unsigned>(*p++ - '0');
    int integerDigits = int(p - digits);
    int fractionDigits = 0;
    if (p < end && *p == '.') {
        const char *fraction = ++p;
        while (p < end && static_cast<unsigned>(*p - '0') < 10)
            mantissa = mantissa * 10 + static_cast<unsigned>(*p++ - '0');
        fractionDigits = int(p - fraction);
    }
    if (integerDigits + fractionDigits == 0 || integerDigits + fractionDigits > 15 ||
        (p < end && (*p | 0x20) == 'e'))
        return nullptr;
    return SgObjPlainLine::detail::toFloat(negative, mantissa, fractionDigits, out) ? p : nullptr;
}

// Asks for huge pages under the reserved room of big arrays: a million-vertex file fills about
// 100 MB of fresh arrays, and taking them in 4 KiB pages costs a fault and a bookkeeping round
// for each (a third of the read on a virtual machine); in 2 MiB pages the kernel's share is
// mostly the clearing. Only whole 2 MiB blocks inside the room are advised; the advice is a
// hint that the kernel may not follow, and elsewhere than Linux nothing is done.
template <typename... T> void adviseHugePages(std::vector<T> &...arrays) {
#if defined(MADV_HUGEPAGE)
    constexpr uintptr_t kHuge = uintptr_t(2) << 20;
    const auto advise = [](const void *data, size_t bytes) {
        const auto first = (reinterpret_cast<uintptr_t>(data) + kHuge - 1) & ~(kHuge - 1);
        const auto end = (reinterpret_cast<uintptr_t>(data) + bytes) & ~(kHuge - 1);
        if (end > first) {
            madvise(reinterpret_cast<void *>(first), end - first, MADV_HUGEPAGE);
        }
    };
    (advise(arrays.data(), arrays.capacity() * sizeof(T)), ...);
#else
    ((void)arrays, ...);
#endif
}

} // namespace

// One reading run over a byte range.
class SgObjReader::Parser {
public:
    Parser(SgObjReader &owner, const char *data, size_t size, const QString &source)
        : m_owner(owner), m_p(data), m_end(data + size), m_source(source) {}

    bool run() {
        m_mesh = new SgPolyMesh;
        m_mesh->beginEdit(true);
        // The plain lines are read a word at a time, up to this far from the end.
        m_fastEnd = m_end - std::min<std::ptrdiff_t>(m_end - m_p, SgObjPlainLine::kReadAhead);
        while (m_p < m_end) {
            if (m_p < m_fastEnd && readPlainRun()) {
                continue;
            }
            ++m_line;
            const char *eol =
                static_cast<const char *>(std::memchr(m_p, '\n', size_t(m_end - m_p)));
            if (!eol) {
                eol = m_end;
            }
            m_lineStart = m_p;
            m_lineEnd = eol;
            if (!parseLine()) {
                return fail();
            }
            m_p = eol + 1;
        }
        if (!checkForwardReferences()) {
            return fail();
        }
        m_mesh->vertices().swap(m_vertices);
        if (!m_uvs.empty()) {
            auto *map = new SgMap(SgMap::UVMap);
            map->values().swap(m_uvs);
            m_mesh->setUVList(map);
        }
        m_mesh->finishEdit();
        m_owner.m_mesh = m_mesh;
        return true;
    }

private:
    // A run of common lines of one kind in their plain forms (see SgObjPlainLine), read in a
    // loop of its own that appends in batches; false, with nothing taken, when the line at m_p
    // is not one of them: it then goes through the general reader.
    bool readPlainRun() {
        const char *p = m_p;
        const char *end = nullptr;
        if (p[0] == 'v' && p[1] == ' ') {
            end = readNumberRun(m_vertices);
        } else if (p[0] == 'f' && p[1] == ' ') {
            end = readFaceRun();
        } else if (p[0] == 'v' && p[1] == 't' && p[2] == ' ') {
            end = readNumberRun(m_uvs);
        }
        if (!end || end == m_p) {
            return false;
        }
        m_p = end;
        return true;
    }

    static constexpr std::ptrdiff_t kPrefetchAhead = 2048;

    // Reads plain lines from m_p while each starts with `keyword` and `readLine(p, next)` (p
    // just after the keyword) takes it, setting the start of the next line; counts the lines
    // and returns where the run ends.
    template <size_t N, typename ReadLine>
    const char *readRun(const char (&keyword)[N], ReadLine &&readLine) {
        const char *p = m_p;
        const char *next = nullptr;
        while (p < m_fastEnd && std::memcmp(p, keyword, N - 1) == 0 && readLine(p + N - 2, next)) {
            // The mapped file's pages come from memory one at a time: the hardware's prefetch
            // stops at each 4 KiB page's end, and the next page's first lines would wait for
            // memory. A hint this far ahead has them arrive in time (a tenth less time per read
            // on the bench's grid); a hint never faults, past the file's end included (the
            // address is computed as an integer, not as a pointer past the buffer).
            __builtin_prefetch(
                reinterpret_cast<const void *>(reinterpret_cast<uintptr_t>(p) + kPrefetchAhead));
            p = next;
            ++m_line;
        }
        return p;
    }

    // A run of "v" lines (three numbers each) or "vt" lines (two) into `items`.
    template <typename T> const char *readNumberRun(std::vector<T> &items) {
        constexpr bool vertices = std::is_same_v<T, SgVec3>;
        SgBatchAppender<T> out(items);
        SgObjPlainLine::NumberShape shape;
        const auto readLine = [&](const char *p, const char *&next) __attribute__((always_inline)) {
            float v[3] = {};
            if (!(vertices ? SgObjPlainLine::vertex(p, v, next, shape)
                           : SgObjPlainLine::uv(p, v, next, shape))) {
                return false;
            }
            reserveFor(items, p - (vertices ? 1 : 2), next);
            if constexpr (vertices) {
                out.push(SgVec3(v[0], v[1], v[2]));
            } else {
                out.push(SgVec2(v[0], v[1]));
            }
            return true;
        };
        return vertices ? readRun("v ", readLine) : readRun("vt ", readLine);
    }

    // At the first line of a kind: room for as many more as the bytes left hold lines of this
    // one's length, so that the array is not grown by doubling (each growth copies the array
    // and touches fresh memory; room that stays unused costs address space only).
    template <typename T>
    void reserveFor(std::vector<T> &items, const char *line, const char *next) {
        if (items.capacity() == 0) {
            const auto lineBytes = size_t(next - line);
            items.reserve(std::min(size_t(m_end - line) / lineBytes + 1, size_t(INT32_MAX / 2)));
            adviseHugePages(items);
        }
    }

    // Faces of three and four corners go in batches, in the material and group of the run
    // (a "usemtl" or "g" line ends it); longer ones one at a time. Each line is read straight
    // into the triangle batch's next place, which a triangle then keeps.
    const char *readFaceRun() {
        // Faces before any material go through the general reader, which names "default".
        if (m_material < 0) {
            return m_p;
        }
        const auto material = static_cast<uint8_t>(m_material);
        // The batches end (and append what they hold) before the run returns.
        FacetBatch<3> triangles(m_mesh->triangleCorners(), m_mesh->triangleMaterials(),
                                m_mesh->triangleGroups(), material, m_group);
        FacetBatch<4> quads(m_mesh->quadCorners(), m_mesh->quadMaterials(), m_mesh->quadGroups(),
                            material, m_group);
        SgObjPlainLine::FaceShape shape;
        return readRun(
            "f ", [&](const char *p, const char *&next) __attribute__((always_inline)) {
                int n = 0;
                SgObjPlainLine::FaceIndexMax max;
                SgFaceCorner *corners = triangles.next();
                if (!SgObjPlainLine::face(p, m_fastEnd, corners, n, max, next, shape)) {
                    return false;
                }
                noteReference(max.vertex, m_maxVertexRef, m_maxVertexLine);
                noteReference(max.uv, m_maxUVRef, m_maxUVLine);
                noteReference(max.normal, m_maxNormalRef, m_maxNormalLine);
                if (!m_facetsReserved) {
                    reserveFacets(size_t(n), size_t(next - p + 1));
                }
                if (n == 3) {
                    triangles.commit();
                } else if (n == 4) {
                    std::copy(corners, corners + 4, quads.next());
                    quads.commit();
                } else {
                    std::copy(corners, corners + n, m_corners.data());
                    addFace(size_t(n));
                }
                return true;
            });
    }

    // Facets of `corners` corners in one material and group: their corners gathered in a
    // buffer and appended a block at a time, their materials and groups all at once at the end.
    // The buffer keeps room for a whole face line (up to 255 corners) behind the next facet.
    template <size_t corners> class FacetBatch {
    public:
        FacetBatch(std::vector<SgFaceCorner> &toCorners, std::vector<uint8_t> &toMaterials,
                   std::vector<int32_t> &toGroups, uint8_t material, int32_t group)
            : m_corners(toCorners), m_materials(toMaterials), m_groups(toGroups),
              m_material(material), m_group(group) {}
        ~FacetBatch() {
            flush();
            m_materials.insert(m_materials.end(), m_total, m_material);
            m_groups.insert(m_groups.end(), m_total, m_group);
        }
        FacetBatch(const FacetBatch &) = delete;
        FacetBatch &operator=(const FacetBatch &) = delete;

        // The place of the next facet's corners.
        SgFaceCorner *next() { return m_buffer.items + m_count * corners; }
        // Keeps the facet written at next().
        void commit() {
            if (++m_count == kFacets) {
                flush();
            }
        }

    private:
        static constexpr size_t kFacets = 256;

        void flush() {
            m_corners.insert(m_corners.end(), m_buffer.items, m_buffer.items + m_count * corners);
            m_total += m_count;
            m_count = 0;
        }

        // Storage that is not filled with default values first.
        union Buffer {
            Buffer() {}
            SgFaceCorner items[kFacets * corners + SgPolyMesh::kMaxPolygonCorners];
        };
        std::vector<SgFaceCorner> &m_corners;
        std::vector<uint8_t> &m_materials;
        std::vector<int32_t> &m_groups;
        uint8_t m_material;
        int32_t m_group;
        size_t m_count = 0, m_total = 0;
        Buffer m_buffer;
    };

    void noteReference(std::uint32_t index, int64_t &maxRef, int &maxRefLine) const {
        if (int64_t(index) > maxRef) {
            maxRef = index;
            maxRefLine = m_line + 1;
        }
    }

    bool fail() {
        delete m_mesh;
        m_mesh = nullptr;
        m_owner.m_errorLine = m_errLine;
        m_owner.m_error = QStringLiteral("%1:%2: %3").arg(m_source).arg(m_errLine).arg(m_errText);
        return false;
    }

    bool error(const QString &text, int line = -1) {
        m_errText = text;
        m_errLine = line < 0 ? m_line : line;
        return false;
    }

    void skipSpace() {
        while (m_p < m_lineEnd && isSpace(*m_p)) {
            ++m_p;
        }
    }

    std::string_view token() {
        skipSpace();
        const char *b = m_p;
        while (m_p < m_lineEnd && !isSpace(*m_p)) {
            ++m_p;
        }
        return {b, size_t(m_p - b)};
    }

    // The rest of the line without surrounding spaces.
    QString restOfLine() {
        skipSpace();
        const char *e = m_lineEnd;
        while (e > m_p && isSpace(e[-1])) {
            --e;
        }
        return QString::fromUtf8(m_p, e - m_p);
    }

    bool atLineEnd() {
        skipSpace();
        return m_p >= m_lineEnd || *m_p == '#';
    }

    bool parseFloat(float &out, const char *what) {
        skipSpace();
        if (const char *e = parseShortDecimal(m_p, m_lineEnd, out);
            e && (e == m_lineEnd || isSpace(*e))) {
            m_p = e;
            return true;
        }
        const char *b = m_p;
        if (b < m_lineEnd && *b == '+') {
            ++b;
        }
        auto [ptr, ec] = std::from_chars(b, m_lineEnd, out);
        if (ec == std::errc::result_out_of_range) {
            double d = 0.0;
            auto r = std::from_chars(b, m_lineEnd, d);
            if (r.ec != std::errc() || std::abs(d) > double(std::numeric_limits<float>::max())) {
                return error(QStringLiteral("number out of range in %1").arg(QLatin1String(what)));
            }
            out = static_cast<float>(d);
            ptr = r.ptr;
        } else if (ec != std::errc()) {
            return error(QStringLiteral("bad number in %1").arg(QLatin1String(what)));
        }
        if (ptr < m_lineEnd && !isSpace(*ptr)) {
            return error(QStringLiteral("bad number in %1").arg(QLatin1String(what)));
        }
        m_p = ptr;
        return true;
    }

    bool parseVertex() {
        SgVec3 v;
        if (atLineEnd()) {
            return error(QStringLiteral("vertex needs three coordinates"));
        }
        if (!parseFloat(v.x, "vertex")) {
            return false;
        }
        if (atLineEnd()) {
            return error(QStringLiteral("vertex needs three coordinates"));
        }
        if (!parseFloat(v.y, "vertex")) {
            return false;
        }
        if (atLineEnd()) {
            return error(QStringLiteral("vertex needs three coordinates"));
        }
        if (!parseFloat(v.z, "vertex")) {
            return false;
        }
        m_vertices.push_back(v);
        return skipNumbers("vertex");
    }

    bool parseUV() {
        SgVec2 t;
        if (atLineEnd()) {
            return error(QStringLiteral("texture coordinate needs a value"));
        }
        if (!parseFloat(t.u, "texture coordinate")) {
            return false;
        }
        if (!atLineEnd() && !parseFloat(t.v, "texture coordinate")) {
            return false;
        }
        m_uvs.push_back(t);
        return skipNumbers("texture coordinate");
    }

    bool parseNormal() {
        float n[3];
        for (float &c : n) {
            if (atLineEnd()) {
                return error(QStringLiteral("normal needs three coordinates"));
            }
            if (!parseFloat(c, "normal")) {
                return false;
            }
        }
        ++m_normalCount;
        return skipNumbers("normal");
    }

    // Accepts (and checks) trailing optional numbers such as w or vertex colours.
    bool skipNumbers(const char *what) {
        while (!atLineEnd()) {
            float ignored = 0.0f;
            if (!parseFloat(ignored, what)) {
                return false;
            }
        }
        return true;
    }

    // Parses one index of a face corner and turns it into a 0-based index; `count` is the
    // number of items of that kind read so far (for relative indices); `maxRef` tracks the
    // largest forward reference for the check at the end of the file.
    bool parseIndex(int32_t &out, int64_t count, int64_t &maxRef, int &maxRefLine,
                    const char *what) {
        // The usual form first: a positive index of up to nine digits, no sign.
        if (m_p < m_lineEnd && static_cast<unsigned>(*m_p - '1') < 9) {
            const char *p = m_p;
            const char *limit = std::min(m_lineEnd, p + 9);
            int32_t value = 0;
            while (p < limit && static_cast<unsigned>(*p - '0') < 10)
                value = value * 10 + (*p++ - '0');
            if (p == m_lineEnd || static_cast<unsigned>(*p - '0') >= 10) {
                m_p = p;
                if (value > maxRef) {
                    maxRef = value;
                    maxRefLine = m_line;
                }
                out = value - 1;
                return true;
            }
        }
        return parseSignedIndex(out, count, maxRef, maxRefLine, what);
    }

    // Any index form: a sign, leading zeros, more digits (and the errors).
    bool parseSignedIndex(int32_t &out, int64_t count, int64_t &maxRef, int &maxRefLine,
                          const char *what) {
        bool negative = false;
        if (m_p < m_lineEnd && (*m_p == '-' || *m_p == '+')) {
            negative = *m_p == '-';
            ++m_p;
        }
        int64_t value = 0;
        const char *digits = m_p;
        while (m_p < m_lineEnd && *m_p >= '0' && *m_p <= '9') {
            value = value * 10 + (*m_p - '0');
            if (value > std::numeric_limits<int32_t>::max()) {
                return error(QStringLiteral("%1 index too large").arg(QLatin1String(what)));
            }
            ++m_p;
        }
        if (m_p == digits) {
            return error(QStringLiteral("bad %1 index in face").arg(QLatin1String(what)));
        }
        if (value == 0) {
            return error(
                QStringLiteral("%1 index 0 in face (indices start at 1)").arg(QLatin1String(what)));
        }
        if (negative) {
            const int64_t resolved = count - value;
            if (resolved < 0) {
                return error(QStringLiteral("%1 index -%2 in face refers before the first %1")
                                 .arg(QLatin1String(what))
                                 .arg(value));
            }
            out = static_cast<int32_t>(resolved);
            return true;
        }
        if (value > maxRef) {
            maxRef = value;
            maxRefLine = m_line;
        }
        out = static_cast<int32_t>(value - 1);
        return true;
    }

    bool parseFace() {
        size_t n = 0;
        const int64_t vcount = int64_t(m_vertices.size());
        const int64_t tcount = int64_t(m_uvs.size());
        while (!atLineEnd()) {
            if (n >= m_corners.size()) {
                return error(QStringLiteral("face with more than %1 corners")
                                 .arg(SgPolyMesh::kMaxPolygonCorners));
            }
            SgFaceCorner &c = m_corners[n];
            c = SgFaceCorner();
            if (!parseIndex(c.vertex, vcount, m_maxVertexRef, m_maxVertexLine, "vertex")) {
                return false;
            }
            if (m_p < m_lineEnd && *m_p == '/') {
                ++m_p;
                if (m_p < m_lineEnd && *m_p != '/') {
                    if (!parseIndex(c.uv, tcount, m_maxUVRef, m_maxUVLine, "texture")) {
                        return false;
                    }
                }
                if (m_p < m_lineEnd && *m_p == '/') {
                    ++m_p;
                    if (!parseIndex(c.third, m_normalCount, m_maxNormalRef, m_maxNormalLine,
                                    "normal")) {
                        return false;
                    }
                }
            }
            if (m_p < m_lineEnd && !isSpace(*m_p) && *m_p != '#') {
                return error(QStringLiteral("bad face corner"));
            }
            ++n;
        }
        if (n < 3) {
            return error(QStringLiteral("face needs at least three corners"));
        }
        if (m_material < 0 && !useMaterial(QStringLiteral("default"))) {
            return false;
        }
        if (!m_facetsReserved) {
            reserveFacets(n, size_t(m_lineEnd - m_lineStart) + 1);
        }
        addFace(n);
        return true;
    }

    // At the first face: room for the faces to come, so that the big arrays are not grown
    // (copied and touched again) by doubling. The faces left are at most the bytes left over
    // this line's length, and a closed mesh has about two triangles or one quad per vertex;
    // the lower of the two is reserved (untouched room costs address space only), and a file
    // with more faces grows the arrays as usual.
    void reserveFacets(size_t n, size_t lineBytes) {
        m_facetsReserved = true;
        const size_t byBytes = size_t(m_end - m_p) / lineBytes + 1;
        const size_t byVertices = (n == 3 ? 2 : 1) * m_vertices.size() + 1024;
        const int facets = int(std::min({byBytes, byVertices, size_t(INT32_MAX / 256)}));
        if (n == 3) {
            m_mesh->reserveFacets(facets, 0, 0, 0);
            adviseHugePages(m_mesh->triangleCorners(), m_mesh->triangleMaterials(),
                            m_mesh->triangleGroups());
        } else if (n == 4) {
            m_mesh->reserveFacets(0, facets, 0, 0);
            adviseHugePages(m_mesh->quadCorners(), m_mesh->quadMaterials(), m_mesh->quadGroups());
        } else {
            m_mesh->reserveFacets(0, 0, facets, facets * int(n));
            adviseHugePages(m_mesh->polygonCorners(), m_mesh->polygonMaterials(),
                            m_mesh->polygonGroups());
        }
    }

    // Appends `n` collected corners; grows by doubling so that the copy stays inline.
    void appendCorners(std::vector<SgFaceCorner> &to, size_t n) {
        if (to.capacity() - to.size() < n) {
            to.reserve(std::max(to.capacity() * 2, to.size() + n));
        }
        for (size_t i = 0; i < n; ++i) {
            to.push_back(m_corners[i]);
        }
    }

    void addFace(size_t n) {
        const auto mat = static_cast<uint8_t>(m_material);
        if (n == 3) {
            appendCorners(m_mesh->triangleCorners(), n);
            m_mesh->triangleMaterials().push_back(mat);
            m_mesh->triangleGroups().push_back(m_group);
        } else if (n == 4) {
            appendCorners(m_mesh->quadCorners(), n);
            m_mesh->quadMaterials().push_back(mat);
            m_mesh->quadGroups().push_back(m_group);
        } else {
            auto &corners = m_mesh->polygonCorners();
            appendCorners(corners, n);
            m_mesh->polygonStarts().push_back(static_cast<uint32_t>(corners.size()));
            m_mesh->polygonMaterials().push_back(mat);
            m_mesh->polygonGroups().push_back(m_group);
        }
    }

    bool useMaterial(const QString &name) {
        auto it = m_materialIndex.constFind(name);
        if (it != m_materialIndex.constEnd()) {
            m_material = it.value();
            return true;
        }
        if (m_owner.m_materials.size() >= kMaxMaterials) {
            return error(QStringLiteral("more than %1 materials").arg(kMaxMaterials));
        }
        m_material = static_cast<int>(m_owner.m_materials.size());
        m_owner.m_materials.append(name);
        m_materialIndex.insert(name, m_material);
        return true;
    }

    bool parseLine() {
        skipSpace();
        if (m_p >= m_lineEnd || *m_p == '#') {
            return true;
        }
        const char *start = m_p;
        const std::string_view key = token();
        if (key == "v") {
            return parseVertex();
        }
        if (key == "f") {
            return parseFace();
        }
        if (key == "vt") {
            return parseUV();
        }
        if (key == "vn") {
            return parseNormal();
        }
        if (key == "g") {
            const std::string_view name = token();
            m_group = name.empty() ? -1
                                   : m_mesh->addFaceGroup(QString::fromUtf8(
                                         name.data(), static_cast<qsizetype>(name.size())));
            return true;
        }
        if (key == "usemtl") {
            const QString name = restOfLine();
            if (name.isEmpty()) {
                return error(QStringLiteral("usemtl without a material name"));
            }
            return useMaterial(name);
        }
        if (key == "o") {
            if (m_owner.m_objectName.isEmpty()) {
                m_owner.m_objectName = restOfLine();
            }
            return true;
        }
        if (key == "mtllib") {
            const QString name = restOfLine();
            if (!name.isEmpty()) {
                m_owner.m_libraries.append(name);
            }
            return true;
        }
        if (isIgnoredStatement(key)) {
            return true;
        }
        for (const char *c = start; c < m_p; ++c) {
            const auto u = static_cast<unsigned char>(*c);
            if (u < 0x20 || u == 0x7f) {
                return error(QStringLiteral("unexpected control character"));
            }
        }
        return error(
            QStringLiteral("unknown statement '%1'")
                .arg(QString::fromUtf8(key.data(), qsizetype(std::min<size_t>(key.size(), 32)))));
    }

    bool checkForwardReferences() {
        if (m_maxVertexRef > int64_t(m_vertices.size())) {
            return error(QStringLiteral("vertex index %1 out of range (the file has %2 vertices)")
                             .arg(m_maxVertexRef)
                             .arg(m_vertices.size()),
                         m_maxVertexLine);
        }
        if (m_maxUVRef > int64_t(m_uvs.size())) {
            return error(QStringLiteral("texture index %1 out of range (the file has %2 texture "
                                        "coordinates)")
                             .arg(m_maxUVRef)
                             .arg(m_uvs.size()),
                         m_maxUVLine);
        }
        if (m_maxNormalRef > m_normalCount) {
            return error(QStringLiteral("normal index %1 out of range (the file has %2 normals)")
                             .arg(m_maxNormalRef)
                             .arg(m_normalCount),
                         m_maxNormalLine);
        }
        return true;
    }

    SgObjReader &m_owner;
    const char *m_p;
    const char *m_end;
    const char *m_lineStart = nullptr;
    const char *m_lineEnd = nullptr;
    const char *m_fastEnd = nullptr;
    bool m_facetsReserved = false;
    QString m_source;
    SgPolyMesh *m_mesh = nullptr;
    std::vector<SgVec3> m_vertices;
    std::vector<SgVec2> m_uvs;
    std::array<SgFaceCorner, SgPolyMesh::kMaxPolygonCorners> m_corners;
    QHash<QString, int> m_materialIndex;
    int64_t m_normalCount = 0;
    int64_t m_maxVertexRef = 0, m_maxUVRef = 0, m_maxNormalRef = 0;
    int m_maxVertexLine = 0, m_maxUVLine = 0, m_maxNormalLine = 0;
    int m_line = 0;
    int m_material = -1;
    int32_t m_group = -1;
    QString m_errText;
    int m_errLine = 0;
};

SgObjReader::SgObjReader() = default;

SgObjReader::~SgObjReader() {
    delete m_mesh;
}

void SgObjReader::reset() {
    delete m_mesh;
    m_mesh = nullptr;
    m_materials.clear();
    m_libraries.clear();
    m_objectName.clear();
    m_error.clear();
    m_errorLine = 0;
}

bool SgObjReader::readBuffer(const char *data, size_t size, const QString &sourceName) {
    reset();
    Parser parser(*this, data, data ? size : 0, sourceName);
    if (!parser.run()) {
        m_materials.clear();
        m_libraries.clear();
        m_objectName.clear();
        return false;
    }
    return true;
}

bool SgObjReader::readFile(const QString &path) {
    reset();
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        m_error = QStringLiteral("%1:0: cannot open the file (%2)").arg(path, file.errorString());
        return false;
    }
    const qint64 size = file.size();
    if (size == 0) {
        return readBuffer("", 0, path);
    }
    if (const uchar *mapped = file.map(0, size)) {
        return readBuffer(reinterpret_cast<const char *>(mapped), size_t(size), path);
    }
    const QByteArray bytes = file.readAll();
    if (bytes.size() != size) {
        m_error = QStringLiteral("%1:0: cannot read the file (%2)").arg(path, file.errorString());
        return false;
    }
    return readBuffer(bytes.constData(), size_t(bytes.size()), path);
}

SgPolyMesh *SgObjReader::takeMesh() {
    SgPolyMesh *mesh = m_mesh;
    m_mesh = nullptr;
    return mesh;
}

SgPolyShape *SgObjReader::takeShape(const QString &name) {
    if (!m_mesh) {
        return nullptr;
    }
    auto *shape = new SgPolyShape(name);
    shape->setPolyMesh(takeMesh());
    for (const QString &m : m_materials) {
        shape->addMaterial(new SgDefaultMaterial(m));
    }
    return shape;
}
