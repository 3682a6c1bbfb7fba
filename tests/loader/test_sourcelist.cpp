// The source list: adding, refusing duplicates, removing, reordering, dropping files and the
// context menus; the settings tree under each source: enabling rules, editors and the texts a
// configuration may hold. Driven through the real list and its popups.
#include "loadertestsupport.h"

#include "sgcore/script/sgscript.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphposeitem.h"
#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

#include <QDropEvent>
#include <QLineEdit>
#include <QMimeData>
#include <QSignalSpy>
#include <QTest>
#include <QUrl>
#include <QVBoxLayout>

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

SgMorphSourceBoolItem *boolRow(QTreeWidgetItem *top, const QString &label) {
    return dynamic_cast<SgMorphSourceBoolItem *>(findRow(top, label));
}

class SourceItems : public ::testing::Test {
protected:
    QWidget window;
    SgMorphSourceList &list = *new SgMorphSourceList(&window, "MorphLoaderSourceList");
    QLineEdit &elsewhere = *new QLineEdit(&window);
    SgMorphFileItem *head = nullptr;

    void SetUp() override {
        auto *layout = new QVBoxLayout(&window);
        layout->addWidget(&list);
        layout->addWidget(&elsewhere);
        window.show();
        window.activateWindow();
        ASSERT_TRUE(QTest::qWaitForWindowActive(&window));
        head = new SgMorphFileItem(&list, QStringLiteral("/data/morphs/head.obj"));
        list.expandAll();
    }
    // Types `text` into the in-place editor of column 1 of `row` and presses Enter, or with
    // `enter` false moves the focus elsewhere.
    void editInPlace(QTreeWidgetItem *row, const QString &text, bool enter = true) {
        ASSERT_EQ(sgTestOpenEditor(&list), nullptr);
        static_cast<SgMorphSourceItem *>(row)->showEditor(QPoint(), 1);
        QLineEdit *editor = sgTestOpenEditor(&list);
        ASSERT_NE(editor, nullptr);
        editor->setText(text);
        if (enter)
            QTest::keyClick(editor, Qt::Key_Return);
        else
            elsewhere.setFocus();
        // The editor hands its text over from the event loop.
        QCoreApplication::processEvents();
    }
};

TEST_F(SourceItems, CreateControlAndErcTypeSwitchTheirDependents) {
    auto *control = boolRow(head, "Create Control Property:");
    auto *useCustom = boolRow(head, "Use Custom Value:");
    SgMorphSourceItem *erc = findRow(head, "ERC Type: ");
    // Which dependent rows are enabled, as '1' and '0' in this order.
    const auto enabled = [&] {
        QString flags;
        for (const char *label : {"ERC Type: ", "Node:", "Property:", "Use Secondary Label:",
                                  "Hide Secondary Properties:", "Use Custom Value:", "Value:"})
            flags += findRow(head, label)->isEnabled() ? '1' : '0';
        return flags;
    };
    editWithPopup(list, control, "no");
    EXPECT_FALSE(head->loader().createControl());
    EXPECT_EQ(enabled(), "0000000");
    // Back on with "ERC[DeltaAdd]": "Use Custom Value:" again, "Value:" only once it is yes.
    editWithPopup(list, control, "yes");
    EXPECT_EQ(enabled(), "1111110");
    editWithPopup(list, useCustom, "yes");
    EXPECT_EQ(enabled(), "1111111");
    EXPECT_TRUE(head->loader().useCustomValue());

    // Every other type turns the custom value off and disables both rows, also after the
    // control is switched off and on again.
    const QStringList types = {"ERC[DeltaAdd]", "ERC[DivideInto]", "ERC[DivideBy]",
                               "ERC[Multiply]", "ERC[Subtract]",   "ERC[Add]"};
    for (int code = 1; code < 6; ++code) {
        editWithPopup(list, useCustom, "yes");
        EXPECT_EQ(editWithPopup(list, erc, types[code]), types);
        EXPECT_EQ(head->loader().ercType(), code);
        EXPECT_FALSE(head->loader().useCustomValue());
        editWithPopup(list, control, "no");
        editWithPopup(list, control, "yes");
        EXPECT_EQ(enabled(), "1111100") << code;
        editWithPopup(list, erc, "ERC[DeltaAdd]");
        EXPECT_EQ(enabled(), "1111110") << code;
        EXPECT_EQ(useCustom->text(1), "no");
    }

    // A dismissed popup changes nothing; the ERC editor opens even while the row is disabled.
    editWithPopup(list, erc, "");
    EXPECT_EQ(head->loader().ercType(), 0);
    editWithPopup(list, control, "no");
    editWithPopup(list, erc, "ERC[Add]");
    EXPECT_EQ(head->loader().ercType(), 5);
    editWithPopup(list, control, "");
    EXPECT_EQ(control->text(1), "no");
}

