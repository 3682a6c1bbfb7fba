#pragma once

#include "sgcore/app/sgimporter.h"

class SgFileIOSettings;
class SgShape;
class SgVertexMesh;

// Base of the importers that read geometry files into a shape (the OBJ importer, ...).
//
// Import options (SgFileIOSettings keys), applied to the vertices on reading:
//   "LatAxis", "VertAxis", "DepthAxis"  the file axis ("X", "Y" or "Z") that becomes the host's
//                                        lateral (X), vertical (Y) and depth (Z) axis;
//                                        defaults "X", "Y", "Z" (the file's axes as they are)
//   "InvertLatAxis", "InvertVertAxis", "InvertDepthAxis"
//                                        negate that host axis after the mapping; default false
//   "Scale"                              multiplies every coordinate after the mapping;
//                                        default 1.0
//   "Preset"                             the name of the preset the options came from; not
//                                        used for reading
// The three axis options must name three different axes, and the scale must be a finite
// number other than 0; otherwise the read fails. Facets are kept as in the file, also when an
// odd number of inversions mirrors the geometry.
class SgGeometryImporter : public SgImporter {
public:
    static const QString s_LatAxisKey;
    static const QString s_VertAxisKey;
    static const QString s_DepthAxisKey;
    static const QString s_InvertLatAxisKey;
    static const QString s_InvertVertAxisKey;
    static const QString s_InvertDepthAxisKey;
    static const QString s_ScaleKey;
    static const QString s_PresetKey;

    // Read results (0 is success).
    enum Result { Ok = 0, FileError = 1, FormatError = 2, OptionError = 3 };

    // The option-defaults step: fills `options` with this importer's defaults (the keys above,
    // "Preset" = "Default"). `flags` is reserved (0). True when the importer can read with
    // options; the base always succeeds.
    virtual bool getDefaultOptions(SgFileIOSettings &options, int flags) const;

    // The read step: reads `fileName` into a new shape handed over in `shape` (the caller owns
    // it) with `options` applied. Returns Ok (0) or another Result, with `shape` null and the
    // reason in `getLastError()`.
    virtual int importGeometry(const QString &fileName, SgShape *&shape,
                               const SgFileIOSettings &options) = 0;

    // The reason for the last failed read ("" after a success).
    QString getLastError() const { return m_lastError; }

    // Applies the axis, inversion and scale options to every vertex of `mesh` (nothing to do
    // for the defaults). False, and the mesh unchanged, when the options are invalid. O(V).
    static bool applyOptions(SgVertexMesh *mesh, const SgFileIOSettings &options,
                             QString *why = nullptr);

protected:
    void setLastError(const QString &error) { m_lastError = error; }

private:
    QString m_lastError;
};
