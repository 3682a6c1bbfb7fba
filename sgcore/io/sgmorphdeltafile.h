#pragma once

#include <QString>

class SgMorphDeltas;

// A morph's deltas as a text file beside a saved scene, so that a morph of a million vertices
// is written and read in a fraction of a second. One header line and one line per entry:
//
//   deltas <vertex count of the mesh>
//   <vertex index> <dx> <dy> <dz>
//
// Indices strictly ascending and below the vertex count; numbers written with the shortest text
// that reads back to the same float. Lines starting with '#' and empty lines are skipped.
class SgMorphDeltaFile {
public:
    // Writes `deltas` to `path` in one step. False, with `error` set, when it cannot be written.
    static bool write(const QString &path, const SgMorphDeltas &deltas, QString &error);
    // Reads `path`; the header's vertex count must equal `vertexCount`. Null, with `error` set
    // to "<file>:<line>: <what>", for a file that does not open or does not read whole.
    // Cost: one pass over the bytes.
    static SgMorphDeltas *read(const QString &path, int vertexCount, QString &error);
    // The same from bytes in memory; `sourceName` stands for the file in messages.
    static SgMorphDeltas *readBuffer(const QByteArray &bytes, int vertexCount,
                                     const QString &sourceName, QString &error);
};
