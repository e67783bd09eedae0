#include "services/CC_ServiceUserInput.h"
#include "tests/support/TestLine.h"

#include <memory>
#include <typeinfo>

namespace
{
using namespace CC_PropertyId;

/// a in a call with b, and perhaps with c.
class CC_CallAdapter_Observation_Test : public TestLines
{
protected:
    void join(TestLine& line, State::State state)
    {
        ASSERT_TRUE(line.accept(theCall()).isOk());
        line.become(state);
        listen();
    }
    /// Whose leg is a's peer: the network's name says so.
    std::string peerOfA() const { return a.peer(NETWORK); }
};
} // namespace

// --- choosing the peer -----------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Observation_Test, AloneInTheCallThereIsNoPeer)
{
    CC_Call* const call = new CC_Call;
    ASSERT_TRUE(a.accept(*call).isOk());
    EXPECT_EQ(peerOfA(), "-");
    EXPECT_EQ(heardBy(a), Lines());
    a.drop();
    settle();
}

TEST_F(CC_CallAdapter_Observation_Test, TheFirstOtherLegBecomesThePeerAndAllItsPropertiesAreReported)
{
    EXPECT_EQ(a.dial(), XCode::OK);
    EXPECT_EQ(peerOfA(), "b-net");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Network, Call-Leg-ID, Context, Provides Data, Cause, State)"});
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (Network, Call-Leg-ID, Context, Provides Data, Cause, State)"});
    EXPECT_EQ(b.peer(NETWORK), "a-net");
    EXPECT_EQ(b.peer(STATE), "CONNECTED");
}

TEST_F(CC_CallAdapter_Observation_Test, ALegThatIsMoreActiveTakesOver)
{
    connect(State::PROCEEDING);
    join(c, State::PROCEEDING);
    EXPECT_EQ(peerOfA(), "b-net") << "equally active: the present peer stays";
    c.become(State::ALERTING);
    EXPECT_EQ(peerOfA(), "c-net");
}

TEST_F(CC_CallAdapter_Observation_Test, ALegThatJoinsMoreActiveTakesOverAtOnce)
{
    connect(State::DISCONNECTING);
    ASSERT_TRUE(c.accept(theCall()).isOk());
    EXPECT_EQ(peerOfA(), "c-net") << "TRYING is more";
}

TEST_F(CC_CallAdapter_Observation_Test, APeerThatFallsBelowAnotherMakesWay)
{
    connect(State::CONNECTED);
    join(c, State::HELD);
    EXPECT_EQ(peerOfA(), "b-net");
    b.become(State::HELD);
    EXPECT_EQ(peerOfA(), "b-net") << "equal: it stays";
    EXPECT_EQ(a.peer(STATE), "HELD") << "and is seen as it is";
    b.become(State::ALERTING);
    EXPECT_EQ(peerOfA(), "c-net");
    EXPECT_EQ(a.peer(STATE), "HELD");
}

TEST_F(CC_CallAdapter_Observation_Test, APeerThatRisesStays)
{
    connect(State::PROCEEDING);
    join(c, State::TRYING);
    b.become(State::CONNECTED);
    EXPECT_EQ(peerOfA(), "b-net");
    EXPECT_EQ(a.peer(STATE), "CONNECTED");
}

TEST_F(CC_CallAdapter_Observation_Test, AnotherLegThatOnlyReachesThePeersStateDoesNotTakeOver)
{
    connect(State::ALERTING);
    join(c, State::TRYING);
    c.become(State::ALERTING);
    EXPECT_EQ(peerOfA(), "b-net");
    EXPECT_EQ(heardBy(a), Lines()) << "and is not reported";
}

TEST_F(CC_CallAdapter_Observation_Test, OtherPropertiesOfAnotherLegMeanNothing)
{
    connect(State::CONNECTED);
    join(c, State::TRYING);
    c.say(NAME, "x");
    EXPECT_EQ(heardBy(a), Lines());
    EXPECT_EQ(a.peer(NAME), "-");
}

TEST_F(CC_CallAdapter_Observation_Test, ASwitchReportsOnlyWhatDiffers)
{
    connect(State::CONNECTED);
    b.say(NAME, "the same");
    b.say(DISPLAY, "only b");
    join(c, State::TRYING);
    c.say(NAME, "the same");
    listen();
    c.become(State::CONNECTED); // as active: no switch
    b.become(State::HELD);
    EXPECT_EQ(peerOfA(), "c-net");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Network, Call-Leg-ID, Display)"})
        << "State, Cause, Name and Provides Data are equal";
    EXPECT_EQ(a.peer(DISPLAY), "-");
}

