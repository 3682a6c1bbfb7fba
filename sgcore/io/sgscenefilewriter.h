#pragma once

#include <QDir>
#include <QHash>
#include <QJsonArray>
#include <QJsonObject>
#include <QSet>
#include <QString>

class SgElement;
class SgMorph;
class SgNode;
class SgNumericProperty;
class SgProperty;
class SgScene;
class SgShape;
class SgSkeleton;

// Writes a scene as a scene file (sgcore/io/scene-format.md) that `SgSceneFile::load` reads
// back to the same state: every node with its hierarchy, origin, hidden flag, properties and
// property groups; each node's base geometry (its current shape, before any modifier) as an OBJ
// file in the folder "<scene base name>-geometry" beside the scene file, with its UVs, face
// groups and material order; materials with colours, strengths and maps; morphs with their
// deltas (a ".deltas" file each in the same folder), their value channel and its ERC links to
// control properties.
//
// What is not written: shapes other than the current one, modifiers other than morphs (skin
// bindings and joints), node rotations and translations, object and shape properties, and
// normal indices of facet corners.
//
// Nodes are referred to by name (links, parents, node properties, follow targets), as the
// loader resolves them. The files are written geometry first, the scene file last, each in one
// step (a reader sees the old file or the whole new one). Cost: linear in vertices, facets and
// morph entries.
class SgSceneFileWriter {
public:
    // Writes `scene` to `path`. False, with getErrorString() set, when a file cannot be written
    // or a node's geometry is not a polygon mesh; the scene file is then left as it was.
    bool save(const SgScene *scene, const QString &path);

    QString getErrorString() const { return m_error; }
    // The geometry files the last save wrote.
    QStringList getWrittenFiles() const { return m_written; }

private:
    void writeInOrder(SgNode *node, QJsonArray &out);
    QJsonObject nodeEntry(SgNode *node);
    QJsonObject figureEntry(SgSkeleton *figure);
    void writeCommon(SgNode *node, QJsonObject &o);
    void writeGeometry(SgNode *node, const QString &fileStem, QJsonObject &o);
    QJsonArray materials(const SgShape *shape) const;
    QJsonArray morphs(SgNode *node, const QString &stem);
    QJsonObject morphEntry(const SgMorph *morph, const QString &stem);
    QJsonArray properties(const SgElement *element) const;
    QJsonObject propertyEntry(const SgProperty *property) const;
    QJsonArray links(const SgNumericProperty *property) const;
    QString filePath(const QString &file) const;
    // A file name in the geometry folder not used yet by this save: "<stem><suffix>", else
    // "<stem>-2<suffix>", ...
    QString freeFileName(const QString &stem, const QString &suffix);

    QDir m_sceneFolder;
    QDir m_geometryFolder;
    QString m_geometryFolderName;
    QSet<const SgNode *> m_done;
    QSet<QString> m_usedNames;
    QStringList m_written;
    QString m_error;
};
