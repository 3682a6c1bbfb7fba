#include "sgcore/app/sgapp.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <gtest/gtest.h>

TEST(HostScene, NodesKeepSceneOrderAndSelection) {
    SgScene scene;
    auto *a = new SgNode(QStringLiteral("a"));
    auto *b = new SgNode(QStringLiteral("b"));
    scene.addNode(a);
    scene.addNode(b);
    ASSERT_EQ(scene.getNodeCount(), 2);
    EXPECT_EQ(scene.getNode(0), a);
    EXPECT_EQ(scene.findNodeByLabel(QStringLiteral("b")), b);
    EXPECT_EQ(scene.findNodeByLabel(QStringLiteral("free")), nullptr);
    scene.selectNode(b);
    scene.selectNode(a, true);
    EXPECT_EQ(scene.getPrimarySelection(), a);
    SgNodeListIterator it = scene.selectedNodeListIterator();
    EXPECT_EQ(it.next(), a);
    EXPECT_EQ(it.next(), b);
    EXPECT_EQ(it.next(), nullptr);
    ASSERT_NE(sgApp, nullptr);
}
