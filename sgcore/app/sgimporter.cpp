#include "sgcore/app/sgimporter.h"

#include <QFileInfo>

bool SgImporter::canImport(const QString &fileName) const {
    const QString suffix = QFileInfo(fileName).suffix().toLower();
    return !suffix.isEmpty() && getExtensions().contains(suffix);
}
