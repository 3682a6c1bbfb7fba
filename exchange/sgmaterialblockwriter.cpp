#include "exchange/sgmaterialblockwriter.h"

#include "exchange/sgrecordoutput.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimagemgr.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/materials/sgmaterial.h"
#include "sgcore/materials/sgtexture.h"
#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/properties/sgfloatproperty.h"

#include <QCryptographicHash>
#include <QDateTime>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QImage>

#include <algorithm>

namespace {

// The fixed bytes of a host entry (six tags, eight floats) plus its five string counts.
constexpr std::int64_t kEntryFixedBytes = 42 + 5 * 4;

QString copyFolder() {
    return (sgApp ? sgApp->getTempPath() : QDir::tempPath()) + QStringLiteral("/FacetorMaps");
}

// The base name with every character other than ASCII letters, digits, '-', '_' and '.'
// replaced by '_', at most 64 characters: the modeler opens the copy through an 8-bit path.
QString asciiBaseName(const QString &fileName) {
    QString name = SgFileIO::getBaseFileName(fileName).left(64);
    for (QChar &c : name) {
        const char16_t u = c.unicode();
        const bool plain = (u >= 'a' && u <= 'z') || (u >= 'A' && u <= 'Z') ||
                           (u >= '0' && u <= '9') || u == '-' || u == '_' || u == '.';
        if (!plain)
            c = QLatin1Char('_');
    }
    return name.isEmpty() ? QStringLiteral("image") : name;
}

// Eight hex digits of a hash of the image's absolute path, the same in every run.
QString sourceHash(const QString &fileName) {
    const QString source = QDir::cleanPath(QFileInfo(fileName).absoluteFilePath());
    return QString::fromLatin1(
        QCryptographicHash::hash(source.toUtf8(), QCryptographicHash::Sha1).toHex().left(8));
}

// A colour or float property of `material` named `name`, or null when missing or of another
// class.
template <typename Property> Property *findTyped(const SgMaterial &material, const char *name) {
    return dynamic_cast<Property *>(material.findProperty(QLatin1String(name)));
}

// The image of a property when it is mapped and has one.
const SgTexture *mappedImage(const SgProperty *property) {
    return property && property->isMapped() ? property->getMapValue() : nullptr;
}

// What the two image strings of `texture` may take.
std::int64_t imageStringBytes(const SgTexture *texture) {
    if (!texture)
        return 0;
    return SgFileIO::getFilePath(texture->getFileName()).size() +
           SgMaterialBlockWriter::jpegCopyPath(texture).size();
}

void putColor(SgRecordOutput &output, const SgColorProperty *property) {
    const QColor color = property ? property->getColorValue() : QColor(0, 0, 0);
    output.putFloat(static_cast<float>(color.red() / 255.0));
    output.putFloat(static_cast<float>(color.green() / 255.0));
    output.putFloat(static_cast<float>(color.blue() / 255.0));
}

// The folder of the image file and the path of its JPEG copy; two empty strings without image.
void putImageStrings(SgRecordOutput &output, const SgTexture *texture) {
    if (!texture) {
        output.putString(QByteArray());
        output.putString(QByteArray());
        return;
    }
    output.putString(SgFileIO::getFilePath(texture->getFileName()).toLatin1());
    output.putString(SgMaterialBlockWriter::exportTextureAsJpeg(texture).toLatin1());
}

void putEntry(SgRecordOutput &output, const SgMaterial &material) {
    const auto *diffuse = findTyped<SgColorProperty>(material, "Diffuse Color");
    const auto *specular = findTyped<SgColorProperty>(material, "Specular Color");
    const auto *glossiness = findTyped<SgFloatProperty>(material, "Glossiness");
    const auto *opacity = findTyped<SgFloatProperty>(material, "Opacity Strength");
    const auto *bump = findTyped<SgFloatProperty>(material, "Bump Strength");

    output.putByte('m');
    output.putString(material.getName().toLatin1());
    output.putByte('c');
    putColor(output, diffuse);
    putImageStrings(output, mappedImage(diffuse));
    output.putByte('s');
    putColor(output, specular);
    output.putByte('g');
    float inverted = 0.0f;
    if (glossiness)
        inverted = 1.0f - (glossiness->isMapped() ? 0.0f : glossiness->getValue());
    output.putFloat(inverted);
    output.putByte('t');
    output.putFloat(opacity ? (opacity->isMapped() ? 1.0f : opacity->getValue()) : 0.0f);
    output.putByte('b');
    output.putFloat(bump ? bump->getValue() : 0.0f);
    putImageStrings(output, mappedImage(bump));
}

} // namespace

std::int64_t SgMaterialBlockWriter::allowance(const SgShape &shape) {
    std::int64_t bytes = 0;
    for (const SgMaterial *material : shape.getAllMaterials())
        bytes += material->getName().size() + kEntryFixedBytes + 4 * kImageStringAllowance;
    return bytes;
}

std::int64_t SgMaterialBlockWriter::measureStrings(const SgShape &shape) {
    std::int64_t bytes = 4;
    for (const SgMaterial *material : shape.getAllMaterials()) {
        bytes += material->getName().size() + kEntryFixedBytes;
        bytes +=
            imageStringBytes(mappedImage(findTyped<SgColorProperty>(*material, "Diffuse Color")));
        bytes +=
            imageStringBytes(mappedImage(findTyped<SgFloatProperty>(*material, "Bump Strength")));
    }
    return bytes;
}

std::int64_t SgMaterialBlockWriter::write(const SgShape &shape, SgRecordOutput &output) {
    const std::size_t start = output.written();
    const auto &materials = shape.getAllMaterials();
    output.putInt32(static_cast<std::int32_t>(materials.size()));
    for (const SgMaterial *material : materials)
        putEntry(output, *material);
    return static_cast<std::int64_t>(output.written() - start);
}

QString SgMaterialBlockWriter::jpegCopyPath(const SgTexture *texture) {
    const QString fileName = texture->getFileName();
    return copyFolder() + QLatin1Char('/') + asciiBaseName(fileName) + QLatin1Char('-') +
           sourceHash(fileName) + QStringLiteral(".jpg");
}

QString SgMaterialBlockWriter::exportTextureAsJpeg(const SgTexture *texture) {
    if (!texture)
        return QString();
    const QString target = jpegCopyPath(texture);
    // A copy of this very image is reused unless the image changed after it was made.
    const QFileInfo copy(target);
    if (copy.exists() && copy.lastModified() >= QFileInfo(texture->getFileName()).lastModified())
        return target;
    if (!SgFileIO::pathExists(copyFolder(), true))
        return QString();
    QImage image;
    if (!sgApp || sgApp->getImageMgr()->loadImage(texture->getFileName(), image, -1) != 0)
        return QString();
    if (!image.save(target, "JPEG"))
        return QString();
    return target;
}
