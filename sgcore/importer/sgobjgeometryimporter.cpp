#include "sgcore/importer/sgobjgeometryimporter.h"

#include "sgcore/app/sgimportmgr.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/io/sgobjreader.h"

#include <QFileInfo>

namespace {
// Every import manager gets an OBJ geometry importer.
const bool s_registered = SgImportMgr::registerDefaultImporter(
    []() -> SgImporter * { return new SgObjGeometryImporter; });
} // namespace

int SgObjGeometryImporter::importGeometry(const QString &fileName, SgShape *&shape,
                                          const SgFileIOSettings &options) {
    shape = nullptr;
    setLastError(QString());
    QString why;
    if (!applyOptions(nullptr, options, &why)) {
        setLastError(QStringLiteral("%1: %2").arg(fileName, why));
        return OptionError;
    }
    const QFileInfo info(fileName);
    if (!info.isFile() || !info.isReadable()) {
        setLastError(QStringLiteral("%1: cannot open the file").arg(fileName));
        return FileError;
    }
    SgObjReader reader;
    if (!reader.readFile(fileName)) {
        setLastError(reader.getErrorString());
        return FormatError;
    }
    SgPolyShape *result = reader.takeShape(SgFileIO::getBaseFileName(fileName));
    if (!result || !result->getGeometry()) {
        delete result;
        setLastError(QStringLiteral("%1: no geometry").arg(fileName));
        return FormatError;
    }
    applyOptions(result->getGeometry(), options);
    shape = result;
    return Ok;
}
