// The scenara executable in headless mode, with the reference modeler as a second process: the
// demonstration's round trip makes one morph per moved bone and exports the figure at morph
// value 1; a failing script ends with a non-zero status; command-line switches reach the host.

#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/io/sgobjreader.h"

#include "tests/support/sgtestmain.h"
#include "tests/support/sgtestprocess.h"

#include <QProcess>
#include <QProcessEnvironment>

#include <tuple>

#include <gtest/gtest.h>

namespace {

struct ScenaraRun {
    int status = -1;
    QString out;
    QString err;
};

// The scenara program run offscreen with settings of its own; the modeler it launches applies
// `edit` and quits once its one return has been read.
class Scenara {
public:
    explicit Scenara(const QByteArray &edit = QByteArray())
        : m_modeler(
              FACETOR_BIN_DIR,
              {{"FACETOR_EXPECT", "1"}, {"FACETOR_QUIT_WHEN_DONE", "1"}, {"FACETOR_EDIT", edit}}) {}
    QString path(const char *name) const { return m_modeler.path(QString::fromLatin1(name)); }
    QString script(const char *name, const QByteArray &text) const {
        return sgTestWriteFile(path(name), text);
    }
    ScenaraRun run(const QStringList &arguments) const {
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        environment.insert(QStringLiteral("QT_QPA_PLATFORM"), QStringLiteral("offscreen"));
        environment.insert(QStringLiteral("SCENARA_SETTINGS"), path("scenara.ini"));
        QProcess process;
        process.setProcessEnvironment(environment);
        process.start(QStringLiteral(SCENARA_BIN), arguments);
        if (!process.waitForFinished(90000)) {
            process.kill();
            process.waitForFinished();
        }
        return {process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1,
                QString::fromUtf8(process.readAllStandardOutput()),
                QString::fromUtf8(process.readAllStandardError())};
    }

private:
    SgTestModeler m_modeler;
};

} // namespace

TEST(HeadlessDemo, RoundTripMakesMorphsAndExportsTheFigureAtValueOne) {
    // The modeler scales what it receives by 1.25 about the origin (its units are the host's
    // times 0.1, so this is the same scale in the host's units).
    const Scenara scenara("scale=1.25");
    const ScenaraRun run =
        scenara.run({QStringLiteral("--script"),
                     QStringLiteral(SG_EXAMPLES_DIR "/demo/send-figure.js"), QStringLiteral("--"),
                     QStringLiteral(SG_EXAMPLES_DIR "/demo/scene.json"), scenara.path("")});
    ASSERT_EQ(run.status, 0) << run.out.toStdString() << run.err.toStdString();
    EXPECT_TRUE(run.out.contains(QStringLiteral("morphs created: 3"))) << run.out.toStdString();
    EXPECT_TRUE(run.out.contains(QStringLiteral(
        "control property MyMorph on Blobby: value 1, range -1 to 1 (clamped), group \"Morphs\"")))
        << run.out.toStdString();

    SgObjReader original;
    ASSERT_TRUE(original.readFile(QStringLiteral(SG_EXAMPLES_DIR "/demo/figure.obj")));
    SgObjReader exported;
    ASSERT_TRUE(exported.readFile(scenara.path("Blobby-morphed.obj")))
        << exported.getErrorString().toStdString();
    // Bone by bone, each bone's vertices are the figure file's group vertices, scaled.
    const SgPolyMesh *source = original.getMesh();
    const SgPolyMesh *result = exported.getMesh();
    int offset = 0;
    for (const char *bone : {"hip", "chest", "head"}) {
        const std::vector<int32_t> vertices =
            source->getFaceGroupVertices(source->findFaceGroup(QString::fromLatin1(bone)));
        ASSERT_GE(result->findFaceGroup(QString::fromLatin1(bone)), 0) << bone;
        for (size_t i = 0; i < vertices.size(); ++i) {
            const SgVec3 expected = source->getVertex(vertices[i]) * 1.25f;
            EXPECT_LT((result->getVertex(offset + int(i)) - expected).length(), 1e-4) << bone << i;
        }
        offset += int(vertices.size());
    }
    EXPECT_EQ(offset, result->getVertexCount());
    // Nothing of the bridge's segments is left behind.
    EXPECT_TRUE(sgTestLeftovers().isEmpty()) << sgTestLeftovers().join(' ').toStdString();
}

