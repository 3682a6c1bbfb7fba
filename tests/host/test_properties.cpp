// What the plug-in's links rely on from the host's properties: a linked value is clamped after
// its links, and a link cycle is read without recursing. (Names, namesakes and ownership are
// checked through the morph engine's control properties.)
#include "sgcore/morph/sgerclink.h"
#include "sgcore/properties/sgfloatproperty.h"

#include <gtest/gtest.h>

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
