#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

class SgMorphErcTypeItem;
class SgMorphControlNodeItem;
class SgMorphControlPropertyItem;
class SgMorphControlCustomLabelItem;
class SgMorphControlHideSecondaryItem;

// The "Create Control Property:" row, with the rows that describe the control property:
// "ERC Type: " (and below it the custom value rows), "Node:", "Property:", "Use Secondary
// Label:" and "Hide Secondary Properties:". They are enabled only while it is yes.
class SgMorphControlItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Creates the dependent rows and shows the loader's current choice.
    SgMorphControlItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Enables the dependent rows (and the ERC type's own dependents) with the value and writes
    // it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 2; }
    QString settingKey() const override { return QStringLiteral("CreateControlProperty"); }

    SgMorphErcTypeItem *ercTypeItem() const { return m_ercType; }

private:
    SgMorphControlHideSecondaryItem *m_hideSecondary;
    SgMorphControlCustomLabelItem *m_customLabel;
    SgMorphControlPropertyItem *m_property;
    SgMorphControlNodeItem *m_node;
    SgMorphErcTypeItem *m_ercType;
};
