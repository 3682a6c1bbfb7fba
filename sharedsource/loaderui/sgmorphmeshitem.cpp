#include "sharedsource/loaderui/sgmorphmeshitem.h"

#include "sgcore/geometry/sgvertexmesh.h"
#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

#include <QList>

SgMorphMeshItem::SgMorphMeshItem(QTreeWidget *list, SgVertexMesh *mesh, SgNode *node)
    : SgMorphFileItem(list, QStringLiteral("FacMorph"), Type), m_mesh(mesh), m_node(node) {
    if (m_mesh)
        m_mesh->ref();
    presetSettingRows();
    setExpanded(true);
}

SgMorphMeshItem::~SgMorphMeshItem() {
    if (m_mesh)
        m_mesh->unref();
}

void SgMorphMeshItem::presetSettingRows() {
    QList<QTreeWidgetItem *> pending = {this};
    while (!pending.isEmpty()) {
        QTreeWidgetItem *item = pending.takeLast();
        for (int i = 0; i < item->childCount(); ++i)
            pending.append(item->child(i));
        auto *row = dynamic_cast<SgMorphSourceBoolItem *>(item);
        if (!row)
            continue;
        switch (row->settingType()) {
        case 13: // "Scenara Exported:"
        case 15: // "Used Bone Welds:"
        case 16: // "Removed Unused Vertices:"
        case 10: // "Reverse Deformations:"
            row->setValue(true);
            break;
        case 14: // "Ignored Invisible Nodes:"
            row->setValue(false);
            break;
        default:
            break;
        }
    }
}
