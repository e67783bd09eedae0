// Legs that enter, leave and change calls, and what observers may do meanwhile.
#include "callcontrol/CC_CallPool.h"
#include "testing/FailingAllocator.h"
#include "tests/support/CallsTest.h"

namespace
{
using LegState = CC_PropertyCallLegState;

struct CC_Call_LegsTest : CallsTest
{
    CC_Call_LegsTest() : x(newCall("X")), y(newCall("Y")) {}

    /// A leg that is CONNECTED in X; the journal is empty afterwards.
    CC_CallLeg& joinX(char const* name)
    {
        CC_CallLeg& leg = join(x, name, LegState::CONNECTED);
        m_journal.clear();
        return leg;
    }

    CC_Call& x;
    CC_Call& y;
};
} // namespace

TEST_F(CC_Call_LegsTest, ALegThatJoinsIsHeldListedAndTold)
{
    CC_CallLeg& leg = newLeg("L");
    observe(x, "x");
    observe(leg, "leg");
    EXPECT_EQ(x.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L joined X", "leg: L moved from none to X"}));
    EXPECT_EQ(leg.getCall(), &x);
    EXPECT_EQ(legsOf(x), Lines{"L"});
    letGo(leg);
    EXPECT_EQ(legsOf(x), Lines{"L"}) << "the call holds it";
}

TEST_F(CC_Call_LegsTest, ATransferToTheSameCallDoesNothing)
{
    CC_CallLeg& leg = joinX("L");
    observe(x, "x");
    observe(leg, "leg");
    EXPECT_EQ(CC_Call::TRANSFER_CALL_LEG(&x, leg), XCode::OK);
    CC_CallLeg& outside = newLeg("M");
    observe(outside, "outside");
    EXPECT_EQ(CC_Call::TRANSFER_CALL_LEG(nullptr, outside), XCode::OK);
    EXPECT_EQ(m_journal.take(), Lines());
    EXPECT_EQ(legsOf(x), Lines{"L"});
}

TEST_F(CC_Call_LegsTest, AMoveTellsTheOldCallThenTheNewThenTheLeg)
{
    CC_CallLeg& leg = joinX("L");
    observe(x, "x1");
    observe(x, "x2");
    observe(y, "y1");
    observe(y, "y2");
    observeLegs(x, "xLegs");
    observeLegs(y, "yLegs");
    observe(leg, "leg");
    EXPECT_EQ(CC_Call::TRANSFER_CALL_LEG(&y, leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x1: L left X", "x2: L left X", "y1: L joined Y", "y2: L joined Y",
                                       "leg: L moved from X to Y", "yLegs: L moved from X to Y"}))
        << "told once, to the new call's leg observers and not the old one's";
    EXPECT_EQ(legsOf(x), Lines());
    EXPECT_EQ(legsOf(y), Lines{"L"});
}

TEST_F(CC_Call_LegsTest, WhileALegLeavesTheNewCallListsItAndItStillNamesTheOld)
{
    CC_CallLeg& leg = joinX("L");
    observeLegs(x, "xLegs");
    RecordingCallObserver& leaving = observe(x, "x");
    RecordingCallObserver& joining = observe(y, "y");
    leaving.m_onLegRemoved = [&](auto const&)
    {
        EXPECT_EQ(leg.getCall(), &x);
        EXPECT_EQ(legsOf(x), Lines());
        EXPECT_EQ(legsOf(y), Lines{"L"});
        m_journal.add("-");
        setState(leg, LegState::HELD); // nobody of X hears of it any more, nor yet of Y
    };
    joining.m_onLegAdded = [&](auto const&)
    {
        EXPECT_EQ(leg.getCall(), &y);
        setState(leg, LegState::ALERTING);
    };
    observeLegs(y, "yLegs");
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L left X", "-", "y: L joined Y", "yLegs: L moved from X to Y"}));
}

TEST_F(CC_Call_LegsTest, TheCallsObserveTheirOwnLegsAlone)
{
    CC_CallLeg& leg = joinX("L");
    settle();
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    settle();
    EXPECT_EQ(numberOfCalls(), 1u) << "X is over: its last leg has left";
    EXPECT_EQ(CallControl::GET_CALL("SWITCH", 0), &y);
    setState(leg, LegState::RELEASED);
    settle();
    EXPECT_EQ(numberOfCalls(), 0u);
}

