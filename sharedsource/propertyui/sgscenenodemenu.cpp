#include "sharedsource/propertyui/sgscenenodemenu.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"

SgSceneNodeMenu::SgSceneNodeMenu(QWidget *parent, const QString &name) : QMenu(parent) {
    setObjectName(name);
    SgScene *scene = sgApp->getScene();
    if (!scene)
        return;
    int position = 0;
    SgNodeListIterator it = scene->nodeListIterator();
    for (SgNode *node = it.next(); node; node = it.next(), ++position) {
        if (!node->isHidden())
            addAction(node->getLabel())->setData(position);
    }
}

SgSceneNodeMenu::~SgSceneNodeMenu() = default;

SgNode *SgSceneNodeMenu::chooseNode(SgNode *current, const QPoint &position) {
    const QAction *chosen = exec(position);
    if (!chosen)
        return current;
    SgScene *scene = sgApp->getScene();
    SgNode *node = scene ? scene->getNode(chosen->data().toInt()) : nullptr;
    // The scene changed under the open menu: keep the current node rather than return none.
    return node ? node : current;
}
