// The bridge action on its own: collecting the selection, launching, the control messages and
// the poll's counting, and placing returned geometry. The modeler is played by this test
// through a second view of the control segment, or by a stand-in program that only sleeps.

#include "bridge/sgfacbridge.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestmodal.h"
#include "tests/support/sgtestprocess.h"
#include "tests/support/sgtestscene.h"
#include "tests/support/sgtestsegment.h"

#include "exchange/shm/sgcontrolrecord.h"
#include "exchange/shm/sgsharedmemory.h"
#include "facetor/sgfacetorreturn.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/materials/sgtexture.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QElapsedTimer>
#include <QFile>
#include <QTest>
#include <QTimer>

#include <cstring>
#include <optional>

#include <gtest/gtest.h>

namespace {

class TestBridge : public SgFacBridge {
public:
    using SgFacBridge::closing;
    using SgFacBridge::collectNode;
    using SgFacBridge::copyMaterials;
    using SgFacBridge::createPropFromShape;
    using SgFacBridge::executeAction;
};

// The modeler's view of the control record: the segment's file mapped directly, so that the
// test holds no segment handle that would keep the segment alive after the bridge has gone.
class Peer {
public:
    Peer() {
        for (const QString &file : sgTestSegmentFiles(kSgControlSegmentKey)) {
            if (file.contains(QLatin1String("-ref")) || file.contains(QLatin1String("-lock")))
                continue;
            m_file.setFileName(QStringLiteral("/dev/shm/") + file);
            if (m_file.open(QIODevice::ReadWrite))
                m_record =
                    reinterpret_cast<SgControlRecord *>(m_file.map(0, sizeof(SgControlRecord)));
        }
    }
    SgControlRecord *live() { return m_record ? m_record : &m_scratch; }
    void post(SgModelerMessage code) { post(sgCodeByte(code)); }
    // A code as the byte it travels as.
    void post(std::uint8_t code, std::int32_t parameter = 0) {
        live()->toHostCode = code;
        live()->toHostParameter = parameter;
        live()->toHostFlag = 0;
    }
    // Takes the host's message: its code, or none when none waits.
    std::optional<SgHostMessage> take() {
        if (live()->toModelerFlag != 0)
            return std::nullopt;
        live()->toModelerFlag = 1;
        return SgHostMessage(live()->toModelerCode);
    }

private:
    QFile m_file;
    SgControlRecord *m_record = nullptr;
    SgControlRecord m_scratch{};
};

// A stand-in modeler program that lives for a few seconds (long enough for a test; a test
// ends it early by killing it) without touching the segments. Its folder lasts as long as the
// test program, since the program starts after the launch has returned.
class StandInModeler {
public:
    StandInModeler() {
        static const QTemporaryDir folder;
        const QString program = folder.filePath(QStringLiteral("Facetor"));
        if (!QFile::exists(program)) {
            sgTestWriteFile(program, "#!/bin/sh\nexec sleep 10 </dev/null >/dev/null 2>&1\n");
            QFile::setPermissions(program, QFile::ReadOwner | QFile::WriteOwner | QFile::ExeOwner);
        }
        qputenv("FACETOR_INSTALL_PATH", folder.path().toUtf8());
    }
    ~StandInModeler() { qunsetenv("FACETOR_INSTALL_PATH"); }
};

class BridgeAction : public SgTestCleanScene {
protected:
    static SgScene *scene() { return sgApp->getScene(); }

    // Adds the nodes `names` to the selection (props made for those not in the scene).
    static void selectProps(const QStringList &names) {
        for (const QString &label : names) {
            if (!scene()->findNodeByLabel(label))
                scene()->addNode(sgTestProp(label));
            scene()->selectNode(scene()->findNodeByLabel(label), true);
        }
    }

    template <typename List> static QStringList labels(const List &list) {
        QStringList out;
        for (SgNode *node : list)
            out << node->getLabel();
        return out;
    }

    // An active bridge linked through the stand-in modeler with the nodes `send` selected and
    // sent; the test steps its poll itself.
    static std::unique_ptr<TestBridge> linkedBridge(const QStringList &send = {"Cup"}) {
        StandInModeler modeler;
        auto bridge = std::make_unique<TestBridge>();
        scene()->clearSelection();
        selectProps(send);
        bridge->executeAction();
        bridge->pollTimer()->stop();
        return bridge;
    }

