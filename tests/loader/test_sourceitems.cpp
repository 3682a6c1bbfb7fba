// The settings tree under each morph source: shown order, values, enabling rules, editors and
// configuration text, driven through the real list and its popups.
#include "loadertestsupport.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphposeitem.h"
#include "sharedsource/loaderui/sgmorphsourceboolitem.h"

#include <QLineEdit>
#include <QTest>
#include <QVBoxLayout>

namespace {

SgMorphSourceBoolItem *boolRow(QTreeWidgetItem *top, const QString &label) {
    return dynamic_cast<SgMorphSourceBoolItem *>(findRow(top, label));
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
        ASSERT_EQ(openEditor(list), nullptr);
        static_cast<SgMorphSourceItem *>(row)->showEditor(QPoint(), 1);
        QLineEdit *editor = openEditor(list);
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
    EXPECT_EQ(openEditor(list), nullptr);

    // Column 0 is never edited, and "Label:" only while "Use Secondary Label:" is yes.
    name->showEditor(QPoint(), 0);
    EXPECT_EQ(openEditor(list), nullptr);
    boolRow(head, "Use Secondary Label:")->setValue(false);
    label->showEditor(QPoint(), 1);
    EXPECT_EQ(openEditor(list), nullptr);

    // A press on the current in-place row opens its editor; the first press only makes it
    // current.
    list.setCurrentItem(head);
    const QPoint at(list.columnViewportPosition(1) + 5, list.visualItemRect(name).center().y());
    QTest::mouseClick(list.viewport(), Qt::LeftButton, {}, at);
    EXPECT_EQ(openEditor(list), nullptr);
    QTest::mouseClick(list.viewport(), Qt::LeftButton, {}, at);
    EXPECT_NE(openEditor(list), nullptr);
}

} // namespace