TEST_F(CC_Call_LegsTest, LegsKeepTheOrderOfJoining)
{
    CC_CallLeg& first = joinX("A");
    joinX("B");
    joinX("C");
    x.removeCallLeg(first);
    EXPECT_EQ(legsOf(x), (Lines{"B", "C"}));
    EXPECT_EQ(x.addCallLeg(first), XCode::OK);
    EXPECT_EQ(legsOf(x), (Lines{"B", "C", "A"}));
}

TEST_F(CC_Call_LegsTest, RemovingALegOfAnotherCallTakesItFromItsOwnAndDefersThisOne)
{
    CC_CallLeg& leg = joinX("L");
    observe(x, "x");
    settle();
    m_journal.clear();
    y.removeCallLeg(leg);
    EXPECT_EQ(m_journal.take(), Lines{"x: L left X"});
    EXPECT_EQ(leg.getCall(), nullptr);
    settle();
    EXPECT_EQ(numberOfCalls(), 0u) << "Y was deferred and had no leg, X has lost its last one";
}

TEST_F(CC_Call_LegsTest, DestroyParticipatingCallLegsTakesEveryLegOutInOrder)
{
    letGo(joinX("A"));
    joinX("B");
    letGo(joinX("C"));
    unsigned int const before = CC_CallLeg::s_numberOfInstances;
    observe(x, "x");
    x.destroyParticipatingCallLegs();
    EXPECT_EQ(m_journal.take(), (Lines{"x: A left X", "x: B left X", "x: C left X"}));
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, before - 2);
}

TEST_F(CC_Call_LegsTest, WithoutMemoryForTheFifthLegNothingMoves)
{
    for (char const* const name : {"A", "B", "C", "D"})
        join(y, name, LegState::CONNECTED);
    CC_CallLeg& leg = joinX("L");
    observe(x, "x");
    observe(leg, "leg");
    FailingAllocator::failNth(1);
    XCode const transferred = CC_Call::TRANSFER_CALL_LEG(&y, leg);
    FailingAllocator::failNth(1);
    XCode const added = y.addCallLeg(leg);
    FailingAllocator::stop();
    EXPECT_EQ(transferred, XCode::NO_ELEMENT);
    EXPECT_EQ(added, XCode::FAILURE);
    EXPECT_EQ(m_journal.take(), Lines());
    EXPECT_EQ(leg.getCall(), &x);
    EXPECT_EQ(y.getNumberOfCallLegs(), 4u);
    letGo(leg);
    EXPECT_EQ(legsOf(x), Lines{"L"}) << "its references are right";
    EXPECT_EQ(y.addCallLeg(*x.getCallLeg(0)), XCode::OK);
}

TEST_F(CC_Call_LegsTest, ALegObserverHearsOfLegsThatAreThereAndOfThoseThatJoin)
{
    CC_CallLeg& early = joinX("early");
    RecordingCallLegObserver& all = observeLegs(x, "all");
    CC_CallLeg& late = joinX("late");
    EXPECT_TRUE(hears(early, "all"));
    EXPECT_TRUE(hears(late, "all"));
    x.removeCallLegObserver(&all);
    EXPECT_FALSE(hears(early, "all"));
    EXPECT_FALSE(hears(late, "all"));
    CC_CallLeg& later = joinX("later");
    EXPECT_FALSE(hears(later, "all"));
}

TEST_F(CC_Call_LegsTest, ALegThatLeavesIsNotHeardOfAnyMore)
{
    CC_CallLeg& leg = joinX("L");
    observeLegs(x, "all");
    x.removeCallLeg(leg);
    EXPECT_FALSE(hears(leg, "all"));
}

TEST_F(CC_Call_LegsTest, AnObserverRegisteredTwiceIsAddedToAJoiningLegOnce)
{
    RecordingCallLegObserver& all = observeLegs(x, "all");
    EXPECT_EQ(x.addCallLegObserver(&all), XCode::OK);
    CC_CallLeg& leg = joinX("L");
    EXPECT_TRUE(hears(leg, "all"));
    leg.removeCallLegObserver(&all);
    EXPECT_FALSE(hears(leg, "all")) << "there was one registration";
    EXPECT_EQ(leg.addCallLegObserver(&all), XCode::OK);
    x.removeCallLeg(leg);
    EXPECT_FALSE(hears(leg, "all"));
}

