// The plug-in machinery without the application: the host's identifiers and the loader's
// refusals, and the bridge's class factory linked in directly (script registration in several
// engines, the conversion of script values back to bridges).

#include "bridge/sgfacbridgefactory.h"

#include "sgcore/plugin/sgguid.h"
#include "sgcore/plugin/sgplugin.h"
#include "sgcore/plugin/sgpluginloader.h"

#include <QJSEngine>

#include <gtest/gtest.h>

TEST(HostPlugin, GuidsParseTheUsualFormOnlyAndTheLoaderRefusesFilesThatAreNoPlugins) {
    const SgGUID guid = SgGUID::fromString(QStringLiteral("6B1F3C2E-8D4A-4E57-9A0C-5F2E7D914B36"));
    EXPECT_FALSE(guid.isNull());
    EXPECT_EQ(guid.toString(), QStringLiteral("6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36"));
    EXPECT_EQ(guid, SgGUID::fromString(QStringLiteral("{6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36}")));
    EXPECT_TRUE(SgGUID::fromString(QStringLiteral("6b1f3c2e-8d4a-4e57-9a0c")).isNull());

    SgPluginLoader missing;
    EXPECT_FALSE(missing.load(QStringLiteral("/nonexistent/libnothing.so")));
    EXPECT_EQ(missing.plugin(), nullptr);
    SgPluginLoader notPlugin; // a real library without the entry points: the host's own core
    EXPECT_FALSE(notPlugin.load(QStringLiteral(SGCORE_LIBRARY_PATH)));
    EXPECT_TRUE(notPlugin.errorString().contains(QStringLiteral("entry point")));
    EXPECT_TRUE(notPlugin.actions().isEmpty());
    notPlugin.registerClasses(nullptr); // a failed loader publishes nothing, and does not crash

    EXPECT_TRUE(SgPluginLoader::isCompatibleSdk(0x0300013D));
    EXPECT_TRUE(SgPluginLoader::isCompatibleSdk(0x03000100));
    EXPECT_FALSE(SgPluginLoader::isCompatibleSdk(0x0300013E)); // newer than the host
    EXPECT_FALSE(SgPluginLoader::isCompatibleSdk(0x0200013D)); // another major version
}

TEST(FacBridgeFactory, RegistersTheTypeOnceAndConvertsOnlyBridges) {
    SgPlugin plugin(QStringLiteral("Test"), QString(), QString(), 0);
    SgFacBridgeFactory factory(SgGUID::fromString("6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36"), &plugin);
    EXPECT_EQ(SgFacBridgeFactory::instance(), &factory);
    EXPECT_EQ(plugin.getClassFactories(), QList<SgClassFactory *>{&factory});

    QJSEngine first;
    QJSEngine second;
    factory.registerClass(&first);
    factory.registerClass(&second);
    factory.registerClass(&second);
    EXPECT_EQ(SgFacBridgeFactory::metaTypeRegistrations(), 1);
    EXPECT_EQ(QMetaType::fromName("SgFacBridge*").id(), SgFacBridgeFactory::metaTypeId());

    QJSValue made = second.evaluate("new SgFacBridge()");
    std::unique_ptr<SgFacBridge> bridge(SgFacBridgeFactory::fromScriptValue(made));
    ASSERT_NE(bridge, nullptr);
    EXPECT_EQ(qjsvalue_cast<SgFacBridge *>(made), bridge.get());

    QObject other;
    const QJSValue foreign = first.newQObject(&other);
    EXPECT_EQ(SgFacBridgeFactory::fromScriptValue(foreign), nullptr);
    EXPECT_EQ(qjsvalue_cast<SgFacBridge *>(foreign), nullptr);
    EXPECT_EQ(SgFacBridgeFactory::fromScriptValue(first.evaluate("42")), nullptr);

    // Called without `new`, the constructor makes a bridge as well.
    std::unique_ptr<QObject> plain(second.evaluate("SgFacBridge()").toQObject());
    EXPECT_NE(qobject_cast<SgFacBridge *>(plain.get()), nullptr);
    // The second creation entry creates a bridge too; the factory keeps no list of them.
    std::unique_ptr<QObject> byId(factory.createInstanceById());
    EXPECT_NE(qobject_cast<SgFacBridge *>(byId.get()), nullptr);
}
