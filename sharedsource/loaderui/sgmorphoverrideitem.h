#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

class SgMorphCleanUpItem;

// The "Overwrite Existing:" row: what happens when the node already has a morph of the name
// (0 "Make Unique", 1 "Deltas and ERC Links", 2 "Deltas Only"), with the dependent
// "Clean Up Orphans:" row, which only applies when overwriting.
class SgMorphOverrideItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Creates "Clean Up Orphans:" below it and shows the loader's current choice.
    SgMorphOverrideItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows `choice`, enables "Clean Up Orphans:" for 1 and 2, and writes it into the loader.
    // Values outside 0 to 2 are taken as 0, as the loader stores them.
    void setValue(short choice);

    // Only while enabled: a popup of the three choices; dismissing it keeps the choice.
    void showEditor(const QPoint &position, int column) override;
    int settingType() const override { return 11; }
    QString settingKey() const override { return QStringLiteral("UpdateOverrideExisting"); }
    QString valueText() const override { return text(1); }
    // "Deltas and ERC Links" gives 1, "Deltas Only" 2, any other text 0.
    void setValueText(const QString &text) override;

    SgMorphCleanUpItem *cleanUpItem() const { return m_cleanUpItem; }

private:
    SgMorphCleanUpItem *m_cleanUpItem;
};
