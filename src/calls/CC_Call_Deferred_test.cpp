// What a call decides from the event loop: its clean-up, its end, and the push-back of an internal loop.
#include "callcontrol/CC_CallPool.h"
#include "properties/CC_PropertyBoolean.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/CallsTest.h"

#include <string>
#include <tuple>

namespace
{
using LegState = CC_PropertyCallLegState;

struct CC_Call_DeferredTest : CallsTest
{
    CC_Call_DeferredTest() : x(newCall("X")) {}

    /// Two legs A (Call-Leg-ID 7) and B (5) of the network "net", in X, with observers a and b.
    void loop(LegState::State first, LegState::State second)
    {
        a = &join(x, "A", first);
        b = &join(x, "B", second);
        setNetwork(*a, "net");
        setNetwork(*b, "net");
        setId(*a, 7);
        setId(*b, 5);
        observe(*a, "a");
        observe(*b, "b");
        m_journal.clear();
    }
    void setStates(LegState::State first, LegState::State second)
    {
        setState(*a, first);
        setState(*b, second);
        m_journal.clear();
    }
    /// What a turn of the loop brings.
    Lines turnLines()
    {
        turn();
        return m_journal.take();
    }
    bool isOver() const { return CC_Call::s_numberOfInstances == 0; }

    CC_Call& x;
    CC_CallLeg* a = nullptr;
    CC_CallLeg* b = nullptr;
};

Lines const NOBODY;
Lines const A_IS_PUSHED{"a: A asked (Push Back: 7)"};
Lines const B_IS_PUSHED{"b: B asked (Push Back: 5)"};
} // namespace

TEST_F(CC_Call_DeferredTest, AnyNumberOfRequestsBringOneRun)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    for (int i = 0; i < 5; ++i)
        x.defer();
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
    EXPECT_FALSE(turn());
}

TEST_F(CC_Call_DeferredTest, ItRunsInTheNextTurnNotInsideTheOperation)
{
    observe(x, "x");
    EXPECT_FALSE(turn()) << "a new call is left alone until somebody asks";
    x.defer();
    EXPECT_EQ(m_journal.take(), Lines());
    EXPECT_EQ(turnLines(), Lines{"x: X ended"});
}

TEST_F(CC_Call_DeferredTest, StateAndNetworkOfALegBringARunAndOtherPropertiesNot)
{
    CC_CallLeg& leg = join(x, "L");
    EXPECT_TRUE(turn());
    EXPECT_EQ(leg.setProperty(CC_PropertyString(CC_PropertyId::NAME, "n")), XCode::OK);
    EXPECT_FALSE(turn());
    setState(leg, LegState::TRYING);
    EXPECT_TRUE(turn());
    setNetwork(leg, "net");
    EXPECT_TRUE(turn());
    setNetwork(leg, "net");
    EXPECT_FALSE(turn());
}

TEST_F(CC_Call_DeferredTest, JoiningAndRemovingBringARun)
{
    CC_CallLeg& leg = join(x, "L");
    EXPECT_TRUE(turn());
    x.removeCallLeg(leg);
    EXPECT_TRUE(turn());
    EXPECT_TRUE(isOver());
}

TEST_F(CC_Call_DeferredTest, AReleasedLegThatTheCallAloneHoldsIsDestroyed)
{
    CC_CallLeg& released = join(x, "L", LegState::RELEASED);
    join(x, "M", LegState::CONNECTED);
    observe(released, "o");
    letGo(released);
    EXPECT_EQ(turnLines(), (Lines{"o: L moved from X to none", "o: L ended"}));
    EXPECT_EQ(legsOf(x), Lines{"M"});
}

TEST_F(CC_Call_DeferredTest, AReleasedLegThatOthersHoldStaysUntilTheyLetItGo)
{
    CC_CallLeg& released = join(x, "L", LegState::RELEASED);
    join(x, "M", LegState::CONNECTED);
    turn();
    EXPECT_EQ(legsOf(x), (Lines{"L", "M"}));
    letGo(released);
    EXPECT_FALSE(turn()) << "letting go asks for nothing by itself";
    x.defer();
    turn();
    EXPECT_EQ(legsOf(x), Lines{"M"});
}

TEST_F(CC_Call_DeferredTest, ACallWithoutALiveLegIsGivenBackAlthoughALegIsStillHeld)
{
    CC_CallLeg& held = join(x, "L", LegState::RELEASED);
    observe(x, "x");
    observe(held, "o");
    EXPECT_EQ(turnLines(), (Lines{"x: L left X", "o: L moved from X to none", "x: X ended"}));
    EXPECT_EQ(held.getCall(), nullptr);
    EXPECT_EQ(numberOfCalls(), 0u);
    EXPECT_TRUE(isOver());
}

