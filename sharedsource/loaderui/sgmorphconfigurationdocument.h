#pragma once

#include "sgcore/settings/sgpropertysettings.h"

#include <QByteArray>
#include <QList>
#include <QMap>
#include <QString>

// One element of a configuration file as plain data: its tag, its XML attributes ("Value",
// "Name", "Path", ...), whether it had any child node, the property attributes read from its
// "Setting" children (meaningful for the "Property" element) and its child elements in order.
struct SgConfigurationElement {
    QString tag;
    QMap<QString, QString> attributes;
    bool hasChildNodes = false;
    SgPropertySettings propertyAttributes;
    QList<SgConfigurationElement> children;

    // The attribute "Value" ("" when absent).
    QString value() const { return attributes.value(QStringLiteral("Value")); }

    // The first element below this one (its whole subtree, document order) tagged `tag`; null
    // when there is none.
    const SgConfigurationElement *firstBelow(const QString &tag) const;
    SgConfigurationElement *firstBelow(const QString &tag);
    // Every element below this one tagged `tag`, in document order.
    QList<const SgConfigurationElement *> allBelow(const QString &tag) const;
};

// Reads the bytes of a morph loader configuration file (".scx") into plain data, without any
// widget: the root must be "VarnTargetImporter" with children, its first child is the
// "FileType" element whose tree `fileType` holds. Every fault gives false and the load error
// text that the user sees:
//   "Error: Document could not set as xml."   not XML, empty, over 16 MiB or nested deeper
//                                              than 64 elements (refused before parsing)
//   "No Root Element Found"
//   "Unexpected Root tag name '<tag>'...Expected 'VarnTargetImporter'"
//   "Root Element Has No Children"
// A first child that is not an element leaves `fileType` empty (its type then is "").
//
// Input is untrusted: sizes and depth are checked before the document is built. Cost: linear
// in the bytes.
class SgMorphConfigurationDocument {
public:
    static constexpr qint64 maxFileSize = 16 * 1024 * 1024;
    static constexpr int maxDepth = 64;

    // False with `error()` set when the bytes are no configuration document.
    bool read(const QByteArray &bytes);

    QString error() const { return m_error; }
    // The "Type" attribute of the FileType element: "Object", "Project" or anything else.
    QString type() const { return m_fileType.attributes.value(QStringLiteral("Type")); }
    const SgConfigurationElement &fileType() const { return m_fileType; }
    SgConfigurationElement &fileType() { return m_fileType; }

private:
    bool fail(const QString &error);

    QString m_error;
    SgConfigurationElement m_fileType;
};
