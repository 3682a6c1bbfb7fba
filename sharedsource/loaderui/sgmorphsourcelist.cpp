#include "sharedsource/loaderui/sgmorphsourcelist.h"

#include "sharedsource/engine/sgmorphloadlog.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimportmgr.h"
#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/importer/sggeometryimporter.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgloaderwarning.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphmeshitem.h"
#include "sharedsource/loaderui/sgmorphsourceitem.h"

#include <QContextMenuEvent>
#include <QDragEnterEvent>
#include <QDropEvent>
#include <QHeaderView>
#include <QKeyEvent>
#include <QMenu>
#include <QMimeData>
#include <QMouseEvent>
#include <QStyle>
#include <QStyledItemDelegate>
#include <QUrl>

// The line editor of the in-place rows. It commits when the editor loses focus as well as on
// Enter, and then tells the row that its text was accepted.
class SgMorphSourceList::RenameDelegate : public QStyledItemDelegate {
public:
    explicit RenameDelegate(SgMorphSourceList *list) : QStyledItemDelegate(list), m_list(list) {}

    void setModelData(QWidget *editor, QAbstractItemModel *model,
                      const QModelIndex &index) const override {
        QStyledItemDelegate::setModelData(editor, model, index);
        m_list->finishRename(index);
    }

private:
    SgMorphSourceList *m_list;
};

namespace {
constexpr int SaveObjectId = 0;
constexpr int CancelId = 1;
constexpr int PoseSettingType = 17;

SgMorphSourceItem *settingRow(QTreeWidgetItem *item) {
    return item && item->type() == SgMorphSourceItem::Type ? static_cast<SgMorphSourceItem *>(item)
                                                           : nullptr;
}

QStringList localFiles(const QMimeData *data) {
    QStringList files;
    for (const QUrl &url : data->urls()) {
        const QString file = url.toLocalFile();
        if (!file.isEmpty())
            files.append(file);
    }
    return files;
}

// Whether a geometry importer takes `file` (the manager keeps its importers).
bool isGeometryFile(const QString &file) {
    SgImportMgr *manager = sgApp->getImportMgr();
    return manager && dynamic_cast<SgGeometryImporter *>(manager->findImporter(file)) != nullptr;
}
} // namespace

SgMorphSourceList::SgMorphSourceList(QWidget *parent, const QString &name) : QTreeWidget(parent) {
    setObjectName(name);
    setColumnCount(2);
    setHeaderLabels({tr("Item"), tr("Value")});
    setRootIsDecorated(true);
    setSortingEnabled(false);
    setAcceptDrops(true);
    viewport()->setAcceptDrops(true);
    setAllColumnsShowFocus(true);
    header()->setStretchLastSection(true);
    header()->setSectionsClickable(false);
    setSelectionMode(QAbstractItemView::ExtendedSelection);
    setEditTriggers(QAbstractItemView::NoEditTriggers);
    setItemDelegate(new RenameDelegate(this));
    setMinimumSize(400, 400);
    // The "Item" column always fits every row's label, shown or collapsed, so that expanding a
    // source never cuts a label; the "Value" column takes the rest.
    connect(model(), &QAbstractItemModel::rowsInserted, this, &SgMorphSourceList::fitItemColumn);
    connect(model(), &QAbstractItemModel::dataChanged, this, &SgMorphSourceList::fitItemColumn);
}

int SgMorphSourceList::textWidthBelow(int column, const QTreeWidgetItem *item, int depth) const {
    int width = 0;
    for (int i = 0; i < item->childCount(); ++i) {
        const QTreeWidgetItem *child = item->child(i);
        const QModelIndex index = indexFromItem(child, column);
        int own = sizeHintForIndex(index).width();
        if (column == 0)
            own += indentation() * (depth + (rootIsDecorated() ? 1 : 0));
        width = qMax(width, qMax(own, textWidthBelow(column, child, depth + 1)));
    }
    return width;
}

int SgMorphSourceList::neededWidth(int column) const {
    const int header = this->header()->sectionSizeHint(column);
    return qMax(header, textWidthBelow(column, invisibleRootItem(), 0));
}

void SgMorphSourceList::fitItemColumn() {
    const int width = neededWidth(0);
    if (header()->sectionSize(0) != width)
        header()->resizeSection(0, width);
}

