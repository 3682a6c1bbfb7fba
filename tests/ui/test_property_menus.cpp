#include "uitesthelpers.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/properties/sgboolproperty.h"
#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/propertyui/sgcreatepropertydlg.h"
#include "sharedsource/propertyui/sgcreatepropertygroupdlg.h"
#include "sharedsource/propertyui/sgpropertygroupmenu.h"
#include "sharedsource/propertyui/sgpropertytreemenu.h"
#include "sharedsource/propertyui/sgscenenodemenu.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QLineEdit>
#include <QPushButton>
#include <QTest>
#include <memory>

namespace {

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

// Answers the next popup by choosing `path`.
void choose(const QStringList &path) {
    uitest::onNextPopup([path](QMenu *menu) { uitest::chooseInMenu(menu, path); });
}

// Dismisses the next popup.
void dismiss() {
    uitest::onNextPopup([](QMenu *menu) { menu->close(); });
}

TEST_F(PropertyMenus, GroupMenuCollectsTheFiguresPathsOnce) {
    {
        SgPropertyGroupMenu empty(nullptr, "empty");
        EXPECT_EQ(uitest::menuEntries(&empty), QStringList({"Create...=268435455", "-"}));
        SgCreatePropertyGroupDlg dialog(nullptr, QString());
        EXPECT_EQ(dialog.findChild<QComboBox *>("TICreatePropGroupList")->count(), 0);
    }
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
    EXPECT_EQ(uitest::menuEntries(&menu), QStringList({"Create...=268435455", "-", "Morphs=0",
                                                       "Morphs/Face=1", "Pose=2", "Pose/Bend=3"}));
    choose({"Pose/Bend"});
    EXPECT_EQ(menu.chooseGroup("current", QPoint(10, 10)), "Pose/Bend");
    dismiss();
    EXPECT_EQ(menu.chooseGroup("current", QPoint(10, 10)), "current");
}

TEST_F(PropertyMenus, CreateGroupDialogFromTheMenu) {
    auto *node = new SgNode("prop");
    scene()->addNode(node);
    addProperty(node, new SgFloatProperty("a"), "Morphs/Face");
    scene()->setPrimarySelection(node);
    SgPropertyGroupMenu menu(nullptr, "groups");

    auto answerDialog = [](std::function<void(SgCreatePropertyGroupDlg *)> act) {
        uitest::onNextPopup([act](QMenu *popup) {
            uitest::onNextModal([act](QWidget *modal) {
                auto *dialog = qobject_cast<SgCreatePropertyGroupDlg *>(modal);
                if (!dialog) {
                    ADD_FAILURE() << "no create-group dialog";
                    modal->close();
                    return;
                }
                act(dialog);
            });
            uitest::chooseInMenu(popup, {"Create..."});
        });
    };
    auto button = [](SgCreatePropertyGroupDlg *dialog, QDialogButtonBox::StandardButton which) {
        return dialog->findChild<QDialogButtonBox *>()->button(which);
    };

    // Accepting with the edit still empty gives an empty path.
    answerDialog([&](SgCreatePropertyGroupDlg *dialog) {
        EXPECT_EQ(dialog->windowTitle(), "Create Property Group");
        EXPECT_EQ(dialog->findChild<QLineEdit *>("TICreatePropGroupEdit")->text(), "");
        button(dialog, QDialogButtonBox::Ok)->click();
    });
    EXPECT_EQ(menu.chooseGroup("current", QPoint()), "");

    // Cancelling returns the current path.
    answerDialog([&](SgCreatePropertyGroupDlg *dialog) {
        dialog->findChild<QLineEdit *>("TICreatePropGroupEdit")->setText("typed");
        button(dialog, QDialogButtonBox::Cancel)->click();
    });
    EXPECT_EQ(menu.chooseGroup("current", QPoint()), "current");

    // Picking a path in the box fills the edit; typing afterwards wins.
    answerDialog([&](SgCreatePropertyGroupDlg *dialog) {
        auto *box = dialog->findChild<QComboBox *>("TICreatePropGroupList");
        EXPECT_EQ(box->count(), 2);
        box->setCurrentIndex(1);
        emit box->textActivated(box->itemText(1));
        EXPECT_EQ(dialog->findChild<QLineEdit *>("TICreatePropGroupEdit")->text(), "Morphs/Face");
        button(dialog, QDialogButtonBox::Ok)->click();
    });
    EXPECT_EQ(menu.chooseGroup("current", QPoint()), "Morphs/Face");
    answerDialog([&](SgCreatePropertyGroupDlg *dialog) {
        auto *box = dialog->findChild<QComboBox *>("TICreatePropGroupList");
        emit box->textActivated(box->itemText(0));
        auto *edit = dialog->findChild<QLineEdit *>("TICreatePropGroupEdit");
        edit->clear();
        QTest::keyClicks(edit, "Mine/New");
        button(dialog, QDialogButtonBox::Ok)->click();
    });
    EXPECT_EQ(menu.chooseGroup("current", QPoint()), "Mine/New");
}

TEST_F(PropertyMenus, TreeMenuListsNumericPropertiesAndChoosesThem) {
    auto *node = new SgNode("body");
    scene()->addNode(node);
    auto *bend = addProperty(node, new SgFloatProperty("bend"), "Pose");
    addProperty(node, new SgBoolProperty("flag"), "Pose");
    auto *count = addProperty(node, new SgIntProperty("count"), "Pose");
    addProperty(node, new SgColorProperty("tint"), "Pose");
    auto *twist = addProperty(node, new SgFloatProperty("twist"), "Pose");
    auto *smile = addProperty(node, new SgFloatProperty("smile"), "Pose/Face");
    smile->setLabel("Smile");

    auto current = std::make_unique<SgFloatProperty>("current");
    SgPropertyTreeMenu menu("Morph Name", node, nullptr, "tree");
    EXPECT_EQ(uitest::menuEntries(&menu),
              QStringList({"Create...=8192", "-", "Morph Name=16384", "-", "Pose=4096"}));
    QMenu *pose = menu.actions().last()->menu();
    ASSERT_NE(pose, nullptr);
    EXPECT_EQ(uitest::menuEntries(pose),
              QStringList({"Create...=8192", "-", "Face=4096", "bend=0", "count=1", "twist=2"}));

    choose({"Pose", "twist"});
    EXPECT_EQ(menu.chooseProperty(current.get(), QPoint()), twist);
    choose({"Pose", "Face", "Smile"});
    EXPECT_EQ(menu.chooseProperty(current.get(), QPoint()), smile);
    choose({"Pose", "count"});
    EXPECT_EQ(menu.chooseProperty(nullptr, QPoint()), count);
    choose({"Morph Name"});
    EXPECT_EQ(menu.chooseProperty(current.get(), QPoint()), nullptr);
    dismiss();
    EXPECT_EQ(menu.chooseProperty(current.get(), QPoint()), current.get());
    (void)bend;

    // No element: "- none -", which keeps the current property.
    SgPropertyTreeMenu none("Morph Name", nullptr, nullptr, "none");
    EXPECT_EQ(uitest::menuEntries(&none),
              QStringList({"Create...=8192", "-", "Morph Name=16384", "-", "- none -=12288"}));
    choose({"- none -"});
    EXPECT_EQ(none.chooseProperty(current.get(), QPoint()), current.get());

    // An element without groups: only "Create..." and the text entry.
    auto *bare = new SgNode("bare");
    scene()->addNode(bare);
    SgPropertyTreeMenu empty("Morph Name", bare, nullptr, "empty");
    EXPECT_EQ(uitest::menuEntries(&empty),
              QStringList({"Create...=8192", "-", "Morph Name=16384", "-"}));
}

TEST_F(PropertyMenus, TreeMenuCreatesAPropertyForTheCaller) {
    auto *node = new SgNode("body");
    scene()->addNode(node);
    addProperty(node, new SgFloatProperty("bend"), "Pose/Face");
    auto current = std::make_unique<SgFloatProperty>("current");
    SgPropertyTreeMenu menu("Grin", node, nullptr, "tree");

    auto answerCreate = [](const QStringList &path,
                           std::function<void(SgCreatePropertyDlg *)> act) {
        uitest::onNextPopup([path, act](QMenu *popup) {
            uitest::onNextModal([act](QWidget *modal) {
                auto *dialog = qobject_cast<SgCreatePropertyDlg *>(modal);
                if (!dialog) {
                    ADD_FAILURE() << "no create-property dialog";
                    modal->close();
                    return;
                }
                act(dialog);
            });
            uitest::chooseInMenu(popup, path);
        });
    };
    auto text = [](SgCreatePropertyDlg *dialog, const char *name) {
        return dialog->findChild<QLineEdit *>(name)->text();
    };

    // Cancelled: the current property stays, nothing is added.
    answerCreate({"Create..."}, [&](SgCreatePropertyDlg *dialog) {
        EXPECT_EQ(dialog->objectName(), "PropertyTreeMenuCreateDlg");
        EXPECT_EQ(text(dialog, "SgPathAttrib"), "Morphs/Morph Loader");
        EXPECT_EQ(text(dialog, "SgPropertyInternalNameAttrib"), "Grin");
        EXPECT_EQ(text(dialog, "SgPropertyLabelAttrib"), "Grin");
        EXPECT_EQ(dialog->getCreationNodes(), QList<SgNode *>({node}));
        auto *paths = dialog->findChild<QComboBox *>("SgPathDefaults");
        EXPECT_EQ(paths->count(), 3); // "Pose", "Pose/Face" and the preset
        dialog->findChild<QPushButton *>("SgCancelCreatePropButton")->click();
    });
    EXPECT_EQ(menu.chooseProperty(current.get(), QPoint()), current.get());
    EXPECT_EQ(node->getPropertyCount(), 1);

    // Created inside a group: preset to the group's path, handed over unattached.
    answerCreate({"Pose", "Face", "Create..."}, [&](SgCreatePropertyDlg *dialog) {
        EXPECT_EQ(text(dialog, "SgPathAttrib"), "Pose/Face");
        dialog->findChild<QPushButton *>("SgCreatePropButton")->click();
    });
    std::unique_ptr<SgNumericProperty> created(menu.chooseProperty(current.get(), QPoint()));
    ASSERT_NE(created, nullptr);
    EXPECT_NE(created.get(), current.get());
    EXPECT_EQ(created->getName(), "Grin");
    EXPECT_EQ(created->getPath(), "Pose/Face");
    EXPECT_EQ(created->getOwner(), nullptr);
    EXPECT_EQ(node->getPropertyCount(), 1);
}

TEST_F(PropertyMenus, SceneNodeMenuListsVisibleNodesByScenePosition) {
    {
        SgSceneNodeMenu empty(nullptr, "empty");
        EXPECT_TRUE(empty.actions().isEmpty());
        SgNode current("current");
        dismiss();
        EXPECT_EQ(empty.chooseNode(&current, QPoint()), &current);
    }
    auto *first = new SgNode("first");
    auto *hidden = new SgNode("hidden");
    auto *third = new SgNode("twin");
    auto *fourth = new SgNode("twin2");
    fourth->setLabel("twin");
    hidden->setHidden(true);
    for (SgNode *node : {first, hidden, third, fourth})
        scene()->addNode(node);
    SgSceneNodeMenu menu(nullptr, "nodes");
    EXPECT_EQ(uitest::menuEntries(&menu), QStringList({"first=0", "twin=2", "twin=3"}));
    uitest::onNextPopup([](QMenu *popup) {
        popup->setActiveAction(popup->actions().at(2));
        QTest::keyClick(popup, Qt::Key_Return);
    });
    EXPECT_EQ(menu.chooseNode(first, QPoint()), fourth);
    choose({"twin"});
    EXPECT_EQ(menu.chooseNode(first, QPoint()), third);
    dismiss();
    EXPECT_EQ(menu.chooseNode(first, QPoint()), first);
}

} // namespace
