#include "enginetestsupport.h"

#include "sgcore/morph/sgerclink.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/properties/sgintproperty.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloadlog.h"

#include <QSignalSpy>

#include <memory>

using namespace enginetest;

namespace {

SgERCLink *onlyLink(SgNumericProperty *channel) {
    return channel->getControllerCount() == 1 ? dynamic_cast<SgERCLink *>(channel->getController(0))
                                              : nullptr;
}

SgNumericProperty *channelOf(SgNode *node, const QString &morph) {
    auto *m = dynamic_cast<SgMorph *>(node->getObject()->findModifier(morph));
    return m ? m->getValueChannel() : nullptr;
}

// Two props that each move one vertex in the target, and a loader for the morph "Smile".
struct TwoProps {
    SgNode *a = sgTestNode("A", sgTestRowMesh(8));
    SgNode *b = sgTestNode("B", sgTestRowMesh(8));
    const std::unique_ptr<SgPolyMesh, Unref> target = hold(sgTestCopyVertices(*sgTestGeometry(a)));
    SgMorphLoader loader;
    SgMorphLoadLog log;

    TwoProps() {
        sgApp->getScene()->addNode(a);
        sgApp->getScene()->addNode(b);
        target->setVertex(5, target->getVertex(5) + SgVec3(0, 2, 0));
        loader.setMorphName("Smile");
        loader.setMorphGroup("Morphs");
    }
    void run() { loader.createMorphForNodes(target.get(), {a, b}, log); }
};

} // namespace

class ControlProperty : public EngineTest {};

// A namesake on the control node that is not a float property: no link, and the log says so.
TEST_F(ControlProperty, ANamesakeThatIsNoFloatPropertyLeavesTheMorphsUnlinked) {
    TwoProps props;
    auto *controls = new SgNode("Controls");
    scene()->addNode(controls);
    controls->addProperty(new SgIntProperty("Smile"));
    props.loader.setControlNode(controls);
    props.run();
    ASSERT_TRUE(channelOf(props.a, "Smile") && channelOf(props.b, "Smile"));
    EXPECT_EQ(channelOf(props.a, "Smile")->getControllerCount(), 0);
    EXPECT_EQ(props.loader.controlProperty(), nullptr);
    EXPECT_TRUE(props.log.toHtml().contains("Warning: </FONT>The property Smile on Controls is "
                                            "not a float property: the morph is not linked to a "
                                            "control property.<BR>\n</BODY>"))
        << props.log.toHtml().toStdString();
}

TEST_F(ControlProperty, FirstMorphOnTheControlNodeDrivesTheOthers) {
    TwoProps props;
    QSignalSpy spy(&props.loader, &SgMorphLoader::controlPropertyChanged);
    props.loader.setControlNode(props.a);
    props.run();
    SgNumericProperty *control = channelOf(props.a, "Smile");
    ASSERT_TRUE(control);
    EXPECT_EQ(props.loader.controlProperty(), control);
    EXPECT_EQ(spy.count(), 1);
    EXPECT_EQ(control->getControllerCount(), 0);
    SgERCLink *link = onlyLink(channelOf(props.b, "Smile"));
    ASSERT_TRUE(link);
    EXPECT_EQ(link->getProperty(), control);

    // Driving the control moves the other node's morph through the link.
    control->setValue(0.5f);
    EXPECT_NEAR(props.b->getObject()->getCachedGeom()->getVertex(5).y,
                sgTestGeometry(props.b)->getVertex(5).y + 1.0f, 1e-5);
}

