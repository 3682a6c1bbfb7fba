#include "enginetestsupport.h"

#include "sgcore/app/sgimporter.h"
#include "sgcore/app/sgimportmgr.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/morph/sgmorphdeltas.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloadlog.h"

#include <QTemporaryDir>

#include <memory>

using namespace enginetest;

namespace {

class TextImporter : public SgImporter {
public:
    QString getName() const override { return "Text"; }
    QStringList getExtensions() const override { return {"txt"}; }
};

} // namespace

class GeometryImport : public EngineTest {};

TEST_F(GeometryImport, FileLoadsMakeMorphsOrReportWhyNot) {
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
    auto *morph = dynamic_cast<SgMorph *>(node->getObject()->findModifier("Brow"));
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
