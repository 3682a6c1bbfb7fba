#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

class SgImageMenu;
class SgImageProperty;
class SgTexture;

// "Image Attributes": the image, chosen among the application's images.
class SgImagePropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgImagePropertyPage(QWidget *parent);

    // Refills the menu from the application's image manager.
    void fillChooser();
    void configure(SgImageProperty *property) const;

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    SgImageMenu *m_image = nullptr;
    SgTexture *m_saved = nullptr;
};
