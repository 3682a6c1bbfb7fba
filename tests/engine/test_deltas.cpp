#include "enginetestsupport.h"

#include "sgcore/morph/sgmorphdeltas.h"
#include "sharedsource/engine/sgmorphloader.h"

#include <cmath>
#include <cstdint>
#include <limits>
#include <memory>
#include <utility>
#include <vector>

using namespace enginetest;

class Deltas : public EngineTest {};

TEST_F(Deltas, ThresholdIsStrictlyAboveOneThousandth) {
    std::unique_ptr<SgPolyMesh> base(sgTestRowMesh(200));
    // Moved vertices sit at the origin, where 0.001 and 0.0011 are differences as written.
    for (int i : {3, 70, 71, 150, 198, 199})
        base->setVertex(i, SgVec3());
    std::unique_ptr<SgPolyMesh> morph(sgTestCopyVertices(*base));

    // Exactly 0.001 (as a float) in one axis, in both directions: no delta, in a block or tail
    // of its own and beside a vertex that moves.
    for (int i : {3, 71, 198})
        morph->setVertex(i, base->getVertex(i) + SgVec3(0.001f, 0.0f, 0.0f));
    morph->setVertex(150, base->getVertex(150) - SgVec3(0.0f, 0.0f, 0.001f));
    EXPECT_EQ(SgMorphLoader::computeDeltas(*base, *morph), nullptr);

    // 0.0011 gives an entry, in a quiet block and in the tail after the last full block.
    const SgVec3 moved = SgVec3(0.0f, 0.0011f, 0.0f);
    morph->setVertex(70, base->getVertex(70) + moved);
    morph->setVertex(199, base->getVertex(199) - moved);
    std::unique_ptr<SgMorphDeltas> deltas(SgMorphLoader::computeDeltas(*base, *morph));
    ASSERT_TRUE(deltas);
    EXPECT_EQ(deltas->getVertCount(), 200);
    ASSERT_EQ(deltas->getNumEntries(), 2);
    EXPECT_EQ(deltas->getVertex(0), 70);
    EXPECT_NEAR(deltas->getDelta(0).y, 0.0011f, 1e-6);
    EXPECT_EQ(deltas->getVertex(1), 199);
    EXPECT_NEAR(deltas->getDelta(1).y, -0.0011f, 1e-6);
}

TEST_F(Deltas, MatchAPlainLoopWhateverTheMixOfMovedAndQuietVertices) {
    // Runs of fully moved blocks; after them blocks with one quiet vertex, with a random third
    // quiet, or with a single moved vertex, at shifting positions; single moved axes at every
    // position of a vertex; and a tail shorter than a block.
    const int count = 64 * 40 + 23;
    std::unique_ptr<SgPolyMesh> base(sgTestRowMesh(count));
    std::unique_ptr<SgPolyMesh> morph(sgTestCopyVertices(*base));
    std::uint32_t seed = 7;
    for (int i = 0; i < count; ++i) {
        seed = seed * 1664525u + 1013904223u;
        const int block = i / 64;
        const bool marked = i % 64 == (block * 13) % 64;
        const int kind = block % 5;
        const bool moves = kind < 2 || (kind == 2 && !marked) ||
                           (kind == 3 && (seed >> 8) % 3 != 0) || (kind == 4 && marked);
        if (!moves)
            continue;
        SgVec3 move;
        const float step = (seed >> 20) % 2 ? 0.5f : -0.0015f;
        (i % 3 == 0 ? move.x : i % 3 == 1 ? move.y : move.z) = step;
        morph->setVertex(i, base->getVertex(i) + move);
    }
    std::vector<std::pair<int, SgVec3>> expected;
    for (int i = 0; i < count; ++i) {
        const SgVec3 d = morph->getVertex(i) - base->getVertex(i);
        if (std::fabs(d.x) > 0.001f || std::fabs(d.y) > 0.001f || std::fabs(d.z) > 0.001f)
            expected.emplace_back(i, d);
    }
    std::unique_ptr<SgMorphDeltas> deltas(SgMorphLoader::computeDeltas(*base, *morph));
    ASSERT_TRUE(deltas);
    std::vector<std::pair<int, SgVec3>> entries;
    for (int e = 0; e < deltas->getNumEntries(); ++e)
        entries.emplace_back(deltas->getVertex(e), deltas->getDelta(e));
    EXPECT_TRUE(entries == expected); // not EXPECT_EQ: a failure would print every entry
}

TEST_F(Deltas, CountMismatchAndInvalidTargetsGiveNoTable) {
    std::unique_ptr<SgPolyMesh> base(sgTestRowMesh(200));
    std::unique_ptr<SgPolyMesh> shorter(sgTestRowMesh(10, 1.0f));
    EXPECT_EQ(SgMorphLoader::computeDeltas(*base, *shorter), nullptr);
    EXPECT_EQ(statusLines().last(), QString("Vertex Count mismatch - delta calculation failed."));

    // A coordinate that is not a number or infinite must never become a delta, wherever it is:
    // beside a move, in a block without one, or in the tail.
    for (float bad :
         {std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::infinity()}) {
        for (int at : {0, 100, 199}) {
            std::unique_ptr<SgPolyMesh> morph(sgTestCopyVertices(*base));
            morph->setVertex(5, base->getVertex(5) + SgVec3(1.0f, 0.0f, 0.0f));
            const SgVec3 b = base->getVertex(at); // only one coordinate of the vertex is bad
            morph->setVertex(at, SgVec3(b.x, bad, b.z));
            EXPECT_EQ(SgMorphLoader::computeDeltas(*base, *morph), nullptr);
            EXPECT_EQ(statusLines().last(),
                      QString("Morph target has invalid coordinates - delta calculation failed."));
        }
    }
    // The fault in the node's own geometry is named as such, in a full block and in the tail.
    for (int at : {3, 70}) {
        std::unique_ptr<SgPolyMesh> broken(sgTestRowMesh(72));
        std::unique_ptr<SgPolyMesh> morph(sgTestCopyVertices(*broken));
        broken->setVertex(at, SgVec3(std::numeric_limits<float>::infinity(), 0.0f, 0.0f));
        EXPECT_EQ(SgMorphLoader::computeDeltas(*broken, *morph), nullptr);
        EXPECT_EQ(statusLines().last(),
                  QString("Base geometry has invalid coordinates - delta calculation failed."));
    }
}