TEST_F(CC_Call_LegsTest, ALegObserverAddedWhileALegIsOnItsWayInIsRegisteredOnce)
{
    CC_CallLeg& leg = joinX("L");
    RecordingCallLegObserver& whileLeaving = newLegObserver("whileLeaving");
    RecordingCallLegObserver& whileJoining = newLegObserver("whileJoining");
    observe(x, "x").m_onLegRemoved = [&](auto const&) { EXPECT_TRUE(y.addCallLegObserver(&whileLeaving).isOk()); };
    observe(y, "y").m_onLegAdded = [&](auto const&) { EXPECT_TRUE(y.addCallLegObserver(&whileJoining).isOk()); };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_TRUE(m_journal.contains("whileLeaving: L moved from X to Y"));
    EXPECT_TRUE(m_journal.contains("whileJoining: L moved from X to Y"));
    EXPECT_TRUE(hears(leg, "whileLeaving"));
    EXPECT_TRUE(hears(leg, "whileJoining"));
    y.removeCallLeg(leg);
    EXPECT_FALSE(hears(leg, "whileLeaving"));
    EXPECT_FALSE(hears(leg, "whileJoining"));
}

TEST_F(CC_Call_LegsTest, ALegObserverAddedWhileALegComesBackIsRegisteredOnce)
{
    CC_CallLeg& leg = joinX("L");
    x.removeCallLeg(leg);
    RecordingCallLegObserver& added = newLegObserver("added");
    observe(x, "x").m_onLegAdded = [&](auto const&) { EXPECT_TRUE(x.addCallLegObserver(&added).isOk()); };
    EXPECT_EQ(x.addCallLeg(leg), XCode::OK);
    EXPECT_TRUE(hears(leg, "added"));
    x.removeCallLeg(leg);
    EXPECT_FALSE(hears(leg, "added"));
}

TEST_F(CC_Call_LegsTest, ALegObserverRemovedWhileALegIsOnItsWayInIsNotRegistered)
{
    CC_CallLeg& leg = joinX("L");
    RecordingCallLegObserver& whileLeaving = observeLegs(y, "whileLeaving");
    RecordingCallLegObserver& whileJoining = observeLegs(y, "whileJoining");
    observe(x, "x").m_onLegRemoved = [&](auto const&) { y.removeCallLegObserver(&whileLeaving); };
    observe(y, "y").m_onLegAdded = [&](auto const&) { y.removeCallLegObserver(&whileJoining); };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_FALSE(hears(leg, "whileLeaving"));
    EXPECT_FALSE(hears(leg, "whileJoining"));
    y.removeCallLeg(leg);
    EXPECT_FALSE(hears(leg, "whileLeaving")) << "a count below 0 would be heard";
    EXPECT_FALSE(hears(leg, "whileJoining"));
}

TEST_F(CC_Call_LegsTest, ALegObserverOfTheOldCallAddedOrRemovedWhileALegLeavesDoesNotReachIt)
{
    CC_CallLeg& leg = joinX("L");
    RecordingCallLegObserver& removed = observeLegs(x, "removed");
    RecordingCallLegObserver& added = newLegObserver("added");
    observe(x, "x").m_onLegRemoved = [&](auto const&)
    {
        x.removeCallLegObserver(&removed);
        EXPECT_TRUE(x.addCallLegObserver(&added).isOk());
    };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_FALSE(hears(leg, "removed"));
    EXPECT_FALSE(hears(leg, "added"));
}

TEST_F(CC_Call_LegsTest, ALegObserverAddedInsideTheRelinkingIsToldAndCountsOnce)
{
    CC_CallLeg& leg = joinX("L");
    RecordingCallLegObserver& added = newLegObserver("added");
    observe(leg, "leg").m_onRelinked = [&](auto const&) { EXPECT_TRUE(y.addCallLegObserver(&added).isOk()); };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_TRUE(m_journal.contains("added: L moved from X to Y"));
    y.removeCallLegObserver(&added);
    EXPECT_FALSE(hears(leg, "added"));
}

