#pragma once

#include <QMenu>
#include <QPoint>
#include <QStringList>

// A popup menu of the property group paths found on the scene's primary selection (for a bone
// or figure: on the figure and all its bones), each path once in first-found order, below a
// "Create..." entry that lets the user pick or type a path in `SgCreatePropertyGroupDlg`.
// The menu only produces a path; no group is created in the scene. Built once, at construction.
class SgPropertyGroupMenu : public QMenu {
    Q_OBJECT
public:
    // The id of "Create..."; paths have the ids 0, 1, 2, ... in collection order.
    static constexpr int CreateId = 0x0FFFFFFF;

    SgPropertyGroupMenu(QWidget *parent, const QString &name);
    ~SgPropertyGroupMenu() override;

    // Runs the menu modally at `position`: a path returns its text; "Create..." opens the
    // create-group dialog preset to `current` and returns its group path whatever its result; a
    // dismissed menu returns `current`.
    QString chooseGroup(const QString &current, const QPoint &position);

    // Appends to `paths` every group path of the primary selection (a bone stands for its
    // figure; a figure adds the paths of all its bones), depth first, each path once.
    // O(groups x paths).
    static void collectGroupPaths(QStringList &paths);

    // The id of a menu action (null, as for a dismissed menu, gives -1).
    static int actionId(const QAction *action);
};
