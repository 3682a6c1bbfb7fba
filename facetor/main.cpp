// Facetor, the reference modeler: the modeler's side of the shared-memory link with the host.

#include "facetor/sgfacetormodeler.h"
#include "facetor/sgfacetorsettings.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QDir>
#include <QTextStream>

#include <csignal>

namespace {

void onSignal(int signal) {
    SgFacetorModeler::requestQuit(signal);
}

// An option's value: from the command line, else the environment variable `variable`, else
// the settings file's `key`.
QString valueOf(const QCommandLineParser &parser, const QCommandLineOption &option,
                const char *variable, const SgFacetorSettings &settings, const char *key) {
    if (parser.isSet(option))
        return parser.value(option);
    if (!qEnvironmentVariableIsEmpty(variable))
        return qEnvironmentVariable(variable);
    return settings.value(key);
}

// A switch: set on the command line, else a value other than "0", "false" or "" in the
// environment or the settings file.
bool flagOf(const QCommandLineParser &parser, const QCommandLineOption &option,
            const char *variable, const SgFacetorSettings &settings, const char *key) {
    if (parser.isSet(option))
        return true;
    const QString value = valueOf(parser, option, variable, settings, key).trimmed().toLower();
    return !value.isEmpty() && value != QLatin1String("0") && value != QLatin1String("false");
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
        "The host starts the modeler with -sgl alone, so options also come from the environment "
        "variable in brackets and, failing that, from the settings file "
        "($XDG_CONFIG_HOME or ~/.config)/Facetor/Facetor.ini, whose [General] keys are in "
        "braces. A command-line option overrides the variable, which overrides the file."));
    parser.addHelpOption();
    const QCommandLineOption link(QStringLiteral("sgl"),
                                  QStringLiteral("Link to the host (required)."));
    const QCommandLineOption workspace(
        QStringLiteral("workspace"),
        QStringLiteral("Folder for received nodes [FACETOR_WORKSPACE] {workspace}; default: the "
                       "folder "
                       "\"facetor-workspace\" in the system's temporary folder."),
        QStringLiteral("folder"));
    const QCommandLineOption edit(
        QStringLiteral("edit"),
        QStringLiteral(
            "Return every received node after this edit [FACETOR_EDIT] {edit}. Steps, "
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
        QStringLiteral("Return a workspace OBJ file whenever it is saved [FACETOR_WATCH=1] "
                       "{watch=true}: once it has stopped changing for the settle time and "
                       "reads whole."));
    const QCommandLineOption settleTime(
        QStringLiteral("settle-time"),
        QStringLiteral("With --watch: how long a saved file must stay unchanged before it is "
                       "returned [FACETOR_SETTLE_TIME] {settleTime}; default 300."),
        QStringLiteral("ms"));
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
        QStringLiteral("Append one line per event to this file [FACETOR_LOG] {log}; default: "
                       "standard error."),
        QStringLiteral("file"));
    const QCommandLineOption linkTimeout(
        QStringLiteral("link-timeout"),
        QStringLiteral("Give up when the host has not set the link up within this many "
                       "milliseconds [FACETOR_LINK_TIMEOUT] {linkTimeout}; default 30000."),
        QStringLiteral("ms"));
    const QCommandLineOption hostTimeout(
        QStringLiteral("host-timeout"),
        QStringLiteral("Quit when the linked host has sent nothing (not even its idle notice) "
                       "for this many milliseconds [FACETOR_HOST_TIMEOUT] {hostTimeout}; "
                       "default 10000, 0 waits for ever."),
        QStringLiteral("ms"));
    parser.addOptions({link, workspace, edit, returnFile, watch, settleTime, expect, quitWhenDone,
                       logFile, linkTimeout, hostTimeout});
    // The host passes its switch with a single dash.
    parser.setSingleDashWordOptionMode(QCommandLineParser::ParseAsLongOptions);
    parser.process(app);

    if (!parser.isSet(link)) {
        QTextStream(stderr) << "Facetor: start with -sgl to link to the host (see --help).\n";
        return 2;
    }

    const SgFacetorSettings settings;
    SgFacetorOptions options;
    options.workspace = valueOf(parser, workspace, "FACETOR_WORKSPACE", settings, "workspace");
    if (options.workspace.isEmpty())
        options.workspace = QDir::temp().filePath(QStringLiteral("facetor-workspace"));
    options.editScript = valueOf(parser, edit, "FACETOR_EDIT", settings, "edit");
    options.returnFiles = parser.values(returnFile);
    if (options.returnFiles.isEmpty() && !qEnvironmentVariableIsEmpty("FACETOR_RETURN"))
        options.returnFiles =
            qEnvironmentVariable("FACETOR_RETURN").split(QLatin1Char(':'), Qt::SkipEmptyParts);
    options.watch = flagOf(parser, watch, "FACETOR_WATCH", settings, "watch");
    options.expect = valueOf(parser, expect, "FACETOR_EXPECT", settings, "expect").toInt();
    options.quitWhenDone =
        flagOf(parser, quitWhenDone, "FACETOR_QUIT_WHEN_DONE", settings, "quitWhenDone");
    options.logFile = valueOf(parser, logFile, "FACETOR_LOG", settings, "log");
    // A number that does not read keeps the default.
    auto number = [&](const QCommandLineOption &option, const char *variable, const char *key,
                      int &out) {
        bool ok = false;
        const int value = valueOf(parser, option, variable, settings, key).toInt(&ok);
        if (ok && value >= 0)
            out = value;
    };
    number(linkTimeout, "FACETOR_LINK_TIMEOUT", "linkTimeout", options.linkTimeoutMs);
    number(hostTimeout, "FACETOR_HOST_TIMEOUT", "hostTimeout", options.hostTimeoutMs);
    number(settleTime, "FACETOR_SETTLE_TIME", "settleTime", options.settleMs);

    std::signal(SIGINT, onSignal);
    std::signal(SIGTERM, onSignal);

    SgFacetorModeler modeler(options);
    if (!modeler.start())
        return 1;
    return app.exec();
}
