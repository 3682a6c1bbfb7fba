// Rows and runs that work on the scene. The run over all sources: target nodes per mode, sources in
// list order into one log, the pose step that may skip a source, the in-memory source's own
// targets, and the progress.
#include "loadertestsupport.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgmessagesink.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/io/sgobjreader.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sharedsource/engine/sgmorphloadlog.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphmeshitem.h"
#include "sharedsource/loaderui/sgmorphsourceboolitem.h"
#include "tests/support/sgtestscene.h"

#include <QMessageBox>
#include <QTemporaryDir>

namespace {

// A triangle at height `y`: (0, y), (1, y), (0, y + 1).
SgPolyMesh *triangle(float y) {
    return sgTestPolygon({{0, y, 0}, {1, y, 0}, {0, y + 1, 0}});
}

// A welded target: the head's group first, then the neck's; `headDy` lifts the head's first
// vertex and `neckDy` the neck's first.
QByteArray figureTarget(double headDy, double neckDy) {
    return QStringLiteral("v 0 %1 0\nv 1 2 0\nv 0 3 0\nv 0 %2 0\nv 1 1 0\nv 0 2 0\n"
                          "g head\nf 1 2 3\ng neck\nf 4 5 6\n")
        .arg(2 + headDy)
        .arg(1 + neckDy)
        .toLatin1();
}

bool hasMorph(SgNode *node, const QString &name) {
    return node->getObject() &&
           dynamic_cast<SgMorph *>(node->getObject()->findModifier(name)) != nullptr;
}

class FigureScene : public ::testing::Test {
protected:
    QTemporaryDir dir;
    SgScene *scene = sgApp->getScene();
    // Two bones of one triangle each, in a figure without geometry of its own, and a prop.
    SgSkeleton *figure = new SgSkeleton("Figure");
    SgBone *head = sgTestNode<SgBone>("head", triangle(2));
    SgBone *neck = sgTestNode<SgBone>("neck", triangle(1));
    SgNode *prop = sgTestNode("box", triangle(2));
    SgMorphSourceList list{nullptr, "MorphLoaderSourceList"};
    SgFileIOSettings options;
    SgMorphLoadLog log;

    void SetUp() override {
        scene->clear();
        figure->addBone(neck);
        figure->addBone(head, neck);
        scene->addNode(figure);
        scene->addNode(prop);
        sgApp->getMessageSink()->clear();
    }
    void TearDown() override {
        list.clear();
        scene->clear();
    }

