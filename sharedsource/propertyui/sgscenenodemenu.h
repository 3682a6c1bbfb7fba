#pragma once

#include <QMenu>
#include <QPoint>

class SgNode;

// A popup menu of the scene's visible nodes by label. Each item's id is the node's position in
// the scene's node order counting hidden nodes too, so ids can have gaps. Built once, at
// construction; the scene's node order must not change while the menu is open.
class SgSceneNodeMenu : public QMenu {
    Q_OBJECT
public:
    SgSceneNodeMenu(QWidget *parent, const QString &name);
    ~SgSceneNodeMenu() override;

    // Runs the menu modally at `position`: the chosen node, or `current` when the menu is
    // dismissed.
    SgNode *chooseNode(SgNode *current, const QPoint &position);
};
