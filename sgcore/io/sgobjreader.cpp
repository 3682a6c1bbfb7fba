#include "sgcore/io/sgobjreader.h"

#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/materials/sgdefaultmaterial.h"

#include <QFile>
#include <QHash>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <string_view>

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

} // namespace

// One reading run over a byte range.
class SgObjReader::Parser {
public:
    Parser(SgObjReader &owner, const char *data, size_t size, const QString &source)
        : m_owner(owner), m_p(data), m_end(data + size), m_source(source) {}

    bool run() {
        m_mesh = new SgPolyMesh;
        m_mesh->beginEdit(true);
        while (m_p < m_end) {
            ++m_line;
            const char *eol =
                static_cast<const char *>(std::memchr(m_p, '\n', size_t(m_end - m_p)));
            if (!eol) {
                eol = m_end;
            }
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
        m_corners.clear();
        const int64_t vcount = int64_t(m_vertices.size());
        const int64_t tcount = int64_t(m_uvs.size());
        while (!atLineEnd()) {
            if (m_corners.size() >= size_t(SgPolyMesh::kMaxPolygonCorners)) {
                return error(QStringLiteral("face with more than %1 corners")
                                 .arg(SgPolyMesh::kMaxPolygonCorners));
            }
            SgFaceCorner c;
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
            m_corners.push_back(c);
        }
        if (m_corners.size() < 3) {
            return error(QStringLiteral("face needs at least three corners"));
        }
        if (m_material < 0 && !useMaterial(QStringLiteral("default"))) {
            return false;
        }
        addFace();
        return true;
    }

    // Appends the collected corners; grows by doubling so that the copy stays inline.
    static void appendCorners(std::vector<SgFaceCorner> &to,
                              const std::vector<SgFaceCorner> &from) {
        if (to.capacity() - to.size() < from.size()) {
            to.reserve(std::max(to.capacity() * 2, to.size() + from.size()));
        }
        for (const SgFaceCorner &c : from) {
            to.push_back(c);
        }
    }

    void addFace() {
        const size_t n = m_corners.size();
        const auto mat = static_cast<uint8_t>(m_material);
        if (n == 3) {
            appendCorners(m_mesh->triangleCorners(), m_corners);
            m_mesh->triangleMaterials().push_back(mat);
            m_mesh->triangleGroups().push_back(m_group);
        } else if (n == 4) {
            appendCorners(m_mesh->quadCorners(), m_corners);
            m_mesh->quadMaterials().push_back(mat);
            m_mesh->quadGroups().push_back(m_group);
        } else {
            auto &corners = m_mesh->polygonCorners();
            appendCorners(corners, m_corners);
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
    const char *m_lineEnd = nullptr;
    QString m_source;
    SgPolyMesh *m_mesh = nullptr;
    std::vector<SgVec3> m_vertices;
    std::vector<SgVec2> m_uvs;
    std::vector<SgFaceCorner> m_corners;
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
