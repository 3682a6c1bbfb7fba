// The morph engine: the delta scan, morph creation on props, bones and welded figures, the
// override and orphan rules, control properties and their links, geometry files and reversed
// deformations.
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgimporter.h"
#include "sgcore/app/sgimportmgr.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/morph/sgerclink.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/morph/sgrigidskinbinding.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgfigurewelder.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sgcore/script/sgscript.h"
#include "sharedsource/engine/sgfacegroupcache.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloaderquestions.h"
#include "sharedsource/engine/sgmorphloadlog.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestmodal.h"
#include "tests/support/sgtestscene.h"

#include <QSignalSpy>
#include <QTemporaryDir>
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <deque>
#include <limits>
#include <memory>
#include <optional>
#include <utility>
#include <vector>

namespace {

// Meshes start with no reference: `hold` takes one for the holder's life, as an owner does.
struct Unref {
    void operator()(SgRefCountedItem *item) const { item->unref(); }
};
template <typename Mesh> std::unique_ptr<Mesh, Unref> hold(Mesh *mesh) {
    mesh->ref();
    return std::unique_ptr<Mesh, Unref>(mesh);
}

// Answers the loader's name questions without dialogs: each takes the next of `names` (nullopt
// cancels; none left cancels too) and records the name it was asked about. Pose questions are
// declined.
struct ScriptedQuestions : SgMorphLoaderQuestions {
    std::deque<std::optional<QString>> names;
    QStringList askedAbout;

    bool askNewMorphName(const QString &name, QString &newName) override {
        askedAbout << name;
        if (names.empty() || !names.front()) {
            names.clear();
            return false;
        }
        newName = *names.front();
        names.pop_front();
        return true;
    }
    bool continueWithoutPose(const QString &, const QString &) override { return false; }
};

class EngineTest : public SgTestCleanScene {
protected:
    static SgScene *scene() { return sgApp->getScene(); }
    static QStringList logLines() { return sgApp->getMessageSink()->logLines(); }
    static QStringList statusLines() { return sgApp->getMessageSink()->statusLines(); }
};

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

SgMorph *morphOn(SgNode *node, const QString &name) {
    return dynamic_cast<SgMorph *>(node->getObject()->findModifier(name));
}

// A 12-vertex prop in the scene and a loader that makes the morph "Smile" in "Morphs/Face".
struct Prop {
    SgNode *node = sgTestNode("Box", sgTestRowMesh(12));
    SgMorphLoader loader;
    SgMorphLoadLog log;

    Prop() {
        sgApp->getScene()->addNode(node);
        loader.setMorphName("Smile");
        loader.setMorphGroup("Morphs/Face");
        loader.setCreateControl(false);
    }
    // A target with vertex `vertex` moved by `by`.
    SgPolyMesh *target(int vertex, const SgVec3 &by) const {
        SgPolyMesh *mesh = sgTestCopyVertices(*sgTestGeometry(node));
        mesh->setVertex(vertex, mesh->getVertex(vertex) + by);
        return mesh;
    }
    void create(SgPolyMesh *target) { loader.createMorphForNode(hold(target).get(), node, log); }
};

class TextImporter : public SgImporter {
public:
    QString getName() const override { return "Text"; }
    QStringList getExtensions() const override { return {"txt"}; }
};

// A two-bone arm bound rigidly: upper at the origin, lower hanging from (0, 2, 0).
struct Arm {
    SgSkeleton *figure = new SgSkeleton("Arm");
    SgBone *upper = sgTestNode<SgBone>("upper", sgTestRowMesh(8));
    SgBone *lower = sgTestNode<SgBone>("lower", sgTestRowMesh(8, 0.5f));

    Arm() {
        lower->setOrigin(SgVec3(0, 2, 0));
        figure->addBone(upper);
        figure->addBone(lower, upper);
        sgApp->getScene()->addNode(figure);
        SgRigidSkinBinding::bindFigure(figure);
    }
    void pose() {
        upper->setLocalRot(SgQuat::fromAxisAngle(SgVec3(0, 0, 1), 0.5f));
        lower->setLocalRot(SgQuat::fromAxisAngle(SgVec3(1, 0, 0), 0.8f));
    }
};

} // namespace

class MorphCreation : public EngineTest {};

