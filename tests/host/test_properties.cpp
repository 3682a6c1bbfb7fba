#include "sgcore/morph/sgerclink.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sgcore/scene/sgnode.h"
#include "tests/support/sgtestmain.h"

#include <gtest/gtest.h>

TEST(HostProperties, NamesAreUniquePerElementAndOwnershipIsTracked) {
    SgNode node(QStringLiteral("n"));
    auto *a = new SgFloatProperty(QStringLiteral("Smile"));
    EXPECT_EQ(node.addProperty(a), 0);
    EXPECT_EQ(a->getOwner(), &node);
    // A second property of the name (names are case-sensitive) is refused and stays unowned.
    auto *dup = new SgIntProperty(QStringLiteral("Smile"));
    EXPECT_EQ(node.addProperty(dup), 82);
    EXPECT_EQ(dup->getOwner(), nullptr);
    EXPECT_EQ(node.findProperty(QStringLiteral("smile")), nullptr);

    // Removing deletes the property; taking hands it back unowned.
    const std::weak_ptr<const void> life = a->getLifeToken();
    EXPECT_EQ(node.removeProperty(QStringLiteral("Smile")), 0);
    EXPECT_TRUE(life.expired());
    EXPECT_EQ(node.addProperty(dup), 0);
    EXPECT_EQ(node.takeProperty(dup), dup);
    EXPECT_EQ(dup->getOwner(), nullptr);
    delete dup;
}

TEST(HostProperties, LinkedValuesClampOnReadingAndACycleDoesNotRecurse) {
    SgFloatProperty control(QStringLiteral("control"));
    SgFloatProperty channel(QStringLiteral("channel"));
    channel.setMin(-1.0f);
    channel.setMax(1.0f);
    channel.setValue(5.0f);
    EXPECT_EQ(channel.getValue(), 5.0f);
    channel.setIsClamped(true);
    EXPECT_EQ(channel.getValue(), 1.0f);
    EXPECT_EQ(channel.getRawValue(), 5.0f);

    channel.setValue(0.0f);
    EXPECT_EQ(channel.insertController(new SgERCLink(SgERCLink::DeltaAdd, &control, 0.5f, 0.0f)),
              0);
    control.setValue(0.8f);
    EXPECT_FLOAT_EQ(channel.getValue(), 0.4f);
    control.setValue(4.0f);
    EXPECT_FLOAT_EQ(channel.getValue(), 1.0f); // clamped after the links

    // A link cycle reads the raw value instead of recursing.
    control.insertController(new SgERCLink(SgERCLink::DeltaAdd, &channel, 1.0f, 0.0f));
    control.setValue(0.5f);
    EXPECT_FLOAT_EQ(control.getValue(), 0.5f + 0.5f * 0.5f);
    control.removeAllControllers();
}
