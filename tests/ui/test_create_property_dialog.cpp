
#include "sgcore/app/sgapp.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/properties/sgenumproperty.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sgcore/properties/sgnodeproperty.h"
#include "sgcore/properties/sgnumericnodeproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/properties/sgskeletonproperty.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sgcore/widgets/sgboolbutton.h"
#include "sgcore/widgets/sgenumslider.h"
#include "sgcore/widgets/sgfloatslider.h"
#include "sgcore/widgets/sgintslider.h"
#include "sgcore/widgets/sgnodemenu.h"
#include "sharedsource/propertyui/sgcreatepropertydlg.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestmodal.h"

#include <QCheckBox>
#include <QComboBox>
#include <QLineEdit>
#include <QMouseEvent>
#include <QPushButton>
#include <QSlider>
#include <QTest>
#include <QTreeWidget>
#include <memory>

namespace {

using Dlg = SgCreatePropertyDlg;

class CreatePropertyDialog : public ::testing::Test {
protected:
    void SetUp() override { sgApp->getScene()->clear(); }
    void TearDown() override { sgApp->getScene()->clear(); }

    // A dialog as most callers make it: all types, create on accept, values kept between shows.
    std::unique_ptr<Dlg> makeDialog(int type = Dlg::FloatType, bool createOnAccept = true) {
        return std::make_unique<Dlg>(nullptr, "TestCreatePropertyDlg", false, type, createOnAccept,
                                     false);
    }

    template <typename T> static T *child(Dlg &dialog, const char *name) {
        T *widget = dialog.findChild<T *>(QString::fromLatin1(name));
        EXPECT_NE(widget, nullptr) << name;
        return widget;
    }

    static void chooseType(Dlg &dialog, int type) {
        auto *box = child<QComboBox>(dialog, "SgCreatePropertyTypeBox");
        box->setCurrentIndex(type);
        emit box->activated(type);
    }

    static void setFloat(Dlg &dialog, const char *name, float value) {
        child<SgFloatSlider>(dialog, name)->setValue(value);
    }
    static void setInt(Dlg &dialog, const char *name, int value) {
        child<SgIntSlider>(dialog, name)->setValue(value);
    }
    static void setText(Dlg &dialog, const char *name, const QString &text) {
        child<QLineEdit>(dialog, name)->setText(text);
    }
    static void setNames(Dlg &dialog, const QString &name, const QString &label) {
        setText(dialog, "SgPropertyInternalNameAttrib", name);
        setText(dialog, "SgPropertyLabelAttrib", label);
    }
    static void setOn(Dlg &dialog, const char *name, bool on) {
        child<SgBoolButton>(dialog, name)->setOn(on);
    }

    // Clicks "Create" and returns the warning text (empty when no warning came).
    static QString clickCreate(Dlg &dialog, bool expectWarning) {
        QString warning;
        SgTestModalAnswer answer(sgTestPressButton(QMessageBox::NoButton, nullptr, &warning));
        QTest::mouseClick(child<QPushButton>(dialog, "SgCreatePropButton"), Qt::LeftButton);
        EXPECT_EQ(answer.answered(), expectWarning ? 1 : 0);
        return warning;
    }