TEST_F(MorphCreation, APropMorphComesOnlyFromAMovedTargetOfItsSize) {
    Prop prop;
    prop.create(sgTestCopyVertices(*sgTestGeometry(prop.node)));
    EXPECT_TRUE(logLines().contains("No deltas for morph, skipping node."));
    EXPECT_TRUE(prop.log.toHtml().contains("Geometry did not match, failed to create morph."));

    prop.loader.createMorphForNode(hold(sgTestRowMesh(10, 1.0f)).get(), prop.node, prop.log);
    EXPECT_EQ(statusLines().last(), QString("Vertex Count mismatch 12:10 (Base:Morph)."));
    EXPECT_EQ(prop.node->getObject()->getModifierCount(), 0);

    // A node without an object is skipped with its own log line.
    SgNode bare("Empty");
    SgNumericProperty *channel = nullptr;
    EXPECT_FALSE(prop.loader.createMorph(&bare, sgTestGeometry(prop.node), false, channel));
    EXPECT_EQ(logLines().last(), QString("No object found, skipping node."));

    // A prop's returned geometry is its own mesh, not a welded figure: with "Scenara Exported"
    // on and no bone among the targets the morph is made from it directly.
    prop.loader.setScenaraExported(true);
    SgMorphLoadLog log;
    prop.loader.createMorphForNodes(hold(prop.target(4, SgVec3(0, 0.5f, 0))).get(), {prop.node},
                                    log);
    EXPECT_EQ(log.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\nCreated morph successfully."
                                    "<BR>\n</BODY>"));
    SgMorph *morph = morphOn(prop.node, "Smile");
    ASSERT_TRUE(morph);
    ASSERT_EQ(morph->getDeltas()->getNumEntries(), 1);
    EXPECT_EQ(morph->getDeltas()->getVertex(0), 4);
    channel = morph->getValueChannel();
    EXPECT_EQ(channel->getPath(), QString("Morphs/Face"));

    // The channel drives the cached geometry, clamped to its range.
    channel->setValue(2.0f);
    const SgVertexMesh *shown = prop.node->getObject()->getCachedGeom();
    EXPECT_NEAR(shown->getVertex(4).y, sgTestGeometry(prop.node)->getVertex(4).y + 0.5f, 1e-6);
}

TEST_F(MorphCreation, MakeUniqueAsksUntilTheNameIsFreeAndNotBlankOrTheUserCancels) {
    Prop prop;
    prop.create(prop.target(1, SgVec3(1, 0, 0)));
    ASSERT_TRUE(morphOn(prop.node, "Smile"));

    // A taken name and a blank one are both asked again; the third answer is free.
    ScriptedQuestions questions;
    questions.names = {QString("Smile"), QString("  "), QString(""), QString("Grin")};
    prop.loader.setQuestions(&questions);
    const auto held = hold(prop.target(2, SgVec3(1, 0, 0)));
    SgPolyMesh *target = held.get();
    prop.loader.createMorphForNode(target, prop.node, prop.log);
    EXPECT_EQ(questions.askedAbout, QStringList({"Smile", "Smile", "  ", ""}));
    EXPECT_EQ(prop.loader.morphName(), QString("Grin"));
    ASSERT_TRUE(morphOn(prop.node, "Grin"));
    EXPECT_EQ(morphOn(prop.node, "Grin")->getDeltas()->getVertex(0), 2);
    EXPECT_FALSE(morphOn(prop.node, ""));

    SgMorphLoadLog cancelled;
    prop.loader.setMorphName("Smile");
    questions.names = {std::nullopt};
    prop.loader.createMorphForNode(target, prop.node, cancelled);
    EXPECT_EQ(cancelled.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\n<FONT COLOR=#0000ff>"
                                          "Warning: </FONT>User cancelled.<BR>\n</BODY>"));
    EXPECT_EQ(prop.node->getObject()->getModifierCount(), 2);

    // Without questions of its own the loader asks with the host's input dialog.
    prop.loader.setQuestions(nullptr);
    SgTestModalAnswer answer([](QWidget *modal) { modal->close(); });
    prop.loader.createMorphForNode(target, prop.node, cancelled);
    EXPECT_EQ(answer.titles(), QStringList("Morph Already Exists"));

    // The name must be free on every node of a run, not only on the first.
    auto *other = sgTestNode("Other", sgTestRowMesh(12));
    scene()->addNode(other);
    questions.names = {QString("Wink")};
    questions.askedAbout.clear();
    prop.loader.setQuestions(&questions);
    prop.loader.setMorphName("Grin");
    prop.loader.createMorphForNodes(target, {other, prop.node}, cancelled);
    EXPECT_EQ(questions.askedAbout, QStringList{"Grin"});
    EXPECT_TRUE(morphOn(other, "Wink") && morphOn(prop.node, "Wink"));
}

