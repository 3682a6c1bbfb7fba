#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

#include <QMenu>

namespace {
constexpr int YesId = 0;
constexpr int NoId = 1;
} // namespace

SgMorphSourceBoolItem::SgMorphSourceBoolItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(1, tr("no"));
}

void SgMorphSourceBoolItem::setValue(bool on) {
    if (on == m_value)
        return;
    m_value = on;
    setText(1, on ? tr("yes") : tr("no"));
}

void SgMorphSourceBoolItem::showEditor(const QPoint &position, int) {
    if (!isEnabled())
        return;
    QMenu menu(menuParent());
    addMenuItem(menu, tr("yes"), YesId);
    addMenuItem(menu, tr("no"), NoId);
    const int chosen = runMenu(menu, position);
    if (chosen == YesId || chosen == NoId)
        setValue(chosen == YesId);
}

QString SgMorphSourceBoolItem::valueText() const {
    return m_value ? QStringLiteral("True") : QStringLiteral("False");
}

void SgMorphSourceBoolItem::setValueText(const QString &text) {
    setValue(text == QLatin1String("True"));
}
