// Wall time to send N nodes through the reference modeler, from the trigger to the modeler's
// acknowledgement of the last node, against the floor of one node per 50 ms poll.

#include "bridge/sgfacbridge.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/scene/sgnode.h"
#include "sgcore/scene/sgscene.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QTemporaryDir>

#include "bench/support/sgbenchreport.h"

#include <benchmark/benchmark.h>

#include <cstdio>

namespace {

constexpr int kNodes = 20;
constexpr double kPollMs = 50.0;

class BenchBridge : public SgFacBridge {
public:
    using SgFacBridge::executeAction;
};

// A prop with a small grid of quads, so each record carries real geometry.
SgNode *makeProp(int index) {
    constexpr int side = 16;
    auto *mesh = new SgPolyMesh;
    mesh->beginEdit(true);
    SgVec3 *v = mesh->setVertexArray(side * side);
    for (int y = 0; y < side; ++y)
        for (int x = 0; x < side; ++x)
            *v++ = SgVec3(float(x + index * side), float(y), 0);
    mesh->activateMaterial(0);
    for (int y = 0; y + 1 < side; ++y)
        for (int x = 0; x + 1 < side; ++x) {
            mesh->startFace();
            for (int corner :
                 {y * side + x, y * side + x + 1, (y + 1) * side + x + 1, (y + 1) * side + x})
                mesh->addFaceEdge(corner);
            mesh->finishFace();
        }
    mesh->finishEdit();
    const QString name = QStringLiteral("Prop %1").arg(index);
    auto *shape = new SgPolyShape(name);
    shape->setPolyMesh(mesh);
    shape->addMaterial(new SgDefaultMaterial(QStringLiteral("Paint")));
    auto *object = new SgObject(name);
    object->addShape(shape);
    auto *node = new SgNode(name);
    node->setObject(object);
    return node;
}

void sendThroughModeler(benchmark::State &state) {
    QTemporaryDir dir;
    qputenv("FACETOR_INSTALL_PATH", FACETOR_BIN_DIR);
    qputenv("FACETOR_WORKSPACE", dir.filePath("workspace").toUtf8());
    qputenv("FACETOR_LOG", dir.filePath("facetor.log").toUtf8());
    qputenv("FACETOR_EXPECT", QByteArray::number(kNodes));
    qputenv("FACETOR_QUIT_WHEN_DONE", "1");
    SgScene *scene = sgApp->getScene();
    double totalMs = 0;
    for (auto _ : state) {
        state.PauseTiming();
        scene->clear();
        for (int i = 0; i < kNodes; ++i) {
            scene->addNode(makeProp(i));
            scene->selectNode(scene->getNode(i), true);
        }
        BenchBridge bridge;
        state.ResumeTiming();
        QElapsedTimer timer;
        timer.start();
        bridge.executeAction();
        // Done when the last node has been acknowledged: nothing left to send, nothing busy.
        while (bridge.isActive() && (bridge.sendList().count() > 0 || bridge.isExchangeBusy()) &&
               timer.elapsed() < 60000)
            QApplication::processEvents(QEventLoop::AllEvents, 2);
        const double ms = double(timer.nsecsElapsed()) / 1e6;
        state.SetIterationTime(ms / 1000.0);
        totalMs += ms;
        state.PauseTiming();
        // Let the modeler say goodbye before the next round uses the same keys.
        QElapsedTimer goodbye;
        goodbye.start();
        while (bridge.isActive() && goodbye.elapsed() < 5000)
            QApplication::processEvents(QEventLoop::AllEvents, 5);
        state.ResumeTiming();
    }
    const double meanMs = totalMs / double(state.iterations());
    state.counters["nodes"] = kNodes;
    state.counters["polls"] = meanMs / kPollMs;
    state.counters["floor_polls"] = kNodes;
    state.counters["ratio_to_floor"] = meanMs / (kNodes * kPollMs);
    state.counters["target_polls"] = kNodes + 3;
    for (const char *name : {"FACETOR_INSTALL_PATH", "FACETOR_WORKSPACE", "FACETOR_LOG",
                             "FACETOR_EXPECT", "FACETOR_QUIT_WHEN_DONE"})
        qunsetenv(name);
}

} // namespace

BENCHMARK(sendThroughModeler)
    ->UseManualTime()
    ->Iterations(1)
    ->Repetitions(5)
    ->Unit(benchmark::kMillisecond);

int main(int argc, char **argv) {
    qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    QTemporaryDir settings;
    SgAppSettings::setFileName(settings.filePath(QStringLiteral("scenara.ini")));
    SgApp host;
    sgBenchInitialize(argc, argv);
    SgBenchReporter reporter(SgBenchReporter::RealTime);
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    std::printf("\nMedian of the repetitions against the floor of one node per poll:\n");
    sgPrintRatio("send 20 nodes / 20 polls of 50 ms", reporter.median("sendThroughModeler"),
                 kNodes * kPollMs / 1000.0, double(kNodes + 3) / kNodes);
    return 0;
}
