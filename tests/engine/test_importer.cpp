#include "enginetestsupport.h"

#include "sgcore/app/sgimporter.h"
#include "sgcore/app/sgimportmgr.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/importer/sggeometryimporter.h"
#include "sgcore/importer/sgobjgeometryimporter.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloadlog.h"

#include <QTemporaryDir>

#include <memory>

using namespace enginetest;

namespace {

QString writeFile(const QTemporaryDir &dir, const QString &name, const QByteArray &text) {
    return sgTestWriteFile(dir.filePath(name), text);
}

// OBJ text for the vertices of `mesh`, with vertex `moved` shifted by `by`, and one face.
QByteArray objOf(const SgVertexMesh &mesh, int moved, const SgVec3 &by, const char *x = nullptr) {
    QByteArray text = "# target\n";
    for (int i = 0; i < mesh.getVertexCount(); ++i) {
        SgVec3 p = mesh.getVertex(i);
        if (i == moved)
            p += by;
        text += QByteArray("v ") + QByteArray::number(p.x, 'g', 9) + ' ' +
                (x && i == moved ? QByteArray(x) : QByteArray::number(p.y, 'g', 9)) + ' ' +
                QByteArray::number(p.z, 'g', 9) + '\n';
    }
    text += "f 1 2 3\n";
    return text;
}

class TextImporter : public SgImporter {
public:
    QString getName() const override { return "Text"; }
    QStringList getExtensions() const override { return {"txt"}; }
};

} // namespace

class GeometryImport : public EngineTest {};

TEST_F(GeometryImport, SettingsTravelAsTextOverDefaults) {
    SgObjGeometryImporter importer;
    SgFileIOSettings defaults;
    ASSERT_TRUE(importer.getDefaultOptions(defaults, 0));

    SgFileIOSettings chosen;
    chosen.setValue("Scale", 2.5);
    chosen.setValue("InvertLatAxis", true);
    chosen.setValue("Preset", "Custom");
    ASSERT_TRUE(defaults.fromString(chosen.toString()));
    EXPECT_DOUBLE_EQ(defaults.doubleValue("Scale", 0.0), 2.5);
    EXPECT_TRUE(defaults.boolValue("InvertLatAxis", false));
    EXPECT_EQ(defaults.stringValue("LatAxis", ""), QString("X")); // untouched default
    EXPECT_EQ(defaults.stringValue("Preset", ""), QString("Custom"));

    const QString before = defaults.toString();
    for (const char *bad : {"{", "[1,2]"})
        EXPECT_FALSE(defaults.fromString(bad)) << bad;
    EXPECT_EQ(defaults.toString(), before);
}

TEST_F(GeometryImport, ObjImporterKeepsOrderAndAppliesAxesInversionAndScale) {
    QTemporaryDir dir;
    const QString path =
        writeFile(dir, "target.obj", "v 1 2 3\nv 4 5 6\nv 7 8 9\ng top\nf 3 1 2\n");
    SgImporter *found = sgApp->getImportMgr()->findImporter(path);
    auto *importer = dynamic_cast<SgGeometryImporter *>(found);
    ASSERT_TRUE(importer);
    EXPECT_EQ(sgApp->getImportMgr()->findImporter(dir.filePath("x.OBJ")), found);

    SgFileIOSettings options;
    importer->getDefaultOptions(options, 0);
    options.setValue("VertAxis", "Z");
    options.setValue("DepthAxis", "Y");
    options.setValue("InvertDepthAxis", true);
    options.setValue("Scale", 2.0);
    SgShape *shape = nullptr;
    ASSERT_EQ(importer->importGeometry(path, shape, options), 0);
    std::unique_ptr<SgShape> owned(shape);
    const auto *mesh = dynamic_cast<const SgPolyMesh *>(shape->getGeometry());
    ASSERT_TRUE(mesh);
    EXPECT_EQ(shape->getName(), QString("target"));
    ASSERT_EQ(mesh->getVertexCount(), 3);
    EXPECT_EQ(mesh->getVertex(0), SgVec3(2, 6, -4));
    EXPECT_EQ(mesh->getVertex(2), SgVec3(14, 18, -16));
    EXPECT_EQ(mesh->findFaceGroup("top"), 0);

    options.setValue("LatAxis", "Z"); // Z named twice
    EXPECT_NE(importer->importGeometry(path, shape, options), 0);
    EXPECT_EQ(shape, nullptr);
    options.setValue("LatAxis", "X");
    options.setValue("Scale", 0.0);
    EXPECT_NE(importer->importGeometry(path, shape, options), 0);
}

TEST_F(GeometryImport, FileLoadsMakeMorphsOrReportWhyNot) {
    QTemporaryDir dir;
    auto *node = sgTestNode("Head", sgTestRowMesh(12));
    scene()->addNode(node);
    SgMorphLoader loader;
    loader.setMorphName("Brow");
    loader.setCreateControl(false);
    SgFileIOSettings options;

    loader.setFilename(
        writeFile(dir, "brow.obj", objOf(*sgTestGeometry(node), 6, SgVec3(0, 0, 0.25f))));
    SgMorphLoadLog log;
    loader.loadMorphForNode(options, node, log);
    EXPECT_EQ(log.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\nLoading morph Brow...<BR>"
                                    "\nCreated morph successfully.<BR>\n</BODY>"));
    EXPECT_TRUE(statusLines().contains("Loading Morph: brow.obj"));
    auto *morph = dynamic_cast<SgMorph *>(node->getObject()->findModifier("Brow"));
    ASSERT_TRUE(morph);
    EXPECT_EQ(morph->getDeltas()->getVertex(0), 6);

    // Each failure to read ends in its status line, one log error and no morph.
    sgApp->getImportMgr()->addImporter(new TextImporter);
    const QString missing = dir.filePath("missing.obj");
    const QString unknown = dir.filePath("notes.xyz");
    const QString text = writeFile(dir, "notes.txt", "hello");
    const QString broken = writeFile(dir, "broken.obj", "v 1 2\nf 1 9 9\n");
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

    // A target whose coordinates are not numbers never becomes a morph.
    for (const char *bad : {"nan", "inf", "1e39"}) {
        SgMorphLoadLog invalid;
        loader.setFilename(
            writeFile(dir, "bad.obj", objOf(*sgTestGeometry(node), 3, SgVec3(), bad)));
        loader.loadMorphForNode(options, node, invalid);
        EXPECT_TRUE(invalid.hasProblems()) << bad;
        EXPECT_FALSE(node->getObject()->findModifier("Other")) << bad;
    }
    EXPECT_EQ(node->getObject()->getModifierCount(), 1);
}
