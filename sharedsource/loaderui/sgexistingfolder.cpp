#include "sharedsource/loaderui/sgexistingfolder.h"

#include <QDir>
#include <QFileInfo>

QString sgExistingFolder(const QString &path) {
    if (path.isEmpty())
        return QDir::homePath();
    QString folder = QDir::cleanPath(QFileInfo(path).absoluteFilePath());
    while (!QFileInfo(folder).isDir()) {
        const QString parent = QFileInfo(folder).path();
        if (parent == folder)
            return QDir::homePath();
        folder = parent;
    }
    return folder;
}
