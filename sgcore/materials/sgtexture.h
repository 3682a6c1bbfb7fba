#pragma once

#include <QImage>
#include <QString>

// An image used by materials: a file name and, once loaded by the image manager, its pixels.
// Textures are owned by the image manager (SgImageMgr::getImage); properties only point at them.
class SgTexture {
public:
    SgTexture() = default;
    explicit SgTexture(const QString &fileName) : m_fileName(fileName) {}

    QString getFileName() const { return m_fileName; }
    void setFileName(const QString &fileName) { m_fileName = fileName; }

    // The loaded image (null until loaded or when the file could not be read).
    const QImage &getImage() const { return m_image; }
    void setImage(const QImage &image) { m_image = image; }
    bool isLoaded() const { return !m_image.isNull(); }

private:
    QString m_fileName;
    QImage m_image;
};
