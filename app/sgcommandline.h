#pragma once

#include <QString>
#include <QStringList>

// What the application was asked to do on its command line:
//   scenara [--script FILE] [--plugins DIR] [SCENE.json] [other arguments...]
// Every argument, known or not, is also handed to the host's command arguments, so that plug-ins
// see switches such as "-facbridge". Arguments after "--" are left to the script alone.
struct SgCommandLine {
    QString scriptFile;          // headless mode when not empty
    QString pluginFolder;        // empty: the default folder next to the executable
    QString sceneFile;           // a scene to open at start, empty for none
    QStringList hostArguments;   // all arguments, program name excluded
    QStringList scriptArguments; // the arguments after "--", for the script
    QString error;               // not empty when the command line is unusable
    bool help = false;

    // Parses the arguments (program name first, as main() receives them).
    static SgCommandLine parse(const QStringList &arguments);

    // The usage text printed for "--help" and after a command-line error.
    static QString usage();
};
