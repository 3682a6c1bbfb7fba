#pragma once

#include <QString>
#include <QStringList>

// Base of the file importers that the import manager holds. Concrete importers (the geometry
// importer for OBJ files, ...) derive from it and add their reading steps.
class SgImporter {
public:
    SgImporter() = default;
    SgImporter(const SgImporter &) = delete;
    SgImporter &operator=(const SgImporter &) = delete;
    virtual ~SgImporter() = default;

    // A name to show ("Wavefront OBJ").
    virtual QString getName() const = 0;
    // The file extensions this importer reads, lower case without the dot ("obj").
    virtual QStringList getExtensions() const = 0;
    // Whether the importer takes `fileName`; by default when its extension (compared without
    // case) is one of getExtensions().
    virtual bool canImport(const QString &fileName) const;
};
