#pragma once

#include <QByteArray>
#include <QString>

// File name helpers of the host. Paths use "/" separators.
class SgFileIO {
public:
    // The folder part of `path` without a trailing slash ("/a/b/c.png" gives "/a/b"); empty
    // when the path has no folder part.
    static QString getFilePath(const QString &path);
    // The file name without folder and without its last extension ("/a/b/c.tar.png" gives
    // "c.tar").
    static QString getBaseFileName(const QString &path);
    // The file name with its extension, without the folder ("/a/b/c.png" gives "c.png").
    static QString getShortFileName(const QString &path);
    // Whether the folder `path` exists; with `create` a missing folder is made (with its
    // parents) first. False when the path names a file or cannot be made.
    static bool pathExists(const QString &path, bool create = false);
    // Writes `bytes` to `path` in one step: readers see the old file or the whole new one,
    // never a part. False, with `error` set (when given), when the file cannot be written.
    static bool writeWholeFile(const QString &path, const QByteArray &bytes,
                               QString *error = nullptr);
};