QSize SgMorphSourceList::sizeHint() const {
    // Wide enough for a source with all its settings shown (measured once on a sample
    // source) and for the rows listed now, plus frame and scroll bar.
    static int sampleItem = 0;
    static int sampleValue = 0;
    if (sampleItem == 0) {
        SgMorphSourceList sample(nullptr, QString());
        sample.setFont(font());
        new SgMorphFileItem(&sample, QStringLiteral("/Targets/target.obj"));
        sampleItem = sample.neededWidth(0);
        sampleValue = sample.neededWidth(1);
    }
    const int item = qMax(sampleItem, neededWidth(0));
    const int value = qMax(sampleValue, neededWidth(1));
    const int chrome = 2 * frameWidth() + style()->pixelMetric(QStyle::PM_ScrollBarExtent) + 4;
    return QSize(qMax(minimumWidth(), item + value + chrome), QTreeWidget::sizeHint().height());
}

SgMorphSourceList::~SgMorphSourceList() {
    clear();
}

void SgMorphSourceList::addFile(const QString &path) {
    for (int i = 0; i < topLevelItemCount(); ++i) {
        QTreeWidgetItem *row = topLevelItem(i);
        if (row->type() != SgMorphFileItem::Type)
            break;
        if (static_cast<SgMorphFileItem *>(row)->loader().filename() == path) {
            sgLoaderWarning(tr("File already selected"),
                            tr("The file \"%1\" is already in the list, it will not be added "
                               "again.")
                                .arg(path));
            return;
        }
    }
    new SgMorphFileItem(this, path);
}

void SgMorphSourceList::addFiles(const QStringList &paths) {
    for (const QString &path : paths)
        addFile(path);
}

SgMorphMeshItem *SgMorphSourceList::addMesh(SgVertexMesh *mesh, SgNode *node) {
    return new SgMorphMeshItem(this, mesh, node);
}

void SgMorphSourceList::removeSelected() {
    for (int i = topLevelItemCount() - 1; i >= 0; --i) {
        if (topLevelItem(i)->isSelected())
            delete takeTopLevelItem(i);
    }
}

void SgMorphSourceList::moveSelected(bool up) {
    // Only unselected rows are taken out and put back, so the selection stays as it is.
    const int count = topLevelItemCount();
    if (up) {
        for (int i = 1; i < count; ++i) {
            if (topLevelItem(i)->isSelected() && !topLevelItem(i - 1)->isSelected())
                moveTopLevelRow(i - 1, i);
        }
        return;
    }
    for (int i = count - 2; i >= 0; --i) {
        if (topLevelItem(i)->isSelected() && !topLevelItem(i + 1)->isSelected()) {
            // The unselected row below rises above the whole block ending at row i.
            int top = i;
            while (top > 0 && topLevelItem(top - 1)->isSelected())
                --top;
            moveTopLevelRow(i + 1, top);
            i = top;
        }
    }
}

void SgMorphSourceList::moveTopLevelRow(int from, int to) {
    QTreeWidgetItem *row = topLevelItem(from);
    const bool expanded = row->isExpanded();
    takeTopLevelItem(from);
    insertTopLevelItem(to, row);
    row->setExpanded(expanded);
}

void SgMorphSourceList::showContextMenu(QTreeWidgetItem *item, const QPoint &pos, int col) {
    if (!item)
        return;
    if (item->type() == SgMorphFileItem::Type && isEnabled()) {
        QMenu menu(this);
        menu.addAction(tr("Save Object Configuration.."))->setData(SaveObjectId);
        menu.addSeparator();
        menu.addAction(tr("Cancel"))->setData(CancelId);
        const QAction *chosen = menu.exec(pos);
        if (chosen && chosen->data().toInt() == SaveObjectId)
            emit saveObject();
        return;
    }
    if (SgMorphSourceItem *row = settingRow(item)) {
        row->showEditor(pos, col);
        return;
    }
    qWarning("Invalid list item found in SgMorphSourceList!");
}

void SgMorphSourceList::dragEnterEvent(QDragEnterEvent *event) {
    if (event->mimeData()->hasFormat(QStringLiteral("text/uri-list")))
        event->acceptProposedAction();
}

void SgMorphSourceList::dragMoveEvent(QDragMoveEvent *event) {
    if (event->mimeData()->hasFormat(QStringLiteral("text/uri-list")))
        event->acceptProposedAction();
    else
        event->ignore();
}

void SgMorphSourceList::dropEvent(QDropEvent *event) {
    const QStringList files = localFiles(event->mimeData());
    SgMorphSourceItem *row = settingRow(itemAt(event->position().toPoint()));
    if (row && row->dropEnabled() && row->settingType() == PoseSettingType) {
        row->dropped(event);
        return;
    }
    event->acceptProposedAction();
    QStringList refused;
    for (const QString &file : files) {
        if (isGeometryFile(file))
            addFile(file);
        else
            refused.append(file);
    }
    if (refused.isEmpty())
        return;
    QString text = tr("Some Files dropped in the Morph Loader could not be imported:");
    for (const QString &file : refused)
        text += QStringLiteral("\n\t%1").arg(file);
    sgLoaderWarning(tr("Error loading files"), text);
}