    SgNode *addNode(const QString &name) {
        auto *node = new SgNode(name);
        sgApp->getScene()->addNode(node);
        return node;
    }
};

const QString Header = "Could not create properties for the following reasons:\n";

TEST_F(CreatePropertyDialog, ValidationListsEveryFailedCheckInOrder) {
    SgNode *node = addNode("body");
    const QString range = "Min is greater than Max", value = "Value is not within limits",
                  fallback = "Default Value is not within limits",
                  noNode = "No nodes have been specified", noName = "Name cannot be empty",
                  noLabel = "Label cannot be empty";
    const struct {
        int type;
        bool onNode;
        const char *name, *label;
        float min, max, value, fallback;
        bool obeyLimits;
        QStringList failures; // empty: accepted; {""}: the header line alone
    } cases[] = {
        {Dlg::FloatType, false, "   ", " ", 0, 1, 0, 0, true, {noNode, noName, noLabel}},
        {Dlg::FloatType, true, "smile", "Smile", 2, 1, 0, 0, true, {range, value, fallback}},
        // Without limits only the range itself is checked.
        {Dlg::FloatType, true, "smile", "Smile", 2, 1, 0, 0, false, {range}},
        {Dlg::FloatType, true, "smile", "Smile", -1, 1, 5, 0, false, {}},
        {Dlg::IntType, true, "count", "Count", 0, 1, 4, 0, true, {value}},
        {Dlg::IntType, true, "count", "Count", 5, 2, 2, 2, true, {range, value, fallback}},
        // Values equal to the limits pass.
        {Dlg::IntType, true, "count", "Count", 2, 4, 4, 2, true, {}},
        // A numeric node property takes a min above its max.
        {Dlg::NumericNodeType, true, "follow", "Follow", 3, 1, 9, 0, true, {}},
        {Dlg::EnumType, true, "mood", "Mood", 0, 1, 0, 0, true, {""}},
    };
    for (const auto &c : cases) {
        SCOPED_TRACE(c.name);
        auto dialog = makeDialog(c.type);
        dialog->show();
        dialog->setCreationNode(c.onNode ? node : nullptr);
        setNames(*dialog, c.name, c.label);
        if (c.type == Dlg::IntType) {
            setInt(*dialog, "SgIntMinAttrib", int(c.min));
            setInt(*dialog, "SgIntMaxAttrib", int(c.max));
            setInt(*dialog, "SgIntVal", int(c.value));
            setInt(*dialog, "SgDefaultIntVal", int(c.fallback));
        } else if (c.type != Dlg::EnumType) {
            setFloat(*dialog, "SgFloatMinAttrib", c.min);
            setFloat(*dialog, "SgFloatMaxAttrib", c.max);
            setFloat(*dialog, "SgFloatVal", c.value);
            setFloat(*dialog, "SgDefaultFloatVal", c.fallback);
            setOn(*dialog, "SgObeyLimitsAttrib", c.obeyLimits);
        }
        QString expected;
        for (const QString &failure : c.failures)
            expected += failure.isEmpty() ? QString() : "   - " + failure + "\n";
        EXPECT_EQ(clickCreate(*dialog, !c.failures.isEmpty()),
                  c.failures.isEmpty() ? QString() : Header + expected);
        EXPECT_EQ(dialog->isVisible(), !c.failures.isEmpty());
    }
    ASSERT_EQ(node->getPropertyCount(), 3);
    EXPECT_EQ(static_cast<SgFloatProperty *>(node->getProperty(0))->getRawValue(), 5.0f);
    // The int property is made without clamping.
    auto *created = dynamic_cast<SgIntProperty *>(node->getProperty(1));
    ASSERT_NE(created, nullptr);
    EXPECT_EQ(created->getIntValue(), 4);
    EXPECT_EQ(created->getDefaultValue(), 2.0f);
    EXPECT_EQ(created->getMin(), 2.0f);
    EXPECT_EQ(created->getMax(), 4.0f);
    EXPECT_FALSE(created->isClamped());
}

TEST_F(CreatePropertyDialog, EachTypeCreatesItsPropertyFromTheDialogsValues) {
    SgNode *first = addNode("first");
    auto *figure = new SgSkeleton("figure");
    sgApp->getScene()->addNode(figure);
    auto dialog = makeDialog(Dlg::FloatType, false);
    dialog->show();
    setText(*dialog, "SgPathAttrib", "Morphs/Face");
    setNames(*dialog, " smile ", "Smile");
    setOn(*dialog, "SgPropertyHiddenAttrib", true);
    setOn(*dialog, "SgPropertyLockedAttrib", true);

    setFloat(*dialog, "SgFloatMinAttrib", -2.0f);
    setFloat(*dialog, "SgFloatMaxAttrib", 3.0f);
    setFloat(*dialog, "SgFloatVal", 0.5f);
    setFloat(*dialog, "SgDefaultFloatVal", 0.25f);
    setFloat(*dialog, "SgFloatSensitivityAttrib", 0.125f);
    setOn(*dialog, "SgObeyLimitsAttrib", false);
    std::unique_ptr<SgProperty> property(dialog->createProperty());
    auto *floatProperty = dynamic_cast<SgFloatProperty *>(property.get());
    ASSERT_NE(floatProperty, nullptr);
    EXPECT_EQ(floatProperty->getRawValue(), 0.5f);
    EXPECT_EQ(floatProperty->getDefaultValue(), 0.25f);
    EXPECT_EQ(floatProperty->getMin(), -2.0f);
    EXPECT_EQ(floatProperty->getMax(), 3.0f);
    EXPECT_FALSE(floatProperty->isClamped());
    EXPECT_EQ(floatProperty->getName(), " smile "); // as typed
    EXPECT_EQ(floatProperty->getPath(), "Morphs/Face");
    EXPECT_TRUE(floatProperty->isHidden() && floatProperty->isLocked());
    EXPECT_EQ(floatProperty->getOwner(), nullptr);

    chooseType(*dialog, Dlg::NodeType);
    auto *nodeMenu = child<SgNodeMenu>(*dialog, "SgNodeAttrib");
    EXPECT_EQ(nodeMenu->getNodes(), QList<SgNode *>({first, figure}));
    EXPECT_EQ(nodeMenu->getCurrentNode(), nullptr);
    nodeMenu->setCurrentNode(first);
    child<SgNodeMenu>(*dialog, "SgDefaultNodeAttrib")->setCurrentNode(figure);
    property.reset(dialog->createProperty());
    auto *nodeProperty = dynamic_cast<SgNodeProperty *>(property.get());
    ASSERT_NE(nodeProperty, nullptr);
    EXPECT_EQ(dynamic_cast<SgSkeletonProperty *>(property.get()), nullptr);
    EXPECT_EQ(nodeProperty->getValue(), first);
    EXPECT_EQ(nodeProperty->getDefaultValue(), figure);

    chooseType(*dialog, Dlg::SkeletonType);
    EXPECT_EQ(nodeMenu->getNodes(), QList<SgNode *>({figure}));
    nodeMenu->setCurrentNode(figure);
    property.reset(dialog->createProperty());
    auto *skeletonProperty = dynamic_cast<SgSkeletonProperty *>(property.get());
    ASSERT_NE(skeletonProperty, nullptr);
    EXPECT_EQ(skeletonProperty->getValue(), figure);
    EXPECT_EQ(skeletonProperty->getDefaultValue(), nullptr);

    chooseType(*dialog, Dlg::NumericNodeType);
    auto *numericNodeMenu = child<SgNodeMenu>(*dialog, "SgNumericNodeAttrib");
    EXPECT_EQ(numericNodeMenu->getNodes(), QList<SgNode *>({first, figure}));
    numericNodeMenu->setCurrentNode(first);
    setOn(*dialog, "SgRequiresNodeAttrib", true);
    property.reset(dialog->createProperty());
    auto *numericNode = dynamic_cast<SgNumericNodeProperty *>(property.get());
    ASSERT_NE(numericNode, nullptr);
    EXPECT_EQ(numericNode->getNode(), first);
    EXPECT_TRUE(numericNode->getMustHaveNode());
    EXPECT_EQ(numericNode->getSensitivity(), 0.125f);
    EXPECT_EQ(numericNode->getMin(), -2.0f);

    // The int Max slider takes no typed text, yet reaches the host's default limit of 100 (its
    // span starts at -1000) without moving Min.
    chooseType(*dialog, Dlg::IntType);
    setInt(*dialog, "SgIntMinAttrib", 2);
    child<QSlider>(*dialog, "SgIntMaxAttribSlider")->setValue(100 - -1000);
    EXPECT_EQ(child<SgIntSlider>(*dialog, "SgIntMaxAttrib")->getValue(), 100);
    EXPECT_EQ(child<SgIntSlider>(*dialog, "SgIntMinAttrib")->getValue(), 2);
    property.reset(dialog->createProperty());
    EXPECT_EQ(dynamic_cast<SgIntProperty *>(property.get())->getMax(), 100.0f);
}

TEST_F(CreatePropertyDialog, CreatesOnEveryNodeAndWarnsForARefusingOne) {
    SgNode *first = addNode("first");
    SgNode *refusing = addNode("refusing");
    SgNode *third = addNode("third");
    refusing->addProperty(new SgFloatProperty("wink"));
    auto dialog = makeDialog();
    dialog->show();
    // A list with a null entry (a node gone from the scene) must not crash "Create" later.
    SgNodeList withNull{first, nullptr, refusing, third};
    dialog->setCreationNodes(withNull);
    setNames(*dialog, "wink", "Wink");
    EXPECT_EQ(clickCreate(*dialog, true), "Unable to add property to refusing node");
    EXPECT_EQ(dialog->result(), QDialog::Accepted);
    ASSERT_EQ(first->getPropertyCount(), 1);
    ASSERT_EQ(third->getPropertyCount(), 1);
    EXPECT_EQ(refusing->getPropertyCount(), 1);
    EXPECT_NE(first->getProperty(0), third->getProperty(0));
    EXPECT_EQ(first->getProperty(0)->getLabel(), "Wink");

    // With create-on-accept off, "Create" only validates and closes.
    auto validateOnly = makeDialog(Dlg::FloatType, false);
    validateOnly->show();
    validateOnly->setCreationNode(third);
    setNames(*validateOnly, "blink", "Blink");
    clickCreate(*validateOnly, false);
    EXPECT_EQ(validateOnly->result(), QDialog::Accepted);
    EXPECT_EQ(third->getPropertyCount(), 1);
}

TEST_F(CreatePropertyDialog, EmptyMorphGoesFirstOrAfterTheJoint) {
    SgNode *withObject = addNode("withObject");
    withObject->setObject(new SgObject);
    withObject->getObject()->addModifier(new SgMorph("existing"));
    SgNode *withoutObject = addNode("withoutObject");
    auto dialog = makeDialog();
    dialog->show();
    // "Create morph after joint" follows "Create as empty morph" without being unchecked.
    auto *morph = child<QCheckBox>(*dialog, "SgCreateAsMorphOption");
    auto *afterJoint = child<QCheckBox>(*dialog, "SgCreateAfterJointOption");
    EXPECT_FALSE(afterJoint->isEnabled());
    morph->setChecked(true);
    afterJoint->click();
    morph->setChecked(false);
    EXPECT_FALSE(afterJoint->isEnabled());
    EXPECT_TRUE(afterJoint->isChecked());

    // Before the joint: first in the stack; an object is made where there is none.
    morph->setChecked(true);
    afterJoint->click();
    SgNodeList nodes{withObject, withoutObject};
    dialog->setCreationNodes(nodes);
    setNames(*dialog, "bulge", "Bulge");
    setFloat(*dialog, "SgFloatMaxAttrib", 2.0f);
    clickCreate(*dialog, false);
    ASSERT_NE(withoutObject->getObject(), nullptr);
    auto *created = dynamic_cast<SgMorph *>(withObject->getObject()->getModifier(0));
    ASSERT_NE(created, nullptr);
    EXPECT_EQ(created->getName(), "bulge");
    EXPECT_EQ(created->getValueChannel()->getMax(), 2.0f);
    EXPECT_EQ(created->getValueChannel()->getLabel(), "Bulge");
    EXPECT_EQ(created->getValueChannel()->getName(), "bulge"); // named by the morph
    EXPECT_EQ(withObject->getPropertyCount(), 0);
    EXPECT_EQ(withoutObject->getObject()->getModifierCount(), 1);

    // After the joint: appended to the stack.
    dialog->show();
    dialog->setCreationNode(withObject);
    setNames(*dialog, "late", "Late");
    afterJoint->click();
    clickCreate(*dialog, false);
    SgObject *object = withObject->getObject();
    ASSERT_EQ(object->getModifierCount(), 3);
    EXPECT_EQ(object->getModifier(2)->getName(), "late");

    // A single-type dialog has its title from the start, so a dialog run with exec() has it
    // too, and offers no type box.
    Dlg single(nullptr, "single", true, Dlg::FloatType, false, true);
    EXPECT_EQ(single.windowTitle(), "Create Float Property");
    single.show();
    EXPECT_FALSE(child<QWidget>(single, "SgPropTypeBox")->isVisible());
}

TEST_F(CreatePropertyDialog, PathDefaultsAndLabelAutoFill) {
    auto dialog = makeDialog();
    auto *box = child<QComboBox>(*dialog, "SgPathDefaults");
    auto *path = child<QLineEdit>(*dialog, "SgPathAttrib");
    auto items = [box] {
        QStringList texts;
        for (int i = 0; i < box->count(); ++i)
            texts.append(box->itemText(i));
        return texts;
    };
    // From the creation nodes: all paths of the first, the first path of the others, sorted.
    SgNode *first = addNode("first");
    first->addProperty(new SgFloatProperty("a"));
    first->getProperty(0)->setPath("Morphs/Face");
    first->getPropertyGroups()->addGroup("Body");
    SgNode *second = addNode("second");
    second->addProperty(new SgFloatProperty("b"));
    second->getProperty(0)->setPath("Acting/Hands");
    SgNode *third = addNode("third");
    second->getPropertyGroups()->addGroup("Zeta");
    SgNodeList nodes{first, second, third};
    dialog->setCreationNodes(nodes);
    dialog->setPathDefaults();
    EXPECT_EQ(items(), QStringList({"Acting", "Body", "Morphs", "Morphs/Face"}));
    EXPECT_EQ(path->text(), "Acting");
    emit box->textActivated("Morphs");
    EXPECT_EQ(path->text(), "Morphs");

    // The label takes the name when focus leaves the name edit and the label is empty.
    auto *name = child<QLineEdit>(*dialog, "SgPropertyInternalNameAttrib");
    auto *label = child<QLineEdit>(*dialog, "SgPropertyLabelAttrib");
    QApplication::setActiveWindow(dialog.get());
    name->setFocus();
    name->setText("grin");
    label->setFocus();
    EXPECT_EQ(label->text(), "grin");
    name->setFocus();
    name->setText("grin2");
    label->setFocus();
    EXPECT_EQ(label->text(), "grin");
}

// The enum editor, driven as a user: double-click the label column and type, select rows and
// press the up, down and delete buttons.
class EnumEditor {
public:
    explicit EnumEditor(Dlg &dialog)
        : m_dialog(dialog), m_list(dialog.findChild<QTreeWidget *>("SgEnumAttrib")),
          m_value(dialog.findChild<SgEnumSlider *>("SgEnumAttrib")),
          m_default(dialog.findChild<SgEnumSlider *>("SgDefaultEnumAttrib")) {}

