#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/settings/sgpropertysettings.h"
#include "sgcore/widgets/sgfloatslider.h"
#include "sgcore/widgets/sgintslider.h"
#include "tests/support/sgtestmain.h"

#include <QDomDocument>
#include <QLineEdit>
#include <QSlider>
#include <gtest/gtest.h>

TEST(HostWidgets, SlidersKeepExactValuesAndTakeTypedNumbersOnlyWhenEditable) {
    SgFloatSlider slider(nullptr, "f");
    const auto type = [](auto &on, const char *text) {
        on.textField()->setText(text);
        emit on.textField()->editingFinished();
    };
    slider.setValue(0.1f);
    // Leaving the field with the shown text must not round the stored value.
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), 0.1f);
    slider.setValue(5.0f); // outside the slider's span: kept as it is
    EXPECT_EQ(slider.getValue(), 5.0f);
    type(slider, "2.5");
    type(slider, "abc");
    EXPECT_EQ(slider.getValue(), 2.5f);
    EXPECT_EQ(slider.textField()->text(), "2.5");
    slider.setTextEditable(false);
    type(slider, "7");
    EXPECT_EQ(slider.getValue(), 2.5f);

    SgIntSlider ints(nullptr, "i");
    type(ints, "-7");
    type(ints, "1.5");
    EXPECT_EQ(ints.getValue(), -7);
    ints.slider()->setValue(ints.slider()->maximum());
    EXPECT_EQ(ints.getValue(), 10);
}

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
