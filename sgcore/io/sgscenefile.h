#pragma once

#include <QString>

class SgScene;
class SgNode;

// Loads and saves scene files: JSON documents that describe figures (bones with geometry,
// hierarchy, origins, hidden flags, follow targets), props, property groups with properties, and
// materials with colours and texture paths, and reference OBJ files for the geometry.
// The format is described in sgcore/io/scene-format.md.
class SgSceneFile {
public:
    // Reads `path` and adds its nodes to `scene` (appended in file order, figures followed by
    // their bones in hierarchy order). On failure nothing is added, false is returned and
    // getErrorString() says what and where ("<file>: <what>", or the OBJ reader's message).
    bool load(const QString &path, SgScene *scene);
    // The same from JSON text; relative file names are resolved against `baseDir`.
    bool loadFromData(const QByteArray &json, const QString &baseDir, SgScene *scene,
                      const QString &sourceName = QStringLiteral("<memory>"));

    // Writes `scene` to `path` so that `load` gives back the same state, with the geometry in
    // the folder "<base name>-geometry" beside it (see SgSceneFileWriter). On failure false is
    // returned, getErrorString() says why, and the scene file is left as it was.
    bool save(const QString &path, const SgScene *scene);

    QString getErrorString() const { return m_error; }
    // The number of nodes the last successful load added.
    int getAddedNodeCount() const { return m_added; }

private:
    QString m_error;
    int m_added = 0;
};
