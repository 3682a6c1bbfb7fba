// The bridge morph dialog, driven through its widgets as a user would.

#include "bridge/sgbridgemorphdlg.h"

#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgnode.h"
#include "tests/support/sgtestmodal.h"
#include "tests/support/sgwidgetfit.h"

#include <QCheckBox>
#include <QComboBox>
#include <QDialogButtonBox>
#include <QLineEdit>
#include <QPushButton>
#include <QTest>

#include <gtest/gtest.h>

namespace {

// Picks the action at `index` with the keyboard, as a user would on a closed combo.
void pickAction(QComboBox *combo, int index) {
    combo->setFocus();
    while (combo->currentIndex() < index)
        QTest::keyClick(combo, Qt::Key_Down);
    while (combo->currentIndex() > index)
        QTest::keyClick(combo, Qt::Key_Up);
}

} // namespace

TEST(BridgeMorphDlg, OnlyMorphActionsTakeMorphSettingsWhichComeBackWithForwardSlashes) {
    SgNode body(QStringLiteral("Body"));
    auto *smile = new SgFloatProperty(QStringLiteral("Smile"));
    smile->setPath(QStringLiteral("Morphs/Face"));
    ASSERT_EQ(body.addProperty(smile), 0);
    SgBridgeMorphDlg dlg(body.getLabel(), nullptr, &body);
    auto *action = dlg.findChild<QComboBox *>(QStringLiteral("FcBridgehAction"));
    auto *group = dlg.findChild<QComboBox *>(QStringLiteral("FcBridgeMorphGroup"));
    auto *name = dlg.findChild<QLineEdit *>(QStringLiteral("FcBridgeMorphName"));
    auto *overrides = dlg.findChild<QCheckBox *>(QStringLiteral("FcOverrideExistingCheck"));
    // The node's groups follow the bridge's own, which stays current; a new morph starts as
    // "Create Morph" and overrides nothing.
    EXPECT_EQ(group->count(), 3);
    EXPECT_EQ(group->itemText(2), QStringLiteral("Morphs/Face"));
    EXPECT_EQ(group->currentIndex(), 0);
    EXPECT_EQ(dlg.getActionText(), QStringLiteral("Create Morph"));
    EXPECT_FALSE(dlg.getOverride());

    SgTestModalAnswer answer([&](QWidget *) {
        // At its default size every text of the dialog is whole.
        EXPECT_EQ(sgCutTexts(&dlg), QStringList());
        const auto morphControlsEnabled = [&] {
            return group->isEnabled() + name->isEnabled() + overrides->isEnabled();
        };
        const int expected[] = {3, 0, 3, 0};
        for (int index : {0, 1, 2, 3, 0, 3}) {
            pickAction(action, index);
            EXPECT_EQ(morphControlsEnabled(), expected[index]) << index;
            EXPECT_EQ(dlg.getActionText(), action->itemText(index));
        }
        // A blank morph name cannot be taken for a morph action; the other actions need none.
        QPushButton *ok = dlg.buttonBox()->button(QDialogButtonBox::Ok);
        name->setText("  ");
        pickAction(action, 0);
        EXPECT_FALSE(ok->isEnabled());
        QTest::keyClick(&dlg, Qt::Key_Return);
        EXPECT_TRUE(dlg.isVisible());
        pickAction(action, 3);
        EXPECT_TRUE(ok->isEnabled());

        pickAction(action, 2);
        group->lineEdit()->selectAll();
        QTest::keyClicks(group->lineEdit(), QStringLiteral("Morphs\\Mine\\Deep"));
        name->selectAll();
        QTest::keyClicks(name, QStringLiteral("Grin"));
        QTest::mouseClick(overrides, Qt::LeftButton);
        QTest::mouseClick(ok, Qt::LeftButton);
    });
    ASSERT_EQ(dlg.exec(), QDialog::Accepted);
    EXPECT_EQ(answer.answered(), 1);
    EXPECT_EQ(dlg.getGroupPath(), QStringLiteral("Morphs/Mine/Deep"));
    EXPECT_EQ(dlg.getMorphName(), QStringLiteral("Grin"));
    EXPECT_TRUE(dlg.getOverride());
    EXPECT_EQ(dlg.getActionText(), QStringLiteral("Create Morph And Copy Materials"));
}
