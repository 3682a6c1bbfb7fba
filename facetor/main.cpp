// Facetor, the reference modeler: the modeler's side of the shared-memory link with the host.

#include "facetor/sgfacetormodeler.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QDir>
#include <QTextStream>

#include <csignal>

namespace {

void onSignal(int) {
    SgFacetorModeler::requestQuit();
}

// An option's value from the command line, else from the environment variable `variable`.
QString valueOf(const QCommandLineParser &parser, const QCommandLineOption &option,
                const char *variable) {
    if (parser.isSet(option))
        return parser.value(option);
    return qEnvironmentVariable(variable);
}

bool flagOf(const QCommandLineParser &parser, const QCommandLineOption &option,
            const char *variable) {
    if (parser.isSet(option))
        return true;
    const QString value = qEnvironmentVariable(variable);
    return !value.isEmpty() && value != QLatin1String("0");
}

} // namespace

int main(int argc, char *argv[]) {
    QCoreApplication app(argc, argv);
    QCoreApplication::setApplicationName(QStringLiteral("Facetor"));

    QCommandLineParser parser;
    parser.setApplicationDescription(QStringLiteral(
        "Reference modeler for the Facetor Bridge. Started by the host with -sgl, it links to the "
        "host's control segment, asks for the selected nodes, writes each one as an OBJ file with "
        "an MTL file into its workspace and acknowledges it. It returns geometry to the host when "
        "a watched workspace OBJ file is saved (--watch), for each OBJ file given with --return, "
        "or for every received node after a scripted edit (--edit). It tells the host when it "
        "quits, also on SIGINT and SIGTERM.\n\n"
        "Every option may also be given through the environment variable in brackets; the host "
        "starts the modeler with -sgl alone, so that is how options reach a launched modeler."));
    parser.addHelpOption();
    const QCommandLineOption link(QStringLiteral("sgl"),
                                  QStringLiteral("Link to the host (required)."));
    const QCommandLineOption workspace(
        QStringLiteral("workspace"),
        QStringLiteral("Folder for received nodes [FACETOR_WORKSPACE]; default: the folder "
                       "\"facetor-workspace\" in the system's temporary folder."),
        QStringLiteral("folder"));
    const QCommandLineOption edit(
        QStringLiteral("edit"),
        QStringLiteral(
            "Return every received node after this edit [FACETOR_EDIT]. Steps, "
            "separated by ';': move=dx,dy,dz  scale=f  vertex=i,dx,dy,dz  extra=x,y,z  "
            "name=TEXT  diffuse=r,g,b (offsets in the modeler's units, the host's times 0.1)."),
        QStringLiteral("script"));
    const QCommandLineOption returnFile(
        QStringLiteral("return"),
        QStringLiteral("Return this OBJ file once the selection has arrived; may be repeated "
                       "[FACETOR_RETURN, several separated by ':']. Its \"o\" line, else its "
                       "base name, names the geometry."),
        QStringLiteral("file"));
    const QCommandLineOption watch(
        QStringLiteral("watch"),
        QStringLiteral("Return a workspace OBJ file whenever it is saved [FACETOR_WATCH=1]."));
    const QCommandLineOption expect(
        QStringLiteral("expect"),
        QStringLiteral("The selection is complete after this many nodes [FACETOR_EXPECT]; "
                       "otherwise when the host's idle notice is not followed by a node."),
        QStringLiteral("count"));
    const QCommandLineOption quitWhenDone(
        QStringLiteral("quit-when-done"),
        QStringLiteral("Quit once the selection has arrived and every return has been read "
                       "[FACETOR_QUIT_WHEN_DONE=1]."));
    const QCommandLineOption logFile(
        QStringLiteral("log"),
        QStringLiteral("Append one line per event to this file [FACETOR_LOG]; default: standard "
                       "error."),
        QStringLiteral("file"));
    const QCommandLineOption linkTimeout(
        QStringLiteral("link-timeout"),
        QStringLiteral("Give up when the host has not set the link up within this many "
                       "milliseconds [FACETOR_LINK_TIMEOUT]; default 30000."),
        QStringLiteral("ms"));
    const QCommandLineOption hostTimeout(
        QStringLiteral("host-timeout"),
        QStringLiteral("Quit when the linked host has sent nothing (not even its idle notice) "
                       "for this many milliseconds [FACETOR_HOST_TIMEOUT]; default 10000, 0 "
                       "waits for ever."),
        QStringLiteral("ms"));
    parser.addOptions({link, workspace, edit, returnFile, watch, expect, quitWhenDone, logFile,
                       linkTimeout, hostTimeout});
    // The host passes its switch with a single dash.
    parser.setSingleDashWordOptionMode(QCommandLineParser::ParseAsLongOptions);
    parser.process(app);

    if (!parser.isSet(link)) {
        QTextStream(stderr) << "Facetor: start with -sgl to link to the host (see --help).\n";
        return 2;
    }

    SgFacetorOptions options;
    options.workspace = valueOf(parser, workspace, "FACETOR_WORKSPACE");
    if (options.workspace.isEmpty())
        options.workspace = QDir::temp().filePath(QStringLiteral("facetor-workspace"));
    options.editScript = valueOf(parser, edit, "FACETOR_EDIT");
    options.returnFiles = parser.values(returnFile);
    if (options.returnFiles.isEmpty() && !qEnvironmentVariableIsEmpty("FACETOR_RETURN"))
        options.returnFiles =
            qEnvironmentVariable("FACETOR_RETURN").split(QLatin1Char(':'), Qt::SkipEmptyParts);
    options.watch = flagOf(parser, watch, "FACETOR_WATCH");
    options.expect = valueOf(parser, expect, "FACETOR_EXPECT").toInt();
    options.quitWhenDone = flagOf(parser, quitWhenDone, "FACETOR_QUIT_WHEN_DONE");
    options.logFile = valueOf(parser, logFile, "FACETOR_LOG");
    const QString timeout = valueOf(parser, linkTimeout, "FACETOR_LINK_TIMEOUT");
    if (!timeout.isEmpty())
        options.linkTimeoutMs = timeout.toInt();
    const QString silence = valueOf(parser, hostTimeout, "FACETOR_HOST_TIMEOUT");
    if (!silence.isEmpty())
        options.hostTimeoutMs = silence.toInt();

    std::signal(SIGINT, onSignal);
    std::signal(SIGTERM, onSignal);

    SgFacetorModeler modeler(options);
    if (!modeler.start())
        return 1;
    return app.exec();
}
