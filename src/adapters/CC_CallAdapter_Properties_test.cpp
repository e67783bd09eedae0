#include "properties/CC_PropertyBoolean.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingCallObserver.h"
#include "tests/support/TestLine.h"

#include <vector>

namespace
{
using namespace CC_PropertyId;
using Adapter = CC_CallAdapter;

class CC_CallAdapter_Properties_Test : public TestLines
{
protected:
    static CC_PropertyContainer TWO(char const* name, char const* display)
    {
        CC_PropertyContainer two;
        EXPECT_TRUE(two.set(CC_PropertyString(NAME, name)).isOk());
        EXPECT_TRUE(two.set(CC_PropertyString(DISPLAY, display)).isOk());
        return two;
    }
};

/// The operations that come for each target and in both forms.
struct Operations
{
    char const* name;
    XCode (Adapter::*set)(CC_Property const&);
    XCode (Adapter::*setSeveral)(CC_PropertyContainer const&);
    CC_Property const* (Adapter::*get)(unsigned int) const;
    XCode (Adapter::*getSeveral)(CC_PropertyContainer&, unsigned int) const;
    bool isUnfiltered;
};

Operations const OPERATIONS[] = {
    {"own", &Adapter::setOwnProperty, &Adapter::setOwnProperties, &Adapter::getOwnProperty, &Adapter::getOwnProperties,
     false},
    {"own, unfiltered", &Adapter::setOwnPropertyUnfiltered, &Adapter::setOwnPropertiesUnfiltered,
     &Adapter::getOwnPropertyUnfiltered, &Adapter::getOwnPropertiesUnfiltered, true},
    {"peer", &Adapter::setPeerProperty, &Adapter::setPeerProperties, &Adapter::getPeerProperty,
     &Adapter::getPeerProperties, false},
    {"peer, unfiltered", &Adapter::setPeerPropertyUnfiltered, &Adapter::setPeerPropertiesUnfiltered,
     &Adapter::getPeerPropertyUnfiltered, &Adapter::getPeerPropertiesUnfiltered, true},
    {"call", &Adapter::setCallProperty, &Adapter::setCallProperties, &Adapter::getCallProperty,
     &Adapter::getCallProperties, false},
    {"call, unfiltered", &Adapter::setCallPropertyUnfiltered, &Adapter::setCallPropertiesUnfiltered,
     &Adapter::getCallPropertyUnfiltered, &Adapter::getCallPropertiesUnfiltered, true},
};
} // namespace

TEST_F(CC_CallAdapter_Properties_Test, WithoutALegEverySetterSaysSoAndNothingChanges)
{
    for (Operations const& row : OPERATIONS)
    {
        EXPECT_EQ((a.adapter.*row.set)(CC_PropertyString(NAME, "x")), XCode::ABSENT) << row.name;
        EXPECT_EQ((a.adapter.*row.setSeveral)(TWO("x", "y")), XCode::ABSENT) << row.name;
        EXPECT_EQ((a.adapter.*row.get)(NAME), nullptr) << row.name;
    }
    EXPECT_EQ(a.own(NAME) + a.peer(NAME) + a.call(NAME), "---");
}

TEST_F(CC_CallAdapter_Properties_Test, WithoutALegTheUnfilteredGettersSaySoAndTheViewsAreEmpty)
{
    for (Operations const& row : OPERATIONS)
    {
        CC_PropertyContainer copied;
        EXPECT_EQ((a.adapter.*row.getSeveral)(copied, 0xff00), row.isUnfiltered ? XCode::ABSENT : XCode::OK)
            << row.name;
        EXPECT_TRUE(copied.isEmpty()) << row.name;
    }
}

TEST_F(CC_CallAdapter_Properties_Test, WithoutAPeerItsSettersSaySo)
{
    CC_Call* const call = new CC_Call;
    ASSERT_TRUE(a.accept(*call).isOk());
    EXPECT_EQ(a.adapter.setPeerProperty(CC_PropertyString(NAME, "x")), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setPeerProperties(TWO("x", "y")), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setPeerPropertyUnfiltered(CC_PropertyString(NAME, "x")), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setPeerPropertiesUnfiltered(TWO("x", "y")), XCode::ABSENT);
    EXPECT_EQ(a.peer(NAME), "-");
    CC_PropertyContainer copied;
    EXPECT_EQ(a.adapter.getPeerPropertiesUnfiltered(copied, 0xff00), XCode::ABSENT);
    EXPECT_EQ(a.adapter.getPeerPropertyUnfiltered(STATE), nullptr);
    EXPECT_EQ(a.adapter.setOwnProperty(CC_PropertyString(NAME, "x")), XCode::OK) << "the own leg is there";
    EXPECT_EQ(a.adapter.setCallProperty(CC_PropertyString(NAME, "x")), XCode::OK) << "and the call";
    a.drop();
    settle();
}

