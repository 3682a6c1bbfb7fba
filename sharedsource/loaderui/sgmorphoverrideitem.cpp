#include "sharedsource/loaderui/sgmorphoverrideitem.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphcleanupitem.h"

#include <QMenu>

namespace {
constexpr const char *ChoiceTexts[] = {
    QT_TRANSLATE_NOOP("SgMorphOverrideItem", "Make Unique"),
    QT_TRANSLATE_NOOP("SgMorphOverrideItem", "Deltas and ERC Links"),
    QT_TRANSLATE_NOOP("SgMorphOverrideItem", "Deltas Only"),
};
} // namespace

SgMorphOverrideItem::SgMorphOverrideItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader), m_cleanUpItem(new SgMorphCleanUpItem(this, loader)) {
    setText(0, tr("Overwrite Existing:"));
    setValue(loader->override());
}

void SgMorphOverrideItem::setValue(short choice) {
    if (choice < 0 || choice > 2)
        choice = 0;
    setText(1, tr(ChoiceTexts[choice]));
    m_cleanUpItem->setEnabled(choice != 0);
    loader()->setOverride(choice);
}

void SgMorphOverrideItem::showEditor(const QPoint &position, int) {
    if (!isEnabled())
        return;
    QMenu menu(menuParent());
    addMenuItem(menu, tr(ChoiceTexts[0]), 0);
    menu.addSeparator();
    addMenuItem(menu, tr(ChoiceTexts[1]), 1);
    addMenuItem(menu, tr(ChoiceTexts[2]), 2);
    const int chosen = runMenu(menu, position);
    if (chosen >= 0 && chosen < 3)
        setValue(static_cast<short>(chosen));
}

void SgMorphOverrideItem::setValueText(const QString &text) {
    if (text == QLatin1String("Deltas and ERC Links"))
        setValue(1);
    else if (text == QLatin1String("Deltas Only"))
        setValue(2);
    else
        setValue(0);
}
