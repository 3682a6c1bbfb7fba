#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/settings/sgpropertysettings.h"
#include "sgcore/widgets/sgenumslider.h"
#include "sgcore/widgets/sgfloatslider.h"
#include "sgcore/widgets/sgintslider.h"

#include <QDomDocument>
#include <gtest/gtest.h>

#include "tests/support/sgtestmain.h"

#include <QLineEdit>
#include <QSlider>

TEST(HostWidgets, SlidersKeepExactValuesAndTakeTypedNumbersOnlyWhenEditable) {
    SgFloatSlider slider(nullptr, "f");
    slider.setValue(0.1f);
    // Leaving the field with the shown text must not round the stored value.
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), 0.1f);
    slider.setValue(5.0f); // outside the slider's span: kept as it is
    EXPECT_EQ(slider.getValue(), 5.0f);

    slider.textField()->setText("2.5");
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), 2.5f);
    slider.textField()->setText("abc");
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), 2.5f);
    EXPECT_EQ(slider.textField()->text(), "2.5");

    slider.setTextEditable(false);
    slider.textField()->setText("7");
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), 2.5f);

    SgIntSlider ints(nullptr, "i");
    for (const char *typed : {"-7", "1.5"}) {
        ints.textField()->setText(typed);
        emit ints.textField()->editingFinished();
    }
    EXPECT_EQ(ints.getValue(), -7);
    ints.slider()->setValue(ints.slider()->maximum());
    EXPECT_EQ(ints.getValue(), 10);
}

TEST(HostWidgets, EnumSliderAddsRenamesAndRemovesKeepingTheCurrentItem) {
    SgEnumSlider slider;
    EXPECT_EQ(slider.currentIndex(), -1);
    EXPECT_EQ(slider.addItem("A"), 0);
    EXPECT_EQ(slider.addItem("B"), 1);
    EXPECT_EQ(slider.addItem("C"), 2);
    EXPECT_EQ(slider.currentIndex(), 0);
    EXPECT_TRUE(slider.renameItem(1, "b"));
    EXPECT_FALSE(slider.renameItem(3, "x"));
    slider.setCurrentIndex(2);
    EXPECT_TRUE(slider.removeItem(0)); // the current item "C" moves down with its index
    EXPECT_EQ(slider.items(), QStringList({"b", "C"}));
    EXPECT_EQ(slider.currentIndex(), 1);
    EXPECT_TRUE(slider.removeItem(1)); // the current, last item goes: the new last is current
    EXPECT_EQ(slider.currentIndex(), 0);
    EXPECT_FALSE(slider.removeItem(5));
    slider.clear();
    EXPECT_EQ(slider.count(), 0);
    EXPECT_EQ(slider.currentIndex(), -1);
}

// A property's attributes written to a document and read back, as the configuration files
// of the Target Importer carry them.
TEST(HostSettings, PropertyAttributesRoundTripExactlyThroughTheDom) {
    SgFloatProperty source("smile");
    source.setLabel("Big <Smile> & \"more\"");
    source.setPath("Morphs/Face");
    source.setHidden(true);
    source.lock(true);
    source.setCanAnimate(false);
    source.setValue(0.1f);
    source.setDefaultValue(-1.0e-30f);
    source.setMin(-3.4028235e38f);
    source.setMax(2.5f);
    source.setIsClamped(true);
    source.setSensitivity(0.0037f);
    source.setDisplayAsPercent(true);
    SgPropertySettings expected;
    source.getAttributes(expected);
    QDomDocument document;
    QDomElement element = document.createElement("Property");
    document.appendChild(element);
    expected.toDOM(document, element);
    QDomDocument reread;
    ASSERT_TRUE(reread.setContent(document.toString()));
    SgPropertySettings back;
    ASSERT_TRUE(back.fromDOM(reread.documentElement()));
    EXPECT_EQ(back.keys(), expected.keys());
    EXPECT_TRUE(back == expected);
    SgFloatProperty target("other");
    target.setAttributes(back);
    EXPECT_EQ(target.getName(), "smile");
    EXPECT_EQ(target.getLabel(), "Big <Smile> & \"more\"");
    EXPECT_EQ(target.getDefaultValue(), -1.0e-30f);
    EXPECT_EQ(target.getMin(), -3.4028235e38f);
    EXPECT_EQ(target.getSensitivity(), 0.0037f);
    EXPECT_TRUE(target.isClamped() && target.getDisplayAsPercent() && target.isLocked());
    EXPECT_FALSE(target.canAnimate());

    // A partial or damaged set changes only what it carries with the right type.
    SgPropertySettings partial;
    partial.setValue("Max", 9.0f);
    partial.setValue("Min", QString("not a number"));
    partial.setValue("Hidden", 0);
    partial.setValue("Locked", false);
    target.setAttributes(partial);
    EXPECT_EQ(target.getMax(), 9.0f);
    EXPECT_EQ(target.getMin(), -3.4028235e38f);
    EXPECT_TRUE(target.isHidden());
    EXPECT_FALSE(target.isLocked());

    // Children that are no setting, or carry no key, an unknown type or a bad value, are
    // skipped; the rest is read.
    QDomDocument bad;
    ASSERT_TRUE(bad.setContent(QStringLiteral(
        "<P><Setting Key='A' Type='Float' Value='nan'/><Setting Key='B' Type='Int' Value='x'/>"
        "<Setting Type='Int' Value='1'/><Setting Key='C' Type='Blob' Value='1'/><Other/>"
        "<Setting Key='D' Type='Int' Value='4'/></P>")));
    EXPECT_FALSE(back.fromDOM(bad.documentElement()));
    EXPECT_EQ(back.keys(), QStringList({"D"}));
    EXPECT_EQ(back.value("D").toInt(), 4);
}
