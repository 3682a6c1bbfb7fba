#include "sharedsource/propertyui/sgimagepropertypage.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimagemgr.h"
#include "sgcore/properties/sgimageproperty.h"
#include "sgcore/widgets/sgimagemenu.h"

SgImagePropertyPage::SgImagePropertyPage(QWidget *parent)
    : SgPropertyPage(parent, tr("Image Attributes"), QStringLiteral("SgImagePropertyAttribs")) {
    m_image = new SgImageMenu(this, QStringLiteral("SgImageAttrib"));
    addRow(0, tr("Image:"), QStringLiteral("SgImageLabel"), m_image);
}

void SgImagePropertyPage::fillChooser() {
    QList<SgTexture *> images;
    if (SgImageMgr *manager = sgApp ? sgApp->getImageMgr() : nullptr) {
        for (int i = 0; i < manager->getImageCount(); ++i)
            images.append(manager->getImageAt(i));
    }
    m_image->setImages(images);
}

void SgImagePropertyPage::configure(SgImageProperty *property) const {
    property->setValue(m_image->getCurrentImage());
}

void SgImagePropertyPage::restoreDefaults() {
    m_image->setCurrentImage(nullptr);
}

void SgImagePropertyPage::saveValues() {
    m_saved = m_image->getCurrentImage();
}

void SgImagePropertyPage::restoreValues() {
    m_image->setCurrentImage(m_saved);
}
