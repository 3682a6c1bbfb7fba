#include "sharedsource/loaderui/sgmorphcontrolnodeitem.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/engine/sgmorphloader.h"

#include "sharedsource/propertyui/sgscenenodemenu.h"

namespace {
SgNode *primarySelection() {
    SgScene *scene = sgApp->getScene();
    return scene ? scene->getPrimarySelection() : nullptr;
}

// The figure of the primary selection: the selection itself when it is a figure.
SgSkeleton *selectedFigure() {
    SgNode *node = primarySelection();
    if (!node)
        return nullptr;
    if (auto *figure = dynamic_cast<SgSkeleton *>(node))
        return figure;
    return node->getSkeleton();
}
} // namespace

SgMorphControlNodeItem::SgMorphControlNodeItem(QTreeWidgetItem *parent, SgMorphLoader *loader)
    : SgMorphSourceItem(parent, loader) {
    setText(0, tr("Node:"));
    connect(loader, &SgMorphLoader::controlNodeChanged, this, &SgMorphControlNodeItem::updateText);
    SgNode *node = primarySelection();
    if (auto *bone = dynamic_cast<SgBone *>(node))
        node = bone->getSkeleton();
    loader->setControlNode(node);
    updateText();
}

void SgMorphControlNodeItem::showEditor(const QPoint &position, int) {
    if (!isEnabled())
        return;
    SgSceneNodeMenu menu(menuParent(), QString());
    loader()->setControlNode(menu.chooseNode(loader()->controlNode(), position));
}

QString SgMorphControlNodeItem::valueText() const {
    const SgNode *node = loader()->controlNode();
    return node ? node->getName() : QString();
}

void SgMorphControlNodeItem::setValueText(const QString &name) {
    if (name.isEmpty()) {
        setText(1, tr("- none -"));
        return;
    }
    SgSkeleton *figure = selectedFigure();
    if (!figure)
        return;
    SgNode *node = figure->findBone(name);
    if (!node)
        node = figure;
    setText(1, node->getLabel());
    loader()->setControlNode(node);
}

void SgMorphControlNodeItem::updateText() {
    const SgNode *node = loader()->controlNode();
    setText(1, node ? node->getLabel() : tr("- none -"));
}