    void doubleClick(int row, int column) {
        const QModelIndex index = m_list->model()->index(row, column);
        m_list->scrollTo(index);
        const QPoint point = m_list->visualRect(index).center();
        QWidget *viewport = m_list->viewport();
        QTest::mouseClick(viewport, Qt::LeftButton, Qt::NoModifier, point);
        // The double click itself is sent as the window system would, after the first click.
        const QPointF global = viewport->mapToGlobal(QPointF(point));
        QMouseEvent doubleClick(QEvent::MouseButtonDblClick, QPointF(point), global, Qt::LeftButton,
                                Qt::LeftButton, Qt::NoModifier);
        QApplication::sendEvent(viewport, &doubleClick);
        QTest::mouseRelease(viewport, Qt::LeftButton, Qt::NoModifier, point);
    }

    // Double-clicks the label of `row` and types `text` into the editor that opens.
    void type(int row, const QString &text) {
        doubleClick(row, 1);
        QLineEdit *editor = openEditor();
        ASSERT_NE(editor, nullptr) << "no editor on row " << row;
        editor->selectAll();
        QTest::keyClick(editor, Qt::Key_Backspace);
        QTest::keyClicks(editor, text);
        QTest::keyClick(editor, Qt::Key_Return);
        QApplication::processEvents();
    }