    QString writeFile(const QString &name, const QByteArray &data) {
        return sgTestWriteFile(dir.filePath(name), data);
    }
    // The nodes the run tried, in order, from the host log.
    QStringList triedNodes() const {
        QStringList nodes;
        for (const QString &line : sgApp->getMessageSink()->logLines()) {
            if (line.startsWith("Creating morph for "))
                nodes.append(line.mid(19).chopped(3));
        }
        return nodes;
    }
    SgMessageSink::Progress lastProgress() const {
        const auto runs = sgApp->getMessageSink()->progressRuns();
        return runs.isEmpty() ? SgMessageSink::Progress() : runs.last();
    }
};

TEST_F(FigureScene, ModesZeroAndTwoChooseTheSelectedFigureOrThePrimarySelection) {
    list.addFile(writeFile("lift.obj", figureTarget(0.5, 0)));
    scene->selectNode(neck);
    list.createMorphs(options, 0, log);

    EXPECT_EQ(triedNodes(), QStringList({"neck", "head", "Figure"}));
    EXPECT_TRUE(hasMorph(head, "lift"));
    EXPECT_FALSE(hasMorph(neck, "lift"));
    EXPECT_TRUE(log.toHtml().contains("Created morph successfully."));
    const SgMessageSink::Progress progress = lastProgress();
    EXPECT_EQ(progress.total, 3);
    EXPECT_TRUE(progress.finished);

    // Nothing selected: no targets, so the file makes no morph, and the log says so.
    scene->clearSelection();
    sgApp->getMessageSink()->clear();
    SgMorphLoadLog empty;
    static_cast<SgMorphFileItem *>(list.topLevelItem(0))->loader().setMorphName("again");
    list.createMorphs(options, 0, empty);
    EXPECT_TRUE(triedNodes().isEmpty());
    EXPECT_EQ(lastProgress().total, 0);
    EXPECT_TRUE(empty.hasProblems());
    EXPECT_FALSE(hasMorph(head, "again"));

    // Mode 2 loads onto the primary selection only.
    list.clear();
    list.addFile(writeFile("dent.obj", "v 0 2 0.5\nv 1 2 0\nv 0 3 0\nf 1 2 3\n"));
    scene->selectNode(neck);
    scene->selectNode(prop, true);
    SgMorphLoadLog primary;
    list.createMorphs(options, 2, primary);
    EXPECT_EQ(triedNodes(), QStringList({"box"}));
    EXPECT_TRUE(hasMorph(prop, "dent"));
    EXPECT_FALSE(primary.hasProblems());
    EXPECT_EQ(lastProgress().total, 2);
}

TEST_F(FigureScene, ModeOneRunsSourcesTopDownOnTheSelectionAndAsksOnAFailedPose) {
    list.addFile(writeFile("first.obj", figureTarget(0, 0.5)));
    list.addFile(writeFile("second.obj", figureTarget(0, 0.25)));
    list.addFile(writeFile("third.obj", figureTarget(0, 0.75)));
    // The poses of "third" (on top) and "first" cannot load: the user declines to go on
    // without it for "third" and goes on for "first".
    const QString missing = dir.filePath("missing.sgs");
    for (int row : {0, 2}) {
        SgMorphLoader &loader = static_cast<SgMorphFileItem *>(list.topLevelItem(row))->loader();
        loader.setReverseModifiers(true);
        loader.setPoseFile(missing);
    }
    scene->selectNode(neck);
    QString text;
    {
        SgTestModalAnswer answer({sgTestPressButton(QMessageBox::No, nullptr, &text),
                                  sgTestPressButton(QMessageBox::Ok)});
        list.createMorphs(options, 1, log);
        EXPECT_EQ(answer.titles(), QStringList({"Pose File Error", "Pose File Error"}));
    }
    EXPECT_EQ(text, "Failed to load the pose file: \n" + missing +
                        "\nFor the morph: third\n\nDo you wish to continue loading this morph?");
    const QString html = log.toHtml();
    EXPECT_FALSE(html.contains("Loading morph third..."));
    EXPECT_LT(html.indexOf("Loading morph second..."), html.indexOf("Loading morph first..."));
    EXPECT_GE(html.indexOf("Loading morph second..."), 0);
    EXPECT_EQ(triedNodes(), QStringList({"neck", "neck"}));
    EXPECT_TRUE(hasMorph(neck, "first"));
    EXPECT_TRUE(hasMorph(neck, "second"));
    EXPECT_FALSE(hasMorph(neck, "third"));
    EXPECT_FALSE(hasMorph(head, "first"));
    EXPECT_EQ(lastProgress().total, 3); // one target times three file rows
}

TEST_F(FigureScene, TheInMemorySourceTargetsItsOwnFiguresBones) {
    SgObjReader reader;
    const QByteArray obj = figureTarget(0.5, 0.5);
    ASSERT_TRUE(reader.readBuffer(obj.constData(), size_t(obj.size()), "returned"));
    SgPolyMesh *mesh = reader.takeMesh();
    mesh->ref();
    list.addFile(writeFile("lift.obj", figureTarget(0.5, 0)));
    SgMorphMeshItem *source = list.addMesh(mesh, figure);
    mesh->unref(); // the row keeps its own reference
    // The row starts on a welded export with reverse deformations, so that a returned figure
    // maps onto its bones; this mesh is not welded: its groups are taken as they are.
    SgMorphLoader &loader = source->loader();
    EXPECT_TRUE(loader.scenaraExported() && loader.weldedGeometry() &&
                loader.removedUnusedVertices() && loader.reverseModifiers());
    EXPECT_FALSE(loader.ignoredInvisibleNodes());
    loader.setScenaraExported(false);
    loader.setReverseModifiers(false);
    scene->selectNode(prop);

    list.createMorphs(options, 1, log);
    // The in-memory row (on top) runs first on the figure's bones; the file row on the prop.
    EXPECT_EQ(triedNodes(), QStringList({"neck", "head", "box"}));
    EXPECT_TRUE(hasMorph(head, "FacMorph"));
    EXPECT_TRUE(hasMorph(neck, "FacMorph"));
    EXPECT_FALSE(hasMorph(figure, "FacMorph"));
    // Only file rows from the top are counted, and the in-memory row stops the count.
    EXPECT_EQ(lastProgress().total, 0);
}

// The node row starts on the figure of the selection and finds bones by name; the group,
// property and node rows open the property UI's chooser menus.
TEST_F(FigureScene, NodeGroupAndPropertyRowsFollowTheSceneAndTheirMenus) {
    auto *smile = new SgFloatProperty("Smile");
    smile->setPath("Morphs/Face");
    ASSERT_EQ(figure->addProperty(smile), 0);
    scene->selectNode(head);
    auto *file = new SgMorphFileItem(&list, "/m/a.obj");
    SgMorphLoader &loader = file->loader();
    list.show();
    list.expandAll();
    const auto row = [&](const QString &label) { return findRow(list.invisibleRootItem(), label); };
    const auto choose = [&](const QString &label, const QString &entry) {
        return editWithPopup(list, row(label), entry);
    };
    SgMorphSourceItem *node = row("Node:");
    EXPECT_EQ(loader.controlNode(), figure);
    EXPECT_EQ(node->valueText(), "Figure");
    node->setValueText("head");
    EXPECT_EQ(loader.controlNode(), head);
    node->setValueText("tail"); // no such bone: the figure itself
    EXPECT_EQ(loader.controlNode(), figure);
    node->setValueText("");
    EXPECT_EQ(node->text(1), "- none -");
    EXPECT_EQ(loader.controlNode(), figure);

    choose("Property Group:", "Morphs/Face"); // the menu's entries: test_property_menus
    EXPECT_EQ(loader.morphGroup(), "Morphs/Face");

    loader.setControlProperty(smile);
    EXPECT_EQ(row("Property:")->text(1), "Smile");
    choose("Property:", "a"); // the morph name: no separate property
    EXPECT_EQ(loader.controlProperty(), nullptr);
    EXPECT_EQ(row("Property:")->text(1), "a");

    EXPECT_EQ(choose("Node:", "box"), QStringList({"Figure", "neck", "head", "box"}));
    EXPECT_EQ(loader.controlNode(), prop);
    EXPECT_EQ(node->text(1), "box");

    // Without a selected figure a stored name finds nothing and changes nothing.
    scene->clearSelection();
    node->setValueText("head");
    EXPECT_EQ(loader.controlNode(), prop);
    auto *other = new SgMorphFileItem(&list, "/m/b.obj");
    EXPECT_EQ(other->loader().controlNode(), nullptr);

    // With the control off, the node and property rows open nothing.
    static_cast<SgMorphSourceBoolItem *>(findRow(file, "Create Control Property:"))
        ->setValue(false);
    SgTestModalAnswer none(sgTestChooseMenu({"Figure"}), 300);
    list.showContextMenu(node, list.viewport()->mapToGlobal(QPoint(5, 5)), 1);
    EXPECT_FALSE(none.answered());
    EXPECT_EQ(loader.controlNode(), prop);
}

} // namespace
