// The modeler killed at random moments of an exchange (including while it holds the data
// segment's lock): the host stays responsive, the scene is either untouched or holds the whole
// import, the bridge keeps polling, a new modeler links and works, and nothing of the two keys
// stays in /dev/shm once both sides are gone.

#include "bridge/sgfacbridge.h"
#include "bridgetestsupport.h"

#include "exchange/shm/sgcontrolrecord.h"
#include "exchange/shm/sgsharedmemory.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"

#include <QDir>
#include <QElapsedTimer>
#include <QRandomGenerator>
#include <QTemporaryDir>
#include <QTimer>

#include <cerrno>
#include <csignal>
#include <cstdio>

#include <gtest/gtest.h>

namespace {

class TestBridge : public SgFacBridge {
public:
    using SgFacBridge::executeAction;
};

QStringList leftovers() {
    QStringList found;
    for (const char *key : {kSgControlSegmentKey, kSgDataSegmentKey}) {
        const QString prefix = QString::fromStdString(SgSharedMemory(key).dataName());
        found += QDir(QStringLiteral("/dev/shm")).entryList({prefix + "*"}, QDir::Files);
    }
    return found;
}

bool processGone(qint64 pid) {
    return pid <= 0 || (::kill(pid_t(pid), 0) != 0 && errno == ESRCH);
}

// A prop big enough that its records take a noticeable time to write and read.
SgNode *makeBigProp(int rows) {
    auto *mesh = new SgPolyMesh;
    mesh->beginEdit(true);
    SgVec3 *v = mesh->setVertexArray(rows * rows);
    for (int y = 0; y < rows; ++y)
        for (int x = 0; x < rows; ++x)
            *v++ = SgVec3(float(x), float(y), 0.0f);
    for (int y = 0; y + 1 < rows; ++y)
        for (int x = 0; x + 1 < rows; ++x) {
            mesh->startFace();
            for (int c :
                 {y * rows + x, y * rows + x + 1, (y + 1) * rows + x + 1, (y + 1) * rows + x})
                mesh->addFaceEdge(c);
            mesh->finishFace();
        }
    mesh->finishEdit();
    auto *object = new SgObject(QStringLiteral("Sheet"));
    object->addShape(bridgetest::makeShape(QStringLiteral("Sheet"), mesh));
    auto *node = new SgNode(QStringLiteral("Sheet"));
    node->setObject(object);
    return node;
}

// Measures the longest time the event loop did not get round to a 2 ms timer: the longest
// step that blocked the host.
class StallMeter : public QObject {
public:
    StallMeter() {
        m_clock.start();
        m_timer.setInterval(2);
        QObject::connect(&m_timer, &QTimer::timeout, [this] {
            const qint64 now = m_clock.nsecsElapsed();
            m_worst = std::max(m_worst, now - m_last);
            m_last = now;
        });
        m_timer.start();
        m_last = m_clock.nsecsElapsed();
    }
    double worstMs() const { return double(m_worst) / 1e6; }

private:
    QTimer m_timer;
    QElapsedTimer m_clock;
    qint64 m_last = 0;
    qint64 m_worst = 0;
};

} // namespace

TEST(KillModeler, HostSurvivesAModelerKilledAtRandomMoments) {
    SgScene *scene = sgApp->getScene();
    scene->clear();
    SgNode *sheet = makeBigProp(160); // 25,600 vertices
    scene->addNode(sheet);
    scene->selectNode(sheet);
    QTemporaryDir dir;
    qputenv("FACETOR_INSTALL_PATH", FACETOR_BIN_DIR);
    qputenv("FACETOR_WORKSPACE", dir.filePath("workspace").toUtf8());
    qputenv("FACETOR_LOG", dir.filePath("facetor.log").toUtf8());
    qputenv("FACETOR_EXPECT", "1");
    qputenv("FACETOR_QUIT_WHEN_DONE", "1");
    qputenv("FACETOR_EDIT", "move=0,0,0.1");

    // One undisturbed trip sets the length of an exchange, over which the kills are spread.
    QElapsedTimer clock;
    clock.start();
    {
        TestBridge bridge;
        bridge.executeAction();
        ASSERT_TRUE(bridgetest::waitUntil([&] { return !bridge.isActive(); }, 20000));
    }
    const qint64 tripMs = std::max<qint64>(clock.elapsed(), 100);
    ASSERT_NE(sheet->getObject()->findModifier(QStringLiteral("MyMorph")), nullptr);
    sheet->getObject()->removeModifier(sheet->getObject()->findModifier(QStringLiteral("MyMorph")));

    StallMeter meter;
    QRandomGenerator random(20261206);
    const int kills = 20;
    int completed = 0;
    for (int i = 0; i < kills; ++i) {
        TestBridge bridge;
        bridge.executeAction();
        ASSERT_TRUE(bridge.isActive());
        const qint64 pid = bridge.modelerProcessId();
        const int at = int(random.bounded(int(tripMs)));
        bridgetest::waitUntil([] { return false; }, at);
        ::kill(pid_t(pid), SIGKILL);
        ASSERT_TRUE(bridgetest::waitUntil([&] { return processGone(pid); }, 5000));
        // The bridge goes on polling a dead modeler without blocking.
        bridgetest::waitUntil([] { return false; }, 150);
        // Either nothing happened to the scene, or the whole import did.
        EXPECT_EQ(scene->getNodeCount(), 1) << "kill " << i << " at " << at << " ms";
        SgObject *object = sheet->getObject();
        if (auto *morph =
                dynamic_cast<SgMorph *>(object->findModifier(QStringLiteral("MyMorph")))) {
            EXPECT_EQ(morph->getDeltas()->getNumEntries(), 160 * 160);
            object->removeModifier(morph);
            ++completed;
        }
        EXPECT_EQ(object->getModifierCount(), 0);
    }
    EXPECT_TRUE(bridgetest::waitUntil([] { return leftovers().isEmpty(); }, 2000))
        << leftovers().join(' ').toStdString();

    // A new modeler links and works.
    {
        TestBridge bridge;
        bridge.executeAction();
        ASSERT_TRUE(bridgetest::waitUntil([&] { return !bridge.isActive(); }, 20000));
    }
    EXPECT_NE(sheet->getObject()->findModifier(QStringLiteral("MyMorph")), nullptr);
    EXPECT_TRUE(bridgetest::waitUntil([] { return leftovers().isEmpty(); }, 2000));
    std::printf("kill test: %d kills over a %lld ms exchange, %d imports completed before the "
                "kill, worst host stall %.1f ms\n",
                kills, static_cast<long long>(tripMs), completed, meter.worstMs());
    // The import itself (reading and morphing 25,600 vertices) is the longest step allowed.
    EXPECT_LT(meter.worstMs(), 500.0);
    for (const char *name : {"FACETOR_INSTALL_PATH", "FACETOR_WORKSPACE", "FACETOR_LOG",
                             "FACETOR_EXPECT", "FACETOR_QUIT_WHEN_DONE", "FACETOR_EDIT"})
        qunsetenv(name);
    scene->clear();
}
