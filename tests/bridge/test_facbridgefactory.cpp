// The bridge's class factory linked in directly: script registration in several engines and
// the conversion of script values back to bridges.

#include "bridge/sgfacbridgefactory.h"

#include "sgcore/plugin/sgplugin.h"

#include <QJSEngine>

#include <gtest/gtest.h>

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