TEST_F(ControlProperty, NamesakeOnTheControlNodeIsReusedAndLinksCarryTypeScaleAndLabel) {
    TwoProps props;
    auto *controls = new SgNode("Controls");
    scene()->addNode(controls);
    auto *namesake = new SgFloatProperty("Smile");
    controls->addProperty(namesake);
    props.loader.setControlNode(controls);
    props.loader.setUseCustomValue(true);
    props.loader.setCustomValue(0.5f);
    props.loader.setHideSecondary(true);
    props.loader.setUseCustomLabel(true);
    props.loader.setCustomLabel("p_Smile");
    props.run();
    EXPECT_EQ(props.loader.controlProperty(), namesake);
    EXPECT_EQ(controls->getPropertyCount(), 1);
    for (SgNode *node : {props.a, props.b}) {
        SgNumericProperty *channel = channelOf(node, "Smile");
        SgERCLink *link = onlyLink(channel);
        ASSERT_TRUE(link);
        EXPECT_EQ(link->getTypeName(), QString("ERC[DeltaAdd]"));
        EXPECT_FLOAT_EQ(link->getScale(), 0.5f);
        EXPECT_FLOAT_EQ(link->getOffset(), 0.0f);
        EXPECT_TRUE(channel->isHidden());
        EXPECT_EQ(channel->getLabel(), QString("p_Smile"));
    }

    // Another type ignores the custom value only when it is switched off.
    TwoProps second;
    second.loader.setMorphName("Frown");
    second.loader.setControlNode(controls);
    second.loader.setErcType(SgERCLink::Multiply);
    second.run();
    auto *created = dynamic_cast<SgFloatProperty *>(controls->findProperty("Frown"));
    ASSERT_TRUE(created);
    EXPECT_EQ(created->getPath(), QString("Morphs"));
    SgERCLink *link = onlyLink(channelOf(second.a, "Frown"));
    ASSERT_TRUE(link);
    EXPECT_EQ(link->getTypeName(), QString("ERC[Multiply]"));
    EXPECT_FLOAT_EQ(link->getScale(), 1.0f);
    EXPECT_FALSE(channelOf(second.a, "Frown")->isHidden());
}

TEST_F(ControlProperty, UnplacedPropertiesArePlacedOrDiscarded) {
    auto *controls = new SgNode("Controls");
    scene()->addNode(controls);

    // Prepares `property` as a loader's control for the control node, then runs `check` on the
    // loader before it ends.
    const auto prepare = [&](SgNumericProperty *property, auto check) {
        SgMorphLoader loader;
        loader.setControlProperty(property);
        loader.setControlNode(controls);
        loader.prepareControlProperty();
        check(loader);
    };
    // A free property is placed on the control node, where the loader leaves it; a free
    // namesake is dropped for the node's own property.
    auto *dial = new SgFloatProperty("Dial");
    prepare(dial, [&](SgMorphLoader &) { EXPECT_EQ(dial->getOwner(), controls); });
    EXPECT_EQ(controls->findProperty("Dial"), dial);
    auto *namesake = new SgFloatProperty("Dial");
    const auto life = namesake->getLifeToken();
    prepare(namesake, [&](SgMorphLoader &loader) {
        EXPECT_TRUE(life.expired());
        EXPECT_EQ(loader.controlProperty(), dial);
    });
    // A control morph goes onto the control node's object, made for it when missing.
    auto *morph = new SgMorph("Ctrl");
    prepare(morph->getValueChannel(), [&](SgMorphLoader &) {
        ASSERT_TRUE(controls->getObject());
        EXPECT_EQ(controls->getObject()->findModifier("Ctrl"), morph);
    });

    // Without a control node, replaced, or left at the end: an unplaced property is deleted.
    std::weak_ptr<const void> lives[3];
    {
        SgMorphLoader loader;
        auto *first = new SgFloatProperty("One");
        lives[0] = first->getLifeToken();
        loader.setControlProperty(first);
        loader.prepareControlProperty();
        EXPECT_EQ(loader.controlProperty(), nullptr);

        auto *two = new SgMorph("Two");
        lives[1] = two->getValueChannel()->getLifeToken();
        loader.setControlProperty(two->getValueChannel());
        auto *third = new SgIntProperty("Three");
        lives[2] = third->getLifeToken();
        loader.setControlProperty(third);
        EXPECT_TRUE(lives[1].expired());
    }
    EXPECT_TRUE(lives[0].expired());
    EXPECT_TRUE(lives[2].expired());
}
