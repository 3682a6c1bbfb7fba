#include "sgcore/io/sgscenefile.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "tests/support/sgtestscene.h"

#include <gtest/gtest.h>

#include <QSignalSpy>

namespace {

const QString kExamples = QStringLiteral(SG_EXAMPLES_DIR);

} // namespace

TEST(HostScene, NodesKeepSceneOrderAndSelection) {
    SgScene scene;
    QSignalSpy selection(&scene, &SgScene::selectionChanged);
    auto *a = new SgNode(QStringLiteral("a"));
    auto *b = new SgNode(QStringLiteral("b"));
    auto *c = new SgNode(QStringLiteral("c"));
    for (SgNode *node : {a, b, c, a}) // a again: stays where it is
        scene.addNode(node);
    ASSERT_EQ(scene.getNodes(), (SgNodeList{a, b, c}));
    b->setLabel(QStringLiteral("Bee")); // found by its label only
    EXPECT_EQ(scene.findNodeByLabel(QStringLiteral("Bee")), b);
    EXPECT_EQ(scene.findNodeByLabel(QStringLiteral("b")), nullptr);

    // Selected nodes come in scene order; the primary selection is the last one selected.
    scene.selectNode(c);
    scene.selectNode(a, true);
    EXPECT_EQ(scene.getPrimarySelection(), a);
    EXPECT_EQ(scene.getSelectedNodes(), (SgNodeList{a, c}));
    scene.deselectNode(a);
    EXPECT_EQ(scene.getPrimarySelection(), c);
    scene.selectNode(b);
    EXPECT_EQ(selection.count(), 4);

    // Removing a node takes it out of the selection; iterators keep their snapshot.
    SgNodeListIterator all = scene.nodeListIterator();
    scene.removeNode(b);
    EXPECT_EQ(scene.getPrimarySelection(), nullptr);
    EXPECT_EQ(all.count(), 3);
}

TEST(HostScene, FigureHierarchyAndNodeChildren) {
    SgScene scene;
    SgSkeleton *figure = sgTestFigure(QStringLiteral("Fig"), 3, 1);
    auto *follower = new SgSkeleton(QStringLiteral("Shirt"));
    follower->setFollowTarget(figure);
    const SgBoneList bones = figure->getAllBones();
    auto *prop = new SgNode(QStringLiteral("ring"));
    prop->setParent(bones[1]);
    scene.addNode(figure);
    scene.addNode(follower);
    // Figures are followed by their bones (and what hangs below them) depth first.
    EXPECT_EQ(scene.getNodes(), (SgNodeList{figure, bones[0], bones[1], bones[2], prop, follower}));
    EXPECT_EQ(scene.getSkeletons(), (SgSkeletonList{figure, follower}));
    EXPECT_EQ(bones[2]->getSkeleton(), figure);
    EXPECT_EQ(prop->getSkeleton(), nullptr);
    EXPECT_EQ(figure->findBone(QStringLiteral("bone2")), bones[2]);
    EXPECT_EQ(figure->findBone(QStringLiteral("Bone 1")), bones[1]); // by label when no name fits

    SgNodeList direct;
    figure->getNodeChildren(direct, false);
    EXPECT_EQ(direct, SgNodeList{bones[0]});
    SgNodeList below;
    bones[0]->getNodeChildren(below, true);
    EXPECT_EQ(below, (SgNodeList{bones[1], bones[2], prop}));
    EXPECT_FALSE(bones[0]->setParent(prop)); // no cycles

    // Removing the figure removes its bones and props; the follower follows none.
    scene.removeNode(figure);
    EXPECT_EQ(scene.getNodes(), SgNodeList{follower});
    EXPECT_EQ(follower->getFollowTarget(), nullptr);
}

TEST(HostSceneFile, RejectsBadFilesWholeWithPlace) {
    SgScene scene;
    SgSceneFile file;
    const QString base = kExamples + QStringLiteral("/scenes");
    struct Case {
        const char *json;
        const char *words;
    };
    const Case cases[] = {
        {"not json", "not a JSON object"},
        {R"({"nodes": []})", "version 1"},
        {R"({"scenara": 2, "nodes": []})", "version 1"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "color", "name": "c", "value": [0, 255.5, 0]}]}]})",
         "0 to 255"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "float", "name": "p"}, {"type": "float", "name": "q",
             "links": [{"node": "a", "property": "p", "type": 6}]}]}]})",
         "link type from 0 to 5"},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a"}]})", "needs \"geometry\""},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a", "geometry": "missing.obj"}]})",
         "missing.obj:0: cannot open"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a"}, {"kind": "figure", "name": "f",
            "bones": [{"name": "b", "parent": "x"}]}]})",
         "nodes[1].bones[0]: unknown parent bone \"x\""},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "float", "name": "p"}, {"type": "int", "name": "p"}]}]})",
         "(82)"},
        {R"({"scenara": 1, "nodes": [{"kind": "figure", "name": "f", "followTarget": "g",
            "bones": []}]})",
         "unknown follow target"},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a",
            "geometry": {"file": "figure.obj", "group": "tail"}}]})",
         "no face group \"tail\""},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "origin": [1, 2]}]})",
         "array of 3 numbers"},
    };
    for (const Case &c : cases) {
        EXPECT_FALSE(file.loadFromData(c.json, base, &scene, QStringLiteral("bad.json"))) << c.json;
        EXPECT_TRUE(file.getErrorString().startsWith(QStringLiteral("bad.json: ")))
            << file.getErrorString().toStdString();
        EXPECT_TRUE(file.getErrorString().contains(QString::fromUtf8(c.words)))
            << file.getErrorString().toStdString();
        EXPECT_EQ(scene.getNodeCount(), 0) << "nothing is added from a rejected file";
    }
}
