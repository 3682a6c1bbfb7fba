
#include "sgcore/app/sgapp.h"
#include "sgcore/properties/sgboolproperty.h"
#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/propertyui/sgcreatepropertydlg.h"
#include "sharedsource/propertyui/sgcreatepropertygroupdlg.h"
#include "sharedsource/propertyui/sgpropertygroupmenu.h"
#include "sharedsource/propertyui/sgpropertytreemenu.h"
#include "sharedsource/propertyui/sgscenenodemenu.h"
#include "tests/support/sgtestmodal.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QLineEdit>
#include <QPushButton>
#include <QTest>
#include <memory>

namespace {

// Runs `open` (a chooser that shows a popup) while the popup is answered by choosing `path` (an
// empty path dismisses it); returns what `open` returns.
template <typename Open> auto pick(const QStringList &path, Open open) {
    return sgTestAnswering({sgTestChooseMenu(path)}, open);
}

class PropertyMenus : public ::testing::Test {
protected:
    void SetUp() override { sgApp->getScene()->clear(); }
    void TearDown() override { sgApp->getScene()->clear(); }

    SgScene *scene() const { return sgApp->getScene(); }

    static SgProperty *addProperty(SgElement *element, SgProperty *property, const QString &path) {
        property->setPath(path);
        EXPECT_EQ(element->addProperty(property), 0);
        return property;
    }
};

TEST_F(PropertyMenus, GroupMenuCollectsTheFiguresPathsOnceAndCreatesGroups) {
    SgPropertyGroupMenu empty(nullptr, "empty");
    EXPECT_EQ(sgTestMenuEntries(&empty, true), QStringList({"Create...=268435455", "-"}));
    auto *figure = new SgSkeleton("figure");
    auto *hip = new SgBone("hip");
    auto *thigh = new SgBone("thigh");
    figure->addBone(hip);
    figure->addBone(thigh, hip);
    scene()->addNode(figure);
    addProperty(figure, new SgFloatProperty("a"), "Morphs/Face");
    addProperty(hip, new SgFloatProperty("b"), "Pose");
    addProperty(thigh, new SgFloatProperty("c"), "Pose/Bend");
    addProperty(thigh, new SgFloatProperty("d"), "Morphs");
    scene()->setPrimarySelection(thigh);

    SgPropertyGroupMenu menu(nullptr, "groups");
    EXPECT_EQ(sgTestMenuEntries(&menu, true),
              QStringList({"Create...=268435455", "-", "Morphs=0", "Morphs/Face=1", "Pose=2",
                           "Pose/Bend=3"}));
    EXPECT_EQ(pick({"Pose/Bend"}, [&] { return menu.chooseGroup("current", QPoint(10, 10)); }),
              "Pose/Bend");
    EXPECT_EQ(pick({}, [&] { return menu.chooseGroup("current", QPoint(10, 10)); }), "current");

    // "Create..." opens the group dialog: its typed path is chosen, or on cancel the current.
    for (const auto button : {QDialogButtonBox::Cancel, QDialogButtonBox::Ok}) {
        const auto answer = [button](SgCreatePropertyGroupDlg *dialog) {
            auto *edit = dialog->findChild<QLineEdit *>("TICreatePropGroupEdit");
            edit->clear();
            QTest::keyClicks(edit, "Mine/New");
            dialog->findChild<QDialogButtonBox *>()->button(button)->click();
        };
        SgTestModalAnswer script(
            {sgTestChooseMenu({"Create..."}), sgTestAs<SgCreatePropertyGroupDlg>(answer)});
        EXPECT_EQ(menu.chooseGroup("current", QPoint()),
                  button == QDialogButtonBox::Ok ? "Mine/New" : "current");
    }
}

TEST_F(PropertyMenus, TreeMenuListsNumericPropertiesAndChoosesThem) {
    auto *node = new SgNode("body");
    scene()->addNode(node);
    addProperty(node, new SgFloatProperty("bend"), "Pose");
    addProperty(node, new SgBoolProperty("flag"), "Pose");
    auto *count = addProperty(node, new SgIntProperty("count"), "Pose");
    addProperty(node, new SgColorProperty("tint"), "Pose");
    auto *twist = addProperty(node, new SgFloatProperty("twist"), "Pose");
    auto *smile = addProperty(node, new SgFloatProperty("smile"), "Pose/Face");
    smile->setLabel("Smile");

    auto current = std::make_unique<SgFloatProperty>("current");
    SgPropertyTreeMenu menu("Morph Name", node, nullptr, "tree");
    EXPECT_EQ(sgTestMenuEntries(&menu, true),
              QStringList({"Create...=8192", "-", "Morph Name=16384", "-", "Pose=4096"}));
    QMenu *pose = menu.actions().last()->menu();
    ASSERT_NE(pose, nullptr);
    EXPECT_EQ(sgTestMenuEntries(pose, true),
              QStringList({"Create...=8192", "-", "Face=4096", "bend=0", "count=1", "twist=2"}));

    EXPECT_EQ(pick({"Pose", "twist"}, [&] { return menu.chooseProperty(current.get(), QPoint()); }),
              twist);
    EXPECT_EQ(pick({"Pose", "Face", "Smile"},
                   [&] { return menu.chooseProperty(current.get(), QPoint()); }),
              smile);
    EXPECT_EQ(pick({"Pose", "count"}, [&] { return menu.chooseProperty(nullptr, QPoint()); }),
              count);
    EXPECT_EQ(pick({"Morph Name"}, [&] { return menu.chooseProperty(current.get(), QPoint()); }),
              nullptr);
    EXPECT_EQ(pick({}, [&] { return menu.chooseProperty(current.get(), QPoint()); }),
              current.get());

    // No element: "- none -", which keeps the current property.
    SgPropertyTreeMenu none("Morph Name", nullptr, nullptr, "none");
    EXPECT_EQ(sgTestMenuEntries(&none, true),
              QStringList({"Create...=8192", "-", "Morph Name=16384", "-", "- none -=12288"}));
    EXPECT_EQ(pick({"- none -"}, [&] { return none.chooseProperty(current.get(), QPoint()); }),
              current.get());
}

TEST_F(PropertyMenus, TreeMenuCreatesAPropertyForTheCaller) {
    auto *node = new SgNode("body");
    scene()->addNode(node);
    addProperty(node, new SgFloatProperty("bend"), "Pose/Face");
    auto current = std::make_unique<SgFloatProperty>("current");
    SgPropertyTreeMenu menu("Grin", node, nullptr, "tree");

    // Chooses `path` and hands the dialog that opens to `act`; returns the chosen property.
    auto create = [&](const QStringList &path, std::function<void(SgCreatePropertyDlg *)> act) {
        SgTestModalAnswer answer({sgTestChooseMenu(path), sgTestAs<SgCreatePropertyDlg>(act)});
        return menu.chooseProperty(current.get(), QPoint());
    };
    auto text = [](SgCreatePropertyDlg *dialog, const char *name) {
        return dialog->findChild<QLineEdit *>(name)->text();
    };

    // Cancelled: the current property stays, nothing is added.
    EXPECT_EQ(create({"Create..."},
                     [&](SgCreatePropertyDlg *dialog) {
                         EXPECT_EQ(text(dialog, "SgPathAttrib"), "Morphs/Morph Loader");
                         EXPECT_EQ(text(dialog, "SgPropertyInternalNameAttrib"), "Grin");
                         EXPECT_EQ(text(dialog, "SgPropertyLabelAttrib"), "Grin");
                         EXPECT_EQ(dialog->getCreationNodes(), QList<SgNode *>({node}));
                         dialog->findChild<QPushButton *>("SgCancelCreatePropButton")->click();
                     }),
              current.get());
    EXPECT_EQ(node->getPropertyCount(), 1);

    // Created inside a group: preset to the group's path, handed over unattached.
    std::unique_ptr<SgNumericProperty> created(
        create({"Pose", "Face", "Create..."}, [&](SgCreatePropertyDlg *dialog) {
            EXPECT_EQ(text(dialog, "SgPathAttrib"), "Pose/Face");
            dialog->findChild<QPushButton *>("SgCreatePropButton")->click();
        }));
    ASSERT_NE(created, nullptr);
    EXPECT_NE(created.get(), current.get());
    EXPECT_EQ(created->getName(), "Grin");
    EXPECT_EQ(created->getPath(), "Pose/Face");
    EXPECT_EQ(created->getOwner(), nullptr);
    EXPECT_EQ(node->getPropertyCount(), 1);
}

TEST_F(PropertyMenus, SceneNodeMenuListsVisibleNodesByScenePosition) {
    auto *first = new SgNode("first");
    auto *hidden = new SgNode("hidden");
    auto *third = new SgNode("twin");
    auto *fourth = new SgNode("twin2");
    fourth->setLabel("twin");
    hidden->setHidden(true);
    for (SgNode *node : {first, hidden, third, fourth})
        scene()->addNode(node);
    SgSceneNodeMenu menu(nullptr, "nodes");
    EXPECT_EQ(sgTestMenuEntries(&menu, true), QStringList({"first=0", "twin=2", "twin=3"}));
    // The two "twin" entries are told apart by their place; a dismissed menu keeps the node.
    EXPECT_EQ(sgTestAnswering({[](QWidget *popup) {
                                  auto *menu = static_cast<QMenu *>(popup);
                                  menu->setActiveAction(menu->actions().at(2));
                                  QTest::keyClick(menu, Qt::Key_Return);
                              }},
                              [&] { return menu.chooseNode(first, QPoint()); }),
              fourth);
    EXPECT_EQ(pick({}, [&] { return menu.chooseNode(first, QPoint()); }), first);
}

} // namespace
