#include "sharedsource/loaderui/sgmorpherctypeitem.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphcontrolcustomvalueitem.h"
#include "sharedsource/loaderui/sgmorphcontrolvalueitem.h"

#include <QMenu>

namespace {
constexpr int TypeCount = 6;
constexpr const char *TypeTexts[TypeCount] = {
    QT_TRANSLATE_NOOP("SgMorphErcTypeItem", "ERC[DeltaAdd]"),
    QT_TRANSLATE_NOOP("SgMorphErcTypeItem", "ERC[DivideInto]"),
    QT_TRANSLATE_NOOP("SgMorphErcTypeItem", "ERC[DivideBy]"),
    QT_TRANSLATE_NOOP("SgMorphErcTypeItem", "ERC[Multiply]"),
    QT_TRANSLATE_NOOP("SgMorphErcTypeItem", "ERC[Subtract]"),
    QT_TRANSLATE_NOOP("SgMorphErcTypeItem", "ERC[Add]"),
};
} // namespace

SgMorphErcTypeItem::SgMorphErcTypeItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader),
      m_customValueItem(new SgMorphControlCustomValueItem(this, loader)) {
    setText(0, tr("ERC Type: "));
    loader->setErcType(0);
    setText(1, typeText(0));
    updateDependents(true);
}

QString SgMorphErcTypeItem::typeText(int code) {
    return tr(TypeTexts[code]);
}

void SgMorphErcTypeItem::selectErcType(int code) {
    if (static_cast<unsigned>(code) >= TypeCount)
        return;
    loader()->setErcType(static_cast<short>(code));
    setText(1, typeText(code));
    if (code == 0) {
        updateDependents(true);
    } else {
        m_customValueItem->setValue(false);
        updateDependents(false);
    }
}

void SgMorphErcTypeItem::updateDependents(bool enable) {
    m_customValueItem->setEnabled(loader()->ercType() <= 0 && enable);
    m_customValueItem->valueItem()->setEnabled(m_customValueItem->value() && enable);
}

void SgMorphErcTypeItem::showEditor(const QPoint &position, int) {
    QMenu menu(menuParent());
    for (int code = 0; code < TypeCount; ++code)
        addMenuItem(menu, typeText(code), code);
    selectErcType(runMenu(menu, position));
}

QString SgMorphErcTypeItem::valueText() const {
    for (int code = 0; code < TypeCount - 1; ++code) {
        if (text(1) == typeText(code))
            return QString::number(code);
    }
    return QStringLiteral("5");
}

void SgMorphErcTypeItem::setValueText(const QString &text) {
    selectErcType(text.toInt());
}
