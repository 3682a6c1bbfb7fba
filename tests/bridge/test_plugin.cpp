// The plug-in library loaded as the host loads it, and its class published to script engines.

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sghelpmgr.h"
#include "sgcore/plugin/sgaction.h"
#include "sgcore/plugin/sgclassfactory.h"
#include "sgcore/plugin/sgplugin.h"
#include "sgcore/plugin/sgpluginloader.h"

#include <QJSEngine>

#include <memory>

#include <gtest/gtest.h>

namespace {

const QString kPluginPath = QStringLiteral(FACBRIDGE_PLUGIN_PATH);

// One loader for the whole process: the library stays loaded, as in the host.
SgPluginLoader &loadedPlugin() {
    static SgPluginLoader *loader = [] {
        auto *l = new SgPluginLoader;
        EXPECT_TRUE(l->load(kPluginPath)) << l->errorString().toStdString();
        return l;
    }();
    return *loader;
}

} // namespace

TEST(Plugin, LoadingGivesOneWorkingActionAndItsClassToEveryScriptEngine) {
    SgPluginLoader &loader = loadedPlugin();
    ASSERT_NE(loader.plugin(), nullptr);
    EXPECT_EQ(loader.sdkVersion(), 0x0300013Du);
    ASSERT_EQ(loader.plugin()->getClassFactories().size(), 1);
    EXPECT_EQ(loader.plugin()->getClassFactories().first()->getGUID(),
              SgGUID::fromString("6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36"));

    ASSERT_EQ(loader.actions().size(), 1);
    SgAction *action = loader.actions().first();
    EXPECT_TRUE(action->inherits("SgFacBridge"));
    EXPECT_EQ(action->getActionGroup(), QStringLiteral("Facetor Bridge"));
    EXPECT_TRUE(sgApp->getHelpMgr()->isRegistered(action));
    // The poll slot is reachable through the meta-object, as the host's timer reaches it.
    EXPECT_TRUE(QMetaObject::invokeMethod(action, "checkSharedMap"));

    // Each engine gets a constructor of bridges that C++ keeps (the collector leaves them).
    for (int i = 0; i < 2; ++i) {
        QJSEngine engine;
        loader.registerClasses(&engine);
        QJSValue made = engine.evaluate("new SgFacBridge()");
        ASSERT_FALSE(made.isError()) << made.toString().toStdString();
        std::unique_ptr<QObject> bridge(made.toQObject());
        ASSERT_NE(bridge, nullptr);
        EXPECT_TRUE(bridge->inherits("SgFacBridge"));
        EXPECT_EQ(QJSEngine::objectOwnership(bridge.get()), QJSEngine::CppOwnership);
        engine.collectGarbage();
        EXPECT_EQ(bridge->objectName(), QString());
    }
}
