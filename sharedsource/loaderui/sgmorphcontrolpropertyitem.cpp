#include "sharedsource/loaderui/sgmorphcontrolpropertyitem.h"

#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/scene/sgnode.h"
#include "sharedsource/engine/sgmorphloader.h"

#include "sharedsource/propertyui/sgpropertytreemenu.h"

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
    SgPropertyTreeMenu menu(loader()->morphName(), loader()->controlNode(), menuParent(),
                            QString());
    loader()->setControlProperty(menu.chooseProperty(loader()->controlProperty(), position));
}

void SgMorphControlPropertyItem::updateText() {
    const SgNumericProperty *property = loader()->controlProperty();
    setText(1, property ? property->getLabel() : loader()->morphName());
}
