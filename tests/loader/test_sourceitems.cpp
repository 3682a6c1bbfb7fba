// The settings tree under each morph source: shown order, values, enabling rules, editors and
// configuration text, driven through the real list and its popups.
#include "modalhelper.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphcontrolvalueitem.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphmeshitem.h"
#include "sharedsource/loaderui/sgmorphposeitem.h"
#include "sharedsource/loaderui/sgmorphsourceboolitem.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"

#include <QLineEdit>
#include <QSignalSpy>
#include <QTest>
#include <QVBoxLayout>
#include <gtest/gtest.h>

namespace {

// A shown row: label, value, enabled, and its shown children.
struct Row {
    QString label;
    QString value;
    bool enabled;
    std::vector<Row> children;
};

Row shown(QTreeWidgetItem *item) {
    Row row{item->text(0), item->text(1), !item->isDisabled(), {}};
    for (int i = 0; i < item->childCount(); ++i)
        row.children.push_back(shown(item->child(i)));
    return row;
}

std::string describe(const Row &row, int depth = 0) {
    std::string out = std::string(depth * 2, ' ') + row.label.toStdString() + " = " +
                      row.value.toStdString() + (row.enabled ? "" : " (disabled)") + "\n";
    for (const Row &child : row.children)
        out += describe(child, depth + 1);
    return out;
}

SgMorphSourceItem *findRow(QTreeWidgetItem *top, const QString &label) {
    for (int i = 0; i < top->childCount(); ++i) {
        QTreeWidgetItem *child = top->child(i);
        if (child->text(0) == label)
            return static_cast<SgMorphSourceItem *>(child);
        if (SgMorphSourceItem *found = findRow(child, label))
            return found;
    }
    return nullptr;
}

SgMorphSourceBoolItem *boolRow(QTreeWidgetItem *top, const QString &label) {
    return dynamic_cast<SgMorphSourceBoolItem *>(findRow(top, label));
}

// Opens a row's editor the way the list does on a right click over `column`, answering the
// popup with `entry` ("" dismisses it).
QStringList editWithPopup(SgMorphSourceList &list, QTreeWidgetItem *row, const QString &entry,
                          int column = 1) {
    QStringList seen;
    ModalAnswer answer(chooseMenuEntry(entry, &seen));
    list.showContextMenu(row, list.viewport()->mapToGlobal(list.visualItemRect(row).center()),
                         column);
    EXPECT_TRUE(answer.answered());
    return seen;
}

// The open in-place editor of the list, if any.
QLineEdit *openEditor(SgMorphSourceList &list) {
    // Closed editors are deleted from the event loop; drop them first.
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    for (QLineEdit *editor : list.viewport()->findChildren<QLineEdit *>()) {
        if (editor->isVisible())
            return editor;
    }
    return nullptr;
}

bool editorOpen(SgMorphSourceList &list) {
    return openEditor(list) != nullptr;
}

// Types `text` into the in-place editor of column 1 of `row` and presses Enter.
void editInPlace(SgMorphSourceList &list, QTreeWidgetItem *row, const QString &text) {
    ASSERT_FALSE(editorOpen(list));
    static_cast<SgMorphSourceItem *>(row)->showEditor(QPoint(), 1);
    QLineEdit *editor = openEditor(list);
    ASSERT_NE(editor, nullptr);
    editor->setText(text);
    QTest::keyClick(editor, Qt::Key_Return);
    // The editor hands its text over from the event loop.
    QCoreApplication::processEvents();
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
};

TEST_F(SourceItems, NewFileItemShowsTheDesignedTree) {
    EXPECT_EQ(head->type(), 52429);
    EXPECT_EQ(head->text(0), "head.obj");
    EXPECT_EQ(head->text(1), "/data/morphs/head.obj");
    EXPECT_EQ(head->loader().filename(), "/data/morphs/head.obj");
    EXPECT_EQ(head->loader().morphName(), "head");
    EXPECT_EQ(head->loader().morphGroup(), "Morphs/Morph Loader");

    const Row expected{
        "head.obj",
        "/data/morphs/head.obj",
        true,
        {{"Scenara Exported:",
          "no",
          true,
          {{"Ignored Invisible Nodes:", "yes", false, {}},
           {"Used Bone Welds:", "no", false, {}},
           {"Removed Unused Vertices:", "no", false, {}}}},
         {"Name:", "head", true, {}},
         {"Property Group:", "Morphs/Morph Loader", true, {}},
         {"Create Control Property:",
          "yes",
          true,
          {{"ERC Type: ",
            "ERC[DeltaAdd]",
            true,
            {{"Use Custom Value:", "no", true, {{"Value:", "1", false, {}}}}}},
           {"Node:", "- none -", true, {}},
           {"Property:", "head", true, {}},
           {"Use Secondary Label:", "no", true, {{"Label:", "head", false, {}}}},
           {"Hide Secondary Properties:", "no", true, {}}}},
         {"Reverse Deformations:", "no", true, {{"Pose:", "None", false, {}}}},
         {"Apply After Joint Binding:", "no", true, {}},
         {"Overwrite Existing:", "Make Unique", true, {{"Clean Up Orphans:", "yes", false, {}}}}}};
    EXPECT_EQ(describe(shown(head)), describe(expected));

    // Every setting row has the setting type 52685, cannot be selected, and carries its key.
    const QStringList keys = {"ScenaraExported",       "Name",
                              "PropertyGroup",         "CreateControlProperty",
                              "ReverseDeformations",   "ApplyAfterJointBinding",
                              "UpdateOverrideExisting"};
    for (int i = 0; i < head->childCount(); ++i) {
        auto *row = static_cast<SgMorphSourceItem *>(head->child(i));
        EXPECT_EQ(row->type(), 52685);
        EXPECT_FALSE(row->flags().testFlag(Qt::ItemIsSelectable));
        EXPECT_EQ(row->settingKey(), keys[i]);
    }
    EXPECT_FALSE(findRow(head, "Pose:")->dropEnabled());
}

TEST_F(SourceItems, CreateControlAndErcTypeSwitchTheirDependents) {
    auto *control = boolRow(head, "Create Control Property:");
    auto *useCustom = boolRow(head, "Use Custom Value:");
    SgMorphSourceItem *value = findRow(head, "Value:");
    SgMorphSourceItem *erc = findRow(head, "ERC Type: ");
    const QStringList five = {
        "ERC Type: ", "Node:", "Property:", "Use Secondary Label:", "Hide Secondary Properties:"};

    editWithPopup(list, control, "no");
    EXPECT_FALSE(head->loader().createControl());
    for (const QString &label : five)
        EXPECT_FALSE(findRow(head, label)->isEnabled()) << label.toStdString();
    EXPECT_FALSE(useCustom->isEnabled());
    EXPECT_FALSE(value->isEnabled());

    // Back on with "ERC[DeltaAdd]": "Use Custom Value:" again, "Value:" only once it is yes.
    editWithPopup(list, control, "yes");
    for (const QString &label : five)
        EXPECT_TRUE(findRow(head, label)->isEnabled()) << label.toStdString();
    EXPECT_TRUE(useCustom->isEnabled());
    EXPECT_FALSE(value->isEnabled());
    editWithPopup(list, useCustom, "yes");
    EXPECT_TRUE(value->isEnabled());
    EXPECT_TRUE(head->loader().useCustomValue());

    // Every other type turns the custom value off and disables both rows, also after the
    // control is switched off and on again.
    const QStringList types = {"ERC[DeltaAdd]", "ERC[DivideInto]", "ERC[DivideBy]",
                               "ERC[Multiply]", "ERC[Subtract]",   "ERC[Add]"};
    for (int code = 1; code < 6; ++code) {
        editWithPopup(list, useCustom, "yes");
        const QStringList seen = editWithPopup(list, erc, types[code]);
        EXPECT_EQ(seen, types);
        EXPECT_EQ(head->loader().ercType(), code);
        EXPECT_EQ(erc->valueText(), QString::number(code));
        EXPECT_EQ(useCustom->text(1), "no");
        EXPECT_FALSE(head->loader().useCustomValue());
        editWithPopup(list, control, "no");
        editWithPopup(list, control, "yes");
        EXPECT_FALSE(useCustom->isEnabled()) << code;
        EXPECT_FALSE(value->isEnabled()) << code;
        editWithPopup(list, erc, "ERC[DeltaAdd]");
        EXPECT_TRUE(useCustom->isEnabled());
        EXPECT_EQ(useCustom->text(1), "no");
        EXPECT_FALSE(value->isEnabled());
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

TEST_F(SourceItems, BoolRowsStayQuietOnTheirOwnValueAndReadOnlyTrue) {
    auto *control = boolRow(head, "Create Control Property:");
    auto *reverse = boolRow(head, "Reverse Deformations:");
    QSignalSpy controlSpy(&head->loader(), &SgMorphLoader::createControlChanged);
    QSignalSpy reverseSpy(&head->loader(), &SgMorphLoader::reverseModifiersChanged);

    control->setValue(true);
    reverse->setValue(false);
    editWithPopup(list, control, "yes");
    EXPECT_EQ(controlSpy.count(), 0);
    EXPECT_EQ(reverseSpy.count(), 0);

    reverse->setValueText("True");
    EXPECT_EQ(reverseSpy.count(), 1);
    reverse->setValueText("true");
    EXPECT_EQ(reverse->text(1), "no");
    EXPECT_EQ(reverse->valueText(), "False");
    EXPECT_FALSE(head->loader().reverseModifiers());

    // A disabled bool row opens no editor.
    auto *cleanUp = boolRow(head, "Clean Up Orphans:");
    ModalAnswer none(chooseMenuEntry("no"), 200);
    cleanUp->showEditor(QPoint(), 1);
    EXPECT_FALSE(none.answered());
    EXPECT_TRUE(head->loader().cleanUpOrphans());
}

TEST_F(SourceItems, ReverseDeformationsEnablesThePoseRowAndItsDrops) {
    auto *reverse = boolRow(head, "Reverse Deformations:");
    auto *pose = static_cast<SgMorphPoseItem *>(findRow(head, "Pose:"));
    editWithPopup(list, reverse, "yes");
    EXPECT_TRUE(head->loader().reverseModifiers());
    EXPECT_TRUE(pose->isEnabled());
    EXPECT_TRUE(pose->dropEnabled());
    EXPECT_TRUE(pose->dragEnabled());
    editWithPopup(list, reverse, "no");
    EXPECT_FALSE(pose->isEnabled());
    EXPECT_FALSE(pose->dropEnabled());

    // "None" in the pose popup clears a chosen pose.
    editWithPopup(list, reverse, "yes");
    pose->setValueText("/poses/sit.sgs");
    EXPECT_EQ(head->loader().poseFile(), "/poses/sit.sgs");
    const QStringList seen = editWithPopup(list, pose, "None");
    EXPECT_EQ(seen, QStringList({"None", "-", "Browse..."}));
    EXPECT_EQ(pose->text(1), "None");
    EXPECT_EQ(head->loader().poseFile(), "None");
}

TEST_F(SourceItems, ValueTextRoundTripsForEveryRow) {
    const std::vector<std::pair<QString, QString>> cases = {
        {"Name:", "brow"},
        {"Property Group:", "Morphs/Face"},
        {"Create Control Property:", "False"},
        {"Create Control Property:", "True"},
        {"Use Custom Value:", "True"},
        {"Value:", "0.25"},
        {"Use Secondary Label:", "True"},
        {"Label:", "Brow Up"},
        {"Hide Secondary Properties:", "True"},
        {"Reverse Deformations:", "True"},
        {"Pose:", "/poses/sit.sgs"},
        {"Overwrite Existing:", "Deltas Only"},
        {"Overwrite Existing:", "Deltas and ERC Links"},
        {"Clean Up Orphans:", "False"},
        {"Apply After Joint Binding:", "True"},
        {"Scenara Exported:", "True"},
        {"Ignored Invisible Nodes:", "False"},
        {"Used Bone Welds:", "True"},
        {"Removed Unused Vertices:", "True"},
        {"ERC Type: ", "3"},
    };
    for (const auto &[label, text] : cases) {
        SgMorphSourceItem *row = findRow(head, label);
        ASSERT_NE(row, nullptr) << label.toStdString();
        row->setValueText(text);
        EXPECT_EQ(row->valueText(), text) << label.toStdString();
    }
    const SgMorphLoader &loader = head->loader();
    EXPECT_EQ(loader.morphName(), "brow");
    EXPECT_EQ(loader.morphGroup(), "Morphs/Face");
    EXPECT_TRUE(loader.createControl());
    EXPECT_FALSE(loader.useCustomValue()); // "ERC[Multiply]" turned it off
    EXPECT_FLOAT_EQ(loader.customValue(), 0.25f);
    EXPECT_TRUE(loader.useCustomLabel());
    EXPECT_EQ(loader.customLabel(), "Brow Up");
    EXPECT_TRUE(loader.hideSecondary());
    EXPECT_TRUE(loader.reverseModifiers());
    EXPECT_EQ(loader.poseFile(), "/poses/sit.sgs");
    EXPECT_EQ(loader.override(), 1);
    EXPECT_FALSE(loader.cleanUpOrphans());
    EXPECT_TRUE(loader.applyAfterJoint());
    EXPECT_TRUE(loader.scenaraExported());
    EXPECT_FALSE(loader.ignoredInvisibleNodes());
    EXPECT_TRUE(loader.weldedGeometry());
    EXPECT_TRUE(loader.removedUnusedVertices());
    EXPECT_EQ(loader.ercType(), 3);
    EXPECT_EQ(findRow(head, "Property:")->valueText(), "brow");

    // Out-of-range and unknown texts.
    SgMorphSourceItem *erc = findRow(head, "ERC Type: ");
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
    findRow(head, "Node:")->setValueText("");
    EXPECT_EQ(findRow(head, "Node:")->text(1), "- none -");
}

TEST_F(SourceItems, InPlaceEditsFollowTheMorphNameAndRevertBadNumbers) {
    auto *label = findRow(head, "Label:");
    boolRow(head, "Use Secondary Label:")->setValue(true);
    editInPlace(list, findRow(head, "Name:"), "smile");
    EXPECT_EQ(head->loader().morphName(), "smile");
    EXPECT_EQ(label->text(1), "smile");
    EXPECT_EQ(findRow(head, "Property:")->text(1), "smile");

    // Leaving the label editor on the shown name keeps it following the name.
    editInPlace(list, label, "smile");
    EXPECT_EQ(head->loader().customLabel(), "");
    editInPlace(list, findRow(head, "Name:"), "grin");
    EXPECT_EQ(label->text(1), "grin");

    editInPlace(list, label, "Big Grin");
    EXPECT_EQ(head->loader().customLabel(), "Big Grin");
    editInPlace(list, findRow(head, "Name:"), "grin2");
    EXPECT_EQ(label->text(1), "Big Grin");
    editInPlace(list, label, "");
    EXPECT_EQ(head->loader().customLabel(), "");
    EXPECT_EQ(label->text(1), "grin2");

    auto *value = findRow(head, "Value:");
    boolRow(head, "Use Custom Value:")->setValue(true);
    editInPlace(list, value, "2.5");
    EXPECT_FLOAT_EQ(head->loader().customValue(), 2.5f);
    editInPlace(list, value, "abc");
    EXPECT_EQ(value->text(1), "2.5");
    EXPECT_FLOAT_EQ(head->loader().customValue(), 2.5f);
    editInPlace(list, value, "inf");
    EXPECT_EQ(value->text(1), "2.5");

    // The edit is also taken over when the editor loses focus.
    ASSERT_FALSE(editorOpen(list));
    static_cast<SgMorphSourceItem *>(value)->showEditor(QPoint(), 1);
    QLineEdit *editor = openEditor(list);
    ASSERT_NE(editor, nullptr);
    editor->setText("0.5");
    elsewhere.setFocus();
    QCoreApplication::processEvents();
    EXPECT_FLOAT_EQ(head->loader().customValue(), 0.5f);
    EXPECT_FALSE(editorOpen(list));

    // Column 0 is never edited, and "Label:" only while "Use Secondary Label:" is yes.
    static_cast<SgMorphSourceItem *>(findRow(head, "Name:"))->showEditor(QPoint(), 0);
    EXPECT_FALSE(editorOpen(list));
    boolRow(head, "Use Secondary Label:")->setValue(false);
    label->showEditor(QPoint(), 1);
    EXPECT_FALSE(editorOpen(list));

    // A press on the current in-place row opens its editor; the first press only makes it
    // current.
    SgMorphSourceItem *name = findRow(head, "Name:");
    list.setCurrentItem(head);
    const QPoint at(list.columnViewportPosition(1) + 5, list.visualItemRect(name).center().y());
    QTest::mouseClick(list.viewport(), Qt::LeftButton, {}, at);
    EXPECT_FALSE(editorOpen(list));
    QTest::mouseClick(list.viewport(), Qt::LeftButton, {}, at);
    EXPECT_TRUE(editorOpen(list));
}

TEST(MeshItem, ShowsFacMorphExpandedWithItsPresets) {
    SgMorphSourceList list(nullptr, "list");
    auto *item = list.addMesh(nullptr, nullptr);
    EXPECT_EQ(item->type(), 52430);
    EXPECT_EQ(item->text(0), "FacMorph");
    EXPECT_EQ(item->text(1), "FacMorph");
    EXPECT_EQ(item->loader().morphName(), "FacMorph");
    EXPECT_TRUE(item->isExpanded());
    EXPECT_EQ(boolRow(item, "Scenara Exported:")->text(1), "yes");
    EXPECT_EQ(boolRow(item, "Used Bone Welds:")->text(1), "yes");
    EXPECT_EQ(boolRow(item, "Removed Unused Vertices:")->text(1), "yes");
    EXPECT_EQ(boolRow(item, "Reverse Deformations:")->text(1), "yes");
    EXPECT_EQ(boolRow(item, "Ignored Invisible Nodes:")->text(1), "no");
    EXPECT_TRUE(boolRow(item, "Used Bone Welds:")->isEnabled());
    EXPECT_TRUE(item->loader().scenaraExported());
    EXPECT_TRUE(item->loader().weldedGeometry());
    EXPECT_TRUE(item->loader().removedUnusedVertices());
    EXPECT_FALSE(item->loader().ignoredInvisibleNodes());
    EXPECT_TRUE(item->loader().reverseModifiers());
    EXPECT_TRUE(findRow(item, "Pose:")->isEnabled());
}

} // namespace
