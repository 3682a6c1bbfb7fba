#include "sgcore/settings/sgsettings.h"
#include "sgcore/widgets/sgboolbutton.h"
#include "sgcore/widgets/sgcolorwgt.h"
#include "sgcore/widgets/sgenumslider.h"
#include "sgcore/widgets/sgfloatslider.h"
#include "sgcore/widgets/sgintslider.h"
#include "sgcore/widgets/sgstyle.h"

#include <QDomDocument>
#include <QLineEdit>
#include <QSignalSpy>
#include <QSlider>
#include <QTest>
#include <gtest/gtest.h>

TEST(HostWidgets, BoolButtonFlipsBetweenItsTwoTexts) {
    SgBoolButton button(nullptr, "b", "Off", "On");
    EXPECT_FALSE(button.isOn());
    EXPECT_EQ(button.text(), "Off");
    QTest::mouseClick(&button, Qt::LeftButton);
    EXPECT_TRUE(button.isOn());
    EXPECT_EQ(button.text(), "On");
    button.setOn(false);
    EXPECT_EQ(button.text(), "Off");
    EXPECT_EQ(SgBoolButton().text(), "No");
}

TEST(HostWidgets, FloatSliderKeepsExactValuesAndTakesTypedTextOnlyWhenEditable) {
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
    EXPECT_FALSE(slider.isTextEditable());
    slider.textField()->setText("7");
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), 2.5f);
}

TEST(HostWidgets, IntSliderTakesTypedIntegersAndMovesWithItsSlider) {
    SgIntSlider slider(nullptr, "i");
    QSignalSpy changed(&slider, &SgIntSlider::valueChanged);
    slider.textField()->setText("-7");
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), -7);
    slider.textField()->setText("1.5");
    emit slider.textField()->editingFinished();
    EXPECT_EQ(slider.getValue(), -7);
    slider.slider()->setValue(slider.slider()->maximum());
    EXPECT_EQ(slider.getValue(), 10);
    EXPECT_EQ(changed.count(), 2);
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

TEST(HostWidgets, ColorWidgetAndStylePixmaps) {
    SgColorWgt color;
    EXPECT_EQ(color.getColor(), QColor(Qt::black));
    QSignalSpy changed(&color, &SgColorWgt::colorChanged);
    color.setColor(Qt::red);
    color.setColor(Qt::red);
    EXPECT_EQ(changed.count(), 1);

    EXPECT_FALSE(SgStyle::customIcon(SgStyle::UpArrowPixmap).isNull());
    EXPECT_FALSE(SgStyle::customIcon(SgStyle::DownArrowPixmap).isNull());
    EXPECT_FALSE(SgStyle::actionIcon("SgDeleteAction").isNull());
    EXPECT_TRUE(SgStyle::actionIcon("NoSuchAction").isNull());
    SgStyle style;
    EXPECT_FALSE(style.standardIcon(QStyle::StandardPixmap(SgStyle::UpArrowPixmap)).isNull());
}

TEST(HostSettings, DomRoundTripIsExactAndBadChildrenAreSkipped) {
    SgSettings settings;
    settings.setValue("Min", -0.1f);
    settings.setValue("Max", 3.4028235e38f);
    settings.setValue("Ratio", 0.1);
    settings.setValue("Steps", -2147483647 - 1);
    settings.setValue("Clamped", true);
    settings.setValue("Label", QString("Smile <&> \"big\""));
    settings.setValue("Min", 0.3f); // replaced in place
    QDomDocument document;
    QDomElement root = document.createElement("Property");
    document.appendChild(root);
    settings.toDOM(document, root);

    QDomDocument reread;
    ASSERT_TRUE(reread.setContent(document.toString()));
    SgSettings back;
    EXPECT_TRUE(back.fromDOM(reread.documentElement()));
    EXPECT_EQ(back.keys(), QStringList({"Min", "Max", "Ratio", "Steps", "Clamped", "Label"}));
    EXPECT_TRUE(back == settings);
    EXPECT_EQ(back.value("Min").toFloat(), 0.3f);

    QDomDocument bad;
    ASSERT_TRUE(bad.setContent(QStringLiteral(
        "<P><Setting Key='A' Type='Float' Value='nan'/><Setting Key='B' Type='Int' Value='x'/>"
        "<Setting Type='Int' Value='1'/><Setting Key='C' Type='Blob' Value='1'/><Other/>"
        "<Setting Key='D' Type='Int' Value='4'/></P>")));
    EXPECT_FALSE(back.fromDOM(bad.documentElement()));
    EXPECT_EQ(back.keys(), QStringList({"D"}));
    EXPECT_EQ(back.value("D").toInt(), 4);
}
