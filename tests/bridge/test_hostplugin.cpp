// The host's plug-in machinery on its own: identifiers, definitions, the script constructor of
// a class factory and the loader's refusals (the bridge's action is triggered by the headless
// test).

#include "sgcore/plugin/sgguid.h"
#include "sgcore/plugin/sgplugin.h"
#include "sgcore/plugin/sgpluginloader.h"
#include "sgcore/plugin/sgtclassfactory.h"

#include <QJSEngine>

#include <gtest/gtest.h>

// A scriptable class for the factory tests.
class SgTestWidgetThing : public QObject {
    Q_OBJECT
public:
    enum Shade { Light = 1, Dark = 7 };
    Q_ENUM(Shade)
    SgTestWidgetThing() { ++s_made; }
    static inline int s_made = 0;
};

namespace {

class ThingFactory : public SgTClassFactory<SgTestWidgetThing> {
public:
    using SgTClassFactory::SgTClassFactory;
    void registerClass(QJSEngine *engine) override {
        SgClassFactory::registerClass(engine);
        QJSValue constructor =
            newConstructorFunction(engine, [this](QJSEngine *e, const QJSValueList &args) {
                lastArguments = args.size();
                return toScriptValue(e, static_cast<SgTestWidgetThing *>(createInstance(e, args)));
            });
        registerEnumsOnClass(engine, metaObject(), constructor);
        engine->globalObject().setProperty(className(), constructor);
    }
    int lastArguments = -1;
};

} // namespace

TEST(HostPlugin, GuidsParseTheUsualFormOnly) {
    const SgGUID guid = SgGUID::fromString(QStringLiteral("6B1F3C2E-8D4A-4E57-9A0C-5F2E7D914B36"));
    EXPECT_FALSE(guid.isNull());
    EXPECT_EQ(guid.toString(), QStringLiteral("6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36"));
    EXPECT_EQ(guid, SgGUID::fromString(QStringLiteral("{6b1f3c2e-8d4a-4e57-9a0c-5f2e7d914b36}")));
    EXPECT_TRUE(SgGUID::fromString(QStringLiteral("6b1f3c2e-8d4a-4e57-9a0c")).isNull());
}

TEST(HostPlugin, FactoriesPublishAConstructorAndEnumsToEachEngine) {
    SgPlugin plugin(QStringLiteral("Things"), QString(), QString(), 0);
    ThingFactory factory(
        SgGUID::fromString(QStringLiteral("00000000-0000-0000-0000-000000000001")));
    plugin.addClassFactory(&factory);
    plugin.addClassFactory(&factory);
    plugin.addClassFactory(nullptr);
    EXPECT_EQ(plugin.getClassFactories().size(), 1);

    QJSEngine engine;
    factory.registerClass(&engine);
    EXPECT_EQ(engine.evaluate("SgTestWidgetThing.Dark").toInt(), 7);
    const int before = SgTestWidgetThing::s_made;
    QJSValue made = engine.evaluate("var t = new SgTestWidgetThing(1, 'two'); t");
    ASSERT_FALSE(made.isError()) << made.toString().toStdString();
    EXPECT_EQ(factory.lastArguments, 2);
    EXPECT_EQ(SgTestWidgetThing::s_made, before + 1);
    auto *thing = ThingFactory::fromScriptValue(made);
    ASSERT_NE(thing, nullptr);
    EXPECT_EQ(engine.evaluate("t.Light").toInt(), 1);
    EXPECT_EQ(QJSEngine::objectOwnership(thing), QJSEngine::CppOwnership);
    engine.evaluate("t = null");
    engine.collectGarbage();
    delete thing; // still ours: the collector left it alone

    QObject stranger;
    EXPECT_EQ(ThingFactory::fromScriptValue(engine.newQObject(&stranger)), nullptr);
    EXPECT_TRUE(ThingFactory::toScriptValue(&engine, nullptr).isNull());
    // Called without `new`, the constructor makes an object as well.
    std::unique_ptr<QObject> plain(engine.evaluate("SgTestWidgetThing()").toQObject());
    EXPECT_NE(qobject_cast<SgTestWidgetThing *>(plain.get()), nullptr);
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

#include "test_hostplugin.moc"
