#include "sgcore/io/sgmtlwriter.h"

#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/materials/sgtexture.h"

#include "sgcore/io/sgfileio.h"

namespace {

QByteArray number(double value) {
    return QByteArray::number(value, 'g', 9);
}

QByteArray rgb(const QColor &color) {
    return number(color.redF()) + ' ' + number(color.greenF()) + ' ' + number(color.blueF());
}

} // namespace

QString SgMtlWriter::mapPath(const QString &file) const {
    const QString relative = m_folder.relativeFilePath(file);
    return relative.startsWith(QLatin1String("..")) || QDir::isAbsolutePath(relative) ? file
                                                                                      : relative;
}

void SgMtlWriter::add(const SgMaterial *material) {
    if (material == nullptr || m_names.contains(material->getName()))
        return;
    m_names.append(material->getName());
    m_text += "\nnewmtl " + material->getName().toUtf8() + '\n';
    const auto *standard = dynamic_cast<const SgDefaultMaterial *>(material);
    if (standard == nullptr)
        return;
    m_text += "Kd " + rgb(standard->getDiffuseColor()) + '\n';
    m_text += "Ks " + rgb(standard->getSpecularColor()) + '\n';
    m_text += "Ns " + number(double(standard->getGlossinessStrength()) * 1000.0) + '\n';
    m_text += "d " + number(double(standard->getOpacityStrength())) + '\n';
    if (const SgTexture *map = standard->getColorMap(); map && !map->getFileName().isEmpty())
        m_text += "map_Kd " + mapPath(map->getFileName()).toUtf8() + '\n';
    if (const SgTexture *map = standard->getBumpMap(); map && !map->getFileName().isEmpty())
        m_text += "map_bump -bm " + number(double(standard->getBumpStrength())) + ' ' +
                  mapPath(map->getFileName()).toUtf8() + '\n';
}

void SgMtlWriter::add(const std::vector<SgMaterial *> &materials) {
    for (const SgMaterial *material : materials)
        add(material);
}

bool SgMtlWriter::save(const QString &path) {
    m_error.clear();
    return SgFileIO::writeWholeFile(path, m_text, &m_error);
}