    // A data segment holding the modeler's return of a shape `name` with `vertices` (x, y, z
    // each; a triangle over the first three).
    static std::unique_ptr<SgTestSegment> writeReturn(const char *name,
                                                      std::vector<float> vertices) {
        SgExchangeNode returned;
        returned.name = QString::fromLatin1(name);
        returned.vertices = std::move(vertices);
        returned.materials.append(SgExchangeNode::Material{});
        if (returned.vertices.size() >= 9) {
            returned.facets.push_back({'T', 0, 0, 3});
            returned.corners = {{0, -1, -1}, {1, -1, -1}, {2, -1, -1}};
        }
        const QByteArray record = SgFacetorReturn::encode(returned);
        auto data = std::make_unique<SgTestSegment>(kSgDataSegmentKey);
        EXPECT_TRUE(data->create(int32_t(record.size())) &&
                    data->attach(SgSharedMemory::kReadWrite));
        std::memcpy(data->data(), record.constData(), size_t(record.size()));
        return data;
    }
};

} // namespace

TEST_F(BridgeAction, CollectingSendsEachFigureOnceWithFollowersAndDescendants) {
    SgSkeleton *body = sgTestFigure(QStringLiteral("Body"), 2, 1);
    const SgBoneList bones = body->getAllBones();
    sgTestProp(QStringLiteral("Hat"))->setParent(bones[1]);
    SgSkeleton *shirt = sgTestFigure(QStringLiteral("Shirt"), 1, 1);
    SgBone *sleeve = shirt->getAllBones()[0];
    shirt->setFollowTarget(body);
    sgTestProp(QStringLiteral("Ring"))->setParent(sleeve);
    auto *empty = new SgNode(QStringLiteral("Empty"));
    sgTestProp(QStringLiteral("Spoon"))->setParent(empty);
    SgNode *cup = sgTestProp(QStringLiteral("Cup"));
    for (SgNode *node : {static_cast<SgNode *>(body), static_cast<SgNode *>(shirt), cup, empty})
        scene()->addNode(node);

    TestBridge bridge;
    // A bone and its figure selected together, a node without an object (whose child is not
    // visited) and a plain prop.
    for (SgNode *node : QList<SgNode *>{bones[1], body, empty, cup, bones[0]})
        scene()->selectNode(node, true);
    StandInModeler modeler;
    bridge.executeAction();
    EXPECT_EQ(labels(bridge.sendList()), (QStringList{"Body", "Shirt", "Ring", "Hat", "Cup"}));

    TestBridge single;
    single.collectNode(nullptr);
    single.collectNode(sleeve);
    single.collectNode(empty);
    EXPECT_EQ(labels(single.sendList()), (QStringList{"Shirt", "Ring"}));
}

TEST_F(BridgeAction, NothingSelectedAsksBeforeLaunching) {
    StandInModeler modeler;
    {
        TestBridge bridge;
        SgTestModalAnswer answer([&](QWidget *box) { QTest::keyClick(box, Qt::Key_Escape); });
        bridge.executeAction();
        EXPECT_EQ(answer.answered(), 1);
        EXPECT_FALSE(bridge.isActive());
        EXPECT_EQ(bridge.modelerProcessId(), 0);
    }
    TestBridge bridge;
    SgTestModalAnswer answer([](QWidget *box) { QTest::keyClick(box, Qt::Key_Return); });
    bridge.executeAction();
    EXPECT_EQ(answer.answered(), 1);
    EXPECT_TRUE(bridge.isActive());
    EXPECT_TRUE(bridge.pollTimer()->isActive());
    EXPECT_EQ(bridge.pollTimer()->interval(), 50);
    EXPECT_NE(bridge.modelerProcessId(), 0);
    EXPECT_EQ(bridge.sendList().count(), 0);
    // The control record was written fresh: both slots free, nothing else.
    const SgControlRecord record = *Peer().live();
    const SgControlRecord fresh = SgControlRecord::fresh();
    EXPECT_EQ(std::memcmp(&record, &fresh, sizeof fresh), 0);

    // Triggered again while linked, it appends the selection: no question, no launch.
    const qint64 pid = bridge.modelerProcessId();
    selectProps({"Cup", "Plate"});
    bridge.executeAction();
    EXPECT_EQ(answer.titles().size(), 1);
    EXPECT_EQ(bridge.modelerProcessId(), pid);
    EXPECT_EQ(labels(bridge.sendList()), (QStringList{"Cup", "Plate"}));
}

