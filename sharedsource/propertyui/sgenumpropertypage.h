#pragma once

#include "sharedsource/propertyui/sgpropertypage.h"

#include <QStringList>

class QPushButton;
class QTreeWidget;
class QTreeWidgetItem;
class SgEnumProperty;
class SgEnumSlider;

// "Enum Attributes": the list of items, edited in place, and the value and default sliders,
// which always hold the same items as the list, in the same order.
//
// Row k of the list is item k of both sliders, followed by one placeholder row
// ("<Double-Click to Add/Rename>"). Typing a label into the placeholder adds an item; renaming a
// row renames the item of its index; the arrows swap labels with the neighbour (the "Int Val"
// column stays); the cross deletes the row and the rows below are renumbered, so that every
// row's "Int Val" is always its slider index. Programmatic changes of the list block its
// signals, so that only the user's edits arrive at the dialog.
class SgEnumPropertyPage : public SgPropertyPage {
    Q_OBJECT
public:
    explicit SgEnumPropertyPage(QWidget *parent);

    static QString placeholderText();

    QTreeWidget *list() const { return m_list; }
    QPushButton *upButton() const { return m_up; }
    QPushButton *downButton() const { return m_down; }
    QPushButton *deleteButton() const { return m_delete; }

    // The item labels, without the placeholder.
    QStringList labels() const;
    bool hasItems() const;
    // The items, then the value and the default index.
    void configure(SgEnumProperty *property) const;

    // The editor's operations (the dialog's enum slots call these).
    void addPlaceholder();
    void beginRename(QTreeWidgetItem *item, int column);
    void rename(QTreeWidgetItem *item, const QString &text);
    void moveUp();
    void moveDown();
    void remove();

    void restoreDefaults() override;
    void saveValues() override;
    void restoreValues() override;

private:
    QTreeWidgetItem *placeholder() const;
    void clear();
    void swapLabels(QTreeWidgetItem *upper, QTreeWidgetItem *lower);
    void renumber();

    QTreeWidget *m_list = nullptr;
    SgEnumSlider *m_value = nullptr, *m_default = nullptr;
    QPushButton *m_up = nullptr, *m_down = nullptr, *m_delete = nullptr;
    QStringList m_savedLabels;
    int m_savedValue = 0, m_savedDefault = 0;
};
