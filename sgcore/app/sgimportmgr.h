#pragma once

#include <QList>

#include <functional>
#include <memory>
#include <vector>

class SgImporter;

// The application's import manager: the list of importers, in registration order.
// Importers come from two places: `addImporter` on a running manager, and factories
// registered once per process with `registerDefaultImporter` (any part of the host library
// can register its importer from a static initialiser); every new manager creates one
// importer from each registered factory, in registration order.
class SgImportMgr {
public:
    using Factory = std::function<SgImporter *()>;

    SgImportMgr();
    ~SgImportMgr();
    SgImportMgr(const SgImportMgr &) = delete;
    SgImportMgr &operator=(const SgImportMgr &) = delete;

    // Appends `importer` and takes ownership (null is ignored).
    void addImporter(SgImporter *importer);
    // Removes and deletes `importer`; false when it is not held.
    bool removeImporter(SgImporter *importer);
    QList<SgImporter *> getImporters() const;
    // The first importer (registration order) that takes `fileName` (SgImporter::canImport),
    // or null.
    SgImporter *findImporterFor(const QString &fileName) const;
    // The same as findImporterFor: the importer for `fileName`, or null.
    SgImporter *findImporter(const QString &fileName) const { return findImporterFor(fileName); }

    // Builds the open-file filter for geometry files into `filter` (replacing its contents):
    // an entry "Geometry Files (...)" with the patterns of every geometry importer
    // (SgGeometryImporter), then one entry per geometry importer ("Wavefront OBJ (*.obj)") in
    // registration order, except that the importer named `preferred` (by name or extension,
    // without case) comes first of those when given; with `withAllFiles` a last entry
    // "All Files (*)". Entries are separated by ";;". O(importers).
    void makeGeometryFileFilter(QString &filter, const QString &preferred, bool withAllFiles) const;

    // Registers a factory for every manager made from now on; returns true (so that it can
    // initialise a static).
    static bool registerDefaultImporter(Factory factory);

private:
    std::vector<std::unique_ptr<SgImporter>> m_importers;
};
