// Reads a generated OBJ file (1000 x 1000 grid: one million vertices with UVs, about two
// million triangles) with SgObjReader and with tinyobjloader (triangulation off), and welds
// and unwelds figures whose vertex and bone counts vary. Prints the ratios at the end.
//
// The file goes to $SG_BENCH_DIR (default: the system temporary folder) and is removed after
// the run.

#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgobjreader.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgfigurewelder.h"
#include "sgcore/scene/sgskeleton.h"

#include "bench/support/sgbenchreport.h"

#include <benchmark/benchmark.h>
#include <tiny_obj_loader.h>

#include <QCoreApplication>
#include <QDir>

#include <cstdio>
#include <memory>
#include <string>
#include <thread>

namespace {

constexpr int kGrid = 1000;

std::string g_objPath;

// The grid's rows `firstRow` to `lastRow` (inclusive) as a file of their own: vertices, UVs,
// then two triangles per grid cell.
void writeGridObj(const std::string &path, int firstRow = 0, int lastRow = kGrid - 1) {
    FILE *f = std::fopen(path.c_str(), "wb");
    if (!f) {
        std::perror(path.c_str());
        std::exit(1);
    }
    for (int y = firstRow; y <= lastRow; ++y) {
        for (int x = 0; x < kGrid; ++x) {
            std::fprintf(f, "v %.6f %.6f %.6f\n", x * 0.01, y * 0.01,
                         ((x * 7 + y * 3) % 100) * 0.001);
        }
    }
    for (int y = firstRow; y <= lastRow; ++y) {
        for (int x = 0; x < kGrid; ++x) {
            std::fprintf(f, "vt %.6f %.6f\n", x / double(kGrid - 1), y / double(kGrid - 1));
        }
    }
    std::fprintf(f, "g body\nusemtl skin\n");
    for (int y = 0; y < lastRow - firstRow; ++y) {
        for (int x = 0; x + 1 < kGrid; ++x) {
            const int a = y * kGrid + x + 1, b = a + 1, c = a + kGrid, d = c + 1;
            std::fprintf(f, "f %d/%d %d/%d %d/%d\nf %d/%d %d/%d %d/%d\n", a, a, b, b, d, d, a, a, d,
                         d, c, c);
        }
    }
    std::fclose(f);
}

// The same grid as two files that share the middle row, for a read on both cores.
std::string g_halfPaths[2];

void BM_TinyObjLoader(benchmark::State &state) {
    for (auto _ : state) {
        tinyobj::attrib_t attrib;
        std::vector<tinyobj::shape_t> shapes;
        std::vector<tinyobj::material_t> materials;
        std::string warn, err;
        const bool ok = tinyobj::LoadObj(&attrib, &shapes, &materials, &warn, &err,
                                         g_objPath.c_str(), nullptr, false);
        if (!ok || attrib.vertices.size() != size_t(kGrid) * kGrid * 3) {
            state.SkipWithError("tinyobjloader failed");
        }
        benchmark::DoNotOptimize(attrib.vertices.data());
    }
}

void BM_SgObjReader(benchmark::State &state) {
    for (auto _ : state) {
        SgObjReader reader;
        if (!reader.readFile(QString::fromStdString(g_objPath)) ||
            reader.getMesh()->getVertexCount() != kGrid * kGrid) {
            state.SkipWithError("SgObjReader failed");
        }
        benchmark::DoNotOptimize(reader.getMesh()->getVertices());
    }
}

// What both cores give: the grid in two halves, each read by SgObjReader on a thread of its own
// (the reader itself is single-threaded; this is what splitting a file could give at best).
void BM_SgObjReaderTwoCores(benchmark::State &state) {
    for (auto _ : state) {
        bool ok[2] = {false, false};
        auto read = [&](int half) {
            SgObjReader reader;
            ok[half] = reader.readFile(QString::fromStdString(g_halfPaths[half]));
        };
        std::thread other(read, 1);
        read(0);
        other.join();
        if (!ok[0] || !ok[1]) {
            state.SkipWithError("SgObjReader failed");
        }
    }
}

// A figure of `bones` bones holding `vertices` vertices in all: each bone a strip of quads
// sharing its seam column with the next bone.
std::unique_ptr<SgSkeleton> makeFigure(int bones, int vertices) {
    auto figure = std::make_unique<SgSkeleton>(QStringLiteral("fig"));
    const int column = std::max(2, vertices / bones / 2);
    SgNode *parent = figure.get();
    for (int b = 0; b < bones; ++b) {
        auto *bone = new SgBone(QStringLiteral("bone%1").arg(b));
        figure->addBone(bone, parent);
        parent = bone;
        auto *mesh = new SgPolyMesh;
        SgVec3 *v = mesh->setVertexArray(2 * column);
        for (int side = 0; side < 2; ++side) {
            for (int r = 0; r < column; ++r) {
                v[side * column + r] = SgVec3(float(b + side), float(r), 0);
            }
        }
        mesh->reserveFacets(0, column, 0, 0);
        for (int r = 0; r + 1 < column; ++r) {
            mesh->startFace();
            mesh->addFaceEdge(r);
            mesh->addFaceEdge(column + r);
            mesh->addFaceEdge(column + r + 1);
            mesh->addFaceEdge(r + 1);
            mesh->finishFace();
        }
        auto *shape = new SgPolyShape(bone->getName());
        shape->setPolyMesh(mesh);
        shape->addMaterial(new SgDefaultMaterial(QStringLiteral("skin")));
        auto *object = new SgObject;
        object->addShape(shape);
        bone->setObject(object);
    }
    return figure;
}

void BM_WeldAndUnweld(benchmark::State &state) {
    const int bones = int(state.range(0));
    const int vertices = int(state.range(1));
    std::unique_ptr<SgSkeleton> figure = makeFigure(bones, vertices);
    for (auto _ : state) {
        SgFigureWelder welder(figure.get(), false, true, true, true);
        std::unique_ptr<SgVertexMesh> back(welder.unWeld(welder.getGeometry()));
        benchmark::DoNotOptimize(back.get());
    }
    state.counters["vertices"] = double(vertices);
}

BENCHMARK(BM_TinyObjLoader)->Unit(benchmark::kMillisecond)->Iterations(1)->Repetitions(5);
BENCHMARK(BM_SgObjReader)->Unit(benchmark::kMillisecond)->Iterations(1)->Repetitions(5);
BENCHMARK(BM_SgObjReaderTwoCores)
    ->Unit(benchmark::kMillisecond)
    ->Iterations(1)
    ->Repetitions(5)
    ->UseRealTime();
BENCHMARK(BM_WeldAndUnweld)
    ->Unit(benchmark::kMillisecond)
    ->Args({10, 1000000})
    ->Args({100, 1000000})
    ->Args({100, 100000})
    ->Iterations(1)
    ->Repetitions(5);

bool sameVertexOrder() {
    tinyobj::attrib_t attrib;
    std::vector<tinyobj::shape_t> shapes;
    std::vector<tinyobj::material_t> materials;
    std::string warn, err;
    tinyobj::LoadObj(&attrib, &shapes, &materials, &warn, &err, g_objPath.c_str(), nullptr, false);
    SgObjReader reader;
    if (!reader.readFile(QString::fromStdString(g_objPath))) {
        return false;
    }
    const SgPolyMesh *m = reader.getMesh();
    if (size_t(m->getVertexCount()) * 3 != attrib.vertices.size()) {
        return false;
    }
    for (int i = 0; i < m->getVertexCount(); ++i) {
        const SgVec3 p = m->getVertex(i);
        if (p.x != attrib.vertices[size_t(i) * 3] || p.y != attrib.vertices[size_t(i) * 3 + 1] ||
            p.z != attrib.vertices[size_t(i) * 3 + 2]) {
            return false;
        }
    }
    return true;
}

} // namespace

