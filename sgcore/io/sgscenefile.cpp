#include "sgcore/io/sgscenefile.h"

#include <QFile>

bool SgSceneFile::load(const QString &path, SgScene *scene) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        m_error = QStringLiteral("%1: cannot open the file (%2)").arg(path, file.errorString());
        return false;
    }
    return loadFromData(file.readAll(), path.section(QLatin1Char('/'), 0, -2), scene, path);
}

bool SgSceneFile::loadFromData(const QByteArray &, const QString &, SgScene *,
                               const QString &sourceName) {
    m_added = 0;
    m_error = QStringLiteral("%1: scene files are not supported yet").arg(sourceName);
    return false;
}
