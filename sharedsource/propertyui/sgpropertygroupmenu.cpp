#include "sharedsource/propertyui/sgpropertygroupmenu.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/propertyui/sgcreatepropertygroupdlg.h"

namespace {

// Adds the path of `group`, then of its descendants, then of its following siblings (with their
// descendants), depth first.
void collectPaths(const SgPropertyGroup *group, QStringList &paths) {
    for (; group; group = group->getNextSibling()) {
        const QString path = group->getPath();
        if (!paths.contains(path))
            paths.append(path);
        collectPaths(group->getFirstChild(), paths);
    }
}

void collectElementPaths(SgElement *element, QStringList &paths) {
    if (SgPropertyGroupTree *tree = element->getPropertyGroups())
        collectPaths(tree->getFirstChild(), paths);
}

} // namespace

SgPropertyGroupMenu::SgPropertyGroupMenu(QWidget *parent, const QString &name) : QMenu(parent) {
    setObjectName(name);
    addAction(tr("Create..."))->setData(CreateId);
    addSeparator();
    QStringList paths;
    collectGroupPaths(paths);
    for (qsizetype i = 0; i < paths.size(); ++i)
        addAction(paths[i])->setData(int(i));
}

SgPropertyGroupMenu::~SgPropertyGroupMenu() = default;

int SgPropertyGroupMenu::actionId(const QAction *action) {
    return action ? action->data().toInt() : -1;
}

QString SgPropertyGroupMenu::chooseGroup(const QString &current, const QPoint &position) {
    const QAction *chosen = exec(position);
    const int id = actionId(chosen);
    if (id == CreateId) {
        SgCreatePropertyGroupDlg dialog(sgApp->getDialogParent(), QString());
        dialog.setGroupPath(current);
        dialog.exec();
        return dialog.getGroup();
    }
    if (id >= 0)
        return chosen->text();
    return current;
}

void SgPropertyGroupMenu::collectGroupPaths(QStringList &paths) {
    SgScene *scene = sgApp->getScene();
    SgNode *node = scene ? scene->getPrimarySelection() : nullptr;
    if (!node)
        return;
    if (dynamic_cast<SgBone *>(node)) {
        node = node->getSkeleton();
        if (!node)
            return;
    }
    collectElementPaths(node, paths);
    if (auto *skeleton = dynamic_cast<SgSkeleton *>(node)) {
        for (SgBone *bone : skeleton->getAllBones())
            collectElementPaths(bone, paths);
    }
}
