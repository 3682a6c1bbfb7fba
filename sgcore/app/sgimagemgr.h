#pragma once

#include <QHash>
#include <QImage>
#include <QString>

#include <memory>
#include <vector>

class SgTexture;

// The application's image manager: loads image files and keeps one texture per path.
class SgImageMgr {
public:
    SgImageMgr();
    ~SgImageMgr();
    SgImageMgr(const SgImageMgr &) = delete;
    SgImageMgr &operator=(const SgImageMgr &) = delete;

    // Reads the image file at `path` into `image`: 0 on success, 1 when the file is missing or
    // not a readable image (then `image` is null). `index` selects an image of a multi-image
    // file; -1 means the first. The texture for `path`, if one exists, takes the image too.
    int loadImage(const QString &path, QImage &image, int index = -1);
    // The texture for `path`, made (and its image loaded, if the file reads) on first request;
    // owned by the manager; null for an empty path. Paths are compared as cleaned absolute paths.
    SgTexture *getImage(const QString &path);
    // The texture for `path` if one was made, or null.
    SgTexture *findImage(const QString &path) const;
    int getImageCount() const { return static_cast<int>(m_textures.size()); }
    // The texture at `index` in the order of first request; null outside the list.
    SgTexture *getImageAt(int index) const {
        return index >= 0 && index < getImageCount() ? m_textures[size_t(index)].get() : nullptr;
    }
    // Reloads every texture's image from its file (textures whose file fails keep a null image).
    void refresh();

private:
    static QString keyFor(const QString &path);

    std::vector<std::unique_ptr<SgTexture>> m_textures;
    QHash<QString, SgTexture *> m_byPath;
};
