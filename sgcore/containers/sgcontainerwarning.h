#pragma once

#include <QString>
#include <QtGlobal>

// Reports a misuse of a host container on the Qt warning channel as "file(line): message".
// `file` and `line` name the place in the container that detected the misuse.
inline void sgContainerWarning(const char *file, int line, const QString &message) {
    qWarning("%s",
             qUtf8Printable(
                 QStringLiteral("%1(%2): %3").arg(QString::fromUtf8(file)).arg(line).arg(message)));
}

// Reports `message` with the current source file and line.
#define SG_CONTAINER_WARNING(message) sgContainerWarning(__FILE__, __LINE__, (message))
