#include "properties/CC_PropertyBoolean.h"
#include "tests/support/TestLine.h"

#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace
{
using namespace CC_PropertyId;

Lines TEXTS(CC_PropertyContainer const& properties)
{
    Lines lines;
    for (CC_Property const& property : properties)
        lines.push_back(std::string(property.getPropertyName()) + " " + TestLine::TEXT(&property));
    return lines;
}

/// A module's class, whose instances are counted.
class Visitor : public CC_PropertyClass<Visitor>
{
public:
    static constexpr char const* TYPE_NAME = "Visitor";
    static TypeId s_typeId;
    static int s_number;

    explicit Visitor(unsigned int id) : CC_PropertyClass(id) { ++s_number; }
    Visitor(Visitor const& other) : CC_PropertyClass(other) { ++s_number; }
    Visitor& operator=(Visitor const&) = default;
    ~Visitor() override { --s_number; }
    String& getValueString(String& out) const override { return out = "visitor"; }
    bool hasSameValue(Visitor const&) const { return true; }
};
Visitor::TypeId Visitor::s_typeId;
int Visitor::s_number = 0;

/// What a filter may leave its copy like.
std::vector<std::function<void(CC_PropertyContainer&)>> const DEEDS = {
    [](CC_PropertyContainer&) {},
    [](CC_PropertyContainer& properties) { properties.clear(); },
    [](CC_PropertyContainer& properties) { properties.removeByIndex(0); },
    [](CC_PropertyContainer& properties) { properties.remove(NAME); },
    [](CC_PropertyContainer& properties)
    {
        String error;
        ASSERT_TRUE(properties.get(NAME)->setValueString(error, "somebody else").isOk());
    },
    [](CC_PropertyContainer& properties) { EXPECT_TRUE(properties.set(CC_PropertyString(URI, "sip:x")).isOk()); },
    [](CC_PropertyContainer& properties)
    {
        properties.clear();
        EXPECT_TRUE(properties.set(CC_PropertyBoolean(NAME, true)).isOk());
        EXPECT_TRUE(properties.set(CC_PropertyString(STATE, "none")).isOk());
    },
    [](CC_PropertyContainer& properties) { EXPECT_TRUE(properties.set(Visitor(URI)).isOk()); },
};

class CC_CallAdapter_Copy_Test : public TestLines
{
protected:
    CC_CallAdapter_Copy_Test() { connect(); }
    ~CC_CallAdapter_Copy_Test() override
    {
        for (TestLine* const line : {&a, &b, &c})
            line->drop(); // before what their filters capture goes
        settle();
        EXPECT_EQ(Visitor::s_number, 0);
    }

    // of the filters, which run up to the last drop
    Lines given;
    std::function<void(CC_PropertyContainer&)> leave = DEEDS.front();
    bool isArmed = false;
    unsigned int depth = 0;
};
} // namespace

TEST_F(CC_CallAdapter_Copy_Test, TheOutputFiltersGetAFreshCopyHoweverTheyLeftTheLastOne)
{
    a.filterOutput(
        [this](CC_PropertyContainer& properties)
        {
            given = TEXTS(properties);
            leave(properties);
            return XCode::OK;
        });
    for (std::size_t round = 0; round < DEEDS.size(); ++round)
    {
        leave = DEEDS[round];
        b.say(NAME, "Bob");
        b.say(DISPLAY, std::to_string(round).c_str());
        EXPECT_EQ(given, TEXTS(b.adapter.getOwnCallLeg()->getProperties())) << round;
        leave = DEEDS.front();
        b.say(DISPLAY, "");
        EXPECT_EQ(given, TEXTS(b.adapter.getOwnCallLeg()->getProperties())) << "after " << round;
        EXPECT_EQ(a.peer(NAME) + a.peer(URI), "Bob-");
    }
}

TEST_F(CC_CallAdapter_Copy_Test, TheInputFiltersGetAFreshCopyHoweverTheyLeftTheLastOne)
{
    a.filterInput(
        [this](CC_PropertyContainer& properties)
        {
            given = TEXTS(properties);
            leave(properties);
            return XCode::REFUSED; // so that the view stays as it is written here
        });
    CC_PropertyContainer known;
    ASSERT_TRUE(a.adapter.getOwnProperties(known, CC_PropertyContainer::ALL_GROUPS).isOk());
    for (std::size_t round = 0; round < DEEDS.size(); ++round)
    {
        leave = DEEDS[round];
        for (CC_PropertyString const& written :
             {CC_PropertyString(NAME, "Ada"), CC_PropertyString(DISPLAY, String::stringOf(round))})
        {
            ASSERT_TRUE(known.set(written).isOk());
            EXPECT_EQ(a.adapter.setOwnProperty(written), XCode::FAILURE);
            EXPECT_EQ(given, TEXTS(known)) << round;
        }
    }
}

