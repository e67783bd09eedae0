#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyUnsigned.h"
#include "testing/FakeMediaContext.h"
#include "testing/PropertyNames.h"
#include "testing/RecordingCallObserver.h"
#include "testing/RecordingContextObserver.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/TestLine.h"

#include <cstdint>
#include <memory>

namespace
{
using namespace CC_PropertyId;
using LogLine = RecordingMonitor::Line;

class CC_CallAdapter_Dial_Test : public TestLines
{
protected:
    static CC_PropertyContainer ONE(unsigned int id, char const* text)
    {
        CC_PropertyContainer one;
        EXPECT_TRUE(one.set(CC_PropertyString(id, text)).isOk());
        return one;
    }
    static XCode ADD_DISPLAY(CC_PropertyContainer& properties)
    {
        return properties.set(CC_PropertyString(DISPLAY, "filtered"));
    }
    /// The unfiltered Call-Leg-ID of the line's leg.
    static unsigned long long ID_OF(TestLine const& line)
    {
        auto const* const id =
            dynamic_cast<CC_PropertyUnsigned const*>(line.adapter.getOwnPropertyUnfiltered(CALL_LEG_ID));
        return id != nullptr ? id->getValue() : 0;
    }
};
} // namespace

// --- dial ------------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Dial_Test, TheCallGoesToTheProviderWithItsNameDestinationAndOffer)
{
    CC_Call* offered = nullptr;
    std::string values;
    provider.m_dial = [&](CC_Call& call, String const&, String const&, CC_PropertyContainer const& offer)
    {
        offered = &call;
        values = PROPERTY_VALUES(offer);
        return XCode::OK;
    };
    EXPECT_EQ(a.dial("isdn", ONE(NAME, "Ada"), ONE(DISPLAY, "to you"), ONE(URI, "talk")), XCode::OK);
    EXPECT_EQ(provider.take(), Lines{"isdn: dial isdn 4989123 (Display)"});
    EXPECT_EQ(values, "Display: to you");
    EXPECT_EQ(offered, a.adapter.getCall());
    EXPECT_EQ(a.leg(NAME) + a.leg(DISPLAY) + a.leg(URI), "Ada--") << "the own properties are the leg's";
    EXPECT_EQ(a.callItself(NAME) + a.callItself(DISPLAY) + a.callItself(URI), "--talk") << "the call's the call's";
}

TEST_F(CC_CallAdapter_Dial_Test, TheCallingLegIsConnectedFromTheStart)
{
    EXPECT_EQ(a.dial(), XCode::OK);
    EXPECT_EQ(a.leg(STATE), "CONNECTED");
    auto const* const cause = dynamic_cast<CC_PropertyCause const*>(a.adapter.getOwnPropertyUnfiltered(CAUSE));
    ASSERT_NE(cause, nullptr);
    EXPECT_EQ(cause->getCause(), QCause::NONE);
    EXPECT_EQ(cause->getSipCode(), 0u);
    EXPECT_EQ(theCall().getCallLeg(0)->getName(), "a/line");
    EXPECT_EQ(a.adapter.getCallLegName(), "a/line");
}

TEST_F(CC_CallAdapter_Dial_Test, StateAndCauseOfTheCallerAreReplaced)
{
    CC_PropertyContainer own;
    ASSERT_TRUE(own.set(State(STATE, State::TRYING)).isOk());
    ASSERT_TRUE(own.set(CC_PropertyCause(CAUSE, QCause::USER_BUSY, 486)).isOk());
    EXPECT_EQ(a.dial("isdn", own), XCode::OK);
    EXPECT_EQ(a.leg(STATE), "CONNECTED");
    EXPECT_EQ(a.leg(CAUSE), TestLine::TEXT(std::make_unique<CC_PropertyCause>(CAUSE).get()));
    EXPECT_EQ(PROPERTY_VALUES(own).substr(0, 13), "State: TRYING") << "the caller's container is not touched";
}

TEST_F(CC_CallAdapter_Dial_Test, NetworkAndCallLegIdAreFilledInWhenAbsent)
{
    EXPECT_EQ(a.dial(), XCode::OK);
    EXPECT_EQ(a.leg(NETWORK), "a-net");
    auto const address = reinterpret_cast<std::uintptr_t>(theCall().getCallLeg(0));
    EXPECT_EQ(ID_OF(a), static_cast<std::uint32_t>(address)) << "the low 32 bits of the leg's address, above them 0";
    EXPECT_EQ(b.leg(NETWORK), "b-net");
    EXPECT_EQ(ID_OF(b), static_cast<std::uint32_t>(reinterpret_cast<std::uintptr_t>(theCall().getCallLeg(1))));
}

