// The reference modeler watching its workspace while an editor saves: every way of saving gives
// the host exactly one return of the complete file; a file still incomplete when it settles is
// reported and not sent. The modeler is set up through its settings file, which its environment
// overrides. A return that the host asks the modeler to release (code 4) comes again instead of
// being lost.

#include "tests/e2e/e2etestbridge.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestprocess.h"
#include "tests/support/sgtestscene.h"
#include "tests/support/sgtestsegment.h"

#include "exchange/sgexchangereader.h"
#include "exchange/shm/sgcontrolrecord.h"
#include "exchange/shm/sgsharedmemory.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"

#include <QDir>
#include <QFile>
#include <QProcess>
#include <QTemporaryDir>
#include <QThread>

#include <gtest/gtest.h>

#include <cstring>
#include <memory>

namespace {

constexpr int kSettleMs = 300;

// The text with the first vertex line moved by `dx` along x (the modeler's units).
QByteArray withFirstVertexMoved(const QByteArray &obj, float dx) {
    const qsizetype start = obj.indexOf("\nv ") + 1;
    const qsizetype end = obj.indexOf('\n', start);
    QList<QByteArray> parts = obj.mid(start, end - start).split(' ');
    parts[1] = QByteArray::number(parts[1].toDouble() + dx, 'g', 9);
    return obj.left(start) + parts.join(' ') + obj.mid(end);
}

int morphsMade() {
    return int(sgApp->getMessageSink()->logLines().filter(QStringLiteral("Created morph")).size());
}

// Everything the modeler needs, in its settings file under a private configuration folder.
// The environment names that folder, and a workspace of its own, which wins over the file's.
class SettingsRun : public SgTestModeler {
public:
    SettingsRun() : SgTestModeler(FACETOR_BIN_DIR) {
        sgTestWriteFile(path(QStringLiteral("config/Facetor/Facetor.ini")),
                        QStringLiteral("[General]\nworkspace=%1\nwatch=true\nsettleTime=%2\n"
                                       "log=%3\nhostTimeout=10000\n")
                            .arg(fileWorkspace())
                            .arg(kSettleMs)
                            .arg(newLog())
                            .toUtf8());
        set("FACETOR_LOG", {}); // the file names the log
        set("XDG_CONFIG_HOME", path(QStringLiteral("config")).toUtf8());
    }
    QString fileWorkspace() const { return path(QStringLiteral("file-workspace")); }
};

class ModelerSaves : public SgTestCleanScene {};

} // namespace

TEST_F(ModelerSaves, EverySaveStyleGivesExactlyOneCompleteReturn) {
    SgScene *scene = sgApp->getScene();
    // A prop whose OBJ copy is long enough to be written in several chunks.
    scene->addNode(sgTestNode(QStringLiteral("Grid"), sgTestRowMesh(400)));
    scene->selectNode(scene->findNodeByLabel(QStringLiteral("Grid")));
    SettingsRun run;
    E2eBridge bridge;
    bridge.executeAction();
    const QString obj = QDir(run.workspace()).filePath(QStringLiteral("Grid.obj"));
    ASSERT_TRUE(sgTestWaitUntil([&] { return QFile::exists(obj); }, 20000))
        << run.log().toStdString();
    ASSERT_TRUE(sgTestWaitUntil(
        [&] { return run.log().contains(QStringLiteral("selection arrived")); }, 10000));
    const QByteArray original = sgTestReadFile(obj);
    ASSERT_GT(original.size(), 6000);
    EXPECT_FALSE(QFile::exists(run.fileWorkspace()));

    // Each style moves the first vertex one step further; the host makes one morph per return,
    // whose one delta is that step (ten host units per modeler unit).
    auto expectOneReturn = [&](const char *style, float step, auto save) {
        const int before = morphsMade();
        save(withFirstVertexMoved(original, step));
        EXPECT_TRUE(sgTestWaitUntil([&] { return morphsMade() > before; }, 10000))
            << style << "\n"
            << run.log().toStdString();
        sgTestIdle(3 * kSettleMs); // a second would come now
        EXPECT_EQ(morphsMade(), before + 1) << style << "\n" << run.log().toStdString();
        SgObject *object = scene->findNodeByLabel(QStringLiteral("Grid"))->getObject();
        auto *morph = dynamic_cast<SgMorph *>(object->findModifier(QStringLiteral("MyMorph")));
        ASSERT_NE(morph, nullptr) << style;
        ASSERT_EQ(morph->getDeltas()->getNumEntries(), 1) << style;
        EXPECT_EQ(morph->getDeltas()->getVertex(0), 0) << style;
        EXPECT_NEAR(morph->getDeltas()->getDelta(0).x, 10 * step, 1e-3f) << style;
        object->removeModifier(morph); // the next return makes "MyMorph" anew
    };
    const auto writeInPlace = [&](const QByteArray &text) { sgTestWriteFile(obj, text); };
    expectOneReturn("in place, one write", 1.0f, writeInPlace);
    expectOneReturn("in place, chunks with pauses", 2.0f, [&](const QByteArray &text) {
        QFile file(obj);
        ASSERT_TRUE(file.open(QIODevice::WriteOnly | QIODevice::Truncate));
        // Cut inside the vertex lines, so that a part caught on a slow machine has no face and
        // never reads whole; the last chunk brings every face.
        const qsizetype faces = text.indexOf("\nf ");
        const qsizetype cuts[] = {0, faces / 3 + 7, 2 * faces / 3 + 7, text.size()};
        for (size_t c = 0; c + 1 < std::size(cuts); ++c) {
            file.write(text.mid(cuts[c], cuts[c + 1] - cuts[c]));
            file.flush();
            sgTestIdle(kSettleMs / 3);
        }
    });
    expectOneReturn("temporary file renamed over", 3.0f, [&](const QByteArray &text) {
        const QString temporary = obj + QStringLiteral(".part");
        QFile file(temporary);
        ASSERT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(text);
        file.close();
        ASSERT_EQ(std::rename(qPrintable(temporary), qPrintable(obj)), 0);
    });

    // A file that stops changing half written is reported, not sent; finished, it is sent once.
    const int before = morphsMade();
    const QByteArray text = withFirstVertexMoved(original, 4.0f);
    writeInPlace(text.left(text.indexOf("\nf ") + 1)); // every vertex, no face yet
    EXPECT_TRUE(
        sgTestWaitUntil([&] { return run.log().contains(QStringLiteral("not returned")); }, 5000))
        << run.log().toStdString();
    EXPECT_EQ(morphsMade(), before);
    expectOneReturn("finished after a stall", 4.0f, writeInPlace);
    bridge.closing();
    ASSERT_TRUE(bridge.settles(10000));
    EXPECT_TRUE(sgTestWaitUntil(
        [&] { return run.log().contains(QStringLiteral("quit: the host closed the link")); }, 5000))
        << run.log().toStdString();
}