    // The open in-place editor, or null (closed editors linger until deleted).
    QLineEdit *openEditor() const {
        for (QLineEdit *editor : m_list->viewport()->findChildren<QLineEdit *>()) {
            if (editor->isVisible())
                return editor;
        }
        return nullptr;
    }

    // Selects `row` and presses the up, down or delete button.
    void press(int row, const char *button) {
        m_list->setCurrentItem(m_list->topLevelItem(row));
        QTest::mouseClick(m_dialog.findChild<QPushButton *>(button), Qt::LeftButton);
    }

    // "index:label" per row, then the labels of both sliders; checked against the expected rows.
    void expect(const QStringList &rows, int line) {
        QStringList shown;
        for (int row = 0; row < m_list->topLevelItemCount(); ++row)
            shown.append(m_list->topLevelItem(row)->text(0) + ":" +
                         m_list->topLevelItem(row)->text(1));
        QStringList expected = rows;
        expected.append(":" + Dlg::enumPlaceholderText());
        EXPECT_EQ(shown, expected) << "line " << line;
        QStringList labels;
        for (const QString &row : rows)
            labels.append(row.section(':', 1));
        EXPECT_EQ(m_value->items(), labels) << "line " << line;
        EXPECT_EQ(m_default->items(), labels) << "line " << line;
    }

