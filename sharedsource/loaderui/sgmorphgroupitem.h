#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

// The "Property Group:" row: the property group path of the morph's value channel, chosen
// from the property group menu.
class SgMorphGroupItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Shows the loader's morph group.
    SgMorphGroupItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // The property group menu of the selected node, opened even while the row is disabled;
    // the chosen path is shown and stored.
    void showEditor(const QPoint &position, int column) override;
    int settingType() const override { return 1; }
    QString settingKey() const override { return QStringLiteral("PropertyGroup"); }
    QString valueText() const override { return text(1); }
    // Shows `text` and stores it as the morph group.
    void setValueText(const QString &text) override;
};
