// Saving a scene and loading it back gives the same state: the user's morphs with their deltas
// and channels, control properties and their links, returned props, and copied materials. A
// bad file is refused whole, naming the place of the fault.

#include "sgcore/app/sgimagemgr.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/io/sgscenefile.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/morph/sgerclink.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sgcore/properties/sgenumproperty.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestscene.h"

#include <QDir>
#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>

#include <functional>

#include <gtest/gtest.h>

namespace {

SgPolyMesh *meshOf(const SgNode *node) {
    return static_cast<SgPolyShape *>(node->getObject()->getCurrentShape())->getPolyMesh();
}

// What a session adds to a figure: a morph per bone driven by a control property on the
// figure, an enum property, a hidden returned prop with a polygon, UVs and two materials, and
// copied colours and maps.
void addUserWork(SgScene &scene) {
    SgSkeleton *figure = sgTestFigure(QStringLiteral("Blobby"), 3, 2, true);
    scene.addNode(figure);
    auto *control = new SgFloatProperty(QStringLiteral("MyMorph"));
    control->setPath(QStringLiteral("Morphs/Face"));
    control->setMin(-1);
    control->setMax(1);
    control->setIsClamped(true);
    control->setValue(0.75f);
    control->setIsUserProperty(true);
    figure->addProperty(control);
    auto *mood = new SgEnumProperty(QStringLiteral("Mood"));
    mood->addItem(QStringLiteral("Calm"));
    mood->addItem(QStringLiteral("Happy"), 5);
    mood->setValue(1);
    figure->addProperty(mood);
    for (SgBone *bone : figure->getAllBones()) {
        auto *deltas = new SgMorphDeltas;
        deltas->setVertCount(meshOf(bone)->getVertexCount());
        deltas->addDelta(1, SgVec3(0.1f, 1.0f / 3.0f, -2e-7f), false);
        deltas->addDelta(4, SgVec3(1e6f, 0, 0.3f), true);
        auto *morph = new SgMorph(QStringLiteral("MyMorph"), deltas);
        morph->setLabel(QStringLiteral("p_MyMorph"));
        morph->getValueChannel()->setHidden(true);
        morph->getValueChannel()->insertController(
            new SgERCLink(SgERCLink::DeltaAdd, control, 0.5f, 0.125f));
        bone->getObject()->addModifier(morph);
        auto *skin = static_cast<SgDefaultMaterial *>(
            bone->getObject()->getCurrentShape()->findMaterial(QStringLiteral("Skin")));
        skin->setDiffuseColor(QColor::fromRgbF(0.5f, 0.25f, 0.1f));
        skin->setColorMap(sgApp->getImageMgr()->getImage(sgTestPath(QStringLiteral("skin.png"))));
    }

    std::vector<SgVec3> vertices;
    std::vector<SgVec2> uvs;
    for (int i = 0; i < 6; ++i) {
        vertices.emplace_back(float(i) * 0.1f, float(i % 2), 1.0f / float(i + 3));
        uvs.emplace_back(float(i) / 7.0f, 0.5f);
    }
    SgPolyMesh *mesh = sgTestMesh(vertices, uvs);
    sgTestAddFacet(*mesh, 1, {{0, 0}, {1, 1}, {2, 2}, {3, 3}, {4, 4}});
    sgTestAddFacet(*mesh, 0, {{0}, {2}, {5}}); // no UVs on this one
    SgShape *shape = sgTestShape(QStringLiteral("Blobby (1)"), mesh,
                                 {QStringLiteral("Unused first"), QStringLiteral("Paint")});
    auto *paint = static_cast<SgDefaultMaterial *>(shape->getMaterial(1));
    paint->setDiffuseColor(QColor(12, 34, 56));
    paint->setBumpStrength(0.4f);
    paint->setGlossinessStrength(0.25f);
    SgNode *prop = sgTestAttach(new SgNode(QStringLiteral("Blobby (1)")), shape);
    prop->setOrigin(SgVec3(0.25f, 0.5f, 0));
    prop->setHidden(true);
    prop->setParent(figure->getAllBones().back());
    scene.addNode(prop);
}

} // namespace

