#pragma once

#include "sgcore/properties/sgnumericproperty.h"

#include <QTreeWidget>

class SgNode;

// The property panel: every numeric property of one node, grouped by where it lives (the node,
// its object, each modifier of its object; a morph's value channel shows under the morph), each
// with a spin box that sets its value. Labels are shown whole; a row's tooltip gives the
// property's group path and name. Setting a value emits `valueEdited`, so that views
// redraw the node's current geometry; controllers and clamping apply when the value is read.
class SgPropertyPanel : public QTreeWidget {
    Q_OBJECT
public:
    explicit SgPropertyPanel(QWidget *parent = nullptr);

    // Shows the properties of `node` (null: none). The panel does not own the node; call
    // again (or with null) before the node is deleted.
    void showNode(SgNode *node);
    SgNode *node() const { return m_node; }

    // Sets `property` to `value` as the panel's spin box does; used by tests and scripts.
    void setValue(SgNumericProperty *property, double value);

public slots:
    // Rebuilds the rows of the current node (after properties were added or removed).
    void refresh();

signals:
    void valueEdited(SgNumericProperty *property);

private:
    void addRows(QTreeWidgetItem *section, class SgElement *element);

    SgNode *m_node = nullptr;
};
