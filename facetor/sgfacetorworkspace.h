#pragma once

#include "exchange/sgexchangenode.h"

#include <QDir>
#include <QHash>
#include <QString>

// The modeler's workspace folder: every node received from the host becomes an OBJ file with
// an MTL file beside it, named after the node (SgFacetorObjFile reads such a file back).
// Coordinates are written as they travel (the host's units times 0.1) with enough digits to give
// back the same floats.
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

    // The file name used for a node name.
    static QString fileBaseName(const QString &nodeName);

private:
    QDir m_folder;
    QHash<QString, QString> m_nodeByPath;
};