TEST_F(CC_Call_DeferredTest, OneIdleLegKeepsItsCallAlive)
{
    CC_CallLeg& idle = join(x, "L");
    letGo(idle);
    turn();
    EXPECT_EQ(legsOf(x), Lines{"L"});
    EXPECT_EQ(numberOfCalls(), 1u);
}

TEST_F(CC_Call_DeferredTest, ALegWithoutStateOrWithOneOfAnotherClassCountsAsReleased)
{
    CC_CallLeg& stateless = join(x, "L", LegState::CONNECTED);
    stateless.getPropertiesToWrite().remove(CC_PropertyId::STATE);
    letGo(stateless);
    CC_CallLeg& mistyped = join(x, "M", LegState::CONNECTED);
    mistyped.getPropertiesToWrite().remove(CC_PropertyId::STATE);
    EXPECT_EQ(mistyped.getPropertiesToWrite().set(CC_PropertyUnsigned(CC_PropertyId::STATE, 6)), XCode::OK);
    letGo(mistyped);
    turn();
    EXPECT_TRUE(isOver());
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
}

TEST_F(CC_Call_DeferredTest, ACallWithoutLegsIsGivenBackToItsPool)
{
    unsigned long long const removed = CC_CallPool::s_statistics.m_callsRemoved;
    x.defer();
    turn();
    EXPECT_EQ(numberOfCalls(), 0u);
    EXPECT_EQ(CC_CallPool::s_statistics.m_callsRemoved, removed + 1);
    EXPECT_TRUE(isOver());
}

TEST_F(CC_Call_DeferredTest, ACallWithoutAPoolDestroysItself)
{
    CC_Call* const own = new CC_Call;
    unsigned long long const removed = CC_CallPool::s_statistics.m_callsRemoved;
    letGo(join(*own, "L", LegState::RELEASED));
    turn();
    EXPECT_EQ(CC_Call::s_numberOfInstances, 1u) << "X";
    EXPECT_EQ(CC_CallPool::s_statistics.m_callsRemoved, removed);
}

TEST_F(CC_Call_DeferredTest, TheLessActiveOfTwoLoopedLegsIsPushedBack)
{
    loop(LegState::CONNECTED, LegState::ALERTING);
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
    setStates(LegState::ALERTING, LegState::CONNECTED);
    EXPECT_EQ(turnLines(), A_IS_PUSHED);
    EXPECT_EQ(legsOf(x), (Lines{"A", "B"})) << "the legs stay";
}

TEST_F(CC_Call_DeferredTest, EquallyActiveLegsAreToldApartByTheSmallerId)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
    setId(*b, 8);
    m_journal.clear();
    x.defer();
    EXPECT_EQ(turnLines(), A_IS_PUSHED);
}

TEST_F(CC_Call_DeferredTest, IdsAreComparedAsSixtyFourBitUnsigned)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    setId(*a, 0xffffffffffffffffULL);
    setId(*b, 0x100000000ULL);
    m_journal.clear();
    x.defer();
    EXPECT_EQ(turnLines(), Lines{"b: B asked (Push Back: 4294967296)"});
    setId(*a, 1);
    m_journal.clear();
    x.defer();
    EXPECT_EQ(turnLines(), Lines{"a: A asked (Push Back: 1)"});
}

TEST_F(CC_Call_DeferredTest, WithEqualIdsTheSecondLegIsPushedBack)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    setId(*a, 5);
    m_journal.clear();
    x.defer();
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
}

TEST_F(CC_Call_DeferredTest, OneLegMustBeConnectedAndTheOtherAtLeastAlerting)
{
    struct Case
    {
        LegState::State a;
        LegState::State b;
        Lines told;
    };
    loop(LegState::TRYING, LegState::TRYING);
    turn();
    for (Case const& c :
         {Case{LegState::CONNECTED, LegState::HELD, B_IS_PUSHED},
          Case{LegState::CONNECTED, LegState::ALERTING, B_IS_PUSHED},
          Case{LegState::CONNECTED, LegState::PROCEEDING, NOBODY},
          Case{LegState::CONNECTED, LegState::DISCONNECTING, NOBODY},
          Case{LegState::CONNECTED, LegState::RELEASED, NOBODY}, Case{LegState::HELD, LegState::HELD, NOBODY},
          Case{LegState::HELD, LegState::CONNECTED, A_IS_PUSHED}, Case{LegState::HELD, LegState::ALERTING, NOBODY},
          Case{LegState::ALERTING, LegState::ALERTING, NOBODY},
          Case{LegState::ALERTING, LegState::CONNECTED, A_IS_PUSHED},
          Case{LegState::PROCEEDING, LegState::CONNECTED, NOBODY}})
    {
        setStates(c.a, c.b);
        x.defer();
        EXPECT_EQ(turnLines(), c.told) << LegState::STATE_NAME(c.a) << " and " << LegState::STATE_NAME(c.b);
    }
}

