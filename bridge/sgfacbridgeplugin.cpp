// The plug-in's entry points and its static definition. The host resolves getSDKVersion and
// getPluginDefinition by their plain names, then reads the definition's factories.

#include "bridge/sgfacbridgefactory.h"
#include "sgcore/plugin/sgguid.h"
#include "sgcore/plugin/sgplugin.h"

#include <QtGlobal>

namespace {

// The SDK this plug-in is built against.
constexpr quint32 kSdkVersion = 0x0300013D;
// The plug-in's own version 1.0.7.32.
constexpr quint32 kPluginVersion = 0x01000720;

// Built in this order by static initialisation and torn down in reverse at exit.
SgPlugin s_definition(QStringLiteral("Facetor Bridge"), QString(), QString(), 0);

bool describe() {
    s_definition.setAuthor(QStringLiteral("Facetor Bridge developers"));
    s_definition.setVersion(kPluginVersion);
    s_definition.setDescription(QStringLiteral(
        "This plug-in provides a link between Scenara and Facetor to enable the user to easily "
        "transfer data between the two applications."));
    return true;
}
const bool s_described = describe();

// The class identifier of SgFacBridge; fixed for every build.
const SgGUID s_classGuid =
    SgGUID::fromString(QStringLiteral("6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36"));

SgFacBridgeFactory s_factory(s_classGuid, &s_definition);

} // namespace

extern "C" Q_DECL_EXPORT quint32 getSDKVersion() {
    return kSdkVersion;
}

extern "C" Q_DECL_EXPORT SgPlugin *getPluginDefinition() {
    return &s_definition;
}
