#pragma once

#include <QComboBox>
#include <QList>

class SgTexture;

// The host's image chooser: a drop-down list with a "None" entry followed by images, shown by
// file name. Texture pointers are not owned (the image manager owns textures).
class SgImageMenu : public QComboBox {
    Q_OBJECT
public:
    explicit SgImageMenu(QWidget *parent = nullptr, const QString &name = QString());
    ~SgImageMenu() override;

    // Replaces the listed images (null entries skipped); the current image stays current when it
    // is still listed, else "None" becomes current. O(images).
    void setImages(const QList<SgTexture *> &images);
    QList<SgTexture *> getImages() const { return m_images; }

    // The current image, or null for "None".
    SgTexture *getCurrentImage() const;
    // Makes `image` current; null selects "None". An image that is not listed is appended first.
    void setCurrentImage(SgTexture *image);

private:
    QList<SgTexture *> m_images;
};