TEST_F(CC_CallAdapter_Dial_Test, NetworkAndCallLegIdOfTheCallerAreKept)
{
    CC_PropertyContainer own = ONE(NETWORK, "mine");
    ASSERT_TRUE(own.set(CC_PropertyUnsigned(CALL_LEG_ID, 0x123456789aULL)).isOk());
    EXPECT_EQ(a.dial("isdn", own), XCode::OK);
    EXPECT_EQ(a.leg(NETWORK), "mine");
    EXPECT_EQ(ID_OF(a), 0x123456789aULL);
}

TEST_F(CC_CallAdapter_Dial_Test, TheGivenMediaContextIsTheCalls)
{
    TYPtr<MG_IContext> const media(new FakeMediaContext(77));
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(a.dial("isdn", none, none, none, media.get()), XCode::OK);
    EXPECT_EQ(a.adapter.getDatapathContext(), media.get());
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 0u);
}

TEST_F(CC_CallAdapter_Dial_Test, WithoutAMediaContextANewOneIsAskedForOnce)
{
    EXPECT_EQ(a.dial(), XCode::OK);
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 1u);
    ASSERT_NE(a.adapter.getDatapathContext(), nullptr);
    EXPECT_EQ(a.adapter.getDatapathContext()->getId(), 1u);
}

TEST_F(CC_CallAdapter_Dial_Test, ADialThatNobodyAnswersStillReportsTheMediaContext)
{
    provider.m_dial = nullptr;
    EXPECT_EQ(a.dial(), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Context)"});
    EXPECT_EQ(a.module.getFlagSets().back(), std::vector<unsigned int>{0x400400});
}

TEST_F(CC_CallAdapter_Dial_Test, TheContextNameFindsTheProviderAndTheCallPool)
{
    ASSERT_TRUE(CallControl::CREATE_CONTEXT("lab").isOk());
    RecordingProvider labProvider("lab provider");
    ASSERT_TRUE(CallControl::ADD_PROVIDER("lab", "isdn", labProvider).isOk());
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(a.adapter.dial("lab", "isdn", "7", none, none, none, nullptr), XCode::OK);
    EXPECT_EQ(labProvider.take(), Lines{"lab provider: dial isdn 7 ()"});
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS("lab"), 1u);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u);
    EXPECT_EQ(provider.take(), Lines());
    a.drop();
    settle();
    CallControl::DESTROY_CONTEXT("lab");
}

TEST_F(CC_CallAdapter_Dial_Test, InputFiltersReworkAllThreeKindsOfProperties)
{
    a.filterInput(ADD_DISPLAY);
    std::string values;
    provider.m_dial = [&](CC_Call&, String const&, String const&, CC_PropertyContainer const& offer)
    {
        values = PROPERTY_VALUES(offer);
        return XCode::OK;
    };
    CC_PropertyContainer const offer = ONE(NAME, "offer");
    CC_PropertyContainer const call = ONE(NAME, "call");
    EXPECT_EQ(a.dial("isdn", ONE(NAME, "own"), offer, call), XCode::OK);
    EXPECT_EQ(a.leg(NAME) + "," + a.leg(DISPLAY), "own,filtered");
    EXPECT_EQ(a.callItself(NAME) + "," + a.callItself(DISPLAY), "call,filtered");
    EXPECT_EQ(values, "Name: offer, Display: filtered");
    EXPECT_EQ(PROPERTY_NAMES(offer) + PROPERTY_NAMES(call), "NameName") << "the caller's containers are not touched";
    EXPECT_EQ(a.inputFilterRuns, 3u);
}

TEST_F(CC_CallAdapter_Dial_Test, TheLegJoinsBeforeTheProviderIsAskedAndTheCallsPropertiesComeFirst)
{
    Journal journal;
    RecordingCallObserver witness("call", &journal);
    RecordingContextObserver context("context", &journal);
    ASSERT_TRUE(getContext()->addContextObserver(context).isOk());
    context.m_onCreateCall = [&](CC_Context&, CC_Call* call) { EXPECT_TRUE(call->addCallObserver(&witness).isOk()); };
    provider.m_dial = [&](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
    {
        journal.add("dial");
        call.removeCallObserver(&witness);
        return XCode::OK;
    };
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(a.dial("isdn", none, none, ONE(NAME, "talk")), XCode::OK);
    EXPECT_EQ(journal.take(),
              (Lines{"context: SWITCH call created", "call: call changed (Name)", "call: a/line joined call", "dial"}));
    getContext()->removeContextObserver(context);
}

TEST_F(CC_CallAdapter_Dial_Test, OneLineAtTheFlowLevelTellsOfIt)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    provider.m_dial = nullptr;
    EXPECT_EQ(a.dial(), XCode::OK);
    String expected;
    expected.format("[EP %s/%s] Dial to provider %s (%s) using call %s", "a", "line", "isdn", "4989123",
                    theCall().getName().c_str());
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{2, expected.c_str()}}));
}

