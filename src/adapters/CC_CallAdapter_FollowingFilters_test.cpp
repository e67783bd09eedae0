// What filters work on is brought up to date and written by what can have changed: nobody may see a difference to a
// copy that is made and compared whole each time.
//
// Two calls live through the same. In the second, the first filter of each kind takes every property for writing, so
// that nothing there is ever taken for unchanged.
#include "properties/CC_PropertyBoolean.h"
#include "testing/RecordingCallLegObserver.h"
#include "tests/support/TestLine.h"

#include <array>
#include <functional>
#include <memory>
#include <random>
#include <vector>

namespace
{
using namespace CC_PropertyId;

/// What a filter does to its container.
using Deed = XCode (*)(CC_PropertyContainer& properties);

XCode REWRITE(CC_Property* property, String const& text)
{
    String error;
    return property != nullptr ? property->setValueString(error, text) : XCode::OK;
}

Deed const DEEDS[] = {
    [](CC_PropertyContainer&) { return XCode::OK; },
    [](CC_PropertyContainer& properties) { return properties.set(CC_PropertyString(NAME, "filtered")); },
    [](CC_PropertyContainer& properties)
    { return REWRITE(properties.get(DISPLAY), "a text too long to be kept inline"); },
    [](CC_PropertyContainer& properties)
    {
        properties.remove(NAME);
        return XCode::OK;
    },
    [](CC_PropertyContainer& properties)
    {
        properties.removeByIndex(4);
        return properties.set(CC_PropertyString(URI, "derived"));
    },
    [](CC_PropertyContainer& properties)
    {
        properties.remove(DISPLAY);
        return properties.set(CC_PropertyBoolean(DISPLAY, true));
    },
    [](CC_PropertyContainer& properties)
    {
        std::ignore = properties.set(CC_PropertyString(ALERT_INFO, "of a failing one"));
        return XCode::REFUSED;
    },
    [](CC_PropertyContainer& properties)
    {
        for (CC_Property& property : properties)
            if (property.getId() == E164_NUMBER)
                std::ignore = REWRITE(&property, "0049");
        return XCode::OK;
    },
    [](CC_PropertyContainer& properties)
    {
        if (CC_Property* const name = properties.get(NAME))
            name->assign(CC_PropertyString(REDIRECTING_NAME, "of another id"));
        return XCode::OK;
    },
    [](CC_PropertyContainer& properties) { return properties.set(State(STATE, State::IDLE)); },
};

/// A caller and a called line with filters, and what is seen of them.
struct Side
{
    Side(RecordingProvider& theProvider, bool isAlwaysLong) : provider(theProvider), isLong(isAlwaysLong)
    {
        setUpFilters();
    }

    void connect()
    {
        provider.m_dial = [this](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
        { return called.accept(call); };
        EXPECT_TRUE(caller.dial().isOk());
        called.become(State::CONNECTED);
        EXPECT_TRUE(leg().addCallLegObserver(&witness).isOk());
    }
    void drop()
    {
        if (called.adapter.getOwnCallLeg() != nullptr)
            leg().removeCallLegObserver(&witness);
        caller.drop();
        called.drop();
    }
    CC_CallLeg& leg() { return *called.adapter.getCall()->getCallLeg(1); }

    void setUpFilters()
    {
        for (TestLine* const line : {&caller, &called})
        {
            if (isLong)
            {
                line->filterInput(TAKE_ALL);
                line->filterOutput(TAKE_ALL);
            }
            line->filterInput([this](CC_PropertyContainer& properties) { return input(properties); });
            line->filterOutput([this](CC_PropertyContainer& properties) { return output(properties); });
        }
    }
    static XCode TAKE_ALL(CC_PropertyContainer& properties)
    {
        std::ignore = properties.begin();
        return XCode::OK;
    }

    static std::string TEXT_OF(CC_PropertyContainer const& properties)
    {
        std::string text;
        for (CC_Property const& property : properties)
            if (property.getId() != CALL_LEG_ID && property.getId() != CONTEXT) // an address, and each has its own
                text += std::string(property.getPropertyName()) + " " + property.getTypeName() + " " +
                        TestLine::TEXT(&property) + "; ";
        return text;
    }
    /// All that modules and observers can see.
    Lines seen()
    {
        Lines lines;
        for (TestLine* const line : {&caller, &called})
        {
            for (auto const get : {&CC_CallAdapter::getOwnProperties, &CC_CallAdapter::getOwnPropertiesUnfiltered,
                                   &CC_CallAdapter::getPeerProperties, &CC_CallAdapter::getCallProperties})
            {
                CC_PropertyContainer properties;
                EXPECT_TRUE((line->adapter.*get)(properties, CC_PropertyContainer::ALL_GROUPS).isOk());
                lines.push_back(TEXT_OF(properties));
            }
            for (auto const& ids : line->module.getFlagSets())
                for (unsigned int const id : ids)
                    lines.push_back(std::to_string(id));
        }
        for (std::string const& line : witness.take())
            lines.push_back(line);
        return lines;
    }

    RecordingProvider& provider;
    bool isLong;
    Deed input = DEEDS[0];
    Deed output = DEEDS[0];
    TestLine caller{"a"};
    TestLine called{"b"};
    RecordingCallLegObserver witness{"w"};
};

class CC_CallAdapter_FollowingFilters_Test : public testing::Test, protected CallControlFixture
{
protected:
    CC_CallAdapter_FollowingFilters_Test() { EXPECT_TRUE(CallControl::ADD_PROVIDER("", "isdn", provider).isOk()); }
    ~CC_CallAdapter_FollowingFilters_Test() override { CallControl::REMOVE_PROVIDER("", "isdn"); }

