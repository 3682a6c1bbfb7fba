#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

// The "Property:" row: the control property, chosen from the property tree of the control
// node. Without a chosen property it shows the morph name, the name of the property that the
// run creates.
class SgMorphControlPropertyItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    SgMorphControlPropertyItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Only while enabled: the property tree menu of the control node; the result becomes the
    // control property (the loader takes over a newly created one).
    void showEditor(const QPoint &position, int column) override;
    int settingType() const override { return 4; }
    QString settingKey() const override { return QStringLiteral("Property"); }
    QString valueText() const override { return text(1); }
    // Configuration files carry the property itself separately; the text is ignored.
    void setValueText(const QString &) override {}

public slots:
    // Shows the control property's label, or the morph name without one.
    void updateText();
};
