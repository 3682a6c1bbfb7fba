#include "sgcore/app/sgimportmgr.h"

#include "sgcore/app/sgimporter.h"
#include "sgcore/importer/sggeometryimporter.h"

#include <QString>

namespace {
std::vector<SgImportMgr::Factory> &factories() {
    static std::vector<SgImportMgr::Factory> list;
    return list;
}
} // namespace

SgImportMgr::SgImportMgr() {
    for (const Factory &f : factories()) {
        addImporter(f());
    }
}

SgImportMgr::~SgImportMgr() = default;

void SgImportMgr::addImporter(SgImporter *importer) {
    if (importer) {
        m_importers.emplace_back(importer);
    }
}

bool SgImportMgr::removeImporter(SgImporter *importer) {
    for (auto it = m_importers.begin(); it != m_importers.end(); ++it) {
        if (it->get() == importer) {
            m_importers.erase(it);
            return true;
        }
    }
    return false;
}

QList<SgImporter *> SgImportMgr::getImporters() const {
    QList<SgImporter *> out;
    for (const auto &i : m_importers) {
        out.append(i.get());
    }
    return out;
}

SgImporter *SgImportMgr::findImporterFor(const QString &fileName) const {
    for (const auto &i : m_importers) {
        if (i->canImport(fileName)) {
            return i.get();
        }
    }
    return nullptr;
}

bool SgImportMgr::registerDefaultImporter(Factory factory) {
    if (factory) {
        factories().push_back(std::move(factory));
    }
    return true;
}

void SgImportMgr::makeGeometryFileFilter(QString &filter, const QString &preferred,
                                         bool withAllFiles) const {
    QStringList allPatterns;
    QStringList entries;
    for (const auto &importer : m_importers) {
        if (!dynamic_cast<const SgGeometryImporter *>(importer.get()))
            continue;
        QStringList patterns;
        for (const QString &extension : importer->getExtensions())
            patterns << QStringLiteral("*.") + extension;
        allPatterns << patterns;
        const QString entry =
            QStringLiteral("%1 (%2)").arg(importer->getName(), patterns.join(QLatin1Char(' ')));
        const bool first = !preferred.isEmpty() &&
                           (importer->getName().compare(preferred, Qt::CaseInsensitive) == 0 ||
                            importer->getExtensions().contains(preferred.toLower()));
        if (first)
            entries.prepend(entry);
        else
            entries.append(entry);
    }
    allPatterns.removeDuplicates();
    QStringList parts;
    parts << QStringLiteral("Geometry Files (%1)").arg(allPatterns.join(QLatin1Char(' ')));
    parts << entries;
    if (withAllFiles)
        parts << QStringLiteral("All Files (*)");
    filter = parts.join(QStringLiteral(";;"));
}
