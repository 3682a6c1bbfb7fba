#pragma once

#include <QLibrary>
#include <QList>
#include <QString>

class QJSEngine;
class SgAction;
class SgPlugin;

// Loads one plug-in library: resolves its two entry points `getSDKVersion` and
// `getPluginDefinition`, checks that it was built against an SDK this host understands, reads
// its definition and creates an action through every factory whose class is an SgAction.
// The library stays loaded for the rest of the process (its static objects must outlive every
// object it created). The loader owns the actions it created.
class SgPluginLoader {
public:
    // The SDK version this host implements, four bytes from the most significant: major,
    // minor, build, patch.
    static constexpr quint32 kSdkVersion = 0x0300013D;

    SgPluginLoader();
    ~SgPluginLoader();

    SgPluginLoader(const SgPluginLoader &) = delete;
    SgPluginLoader &operator=(const SgPluginLoader &) = delete;

    // Loads the library at `fileName` and creates its actions. False, with errorString() set,
    // when the file does not load, an entry point is missing, the SDK major version differs
    // from the host's or is newer than the host's, or the definition is null. Loading a second
    // time on the same loader fails.
    bool load(const QString &fileName);

    // Whether a plug-in may be used by this host: the same major byte and not newer.
    static bool isCompatibleSdk(quint32 pluginSdkVersion);

    // The reason of the last failure ("" after a success).
    const QString &errorString() const { return m_error; }

    // The definition read from the library; null before a successful load.
    SgPlugin *plugin() const { return m_plugin; }
    // The SDK version the library reported; 0 before load.
    quint32 sdkVersion() const { return m_sdkVersion; }
    // The actions created through the plug-in's factories, in factory order.
    const QList<SgAction *> &actions() const { return m_actions; }

    // Publishes every class of the plug-in to `engine` (each factory's registerClass). The host
    // calls this for every script engine it sets up.
    void registerClasses(QJSEngine *engine) const;

private:
    bool fail(const QString &message);

    QLibrary m_library;
    SgPlugin *m_plugin = nullptr;
    quint32 m_sdkVersion = 0;
    QList<SgAction *> m_actions;
    QString m_error;
};