    unsigned int random(unsigned int below) { return static_cast<unsigned int>(m_random() % below); }
    unsigned int randomId()
    {
        constexpr unsigned int IDS[] = {E164_NUMBER, NAME, ALERT_INFO, DISPLAY, URI, REDIRECTING_NAME};
        return IDS[random(std::size(IDS))];
    }
    CC_PropertyString randomText()
    {
        return {randomId(), random(2) == 0 ? "x" : "another text too long to be kept inline"};
    }

    /// One of the ways in which the called line's leg and what is seen of it change, the same for both sides.
    std::function<XCode(Side&)> randomChange()
    {
        CC_PropertyString const text = randomText();
        CC_PropertyString const other = randomText();
        bool const flag = random(2) == 0;
        Deed const deed = DEEDS[random(std::size(DEEDS))];
        unsigned int const index = random(12);
        switch (random(24))
        {
        case 0:
        case 1:
        case 2:
        case 3:
            return [=](Side& side) { return side.called.adapter.setOwnProperty(text); };
        case 4:
            return [=](Side& side)
            { return side.called.adapter.setOwnProperty(CC_PropertyBoolean(PROVIDES_DATA, flag)); };
        case 5:
            return [=](Side& side) { return side.called.adapter.setOwnPropertyUnfiltered(text); };
        case 6:
        case 7:
            return [=](Side& side)
            {
                CC_PropertyContainer several;
                std::ignore = several.set(text);
                std::ignore = several.set(State(STATE, flag ? State::ALERTING : State::CONNECTED));
                std::ignore = several.set(other);
                return side.called.adapter.setOwnProperties(several);
            };
        case 8:
        case 9:
            return [=](Side& side) { return side.caller.adapter.setPeerProperty(text); };
        case 10:
            return [=](Side& side) { return side.caller.adapter.setPeerProperty(CC_PropertyBoolean(NAME, flag)); };
        case 11:
            return [=](Side& side) { return side.caller.adapter.setCallProperty(text); };
        case 12:
            return [=](Side& side) { return side.leg().setProperty(text); };
        case 13:
            return [=](Side& side) { return side.called.adapter.setOwnProperty(State(STATE, State::IDLE)); };
        case 14:
            return [=](Side& side)
            {
                side.called.endpoint.setInputFilterContainer(flag ? &side.called.inputFilters : nullptr);
                return XCode(XCode::OK);
            };
        case 15:
            return [=](Side& side)
            {
                side.caller.endpoint.setOutputFilterContainer(flag ? &side.caller.outputFilters : nullptr);
                return XCode(XCode::OK);
            };
        case 16:
            return [=](Side& side)
            {
                side.called.endpoint.setOutputFilterContainer(flag ? &side.called.outputFilters : nullptr);
                return XCode(XCode::OK);
            };
        case 17:
        case 18:
            return [=](Side& side)
            {
                side.input = deed;
                return XCode(XCode::OK);
            };
        case 19:
        case 20:
            return [=](Side& side)
            {
                side.output = deed;
                return XCode(XCode::OK);
            };
        case 21:
            return [=](Side& side) { return nest(side, side.input, text, other); };
        case 22:
            return [=](Side& side) { return nest(side, side.output, text, other); };
        default:
            return [=, this](Side& side) { return changeUntold(side, text, index); };
        }
    }

    /// A filter writes while it works.
    static XCode nest(Side& side, Deed& where, CC_Property const& text, CC_Property const& inner)
    {
        static Side* s_side;
        static CC_Property const* s_inner;
        static Deed* s_where;
        static Deed s_former;
        s_side = &side;
        s_inner = &inner;
        s_where = &where;
        s_former = where;
        where = [](CC_PropertyContainer& properties)
        {
            *s_where = s_former;
            std::ignore = s_side->called.adapter.setOwnProperty(*s_inner);
            return s_former(properties);
        };
        XCode const result = side.called.adapter.setOwnProperty(text);
        where = s_former;
        return result;
    }
    /// From here on the leg's changes are not all told.
    XCode changeUntold(Side& side, CC_Property const& text, unsigned int index) const
    {
        bool changed = false;
        if (!isUntoldAllowed)
            return XCode::OK;
        if (index % 2 == 0)
            return side.leg().setPropertyNoNotification(text, changed);
        side.leg().getPropertiesToWrite().removeByIndex(index);
        return XCode::OK;
    }

    RecordingProvider provider{"isdn"};
    bool isUntoldAllowed = false;
    std::minstd_rand m_random;
};
} // namespace

TEST_F(CC_CallAdapter_FollowingFilters_Test,
       WhateverFiltersAndOthersDoNothingDiffersFromCopiesThatAreMadeAndComparedWhole)
{
    for (unsigned int round = 0; round < 300 && !HasFailure(); ++round)
    {
        SCOPED_TRACE("round " + std::to_string(round));
        auto const brief = std::make_unique<Side>(provider, false);
        auto const whole = std::make_unique<Side>(provider, true);
        brief->connect();
        whole->connect();
        isUntoldAllowed = false;
        for (unsigned int i = 0; i < 40 && !HasFailure(); ++i)
        {
            SCOPED_TRACE("change " + std::to_string(i));
            isUntoldAllowed = round % 4 == 3 && i > 25;
            auto const change = randomChange();
            EXPECT_EQ(change(*brief), change(*whole));
            if (random(3) == 0)
                settle();
            EXPECT_EQ(brief->seen(), whole->seen());
        }
        brief->drop();
        whole->drop();
        settle();
    }
}
