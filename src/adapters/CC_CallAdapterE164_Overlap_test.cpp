// Digits that arrive after the call was offered: collected, passed on, or sent en bloc with a new dial.
#include "services/CC_ServicePushBack.h"
#include "testing/FakeMediaContext.h"
#include "tests/support/TestOverlapE164.h"

#include <vector>

namespace
{
using namespace CC_PropertyId;

using CC_CallAdapterE164_Overlap_Test = TestOverlapE164;

class CC_CallAdapterE164_Collecting_Test : public CC_CallAdapterE164_Overlap_Test,
                                           public testing::WithParamInterface<State::State>
{
};
std::string NAME_OF_STATE(testing::TestParamInfo<State::State> const& info)
{
    std::string name = State::STATE_NAME(info.param);
    std::erase(name, '-');
    return name;
}
INSTANTIATE_TEST_SUITE_P(States, CC_CallAdapterE164_Collecting_Test,
                         testing::Values(State::TRYING, State::ADDRESS_INCOMPLETE, State::PROCEEDING, State::ALERTING),
                         NAME_OF_STATE);

class CC_CallAdapterE164_NotCollecting_Test : public CC_CallAdapterE164_Collecting_Test
{
};
INSTANTIATE_TEST_SUITE_P(States, CC_CallAdapterE164_NotCollecting_Test,
                         testing::Values(State::DISCONNECTING, State::HELD, State::CONNECTED), NAME_OF_STATE);
} // namespace

// --- collecting ------------------------------------------------------------------------------------------------------

TEST_P(CC_CallAdapterE164_Collecting_Test, DigitsAreCollectedAndPassedOn)
{
    accepting(GetParam(), GetParam() == State::ADDRESS_INCOMPLETE);
    ASSERT_EQ(a.dial("49"), XCode::OK);
    CC_Call const* const call = a.adapter->getCall();
    a.key("8");
    a.key("91");
    EXPECT_EQ(b.module.getServices(),
              (Lines{"User Input: 8 (Duration: Unknown)", "User Input: 91 (Duration: Unknown)"}));
    EXPECT_EQ(a.adapter->getCall(), call);
    EXPECT_EQ(numbers, (Lines{"49"})) << "not dialled again";

    ASSERT_EQ(b.adapter->setOwnSupportsOverlapReceiving(false), XCode::OK);
    b.become(State::ADDRESS_INCOMPLETE);
    a.key("2");
    EXPECT_EQ(numbers, (Lines{"49", "498912"})) << "with all of them";
}