// The test steps the host's side by hand with the bridge's own message calls: it takes the
// modeler's return announcement (code 1) and answers with code 4, as a host that needs the data
// segment for a node of its own does.
TEST(ModelerRelease, AReturnReleasedInFlightComesAgain) {
    QTemporaryDir dir;
    const QString returned = sgTestWriteFile(dir.filePath(QStringLiteral("shape.obj")),
                                             "o Shape\nv 0 0 0\nv 1 0 0\nv 0 1 0\nf 1 2 3\n");

    SgTestSegment control(kSgControlSegmentKey);
    ASSERT_TRUE(control.create(sizeof(SgControlRecord)));
    ASSERT_TRUE(control.attach(SgSharedMemory::kReadWrite));
    const SgControlRecord fresh = SgControlRecord::fresh();
    std::memcpy(control.data(), &fresh, sizeof fresh);
    // Linked as a host that the modeler started, with the poll left off.
    sgApp->setCommandArguments({QStringLiteral("-facbridge")});
    E2eBridge host;
    sgApp->setCommandArguments({});
    host.pollTimer()->stop();
    const auto post = [&host](SgHostMessage code) {
        while (!host.postMessage(code, 0))
            QThread::msleep(5);
    };

    QProcess modeler;
    modeler.start(QStringLiteral(FACETOR_BIN_DIR "/Facetor"),
                  {QStringLiteral("-sgl"), QStringLiteral("--return"), returned,
                   QStringLiteral("--workspace"), dir.filePath(QStringLiteral("ws")),
                   QStringLiteral("--log"), dir.filePath(QStringLiteral("log"))});
    ASSERT_TRUE(modeler.waitForStarted());

    // Idle notices until the return is announced (the selection is empty).
    int announcements = 0;
    int vertices = 0;
    QElapsedTimer clock;
    clock.start();
    int value = 0;
    while (vertices == 0 && clock.elapsed() < 15000) {
        if (host.readMessage(value) == SgModelerMessage::GeometryWritten) {
            if (++announcements == 1) {
                // The first announcement is answered by asking the modeler to let go.
                post(SgHostMessage::SegmentBusy);
                continue;
            }
            SgTestSegment data(kSgDataSegmentKey);
            ASSERT_TRUE(data.attach(SgSharedMemory::kReadWrite));
            ASSERT_TRUE(data.lock()) << kSgTestStuckLock;
            QString trailer;
            std::unique_ptr<SgPolyShape> read(
                SgExchangeReader(data.data(), size_t(data.size())).readShape(trailer));
            data.unlock();
            data.detach();
            ASSERT_NE(read, nullptr);
            vertices = read->getGeometry()->getVertexCount();
            post(SgHostMessage::GeometryRead);
        }
        host.postMessage(SgHostMessage::Idle, 0);
        QThread::msleep(20);
    }
    EXPECT_EQ(announcements, 2)
        << sgTestReadFile(dir.filePath(QStringLiteral("log"))).toStdString();
    EXPECT_EQ(vertices, 3);
    // A signal ends it too, and its log says which.
    modeler.terminate();
    EXPECT_TRUE(modeler.waitForFinished(5000));
    EXPECT_TRUE(
        sgTestReadFile(dir.filePath(QStringLiteral("log"))).contains("quit: signal SIGTERM"));
    control.detach();
    control.remove(SgSharedMemory::kRemoveUnlocked);
}