TEST_F(CC_Call_DeferredTest, NetworksMustBeTheSameToTheByte)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    turn();
    for (String const& network : {String("NET"), String("ne"), String("net "), String("net\0", 4), String("")})
    {
        EXPECT_EQ(b->setProperty(CC_PropertyString(CC_PropertyId::NETWORK, network)), XCode::OK);
        m_journal.clear();
        EXPECT_EQ(turnLines(), NOBODY) << network.view();
    }
    setNetwork(*a, "");
    m_journal.clear();
    EXPECT_EQ(turnLines(), B_IS_PUSHED) << "two empty names are the same";
}

TEST_F(CC_Call_DeferredTest, ALoopOfNetworksWithNulBytesIsFound)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    for (CC_CallLeg* const leg : {a, b})
        EXPECT_EQ(leg->setProperty(CC_PropertyString(CC_PropertyId::NETWORK, String("n\0t", 3))), XCode::OK);
    m_journal.clear();
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
}

TEST_F(CC_Call_DeferredTest, AMissingOrMistypedPropertyEndsTheSearchForALoop)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    turn();
    m_journal.clear();
    RecordingMonitor const monitor(RTD::LEVEL_FLOW);
    for (unsigned int const id : {CC_PropertyId::NETWORK, CC_PropertyId::CALL_LEG_ID})
        for (CC_CallLeg* const leg : {a, b})
        {
            CC_PropertyContainer const kept(leg->getProperties());
            leg->getPropertiesToWrite().remove(id);
            x.defer();
            EXPECT_EQ(turnLines(), NOBODY);
            EXPECT_EQ(leg->getPropertiesToWrite().set(CC_PropertyBoolean(id, true)), XCode::OK);
            x.defer();
            EXPECT_EQ(turnLines(), NOBODY);
            leg->getPropertiesToWrite() = kept;
        }
    EXPECT_TRUE(monitor.getLines().empty());
    x.defer();
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
}

TEST_F(CC_Call_DeferredTest, OnlyACallOfExactlyTwoLegsIsSearched)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    CC_CallLeg& third = join(x, "C", LegState::DISCONNECTING);
    m_journal.clear();
    EXPECT_EQ(turnLines(), NOBODY);
    setState(third, LegState::RELEASED);
    m_journal.clear();
    EXPECT_EQ(turnLines(), NOBODY) << "released, but still held by its creator";
    letGo(third);
    x.defer();
    EXPECT_EQ(turnLines(), B_IS_PUSHED) << "gone in the same run";
    x.removeCallLeg(*b);
    m_journal.clear();
    EXPECT_EQ(turnLines(), NOBODY);
}

TEST_F(CC_Call_DeferredTest, ASecondRunRepeatsThePushBack)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
    x.defer();
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
}

TEST_F(CC_Call_DeferredTest, ThatALegAllowsNoPushBackChangesNothing)
{
    loop(LegState::CONNECTED, LegState::CONNECTED);
    EXPECT_EQ(b->setProperty(CC_PropertyBoolean(CC_PropertyId::ALLOWS_PUSH_BACK, false)), XCode::OK);
    m_journal.clear();
    EXPECT_EQ(turnLines(), B_IS_PUSHED);
}

TEST_F(CC_Call_DeferredTest, ThePushBackIsLoggedAtLevelTwoAndReachesTheCallsLegObservers)
{
    loop(LegState::CONNECTED, LegState::ALERTING);
    observeLegs(x, "all");
    RecordingMonitor const monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(turnLines(), (Lines{"b: B asked (Push Back: 5)", "all: B asked (Push Back: 5)"}));
    using Line = RecordingMonitor::Line;
    EXPECT_EQ(monitor.getLines(),
              std::vector<Line>({Line{RTD::LEVEL_FLOW, std::string("[Call ") + x.getName().c_str() +
                                                           "] Internal loop detected; push-back to net"}}));
}

TEST_F(CC_Call_DeferredTest, ThePushedBackMayReleaseTheCallAndLetBothLegsGo)
{
    loop(LegState::CONNECTED, LegState::ALERTING);
    RecordingCallLegObserver& observer = observeLegs(x, "all");
    observer.m_onService = [&](auto const&)
    {
        CallControl::RELEASE_CALL("SWITCH", &x);
        letGo(*a);
        letGo(*b);
    };
    turn();
    EXPECT_TRUE(isOver());
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
}