TEST_F(CC_CallAdapter_Properties_Test, WithoutACallItsSettersSaySoThoughTheLegIsThere)
{
    connect();
    theCall().removeCallLeg(*theCall().getCallLeg(0));
    ASSERT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(a.adapter.setCallProperty(CC_PropertyString(NAME, "x")), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setCallProperties(TWO("x", "y")), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setCallPropertyUnfiltered(CC_PropertyString(NAME, "x")), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setCallPropertiesUnfiltered(TWO("x", "y")), XCode::ABSENT);
    CC_PropertyContainer copied;
    EXPECT_EQ(a.adapter.getCallPropertiesUnfiltered(copied, 0xff00), XCode::ABSENT);
    EXPECT_EQ(a.adapter.getCallPropertyUnfiltered(CONTEXT), nullptr);
    EXPECT_EQ(a.call(NAME), "-");
    EXPECT_EQ(a.adapter.setOwnProperty(CC_PropertyString(NAME, "x")), XCode::OK);
}

TEST_F(CC_CallAdapter_Properties_Test, WhatIsSetIsReadBackInBothForms)
{
    connect();
    for (std::size_t i = 0; i < std::size(OPERATIONS); ++i)
    {
        Operations const& row = OPERATIONS[i];
        Operations const& other = OPERATIONS[i ^ 1];
        std::string const text(1, static_cast<char>('p' + i));
        EXPECT_EQ((a.adapter.*row.set)(CC_PropertyString(NAME, text.c_str())), XCode::OK) << row.name;
        EXPECT_EQ(TestLine::TEXT((a.adapter.*row.get)(NAME)), text) << row.name;
        EXPECT_EQ(TestLine::TEXT((a.adapter.*other.get)(NAME)), text) << other.name;
        EXPECT_EQ((a.adapter.*row.setSeveral)(TWO("many", text.c_str())), XCode::OK) << row.name;
        EXPECT_EQ(TestLine::TEXT((a.adapter.*row.get)(NAME)), "many") << row.name;
        EXPECT_EQ(TestLine::TEXT((a.adapter.*other.get)(DISPLAY)), text) << other.name;
    }
}

TEST_F(CC_CallAdapter_Properties_Test, AMaskTakesTheGroupsWithABitInCommon)
{
    connect();
    CC_PropertyContainer all;
    for (unsigned int const id : {NETWORK, NAME, CALL_PROGRESS_TONE, ALLOWS_PUSH_BACK, QUALITY_OF_SERVICE})
        ASSERT_TRUE(all.set(CC_PropertyString(id, "x")).isOk());
    struct Case
    {
        unsigned int mask;
        char const* names;
    };
    Case const cases[] = {
        {0x100, "Network"},
        {0x200, "Name"},
        {0x400, "Call-Progress Tone"},
        {0x800, "Allows Push-Back"},
        {0x1000, "Quality-Of-Service"},
        {0x300, "Network, Name"},
        {0, ""},
        {0xff00, "Network, Name, Call-Progress Tone, Allows Push-Back, Quality-Of-Service"},
    };
    ASSERT_TRUE(a.adapter.setCallProperties(all).isOk());
    for (Operations const& row : OPERATIONS)
    {
        if (row.name[0] != 'c')
            continue;
        for (Case const& masked : cases)
        {
            CC_PropertyContainer copied;
            EXPECT_EQ((a.adapter.*row.getSeveral)(copied, masked.mask), XCode::OK);
            copied.remove(CONTEXT); // the call has had it before
            EXPECT_EQ(PROPERTY_NAMES(copied), masked.names) << row.name << " " << masked.mask;
        }
    }
}

TEST_F(CC_CallAdapter_Properties_Test, CopyingKeepsTheFirstFailureAndGoesOn)
{
    connect();
    ASSERT_TRUE(a.adapter.setOwnProperties(TWO("x", "y")).isOk());
    CC_PropertyContainer copied;
    FailingAllocator::failNth(1);
    XCode const result = a.adapter.getOwnProperties(copied, 0x200);
    FailingAllocator::stop();
    EXPECT_EQ(result, XCode::NO_ELEMENT) << "the copy's own code, not a mapped one";
    EXPECT_EQ(PROPERTY_NAMES(copied), "Display") << "the one after it came through";
}