TEST_F(BridgeAction, AMissingModelerIsLoggedAndRemovedNodesLeaveTheSendList) {
    qputenv("FACETOR_INSTALL_PATH", "/nonexistent/facetor");
    TestBridge bridge;
    selectProps({"Cup", "Plate", "Fork"});
    bridge.executeAction();
    qunsetenv("FACETOR_INSTALL_PATH");
    EXPECT_TRUE(
        sgApp->getMessageSink()->logLines().contains(QStringLiteral("Failed to launch Facetor.")));
    EXPECT_FALSE(bridge.isActive());
    EXPECT_FALSE(bridge.pollTimer()->isActive());
    EXPECT_EQ(labels(bridge.sendList()), (QStringList{"Cup", "Plate", "Fork"}));

    // The kept list never outlives its nodes: a removal or a cleared (reloaded) scene drops
    // them before they are deleted, so a later send cannot reach a freed node.
    scene()->removeNode(scene()->findNodeByLabel(QStringLiteral("Plate")));
    EXPECT_EQ(labels(bridge.sendList()), (QStringList{"Cup", "Fork"}));
    scene()->clear();
    EXPECT_EQ(bridge.sendList().count(), 0);

    // While another host holds the link the user is told, and no modeler starts.
    SgTestSegment otherHost(kSgHostLinkKey);
    ASSERT_TRUE(otherHost.create(8));
    selectProps({"Cup"});
    StandInModeler modeler;
    TestBridge second;
    second.executeAction();
    EXPECT_FALSE(second.isActive());
    EXPECT_EQ(second.modelerProcessId(), 0);
    EXPECT_EQ(sgApp->getMessageSink()->logLines().last(),
              QStringLiteral("Facetor is linked to another Scenara."));
    otherHost.remove(SgSharedMemory::kRemoveUnlocked);
}

TEST_F(BridgeAction, MessagesWaitForTheirSlot) {
    TestBridge idle;
    int value = 42;
    EXPECT_FALSE(idle.postMessage(SgHostMessage::NodeWritten, 0)); // not attached
    EXPECT_EQ(idle.readMessage(value), SgModelerMessage::SendSelection);
    EXPECT_EQ(value, 42);

    auto bridge = linkedBridge();
    Peer peer;
    EXPECT_EQ(bridge->readMessage(value), SgModelerMessage::NoMessage);
    EXPECT_TRUE(bridge->postMessage(SgHostMessage::SegmentBusy, 7));
    const SgControlRecord before = *peer.live();
    EXPECT_EQ(before.toModelerFlag, 0);
    EXPECT_EQ(before.toModelerCode, 4); // the byte SegmentBusy travels as
    EXPECT_EQ(before.toModelerParameter, 7);
    EXPECT_FALSE(bridge->postMessage(SgHostMessage::NodeWritten, 9));
    EXPECT_EQ(std::memcmp(&before, peer.live(), sizeof before), 0);

    peer.post(200, -3);
    EXPECT_EQ(sgCodeByte(bridge->readMessage(value)), 200);
    EXPECT_EQ(value, -3);
    EXPECT_EQ(peer.live()->toHostFlag, 1);

    // Closing says goodbye once the slot is free, and gives up quietly while it is taken.
    bridge->closing();
    EXPECT_EQ(peer.take(), SgHostMessage::SegmentBusy);
    bridge->closing();
    EXPECT_EQ(peer.take(), SgHostMessage::ShuttingDown);
}