void SgMorphSourceList::contextMenuEvent(QContextMenuEvent *event) {
    // From the keyboard the request is about the current row's value; from the mouse about
    // the row and column under the pointer (the position is the viewport's).
    event->accept();
    if (event->reason() == QContextMenuEvent::Keyboard) {
        if (QTreeWidgetItem *current = currentItem()) {
            const QPoint at = visualItemRect(current).center();
            showContextMenu(current, viewport()->mapToGlobal(at), 1);
        }
        return;
    }
    showContextMenu(itemAt(event->pos()), event->globalPos(), columnAt(event->pos().x()));
}

void SgMorphSourceList::mousePressEvent(QMouseEvent *event) {
    QTreeWidgetItem *before = currentItem();
    QTreeWidget::mousePressEvent(event);
    QTreeWidgetItem *pressed = itemAt(event->position().toPoint());
    if (event->button() == Qt::LeftButton && pressed && pressed == before)
        activateRow(pressed);
}

void SgMorphSourceList::keyPressEvent(QKeyEvent *event) {
    if (event->key() == Qt::Key_Space && currentItem() && state() != EditingState) {
        activateRow(currentItem());
        return;
    }
    QTreeWidget::keyPressEvent(event);
}

void SgMorphSourceList::activateRow(QTreeWidgetItem *item) {
    if (SgMorphSourceItem *row = settingRow(item))
        row->activate();
}

void SgMorphSourceList::finishRename(const QModelIndex &index) {
    if (SgMorphSourceItem *row = settingRow(itemFromIndex(index)))
        row->okRename(index.column());
}

QList<SgNode *> SgMorphSourceList::targetNodes(int mode) const {
    QList<SgNode *> targets;
    SgScene *scene = sgApp->getScene();
    if (!scene)
        return targets;
    for (SgNode *node : scene->getSelectedNodes())
        targets.append(node);
    if (mode != 0 || targets.isEmpty())
        return targets;
    SgNode *first = targets.first();
    if (auto *bone = dynamic_cast<SgBone *>(first))
        first = bone->getSkeleton();
    if (auto *figure = dynamic_cast<SgSkeleton *>(first)) {
        targets.clear();
        for (SgBone *bone : figure->getAllBones())
            targets.append(bone);
        targets.append(figure);
    }
    return targets;
}

int SgMorphSourceList::leadingFileRows() const {
    int rows = 0;
    while (rows < topLevelItemCount() && topLevelItem(rows)->type() == SgMorphFileItem::Type)
        ++rows;
    return rows;
}

void SgMorphSourceList::createMorphs(SgFileIOSettings &importOptions, int mode,
                                     SgMorphLoadLog &log) {
    const QList<SgNode *> targets = targetNodes(mode);
    SgScene *scene = sgApp->getScene();
    SgNode *primary = scene ? scene->getPrimarySelection() : nullptr;
    sgApp->startProgress(tr("Creating Morphs"), int(targets.size()) * leadingFileRows(), false,
                         false);
    for (int i = 0; i < topLevelItemCount(); ++i) {
        QTreeWidgetItem *row = topLevelItem(i);
        if (row->type() == SgMorphFileItem::Type) {
            SgMorphLoader &loader = static_cast<SgMorphFileItem *>(row)->loader();
            if (!loader.applyPose())
                continue;
            if (mode == 2)
                loader.loadMorphForNode(importOptions, primary, log);
            else
                loader.loadMorphForNodes(importOptions, targets, log);
        } else if (row->type() == SgMorphMeshItem::Type) {
            auto *source = static_cast<SgMorphMeshItem *>(row);
            QList<SgNode *> own;
            if (auto *figure = dynamic_cast<SgSkeleton *>(source->node())) {
                for (SgBone *bone : figure->getAllBones())
                    own.append(bone);
            } else if (source->node()) {
                own.append(source->node());
            }
            if (source->loader().applyPose() && source->mesh()) {
                SgVertexMesh *mesh = source->mesh();
                mesh->ref(); // the geometry stays alive for the whole call
                source->loader().createMorphForNodes(mesh, own, log);
                mesh->unref();
            }
        } else {
            break;
        }
    }
    sgApp->finishProgress();
    // The loader's "Loading Morph: ..." must not outlive the run.
    sgApp->statusLine(log.hasProblems() ? tr("Morphs loaded, with warnings or errors.")
                                        : tr("Morphs loaded."),
                      true);
}
