#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

// The "Label:" row: the control's secondary label, edited in place. It shows the custom label
// when there is one and the morph name otherwise, following both as they change.
class SgMorphControlSecondaryLabelItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    SgMorphControlSecondaryLabelItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    int settingType() const override { return 8; }
    QString settingKey() const override { return QStringLiteral("Label"); }
    QString valueText() const override { return text(1); }
    // Shows `text` and stores it as the custom label.
    void setValueText(const QString &text) override;
    bool renameEnabled(int column) const override { return column == 1; }
    // Stores the edited text as the custom label. Leaving the editor on the shown morph name
    // stores nothing, so the row keeps following the morph name.
    void okRename(int column) override;

public slots:
    // Shows the custom label, or the morph name when the label is empty.
    void updateText();
};