TEST(HostSceneSave, ReopensToTheSameStateAndSavesTheSameFileAgain) {
    SgScene scene;
    addUserWork(scene);
    SgSceneFile file;
    const QString first = sgTestPath(QStringLiteral("one/work.json"));
    QDir().mkpath(sgTestPath(QStringLiteral("one")));
    ASSERT_TRUE(file.save(first, &scene)) << file.getErrorString().toStdString();

    SgScene reopened;
    ASSERT_TRUE(file.load(first, &reopened)) << file.getErrorString().toStdString();
    ASSERT_EQ(reopened.getNodeCount(), scene.getNodeCount());
    for (int i = 0; i < scene.getNodeCount(); ++i) {
        SgNode *was = scene.getNode(i);
        SgNode *now = reopened.getNode(i);
        ASSERT_EQ(now->getName(), was->getName());
        EXPECT_EQ(now->getOrigin(), was->getOrigin());
        EXPECT_EQ(bool(now->getParent()), bool(was->getParent()));
        if (!was->getObject())
            continue;
        // Base geometry, facets and UVs exactly; the current geometry (morphs at the linked
        // control's value) exactly.
        const SgPolyMesh *a = meshOf(was);
        const SgPolyMesh *b = meshOf(now);
        EXPECT_EQ(b->vertices(), a->vertices()) << was->getName().toStdString();
        EXPECT_EQ(b->triangleCorners(), a->triangleCorners());
        EXPECT_EQ(b->quadCorners(), a->quadCorners());
        EXPECT_EQ(b->polygonCorners(), a->polygonCorners());
        EXPECT_EQ(b->quadMaterials(), a->quadMaterials());
        EXPECT_EQ(b->polygonMaterials(), a->polygonMaterials());
        ASSERT_EQ(b->getUVCount(), a->getUVCount());
        EXPECT_EQ(b->getUVList()->values(), a->getUVList()->values());
        EXPECT_EQ(now->getObject()->getCachedGeom()->vertices(),
                  was->getObject()->getCachedGeom()->vertices());
        const SgShape *sa = was->getObject()->getCurrentShape();
        const SgShape *sb = now->getObject()->getCurrentShape();
        ASSERT_EQ(sb->getMaterialCount(), sa->getMaterialCount());
        for (int m = 0; m < sa->getMaterialCount(); ++m) {
            auto *ma = static_cast<SgDefaultMaterial *>(sa->getMaterial(m));
            auto *mb = static_cast<SgDefaultMaterial *>(sb->getMaterial(m));
            EXPECT_EQ(mb->getName(), ma->getName());
            EXPECT_EQ(mb->getDiffuseColor(), ma->getDiffuseColor());
            EXPECT_EQ(mb->getBumpStrength(), ma->getBumpStrength());
            EXPECT_EQ(bool(mb->getColorMap()), bool(ma->getColorMap()));
        }
    }

    // The links still work: moving the control moves every bone's morph.
    auto *figure = static_cast<SgSkeleton *>(reopened.findNodeByName(QStringLiteral("Blobby")));
    auto *control = static_cast<SgFloatProperty *>(figure->findProperty(QStringLiteral("MyMorph")));
    EXPECT_EQ(control->getPath(), QStringLiteral("Morphs/Face"));
    control->setValue(-1);
    for (SgBone *bone : figure->getAllBones()) {
        auto *morph =
            static_cast<SgMorph *>(bone->getObject()->findModifier(QStringLiteral("MyMorph")));
        ASSERT_NE(morph, nullptr);
        EXPECT_EQ(morph->getLabel(), QStringLiteral("p_MyMorph"));
        EXPECT_TRUE(morph->getValueChannel()->isHidden());
        EXPECT_FLOAT_EQ(morph->getValueChannel()->getValue(), 0.5f * (-1.0f - 0.125f));
        EXPECT_EQ(morph->getDeltas()->getDelta(0), SgVec3(0.1f, 1.0f / 3.0f, -2e-7f));
    }
    EXPECT_EQ(reopened.findNodeByName(QStringLiteral("Blobby (1)"))->getParent(),
              figure->getAllBones().back());

    // Nothing was lost on the way: the reopened scene saves to the same text.
    control->setValue(0.75f);
    const QString second = sgTestPath(QStringLiteral("two/work.json"));
    QDir().mkpath(sgTestPath(QStringLiteral("two")));
    ASSERT_TRUE(file.save(second, &reopened)) << file.getErrorString().toStdString();
    QByteArray text = sgTestReadFile(first);
    EXPECT_EQ(sgTestReadFile(second), text.replace(sgTestPath(QStringLiteral("one")).toUtf8(),
                                                   sgTestPath(QStringLiteral("two")).toUtf8()));
}

