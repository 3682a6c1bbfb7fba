// The source list: adding, refusing duplicates, removing, reordering, dropping files and the
// context menus, driven through the real list.
#include "loadertestsupport.h"

#include "sgcore/script/sgscript.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphposeitem.h"
#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

#include <QDropEvent>
#include <QMimeData>
#include <QSignalSpy>
#include <QUrl>

namespace {

QString poseExtension() {
    return QString(SgScript::s_VarnScript2TextExtension);
}

// Drops `files` onto the list's viewport at `point`.
void drop(SgMorphSourceList &list, const QStringList &files, QPoint point) {
    QMimeData data;
    QList<QUrl> urls;
    for (const QString &file : files)
        urls.append(QUrl::fromLocalFile(file));
    data.setUrls(urls);
    QDragEnterEvent enter(point, Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
    QCoreApplication::sendEvent(list.viewport(), &enter);
    EXPECT_TRUE(enter.isAccepted());
    QDropEvent dropEvent(QPointF(point), Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
    QCoreApplication::sendEvent(list.viewport(), &dropEvent);
}

class SourceList : public ::testing::Test {
protected:
    SgMorphSourceList list{nullptr, QStringLiteral("MorphLoaderSourceList")};
    void SetUp() override { list.show(); }

    void select(const QList<int> &rows) {
        list.clearSelection();
        for (int row : rows)
            list.topLevelItem(row)->setSelected(true);
    }
};

TEST_F(SourceList, AddsOnTopAndRefusesExactDuplicatesOnce) {
    list.addFile("/m/a.obj");
    list.addFile("/m/b.obj");
    EXPECT_EQ(rowPaths(list), QStringList({"/m/b.obj", "/m/a.obj"}));
    QString text;
    {
        SgTestModalAnswer answer(sgTestPressButton(QMessageBox::NoButton, nullptr, &text));
        list.addFile("/m/a.obj");
        EXPECT_EQ(answer.titles(), QStringList{"File already selected"});
    }
    EXPECT_EQ(text, "The file \"/m/a.obj\" is already in the list, it will not be added again.");
    // A path in another letter case is another file. One warning for the one duplicate of a
    // batch; the last path of the batch ends on top.
    list.addFile("/m/A.obj");
    {
        SgTestModalAnswer answer(sgTestPressButton());
        list.addFiles({"/m/c.obj", "/m/b.obj", "/m/d.obj"});
        EXPECT_EQ(answer.titles(), QStringList{"File already selected"});
    }
    EXPECT_EQ(rowPaths(list),
              QStringList({"/m/d.obj", "/m/c.obj", "/m/A.obj", "/m/b.obj", "/m/a.obj"}));

    select({1, 3});
    list.removeSelected();
    EXPECT_EQ(rowPaths(list), QStringList({"/m/d.obj", "/m/A.obj", "/m/a.obj"}));
}

TEST_F(SourceList, MovesSelectedRowsAsBlocks) {
    // Rows "/1" to "/n" from the top; the selected rows move by each step in turn (true: up).
    const struct {
        int rows;
        QList<int> selected;
        QList<bool> up;
        QStringList expected;
    } cases[] = {
        {4, {0, 1}, {true}, {"/1", "/2", "/3", "/4"}},
        {4, {1, 2}, {true}, {"/2", "/3", "/1", "/4"}},
        {4, {1, 2}, {false, false}, {"/1", "/4", "/2", "/3"}},
        // Separate selected rows each move one place.
        {5, {1, 3}, {false}, {"/1", "/3", "/2", "/5", "/4"}},
        {5, {1, 3}, {false, true}, {"/1", "/2", "/3", "/4", "/5"}},
    };
    for (const auto &c : cases) {
        list.clear();
        for (int row = c.rows; row > 0; --row)
            list.addFile("/" + QString::number(row));
        list.topLevelItem(1)->setExpanded(true);
        select(c.selected);
        QStringList chosen;
        for (int row : c.selected)
            chosen << list.topLevelItem(row)->text(1);
        for (bool up : c.up)
            list.moveSelected(up);
        EXPECT_EQ(rowPaths(list), c.expected);
        for (int row = 0; row < c.rows; ++row) // the moved rows stay selected
            EXPECT_EQ(list.topLevelItem(row)->isSelected(), chosen.contains(c.expected[row]));
    }
}

TEST_F(SourceList, ContextMenusForwardToRowsAndOfferSavingOnFileRows) {
    list.addFile("/m/a.obj");
    list.addMesh(nullptr, nullptr);
    QSignalSpy saved(&list, &SgMorphSourceList::saveObject);
    QTreeWidgetItem *file = list.topLevelItem(1);
    const QPoint at = list.viewport()->mapToGlobal(QPoint(5, 5));

    QStringList seen;
    {
        SgTestModalAnswer answer(sgTestChooseMenu({"Save Object Configuration.."}, &seen));
        list.showContextMenu(file, at, 0);
    }
    EXPECT_EQ(seen, QStringList({"Save Object Configuration..", "-", "Cancel"}));
    EXPECT_EQ(saved.count(), 1);

    // The in-memory row has no menu.
    {
        SgTestModalAnswer answer(sgTestChooseMenu({}), 300);
        list.showContextMenu(list.topLevelItem(0), at, 0);
        EXPECT_FALSE(answer.answered());
    }
    list.showContextMenu(nullptr, at, 0);

    // A right click on a setting row's value, or the context-menu key on the current row,
    // opens the row's editor.
    const auto contextMenu = [&](QContextMenuEvent::Reason reason, QPoint at) {
        SgTestModalAnswer answer(sgTestChooseMenu({"yes"}));
        QContextMenuEvent event(reason, at, list.viewport()->mapToGlobal(at));
        QCoreApplication::sendEvent(list.viewport(), &event);
        EXPECT_TRUE(answer.answered());
    };
    list.expandAll();
    const QRect rect = list.visualItemRect(findRow(file, "Reverse Deformations:"));
    contextMenu(QContextMenuEvent::Mouse,
                QPoint(list.columnViewportPosition(1) + 5, rect.center().y()));
    EXPECT_TRUE(static_cast<SgMorphFileItem *>(file)->loader().reverseModifiers());
    list.setCurrentItem(findRow(file, "Apply After Joint Binding:"));
    contextMenu(QContextMenuEvent::Keyboard, QPoint(1, 1));
    EXPECT_TRUE(static_cast<SgMorphFileItem *>(file)->loader().applyAfterJoint());
}

TEST_F(SourceList, DropsAddGeometryFilesAndSetOrClearPoses) {
    // Drops `files` at `point`; returns the text of the box that came, or "" when none did.
    const auto dropAt = [&](const QStringList &files, QPoint point) {
        QString text;
        SgTestModalAnswer answer(sgTestPressButton(QMessageBox::NoButton, nullptr, &text));
        drop(list, files, point);
        return answer.titles().join('|') + ": " + text;
    };
    const QString failed = "Error loading files: Some Files dropped in the Morph Loader could "
                           "not be imported";
    EXPECT_EQ(dropAt({"/m/a.obj", "/m/notes.txt", "/m/b.obj", "/m/c.png"},
                     QPoint(10, list.viewport()->height() - 5)),
              failed + ":\n\t/m/notes.txt\n\t/m/c.png");
    EXPECT_EQ(rowPaths(list), QStringList({"/m/b.obj", "/m/a.obj"}));

    // A pose file onto the enabled "Pose:" row sets the pose and adds nothing; while the row
    // is not drop-enabled the list reports it.
    QTreeWidgetItem *file = list.topLevelItem(0);
    auto *pose = static_cast<SgMorphPoseItem *>(findRow(file, "Pose:"));
    const QString script = "/poses/sit." + poseExtension();
    list.expandAll();
    const QPoint onPose = list.visualItemRect(pose).center();
    EXPECT_EQ(dropAt({script}, onPose), failed + ":\n\t" + script);
    EXPECT_EQ(pose->text(1), "None");
    auto *reverse = static_cast<SgMorphSourceBoolItem *>(findRow(file, "Reverse Deformations:"));
    reverse->setValue(true);
    EXPECT_EQ(dropAt({script}, onPose), ": ");
    EXPECT_EQ(pose->text(1), script);
    EXPECT_EQ(static_cast<SgMorphFileItem *>(file)->loader().poseFile(), script);

    // Anything else onto the pose row is refused with the pose kept; "None" in the pose popup
    // clears it.
    EXPECT_EQ(dropAt({"/m/d.obj"}, onPose), failed + " as Pose files:\n\t/m/d.obj");
    EXPECT_EQ(pose->text(1), script);
    EXPECT_EQ(list.topLevelItemCount(), 2);
    EXPECT_EQ(editWithPopup(list, pose, "None"), QStringList({"None", "-", "Browse..."}));
    EXPECT_EQ(static_cast<SgMorphFileItem *>(file)->loader().poseFile(), "None");
    reverse->setValue(false);
    EXPECT_FALSE(pose->isEnabled());
}

} // namespace
