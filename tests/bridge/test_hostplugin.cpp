// The host's plug-in machinery on its own: identifiers and the loader's refusals (the bridge's
// factory publishes its class through the host's, in bridge_factory and app_window).

#include "sgcore/plugin/sgguid.h"
#include "sgcore/plugin/sgpluginloader.h"

#include <gtest/gtest.h>

TEST(HostPlugin, GuidsParseTheUsualFormOnly) {
    const SgGUID guid = SgGUID::fromString(QStringLiteral("6B1F3C2E-8D4A-4E57-9A0C-5F2E7D914B36"));
    EXPECT_FALSE(guid.isNull());
    EXPECT_EQ(guid.toString(), QStringLiteral("6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36"));
    EXPECT_EQ(guid, SgGUID::fromString(QStringLiteral("{6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36}")));
    EXPECT_TRUE(SgGUID::fromString(QStringLiteral("6b1f3c2e-8d4a-4e57-9a0c")).isNull());
}

TEST(HostPlugin, TheLoaderRefusesFilesThatAreNoPlugins) {
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