TEST_F(CC_Call_LegsTest, AnObserverThatMissesAJoiningLegForMemoryDoesNotHearOfItAfterwardsEither)
{
    for (char const* const name : {"1", "2", "3", "4"}) // with the call itself: five
        observeLegs(x, name);
    CC_CallLeg& leg = newLeg("L", LegState::CONNECTED);
    FailingAllocator::failNth(1);
    XCode const joined = x.addCallLeg(leg);
    FailingAllocator::stop();
    EXPECT_EQ(joined, XCode::OK);
    EXPECT_TRUE(hears(leg, "3"));
    EXPECT_FALSE(hears(leg, "4"));
    x.removeCallLeg(leg);
    EXPECT_FALSE(hears(leg, "4")) << "a count below 0 would be heard";
}

TEST_F(CC_Call_LegsTest, AMoveAskedForInsideAMoveOfTheLegRunsAfterIt)
{
    CC_Call& z = newCall("Z");
    CC_CallLeg& leg = joinX("L");
    RecordingCallObserver& leaving = observe(x, "x");
    observe(y, "y");
    observe(z, "z");
    observe(leg, "leg");
    leaving.m_onLegRemoved = [&](auto const&)
    {
        EXPECT_EQ(z.addCallLeg(leg), XCode::OK);
        EXPECT_EQ(legsOf(z), Lines());
        m_journal.add("-");
    };
    EXPECT_EQ(CC_Call::TRANSFER_CALL_LEG(&y, leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L left X", "-", "y: L joined Y", "leg: L moved from X to Y", "y: L left Y",
                                       "z: L joined Z", "leg: L moved from Y to Z"}));
    EXPECT_EQ(leg.getCall(), &z);
    EXPECT_EQ(legsOf(y), Lines());
    EXPECT_EQ(legsOf(z), Lines{"L"});
}

TEST_F(CC_Call_LegsTest, OfSeveralMovesAskedForInsideAMoveTheLastCounts)
{
    CC_Call& z = newCall("Z");
    CC_CallLeg& leg = joinX("L");
    observe(leg, "leg");
    observe(y, "y").m_onLegAdded = [&](auto const&)
    {
        EXPECT_EQ(z.addCallLeg(leg), XCode::OK);
        y.removeCallLeg(leg);
        EXPECT_EQ(x.addCallLeg(leg), XCode::OK);
    };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(),
              (Lines{"y: L joined Y", "leg: L moved from X to Y", "y: L left Y", "leg: L moved from Y to X"}));
    EXPECT_EQ(leg.getCall(), &x);
}

TEST_F(CC_Call_LegsTest, AMoveBackIntoTheCallThatTheLegIsOnItsWayToChangesNothing)
{
    CC_CallLeg& leg = joinX("L");
    observe(leg, "leg");
    observe(x, "x").m_onLegRemoved = [&](auto const&) { EXPECT_EQ(y.addCallLeg(leg), XCode::OK); };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L left X", "leg: L moved from X to Y"}));
    EXPECT_EQ(legsOf(y), Lines{"L"});
}

