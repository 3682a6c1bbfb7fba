#pragma once

#include <QList>
#include <QTreeWidget>

class SgFileIOSettings;
class SgMorphLoadLog;
class SgMorphMeshItem;
class SgNode;
class SgVertexMesh;

// The list of morph sources of the morph loader: a two-column tree ("Item", "Value") whose
// top-level rows are the sources (geometry files, or one in-memory shape from the modeler),
// each with its setting rows beneath. It adds files (refusing exact duplicates), takes
// dropped geometry and pose files, removes and reorders the selected sources, forwards
// context-menu requests on setting rows to their editors, and finally runs every source's
// loader over the target nodes. The order of the rows is the order in which sources are run
// and saved; a new source goes to the top.
class SgMorphSourceList : public QTreeWidget {
    Q_OBJECT
public:
    // `name` becomes the object name.
    SgMorphSourceList(QWidget *parent, const QString &name);
    ~SgMorphSourceList() override;

    // Adds a source row for `path` at the top, unless a source file row already has exactly
    // this path (case-sensitive), which shows the "File already selected" warning instead.
    void addFile(const QString &path);
    // `addFile` for each path in order, so the last path ends up at the top.
    void addFiles(const QStringList &paths);
    // Adds the in-memory source for `mesh` (referenced while the row lives) from `node`, at
    // the top, and returns it.
    SgMorphMeshItem *addMesh(SgVertexMesh *mesh, SgNode *node);
    // Deletes every selected source row with its settings and loader.
    void removeSelected();
    // Moves the selected source rows one place up (`up`) or down. Adjacent selected rows move
    // together as a block; a block at the edge stays. Cost: linear in the rows.
    void moveSelected(bool up);

    // Runs every source from the top, in order, into `log`: file rows load their file onto the
    // targets (`mode` 0: every bone of the first selected node's figure and the figure itself;
    // 1: the selected nodes; 2: the primary selection only), the in-memory row creates its
    // morph on its own node (every bone of it for a figure). Each source's pose step runs
    // first and may skip it. The host progress shows "Creating Morphs" with the targets times
    // the file rows as total. Stops at the first row that is no source.
    void createMorphs(SgFileIOSettings &importOptions, int mode, SgMorphLoadLog &log);

    // Wide enough for both columns of a source with every setting row shown: the dialog's
    // default width fits its columns.
    QSize sizeHint() const override;

signals:
    // "Save Object Configuration.." was chosen on a source row.
    void saveObject();

public slots:
    // A context-menu request at the global `pos` over `col` of `item`: the source row menu
    // for a file row, the row's editor for a setting row, nothing for no row, and a debug
    // warning for any other row.
    void showContextMenu(QTreeWidgetItem *item, const QPoint &pos, int col);

protected:
    // Takes drags that carry file URLs.
    void dragEnterEvent(QDragEnterEvent *event) override;
    void dragMoveEvent(QDragMoveEvent *event) override;
    // Files dropped onto an enabled "Pose:" row become its pose; otherwise geometry files are
    // added and the others are listed in one "Error loading files" warning.
    void dropEvent(QDropEvent *event) override;
    // A right click asks for the row and column under the pointer, the context-menu key for
    // the current row's value; both go to `showContextMenu`.
    void contextMenuEvent(QContextMenuEvent *event) override;
    // A press on the current row (or Space on it) starts its in-place edit.
    void mousePressEvent(QMouseEvent *event) override;
    void keyPressEvent(QKeyEvent *event) override;

private:
    class RenameDelegate;

    // The widest text of `column` among the rows below `item` (all of them, expanded or not),
    // with the indentation of their depth for the "Item" column; at least the header's width.
    int textWidthBelow(int column, const QTreeWidgetItem *item, int depth) const;
    int neededWidth(int column) const;
    // Sizes the "Item" column to its widest row.
    void fitItemColumn();

    void activateRow(QTreeWidgetItem *item);
    void finishRename(const QModelIndex &index);
    QList<SgNode *> targetNodes(int mode) const;
    int leadingFileRows() const;
    void moveTopLevelRow(int from, int to);
};
