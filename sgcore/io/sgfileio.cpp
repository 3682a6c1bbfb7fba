#include "sgcore/io/sgfileio.h"

#include <QDir>
#include <QFileInfo>
#include <QSaveFile>

namespace {
QString normalised(const QString &path) {
    return QDir::fromNativeSeparators(path);
}
} // namespace

QString SgFileIO::getFilePath(const QString &path) {
    const QString p = normalised(path);
    const qsizetype slash = p.lastIndexOf(QLatin1Char('/'));
    if (slash < 0) {
        return QString();
    }
    return slash == 0 ? QStringLiteral("/") : p.left(slash);
}

QString SgFileIO::getShortFileName(const QString &path) {
    const QString p = normalised(path);
    return p.mid(p.lastIndexOf(QLatin1Char('/')) + 1);
}

QString SgFileIO::getBaseFileName(const QString &path) {
    const QString name = getShortFileName(path);
    const qsizetype dot = name.lastIndexOf(QLatin1Char('.'));
    return dot <= 0 ? name : name.left(dot);
}

bool SgFileIO::pathExists(const QString &path, bool create) {
    if (path.isEmpty()) {
        return false;
    }
    const QFileInfo info(path);
    if (info.exists()) {
        return info.isDir();
    }
    return create && QDir().mkpath(path);
}

bool SgFileIO::writeWholeFile(const QString &path, const QByteArray &bytes, QString *error) {
    QSaveFile file(path);
    if (file.open(QIODevice::WriteOnly) && file.write(bytes) == bytes.size() && file.commit())
        return true;
    if (error)
        *error = file.errorString();
    return false;
}
