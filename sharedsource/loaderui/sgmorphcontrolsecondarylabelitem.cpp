#include "sharedsource/loaderui/sgmorphcontrolsecondarylabelitem.h"

#include "sharedsource/engine/sgmorphloader.h"

SgMorphControlSecondaryLabelItem::SgMorphControlSecondaryLabelItem(QTreeWidgetItem *parent,
                                                                   SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Label:"));
    connect(loader, &SgMorphLoader::morphNameChanged, this,
            &SgMorphControlSecondaryLabelItem::updateText);
    connect(loader, &SgMorphLoader::customLabelChanged, this,
            &SgMorphControlSecondaryLabelItem::updateText);
    updateText();
}

void SgMorphControlSecondaryLabelItem::setValueText(const QString &text) {
    setText(1, text);
    loader()->setCustomLabel(text);
}

void SgMorphControlSecondaryLabelItem::okRename(int column) {
    if (column != 1)
        return;
    if (loader()->customLabel().isEmpty() && text(1) == loader()->morphName())
        return;
    loader()->setCustomLabel(text(1));
    updateText();
}

void SgMorphControlSecondaryLabelItem::updateText() {
    const QString label = loader()->customLabel();
    setText(1, label.isEmpty() ? loader()->morphName() : label);
}
