#pragma once

#include "sharedsource/loaderui/sgmorphsourceitem.h"

// A setting row with a yes/no value: shown as "yes" or "no", written as "True" or "False",
// edited with a two-entry popup. Subclasses write the value into the loader (and switch their
// dependent rows) in `setValue`, after calling the base.
class SgMorphSourceBoolItem : public SgMorphSourceItem {
    Q_OBJECT
public:
    // Starts with the value false, shown as "no".
    SgMorphSourceBoolItem(QTreeWidgetItem *parent, SgMorphLoader *loader);

    // Stores `on` and shows it when it differs from the stored value; nothing otherwise.
    // Subclasses do their own work after this even when the value did not change.
    virtual void setValue(bool on);
    bool value() const { return m_value; }

    // Only while the row is enabled: a popup with "yes" and "no"; choosing sets the value.
    // Dismissing the popup leaves the value as it was.
    void showEditor(const QPoint &position, int column) override;
    // "True" or "False".
    QString valueText() const override;
    // True exactly for the text "True" (case-sensitive); any other text gives false.
    void setValueText(const QString &text) override;

private:
    bool m_value = false;
};