TEST_F(BridgeAction, ThePollCountsIdlePollsRetriesBeforeNoticesAndSendsWhatItCan) {
    // A node whose shape has no geometry, sent before a plain prop.
    scene()->addNode(sgTestAttach(new SgNode(QStringLiteral("Hollow")),
                                  new SgPolyShape(QStringLiteral("Hollow"))));
    auto bridge = linkedBridge({"Hollow", "Cup"});
    Peer peer;
    for (int i = 1; i <= 10; ++i) {
        bridge->checkSharedMap();
        EXPECT_EQ(bridge->idlePolls(), i);
    }
    EXPECT_EQ(peer.take(), std::nullopt);
    bridge->checkSharedMap(); // the eleventh poll sends the idle notice
    EXPECT_EQ(bridge->idlePolls(), 1);
    EXPECT_EQ(peer.live()->toModelerCode, sgCodeByte(SgHostMessage::Idle));
    EXPECT_EQ(peer.live()->toModelerFlag, 0);

    // Geometry announced without a readable segment is still acknowledged; with the slot
    // taken the acknowledgement waits in the retry queue.
    peer.post(SgModelerMessage::GeometryWritten);
    bridge->checkSharedMap();
    EXPECT_EQ(bridge->idlePolls(), 0);
    ASSERT_EQ(bridge->retryQueue().size(), 1);
    EXPECT_EQ(bridge->retryQueue().head(), std::make_pair(SgHostMessage::GeometryRead, 0));
    for (int i = 0; i < 12; ++i)
        bridge->checkSharedMap(); // retries leave the count alone, and no notice goes out
    EXPECT_EQ(bridge->idlePolls(), 0);
    EXPECT_EQ(bridge->retryQueue().size(), 1);
    EXPECT_EQ(peer.take(), SgHostMessage::Idle);
    // While the modeler holds the control lock a step waits for it once, posts nothing and
    // counts as idle.
    {
        SgTestSegment modeler(kSgControlSegmentKey);
        ASSERT_TRUE(modeler.attach(SgSharedMemory::kReadWrite));
        ASSERT_TRUE(modeler.tryLock(0));
        QElapsedTimer clock;
        clock.start();
        bridge->checkSharedMap();
        EXPECT_GE(clock.elapsed(), 24);
        EXPECT_LT(clock.elapsed(), 45);
        EXPECT_EQ(bridge->retryQueue().size(), 1);
        EXPECT_EQ(bridge->idlePolls(), 1);
        modeler.unlock();
        modeler.detach();
        modeler.remove(SgSharedMemory::kRemoveUnlocked);
    }
    bridge->checkSharedMap();
    EXPECT_TRUE(bridge->retryQueue().isEmpty());
    EXPECT_EQ(peer.take(), SgHostMessage::GeometryRead);
    EXPECT_EQ(bridge->idlePolls(), 1);

    // The modeler asks: the node that cannot be written is reported, and only the whole record
    // of the next goes out, in a data segment of its own.
    peer.post(SgModelerMessage::SendSelection);
    bridge->checkSharedMap();
    EXPECT_TRUE(sgApp->getMessageSink()->logLines().contains(
        QStringLiteral("Could not send Hollow to Facetor.")));
    EXPECT_TRUE(bridge->isExchangeBusy());
    EXPECT_EQ(bridge->sendList().count(), 0);
    EXPECT_EQ(peer.take(), SgHostMessage::NodeWritten);
    EXPECT_TRUE(sgTestSegmentExists(kSgDataSegmentKey));
    // Code 4 asks the host to let go of the data segment; the exchange goes on.
    peer.post(std::uint8_t(4));
    bridge->checkSharedMap();
    EXPECT_FALSE(sgTestSegmentExists(kSgDataSegmentKey));
    EXPECT_TRUE(bridge->isExchangeBusy());
    peer.post(SgModelerMessage::NodeRead);
    bridge->checkSharedMap();
    EXPECT_FALSE(bridge->isExchangeBusy());
    EXPECT_FALSE(sgTestSegmentExists(kSgDataSegmentKey));
}

TEST_F(BridgeAction, ALostRecordEndsTheExchangeAndAQuitEndsTheLink) {
    auto bridge = linkedBridge();
    Peer peer;
    // The modeler takes the node record and asks again without acknowledging it: the same
    // modeler is still at work; one that has linked since has lost the record.
    peer.post(SgModelerMessage::SendSelection);
    bridge->checkSharedMap();
    EXPECT_EQ(peer.take(), SgHostMessage::NodeWritten);
    bridge->checkSharedMap();
    peer.post(SgModelerMessage::SendSelection);
    bridge->checkSharedMap();
    EXPECT_TRUE(bridge->isExchangeBusy());
    SgTestSegment restarted(kSgControlSegmentKey);
    ASSERT_TRUE(restarted.attach(SgSharedMemory::kReadWrite));
    peer.post(SgModelerMessage::SendSelection);
    bridge->checkSharedMap();
    EXPECT_FALSE(bridge->isExchangeBusy());
    EXPECT_FALSE(sgTestSegmentExists(kSgDataSegmentKey));

    // A modeler that quits ends a busy exchange, drops the queued messages and stops the poll.
    scene()->clearSelection();
    selectProps({"Plate"});
    bridge->executeAction();
    peer.post(SgModelerMessage::SendSelection);
    bridge->checkSharedMap();
    ASSERT_TRUE(bridge->isExchangeBusy());
    EXPECT_TRUE(sgTestSegmentExists(kSgDataSegmentKey));
    peer.post(SgModelerMessage::Quit);
    bridge->pollTimer()->start();
    bridge->checkSharedMap();
    EXPECT_FALSE(bridge->isActive());
    EXPECT_FALSE(bridge->pollTimer()->isActive());
    EXPECT_FALSE(bridge->isExchangeBusy());
    EXPECT_TRUE(bridge->retryQueue().isEmpty());
    EXPECT_FALSE(sgTestSegmentExists(kSgDataSegmentKey));
    restarted.detach();
    restarted.remove(SgSharedMemory::kRemoveUnlocked);
}