TEST_F(MorphCreation, OverrideReplacesDeltasKeepsPlaceAndHandlesLinks) {
    Prop prop;
    auto *controls = new SgNode("Controls");
    scene()->addNode(controls);
    prop.loader.setCreateControl(true);
    prop.loader.setControlNode(controls);
    prop.create(prop.target(1, SgVec3(1, 0, 0)));
    prop.loader.setMorphName("Other");
    prop.create(prop.target(2, SgVec3(1, 0, 0)));
    SgMorph *smile = morphOn(prop.node, "Smile");
    ASSERT_TRUE(smile);
    ASSERT_EQ(smile->getValueChannel()->getControllerCount(), 1);
    auto *control = dynamic_cast<SgFloatProperty *>(controls->findProperty("Smile"));
    ASSERT_TRUE(control);

    // Deltas Only, twice: new deltas, the one link kept and not doubled, same stack place.
    prop.loader.setMorphName("Smile");
    prop.loader.setOverride(SgMorphLoader::DeltasOnly);
    prop.loader.setControlProperty(nullptr);
    for (int run = 0; run < 2; ++run) {
        prop.loader.setControlProperty(control);
        prop.create(prop.target(7, SgVec3(0, 0, 1)));
    }
    EXPECT_EQ(morphOn(prop.node, "Smile"), smile);
    EXPECT_EQ(prop.node->getObject()->getModifierIndex(smile), 0);
    EXPECT_EQ(smile->getDeltas()->getVertex(0), 7);
    EXPECT_EQ(smile->getValueChannel()->getControllerCount(), 1);

    // Deltas and ERC Links: a foreign controller goes, and one new link comes.
    SgFloatProperty foreign("Foreign");
    smile->getValueChannel()->insertController(
        new SgERCLink(SgERCLink::Multiply, &foreign, 1.0f, 0.0f));
    prop.loader.setOverride(SgMorphLoader::DeltasAndLinks);
    prop.create(prop.target(9, SgVec3(0, 0, 1)));
    EXPECT_EQ(smile->getDeltas()->getVertex(0), 9);
    ASSERT_EQ(smile->getValueChannel()->getControllerCount(), 1);
    auto *link = dynamic_cast<SgERCLink *>(smile->getValueChannel()->getController(0));
    ASSERT_TRUE(link);
    EXPECT_EQ(link->getProperty(), control);
    EXPECT_EQ(prop.node->getObject()->getModifierIndex(smile), 0);
}

TEST_F(MorphCreation, OrphanCleanUpRemovesOnlyUnlinkedMorphsOfNodesARunLeftOut) {
    // Box moves in the target and Other does not; Other carries a "Smile" from before, which
    // the run leaves out. It goes only with clean-up on, when the run replaces morphs, and when
    // nothing keeps it: a link, being the loader's control property, or Other being the control
    // node of a run that makes links or keeps the old ones. A run that makes no morph (a target
    // that moves nothing, or one of the wrong size) removes nothing.
    using L = SgMorphLoader;
    enum Target { Moved, Unmoved, WrongSize };
    const struct Case {
        const char *what;
        bool cleanUp;
        int override;
        bool linked, ownControl, controlNode, createControl;
        bool removed;
        Target target = Moved;
    } cases[] = {
        {"an orphan", true, L::DeltasAndLinks, false, false, false, false, true},
        {"deltas only", true, L::DeltasOnly, false, false, false, false, true},
        {"clean-up off", false, L::DeltasAndLinks, false, false, false, false, false},
        {"make unique", true, L::MakeUnique, false, false, false, false, false},
        {"a linked morph", true, L::DeltasAndLinks, true, false, false, false, false},
        {"the control property", true, L::DeltasAndLinks, false, true, false, false, false},
        {"control node, links remade", true, L::DeltasAndLinks, false, false, true, false, true},
        {"control node, deltas only", true, L::DeltasOnly, false, false, true, false, false},
        {"control node, control made", true, L::DeltasAndLinks, false, false, true, true, false},
        {"no motion", true, L::DeltasAndLinks, false, false, false, false, false, Unmoved},
        {"wrong size", true, L::DeltasAndLinks, false, false, false, false, false, WrongSize},
    };
    SgFloatProperty dial("Dial");
    for (const Case &c : cases) {
        SCOPED_TRACE(c.what);
        scene()->clear();
        Prop prop;
        prop.create(prop.target(1, SgVec3(1, 0, 0)));
        auto *other = sgTestNode("Other", sgTestRowMesh(12));
        scene()->addNode(other);
        auto *orphan = new SgMorph("Smile");
        other->getObject()->addModifier(orphan);
        if (c.linked)
            orphan->getValueChannel()->insertController(
                new SgERCLink(SgERCLink::DeltaAdd, &dial, 1.0f, 0.0f));
        ScriptedQuestions questions;
        questions.names = {QString("Grin")};
        prop.loader.setQuestions(&questions);
        prop.loader.setCleanUpOrphans(c.cleanUp);
        prop.loader.setOverride(c.override);
        prop.loader.setControlNode(c.controlNode ? other : nullptr);
        prop.loader.setCreateControl(c.createControl);
        if (c.ownControl)
            prop.loader.setControlProperty(orphan->getValueChannel());

        const auto target = hold(
            c.target == WrongSize ? sgTestRowMesh(10)
                                  : prop.target(4, SgVec3(0, 0, c.target == Moved ? 1.0f : 0.0f)));
        sgTestGeometry(other)->setVertex(4, target->getVertex(4)); // Other sees no motion
        SgMorphLoadLog log;
        prop.loader.createMorphForNodes(target.get(), {prop.node, other}, log);
        ASSERT_TRUE(morphOn(prop.node, prop.loader.morphName())) << log.toHtml().toStdString();
        EXPECT_EQ(morphOn(other, "Smile") == nullptr, c.removed);
        EXPECT_EQ(log.toHtml().contains("Removed orphaned morph Smile from Other."), c.removed);
        prop.loader.setControlProperty(nullptr);
    }
}

