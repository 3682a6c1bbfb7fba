#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

// The "Value:" row: the custom controller value, edited in place.
class SgMorphControlValueItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Shows the loader's custom value (six significant digits).
    SgMorphControlValueItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    int settingType() const override { return 6; }
    QString settingKey() const override { return QStringLiteral("CustomValue"); }
    // The shown text.
    QString valueText() const override;
    // Stores the number in `text` (0 when it is no number) and shows `text`; a text that is
    // no finite number shows the stored value instead.
    void setValueText(const QString &text) override;
    bool renameEnabled(int column) const override { return column == 1; }
    // Stores the edited number; a text that is no finite number reverts to the stored value.
    void okRename(int column) override;

private:
    void showStoredValue();
};
