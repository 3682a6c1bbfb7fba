#pragma once

#include <QList>
#include <QString>

#include <memory>
#include <vector>

class QJSEngine;
class SgAction;
class SgPluginLoader;

// The application's plug-ins: every library in the plug-in folder, loaded with the host's
// plug-in loader, with the actions their factories created. Loading needs `sgApp` (plug-in
// actions read the command arguments and connect to its signals when they are made); the
// plug-ins' actions must be destroyed before `sgApp`, which destroying this object does.
class SgPluginHost {
public:
    SgPluginHost();
    ~SgPluginHost();
    SgPluginHost(const SgPluginHost &) = delete;
    SgPluginHost &operator=(const SgPluginHost &) = delete;

    // The folder plug-ins are loaded from when none is given: $SCENARA_PLUGIN_PATH when set,
    // else the folder "plugins" beside the executable's folder (bin/scenara, plugins/).
    static QString defaultFolder();

    // Loads every shared library ("*.so", "*.dll", "*.dylib") of `folder`, in name order.
    // Each success and failure is written to the host log; returns the number loaded.
    int loadFolder(const QString &folder);
    // Loads one library file; false (reason in the host log) when it is not a usable plug-in.
    bool loadFile(const QString &fileName);

    // The actions of every loaded plug-in, in loading order.
    QList<SgAction *> actions() const;
    // Publishes every plug-in class to `engine` (call once for each script engine).
    void registerClasses(QJSEngine *engine) const;
    int pluginCount() const { return static_cast<int>(m_loaders.size()); }

private:
    std::vector<std::unique_ptr<SgPluginLoader>> m_loaders;
};
