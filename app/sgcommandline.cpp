#include "app/sgcommandline.h"

SgCommandLine SgCommandLine::parse(const QStringList &arguments) {
    SgCommandLine line;
    for (qsizetype i = 1; i < arguments.size(); ++i) {
        const QString &argument = arguments.at(i);
        if (argument == QLatin1String("--")) {
            line.scriptArguments = arguments.mid(i + 1);
            break;
        }
        line.hostArguments.append(argument);
        const bool takesValue =
            argument == QLatin1String("--script") || argument == QLatin1String("--plugins");
        if (takesValue) {
            if (i + 1 >= arguments.size()) {
                line.error = QStringLiteral("%1 needs a value.").arg(argument);
                return line;
            }
            const QString value = arguments.at(++i);
            line.hostArguments.append(value);
            (argument == QLatin1String("--script") ? line.scriptFile : line.pluginFolder) = value;
        } else if (argument == QLatin1String("--help") || argument == QLatin1String("-h")) {
            line.help = true;
        } else if (!argument.startsWith(QLatin1Char('-')) && line.sceneFile.isEmpty()) {
            line.sceneFile = argument;
        }
    }
    return line;
}

QString SgCommandLine::usage() {
    return QStringLiteral(
        "Usage: scenara [--script FILE] [--plugins DIR] [SCENE.json] [-facbridge] [-- ARGS...]\n"
        "\n"
        "Without --script a main window opens with the scene tree, the plug-ins' actions, a log\n"
        "pane and a property panel. With --script FILE no window opens: the JavaScript file runs\n"
        "in the host's script engine and the exit status tells whether it succeeded.\n"
        "\n"
        "  --script FILE  run FILE headless (globals: app, scene, selection; plug-in classes)\n"
        "  --plugins DIR  load plug-ins from DIR (default: $SCENARA_PLUGIN_PATH, else the\n"
        "                 folder \"plugins\" beside the executable's folder)\n"
        "  SCENE.json     a scene file to open at start\n"
        "  -facbridge     link the Facetor bridge to an already running modeler\n"
        "  -- ARGS...     arguments for the script (app.arguments)\n");
}