    QString currentLabel() const { return m_list->currentItem()->text(1); }
    SgEnumSlider *defaultSlider() const { return m_default; }

private:
    Dlg &m_dialog;
    QTreeWidget *m_list;
    SgEnumSlider *m_value;
    SgEnumSlider *m_default;
};

TEST_F(CreatePropertyDialog, EnumEditorKeepsRowsAndSlidersInStepAndCancelRestoresTheShownValues) {
    auto dialog = makeDialog(Dlg::EnumType);
    dialog->show();
    EnumEditor editor(*dialog);
    editor.expect({}, __LINE__);
    editor.doubleClick(0, 0); // the "Int Val" column is not renamed
    EXPECT_EQ(editor.openEditor(), nullptr);
    editor.type(0, "A");
    editor.expect({"0:A"}, __LINE__);
    editor.type(1, "B");
    editor.type(2, "C");
    editor.expect({"0:A", "1:B", "2:C"}, __LINE__);
    editor.type(1, "b");
    editor.expect({"0:A", "1:b", "2:C"}, __LINE__);

    // Moves that change nothing: first row up, placeholder up or down, last real row down.
    editor.press(0, "SgMoveEnumUpButton");
    editor.press(3, "SgMoveEnumUpButton");
    editor.press(3, "SgMoveEnumDownButton");
    editor.press(3, "SgDeleteEnumDownButton");
    editor.press(2, "SgMoveEnumDownButton");
    editor.expect({"0:A", "1:b", "2:C"}, __LINE__);

    editor.press(1, "SgMoveEnumUpButton");
    editor.expect({"0:b", "1:A", "2:C"}, __LINE__);
    EXPECT_EQ(editor.currentLabel(), "b");

    // After a removal the rows below are renumbered, so later edits reach the right items, and
    // the sliders' current item moves down with its index.
    editor.defaultSlider()->setCurrentIndex(2);
    editor.press(0, "SgDeleteEnumDownButton");
    editor.expect({"0:A", "1:C"}, __LINE__);
    EXPECT_EQ(editor.defaultSlider()->currentIndex(), 1);
    editor.type(1, "Z");
    editor.expect({"0:A", "1:Z"}, __LINE__);
    editor.type(2, "D");
    editor.press(1, "SgDeleteEnumDownButton");
    editor.expect({"0:A", "1:D"}, __LINE__);
    editor.type(2, "");

    // The property takes the rows' labels and both sliders' indices.
    editor.defaultSlider()->setCurrentIndex(1);
    std::unique_ptr<SgProperty> property(dialog->createProperty());
    auto *enumProperty = dynamic_cast<SgEnumProperty *>(property.get());
    ASSERT_NE(enumProperty, nullptr);
    EXPECT_EQ(enumProperty->getItems(), QStringList({"A", "D", ""}));
    EXPECT_EQ(enumProperty->getValue(), 0);
    EXPECT_EQ(enumProperty->getDefaultValue(), 1);

    // Each show keeps the values; "Cancel" brings back those of the last show.
    dialog->setDefaultName("keep");
    setFloat(*dialog, "SgFloatMinAttrib", -4.0f);
    dialog->hide();
    dialog->show();
    setText(*dialog, "SgPropertyInternalNameAttrib", "changed");
    setFloat(*dialog, "SgFloatMinAttrib", 7.0f);
    setOn(*dialog, "SgPropertyHiddenAttrib", true);
    editor.press(0, "SgDeleteEnumDownButton");
    editor.type(1, "X");
    QTest::mouseClick(child<QPushButton>(*dialog, "SgCancelCreatePropButton"), Qt::LeftButton);
    EXPECT_EQ(dialog->result(), QDialog::Rejected);
    EXPECT_FALSE(dialog->isVisible());
    EXPECT_EQ(child<QLineEdit>(*dialog, "SgPropertyInternalNameAttrib")->text(), "keep");
    EXPECT_EQ(child<SgFloatSlider>(*dialog, "SgFloatMinAttrib")->getValue(), -4.0f);
    EXPECT_FALSE(child<SgBoolButton>(*dialog, "SgPropertyHiddenAttrib")->isOn());
    editor.expect({"0:A", "1:D", "2:"}, __LINE__);
    EXPECT_EQ(editor.defaultSlider()->currentIndex(), 1);
}

} // namespace
