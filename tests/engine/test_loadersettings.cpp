#include "sharedsource/engine/sgmorphloader.h"

#include <QSignalSpy>
#include <gtest/gtest.h>

TEST(MorphLoaderSettings, SettersEmitOnlyOnChange) {
    SgMorphLoader loader;
    QSignalSpy name(&loader, &SgMorphLoader::morphNameChanged);
    QSignalSpy control(&loader, &SgMorphLoader::createControlChanged);
    QSignalSpy value(&loader, &SgMorphLoader::customValueChanged);
    loader.setMorphName("Smile");
    loader.setMorphName("Smile");
    loader.setCreateControl(true);
    loader.setCreateControl(false);
    loader.setCustomValue(0.5f);
    loader.setCustomValue(0.5f);
    ASSERT_EQ(name.count(), 1);
    EXPECT_EQ(name.at(0).at(0).toString(), QString("Smile"));
    ASSERT_EQ(control.count(), 1);
    EXPECT_FALSE(control.at(0).at(0).toBool());
    EXPECT_EQ(value.count(), 1);
}

TEST(MorphLoaderSettings, OverrideOutsideItsRangeIsStoredAsMakeUnique) {
    SgMorphLoader loader;
    QSignalSpy spy(&loader, &SgMorphLoader::overrideChanged);
    loader.setOverride(2);
    EXPECT_EQ(loader.override(), 2);
    loader.setOverride(7);
    EXPECT_EQ(loader.override(), 0);
    ASSERT_EQ(spy.count(), 2);
    EXPECT_EQ(spy.at(1).at(0).value<short>(), 0);
    loader.setOverride(-3);
    EXPECT_EQ(loader.override(), 0);
    EXPECT_EQ(spy.count(), 2);
}

TEST(MorphLoaderSettings, LabelFallsBackToTheMorphName) {
    SgMorphLoader loader;
    loader.setMorphName("Smile");
    EXPECT_EQ(loader.label(), QString("Smile"));
    loader.setCustomLabel("p_Smile");
    EXPECT_EQ(loader.label(), QString("p_Smile"));
    loader.setCustomLabel(QString());
    EXPECT_EQ(loader.label(), QString("Smile"));
}