TEST(HostSceneSave, AFailedSaveLeavesTheFileAndABadMorphIsRefusedWhole) {
    SgScene scene;
    addUserWork(scene);
    SgSceneFile file;
    const QString path = sgTestPath(QStringLiteral("kept.json"));
    ASSERT_TRUE(file.save(path, &scene));
    const QByteArray saved = sgTestReadFile(path);
    // Deltas that do not fit the geometry, or a link to nothing, are refused with their place,
    // and nothing is added.
    const QJsonObject root = QJsonDocument::fromJson(saved).object();
    using Edit = std::function<void(QJsonObject &)>;
    auto deltasFile = [](const char *name, const QByteArray &text) {
        return sgTestWriteFile(sgTestPath(QString::fromLatin1(name)), text);
    };
    // Each bone has 7 vertices: a delta line short of a number, a vertex repeated or out of
    // order, one past the last vertex, and a header for another count.
    const QString files[] = {deltasFile("short.deltas", "deltas 7\n1 0.5 0\n"),
                             deltasFile("twice.deltas", "deltas 7\n1 0 0 1\n1 0 1 0\n"),
                             deltasFile("order.deltas", "deltas 7\n4 0 0 1\n1 0 1 0\n"),
                             deltasFile("past.deltas", "deltas 7\n7 0 0 1\n"),
                             deltasFile("count.deltas", "deltas 10\n1 0 0 1\n")};
    const auto inline3 = [](QJsonArray vertices) {
        return [vertices](QJsonObject &m) {
            m.insert(QStringLiteral("vertices"), vertices);
            m.insert(QStringLiteral("deltas"), QJsonArray{1, 2, 3, 4, 5, 6});
        };
    };
    std::vector<Edit> edits = {
        [](QJsonObject &m) { m.insert(QStringLiteral("vertexCount"), 11); },
        inline3({4, 4}),
        inline3({4, 1}),
        inline3({1, 7}),
        [](QJsonObject &m) { m.insert(QStringLiteral("deltas"), QStringLiteral("missing")); },
        [](QJsonObject &m) {
            m.insert(QStringLiteral("vertices"), QJsonArray{1, 4});
            m.insert(QStringLiteral("deltas"), QJsonArray{1, 2, 3});
        },
        [](QJsonObject &m) {
            QJsonObject channel = m.value(QStringLiteral("channel")).toObject();
            QJsonArray links = channel.value(QStringLiteral("links")).toArray();
            QJsonObject link = links.at(0).toObject();
            link.insert(QStringLiteral("property"), QStringLiteral("Nothing"));
            links.replace(0, link);
            channel.insert(QStringLiteral("links"), links);
            m.insert(QStringLiteral("channel"), channel);
        }};
    for (const QString &file : files)
        edits.push_back([file](QJsonObject &m) { m.insert(QStringLiteral("deltas"), file); });
    for (const Edit &edit : edits) {
        QJsonArray nodes = root.value(QStringLiteral("nodes")).toArray();
        QJsonObject figure = nodes.at(0).toObject();
        QJsonArray bones = figure.value(QStringLiteral("bones")).toArray();
        QJsonObject bone = bones.at(1).toObject();
        QJsonArray morphs = bone.value(QStringLiteral("morphs")).toArray();
        QJsonObject morph = morphs.at(0).toObject();
        edit(morph);
        morphs.replace(0, morph);
        bone.insert(QStringLiteral("morphs"), morphs);
        bones.replace(1, bone);
        figure.insert(QStringLiteral("bones"), bones);
        nodes.replace(0, figure);
        QJsonObject changed = root;
        changed.insert(QStringLiteral("nodes"), nodes);
        SgScene target;
        EXPECT_FALSE(file.loadFromData(QJsonDocument(changed).toJson(), sgTestFolder(), &target));
        EXPECT_TRUE(file.getErrorString().contains(QStringLiteral("bones[1].morphs[0]")))
            << file.getErrorString().toStdString();
        EXPECT_EQ(target.getNodeCount(), 0);
    }

    // The geometry folder cannot be made: a file stands in its place.
    QDir(sgTestPath(QStringLiteral("kept-geometry"))).removeRecursively();
    QFile blocker(sgTestPath(QStringLiteral("kept-geometry")));
    ASSERT_TRUE(blocker.open(QIODevice::WriteOnly));
    blocker.close();
    EXPECT_FALSE(file.save(path, &scene));
    EXPECT_TRUE(file.getErrorString().contains(QStringLiteral("kept-geometry")));
    EXPECT_EQ(sgTestReadFile(path), saved);
}

