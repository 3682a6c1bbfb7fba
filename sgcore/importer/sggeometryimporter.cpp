#include "sgcore/importer/sggeometryimporter.h"

#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/importer/sgfileiosettings.h"

#include <cmath>

const QString SgGeometryImporter::s_LatAxisKey = QStringLiteral("LatAxis");
const QString SgGeometryImporter::s_VertAxisKey = QStringLiteral("VertAxis");
const QString SgGeometryImporter::s_DepthAxisKey = QStringLiteral("DepthAxis");
const QString SgGeometryImporter::s_InvertLatAxisKey = QStringLiteral("InvertLatAxis");
const QString SgGeometryImporter::s_InvertVertAxisKey = QStringLiteral("InvertVertAxis");
const QString SgGeometryImporter::s_InvertDepthAxisKey = QStringLiteral("InvertDepthAxis");
const QString SgGeometryImporter::s_ScaleKey = QStringLiteral("Scale");
const QString SgGeometryImporter::s_PresetKey = QStringLiteral("Preset");

bool SgGeometryImporter::getDefaultOptions(SgFileIOSettings &options, int) const {
    options.setValue(s_LatAxisKey, QStringLiteral("X"));
    options.setValue(s_VertAxisKey, QStringLiteral("Y"));
    options.setValue(s_DepthAxisKey, QStringLiteral("Z"));
    options.setValue(s_InvertLatAxisKey, false);
    options.setValue(s_InvertVertAxisKey, false);
    options.setValue(s_InvertDepthAxisKey, false);
    options.setValue(s_ScaleKey, 1.0);
    options.setValue(s_PresetKey, QStringLiteral("Default"));
    return true;
}

namespace {
// The file axis (0, 1, 2) that an option names, or -1.
int axisOf(const SgFileIOSettings &options, const QString &key, const QString &fallback) {
    const QString name = options.stringValue(key, fallback).trimmed().toUpper();
    if (name == QLatin1String("X"))
        return 0;
    if (name == QLatin1String("Y"))
        return 1;
    if (name == QLatin1String("Z"))
        return 2;
    return -1;
}
} // namespace

bool SgGeometryImporter::applyOptions(SgVertexMesh *mesh, const SgFileIOSettings &options,
                                      QString *why) {
    const int axes[3] = {axisOf(options, s_LatAxisKey, QStringLiteral("X")),
                         axisOf(options, s_VertAxisKey, QStringLiteral("Y")),
                         axisOf(options, s_DepthAxisKey, QStringLiteral("Z"))};
    if (axes[0] < 0 || axes[1] < 0 || axes[2] < 0 || axes[0] == axes[1] || axes[0] == axes[2] ||
        axes[1] == axes[2]) {
        if (why)
            *why = QStringLiteral("the axis options must name X, Y and Z once each");
        return false;
    }
    const double scale = options.doubleValue(s_ScaleKey, 1.0);
    if (!std::isfinite(scale) || scale == 0.0) {
        if (why)
            *why = QStringLiteral("the scale must be a finite number other than 0");
        return false;
    }
    const float s = float(scale);
    const float factors[3] = {options.boolValue(s_InvertLatAxisKey, false) ? -s : s,
                              options.boolValue(s_InvertVertAxisKey, false) ? -s : s,
                              options.boolValue(s_InvertDepthAxisKey, false) ? -s : s};
    const bool identity = axes[0] == 0 && axes[1] == 1 && axes[2] == 2 && factors[0] == 1.0f &&
                          factors[1] == 1.0f && factors[2] == 1.0f;
    if (identity || !mesh)
        return true;
    SgVec3 *points = mesh->getVertices();
    const int count = mesh->getVertexCount();
    for (int i = 0; i < count; ++i) {
        const SgVec3 p = points[i];
        points[i] = {p[axes[0]] * factors[0], p[axes[1]] * factors[1], p[axes[2]] * factors[2]};
    }
    return true;
}