TEST_P(CC_CallAdapterE164_Collecting_Test, AnUpdateIsPassedOn)
{
    accepting(GetParam(), true);
    ASSERT_EQ(a.dial("49"), XCode::OK);
    update();
    EXPECT_EQ(b.module.getServices(), (Lines{"User Input Update (Duration: 500)"}));
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_P(CC_CallAdapterE164_NotCollecting_Test, DigitsArePassedOnButNotCollected)
{
    accepting(GetParam(), false);
    ASSERT_EQ(a.dial("49"), XCode::OK);
    a.key("8");
    update();
    EXPECT_EQ(b.module.getServices(),
              (Lines{"User Input: 8 (Duration: Unknown)", "User Input Update (Duration: 500)"}));
    EXPECT_EQ(numbers, (Lines{"49"}));
    b.become(State::ADDRESS_INCOMPLETE);
    a.key("2");
    EXPECT_EQ(numbers, (Lines{"49", "492"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, WithoutAPeerNothingIsCollected)
{
    onOffer = [](CC_Call&) { return XCode::OK; };
    ASSERT_EQ(a.dial("49"), XCode::OK);
    a.key("8");
    EXPECT_EQ(b.accept(*a.adapter->getCall()), XCode::OK);
    ASSERT_EQ(b.adapter->setOwnSupportsOverlapReceiving(false), XCode::OK);
    b.become(State::ADDRESS_INCOMPLETE);
    a.key("2");
    EXPECT_EQ(numbers, (Lines{"49", "492"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, WithoutALegNothingHappens)
{
    a.key("8");
    update();
    EXPECT_EQ(a.adapter->getCall(), nullptr);
    EXPECT_EQ(numbers, Lines());
}

// --- dialling again --------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_Overlap_Test, ADestinationThatWantsTheNumberEnBlocIsDialledAgain)
{
    dialEnBloc();
    CC_Call* const first = a.adapter->getCall();
    onOffer = nullptr; // the first attempt stays with b, to see how it ends
    TestLineE164<> other("c");
    onOffer = [&other](CC_Call& call) { return other.accept(call); };
    listen();
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "498"}));
    EXPECT_EQ(destinations, (Lines{"trunk", "trunk"}));
    EXPECT_NE(a.adapter->getCall(), first);
    EXPECT_EQ(other.adapter->getCall(), a.adapter->getCall());
    EXPECT_EQ(b.module.getServices(), Lines()) << "the digit itself is not passed on";

    EXPECT_EQ(b.peer(STATE), "RELEASED");
    auto const* const cause = dynamic_cast<CC_PropertyCause const*>(b.adapter->getPeerCauseProperty());
    ASSERT_NE(cause, nullptr);
    EXPECT_EQ(cause->getCause(), QCause::NORMAL_CALL_CLEARING);
    EXPECT_EQ(static_cast<unsigned int>(cause->getCause()), 16U);
    EXPECT_EQ(cause->getSipCode(), 0U);
}

TEST_F(CC_CallAdapterE164_Overlap_Test, EachFurtherDigitDialsAgainWithAllOfThem)
{
    dialEnBloc();
    a.key("8");
    a.key("9");
    a.key("123");
    EXPECT_EQ(numbers, (Lines{"49", "498", "4989", "4989123"}));
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 1U);
}

TEST_F(CC_CallAdapterE164_Overlap_Test, InputWithoutADigitDialsTheSameNumberAgain)
{
    dialEnBloc();
    a.key("");
    EXPECT_EQ(numbers, (Lines{"49", "49"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, AnUpdateIsSwallowed)
{
    dialEnBloc();
    CC_Call const* const call = a.adapter->getCall();
    update();
    EXPECT_EQ(b.module.getServices(), Lines());
    EXPECT_EQ(a.adapter->getCall(), call);
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, OtherServicesArePassedOn)
{
    dialEnBloc();
    CC_ServicePushBack pushBack(5);
    a.adapter->invokeSynchronousService(pushBack);
    EXPECT_EQ(b.module.getServices(), (Lines{"Push Back: 5"}));
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, ADestinationThatDoesNotSayWhetherItTakesDigitsTakesThem)
{
    ASSERT_EQ(a.dial("49"), XCode::OK);
    b.become(State::ADDRESS_INCOMPLETE);
    a.key("8");
    EXPECT_EQ(b.module.getServices(), (Lines{"User Input: 8 (Duration: Unknown)"}));
    EXPECT_EQ(numbers, (Lines{"49"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, WhatElseWasDialledIsDialledAgain)
{
    accepting(State::ADDRESS_INCOMPLETE, false);
    CC_PropertyContainer own;
    CC_PropertyContainer call;
    ASSERT_EQ(own.set(CC_PropertyString(NAME, "Ada")), XCode::OK);
    ASSERT_EQ(call.set(CC_PropertyUnsigned(HOPS, 3)), XCode::OK);
    ASSERT_EQ(a.dial("49", nullptr, "isdn", own, call), XCode::OK);
    ASSERT_EQ(a.adapter->setOwnName("changed since"), XCode::OK);
    a.key("8");
    EXPECT_EQ(a.leg(NAME), "Ada");
    EXPECT_EQ(a.call(HOPS), "0x00000003");
    EXPECT_EQ(a.leg(STATE), "CONNECTED");
}

TEST_F(CC_CallAdapterE164_Overlap_Test, WithoutARememberedNumberTheDigitsAreTheNumber)
{
    accepting(State::ADDRESS_INCOMPLETE, false);
    ASSERT_EQ(a.adapter->dial("SWITCH", "isdn", "trunk", CC_PropertyContainer::EMPTY(), CC_PropertyContainer::EMPTY(),
                              CC_PropertyContainer::EMPTY(), nullptr),
              XCode::OK);
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"-", "8"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, ADestinationThatRefusesTheLongerNumberLeavesTheAdapterIdle)
{
    dialEnBloc();
    onOffer = [](CC_Call&) { return XCode::REFUSED; };
    a.key("8");
    EXPECT_EQ(a.adapter->getCall(), nullptr);
    accepting(State::ALERTING, false);
    EXPECT_EQ(a.dial("50"), XCode::OK);
}

TEST_F(CC_CallAdapterE164_Overlap_Test, ADialThatIsRefusedIsRememberedAllTheSame)
{
    dialEnBloc();
    EXPECT_EQ(a.dial("7"), XCode::REFUSED);
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "78"}));
}

TEST_F(CC_CallAdapterE164_Overlap_Test, CleanUpAndSetUpKeepTheRememberedDial)
{
    dialEnBloc();
    a.adapter->cleanup();
    b.adapter->cleanup();
    settle();
    ASSERT_EQ(a.adapter->setup("again", a.endpoint, &a.module), XCode::OK);
    ASSERT_EQ(b.adapter->setup("line", b.endpoint, &b.module), XCode::OK);
    onOffer = [this](CC_Call& call) { return a.accept(call); };
    ASSERT_EQ(b.dial("1"), XCode::OK);
    ASSERT_EQ(b.adapter->setOwnSupportsOverlapReceiving(false), XCode::OK);
    b.become(State::ADDRESS_INCOMPLETE);
    onOffer = [](CC_Call&) { return XCode::OK; };
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "1", "498"}));
}

// --- the media context -----------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapterE164_Overlap_Test, TheMediaContextOfTheDialIsDialledWithAgain)
{
    TYPtr<MG_IContext> const media(new FakeMediaContext(77));
    unsigned int notified = 0;
    a.adapter->onNotify = [&notified](CC_Flags const&) { ++notified; };
    dialEnBloc(media.get());
    a.adapter->setDatapathContext(TYPtr<MG_IContext>(new FakeMediaContext(78)).get());
    a.key("8");
    EXPECT_EQ(a.adapter->getDatapathContext(), media.get()) << "the one remembered, not the one in use";
    EXPECT_EQ(notified, 0U);
}

TEST_F(CC_CallAdapterE164_Overlap_Test, ADialWithoutMediaContextGoesOnWithTheOneItWasGiven)
{
    unsigned int notified = 0;
    a.adapter->onNotify = [&notified](CC_Flags const&) { ++notified; };
    dialEnBloc();
    MG_IContext const* const given = a.adapter->getDatapathContext();
    ASSERT_NE(given, nullptr);
    a.key("8");
    EXPECT_EQ(a.adapter->getDatapathContext(), given);
    settle();
    a.key("9");
    EXPECT_EQ(a.adapter->getDatapathContext(), given);
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 1U);
    EXPECT_EQ(notified, 0U);
}

TEST_F(CC_CallAdapterE164_Overlap_Test, WithoutAnyMediaContextTheAdapterItselfIsToldOfTheChange)
{
    std::vector<Lines> told;
    a.adapter->onNotify = [this, &told](CC_Flags const& flags)
    {
        EXPECT_EQ(flags.getFirstSet(0), CONTEXT);
        EXPECT_EQ(flags.getFirstSet(CONTEXT + 1), CC_Flags::NONE) << "nothing else";
        EXPECT_EQ(a.adapter->getCall(), nullptr) << "after the drop";
        told.push_back(numbers);
    };
    m_mediaContexts.setFailing(true);
    dialEnBloc();
    ASSERT_EQ(a.adapter->getDatapathContext(), nullptr);
    listen();
    a.key("8");
    EXPECT_EQ(told, (std::vector<Lines>{{"49"}})) << "once, before the dial";
    EXPECT_EQ(a.module.take(), Lines()) << "not the observer";
    EXPECT_EQ(numbers, (Lines{"49", "498"}));
}

// --- classes that override -------------------------------------------------------------------------------------------

namespace
{
/// Counts its dials, and may keep a drop from happening or go past the E.164 adapter.
class OverridingAdapter : public CC_CallAdapterE164
{
public:
    using CC_CallAdapterE164::dial;
    XCode dial(String const& contextName, String const& providerName, String const& destination,
               CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
               CC_PropertyContainer const& callProperties, MG_IContext* datapathContext) override
    {
        XCode const result = goesPastTheE164Adapter
                                 ? CC_CallAdapter::dial(contextName, providerName, destination, ownProperties,
                                                        offerProperties, callProperties, datapathContext)
                                 : CC_CallAdapterE164::dial(contextName, providerName, destination, ownProperties,
                                                            offerProperties, callProperties, datapathContext);
        results.push_back(result);
        return result;
    }
    void drop(QCause cause, unsigned int causeValue) override
    {
        if (!keepsItsLeg)
            CC_CallAdapterE164::drop(cause, causeValue);
    }

    bool goesPastTheE164Adapter = false;
    bool keepsItsLeg = false;
    std::vector<XCode> results;
};

class OverridingAdapterTest : public TestLinesE164<OverridingAdapter>
{
protected:
    OverridingAdapterTest()
    {
        onOffer = [this](CC_Call& call)
        {
            b.renew();
            XCode const result = b.accept(call);
            std::ignore = b.adapter->setOwnSupportsOverlapReceiving(false);
            b.become(State::ADDRESS_INCOMPLETE);
            return result;
        };
    }
    XCode dialByNumber()
    {
        return a.adapter->dial({.providerName = "isdn", .destination = "trunk", .called = {.number = "49"}});
    }
};
} // namespace

TEST_F(OverridingAdapterTest, ADialByNumberIsRememberedThoughTheOverrideGoesPastIt)
{
    a.adapter->goesPastTheE164Adapter = true;
    ASSERT_EQ(dialByNumber(), XCode::OK);
    a.key("8");
    EXPECT_EQ(numbers, (Lines{"49", "498"}));
    EXPECT_EQ(a.adapter->results, (std::vector<XCode>{XCode::OK, XCode::OK})) << "through the override both times";
}

TEST_F(OverridingAdapterTest, TheDialIsMadeThoughADropLeftTheLegAndItsRefusalIgnored)
{
    ASSERT_EQ(dialByNumber(), XCode::OK);
    CC_Call const* const call = a.adapter->getCall();
    a.adapter->keepsItsLeg = true;
    a.key("8");
    EXPECT_EQ(a.adapter->results, (std::vector<XCode>{XCode::OK, XCode::REFUSED}));
    EXPECT_EQ(a.adapter->getCall(), call);
    EXPECT_EQ(numbers, (Lines{"49"}));
}
