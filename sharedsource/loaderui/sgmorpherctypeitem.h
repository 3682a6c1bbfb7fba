#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

class SgMorphControlCustomValueItem;

// The "ERC Type: " row: how the control property drives the morph (codes 0 to 5), with the
// dependent "Use Custom Value:" row. A custom controller value exists only for
// "ERC[DeltaAdd]" (code 0).
class SgMorphErcTypeItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Creates "Use Custom Value:" below it and sets the loader's type to 0 ("ERC[DeltaAdd]").
    SgMorphErcTypeItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Stores and shows `code`; codes outside 0 to 5 are ignored. Any code but 0 turns
    // "Use Custom Value:" to no and disables it and "Value:".
    void selectErcType(int code);
    // Enables "Use Custom Value:" when the type is 0 and `enable` holds, and "Value:" when
    // moreover "Use Custom Value:" is yes.
    void updateDependents(bool enable);

    // A popup of the six types, opened even while the row is disabled; dismissing it keeps
    // the type.
    void showEditor(const QPoint &position, int column) override;
    int settingType() const override { return 18; }
    QString settingKey() const override { return QStringLiteral("ERCType"); }
    // The code digit of the shown type; a text that is none of the first five gives "5".
    QString valueText() const override;
    // `selectErcType` with the base-10 number in `text`.
    void setValueText(const QString &text) override;

    SgMorphControlCustomValueItem *customValueItem() const { return m_customValueItem; }

private:
    static QString typeText(int code);

    SgMorphControlCustomValueItem *m_customValueItem;
};