TEST(HostSceneFile, RejectsBadFilesWholeWithPlace) {
    SgScene scene;
    SgSceneFile file;
    const QString base = QStringLiteral(SG_EXAMPLES_DIR "/scenes");
    struct Case {
        const char *json;
        const char *words;
    };
    const Case cases[] = {
        {"not json", "not a JSON object"},
        {R"({"nodes": []})", "version 1"},
        {R"({"scenara": 2, "nodes": []})", "version 1"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "color", "name": "c", "value": [0, 255.5, 0]}]}]})",
         "0 to 255"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "float", "name": "p"}, {"type": "float", "name": "q",
             "links": [{"node": "a", "property": "p", "type": 6}]}]}]})",
         "link type from 0 to 5"},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a"}]})", "needs \"geometry\""},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a", "geometry": "missing.obj"}]})",
         "missing.obj:0: cannot open"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a"}, {"kind": "figure", "name": "f",
            "bones": [{"name": "b", "parent": "x"}]}]})",
         "nodes[1].bones[0]: unknown parent bone \"x\""},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "float", "name": "p"}, {"type": "int", "name": "p"}]}]})",
         "(82)"},
        {R"({"scenara": 1, "nodes": [{"kind": "figure", "name": "f", "followTarget": "g",
            "bones": []}]})",
         "unknown follow target"},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a",
            "geometry": {"file": "figure.obj", "group": "tail"}}]})",
         "no face group \"tail\""},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "origin": [1, 2]}]})",
         "array of 3 numbers"},
    };
    for (const Case &c : cases) {
        EXPECT_FALSE(file.loadFromData(c.json, base, &scene, QStringLiteral("bad.json"))) << c.json;
        EXPECT_TRUE(file.getErrorString().startsWith(QStringLiteral("bad.json: ")))
            << file.getErrorString().toStdString();
        EXPECT_TRUE(file.getErrorString().contains(QString::fromUtf8(c.words)))
            << file.getErrorString().toStdString();
        EXPECT_EQ(scene.getNodeCount(), 0) << "nothing is added from a rejected file";
    }
}