TEST_F(CC_CallAdapter_Properties_Test, WithoutFiltersOnlyTheSetPropertyIsWrittenToTheLeg)
{
    connect();
    RecordingCallLegObserver witness("w");
    a.say(NAME, "before");
    ASSERT_TRUE(theCall().addCallLegObserver(&witness).isOk());
    a.say(DISPLAY, "x");
    EXPECT_EQ(witness.take(), Lines{"w: a/line changed (Display)"});
    a.say(DISPLAY, "x");
    EXPECT_EQ(witness.take(), Lines()) << "no change, no event";
    theCall().removeCallLegObserver(&witness);
}

TEST_F(CC_CallAdapter_Properties_Test, SettingSeveralTellsOnceEvenOfNothing)
{
    connect();
    RecordingCallLegObserver witness("w");
    ASSERT_TRUE(theCall().addCallLegObserver(&witness).isOk());
    EXPECT_EQ(a.adapter.setOwnProperties(TWO("x", "y")), XCode::OK);
    EXPECT_EQ(a.adapter.setOwnProperties(TWO("x", "z")), XCode::OK);
    EXPECT_EQ(a.adapter.setOwnProperties(TWO("x", "z")), XCode::OK);
    EXPECT_EQ(witness.take(),
              (Lines{"w: a/line changed (Name, Display)", "w: a/line changed (Display)", "w: a/line changed ()"}));
    theCall().removeCallLegObserver(&witness);
}

TEST_F(CC_CallAdapter_Properties_Test, WhatTheLegRefusesIsAFailure)
{
    connect();
    State const idle(STATE, State::IDLE);
    CC_PropertyContainer several;
    ASSERT_TRUE(several.set(idle).isOk());
    EXPECT_EQ(a.adapter.setOwnProperty(idle), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setOwnProperties(several), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setOwnPropertyUnfiltered(idle), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setOwnPropertiesUnfiltered(several), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setPeerProperty(idle), XCode::FAILURE);
    EXPECT_EQ(a.leg(STATE), "CONNECTED");
    EXPECT_EQ(TestLine::TEXT(a.adapter.getPeerPropertyUnfiltered(STATE)), "CONNECTED");
}

TEST_F(CC_CallAdapter_Properties_Test, WhatMemoryRefusesIsAFailureForEverySetter)
{
    connect();
    for (Operations const& row : OPERATIONS)
    {
        FailingAllocator::failNth(1);
        XCode const one = (a.adapter.*row.set)(CC_PropertyBoolean(ENDPOINT_IS_ISDN, true));
        FailingAllocator::stop();
        EXPECT_EQ(one, XCode::FAILURE) << row.name;
        CC_PropertyContainer several;
        ASSERT_TRUE(several.set(CC_PropertyBoolean(CONNECTED_NUMBER_UPDATE, true)).isOk());
        FailingAllocator::failNth(1);
        XCode const many = (a.adapter.*row.setSeveral)(several);
        FailingAllocator::stop();
        EXPECT_EQ(many, XCode::FAILURE) << row.name;
        EXPECT_EQ((a.adapter.*row.get)(ENDPOINT_IS_ISDN), nullptr) << row.name;
    }
}

TEST_F(CC_CallAdapter_Properties_Test, APeerPropertyIsWrittenToThePeersLeg)
{
    connect();
    EXPECT_EQ(a.adapter.setPeerProperty(CC_PropertyString(NAME, "yours")), XCode::OK);
    EXPECT_EQ(b.leg(NAME), "yours");
    EXPECT_EQ(b.own(NAME), "yours") << "its own view follows its leg";
    EXPECT_EQ(heardBy(b), Lines()) << "it is b's own leg";
    EXPECT_EQ(heardBy(a), Lines()) << "a wrote it itself";
}

TEST_F(CC_CallAdapter_Properties_Test, ACallPropertyIsToldToTheOtherAdapterAndNotToTheWriter)
{
    connect();
    ASSERT_TRUE(c.accept(theCall()).isOk());
    listen();
    EXPECT_EQ(a.adapter.setCallProperty(CC_PropertyString(NAME, "conference")), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines());
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (Name)"});
    EXPECT_EQ(heardBy(c), Lines{"c: peer changed (Name)"});
    EXPECT_EQ(b.call(NAME), "conference");
    EXPECT_EQ(b.peer(NAME), "-");
}

TEST_F(CC_CallAdapter_Properties_Test, SeveralCallPropertiesTellTheCallsObserversEvenOfNothing)
{
    connect();
    RecordingCallObserver witness("w");
    ASSERT_TRUE(theCall().addCallObserver(&witness).isOk());
    EXPECT_EQ(a.adapter.setCallProperties(TWO("x", "y")), XCode::OK);
    EXPECT_EQ(a.adapter.setCallProperties(TWO("x", "y")), XCode::OK);
    EXPECT_EQ(witness.take(), (Lines{"w: call changed (Name, Display)", "w: call changed ()"}));
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (Name, Display)"});
    theCall().removeCallObserver(&witness);
}
