#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

// The "Name:" row: the morph's name, edited in place.
class SgMorphNameItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Shows the loader's morph name.
    SgMorphNameItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    int settingType() const override { return 0; }
    QString settingKey() const override { return QStringLiteral("Name"); }
    QString valueText() const override { return text(1); }
    // Shows `text` and stores it as the morph name.
    void setValueText(const QString &text) override;
    bool renameEnabled(int column) const override { return column == 1; }
    // Stores the edited text as the morph name.
    void okRename(int column) override;
};
