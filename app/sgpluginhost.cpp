#include "app/sgpluginhost.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/plugin/sgaction.h"
#include "sgcore/plugin/sgplugin.h"
#include "sgcore/plugin/sgpluginloader.h"

#include <QCoreApplication>
#include <QDir>
#include <QFileInfo>

SgPluginHost::SgPluginHost() = default;

SgPluginHost::~SgPluginHost() {
    // Newest first, so that actions go before anything loaded earlier that they might use.
    while (!m_loaders.empty())
        m_loaders.pop_back();
}

QString SgPluginHost::defaultFolder() {
    const QString fromEnvironment = qEnvironmentVariable("SCENARA_PLUGIN_PATH");
    if (!fromEnvironment.isEmpty())
        return fromEnvironment;
    return QDir::cleanPath(QCoreApplication::applicationDirPath() + QStringLiteral("/../plugins"));
}

int SgPluginHost::loadFolder(const QString &folder) {
    const QDir dir(folder);
    const QStringList files =
        dir.entryList({QStringLiteral("*.so"), QStringLiteral("*.dll"), QStringLiteral("*.dylib")},
                      QDir::Files, QDir::Name);
    int loaded = 0;
    for (const QString &file : files)
        loaded += loadFile(dir.absoluteFilePath(file)) ? 1 : 0;
    if (files.isEmpty() && sgApp)
        sgApp->log(
            QStringLiteral("No plug-ins found in %1.").arg(QDir::toNativeSeparators(folder)));
    return loaded;
}

bool SgPluginHost::loadFile(const QString &fileName) {
    auto loader = std::make_unique<SgPluginLoader>();
    if (!loader->load(fileName)) {
        if (sgApp)
            sgApp->log(QStringLiteral("Could not load the plug-in %1: %2")
                           .arg(QFileInfo(fileName).fileName(), loader->errorString()));
        return false;
    }
    if (sgApp)
        sgApp->log(QStringLiteral("Loaded the plug-in \"%1\" from %2.")
                       .arg(loader->plugin()->getName(), QFileInfo(fileName).fileName()));
    m_loaders.push_back(std::move(loader));
    return true;
}

QList<SgAction *> SgPluginHost::actions() const {
    QList<SgAction *> all;
    for (const auto &loader : m_loaders)
        all += loader->actions();
    return all;
}

void SgPluginHost::registerClasses(QJSEngine *engine) const {
    for (const auto &loader : m_loaders)
        loader->registerClasses(engine);
}
