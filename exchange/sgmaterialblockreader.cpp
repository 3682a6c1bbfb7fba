#include "exchange/sgmaterialblockreader.h"

#include "exchange/sgrecordinput.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimagemgr.h"
#include "sgcore/geometry/sgshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/properties/sgfloatproperty.h"

#include <algorithm>
#include <cmath>

namespace {

// The fixed bytes of a returned entry (tags, colours, strengths) plus its three string counts.
constexpr std::size_t kSmallestEntryBytes = 42 + 3 * 4;

void readColor(SgRecordInput &input, float (&color)[3]) {
    for (float &channel : color)
        channel = input.float32();
}

// A strength that is not a finite number is dropped: the entry keeps its default.
void readStrength(SgRecordInput &input, float &strength, bool inverted) {
    const float value = input.float32();
    if (std::isfinite(value))
        strength = inverted ? 1.0f - value : value;
}

QString readText(SgRecordInput &input) {
    return QString::fromLatin1(input.string());
}

// The texture for an image path, or null for no path or one that cannot name a file.
SgTexture *imageFor(SgImageMgr *images, const QString &path) {
    if (!images || path.isEmpty() || path.contains(QChar(0)))
        return nullptr;
    return images->getImage(path);
}

QColor colorFromFloats(const float (&color)[3]) {
    return QColor(SgMaterialBlockReader::channelFromFloat(color[0]),
                  SgMaterialBlockReader::channelFromFloat(color[1]),
                  SgMaterialBlockReader::channelFromFloat(color[2]), 255);
}

} // namespace

void SgMaterialBlockReader::read(SgRecordInput &input) {
    m_materials.clear();
    const std::int32_t count = input.count(kSmallestEntryBytes);
    m_materials.reserve(static_cast<std::size_t>(count));
    for (std::int32_t i = 0; i < count; ++i) {
        SgReturnMaterial material;
        input.skip(1); // 'm'
        material.name = readText(input);
        input.skip(1); // 'c'
        readColor(input, material.diffuse);
        material.diffuseImage = readText(input);
        input.skip(1); // 's'
        readColor(input, material.specular);
        input.skip(1); // 'g'
        readStrength(input, material.glossiness, true);
        input.skip(1); // 't'
        readStrength(input, material.opacity, true);
        input.skip(1); // 'b'
        readStrength(input, material.bumpStrength, false);
        material.bumpImage = readText(input);
        m_materials.push_back(std::move(material));
    }
}

int SgMaterialBlockReader::usableMaterialCount() const {
    if (m_materials.empty())
        return 1;
    return static_cast<int>(std::min<std::size_t>(m_materials.size(), kMaxMaterialIndices));
}

int SgMaterialBlockReader::channelFromFloat(float value) {
    const double scaled = static_cast<double>(value) * 255.0;
    if (!(scaled > 0.0))
        return 0; // also not-a-number
    if (scaled >= 255.0)
        return 255;
    return static_cast<int>(scaled);
}

void SgMaterialBlockReader::applyTo(SgShape &shape) const {
    if (m_materials.empty()) {
        shape.addMaterial(new SgDefaultMaterial(QStringLiteral("default")));
        return;
    }
    SgImageMgr *images = sgApp ? sgApp->getImageMgr() : nullptr;
    for (const SgReturnMaterial &entry : m_materials) {
        auto *material = new SgDefaultMaterial(entry.name);
        material->setDiffuseColor(colorFromFloats(entry.diffuse));
        if (SgTexture *image = imageFor(images, entry.diffuseImage))
            material->setColorMap(image);
        material->setSpecularColor(colorFromFloats(entry.specular));
        material->setGlossinessStrength(entry.glossiness);
        if (SgFloatProperty *opacity = material->getOpacityControl())
            opacity->setValue(entry.opacity);
        material->setBumpStrength(entry.bumpStrength);
        // A returned bump image is ignored: the host's material interface has no bump-map
        // setter, and taking it as the colour map would replace the diffuse map.
        shape.addMaterial(material);
    }
    if (images)
        images->refresh();
}
