// A figure-sized record (about 1M vertices, 2M triangles, UVs, 64 materials):
//   write    measure plus write into a buffer of the measured size
//   read     read the returned record back into a shape
//   memcpy   copying the same number of bytes (the baseline)
// and writing with 1 and with 256 materials. The ratios are printed after the run.

#include "exchange/sgexchangereader.h"
#include "exchange/sgexchangewriter.h"
#include "exchange/sgreturnrecordwriter.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/scene/sgnode.h"

#include "bench/support/sgbenchreport.h"

#include <benchmark/benchmark.h>

#include <malloc.h>

#include <cstdio>
#include <cstring>
#include <map>
#include <memory>
#include <vector>

namespace {

constexpr int kSide = 1000; // 1000 x 1000 vertices, 2 x 999 x 999 triangles

// A grid mesh with UVs whose triangles spread over `materials` materials in a scattered order.
SgPolyMesh *gridMesh(int materials) {
    auto *mesh = new SgPolyMesh;
    mesh->beginEdit(true);
    SgVec3 *v = mesh->setVertexArray(kSide * kSide);
    auto *uvs = new SgMap(SgMap::UVMap);
    uvs->values().resize(size_t(kSide) * kSide);
    for (int y = 0; y < kSide; ++y)
        for (int x = 0; x < kSide; ++x) {
            v[y * kSide + x] = SgVec3(float(x), float(y), float((x * y) % 7));
            uvs->values()[size_t(y * kSide + x)] = SgVec2(float(x) / kSide, float(y) / kSide);
        }
    mesh->setUVList(uvs);
    const size_t triangles = size_t(kSide - 1) * (kSide - 1) * 2;
    auto &corners = mesh->triangleCorners();
    auto &mats = mesh->triangleMaterials();
    auto &groups = mesh->triangleGroups();
    corners.reserve(triangles * 3);
    mats.reserve(triangles);
    groups.assign(triangles, -1);
    std::uint32_t scramble = 12345;
    for (int y = 0; y + 1 < kSide; ++y)
        for (int x = 0; x + 1 < kSide; ++x) {
            const int a = y * kSide + x, b = a + 1, c = a + kSide, d = c + 1;
            const int tri[2][3] = {{a, b, c}, {b, d, c}};
            for (const auto &t : tri) {
                for (const int i : t)
                    corners.push_back(SgFaceCorner{i, i, -1});
                scramble = scramble * 1664525u + 1013904223u;
                mats.push_back(std::uint8_t((scramble >> 16) % std::uint32_t(materials)));
            }
        }
    mesh->finishEdit();
    return mesh;
}

struct Figure {
    std::unique_ptr<SgNode> node;
    SgPolyMesh *mesh = nullptr;
};

Figure makeFigure(int materials) {
    Figure figure;
    figure.mesh = gridMesh(materials);
    auto *shape = new SgPolyShape("Figure");
    shape->setPolyMesh(figure.mesh);
    for (int m = 0; m < materials; ++m)
        shape->addMaterial(new SgDefaultMaterial(QString("material%1").arg(m)));
    figure.node = std::make_unique<SgNode>("Figure");
    auto *object = new SgObject("Figure");
    object->addShape(shape);
    figure.node->setObject(object);
    return figure;
}

// A destination already touched once, as a mapped segment would be after its first use.
std::vector<char> &destination(size_t bytes) {
    static std::vector<char> buffer;
    if (buffer.size() < bytes)
        buffer.assign(bytes, 1);
    return buffer;
}

Figure &figureWith(int materials) {
    static std::map<int, Figure> figures;
    auto found = figures.find(materials);
    if (found == figures.end())
        found = figures.emplace(materials, makeFigure(materials)).first;
    return found->second;
}

std::int64_t recordBytes() {
    Figure &figure = figureWith(64);
    SgExchangeWriter writer(figure.node.get(), QString());
    std::vector<char> &out = destination(size_t(writer.getSize()));
    return writer.write(out.data());
}

void BM_Write(benchmark::State &state) {
    Figure &figure = figureWith(int(state.range(0)));
    std::int64_t written = 0;
    for (auto _ : state) {
        SgExchangeWriter writer(figure.node.get(), QString());
        std::vector<char> &out = destination(size_t(writer.getSize()));
        written = writer.write(out.data());
        benchmark::DoNotOptimize(out.data());
    }
    state.SetBytesProcessed(state.iterations() * written);
    state.counters["record_bytes"] = double(written);
}

void BM_Read(benchmark::State &state) {
    Figure &figure = figureWith(64);
    std::vector<SgReturnMaterial> materials(64);
    const QByteArray record =
        SgReturnRecordWriter("Figure", *figure.mesh, materials, QString()).toByteArray();
    for (auto _ : state) {
        QString trailer;
        std::unique_ptr<SgPolyShape> shape(
            SgExchangeReader(record.constData(), size_t(record.size())).readShape(trailer));
        if (!shape)
            state.SkipWithError("record not read");
        state.PauseTiming();
        shape.reset();
        state.ResumeTiming();
    }
    state.SetBytesProcessed(state.iterations() * record.size());
}

void BM_Memcpy(benchmark::State &state) {
    const size_t bytes = size_t(recordBytes());
    std::vector<char> from(bytes, 2);
    std::vector<char> &to = destination(bytes);
    for (auto _ : state) {
        std::memcpy(to.data(), from.data(), bytes);
        benchmark::DoNotOptimize(to.data());
    }
    state.SetBytesProcessed(state.iterations() * std::int64_t(bytes));
}

BENCHMARK(BM_Memcpy)->Unit(benchmark::kMillisecond)->MinTime(0.3)->Repetitions(5);
BENCHMARK(BM_Write)
    ->Arg(64)
    ->Arg(1)
    ->Arg(256)
    ->Unit(benchmark::kMillisecond)
    ->MinTime(0.3)
    ->Repetitions(5);
BENCHMARK(BM_Read)->Unit(benchmark::kMillisecond)->MinTime(0.3)->Repetitions(5);

} // namespace

int main(int argc, char **argv) {
    // A long-running host reuses its heap: big blocks stay in the process instead of being
    // mapped afresh (and page-faulted) for every record, as the memcpy baseline's buffers are.
    mallopt(M_MMAP_THRESHOLD, 1 << 30);
    mallopt(M_TRIM_THRESHOLD, 1 << 30);
    sgBenchInitialize(argc, argv);
    SgBenchReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    std::printf("\nRatios of median CPU times (the machine is shared; wall time is noise):\n");
    const double memcpyTime = reporter.median("BM_Memcpy");
    sgPrintRatio("(a) measure + write, 64 materials / memcpy", reporter.median("BM_Write/64"),
                 memcpyTime, 2.0);
    sgPrintRatio("(b) read back into a shape / memcpy", reporter.median("BM_Read"), memcpyTime,
                 4.0);
    sgPrintRatio("(c) write, 256 materials / 1 material", reporter.median("BM_Write/256"),
                 reporter.median("BM_Write/1"), 1.2);
    benchmark::Shutdown();
    return 0;
}
