// The bridge and the reference modeler in two processes: nodes go out in send-list order, and
// both sides leave nothing behind in the shared-memory folder.

#include "bridge/sgfacbridge.h"
#include "tests/support/sgtestprocess.h"
#include "tests/support/sgtestscene.h"

#include "exchange/shm/sgcontrolrecord.h"
#include "facetor/sgfacetorobjfile.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QDir>
#include <QFile>
#include <QRegularExpression>
#include <QTimer>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <tuple>
#include <vector>

#include <gtest/gtest.h>

namespace {

using Point = std::tuple<float, float, float>;

class TestBridge : public SgFacBridge {
public:
    using SgFacBridge::executeAction;
};

// The node names in the order the modeler received them, from its log.
QStringList received(const QString &log) {
    QStringList names;
    static const QRegularExpression line(QStringLiteral(" received (.*) vertices="));
    auto it = line.globalMatch(log);
    while (it.hasNext())
        names << it.next().captured(1);
    return names;
}

std::vector<Point> scaledPoints(const SgExchangeNode &node) {
    std::vector<Point> points;
    for (size_t i = 0; i + 2 < node.vertices.size(); i += 3)
        points.emplace_back(node.vertices[i] * 10, node.vertices[i + 1] * 10,
                            node.vertices[i + 2] * 10);
    return points;
}

std::vector<Point> scenePoints(const SgNode *node) {
    std::vector<Point> points;
    const SgVertexMesh *mesh = node->getObject()->getCurrentShape()->getGeometry();
    for (int i = 0; i < mesh->getVertexCount(); ++i)
        points.emplace_back(mesh->getVertex(i).x, mesh->getVertex(i).y, mesh->getVertex(i).z);
    return points;
}

void expectSamePoints(std::vector<Point> actual, std::vector<Point> expected, bool anyOrder) {
    if (anyOrder) { // and a point that two bones share counted once
        for (std::vector<Point> *points : {&actual, &expected}) {
            std::sort(points->begin(), points->end());
            points->erase(std::unique(points->begin(), points->end()), points->end());
        }
    }
    ASSERT_EQ(actual.size(), expected.size());
    for (size_t i = 0; i < actual.size(); ++i) {
        EXPECT_NEAR(std::get<0>(actual[i]), std::get<0>(expected[i]), 1e-4f) << i;
        EXPECT_NEAR(std::get<1>(actual[i]), std::get<1>(expected[i]), 1e-4f) << i;
        EXPECT_NEAR(std::get<2>(actual[i]), std::get<2>(expected[i]), 1e-4f) << i;
    }
}

class BridgeRoundTrip : public ::testing::Test {
protected:
    void SetUp() override {
        sgApp->getScene()->clear();
        ASSERT_TRUE(sgTestLeftovers().isEmpty()) << sgTestLeftovers().join(' ').toStdString();
    }
    void TearDown() override { sgApp->getScene()->clear(); }
};

} // namespace

TEST_F(BridgeRoundTrip, SelectedNodesArriveInOrderAndBothSidesCleanUp) {
    SgScene *scene = sgApp->getScene();
    scene->addNode(sgTestProp(QStringLiteral("Cup"), {1.5f, -2, 300}));
    scene->addNode(sgTestFigure(QStringLiteral("Body"), 2, 1));
    scene->addNode(sgTestProp(QStringLiteral("Plate"), {-40, 0.125f, 9}));
    for (const char *label : {"Bone 1", "Plate", "Cup"})
        scene->selectNode(scene->findNodeByLabel(QString::fromLatin1(label)), true);

    SgTestModeler run(FACETOR_BIN_DIR, {{"FACETOR_EXPECT", "3"}, {"FACETOR_QUIT_WHEN_DONE", "1"}});
    qint64 pid = 0;
    {
        TestBridge bridge;
        bridge.executeAction();
        ASSERT_TRUE(bridge.isActive())
            << sgApp->getMessageSink()->logLines().join('\n').toStdString();
        QStringList sendOrder;
        for (SgNode *node : bridge.sendList())
            sendOrder << node->getLabel();
        // Selected nodes are listed in scene order; the figure stands for its bone.
        EXPECT_EQ(sendOrder, (QStringList{"Cup", "Body", "Plate"}));
        pid = bridge.modelerProcessId();
        // The modeler's goodbye stops the poll.
        ASSERT_TRUE(sgTestWaitUntil(
            [&] { return !bridge.isActive() && bridge.pendingImports() == 0; }, 20000))
            << run.log().toStdString();
        EXPECT_FALSE(bridge.pollTimer()->isActive());
        EXPECT_EQ(bridge.sendList().count(), 0);
        EXPECT_EQ(received(run.log()), sendOrder) << run.log().toStdString();
    }
    ASSERT_TRUE(sgTestWaitUntil([&] { return sgTestProcessGone(pid); }, 10000));
    EXPECT_TRUE(sgTestWaitUntil([] { return sgTestLeftovers().isEmpty(); }, 2000))
        << sgTestLeftovers().join(' ').toStdString();

    // Each node's workspace copy holds the scene's geometry at a tenth of its size.
    QString error;
    for (const char *label : {"Cup", "Plate"}) {
        SgExchangeNode copy;
        ASSERT_TRUE(SgFacetorObjFile::read(
            QDir(run.workspace()).filePath(QString::fromLatin1(label) + ".obj"), QString(), copy,
            error))
            << error.toStdString();
        EXPECT_EQ(copy.name, QString::fromLatin1(label));
        expectSamePoints(scaledPoints(copy), scenePoints(scene->findNodeByLabel(label)), false);
        EXPECT_EQ(copy.facets.size(), 1u);
    }
    SgExchangeNode figure;
    ASSERT_TRUE(SgFacetorObjFile::read(QDir(run.workspace()).filePath("Body.obj"), QString(),
                                       figure, error));
    std::vector<Point> bones = scenePoints(scene->findNodeByLabel("Bone 0"));
    const std::vector<Point> second = scenePoints(scene->findNodeByLabel("Bone 1"));
    bones.insert(bones.end(), second.begin(), second.end());
    expectSamePoints(scaledPoints(figure), bones, true);
}