TEST_F(CC_CallAdapter_Observation_Test, WhenThePeerLeavesTheNextMostActiveLegIsChosen)
{
    TestLine d("d");
    connect(State::CONNECTED);
    join(c, State::TRYING);
    join(d, State::ALERTING);
    theCall().removeCallLeg(*theCall().getCallLeg(1));
    EXPECT_EQ(peerOfA(), "d-net");
    d.drop();
    settle();
}

TEST_F(CC_CallAdapter_Observation_Test, WhenTheLastPeerLeavesEveryFormerIdIsReported)
{
    connect();
    b.say(NAME, "x");
    listen();
    theCall().removeCallLeg(*theCall().getCallLeg(1));
    EXPECT_EQ(peerOfA(), "-");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Network, Call-Leg-ID, Name, Provides Data, Cause, State)"});
    EXPECT_EQ(a.peer(STATE), "-");
    EXPECT_EQ(a.adapter.setPeerProperty(CC_PropertyString(NAME, "x")), XCode::ABSENT);
}

TEST_F(CC_CallAdapter_Observation_Test, WhenAnotherLegThanThePeerLeavesNothingIsReported)
{
    connect();
    join(c, State::TRYING);
    theCall().removeCallLeg(*theCall().getCallLeg(2));
    EXPECT_EQ(peerOfA(), "b-net");
    EXPECT_EQ(heardBy(a), Lines());
}

TEST_F(CC_CallAdapter_Observation_Test, APeerWithoutAStateIsChosenAnewAndSeenAsItIs)
{
    connect();
    a.filterOutput(
        [](CC_PropertyContainer& properties)
        {
            properties.remove(STATE);
            return XCode::OK;
        });
    b.say(NAME, "x"); // the view loses the state
    EXPECT_EQ(a.peer(STATE), "-");
    join(c, State::CONNECTED);
    b.become(State::TRYING);
    EXPECT_EQ(peerOfA(), "c-net") << "no state was seen: a new choice";
    b.become(State::HELD);
    c.become(State::TRYING);
    EXPECT_EQ(peerOfA(), "b-net");
}

TEST_F(CC_CallAdapter_Observation_Test, AnotherLegDoesNotTakeOverFromAPeerWhoseStateIsNotSeen)
{
    connect(State::TRYING);
    a.filterOutput(
        [](CC_PropertyContainer& properties)
        {
            properties.remove(STATE);
            return XCode::OK;
        });
    b.say(NAME, "x");
    ASSERT_TRUE(c.accept(theCall()).isOk());
    c.become(State::CONNECTED);
    EXPECT_EQ(peerOfA(), "b-net");
}

// --- moving between calls --------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Observation_Test, WhenTheOwnLegLeavesThePeerIsGoneAndTheCallViewStays)
{
    connect();
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(NAME, "talk")), XCode::OK);
    listen();
    CC_Call& call = theCall();
    call.removeCallLeg(*call.getCallLeg(0));
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(a.call(NAME), "talk");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Network, Call-Leg-ID, Provides Data, Cause, State)"});
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(NAME, "alone")), XCode::OK);
    b.say(DISPLAY, "x");
    EXPECT_EQ(heardBy(a), Lines()) << "it hears of that call no more";
}

TEST_F(CC_CallAdapter_Observation_Test, TheOwnLegSeesTheCallAndTheLegsThatItComesTo)
{
    connect();
    CC_Call* const other = CallControl::ACQUIRE_CALL("");
    ASSERT_TRUE(other->setProperty(CC_PropertyString(NAME, "other")).isOk());
    ASSERT_TRUE(c.accept(*other).isOk());
    listen();
    CC_Call& before = theCall();
    ASSERT_TRUE(other->addCallLeg(*before.getCallLeg(0)).isOk());
    EXPECT_EQ(a.adapter.getCall(), other);
    EXPECT_EQ(a.call(NAME), "other");
    EXPECT_EQ(peerOfA(), "c-net");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Network, Call-Leg-ID, Name, Context, State)"});
    b.say(DISPLAY, "x");
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(DISPLAY, "y")), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines());
    c.say(DISPLAY, "z");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Display)"});
}