namespace {

// Two bones "a" and "b" of `count` vertices each and a target whose face groups "a" and "b"
// hold vertices 0..count-1 and count..2*count-1, equal to the bones' own. Bone "a" finds its
// group by name, bone "b" (named "b2") by its label. The group "BODY" holds vertices 0 to 2.
struct TwoBones {
    static constexpr int count = 130; // two full 64-vertex scan blocks and a tail of 2
    SgSkeleton *figure = new SgSkeleton("Fig");
    SgBone *a = sgTestNode<SgBone>("a", sgTestRowMesh(count));
    SgBone *b = sgTestNode<SgBone>("b2", sgTestRowMesh(count, 500.0f));
    const std::unique_ptr<SgPolyMesh, Unref> held = hold(new SgPolyMesh);
    SgPolyMesh *target = held.get();

    TwoBones() {
        b->setLabel("b");
        figure->addBone(a);
        figure->addBone(b, a);
        sgApp->getScene()->addNode(figure);
        regroup(false);
    }
    // Rebuilds the target (or `mesh`); `swapped` gives group "a" the second half, "b" the first.
    void regroup(bool swapped) { fill(target, swapped); }
    void fill(SgPolyMesh *mesh, bool swapped) {
        mesh->beginEdit(true);
        SgVec3 *v = mesh->setVertexArray(2 * count);
        for (int i = 0; i < count; ++i) {
            v[i] = sgTestGeometry(swapped ? b : a)->getVertex(i);
            v[count + i] = sgTestGeometry(swapped ? a : b)->getVertex(i);
        }
        // The groups keep their indices; only the halves they cover change.
        const int a = mesh->addFaceGroup("a");
        const int b = mesh->addFaceGroup("b");
        for (int half = 0; half < 2; ++half) {
            mesh->setActiveFaceGroup((half == 0) != swapped ? a : b);
            for (int i = 0; i + 2 < count; ++i) {
                mesh->startFace();
                for (int k : {0, 1, 2})
                    mesh->addFaceEdge(half * count + i + k);
                mesh->finishFace();
            }
        }
        mesh->setActiveFaceGroup(mesh->addFaceGroup("BODY"));
        mesh->startFace();
        for (int k : {0, 1, 2})
            mesh->addFaceEdge(k);
        mesh->finishFace();
        mesh->finishEdit();
    }
};

} // namespace

TEST_F(MorphCreation, BonesTakeTheGroupOfTheirNameOrLabelGatheredForEachRunAndFiguresTheBody) {
    TwoBones bones;
    bones.target->setVertex(3, bones.target->getVertex(3) + SgVec3(0, 1, 0));
    bones.target->setVertex(TwoBones::count + 2,
                            bones.target->getVertex(TwoBones::count + 2) + SgVec3(0, 0, -1));
    SgMorphLoader loader;
    loader.setMorphName("Sculpt");
    loader.setCreateControl(false);
    SgMorphLoadLog log;
    loader.createMorphForNodes(bones.target, {bones.a, bones.b}, log);
    EXPECT_EQ(log.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\nCreated morph successfully."
                                    "<BR>\n</BODY>"));
    SgMorph *a = morphOn(bones.a, "Sculpt");
    SgMorph *b = morphOn(bones.b, "Sculpt");
    ASSERT_TRUE(a && b);
    ASSERT_EQ(a->getDeltas()->getNumEntries(), 1);
    EXPECT_EQ(a->getDeltas()->getVertex(0), 3);
    EXPECT_EQ(a->getDeltas()->getDelta(0), SgVec3(0, 1, 0));
    EXPECT_EQ(b->getDeltas()->getVertex(0), 2);

    // The groups are gathered again for every run: the same mesh object regrouped, the first
    // half now b's, moves only b.
    bones.regroup(true);
    bones.target->setVertex(7, bones.target->getVertex(7) + SgVec3(0, 0, 2));
    loader.setMorphName("Second");
    loader.createMorphForNodes(bones.target, {bones.a, bones.b}, log);
    EXPECT_FALSE(morphOn(bones.a, "Second"));
    ASSERT_TRUE(morphOn(bones.b, "Second"));
    EXPECT_EQ(morphOn(bones.b, "Second")->getDeltas()->getVertex(0), 7);
    EXPECT_FALSE(log.hasProblems()) << log.toHtml().toStdString();

    // A figure takes the group "BODY".
    auto *body = sgTestNode<SgSkeleton>("Body", sgTestRowMesh(3));
    scene()->addNode(body);
    std::unique_ptr<SgVertexMesh> group(loader.groupGeometry(body, bones.target));
    ASSERT_TRUE(group);
    ASSERT_EQ(group->getVertexCount(), 3);
    EXPECT_EQ(group->getVertex(2), bones.target->getVertex(2));
    group.release()->unref();

    // A mesh its caller owns directly (reference count 0, here on the stack) is borrowed, never
    // freed, by the group lookups, with a run's cache or without one.
    SgPolyMesh owned;
    bones.fill(&owned, false);
    SgFaceGroupCache run;
    for (SgFaceGroupCache *cache : {&run, static_cast<SgFaceGroupCache *>(nullptr)}) {
        SgVertexMesh *found = loader.groupGeometry(bones.a, &owned, cache);
        ASSERT_TRUE(found);
        EXPECT_EQ(found->getVertexCount(), TwoBones::count);
        found->unref();
        EXPECT_EQ(owned.getRefCount(), 0);
    }

    // A bone without a group of its name gets nothing, and the log says so.
    auto *tail = sgTestNode<SgBone>("tail", sgTestRowMesh(4));
    bones.figure->addBone(tail, bones.a);
    scene()->addNode(tail);
    SgMorphLoadLog none;
    loader.setMorphName("Other");
    loader.createMorphForNodes(bones.target, {tail}, none);
    EXPECT_TRUE(logLines().contains("No morph geometry found, skipping node."));
    EXPECT_TRUE(none.toHtml().contains("Geometry did not match, no morphs created."));
}

