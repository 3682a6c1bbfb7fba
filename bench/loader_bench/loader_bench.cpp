// Target Importer benchmark. A figure of 10 bones with 10,000 vertices each (100,000 in all)
// and 20 OBJ targets of the whole figure, one face group per bone, written at start-up into a
// temporary folder. Figures are CPU times, with ratios against baselines of the same run:
//   run            the dialog's file-mode run: accept() on a "Target Importer" dialog listing the
//                  20 files, nodes "All Group / Bone Matches in Figure" with the figure selected;
//                  reported per target
//   read           the host's geometry importer reading the same 20 files, as each source's
//                  loader does at the start of its load; read / run is the share spent reading
//   tinyobj        tinyobjloader parsing the same 20 files (triangulate off)

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphloaderdlg.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"

#include <QApplication>
#include <QComboBox>
#include <QFile>
#include <QTemporaryDir>
#include <QTextBrowser>

#include "bench/support/sgbenchreport.h"

#include <benchmark/benchmark.h>
#include <tiny_obj_loader.h>

#include <cstdio>
#include <string>
#include <vector>

namespace {

constexpr int kBones = 10;
constexpr int kSide = 100; // each bone: a 100 x 100 grid of vertices
constexpr int kBoneVertices = kSide * kSide;
constexpr int kTargets = 20;

SgVec3 gridPoint(int bone, int r, int c, float lift) {
    return SgVec3(float(c) * 0.1f + float(bone) * 12.0f, float(r) * 0.1f,
                  lift * float((r * 7 + c * 3) % 11) * 0.01f);
}

template <typename Quad> void forEachQuad(Quad quad) {
    for (int r = 0; r + 1 < kSide; ++r)
        for (int c = 0; c + 1 < kSide; ++c) {
            const int a = r * kSide + c;
            quad(a, a + 1, a + 1 + kSide, a + kSide);
        }
}

SgObject *boneObject(int bone, const QString &name) {
    auto *mesh = new SgPolyMesh;
    SgVec3 *v = mesh->setVertexArray(kBoneVertices);
    for (int r = 0; r < kSide; ++r)
        for (int c = 0; c < kSide; ++c)
            v[r * kSide + c] = gridPoint(bone, r, c, 0.0f);
    forEachQuad([mesh](int a, int b, int c, int d) {
        mesh->startFace();
        for (int i : {a, b, c, d})
            mesh->addFaceEdge(i);
        mesh->finishFace();
    });
    auto *shape = new SgPolyShape(name);
    shape->setGeometry(mesh);
    auto *object = new SgObject(name);
    object->addShape(shape);
    return object;
}

// The whole figure with every vertex lifted by a pattern scaled with `lift`, one group per bone.
void writeTarget(const QString &path, float lift) {
    std::string text;
    text.reserve(size_t(kBones) * kBoneVertices * 56);
    char line[96];
    for (int b = 0; b < kBones; ++b)
        for (int r = 0; r < kSide; ++r)
            for (int c = 0; c < kSide; ++c) {
                const SgVec3 p = gridPoint(b, r, c, lift);
                const int n = std::snprintf(line, sizeof line, "v %.6f %.6f %.6f\n", double(p.x),
                                            double(p.y), double(p.z));
                text.append(line, size_t(n));
            }
    for (int b = 0; b < kBones; ++b) {
        text += "g bone" + std::to_string(b) + "\n";
        const int base = b * kBoneVertices + 1;
        forEachQuad([&](int a, int bb, int c, int d) {
            const int n = std::snprintf(line, sizeof line, "f %d %d %d %d\n", base + a, base + bb,
                                        base + c, base + d);
            text.append(line, size_t(n));
        });
    }
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write(text.data(), qint64(text.size())) < 0)
        std::fprintf(stderr, "cannot write %s\n", qPrintable(path));
}

struct Fixture {
    QTemporaryDir dir;
    QStringList paths;
    SgSkeleton *figure = nullptr;

    Fixture() {
        SgAppSettings::setFileName(dir.filePath("settings.ini"));
        for (int i = 0; i < kTargets; ++i) {
            paths.append(dir.filePath(QStringLiteral("target%1.obj").arg(i, 2, 10, QChar('0'))));
            writeTarget(paths.last(), 1.0f + float(i) * 0.05f);
        }
        figure = new SgSkeleton(QStringLiteral("Figure"));
        SgBone *parent = nullptr;
        for (int b = 0; b < kBones; ++b) {
            auto *bone = new SgBone(QStringLiteral("bone%1").arg(b));
            bone->setObject(boneObject(b, bone->getName()));
            figure->addBone(bone, parent);
            parent = bone;
        }
        sgApp->getScene()->addNode(figure);
        sgApp->getScene()->selectNode(figure);
    }
};