TEST_F(CC_Call_DeferredTest, AnObserverMayRemoveLegsDuringTheWalk)
{
    letGo(join(x, "A", LegState::RELEASED));
    CC_CallLeg& second = join(x, "B", LegState::RELEASED);
    letGo(join(x, "C", LegState::RELEASED));
    join(x, "D", LegState::CONNECTED);
    RecordingCallObserver& observer = observe(x, "x");
    observer.m_onLegRemoved = [&](auto const&)
    {
        observer.m_onLegRemoved = [](auto const&) {};
        x.removeCallLeg(second);
    };
    m_journal.clear();
    EXPECT_EQ(turnLines(), (Lines{"x: A left X", "x: B left X", "x: C left X"}));
    EXPECT_EQ(legsOf(x), Lines{"D"});
}

TEST_F(CC_Call_DeferredTest, ALegThatJoinsDuringTheWalkKeepsTheCallAlive)
{
    letGo(join(x, "A", LegState::RELEASED));
    CC_CallLeg& late = newLeg("late", LegState::CONNECTED);
    RecordingCallObserver& observer = observe(x, "x");
    observer.m_onLegRemoved = [&](auto const&)
    {
        observer.m_onLegRemoved = nullptr;
        EXPECT_EQ(x.addCallLeg(late), XCode::OK);
    };
    m_journal.clear();
    EXPECT_EQ(turnLines(), (Lines{"x: A left X", "x: late joined X"}));
    EXPECT_EQ(legsOf(x), Lines{"late"});
    settle();
    EXPECT_EQ(numberOfCalls(), 1u);
}

TEST_F(CC_Call_DeferredTest, ALegThatJoinsWhileTheCallIsBeingEmptiedGoesWithTheRest)
{
    join(x, "A", LegState::RELEASED); // held: leaves only when the call is given back
    CC_CallLeg& late = newLeg("late", LegState::CONNECTED);
    RecordingCallObserver& observer = observe(x, "x");
    observer.m_onLegRemoved = [&](auto const&)
    {
        observer.m_onLegRemoved = [](auto const&) {};
        EXPECT_EQ(x.addCallLeg(late), XCode::OK);
    };
    m_journal.clear();
    EXPECT_EQ(turnLines(), (Lines{"x: A left X", "x: late joined X", "x: late left X", "x: X ended"}));
    EXPECT_EQ(late.getCall(), nullptr);
    EXPECT_TRUE(isOver());
}

TEST_F(CC_Call_DeferredTest, ACallReleasedDuringTheWalkPushesNobodyBack)
{
    letGo(join(x, "R", LegState::RELEASED));
    loop(LegState::CONNECTED, LegState::CONNECTED);
    observe(x, "x").m_onLegRemoved = [&](CC_EvCallCallLegModified const& event)
    {
        if (event.getCallLeg()->getState() == LegState::RELEASED)
            CallControl::RELEASE_CALL("SWITCH", &x);
    };
    EXPECT_EQ(turnLines(), (Lines{"x: R left X", "x: A left X", "a: A moved from X to none", "x: B left X",
                                  "b: B moved from X to none", "x: X ended"}));
}

TEST_F(CC_Call_DeferredTest, AnObserverMayReleaseTheCallDuringTheWalk)
{
    letGo(join(x, "A", LegState::RELEASED));
    CC_CallLeg& held = join(x, "B", LegState::RELEASED);
    RecordingCallObserver& observer = observe(x, "x");
    observer.m_onLegRemoved = [&](auto const&)
    {
        observer.m_onLegRemoved = [](auto const&) {};
        CallControl::RELEASE_CALL("SWITCH", &x);
    };
    unsigned long long const removed = CC_CallPool::s_statistics.m_callsRemoved;
    m_journal.clear();
    EXPECT_EQ(turnLines(), (Lines{"x: A left X", "x: B left X", "x: X ended"}));
    EXPECT_EQ(CC_CallPool::s_statistics.m_callsRemoved, removed + 1) << "given back once";
    EXPECT_EQ(held.getCall(), nullptr);
    EXPECT_TRUE(isOver());
}

TEST_F(CC_Call_DeferredTest, AnObserverMayDestroyTheContextDuringTheWalk)
{
    letGo(join(x, "A", LegState::RELEASED));
    observe(x, "x").m_onLegRemoved = [&](auto const&) { CallControl::DESTROY_CONTEXT("SWITCH"); };
    m_journal.clear();
    EXPECT_EQ(turnLines(), (Lines{"x: A left X", "x: X ended"}));
    EXPECT_TRUE(isOver());
}

TEST_F(CC_Call_DeferredTest, AnObserverThatAlwaysPutsALegBackCannotKeepTheCall)
{
    for (char const* const name : {"A", "B"})
        letGo(join(x, name, LegState::RELEASED));
    unsigned int returns = 0;
    observe(x, "x").m_onLegRemoved = [&](CC_EvCallCallLegModified const& event)
    {
        if (++returns < 50)
            std::ignore = x.addCallLeg(*event.getCallLeg()); // refused in the end, when the call itself ends
    };
    turn();
    EXPECT_TRUE(isOver());
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
    EXPECT_LT(returns, 10u);
}
