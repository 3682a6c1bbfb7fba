// scenara: the host application. Window mode shows the scene with the plug-ins' actions;
// headless mode (--script FILE) runs a JavaScript file and exits with its status.

#include "app/sgappwindow.h"
#include "app/sgcommandline.h"
#include "app/sgpluginhost.h"
#include "app/sgscripthost.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/app/sgheappolicy.h"
#include "sgcore/io/sgscenefile.h"
#include "sgcore/plugin/sgaction.h"

#include <QApplication>
#include <QFileInfo>
#include <QTimer>

#include <cstdio>
#include <memory>

namespace {

QStringList argumentList(int argc, char **argv) {
    QStringList list;
    for (int i = 0; i < argc; ++i)
        list.append(QString::fromLocal8Bit(argv[i]));
    return list;
}

// A user who starts the application from its build or install folder finds the modeler beside
// it: the install path defaults to that folder until the user sets one ("Preferences...").
void defaultModelerPath() {
    SgAppSettings settings;
    const QString key = QStringLiteral("FacetorInstallPath");
    const QString here = QCoreApplication::applicationDirPath();
    if (!settings.contains(key) && qEnvironmentVariableIsEmpty("FACETOR_INSTALL_PATH") &&
        QFileInfo(here + QStringLiteral("/Facetor")).isExecutable())
        settings.setString(key, here);
}

int runWindow(const SgCommandLine &line, SgPluginHost &plugins) {
    defaultModelerPath();
    auto window = std::make_unique<SgAppWindow>();
    for (SgAction *action : plugins.actions())
        window->addPluginAction(action);
    if (!line.sceneFile.isEmpty())
        window->openScene(line.sceneFile);
    window->show();
    // The plug-ins hear that start-up is over once the window is up and the loop runs.
    QTimer::singleShot(0, sgApp, &SgApp::emitStarting);
    const int status = QApplication::exec();
    sgApp->emitClosing();
    return status;
}

int runScript(const SgCommandLine &line, SgPluginHost &plugins) {
    // The script's end ends the run: a modal box closing (the only windows of a headless run)
    // must not quit the event loop under a script that is still waiting.
    QApplication::setQuitOnLastWindowClosed(false);
    SgScriptHost host(&plugins, line.scriptArguments);
    if (!line.sceneFile.isEmpty()) {
        // A scene named on the command line is open before the script starts.
        SgSceneFile file;
        if (!file.load(line.sceneFile, sgApp->getScene())) {
            std::fprintf(stderr, "%s\n", qPrintable(file.getErrorString()));
            return 1;
        }
    }
    sgApp->emitStarting();
    const int status = host.run(line.scriptFile);
    sgApp->emitClosing();
    return status;
}

} // namespace

int main(int argc, char **argv) {
    SgHeapPolicy::keepLargeBlocks();
    const SgCommandLine line = SgCommandLine::parse(argumentList(argc, argv));
    if (line.help || !line.error.isEmpty()) {
        if (!line.error.isEmpty())
            std::fprintf(stderr, "%s\n\n", qPrintable(line.error));
        std::fputs(qPrintable(SgCommandLine::usage()), line.help ? stdout : stderr);
        return line.help ? 0 : 2;
    }
    const bool headless = !line.scriptFile.isEmpty();
    // Headless runs need no display.
    if (headless && qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");

    QApplication application(argc, argv);
    QApplication::setApplicationName(QStringLiteral("Scenara"));
    QApplication::setOrganizationName(QStringLiteral("Scenara"));
    const QString settingsFile = qEnvironmentVariable("SCENARA_SETTINGS");
    if (!settingsFile.isEmpty())
        SgAppSettings::setFileName(settingsFile);

    auto app = std::make_unique<SgApp>(line.hostArguments);
    int status = 0;
    {
        SgPluginHost plugins;
        plugins.loadFolder(line.pluginFolder.isEmpty() ? SgPluginHost::defaultFolder()
                                                       : line.pluginFolder);
        status = headless ? runScript(line, plugins) : runWindow(line, plugins);
    }
    app.reset();
    return status;
}