Fixture *fixture = nullptr;

// One file-mode run of the dialog, as its first "Ok" does it. Each source replaces the morph
// that the previous iteration made ("Deltas and links"), so no name question comes up.
void BM_DialogRun(benchmark::State &state) {
    for (auto _ : state) {
        state.PauseTiming();
        auto *dialog = new SgMorphLoaderDlg(nullptr, true, nullptr, fixture->figure);
        dialog->findChild<QComboBox *>(QStringLiteral("MorphLoaderNodes"))->setCurrentIndex(0);
        SgMorphSourceList *list = dialog->sourceList();
        list->addFiles(fixture->paths);
        for (int i = 0; i < list->topLevelItemCount(); ++i)
            static_cast<SgMorphFileItem *>(list->topLevelItem(i))
                ->loader()
                .setOverride(SgMorphLoader::DeltasAndLinks);
        state.ResumeTiming();
        dialog->accept();
        state.PauseTiming();
        const QString log =
            dialog->findChild<QTextBrowser *>(QStringLiteral("MorphLoaderLog"))->toPlainText();
        if (log.contains(QLatin1String("did not match")) || log.contains(QLatin1String("rror")))
            state.SkipWithError("a target was not made");
        delete dialog;
        state.ResumeTiming();
    }
    state.counters["targets"] = kTargets;
}

void BM_HostRead(benchmark::State &state) {
    SgFileIOSettings options;
    for (auto _ : state) {
        for (const QString &path : fixture->paths) {
            SgMorphLoader loader;
            loader.setFilename(path);
            SgVertexMesh *mesh = loader.loadGeometry(options);
            if (!mesh || mesh->getVertexCount() != kBones * kBoneVertices)
                state.SkipWithError("the host importer failed");
            if (mesh)
                mesh->unref();
        }
    }
}

void BM_TinyObjRead(benchmark::State &state) {
    std::vector<std::string> paths;
    for (const QString &path : fixture->paths)
        paths.push_back(path.toStdString());
    for (auto _ : state) {
        for (const std::string &path : paths) {
            tinyobj::attrib_t attrib;
            std::vector<tinyobj::shape_t> shapes;
            std::vector<tinyobj::material_t> materials;
            std::string warn, err;
            const bool ok = tinyobj::LoadObj(&attrib, &shapes, &materials, &warn, &err,
                                             path.c_str(), nullptr, false);
            if (!ok || attrib.vertices.size() != size_t(3 * kBones * kBoneVertices))
                state.SkipWithError("tinyobjloader failed");
            benchmark::DoNotOptimize(attrib.vertices.data());
        }
    }
}

BENCHMARK(BM_DialogRun)->Unit(benchmark::kMillisecond)->Repetitions(5);
BENCHMARK(BM_HostRead)->Unit(benchmark::kMillisecond)->Repetitions(5);
BENCHMARK(BM_TinyObjRead)->Unit(benchmark::kMillisecond)->Repetitions(5);

} // namespace

int main(int argc, char **argv) {
    // The dialog is built but never shown: no display is needed.
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication qt(argc, argv);
    SgApp app;
    sgBenchInitialize(argc, argv);
    Fixture data;
    fixture = &data;
    SgBenchReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    const double run = reporter.median("BM_DialogRun");
    const double read = reporter.median("BM_HostRead");
    const double tiny = reporter.median("BM_TinyObjRead");
    if (run > 0 && read > 0 && tiny > 0) {
        std::printf("\nSame run, medians of 5, %d targets of %d vertices onto a %d-bone figure:\n",
                    kTargets, kBones * kBoneVertices, kBones);
        std::printf("  time per target (dialog run)        %8.2f ms\n", 1e3 * run / kTargets);
        std::printf("  reading per target (host importer)  %8.2f ms\n", 1e3 * read / kTargets);
        std::printf("  reading per target (tinyobjloader)  %8.2f ms\n", 1e3 * tiny / kTargets);
        std::printf("  share of the run spent reading       %7.1f %%\n", 100.0 * read / run);
        std::printf("  host read / tinyobjloader read       %8.3f\n", read / tiny);
        std::printf("  whole run / tinyobjloader read       %8.3f\n", run / tiny);
    }
    sgApp->getScene()->clear();
    benchmark::Shutdown();
    return 0;
}
