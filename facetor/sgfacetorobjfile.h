#pragma once

#include "exchange/sgexchangenode.h"

#include <QString>

// Reads an OBJ file that an editor saved into the geometry the modeler returns, through the
// host stand-in's strict OBJ reader: a bad number, a short vertex line, an index out of range or
// an unknown statement fails the whole file with "<file>:<line>: <what>", so that a file caught
// half written is never returned. The materials are the file's `usemtl` names in order of first
// use ("default" for faces before any); an MTL file named by `mtllib` gives their diffuse and
// specular colours, opacity and diffuse map. Facets come out as triangles, then quads, then
// polygons, each kind in file order; corners without a UV get UV index -1. A file without a
// vertex or without a face is refused as well (an editor caught after truncating it).
class SgFacetorObjFile {
public:
    // Reads `path` into `node`, named `name` or, when that is empty, after the file's first `o`
    // statement, else its base name. False, with `error` set, when the file does not read.
    static bool read(const QString &path, const QString &name, SgExchangeNode &node,
                     QString &error);
};