TEST_F(BridgeAction, TheHostSwitchLinksWithoutRewritingTheRecord) {
    // The modeler that started the host has set the record up and asks for the selection.
    SgTestSegment modeler(kSgControlSegmentKey);
    ASSERT_TRUE(modeler.create(16));
    ASSERT_TRUE(modeler.attach(SgSharedMemory::kReadWrite));
    SgControlRecord asking = SgControlRecord::fresh();
    asking.toHostFlag = 0;
    asking.toModelerParameter = 77;
    std::memcpy(modeler.data(), &asking, sizeof asking);

    sgApp->setCommandArguments({QStringLiteral("-x"), QStringLiteral("-facbridge")});
    TestBridge bridge;
    sgApp->setCommandArguments({});
    EXPECT_TRUE(bridge.isActive());
    EXPECT_TRUE(bridge.pollTimer()->isActive());
    EXPECT_EQ(bridge.modelerProcessId(), 0);
    EXPECT_EQ(std::memcmp(modeler.data(), &asking, sizeof asking), 0);
    int value = 0;
    EXPECT_EQ(bridge.readMessage(value), SgModelerMessage::SendSelection);
    // The host's start-up restarts the poll of a linked bridge.
    bridge.pollTimer()->stop();
    sgApp->emitStarting();
    EXPECT_TRUE(bridge.pollTimer()->isActive());
    modeler.detach();
}

TEST_F(BridgeAction, ReturnsAreAcknowledgedFirstThenImportedOrRefused) {
    scene()->addNode(sgTestProp(QString::fromUtf8("Kiste\u2013A")));
    auto bridge = linkedBridge();
    Peer peer;
    QStringList outcomes;
    QObject::connect(bridge.get(), &SgFacBridge::returnHandled,
                     [&](const QString &outcome) { outcomes << outcome; });

    // One returned record in the data segment, announced; the poll reads and acknowledges it
    // in the step, and the import follows from the event loop.
    auto returnShape = [&](const char *name, std::vector<float> vertices) {
        auto data = writeReturn(name, std::move(vertices));
        peer.post(SgModelerMessage::GeometryWritten);
        const int nodes = scene()->getNodeCount();
        bridge->checkSharedMap();
        EXPECT_EQ(peer.take(), SgHostMessage::GeometryRead);
        EXPECT_EQ(scene()->getNodeCount(), nodes);
        EXPECT_EQ(bridge->pendingImports(), 1);
        data->detach();
        data->remove(SgSharedMemory::kRemoveUnlocked);
        EXPECT_FALSE(sgTestSegmentExists(kSgDataSegmentKey));
        EXPECT_TRUE(sgTestWaitUntil([&] { return bridge->pendingImports() == 0; }, 2000));
    };

    returnShape("Gizmo", {0, 0, 0, 2, 0, 0, 0, 4, 0});
    SgNode *prop = scene()->findNodeByLabel(QStringLiteral("Gizmo"));
    ASSERT_NE(prop, nullptr);
    // Host units are ten times the modeler's; the origin is the centre of the bounding box.
    EXPECT_EQ(prop->getOrigin(), SgVec3(10, 20, 0));
    EXPECT_EQ(sgTestGeometry(prop)->getVertexCount(), 3);

    // A label outside 8 bits travels as "Kiste?A" and comes back to its node as a morph.
    returnShape("Kiste?A", {0, 0, 0, 1, 0.5f, 0, 0, 1, 0});
    SgNode *kiste = scene()->findNodeByLabel(QString::fromUtf8("Kiste\u2013A"));
    EXPECT_NE(kiste->getObject()->findModifier(QStringLiteral("MyMorph")), nullptr);
    EXPECT_EQ(scene()->findNodeByLabel(QStringLiteral("Kiste?A")), nullptr);

    // A return without vertices is refused, not offered as a morph or a prop.
    returnShape("Cup", {});
    EXPECT_EQ(scene()->getNodeCount(), 3);
    EXPECT_EQ(scene()->findNodeByLabel(QStringLiteral("Cup"))->getObject()->getModifierCount(), 0);
    EXPECT_TRUE(sgApp->getMessageSink()->logLines().contains(
        QStringLiteral("Facetor returned Cup without geometry; nothing was imported.")));
    EXPECT_EQ(outcomes, (QStringList{"imported", "imported", "refused"}));
}

