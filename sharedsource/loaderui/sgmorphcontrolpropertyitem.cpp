#include "sharedsource/loaderui/sgmorphcontrolpropertyitem.h"

#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/scene/sgnode.h"
#include "sharedsource/engine/sgmorphloader.h"

// The chooser menus belong to the property UI of the same library; a build without it
// offers no chooser.
#if __has_include("sharedsource/propertyui/sgpropertytreemenu.h")
#include "sharedsource/propertyui/sgpropertytreemenu.h"
#define SG_HAS_CHOOSER_MENU 1
#endif

SgMorphControlPropertyItem::SgMorphControlPropertyItem(QTreeWidgetItem *parent,
                                                       SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Property:"));
    updateText();
    connect(loader, &SgMorphLoader::morphNameChanged, this,
            &SgMorphControlPropertyItem::updateText);
    connect(loader, &SgMorphLoader::controlPropertyChanged, this,
            &SgMorphControlPropertyItem::updateText);
}

void SgMorphControlPropertyItem::showEditor(const QPoint &position, int) {
    if (!isEnabled())
        return;
#ifdef SG_HAS_CHOOSER_MENU
    SgPropertyTreeMenu menu(loader()->morphName(), loader()->controlNode(), menuParent(),
                            QString());
    loader()->setControlProperty(menu.chooseProperty(loader()->controlProperty(), position));
#else
    Q_UNUSED(position);
#endif
}

void SgMorphControlPropertyItem::updateText() {
    const SgNumericProperty *property = loader()->controlProperty();
    setText(1, property ? property->getLabel() : loader()->morphName());
}
