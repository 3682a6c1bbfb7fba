#pragma once

#include <QString>
#include <QStringList>

#include <cstddef>

class SgPolyMesh;
class SgPolyShape;

// Reads Wavefront OBJ geometry into a polygon mesh.
//
// - `v x y z [w ...]`: positions, kept in file order exactly (extra components ignored).
// - `vt u [v [w]]`: the UV list (v defaults to 0).
// - `vn`: counted, so that normal indices can be checked; stored as the corners' third index.
// - `f` corners `v`, `v/vt`, `v//vn`, `v/vt/vn`, with negative (relative) indices; faces stay
//   as written: 3 corners make a triangle, 4 a quad, 5 to 255 a polygon (never triangulated).
//   Missing UV or normal indices are stored as -1.
// - `g name`: the following faces belong to face group `name` (only the first name of the
//   line counts); `g` alone ends the group.
// - `usemtl name`: the following faces use that material; material indices follow the order
//   in which names are first used. Faces before any `usemtl` use a material "default".
// - `o` (the first name recorded), `s`, `mtllib` (recorded), `l`, `p` and the other statements of
// the format are
//   accepted and ignored; an unknown statement is an error.
// Errors stop reading; the message names the file and the line: "<file>:<line>: <what>".
// Cost: one pass over the bytes, O(size); the file is memory-mapped, not copied.
class SgObjReader {
public:
    SgObjReader();
    ~SgObjReader();
    SgObjReader(const SgObjReader &) = delete;
    SgObjReader &operator=(const SgObjReader &) = delete;

    // Reads the file at `path`; false on failure (see getErrorString).
    bool readFile(const QString &path);
    // Reads OBJ text from memory; `sourceName` stands for the file in messages.
    bool readBuffer(const char *data, size_t size, const QString &sourceName);

    // The mesh read last (null before a successful read); the reader keeps it.
    SgPolyMesh *getMesh() const { return m_mesh; }
    // Hands the mesh to the caller (reference count 0); the reader forgets it.
    SgPolyMesh *takeMesh();
    // A new shape named `name` holding the mesh (taken from the reader) and one SgDefaultMaterial
    // per material name, in index order; null before a successful read.
    SgPolyShape *takeShape(const QString &name);

    // Material names in index order, and the material libraries named by `mtllib`.
    QStringList getMaterialNames() const { return m_materials; }
    QStringList getMaterialLibraries() const { return m_libraries; }
    // The name of the file's first `o` statement ("" without one).
    QString getObjectName() const { return m_objectName; }

    // "<file>:<line>: <what>" for the last failure (line 0 when it concerns the whole file).
    QString getErrorString() const { return m_error; }
    int getErrorLine() const { return m_errorLine; }

private:
    class Parser;
    void reset();

    SgPolyMesh *m_mesh = nullptr;
    QStringList m_materials;
    QStringList m_libraries;
    QString m_objectName;
    QString m_error;
    int m_errorLine = 0;
};
