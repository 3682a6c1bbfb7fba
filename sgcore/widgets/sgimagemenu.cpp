#include "sgcore/widgets/sgimagemenu.h"

#include "sgcore/materials/sgtexture.h"

#include <QFileInfo>

SgImageMenu::SgImageMenu(QWidget *parent, const QString &name) : QComboBox(parent) {
    setObjectName(name);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    setImages({});
}

SgImageMenu::~SgImageMenu() = default;

void SgImageMenu::setImages(const QList<SgTexture *> &images) {
    SgTexture *current = getCurrentImage();
    clear();
    m_images.clear();
    addItem(tr("None"));
    for (SgTexture *image : images) {
        if (!image)
            continue;
        m_images.append(image);
        addItem(QFileInfo(image->getFileName()).fileName());
        setItemData(count() - 1, image->getFileName(), Qt::ToolTipRole);
    }
    const qsizetype index = m_images.indexOf(current);
    setCurrentIndex(index >= 0 ? int(index) + 1 : 0);
}

SgTexture *SgImageMenu::getCurrentImage() const {
    return m_images.value(currentIndex() - 1, nullptr);
}

void SgImageMenu::setCurrentImage(SgTexture *image) {
    if (!image) {
        setCurrentIndex(0);
        return;
    }
    if (!m_images.contains(image)) {
        QList<SgTexture *> images = m_images;
        images.append(image);
        setImages(images);
    }
    setCurrentIndex(int(m_images.indexOf(image)) + 1);
}
