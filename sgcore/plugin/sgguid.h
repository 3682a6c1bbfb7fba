#pragma once

#include <QString>
#include <QUuid>

// A class identifier: 128 bits, written in the usual 8-4-4-4-12 hexadecimal form.
class SgGUID {
public:
    // The null identifier.
    SgGUID() = default;

    // Parses "xxxxxxxx-xxxx-xxxx-xxxx-xxxxxxxxxxxx", with or without surrounding braces.
    // Text that is not such a GUID gives the null identifier.
    static SgGUID fromString(const QString &text);

    // The identifier in lower-case 8-4-4-4-12 form without braces ("" for the null one).
    QString toString() const;

    bool isNull() const { return m_uuid.isNull(); }
    bool operator==(const SgGUID &other) const { return m_uuid == other.m_uuid; }
    bool operator!=(const SgGUID &other) const { return !(*this == other); }

private:
    QUuid m_uuid;
};