TEST_F(MorphCreation, ATargetThatFailsOnOneBoneMakesNoMorphOnAny) {
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const float inf = std::numeric_limits<float>::infinity();
    // Bone a moves validly; bone b's part of the target is broken in a full scan block (vertex
    // 10), in the tail (vertex 129), or only in the block after a block that moved throughout.
    for (int bad : {10, TwoBones::count - 1, 64}) {
        TwoBones bones;
        auto *controls = new SgNode("Controls");
        scene()->addNode(controls);
        SgMorphLoader loader;
        loader.setMorphName("Sculpt");
        loader.setControlNode(controls);
        const SgVec3 at = bones.target->getVertex(3);
        bones.target->setVertex(3, at + SgVec3(0, 1, 0));
        if (bad == 64) // every vertex of b's first block moves, then the fault
            for (int i = 0; i < 64; ++i)
                bones.target->setVertex(TwoBones::count + i,
                                        bones.target->getVertex(TwoBones::count + i) +
                                            SgVec3(1, 0, 0));
        bones.target->setVertex(TwoBones::count + bad, SgVec3(0, bad == 10 ? nan : inf, 0));
        SgMorphLoadLog log;
        loader.createMorphForNodes(bones.target, {bones.a, bones.b}, log);
        EXPECT_EQ(log.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\n<FONT COLOR=#ff0000>Error: "
                                        "</FONT>The target for b has coordinates that are not "
                                        "finite numbers. No morphs created.<BR>\n</BODY>"))
            << bad;
        EXPECT_EQ(bones.a->getObject()->getModifierCount(), 0) << bad;
        EXPECT_EQ(bones.b->getObject()->getModifierCount(), 0) << bad;
        EXPECT_EQ(controls->getPropertyCount(), 0) << bad;
        scene()->clear();
    }

    // A broken node mesh is named as such; one node alone says the same.
    TwoBones bones;
    SgMorphLoader loader;
    loader.setMorphName("Sculpt");
    bones.target->setVertex(3, bones.target->getVertex(3) + SgVec3(0, 1, 0));
    sgTestGeometry(bones.b)->setVertex(5, SgVec3(nan, 0, 0));
    SgMorphLoadLog log;
    loader.createMorphForNodes(bones.target, {bones.a, bones.b}, log);
    EXPECT_TRUE(log.toHtml().contains("The geometry of b has coordinates that are not finite "
                                      "numbers. No morphs created."))
        << log.toHtml().toStdString();
    EXPECT_EQ(bones.a->getObject()->getModifierCount(), 0);
    SgPolyMesh *alone = sgTestCopyVertices(*sgTestGeometry(bones.a));
    alone->setVertex(100, SgVec3(0, 0, inf));
    SgMorphLoadLog single;
    loader.createMorphForNode(hold(alone).get(), bones.a, single);
    EXPECT_TRUE(single.toHtml().contains("Error: </FONT>The target for a has coordinates that "
                                         "are not finite numbers. No morph created."))
        << single.toHtml().toStdString();
    EXPECT_EQ(bones.a->getObject()->getModifierCount(), 0);
}