TEST_F(BridgeAction, AReturnWhoseLockTheModelerKeepsCostsShortStepsAndIsGivenUp) {
    auto bridge = linkedBridge();
    Peer peer;
    auto data = writeReturn("Gizmo", {0, 0, 0, 2, 0, 0, 0, 4, 0});
    // The modeler announces the record and keeps its lock: each step waits a little and the
    // return is tried again, until it is given up after a few seconds and acknowledged.
    ASSERT_TRUE(data->tryLock(0));
    peer.post(SgModelerMessage::GeometryWritten);
    QElapsedTimer clock;
    clock.start();
    qint64 worst = 0;
    while (peer.live()->toModelerFlag == 1 && clock.elapsed() < 5000) {
        QElapsedTimer step;
        step.start();
        bridge->checkSharedMap();
        worst = std::max(worst, step.elapsed());
        if (peer.live()->toModelerCode == sgCodeByte(SgHostMessage::Idle))
            peer.take(); // idle notices go on meanwhile
    }
    EXPECT_LT(worst, 100);
    EXPECT_GE(clock.elapsed(), 2900);
    EXPECT_EQ(peer.take(), SgHostMessage::GeometryRead);
    EXPECT_TRUE(sgApp->getMessageSink()->logLines().contains(
        QStringLiteral("Could not read the geometry returned by Facetor.")));
    EXPECT_EQ(scene()->findNodeByLabel(QStringLiteral("Gizmo")), nullptr);
    data->unlock();
    data->detach();
    data->remove(SgSharedMemory::kRemoveUnlocked);
}

TEST_F(BridgeAction, ReturnedPropsGetUniqueCentredLabelsAndFiguresTheirNamesakesDiffuse) {
    scene()->addNode(sgTestProp(QStringLiteral("Body")));
    scene()->addNode(sgTestProp(QStringLiteral("Body (1)")));
    TestBridge bridge;
    for (const char *name : {"Body", "Body", "Lamp"})
        bridge.createPropFromShape(sgTestShape(QString::fromLatin1(name),
                                               sgTestPolygon({{-4, 0, 0}, {4, 2, 0}, {0, 6, 8}})));
    EXPECT_EQ(labels(scene()->getNodes()),
              (QStringList{"Body", "Body (1)", "Body (2)", "Body (3)", "Lamp"}));
    EXPECT_EQ(scene()->getNode(2)->getName(), QStringLiteral("Body (2)"));
    EXPECT_EQ(scene()->getNode(2)->getOrigin(), SgVec3(0, 3, 4));

    // A returned figure's materials reach only the namesakes on its bones, and of those only
    // the diffuse colour and map.
    SgSkeleton *figure = sgTestFigure(QStringLiteral("Figure"), 2, 1);
    scene()->addNode(figure);
    auto *returned = sgTestShape(QStringLiteral("Figure"), sgTestPolygon({{0, 0, 0}}));
    auto *skin = static_cast<SgDefaultMaterial *>(returned->getMaterial(0));
    skin->setDiffuseColor(QColor(255, 128, 0));
    skin->setSpecularColor(QColor(1, 2, 3));
    SgTexture texture(QStringLiteral("skin.png"));
    skin->setColorMap(&texture);
    returned->addMaterial(new SgDefaultMaterial(QStringLiteral("Nails")));
    bridge.copyMaterials(returned, figure);
    bridge.copyMaterials(nullptr, figure);
    bridge.copyMaterials(returned, nullptr);
    for (SgBone *bone : figure->getAllBones()) {
        SgShape *shape = bone->getObject()->getCurrentShape();
        auto *target = static_cast<SgDefaultMaterial *>(shape->findMaterial("Skin"));
        EXPECT_EQ(target->getDiffuseColor(), QColor(255, 128, 0));
        EXPECT_EQ(target->getColorMap(), &texture);
        EXPECT_NE(target->getSpecularColor(), QColor(1, 2, 3));
        auto *cloth = static_cast<SgDefaultMaterial *>(shape->findMaterial("Cloth"));
        EXPECT_EQ(cloth->getDiffuseColor(), QColor(255, 255, 255));
        EXPECT_EQ(shape->findMaterial("Nails"), nullptr);
    }
    delete returned;
}
