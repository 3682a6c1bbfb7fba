#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

class SgNode;

// The "Node:" row: the scene node that carries the control property. It starts on the
// primary selection (a bone standing for its figure) and follows the loader's control node.
class SgMorphControlNodeItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Sets the loader's control node to the primary selection, or its figure for a bone.
    SgMorphControlNodeItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Only while enabled: the scene node menu; the chosen node becomes the control node.
    void showEditor(const QPoint &position, int column) override;
    int settingType() const override { return 3; }
    QString settingKey() const override { return QStringLiteral("Node"); }
    // The control node's name, or empty without one.
    QString valueText() const override;
    // Finds the bone named `name` in the primary selection's figure and makes it the control
    // node, or the figure itself when it has no such bone; nothing without a figure. An empty
    // name only shows "- none -".
    void setValueText(const QString &name) override;

public slots:
    // Shows the control node's label, or "- none -".
    void updateText();
};