TEST_F(MorphCreation, WeldedFigureTargetsBecomeOneLinkedMorphPerMovedBone) {
    SgSkeleton *figure = sgTestFigure("Fig", 3, 2);
    scene()->addNode(figure);
    const SgBoneList bones = figure->getAllBones();
    SgFigureWelder welder(figure, false, true, true, true);
    const auto edited = hold(sgTestCopyVertices(*welder.getGeometry()));

    SgMorphLoader loader;
    loader.setMorphName("Bulge");
    loader.setControlNode(figure);
    loader.setScenaraExported(true);
    loader.setIgnoredInvisibleNodes(false);
    loader.setWeldedGeometry(true);
    loader.setRemovedUnusedVertices(true);
    loader.setFourthWeldFlag(true);
    const QList<SgNode *> targets(bones.begin(), bones.end());

    // Move the seam vertex that bone 0 and bone 1 share (x = 1, y = 0).
    int seam = -1;
    for (int i = 0; i < edited->getVertexCount(); ++i)
        if (edited->getVertex(i) == SgVec3(1, 0, 0))
            seam = i;
    ASSERT_GE(seam, 0);
    edited->setVertex(seam, SgVec3(1, -0.5f, 0));
    sgApp->startProgress("Creating Morphs", 3);
    SgMorphLoadLog log;
    loader.createMorphForNodes(edited.get(), targets, log);
    EXPECT_EQ(sgApp->getMessageSink()->progressRuns().last().steps, 3);
    sgApp->finishProgress();
    EXPECT_FALSE(log.hasProblems());
    auto *control = dynamic_cast<SgFloatProperty *>(figure->findProperty("Bulge"));
    ASSERT_TRUE(control);
    for (int b = 0; b < 3; ++b) {
        SgMorph *morph = morphOn(bones[b], "Bulge");
        ASSERT_EQ(morph != nullptr, b < 2) << b;
        if (!morph)
            continue;
        ASSERT_EQ(morph->getDeltas()->getNumEntries(), 1);
        EXPECT_EQ(morph->getDeltas()->getDelta(0), SgVec3(0, -0.5f, 0));
        auto *link = dynamic_cast<SgERCLink *>(morph->getValueChannel()->getController(0));
        ASSERT_TRUE(link);
        EXPECT_EQ(link->getProperty(), control);
    }
}

namespace {

SgERCLink *onlyLink(SgNumericProperty *channel) {
    return channel->getControllerCount() == 1 ? dynamic_cast<SgERCLink *>(channel->getController(0))
                                              : nullptr;
}

SgNumericProperty *channelOf(SgNode *node, const QString &morph) {
    SgMorph *m = morphOn(node, morph);
    return m ? m->getValueChannel() : nullptr;
}

// Two props that each move one vertex in the target, and a loader for the morph "Smile".
struct TwoProps {
    SgNode *a = sgTestNode("A", sgTestRowMesh(8));
    SgNode *b = sgTestNode("B", sgTestRowMesh(8));
    const std::unique_ptr<SgPolyMesh, Unref> target = hold(sgTestCopyVertices(*sgTestGeometry(a)));
    SgMorphLoader loader;
    SgMorphLoadLog log;

    TwoProps() {
        sgApp->getScene()->addNode(a);
        sgApp->getScene()->addNode(b);
        target->setVertex(5, target->getVertex(5) + SgVec3(0, 2, 0));
        loader.setMorphName("Smile");
        loader.setMorphGroup("Morphs");
    }
    void run() { loader.createMorphForNodes(target.get(), {a, b}, log); }
};

} // namespace

class ControlProperty : public EngineTest {};

TEST_F(ControlProperty, FirstMorphOnTheControlNodeDrivesTheOthers) {
    TwoProps props;
    QSignalSpy spy(&props.loader, &SgMorphLoader::controlPropertyChanged);
    props.loader.setControlNode(props.a);
    props.run();
    SgNumericProperty *control = channelOf(props.a, "Smile");
    ASSERT_TRUE(control);
    EXPECT_EQ(props.loader.controlProperty(), control);
    EXPECT_EQ(spy.count(), 1);
    EXPECT_EQ(control->getControllerCount(), 0);
    SgERCLink *link = onlyLink(channelOf(props.b, "Smile"));
    ASSERT_TRUE(link);
    EXPECT_EQ(link->getProperty(), control);

    // Driving the control moves the other node's morph through the link.
    control->setValue(0.5f);
    EXPECT_NEAR(props.b->getObject()->getCachedGeom()->getVertex(5).y,
                sgTestGeometry(props.b)->getVertex(5).y + 1.0f, 1e-5);
}

