// The plug-in library loaded as the host loads it, and its class published to script engines.

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sghelpmgr.h"
#include "sgcore/plugin/sgaction.h"
#include "sgcore/plugin/sgclassfactory.h"
#include "sgcore/plugin/sgplugin.h"
#include "sgcore/plugin/sgpluginloader.h"

#include <QJSEngine>
#include <QLibrary>
#include <QMetaType>

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

TEST(Plugin, LoadingGivesTheDefinitionAndOneWorkingAction) {
    SgPluginLoader &loader = loadedPlugin();
    ASSERT_NE(loader.plugin(), nullptr);
    EXPECT_EQ(loader.plugin()->getName(), QStringLiteral("Facetor Bridge"));
    EXPECT_EQ(loader.plugin()->getVersion(), 0x01000720u);
    EXPECT_EQ(loader.plugin()->getDescription(),
              QStringLiteral("This plug-in provides a link between Scenara and Facetor to enable "
                             "the user to easily transfer data between the two applications."));
    EXPECT_EQ(loader.sdkVersion(), 0x0300013Du);
    ASSERT_EQ(loader.plugin()->getClassFactories().size(), 1);
    SgClassFactory *factory = loader.plugin()->getClassFactories().first();
    EXPECT_EQ(factory->className(), QStringLiteral("SgFacBridge"));
    EXPECT_EQ(factory->getGUID(), SgGUID::fromString("6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36"));

    ASSERT_EQ(loader.actions().size(), 1);
    SgAction *action = loader.actions().first();
    EXPECT_TRUE(action->inherits("SgFacBridge"));
    EXPECT_EQ(action->text(), QStringLiteral("Send to Facetor..."));
    EXPECT_EQ(action->getActionGroup(), QStringLiteral("Facetor Bridge"));
    EXPECT_TRUE(sgApp->getHelpMgr()->isRegistered(action));
    // The poll slot is reachable through the meta-object, as the host's timer reaches it.
    EXPECT_TRUE(QMetaObject::invokeMethod(action, "checkSharedMap"));

    // The SDK version is the same constant before and after reading the definition.
    QLibrary library(kPluginPath);
    auto sdk = reinterpret_cast<quint32 (*)()>(library.resolve("getSDKVersion"));
    ASSERT_NE(sdk, nullptr);
    EXPECT_EQ(sdk(), 0x0300013Du);
    EXPECT_NE(library.resolve("getPluginDefinition"), nullptr);
    EXPECT_EQ(sdk(), 0x0300013Du);
}

TEST(Plugin, EveryScriptEngineGetsTheConstructorAndObjectsStayWithCpp) {
    SgPluginLoader &loader = loadedPlugin();
    QJSEngine first;
    QJSEngine second;
    loader.registerClasses(&first);
    const int typeId = QMetaType::fromName("SgFacBridge*").id();
    EXPECT_GT(typeId, 0);
    loader.registerClasses(&second);
    EXPECT_EQ(QMetaType::fromName("SgFacBridge*").id(), typeId);

    for (QJSEngine *engine : {&first, &second}) {
        EXPECT_TRUE(engine->globalObject().property("SgFacBridge").isCallable());
        QJSValue made = engine->evaluate("new SgFacBridge()");
        ASSERT_FALSE(made.isError()) << made.toString().toStdString();
        QObject *bridge = made.toQObject();
        ASSERT_NE(bridge, nullptr);
        EXPECT_TRUE(bridge->inherits("SgFacBridge"));
        EXPECT_EQ(QJSEngine::objectOwnership(bridge), QJSEngine::CppOwnership);
        EXPECT_EQ(engine->evaluate("new SgFacBridge().text").toString(),
                  QStringLiteral("Send to Facetor..."));
        // The collector leaves objects owned by C++ alone.
        engine->evaluate("new SgFacBridge(); null");
        engine->collectGarbage();
        EXPECT_EQ(bridge->objectName(), QString());
        delete bridge;
    }
    EXPECT_EQ(SgClassFactory::s_ownership, QJSEngine::CppOwnership);
}
