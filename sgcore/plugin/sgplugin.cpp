#include "sgcore/plugin/sgplugin.h"

SgPlugin::SgPlugin(const QString &name, const QString &author, const QString &description,
                   quint32 version)
    : m_name(name), m_author(author), m_description(description), m_version(version) {}

SgPlugin::~SgPlugin() = default;

void SgPlugin::addClassFactory(SgClassFactory *factory) {
    if (factory && !m_factories.contains(factory))
        m_factories.append(factory);
}
