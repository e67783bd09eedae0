#include "environment/CC_Moment.h"

#include "testing/DrivenClock.h"
#include "testing/DrivenLoop.h"

#include <gtest/gtest.h>
#include <tuple>

namespace
{
constexpr long long MILLISECOND = 1000000;

struct Moments
{
    DrivenClock clock;
    DrivenLoop loop;
    CC_Moment first;
    CC_Moment second;
};

void TAKE_TWO(void* argument)
{
    Moments& moments = *static_cast<Moments*>(argument);
    moments.first = CC_Moment::NOW();
    moments.clock.advance(7);
    moments.second = CC_Moment::NOW();
}
} // namespace

TEST(CC_Moment, AllThatHappensInATurnHasOneTime)
{
    Moments moments;
    auto* const event = new TYEvent(moments.loop, EventPrio::HIGH, TAKE_TWO, &moments);
    std::ignore = event->setIfNotPending();
    moments.loop.turn();
    CC_Moment const ofTheFirstTurn = moments.first;
    EXPECT_EQ(moments.first, moments.second);
    EXPECT_EQ(moments.first.turn, 1u);
    std::ignore = event->setIfNotPending();
    moments.loop.turn();
    EXPECT_EQ(moments.first.turn, 2u);
    EXPECT_EQ(moments.first.nanoseconds - ofTheFirstTurn.nanoseconds, 7 * MILLISECOND) << "each turn reads anew";
    event->destroy();
}

TEST(CC_Moment, BetweenTurnsTimeGoesOn)
{
    Moments moments;
    TAKE_TWO(&moments);
    EXPECT_EQ(moments.second.nanoseconds - moments.first.nanoseconds, 7 * MILLISECOND);
    EXPECT_EQ(moments.second.turn, 0u) << "no turn has begun yet";
}

TEST(CC_Moment, TimeDoesNotGoBackBehindATurn)
{
    DrivenLoop loop;
    TY::Time::SET_CLOCK(
        [](unsigned int source) {
            return source == TY::Time::MONOTONIC_COARSE ? TY::Time{7, 0} : TY::Time{7, 4000000};
        });
    CC_Moment inTurn;
    auto* const event = new TYEvent(
        loop, EventPrio::HIGH, [](void* moment) { *static_cast<CC_Moment*>(moment) = CC_Moment::NOW(); }, &inTurn);
    std::ignore = event->setIfNotPending();
    loop.turn();
    EXPECT_EQ(inTurn.nanoseconds, 7004 * MILLISECOND);
    EXPECT_EQ(CC_Moment::NOW().nanoseconds, 7004 * MILLISECOND) << "though the system's last tick was before";
    TY::Time::SET_CLOCK(nullptr);
    event->destroy();
}

TEST(CC_Moment, WithoutALoopIsNoMoment) { EXPECT_EQ(CC_Moment::NOW(), CC_Moment()); }

TEST(CC_Moment, TheSystemsCoarseClockIsTheMonotonicOneOfAMomentAgo)
{
    auto const nanoseconds = [](TY::Time const& time) { return time.seconds * 1000000000 + time.nanoseconds; };
    long long const coarse = nanoseconds(TY::Time::NOW(TY::Time::MONOTONIC_COARSE));
    long long const exact = nanoseconds(TY::Time::NOW(TY::Time::MONOTONIC));
    EXPECT_LE(coarse, exact);
    EXPECT_LE(exact, nanoseconds(TY::Time::NOW(TY::Time::MONOTONIC_COARSE)) + 20 * MILLISECOND);
}
