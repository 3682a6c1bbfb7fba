#include "sgcore/app/sgimagemgr.h"

#include "sgcore/materials/sgtexture.h"

#include <QDir>
#include <QFileInfo>
#include <QImageReader>

SgImageMgr::SgImageMgr() = default;
SgImageMgr::~SgImageMgr() = default;

QString SgImageMgr::keyFor(const QString &path) {
    return QDir::cleanPath(QFileInfo(path).absoluteFilePath());
}

int SgImageMgr::loadImage(const QString &path, QImage &image, int index) {
    image = QImage();
    if (path.isEmpty() || !QFileInfo(path).isFile()) {
        return 1;
    }
    QImageReader reader(path);
    if (index > 0 && !reader.jumpToImage(index)) {
        return 1;
    }
    if (!reader.read(&image) || image.isNull()) {
        image = QImage();
        return 1;
    }
    if (SgTexture *t = findImage(path)) {
        t->setImage(image);
    }
    return 0;
}

SgTexture *SgImageMgr::findImage(const QString &path) const {
    return path.isEmpty() ? nullptr : m_byPath.value(keyFor(path), nullptr);
}

SgTexture *SgImageMgr::getImage(const QString &path) {
    if (path.isEmpty()) {
        return nullptr;
    }
    if (SgTexture *found = findImage(path)) {
        return found;
    }
    m_textures.push_back(std::make_unique<SgTexture>(path));
    SgTexture *t = m_textures.back().get();
    m_byPath.insert(keyFor(path), t);
    QImage image;
    if (loadImage(path, image) == 0) {
        t->setImage(image);
    }
    return t;
}

void SgImageMgr::refresh() {
    for (const auto &t : m_textures) {
        QImage image;
        loadImage(t->getFileName(), image);
        t->setImage(image);
    }
}
