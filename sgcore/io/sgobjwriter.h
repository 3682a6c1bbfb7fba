#pragma once

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <cstddef>

class SgPolyMesh;
struct SgFaceCorner;

// Builds the text of a Wavefront OBJ file in memory and writes it in one go: vertices ("v"),
// UVs ("vt"), face groups ("g"), material libraries ("mtllib"), materials ("usemtl") and
// polygons ("f", 1-based indices, any corner count, "v/vt" where a corner has a UV).
// Numbers are written with the shortest text that reads back to the same float, so a file read
// back with the host's OBJ reader gives the exact positions. Cost: linear in the output size.
class SgObjWriter {
public:
    // A comment line ("# text") at the current position.
    void comment(const QString &text);
    // An object line ("o name").
    void object(const QString &name);
    // A "mtllib" line naming a material library (an MTL file beside the OBJ file).
    void materialLibrary(const QString &fileName);
    // A vertex line per point; `xyz` holds `count` packed x, y, z triples.
    void vertices(const float *xyz, std::size_t count);
    // A "vt" line per UV; `uv` holds `count` packed u, v pairs.
    void uvs(const float *uv, std::size_t count);
    // Starts a face group ("g name") for the faces that follow.
    void group(const QString &name);
    // Sets the material ("usemtl name") of the faces that follow.
    void material(const QString &name);
    // One face over `count` 0-based vertex indices, written 1-based.
    void face(const int *indices, std::size_t count);
    // One face over `count` corners; vertex indices are shifted by `vertexBase`, and a corner
    // whose UV index lies in 0 to `uvCount` - 1 is written with that UV shifted by `uvBase`.
    void face(const SgFaceCorner *corners, std::size_t count, int vertexBase, int uvBase,
              int uvCount);
    // Every facet of `mesh` in storage order (triangles, quads, then polygons), with a "usemtl"
    // line where the material changes (named from `materials`, "material<i>" past its end) and,
    // with `withGroups`, a "g" line where the face group changes. Indices as for `face`, so
    // several meshes can share one file. Read back by the host's OBJ reader, the facets come
    // out in the same order with the same corners.
    void facets(const SgPolyMesh &mesh, const QStringList &materials, int vertexBase, int uvBase,
                bool withGroups);

    // The text so far.
    const QByteArray &text() const { return m_text; }

    // Writes the text to `path` (replacing the file atomically); false with `errorString` set
    // when the file cannot be written.
    bool save(const QString &path);
    const QString &errorString() const { return m_error; }

private:
    void appendFloat(float value);
    void appendInt(long long value);

    QByteArray m_text;
    QString m_error;
};