TEST_F(CC_CallAdapter_Observation_Test, ARemovedCallPropertyIsReportedAsGone)
{
    connect();
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(NAME, "talk")), XCode::OK);
    listen();
    auto const isHidden = std::make_shared<bool>(true);
    a.filterOutput(
        [isHidden](CC_PropertyContainer& properties)
        {
            if (*isHidden)
                properties.remove(NAME);
            return XCode::OK;
        });
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(DISPLAY, "x")), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Name, Display)"});
    EXPECT_EQ(a.call(NAME), "-");
    *isHidden = false;
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(DISPLAY, "y")), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Name, Display)"});
    EXPECT_EQ(a.call(NAME), "talk");
}

// --- events that are none of its business ----------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Observation_Test, AnIdleAdapterTakesNoNoticeOfEvents)
{
    connect();
    CC_CallLeg& leg = *theCall().getCallLeg(1);
    CC_ServiceUserInput digits("5");
    CC_Flags flags;
    ASSERT_TRUE(flags.set(STATE, true).isOk());
    c.adapter.onCallCallLegAdded(CC_EvCallCallLegModified(theCall(), leg));
    c.adapter.onCallCallLegRemoved(CC_EvCallCallLegModified(theCall(), leg));
    c.adapter.onCallPropertyChanged(CC_EvCallPropertyChanged(theCall(), flags));
    c.adapter.onCallObservationEnded(CC_EvCallObservationEnded(theCall()));
    c.adapter.onCallLegCallRelinked(CC_EvCallLegCallRelinked(leg, nullptr, &theCall()));
    c.adapter.onCallLegPropertyChanged(CC_EvCallLegPropertyChanged(leg, flags));
    c.adapter.onCallLegSynchronousService(CC_EvCallLegSynchronousService(leg, digits));
    c.adapter.onCallLegObservationEnded(CC_EvCallLegObservationEnded(leg));
    EXPECT_EQ(heardBy(c), Lines());
    EXPECT_EQ(c.peer(STATE) + c.call(CONTEXT), "--");
}

TEST_F(CC_CallAdapter_Observation_Test, EventsOfAnotherCallAreIgnored)
{
    connect();
    CC_Call* const other = CallControl::ACQUIRE_CALL("");
    ASSERT_TRUE(c.accept(*other).isOk());
    listen();
    CC_CallLeg& legOfC = *other->getCallLeg(0);
    a.adapter.onCallCallLegAdded(CC_EvCallCallLegModified(*other, legOfC));
    a.adapter.onCallCallLegRemoved(CC_EvCallCallLegModified(*other, legOfC));
    a.adapter.onCallPropertyChanged(CC_EvCallPropertyChanged(*other, CC_Flags()));
    a.adapter.onCallLegCallRelinked(CC_EvCallLegCallRelinked(legOfC, nullptr, other));
    EXPECT_EQ(peerOfA(), "b-net");
    EXPECT_EQ(heardBy(a), Lines());
}

TEST_F(CC_CallAdapter_Observation_Test, AServiceOfTheOwnLegIsNotForItsOwnModule)
{
    connect();
    CC_ServiceUserInput digits("5");
    a.adapter.onCallLegSynchronousService(CC_EvCallLegSynchronousService(*theCall().getCallLeg(0), digits));
    EXPECT_EQ(a.module.take(), Lines());
}

TEST_F(CC_CallAdapter_Observation_Test, AnEventOfAnotherClassIsAProgrammingErrorEvenWhenIdle)
{
    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    ASSERT_TRUE(b.accept(*call).isOk());
    CC_CallLeg& leg = *call->getCallLeg(0);
    CC_EvCallObservationEnded const ended(*call);
    CC_EvCallPropertyChanged const changed(*call, CC_Flags());
    CC_EvCallLegObservationEnded const legEnded(leg);
    CC_EvCallLegPropertyChanged const legChanged(leg, CC_Flags());
    for (CC_CallAdapter* const adapter : {&c.adapter, &b.adapter})
    {
        EXPECT_THROW(adapter->onCallObservationEnded(changed), std::bad_cast);
        EXPECT_THROW(adapter->onCallCallLegAdded(ended), std::bad_cast);
        EXPECT_THROW(adapter->onCallCallLegRemoved(ended), std::bad_cast);
        EXPECT_THROW(adapter->onCallPropertyChanged(ended), std::bad_cast);
        EXPECT_THROW(adapter->onCallLegObservationEnded(legChanged), std::bad_cast);
        EXPECT_THROW(adapter->onCallLegCallRelinked(legEnded), std::bad_cast);
        EXPECT_THROW(adapter->onCallLegPropertyChanged(legEnded), std::bad_cast);
        EXPECT_THROW(adapter->onCallLegSynchronousService(legEnded), std::bad_cast);
    }
}
