// Morph engine benchmark. Every figure is a ratio of median CPU times (steadier than wall time on a
// shared machine) against a baseline measured in the same run:
//   load/tinyobj      loadMorphForNode of a 1M-vertex OBJ target onto a 1M-vertex node, end to
//                     end, against tinyobjloader only parsing the same file (triangulate off);
//                     target at most 0.5
//   deltas/loop       computeDeltas on 1M vertices against a plain loop that subtracts the two
//                     arrays (all vertices moved, and a tenth of them); target at most 1.5
//   groups 100/10     matching every bone's face group of a figure with 100 bones against one
//                     with 10 bones over the same facets; linear in the facets gives about 1

#include "sgcore/app/sgapp.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sharedsource/engine/sgfacegroupcache.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloadlog.h"

#include <QApplication>
#include <QFile>
#include <QTemporaryDir>

#include "bench/support/sgbenchreport.h"

#include <benchmark/benchmark.h>
#include <tiny_obj_loader.h>

#include <cstdio>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace {

constexpr int kSide = 1000; // a 1000 x 1000 grid: one million vertices, ~one million quads

SgPolyMesh *gridMesh(float lift) {
    auto *mesh = new SgPolyMesh;
    SgVec3 *v = mesh->setVertexArray(kSide * kSide);
    for (int r = 0; r < kSide; ++r)
        for (int c = 0; c < kSide; ++c)
            v[r * kSide + c] = SgVec3(float(c) * 0.01f, float(r) * 0.01f,
                                      lift * float((r * 7 + c * 3) % 11) * 0.01f);
    return mesh;
}

struct Fixture {
    QTemporaryDir dir;
    QString objPath;
    SgNode *node = nullptr;
    std::unique_ptr<SgPolyMesh> base;
    std::unique_ptr<SgPolyMesh> allMoved;
    std::unique_ptr<SgPolyMesh> tenthMoved;

    Fixture() {
        base.reset(gridMesh(0.0f));
        allMoved.reset(gridMesh(1.0f));
        for (SgVec3 &p : allMoved->vertices())
            p.x += 0.01f;
        tenthMoved.reset(gridMesh(0.0f));
        for (int i = 0; i < kSide * kSide / 10; ++i)
            tenthMoved->vertices()[size_t(i)].z += 0.05f;

        // The target file: every vertex moved, and the grid's quads.
        objPath = dir.filePath("target.obj");
        QFile file(objPath);
        file.open(QIODevice::WriteOnly);
        std::string text;
        text.reserve(60u * kSide * kSide);
        char line[96];
        for (const SgVec3 &p : allMoved->vertices()) {
            const int n = std::snprintf(line, sizeof line, "v %.6f %.6f %.6f\n", double(p.x),
                                        double(p.y), double(p.z));
            text.append(line, size_t(n));
        }
        for (int r = 0; r + 1 < kSide; ++r) {
            for (int c = 0; c + 1 < kSide; ++c) {
                const int a = r * kSide + c + 1;
                const int n = std::snprintf(line, sizeof line, "f %d %d %d %d\n", a, a + 1,
                                            a + 1 + kSide, a + kSide);
                text.append(line, size_t(n));
            }
        }
        file.write(text.data(), qint64(text.size()));
        file.close();

        node = new SgNode("Grid");
        auto *object = new SgObject("Grid");
        auto *shape = new SgPolyShape("Grid");
        shape->setGeometry(gridMesh(0.0f));
        object->addShape(shape);
        node->setObject(object);
        sgApp->getScene()->addNode(node);
    }
};

Fixture *fixture = nullptr;

void BM_LoadMorphForNode(benchmark::State &state) {
    SgMorphLoader loader;
    loader.setFilename(fixture->objPath);
    loader.setMorphName("Lift");
    loader.setCreateControl(false);
    loader.setOverride(SgMorphLoader::DeltasAndLinks);
    SgFileIOSettings options;
    for (auto _ : state) {
        SgMorphLoadLog log;
        loader.loadMorphForNode(options, fixture->node, log);
        if (log.hasProblems())
            state.SkipWithError("the morph was not made");
    }
}

void BM_TinyObjParse(benchmark::State &state) {
    const std::string path = fixture->objPath.toStdString();
    for (auto _ : state) {
        tinyobj::attrib_t attrib;
        std::vector<tinyobj::shape_t> shapes;
        std::vector<tinyobj::material_t> materials;
        std::string warn, err;
        const bool ok = tinyobj::LoadObj(&attrib, &shapes, &materials, &warn, &err, path.c_str(),
                                         nullptr, false);
        if (!ok || attrib.vertices.size() != size_t(3 * kSide * kSide))
            state.SkipWithError("tinyobjloader failed");
        benchmark::DoNotOptimize(attrib.vertices.data());
    }
}

