#pragma once

#include <QByteArray>
#include <QString>

#include <cstddef>

// Builds the text of a Wavefront OBJ file in memory and writes it in one go: vertices ("v"),
// face groups ("g"), materials ("usemtl") and polygons ("f", 1-based indices, any corner count).
// Numbers are written with the shortest text that reads back to the same float, so a file read
// back with the host's OBJ reader gives the exact positions. Cost: linear in the output size.
class SgObjWriter {
public:
    // A comment line ("# text") at the current position.
    void comment(const QString &text);
    // An object line ("o name").
    void object(const QString &name);
    // A vertex line per point; `xyz` holds `count` packed x, y, z triples.
    void vertices(const float *xyz, std::size_t count);
    // Starts a face group ("g name") for the faces that follow.
    void group(const QString &name);
    // Sets the material ("usemtl name") of the faces that follow.
    void material(const QString &name);
    // One face over `count` 0-based vertex indices, written 1-based.
    void face(const int *indices, std::size_t count);

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