// Every row's text round trip and its value in the loader is checked through a saved and
// loaded configuration file (test_morphloaderdlg); here the texts a file may hold wrongly.
TEST_F(SourceItems, UnknownAndOutOfRangeTextsFallBackToDefaults) {
    const SgMorphLoader &loader = head->loader();
    SgMorphSourceItem *erc = findRow(head, "ERC Type: ");
    SgMorphSourceItem *reverse = findRow(head, "Reverse Deformations:");
    for (const auto &[row, text] : {std::pair(erc, "3"),
                                    {findRow(head, "Clean Up Orphans:"), "False"},
                                    {findRow(head, "Overwrite Existing:"), "Deltas Only"},
                                    {reverse, "True"}})
        row->setValueText(text);
    erc->setValueText("9");
    EXPECT_EQ(loader.ercType(), 3);
    erc->setValueText("x"); // no number: 0
    EXPECT_EQ(erc->text(1), "ERC[DeltaAdd]");
    findRow(head, "Overwrite Existing:")->setValueText("deltas only");
    EXPECT_EQ(loader.override(), 0);
    EXPECT_EQ(findRow(head, "Overwrite Existing:")->text(1), "Make Unique");
    EXPECT_FALSE(findRow(head, "Clean Up Orphans:")->isEnabled());
    SgMorphSourceItem *value = findRow(head, "Value:");
    value->setValueText("nan");
    EXPECT_FLOAT_EQ(loader.customValue(), 0.0f);
    EXPECT_EQ(value->text(1), "0");
    // A bool row reads only "True" as yes.
    reverse->setValueText("true");
    EXPECT_FALSE(loader.reverseModifiers());

    // A disabled bool row opens no editor.
    SgTestModalAnswer none(sgTestChooseMenu({"yes"}), 200);
    findRow(head, "Clean Up Orphans:")->showEditor(QPoint(), 1);
    EXPECT_FALSE(none.answered());
    EXPECT_FALSE(loader.cleanUpOrphans());
}

TEST_F(SourceItems, InPlaceEditsFollowTheMorphNameAndRevertBadNumbers) {
    SgMorphSourceItem *name = findRow(head, "Name:");
    auto *label = findRow(head, "Label:");
    boolRow(head, "Use Secondary Label:")->setValue(true);
    editInPlace(name, "smile");
    EXPECT_EQ(head->loader().morphName(), "smile");
    EXPECT_EQ(label->text(1), "smile");
    EXPECT_EQ(findRow(head, "Property:")->text(1), "smile");

    // Leaving the label editor on the shown name keeps it following the name.
    editInPlace(label, "smile");
    EXPECT_EQ(head->loader().customLabel(), "");
    editInPlace(name, "grin");
    EXPECT_EQ(label->text(1), "grin");

    editInPlace(label, "Big Grin");
    EXPECT_EQ(head->loader().customLabel(), "Big Grin");
    editInPlace(name, "grin2");
    EXPECT_EQ(label->text(1), "Big Grin");
    editInPlace(label, "");
    EXPECT_EQ(head->loader().customLabel(), "");
    EXPECT_EQ(label->text(1), "grin2");

    auto *value = findRow(head, "Value:");
    boolRow(head, "Use Custom Value:")->setValue(true);
    editInPlace(value, "2.5");
    EXPECT_FLOAT_EQ(head->loader().customValue(), 2.5f);
    editInPlace(value, "abc");
    EXPECT_EQ(value->text(1), "2.5");
    EXPECT_FLOAT_EQ(head->loader().customValue(), 2.5f);

    // The edit is also taken over when the editor loses focus.
    editInPlace(value, "0.5", false);
    EXPECT_FLOAT_EQ(head->loader().customValue(), 0.5f);
    EXPECT_EQ(sgTestOpenEditor(&list), nullptr);

    // Column 0 is never edited, and "Label:" only while "Use Secondary Label:" is yes.
    name->showEditor(QPoint(), 0);
    EXPECT_EQ(sgTestOpenEditor(&list), nullptr);
    boolRow(head, "Use Secondary Label:")->setValue(false);
    label->showEditor(QPoint(), 1);
    EXPECT_EQ(sgTestOpenEditor(&list), nullptr);

    // A press on the current in-place row opens its editor; the first press only makes it
    // current.
    list.setCurrentItem(head);
    const QPoint at(list.columnViewportPosition(1) + 5, list.visualItemRect(name).center().y());
    QTest::mouseClick(list.viewport(), Qt::LeftButton, {}, at);
    EXPECT_EQ(sgTestOpenEditor(&list), nullptr);
    QTest::mouseClick(list.viewport(), Qt::LeftButton, {}, at);
    EXPECT_NE(sgTestOpenEditor(&list), nullptr);
}

} // namespace