void BM_ComputeDeltas(benchmark::State &state) {
    const SgPolyMesh &target = state.range(0) ? *fixture->allMoved : *fixture->tenthMoved;
    for (auto _ : state) {
        std::unique_ptr<SgMorphDeltas> deltas(SgMorphLoader::computeDeltas(*fixture->base, target));
        benchmark::DoNotOptimize(deltas.get());
    }
}

void BM_PlainSubtraction(benchmark::State &state) {
    const SgPolyMesh &target = state.range(0) ? *fixture->allMoved : *fixture->tenthMoved;
    const size_t n = size_t(target.getVertexCount());
    for (auto _ : state) {
        std::vector<SgVec3> out(n);
        const SgVec3 *a = target.getVertices();
        const SgVec3 *b = fixture->base->getVertices();
        for (size_t i = 0; i < n; ++i)
            out[i] = a[i] - b[i];
        benchmark::DoNotOptimize(out.data());
        benchmark::ClobberMemory();
    }
}

// A welded-style mesh of one million quads split evenly into `bones` face groups, and the bones.
struct GroupFixture {
    std::unique_ptr<SgPolyMesh> mesh;
    std::vector<std::unique_ptr<SgBone>> bones;
    explicit GroupFixture(int count) {
        mesh.reset(gridMesh(0.0f));
        for (int b = 0; b < count; ++b) {
            bones.push_back(std::make_unique<SgBone>(QStringLiteral("bone%1").arg(b)));
            mesh->addFaceGroup(bones.back()->getName());
        }
        const int quads = (kSide - 1) * (kSide - 1);
        int done = 0;
        for (int r = 0; r + 1 < kSide; ++r) {
            for (int c = 0; c + 1 < kSide; ++c, ++done) {
                mesh->setActiveFaceGroup(int(int64_t(done) * count / quads));
                const int a = r * kSide + c;
                mesh->startFace();
                for (int v : {a, a + 1, a + 1 + kSide, a + kSide})
                    mesh->addFaceEdge(v);
                mesh->finishFace();
            }
        }
    }
};

void BM_GroupGeometry(benchmark::State &state) {
    static std::map<int, std::unique_ptr<GroupFixture>> fixtures;
    auto &f = fixtures[int(state.range(0))];
    if (!f)
        f = std::make_unique<GroupFixture>(int(state.range(0)));
    for (auto _ : state) {
        SgMorphLoader loader;
        SgFaceGroupCache groups; // a fresh cache gathers the groups again, as each run does
        for (const auto &bone : f->bones) {
            SgVertexMesh *group = loader.groupGeometry(bone.get(), f->mesh.get(), &groups);
            if (!group)
                state.SkipWithError("group missing");
            else
                group->unref();
        }
    }
}

BENCHMARK(BM_LoadMorphForNode)->Unit(benchmark::kMillisecond)->MinTime(0.5)->Repetitions(5);
BENCHMARK(BM_TinyObjParse)->Unit(benchmark::kMillisecond)->MinTime(0.5)->Repetitions(5);
BENCHMARK(BM_ComputeDeltas)->Arg(1)->Arg(0)->Unit(benchmark::kMicrosecond)->Repetitions(5);
BENCHMARK(BM_PlainSubtraction)->Arg(1)->Arg(0)->Unit(benchmark::kMicrosecond)->Repetitions(5);
BENCHMARK(BM_GroupGeometry)->Arg(10)->Arg(100)->Unit(benchmark::kMillisecond)->Repetitions(5);

} // namespace

int main(int argc, char **argv) {
    QApplication qt(argc, argv);
    SgApp app;
    sgBenchInitialize(argc, argv);
    Fixture data;
    fixture = &data;
    SgBenchReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    std::printf("\nRatios of the medians (same run):\n");
    sgPrintRatio("loadMorphForNode / tinyobjloader parse", reporter.median("BM_LoadMorphForNode"),
                 reporter.median("BM_TinyObjParse"), 0.5);
    sgPrintRatio("computeDeltas / plain loop (all moved)", reporter.median("BM_ComputeDeltas/1"),
                 reporter.median("BM_PlainSubtraction/1"), 1.5);
    sgPrintRatio("computeDeltas / plain loop (tenth moved)", reporter.median("BM_ComputeDeltas/0"),
                 reporter.median("BM_PlainSubtraction/0"), 1.5);
    sgPrintRatio("group geometry 100 bones / 10 bones", reporter.median("BM_GroupGeometry/100"),
                 reporter.median("BM_GroupGeometry/10"), 1.5);
    sgApp->getScene()->clear();
    benchmark::Shutdown();
    return 0;
}
