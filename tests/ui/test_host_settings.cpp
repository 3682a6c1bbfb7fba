#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/settings/sgpropertysettings.h"
#include "tests/support/sgtestmain.h"

#include <QDomDocument>
#include <gtest/gtest.h>

// The exact round trip of a property's attributes through a configuration file is checked by
// the loader's save-then-load test; here a partial or damaged set, as a file edited by hand.
TEST(HostSettings, DamagedPropertyAttributesChangeOnlyWhatTheyCarry) {
    SgFloatProperty target("other");
    target.setMin(-3.0f);
    target.lock(true);
    target.setHidden(true);
    SgPropertySettings partial;
    partial.setValue("Max", 9.0f);
    partial.setValue("Min", QString("not a number"));
    partial.setValue("Hidden", 0);
    partial.setValue("Locked", false);
    target.setAttributes(partial);
    EXPECT_EQ(target.getMax(), 9.0f);
    EXPECT_EQ(target.getMin(), -3.0f);
    EXPECT_TRUE(target.isHidden());
    EXPECT_FALSE(target.isLocked());

    // Children that are no setting, or carry no key, an unknown type or a bad value, are
    // skipped; the rest is read.
    QDomDocument bad;
    ASSERT_TRUE(bad.setContent(QStringLiteral(
        "<P><Setting Key='A' Type='Float' Value='nan'/><Setting Key='B' Type='Int' Value='x'/>"
        "<Setting Type='Int' Value='1'/><Setting Key='C' Type='Blob' Value='1'/><Other/>"
        "<Setting Key='D' Type='Int' Value='4'/></P>")));
    SgPropertySettings back;
    EXPECT_FALSE(back.fromDOM(bad.documentElement()));
    EXPECT_EQ(back.keys(), QStringList({"D"}));
    EXPECT_EQ(back.value("D").toInt(), 4);
}