TEST_F(CC_Call_LegsTest, ALegRemovedInsideItsOwnJoiningLeavesWithoutTrace)
{
    CC_CallLeg& leg = newLeg("L", LegState::CONNECTED);
    observeLegs(x, "all");
    observe(x, "x").m_onLegAdded = [&](auto const&) { x.removeCallLeg(leg); };
    EXPECT_EQ(x.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L joined X", "all: L moved from none to X", "x: L left X"}));
    EXPECT_EQ(leg.getCall(), nullptr);
    EXPECT_FALSE(hears(leg, "all"));
}

TEST_F(CC_Call_LegsTest, ALegLetGoByEverybodyInsideItsMoveEndsAfterIt)
{
    CC_CallLeg& leg = joinX("L");
    observe(leg, "leg");
    observe(x, "x").m_onLegRemoved = [&](auto const&) { letGo(leg); };
    x.removeCallLeg(leg);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L left X", "leg: L moved from X to none", "leg: L ended"}));
}

TEST_F(CC_Call_LegsTest, AnotherLegMayMoveInsideAMove)
{
    CC_CallLeg& first = joinX("A");
    CC_CallLeg& second = joinX("B");
    observe(x, "x").m_onLegRemoved = [&](CC_EvCallCallLegModified const& event)
    {
        if (event.getCallLeg() == &first)
        {
            EXPECT_EQ(y.addCallLeg(second), XCode::OK);
        }
    };
    observe(y, "y");
    EXPECT_EQ(y.addCallLeg(first), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: A left X", "x: B left X", "y: B joined Y", "y: A joined Y"}));
    EXPECT_EQ(legsOf(y), (Lines{"A", "B"})) << "A was listed before the old call was told";
}

TEST_F(CC_Call_LegsTest, TheOldCallMayBeReleasedInsideTheMove)
{
    CC_CallLeg& leg = joinX("L");
    CC_CallLeg& other = joinX("M");
    observe(leg, "leg");
    observe(x, "x").m_onLegRemoved = [&](CC_EvCallCallLegModified const& event)
    {
        if (event.getCallLeg() == &leg)
            CallControl::RELEASE_CALL("SWITCH", &x);
    };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L left X", "leg: L moved from X to Y", "x: M left X", "x: X ended"}));
    EXPECT_EQ(leg.getCall(), &y);
    EXPECT_EQ(other.getCall(), nullptr);
}

TEST_F(CC_Call_LegsTest, TheNewCallMayBeReleasedInsideTheMove)
{
    CC_CallLeg& leg = joinX("L");
    observe(leg, "leg");
    observe(x, "x").m_onLegRemoved = [&](auto const&) { CallControl::RELEASE_CALL("SWITCH", &y); };
    observe(y, "y");
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"x: L left X", "y: L joined Y", "leg: L moved from X to Y", "y: L left Y",
                                       "leg: L moved from Y to none", "y: Y ended"}));
    EXPECT_EQ(leg.getCall(), nullptr);
    EXPECT_EQ(CC_Call::s_numberOfInstances, 1u);
}

TEST_F(CC_Call_LegsTest, BothCallsMayBeReleasedAndTheLegLetGoInsideTheMove)
{
    CC_CallLeg& leg = joinX("L");
    observe(leg, "leg").m_onRelinked = [&](CC_EvCallLegCallRelinked const& event)
    {
        if (event.getNewCall() != &y)
            return;
        CallControl::RELEASE_CALL("SWITCH", &x);
        CallControl::RELEASE_CALL("SWITCH", &y);
        letGo(leg);
    };
    EXPECT_EQ(y.addCallLeg(leg), XCode::OK);
    EXPECT_EQ(m_journal.take(), (Lines{"leg: L moved from X to Y", "leg: L moved from Y to none", "leg: L ended"}));
    EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
    EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
}

TEST_F(CC_Call_LegsTest, AnObserverThatTakesALegOutInsideTheEmptyingOfACallIsHarmless)
{
    joinX("A");
    CC_CallLeg& second = joinX("B");
    joinX("C");
    observe(x, "x").m_onLegRemoved = [&](CC_EvCallCallLegModified const& event)
    {
        if (event.getCallLeg() != &second)
            x.removeCallLeg(second);
    };
    x.destroyParticipatingCallLegs();
    EXPECT_EQ(m_journal.take(), (Lines{"x: A left X", "x: B left X", "x: C left X"}));
    EXPECT_EQ(legsOf(x), Lines());
}

TEST_F(CC_Call_LegsTest, ALegThatJoinsInsideTheEmptyingOfACallIsTakenOutToo)
{
    joinX("A");
    CC_CallLeg& late = newLeg("B", LegState::CONNECTED);
    RecordingCallObserver& observer = observe(x, "x");
    observer.m_onLegRemoved = [&](auto const&)
    {
        observer.m_onLegRemoved = [](auto const&) {};
        EXPECT_EQ(x.addCallLeg(late), XCode::OK);
    };
    x.destroyParticipatingCallLegs();
    EXPECT_EQ(m_journal.take(), (Lines{"x: A left X", "x: B joined X", "x: B left X"}));
    EXPECT_EQ(legsOf(x), Lines());
}