TEST_F(CC_CallAdapter_Copy_Test, AnInputFilterThatWritesToItsOwnAdapterKeepsItsCopy)
{
    a.filterInput(
        [this](CC_PropertyContainer& properties)
        {
            if (!std::exchange(isArmed, false))
                return XCode::OK;
            Lines const before = TEXTS(properties);
            a.say(NAME, "inner");
            EXPECT_EQ(TEXTS(properties), before) << "the inner write has had a copy of its own";
            return properties.set(CC_PropertyString(URI, "sip:outer"));
        });
    a.say(DISPLAY, "first");
    listen();
    isArmed = true;
    a.say(DISPLAY, "outer");
    EXPECT_FALSE(isArmed);
    EXPECT_EQ(a.leg(NAME) + a.leg(DISPLAY) + a.leg(URI), "inneroutersip:outer");
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (URI, Name, Display)"});
    a.say(DISPLAY, "last");
    EXPECT_EQ(b.peer(NAME) + b.peer(DISPLAY) + b.peer(URI), "innerlastsip:outer");
}

TEST_F(CC_CallAdapter_Copy_Test, AnOutputFilterThatBringsAboutAnotherRefreshKeepsItsCopy)
{
    a.filterOutput(
        [this](CC_PropertyContainer& properties)
        {
            if (!std::exchange(isArmed, false))
                return XCode::OK;
            Lines const before = TEXTS(properties);
            isArmed = ++depth < 3;
            b.say(NAME, std::to_string(depth).c_str());
            EXPECT_EQ(TEXTS(properties), before) << depth;
            properties.clear(); // not what the module sees: the inner refresh is the later
            return XCode::OK;
        });
    b.say(DISPLAY, "first");
    isArmed = true;
    b.say(DISPLAY, "last");
    EXPECT_EQ(depth, 3u);
    EXPECT_EQ(a.peer(NAME) + a.peer(DISPLAY), "3last");
}

TEST_F(CC_CallAdapter_Copy_Test, WhatAFilterHasHadForWritingIsLookedAtEveryTime)
{
    CC_Property* kept = nullptr;
    String text = "first";
    a.say(NAME, "Ada");
    for (TestLine* const line : {&a, &b})
        line->filterOutput([](CC_PropertyContainer&) { return XCode::OK; });
    a.filterInput(
        [&](CC_PropertyContainer& properties)
        {
            String error;
            if (isArmed && kept == nullptr)
                kept = properties.get(NAME);
            return kept != nullptr ? kept->setValueString(error, text) : XCode(XCode::OK);
        });
    for (char const* const display : {"1", "2", "3"})
        a.say(DISPLAY, display); // from now on the copy is in step
    isArmed = true;
    a.say(DISPLAY, "4");
    EXPECT_EQ(a.leg(NAME), "first");
    text = "second"; // by the pointer alone
    a.say(DISPLAY, "5");
    EXPECT_EQ(a.leg(NAME) + b.peer(NAME), "secondsecond");
    a.say(DISPLAY, "6");
    text = "third";
    a.say(DISPLAY, "7");
    EXPECT_EQ(a.leg(NAME) + a.leg(DISPLAY), "third7");
    a.endpoint.setInputFilterContainer(nullptr);
}

TEST_F(CC_CallAdapter_Copy_Test, AnIdleAdapterKeepsNothingOfWhatItsFiltersWorkedOn)
{
    a.drop();
    b.drop();
    settle();
    unsigned int const whenIdle = CC_Property::s_numberOfInstances;
    for (TestLine* const line : {&a, &b})
    {
        line->filterInput([](CC_PropertyContainer&) { return XCode::OK; });
        line->filterOutput([](CC_PropertyContainer&) { return XCode::OK; });
    }
    connect();
    a.say(NAME, "Ada");
    EXPECT_EQ(a.adapter.setCallProperty(CC_PropertyString(NAME, "talk")), XCode::OK);
    a.drop();
    b.drop();
    settle();
    EXPECT_EQ(CC_Property::s_numberOfInstances, whenIdle);
}

TEST_F(CC_CallAdapter_Copy_Test, AModulesPropertyDoesNotOutliveTheFiltersInTheirCopy)
{
    auto const countAfterTwoWrites = [&]
    {
        a.say(NAME, "Ada");
        a.say(NAME, "Anna");
        return Visitor::s_number;
    };
    ASSERT_EQ(a.adapter.setOwnProperty(Visitor(URI)), XCode::OK);
    int const withoutFilters = countAfterTwoWrites();
    EXPECT_EQ(withoutFilters, 3) << "the leg's, and one in each view";
    for (TestLine* const line : {&a, &b})
    {
        line->filterInput([](CC_PropertyContainer&) { return XCode::OK; });
        line->filterOutput([](CC_PropertyContainer&) { return XCode::OK; });
    }
    EXPECT_EQ(countAfterTwoWrites(), withoutFilters);
}