int main(int argc, char **argv) {
    QCoreApplication app(argc, argv);
    const QByteArray dir = qgetenv("SG_BENCH_DIR");
    g_objPath = (dir.isEmpty() ? QDir::tempPath().toStdString() : dir.toStdString()) +
                "/sg_obj_bench_grid.obj";
    writeGridObj(g_objPath);
    for (int half = 0; half < 2; ++half) {
        g_halfPaths[half] = g_objPath + (half ? ".second.obj" : ".first.obj");
        writeGridObj(g_halfPaths[half], half ? kGrid / 2 - 1 : 0, half ? kGrid - 1 : kGrid / 2);
    }

    sgBenchInitialize(argc, argv);
    SgBenchReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);

    std::printf("\nRatios of the medians (same run):\n");
    const double theirs = reporter.median("BM_TinyObjLoader");
    sgPrintRatio("OBJ read: tinyobjloader / SgObjReader", theirs, reporter.median("BM_SgObjReader"),
                 6.0, true);
    std::printf("OBJ read: same vertices as tinyobjloader: %s\n", sameVertexOrder() ? "yes" : "NO");
    // Both cores, in wall time (the one clock that shows two threads at work) against the
    // single-threaded read's wall time in the same run.
    sgPrintRatio("OBJ read, wall time: one core / both cores",
                 reporter.median("BM_SgObjReader", SgBenchReporter::RealTime),
                 reporter.median("BM_SgObjReaderTwoCores", SgBenchReporter::RealTime));
    sgPrintRatio("OBJ read, wall time: tinyobjloader / both cores",
                 reporter.median("BM_TinyObjLoader", SgBenchReporter::RealTime),
                 reporter.median("BM_SgObjReaderTwoCores", SgBenchReporter::RealTime));
    const double w10 = reporter.median("BM_WeldAndUnweld/10/1000000");
    const double w100 = reporter.median("BM_WeldAndUnweld/100/1000000");
    sgPrintRatio("Weld+unweld 1M vertices: 100 bones / 10 bones", w100, w10, 1.5);
    sgPrintRatio("Weld+unweld 100 bones: 1M / 100k vertices", w100,
                 reporter.median("BM_WeldAndUnweld/100/100000"));
    std::remove(g_objPath.c_str());
    for (const std::string &half : g_halfPaths) {
        std::remove(half.c_str());
    }
    benchmark::Shutdown();
    return 0;
}
