#include "sgcore/app/sgimportmgr.h"

#include "sgcore/app/sgimporter.h"

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
