#include "sharedsource/loaderui/sgmorphcontrolvalueitem.h"

#include "sharedsource/engine/sgmorphloader.h"

#include <cmath>
#include <optional>

namespace {
// The number in `text`, or nothing when it is not a finite number: a NaN or infinite scale
// would spread into every value the control drives.
std::optional<float> finiteNumber(const QString &text) {
    bool ok = false;
    const float number = text.toFloat(&ok);
    if (!ok || !std::isfinite(number))
        return std::nullopt;
    return number;
}
} // namespace

SgMorphControlValueItem::SgMorphControlValueItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Value:"));
    showStoredValue();
    loader->setCustomValue(loader->customValue());
}

QString SgMorphControlValueItem::valueText() const {
    return text(1);
}

void SgMorphControlValueItem::setValueText(const QString &text) {
    const std::optional<float> number = finiteNumber(text);
    loader()->setCustomValue(number.value_or(0.0f));
    if (number)
        setText(1, text);
    else
        showStoredValue();
}

void SgMorphControlValueItem::okRename(int column) {
    if (column != 1)
        return;
    if (const std::optional<float> number = finiteNumber(text(1)))
        loader()->setCustomValue(*number);
    else
        showStoredValue();
}

void SgMorphControlValueItem::showStoredValue() {
    setText(1, QString::number(loader()->customValue(), 'g', 6));
}