TEST_F(CC_CallAdapter_Dial_Test, AnActiveAdapterRefusesToDialOrAcceptAndItsCallGoesOn)
{
    connect();
    RecordingMonitor monitor;
    CC_Call const* const call = a.adapter.getCall();
    EXPECT_EQ(a.dial(), XCode::REFUSED);
    EXPECT_EQ(a.dial("nobody"), XCode::REFUSED);
    EXPECT_EQ(a.accept(theCall()), XCode::REFUSED);
    EXPECT_EQ(a.adapter.getCall(), call);
    EXPECT_EQ(a.leg(STATE), "CONNECTED");
    EXPECT_EQ(call->getNumberOfCallLegs(), 2u);
    EXPECT_EQ(heardBy(b), Lines());
    using Line = RecordingMonitor::Line;
    Line const dial{1, "[EP a/line] Dial failed: the adapter has a leg or what is left of one"};
    Line const accept{1, "[EP a/line] Accept failed: the adapter has a leg or what is left of one"};
    EXPECT_EQ(monitor.getLines(), (std::vector<Line>{dial, dial, accept}));
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 1u);
}

TEST_F(CC_CallAdapter_Dial_Test, WithoutAnEndpointDialAndAcceptAreRefused)
{
    CC_CallAdapter adapter;
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(adapter.dial("", "isdn", "1", none, none, none, nullptr), XCode::REFUSED);
    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    EXPECT_EQ(adapter.accept(*call, none), XCode::REFUSED);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 1u);
    CallControl::RELEASE_CALL("", call);
}

TEST_F(CC_CallAdapter_Dial_Test, AfterADropItDialsAgain)
{
    for (int i = 0; i < 3; ++i)
    {
        EXPECT_EQ(a.dial(), XCode::OK);
        EXPECT_EQ(a.peer(NETWORK), "b-net");
        a.drop();
        b.drop();
        settle();
        EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u);
    }
}

// --- accept ----------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Dial_Test, AnAcceptedCallHasALegInStateTrying)
{
    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(b.adapter.accept(*call, ONE(NAME, "Bob")), XCode::OK);
    String expected;
    expected.format("[EP %s/%s] Accept call %s", "b", "line", call->getName().c_str());
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{2, expected.c_str()}}));
    EXPECT_EQ(b.adapter.getCall(), call);
    EXPECT_EQ(b.leg(STATE), "TRYING");
    EXPECT_EQ(b.leg(NAME), "Bob");
    EXPECT_EQ(b.adapter.getCallLegName(), "b/line");
    EXPECT_NE(b.adapter.getOwnPropertyUnfiltered(CAUSE), nullptr);
}

TEST_F(CC_CallAdapter_Dial_Test, AcceptKeepsNetworkAndCallLegIdOfTheCaller)
{
    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    CC_PropertyContainer own = ONE(NETWORK, "mine");
    ASSERT_TRUE(own.set(CC_PropertyUnsigned(CALL_LEG_ID, 5)).isOk());
    EXPECT_EQ(b.adapter.accept(*call, own), XCode::OK);
    EXPECT_EQ(b.leg(NETWORK), "mine");
    EXPECT_EQ(ID_OF(b), 5u);
}

TEST_F(CC_CallAdapter_Dial_Test, AcceptFiltersTheOwnPropertiesAndSetsNoneOfTheCall)
{
    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    std::string const before = PROPERTY_VALUES(call->getProperties());
    b.filterInput(ADD_DISPLAY);
    EXPECT_EQ(b.accept(*call), XCode::OK);
    EXPECT_EQ(b.leg(DISPLAY), "filtered");
    EXPECT_EQ(b.inputFilterRuns, 1u);
    EXPECT_EQ(PROPERTY_VALUES(call->getProperties()), before);
}

TEST_F(CC_CallAdapter_Dial_Test, UntilTheLegChangesTheOwnViewHoldsWhatWasGiven)
{
    b.filterInput(ADD_DISPLAY);
    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    EXPECT_EQ(b.accept(*call), XCode::OK);
    EXPECT_EQ(b.own(DISPLAY), "-");
    EXPECT_EQ(b.own(STATE), "TRYING");
    b.say(NAME, "Bob");
    EXPECT_EQ(b.own(DISPLAY), "filtered");
}