TEST_F(ControlProperty, AFloatNamesakeOnTheControlNodeIsReusedAndLinksCarryTypeScaleAndLabel) {
    TwoProps props;
    auto *controls = new SgNode("Controls");
    scene()->addNode(controls);
    auto *namesake = new SgFloatProperty("Smile");
    controls->addProperty(namesake);
    props.loader.setControlNode(controls);
    props.loader.setUseCustomValue(true);
    props.loader.setCustomValue(0.5f);
    props.loader.setHideSecondary(true);
    props.loader.setUseCustomLabel(true);
    props.loader.setCustomLabel("p_Smile");
    props.run();
    EXPECT_EQ(props.loader.controlProperty(), namesake);
    EXPECT_EQ(controls->getPropertyCount(), 1);
    for (SgNode *node : {props.a, props.b}) {
        SgNumericProperty *channel = channelOf(node, "Smile");
        SgERCLink *link = onlyLink(channel);
        ASSERT_TRUE(link);
        EXPECT_EQ(link->getTypeName(), QString("ERC[DeltaAdd]"));
        EXPECT_FLOAT_EQ(link->getScale(), 0.5f);
        EXPECT_FLOAT_EQ(link->getOffset(), 0.0f);
        EXPECT_TRUE(channel->isHidden());
        EXPECT_EQ(channel->getLabel(), QString("p_Smile"));
    }

    // Another type ignores the custom value only when it is switched off.
    TwoProps second;
    second.loader.setMorphName("Frown");
    second.loader.setControlNode(controls);
    second.loader.setErcType(SgERCLink::Multiply);
    second.run();
    auto *created = dynamic_cast<SgFloatProperty *>(controls->findProperty("Frown"));
    ASSERT_TRUE(created);
    EXPECT_EQ(created->getPath(), QString("Morphs"));
    SgERCLink *link = onlyLink(channelOf(second.a, "Frown"));
    ASSERT_TRUE(link);
    EXPECT_EQ(link->getTypeName(), QString("ERC[Multiply]"));
    EXPECT_FLOAT_EQ(link->getScale(), 1.0f);
    EXPECT_FALSE(channelOf(second.a, "Frown")->isHidden());

    // A namesake that is no float property: no link, and the log says so.
    TwoProps third;
    third.loader.setMorphName("Count");
    controls->addProperty(new SgIntProperty("Count"));
    third.loader.setControlNode(controls);
    third.run();
    ASSERT_TRUE(channelOf(third.a, "Count") && channelOf(third.b, "Count"));
    EXPECT_EQ(channelOf(third.a, "Count")->getControllerCount(), 0);
    EXPECT_EQ(third.loader.controlProperty(), nullptr);
    EXPECT_TRUE(third.log.toHtml().contains("Warning: </FONT>The property Count on Controls is "
                                            "not a float property: the morph is not linked to a "
                                            "control property.<BR>\n</BODY>"))
        << third.log.toHtml().toStdString();
}

TEST_F(ControlProperty, UnplacedPropertiesArePlacedOrDiscarded) {
    auto *controls = new SgNode("Controls");
    scene()->addNode(controls);
    // Prepares `property` as the control of a loader for `node`; returns what the loader holds
    // then, before it ends.
    const auto prepare = [&](SgNumericProperty *property, SgNode *node) {
        SgMorphLoader loader;
        loader.setControlProperty(property);
        loader.setControlNode(node);
        loader.prepareControlProperty();
        return loader.controlProperty();
    };
    // A free property is placed on the control node, where the loader leaves it; a free
    // namesake is dropped for the node's own property; a control morph goes onto the node's
    // object, made for it when missing.
    auto *dial = new SgFloatProperty("Dial");
    EXPECT_EQ(prepare(dial, controls), dial);
    EXPECT_EQ(controls->findProperty("Dial"), dial);
    auto *namesake = new SgFloatProperty("Dial");
    std::weak_ptr<const void> lives[] = {namesake->getLifeToken(), {}, {}, {}};
    EXPECT_EQ(prepare(namesake, controls), dial);
    auto *morph = new SgMorph("Ctrl");
    prepare(morph->getValueChannel(), controls);
    ASSERT_TRUE(controls->getObject());
    EXPECT_EQ(controls->getObject()->findModifier("Ctrl"), morph);

    // Without a control node, replaced, or left at the end: an unplaced property is deleted.
    auto *lost = new SgFloatProperty("One");
    lives[1] = lost->getLifeToken();
    EXPECT_EQ(prepare(lost, nullptr), nullptr);
    {
        SgMorphLoader loader;
        auto *two = new SgMorph("Two");
        lives[2] = two->getValueChannel()->getLifeToken();
        loader.setControlProperty(two->getValueChannel());
        auto *three = new SgIntProperty("Three");
        lives[3] = three->getLifeToken();
        loader.setControlProperty(three);
        EXPECT_TRUE(lives[2].expired());
    }
    for (const auto &life : lives)
        EXPECT_TRUE(life.expired());
}

