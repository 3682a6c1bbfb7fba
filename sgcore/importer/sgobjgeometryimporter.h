#pragma once

#include "sgcore/importer/sggeometryimporter.h"

// The geometry importer for Wavefront OBJ files (extension "obj"): the host's OBJ reader
// (vertex order kept exactly as in the file, `g` lines as face groups, polygons kept), then
// the import options. The shape is named after the file's base name and carries one material
// per `usemtl` name. Registered with every import manager.
class SgObjGeometryImporter : public SgGeometryImporter {
public:
    QString getName() const override { return QStringLiteral("Wavefront OBJ"); }
    QStringList getExtensions() const override { return {QStringLiteral("obj")}; }

    // Returns FileError for a file that cannot be opened, FormatError for malformed OBJ
    // (the reader's "<file>:<line>: <what>" in getLastError()), OptionError for invalid
    // options. O(file size).
    int importGeometry(const QString &fileName, SgShape *&shape,
                       const SgFileIOSettings &options) override;
};