TEST(HeadlessDemo, ScriptFailuresArgumentsAndADeclinedReturn) {
    // The modeler returns the prop with a vertex more: no morph can be made.
    const Scenara scenara("extra=0,0,5");
    // A script that throws ends with a non-zero status and names its line; so do a syntax
    // error, an exception inside a waited-for callback, and a missing file.
    for (const auto &[name, text, says] :
         {std::tuple<const char *, QByteArray, const char *>{
              "throw.js", "var a = 1;\nthrow new Error('broken');\n", ":2: Error: broken"},
          {"syntax.js", "var = ;\n", ""},
          {"later.js", "app.later(10, function () { throw new Error('late'); });\n", ""},
          {"none.js", QByteArray(), ""}}) {
        const ScenaraRun run =
            scenara.run({QStringLiteral("--script"),
                         text.isNull() ? scenara.path(name) : scenara.script(name, text)});
        EXPECT_NE(run.status, 0) << name;
        EXPECT_TRUE(run.err.contains(QString::fromLatin1(says))) << run.err.toStdString();
    }
    // Host arguments reach the plug-ins' view of the command line; script arguments follow "--".
    const ScenaraRun args =
        scenara.run({QStringLiteral("--script"),
                     scenara.script("args.js", "app.print('host=' + app.hostArguments.join(','));\n"
                                               "app.print('script=' + app.arguments.join(','));\n"
                                               "app.print('classes=' + (typeof SgFacBridge));\n"),
                     QStringLiteral("-facbridge"), QStringLiteral("--"), QStringLiteral("one"),
                     QStringLiteral("two")});
    EXPECT_EQ(args.status, 0) << args.err.toStdString();
    EXPECT_TRUE(args.out.contains(QStringLiteral("host=--script,"))) << args.out.toStdString();
    EXPECT_TRUE(args.out.contains(QStringLiteral(",-facbridge\n")));
    EXPECT_TRUE(args.out.contains(QStringLiteral("script=one,two\n")));
    EXPECT_TRUE(args.out.contains(QStringLiteral("classes=function\n")));

    // A closed box does not end the script; it declines the prop that the host offers instead
    // of a morph, and learns so.
    const ScenaraRun run = scenara.run(
        {QStringLiteral("--script"),
         scenara.script("declined.js",
                        "var bridge = app.action('Send to Facetor...');\n"
                        "app.onQuestion(function (title) { app.print('asked ' + title);"
                        " return 'No'; });\n"
                        "bridge.trigger();\n" // nothing selected: "Launch Facetor", answered No
                        "app.later(200, function () {\n"
                        "    app.print('still running');\n"
                        "    selection.select('Box');\n"
                        "    bridge.trigger();\n"
                        "    app.waitForBridge(bridge, 30000, function (outcome) {\n"
                        "        app.print('outcome ' + outcome);\n"
                        "        app.exit(outcome === 'declined' ? 3 : 4);\n"
                        "    });\n"
                        "});\n"),
         QStringLiteral(SG_EXAMPLES_DIR "/demo/scene.json")});
    const qsizetype asked = run.out.indexOf(QStringLiteral("asked Launch Facetor\n"));
    EXPECT_GE(asked, 0) << run.out.toStdString() << run.err.toStdString();
    EXPECT_GT(run.out.indexOf(QStringLiteral("still running\n")), asked);
    EXPECT_TRUE(run.out.contains(QStringLiteral("asked Changed Geometry\n")));
    EXPECT_TRUE(run.out.contains(QStringLiteral("outcome declined\n")));
    EXPECT_EQ(run.status, 3);
}
