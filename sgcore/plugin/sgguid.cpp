#include "sgcore/plugin/sgguid.h"

SgGUID SgGUID::fromString(const QString &text) {
    SgGUID guid;
    guid.m_uuid = QUuid::fromString(text.trimmed());
    return guid;
}

QString SgGUID::toString() const {
    if (isNull())
        return QString();
    return m_uuid.toString(QUuid::WithoutBraces);
}
