#pragma once

#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

// The "Ignored Invisible Nodes:" row: whether the exported figure left out invisible nodes.
class SgMorphScExportIgnoredInvisibleItem : public SgMorphSourceBoolItem {
    Q_OBJECT
public:
    // Shows the loader's current value.
    SgMorphScExportIgnoredInvisibleItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Shows the value and writes it into the loader.
    void setValue(bool on) override;
    int settingType() const override { return 14; }
    QString settingKey() const override { return QStringLiteral("ScExportIgnoredInvisibleNodes"); }
};