TEST_F(MorphCreation, GeometryFileLoadsMakeMorphsOrReportWhyNot) {
    QTemporaryDir dir;
    const auto writeFile = [&](const QString &name, const QByteArray &text) {
        return sgTestWriteFile(dir.filePath(name), text);
    };
    auto *node = sgTestNode("Head", sgTestRowMesh(12));
    scene()->addNode(node);
    SgMorphLoader loader;
    loader.setMorphName("Brow");
    loader.setCreateControl(false);
    SgFileIOSettings options;

    // The head's vertices with vertex 6 moved by 0.25 in z.
    QByteArray obj;
    for (int i = 0; i < 12; ++i) {
        const SgVec3 p = sgTestGeometry(node)->getVertex(i) + SgVec3(0, 0, i == 6 ? 0.25f : 0);
        obj += QStringLiteral("v %1 %2 %3\n").arg(p.x).arg(p.y).arg(p.z).toLatin1();
    }
    loader.setFilename(writeFile("brow.obj", obj + "f 1 2 3\n"));
    SgMorphLoadLog log;
    loader.loadMorphForNode(options, node, log);
    EXPECT_EQ(log.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\nLoading morph Brow...<BR>"
                                    "\nCreated morph successfully.<BR>\n</BODY>"));
    EXPECT_TRUE(statusLines().contains("Loading Morph: brow.obj"));
    SgMorph *morph = morphOn(node, "Brow");
    ASSERT_TRUE(morph);
    EXPECT_EQ(morph->getDeltas()->getVertex(0), 6);

    // Each failure to read ends in its status line, one log error and no morph.
    sgApp->getImportMgr()->addImporter(new TextImporter);
    const QString missing = dir.filePath("missing.obj");
    const QString unknown = dir.filePath("notes.xyz");
    const QString text = writeFile("notes.txt", "hello");
    const QString broken = writeFile("broken.obj", "v 1 2\nf 1 9 9\n");
    const struct {
        QString file;
        QString status;
    } failures[] = {{missing, "Failed to load morph source file: " + missing},
                    {unknown, "Failed to find an importer for " + unknown + "."},
                    {text, "The importer for " + text + " is not a geometry importer."},
                    {broken, "Failed to load morph source file: " + broken}};
    loader.setMorphName("Other");
    for (const auto &failure : failures) {
        SgMorphLoadLog failed;
        loader.setFilename(failure.file);
        loader.loadMorphForNodes(options, {node}, failed);
        EXPECT_EQ(statusLines().last(), failure.status);
        EXPECT_EQ(failed.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\nLoading morph Other...<BR>"
                                           "\n<FONT COLOR=#ff0000>Error: </FONT>Could not load "
                                           "geometry from file.<BR>\n</BODY>"));
    }
    EXPECT_EQ(node->getObject()->getModifierCount(), 1);
}

TEST_F(MorphCreation, ReversedSculptOfAPoseIsReproducedWhenPosedAgain) {
    for (bool afterJoint : {false, true}) {
        SCOPED_TRACE(afterJoint ? "after joint" : "before joint");
        Arm arm;
        arm.pose();
        // Sculpt the posed lower bone: two vertices pushed out.
        const auto sculpt = hold(sgTestCopyVertices(*arm.lower->getObject()->getCachedGeom()));
        sculpt->setVertex(2, sculpt->getVertex(2) + SgVec3(0.3f, -0.2f, 0.1f));
        sculpt->setVertex(6, sculpt->getVertex(6) + SgVec3(0.0f, 0.0f, 0.5f));

        SgMorphLoader loader;
        loader.setMorphName("Fix");
        loader.setCreateControl(false);
        loader.setReverseModifiers(true);
        loader.setApplyAfterJoint(afterJoint);
        SgMorphLoadLog log;
        loader.createMorphForNode(sculpt.get(), arm.lower, log);
        ASSERT_FALSE(log.hasProblems());

        SgMorph *morph = morphOn(arm.lower, "Fix");
        ASSERT_TRUE(morph);
        EXPECT_EQ(arm.lower->getObject()->getModifierIndex(morph), afterJoint ? 1 : 0);
        EXPECT_EQ(morph->getDeltas()->getNumEntries(), 2);

        morph->getValueChannel()->setValue(1.0f);
        const SgVertexMesh *shown = arm.lower->getObject()->getCachedGeom();
        for (int i = 0; i < sculpt->getVertexCount(); ++i)
            EXPECT_LT((shown->getVertex(i) - sculpt->getVertex(i)).length(), 1e-4f) << i;
    }
}

// A pose that does not load asks whether to go on without it (test_createmorphs).
TEST_F(MorphCreation, PoseFileRunsOnlyWithReverseDeformations) {
    Arm arm;
    QTemporaryDir dir;
    SgMorphLoader loader;
    loader.setPoseFile(sgTestWriteFile(dir.filePath("bend.sgs"),
                                       "scene.setRotation('lower', 90, 0, 0);\nprint('bent');\n"));
    EXPECT_TRUE(loader.applyPose()); // reverse deformations off: nothing runs
    EXPECT_TRUE(arm.lower->getLocalRot().isIdentity());

    loader.setReverseModifiers(true);
    EXPECT_TRUE(loader.applyPose());
    EXPECT_NEAR(arm.lower->getLocalRot().x, std::sqrt(0.5f), 1e-5);
    EXPECT_EQ(logLines().last(), QString("bent"));
    loader.setPoseFile("None");
    EXPECT_TRUE(loader.applyPose());
}
