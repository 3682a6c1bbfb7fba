#pragma once

#include <QObject>
#include <QTreeWidgetItem>

class QDropEvent;
class QMenu;
class QPoint;
class SgMorphLoader;

// One setting row under a morph source row of the source list. The row shows its label in
// column 0 and its value in column 1, writes every change straight into the source's loader,
// opens its editor on a context-menu request and turns its value into configuration text and
// back. Every setting row has the item type `Type` (52685); source rows use their own types.
//
// New rows are inserted in front of their siblings, so rows created last are shown first.
class SgMorphSourceItem : public QObject, public QTreeWidgetItem {
    Q_OBJECT
public:
    static constexpr int Type = 52685;

    // Inserts the row as the first child of `parent` and makes it not selectable. `loader` is
    // not owned; it lives in the source row and outlives every setting row under it.
    SgMorphSourceItem(QTreeWidgetItem *parent, SgMorphLoader *loader);
    ~SgMorphSourceItem() override;

    // Opens the row's editor at the global `position` of a context-menu request made over
    // `column`. The base starts the in-place edit of `column` when the row allows it.
    virtual void showEditor(const QPoint &position, int column);
    // The row's setting type (0 to 19), which identifies it in configuration files.
    virtual int settingType() const = 0;
    // The configuration key of the row's setting.
    virtual QString settingKey() const = 0;
    // The value as written to a configuration file.
    virtual QString valueText() const = 0;
    // Sets the value from configuration text. The base ignores the text.
    virtual void setValueText(const QString &text);

    // Whether the value of `column` is edited in place (the in-place rows allow column 1).
    virtual bool renameEnabled(int column) const;
    // Called when the user presses on the row (or hits Space) while it is the current row:
    // starts the in-place edit of column 1 when the row allows it.
    virtual void activate();
    // Called after the in-place editor of `column` has put its text into the row.
    virtual void okRename(int column);
    // Called with a drop onto the row while the row is drop-enabled. The base ignores it.
    virtual void dropped(QDropEvent *event);

    // Effective enabled state: the row and every row above it are enabled.
    bool isEnabled() const { return !isDisabled(); }
    // Enables or disables the row itself; rows below a disabled row show disabled too.
    void setEnabled(bool enabled);
    // Turns dropping onto the row on or off.
    void setDropEnabled(bool enabled);
    bool dropEnabled() const { return m_flags.testFlag(Qt::ItemIsDropEnabled); }
    void setDragEnabled(bool enabled);
    bool dragEnabled() const { return m_flags.testFlag(Qt::ItemIsDragEnabled); }

    SgMorphLoader *loader() const { return m_loader; }

protected:
    // Starts the tree's line editor on `column` (column 1 for every in-place row).
    void startRename(int column);
    // Runs `menu` at `position` and returns the id stored in the chosen action's data, or -1
    // when the menu is dismissed.
    static int runMenu(QMenu &menu, const QPoint &position);
    // Appends an entry whose action carries `id`, for `runMenu`.
    static void addMenuItem(QMenu &menu, const QString &text, int id);
    // The widget that parents the row's menus and dialogs: the tree the row is shown in.
    QWidget *menuParent() const;

private:
    void setRowFlag(Qt::ItemFlag flag, bool on);

    SgMorphLoader *m_loader;
    // The row's own flags. Qt reports a row under a disabled parent as disabled; keeping our
    // own copy keeps that inherited state from turning into the row's own.
    Qt::ItemFlags m_flags;
};
