#pragma once

#include "exchange/sgexchangenode.h"

#include <QDir>
#include <QHash>
#include <QString>

// The modeler's workspace folder: every node received from the host becomes an OBJ file with
// an MTL file beside it, named after the node; an OBJ file can be read back into a node to
// return it. Coordinates are written as they travel (the host's units times 0.1) with enough
// digits to give back the same floats.
class SgFacetorWorkspace {
public:
    // Creates the folder when it does not exist.
    explicit SgFacetorWorkspace(const QString &folder);

    const QDir &folder() const { return m_folder; }

    // Writes `node` as <name>.obj and <name>.mtl (characters outside letters, digits, '-', '_'
    // and '.' become '_'). A second node of the same name replaces the first's files. Returns
    // the OBJ path, or "" when a file cannot be written. Cost: one pass over the record.
    QString writeNode(const SgExchangeNode &node);

    // The node name an OBJ file of this workspace was written for ("" for other files).
    QString nodeNameOf(const QString &objPath) const;

    // Reads an OBJ file (v, vt, f, usemtl, o and g lines; an MTL file named by mtllib gives the
    // materials' diffuse colours) into `node`, named `name` or, when that is empty, after the
    // file's base name. Faces with 3 corners become triangles, with 4 quads, with more polygons
    // (up to 255 corners). False, with `error` set, when the file cannot be read, a face refers
    // to a vertex or UV that does not exist, or a polygon has more than 255 corners.
    static bool readObj(const QString &path, const QString &name, SgExchangeNode &node,
                        QString &error);

    // The file name used for a node name.
    static QString fileBaseName(const QString &nodeName);

private:
    QDir m_folder;
    QHash<QString, QString> m_nodeByPath;
};
