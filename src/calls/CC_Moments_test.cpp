// When calls and legs were made, and since when they are in their states.
#include "properties/CC_PropertyBoolean.h"
#include "testing/DrivenClock.h"
#include "tests/support/CallsTest.h"

namespace
{
using StateProperty = CC_PropertyCallLegState;

struct CC_Moments_Test : CallsTest
{
    void pass(long long milliseconds)
    {
        settle();
        m_clock.advance(milliseconds);
    }
    /// In milliseconds, how long ago that was.
    static long long ago(CC_Moment const& moment)
    {
        return (CC_Moment::NOW().nanoseconds - moment.nanoseconds) / 1000000;
    }

    DrivenClock m_clock;
};
} // namespace

TEST_F(CC_Moments_Test, ALegIsInItsStateSinceThatWasStored)
{
    CC_CallLeg& leg = newLeg("a", State::TRYING);
    EXPECT_EQ(leg.getStart(), CC_Moment::NOW());
    EXPECT_EQ(leg.getStateSince(), leg.getStart());
    CC_Call& call = newCall("X");
    EXPECT_TRUE(call.addCallLeg(leg).isOk());
    pass(100);
    setState(leg, State::ALERTING);
    pass(10);
    EXPECT_EQ(ago(leg.getStart()), 110);
    EXPECT_EQ(ago(leg.getStateSince()), 10);
    setState(leg, State::ALERTING); // which it is already
    EXPECT_EQ(leg.setProperty(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true)), XCode::OK);
    EXPECT_EQ(leg.setProperty(StateProperty(CC_PropertyId::STATE, State::IDLE)), XCode::FAILURE);
    EXPECT_EQ(ago(leg.getStateSince()), 10);
    bool changed = false;
    EXPECT_TRUE(leg.setPropertyNoNotification(StateProperty(CC_PropertyId::STATE, State::HELD), changed).isOk());
    EXPECT_EQ(ago(leg.getStateSince()), 0);
}

TEST_F(CC_Moments_Test, TheFirstStateThatNobodyObservesCountsFromTheLegsStart)
{
    CC_CallLeg& unobserved = newLeg("a");
    CC_CallLeg& observed = newLeg("b");
    RecordingCallLegObserver observer("o");
    EXPECT_TRUE(observer.observe(observed).isOk());
    pass(100);
    setState(unobserved, State::TRYING);
    setState(observed, State::TRYING);
    EXPECT_EQ(ago(unobserved.getStateSince()), 100);
    EXPECT_EQ(ago(observed.getStateSince()), 0);
}

TEST_F(CC_Moments_Test, AMomentTellsTheTurn)
{
    turn();
    CC_CallLeg const& before = newLeg("a");
    turn();
    CC_CallLeg const& after = newLeg("b");
    EXPECT_EQ(after.getStart().turn, before.getStart().turn + 1);
}

TEST_F(CC_Moments_Test, ACallIsInItsStateSinceItsLegsMadeItSo)
{
    CC_Call& call = newCall("X");
    EXPECT_EQ(call.getStart(), CC_Moment::NOW());
    pass(1000);
    CC_CallLeg& a = join(call, "a", State::CONNECTED);
    EXPECT_EQ(ago(call.getStateSince()), 1000) << "one leg: as inactive as none";
    CC_CallLeg& b = join(call, "b", State::TRYING);
    EXPECT_EQ(ago(call.getStateSince()), 0) << "active by a leg that joins";
    pass(10);
    setState(b, State::ALERTING);
    setState(b, State::CONNECTED);
    EXPECT_EQ(ago(call.getStateSince()), 10) << "it stays active";
    CC_CallLeg& c = join(call, "c");
    EXPECT_EQ(ago(call.getStateSince()), 10);
    setState(c, State::TRYING);
    EXPECT_EQ(ago(call.getStateSince()), 0) << "a conference by a leg that becomes active";
    pass(10);
    setState(c, State::RELEASED);
    EXPECT_EQ(ago(call.getStateSince()), 0);
    pass(10);
    call.removeCallLeg(a);
    EXPECT_EQ(ago(call.getStateSince()), 0) << "inactive by a leg that leaves";
    pass(10);
    EXPECT_EQ(ago(call.getStateSince()), 10);
    EXPECT_EQ(ago(call.getStart()), 1040);
}

TEST_F(CC_Moments_Test, AMoveChangesBothCalls)
{
    CC_Call& left = newCall("X");
    CC_Call& right = newCall("Y");
    CC_CallLeg& moving = join(left, "a", State::CONNECTED);
    join(left, "b", State::CONNECTED);
    join(right, "c", State::CONNECTED);
    pass(100);
    EXPECT_TRUE(CC_Call::TRANSFER_CALL_LEG(&right, moving).isOk());
    EXPECT_EQ(ago(left.getStateSince()), 0);
    EXPECT_EQ(ago(right.getStateSince()), 0);
}

TEST_F(CC_Moments_Test, TheStateIsThatOfThePropertyAlsoWhenSomebodyWroteItPastTheLeg)
{
    CC_CallLeg& leg = newLeg("a", State::CONNECTED);
    EXPECT_EQ(leg.getState(), State::CONNECTED);
    leg.getPropertiesToWrite().remove(CC_PropertyId::STATE);
    EXPECT_EQ(leg.getState(), State::RELEASED);
    setState(leg, State::HELD);
    EXPECT_EQ(leg.getState(), State::HELD);
}
