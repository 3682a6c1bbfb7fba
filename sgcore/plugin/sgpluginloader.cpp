#include "sgcore/plugin/sgpluginloader.h"

#include "sgcore/plugin/sgaction.h"
#include "sgcore/plugin/sgclassfactory.h"
#include "sgcore/plugin/sgplugin.h"

#include <QMetaObject>

namespace {
using GetSdkVersion = quint32 (*)();
using GetPluginDefinition = SgPlugin *(*)();
} // namespace

SgPluginLoader::SgPluginLoader() = default;

SgPluginLoader::~SgPluginLoader() {
    qDeleteAll(m_actions);
}

bool SgPluginLoader::isCompatibleSdk(quint32 pluginSdkVersion) {
    return (pluginSdkVersion >> 24) == (kSdkVersion >> 24) && pluginSdkVersion <= kSdkVersion;
}

bool SgPluginLoader::fail(const QString &message) {
    m_error = message;
    return false;
}

bool SgPluginLoader::load(const QString &fileName) {
    if (m_plugin)
        return fail(QStringLiteral("A plug-in is already loaded."));
    m_library.setFileName(fileName);
    // Entry points of a plug-in never need lazy binding, and a bad library should fail here.
    m_library.setLoadHints(QLibrary::ResolveAllSymbolsHint);
    if (!m_library.load())
        return fail(m_library.errorString());
    const auto sdkVersion = reinterpret_cast<GetSdkVersion>(m_library.resolve("getSDKVersion"));
    const auto definition =
        reinterpret_cast<GetPluginDefinition>(m_library.resolve("getPluginDefinition"));
    if (!sdkVersion || !definition)
        return fail(
            QStringLiteral("%1 is not a plug-in: an entry point is missing.").arg(fileName));
    m_sdkVersion = sdkVersion();
    if (!isCompatibleSdk(m_sdkVersion))
        return fail(QStringLiteral("%1 was built for SDK version 0x%2, which this host does not "
                                   "support.")
                        .arg(fileName)
                        .arg(m_sdkVersion, 8, 16, QLatin1Char('0')));
    SgPlugin *plugin = definition();
    if (!plugin)
        return fail(QStringLiteral("%1 has no plug-in definition.").arg(fileName));
    m_plugin = plugin;
    for (SgClassFactory *factory : plugin->getClassFactories()) {
        if (!factory || !factory->metaObject() ||
            !factory->metaObject()->inherits(&SgAction::staticMetaObject))
            continue;
        QObject *object = factory->createInstance();
        if (auto *action = qobject_cast<SgAction *>(object))
            m_actions.append(action);
        else
            delete object;
    }
    m_error.clear();
    return true;
}

void SgPluginLoader::registerClasses(QJSEngine *engine) const {
    if (!m_plugin || !engine)
        return;
    for (SgClassFactory *factory : m_plugin->getClassFactories())
        if (factory)
            factory->registerClass(engine);
}
