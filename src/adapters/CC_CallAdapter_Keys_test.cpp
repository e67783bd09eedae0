#include "properties/CC_PropertyKeys.h"
#include "testing/FailingAllocator.h"
#include "tests/support/TestLine.h"

namespace
{
class CC_CallAdapter_Keys_Test : public TestLines
{
};
using State = CC_PropertyCallLegState;
String const LONG_TEXT("a text too long to be kept without memory");
} // namespace

TEST_F(CC_CallAdapter_Keys_Test, WithoutALegSettersSaySoAndGettersFindNothing)
{
    EXPECT_EQ(a.adapter.setOwn(Key::NAME, "Anna"), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setPeer(Key::NAME, "Anna"), XCode::ABSENT);
    EXPECT_EQ(a.adapter.setCall(Key::NAME, "Anna"), XCode::ABSENT);
    EXPECT_FALSE(a.adapter.getOwn(Key::NAME));
    EXPECT_FALSE(a.adapter.getPeer(Key::NAME));
    EXPECT_FALSE(a.adapter.getCall(Key::NAME));
    EXPECT_EQ(a.adapter.getOwn(Key::NAME, "nobody"), "nobody");
    EXPECT_EQ(a.adapter.getPeer(Key::HOPS, 7u), 7u);
    EXPECT_EQ(a.adapter.getCall(Key::ENDPOINT_IS_ISDN, true), true);
}

TEST_F(CC_CallAdapter_Keys_Test, WhatIsSetUnderAKeyIsReadBackFromTheSameTarget)
{
    connect();
    EXPECT_EQ(a.adapter.setOwn(Key::NAME, "own"), XCode::OK);
    EXPECT_EQ(a.adapter.setPeer(Key::NAME, "peer"), XCode::OK);
    EXPECT_EQ(a.adapter.setCall(Key::NAME, "call"), XCode::OK);
    EXPECT_EQ(a.own(CC_PropertyId::NAME), "own");
    EXPECT_EQ(a.peer(CC_PropertyId::NAME), "peer");
    EXPECT_EQ(a.call(CC_PropertyId::NAME), "call");
    EXPECT_EQ(a.adapter.getOwn(Key::NAME), "own");
    EXPECT_EQ(a.adapter.getPeer(Key::NAME), "peer");
    EXPECT_EQ(a.adapter.getCall(Key::NAME), "call");
    EXPECT_EQ(a.adapter.getOwn(Key::NAME, "nobody"), "own") << "no fallback is needed";
    EXPECT_EQ(a.adapter.getPeer(Key::NAME, "nobody"), "peer");
    EXPECT_EQ(a.adapter.getCall(Key::NAME, "nobody"), "call");
}

TEST_F(CC_CallAdapter_Keys_Test, TheOtherSideSeesWhatIsSet)
{
    connect();
    EXPECT_EQ(b.adapter.setOwn(Key::STATE, State::ALERTING), XCode::OK);
    EXPECT_EQ(b.adapter.setOwn(Key::HOPS, 3), XCode::OK);
    settle();
    EXPECT_EQ(a.adapter.getPeer(Key::STATE), State::ALERTING);
    EXPECT_EQ(a.adapter.getPeer(Key::HOPS, 0u), 3u);
    EXPECT_EQ(a.adapter.setPeer(Key::DISPLAY, "for b"), XCode::OK);
    EXPECT_EQ(b.adapter.getOwn(Key::DISPLAY), "for b");
    EXPECT_EQ(b.adapter.setCall(Key::DISPLAY, "for both"), XCode::OK);
    EXPECT_EQ(a.adapter.getCall(Key::DISPLAY), "for both");
}

TEST_F(CC_CallAdapter_Keys_Test, AKeyTakesAllThatItsClassIsMadeOf)
{
    connect();
    EXPECT_EQ(a.adapter.setOwn(Key::CAUSE, QCause::USER_BUSY, 486u), XCode::OK);
    auto const cause = a.adapter.getOwn(Key::CAUSE);
    ASSERT_TRUE(cause);
    EXPECT_EQ(cause->getCause(), QCause::USER_BUSY);
    EXPECT_EQ(cause, QCause::USER_BUSY);
}

TEST_F(CC_CallAdapter_Keys_Test, APropertyOfAnotherClassIsNotFoundUnderTheKey)
{
    connect();
    ASSERT_EQ(a.adapter.setOwnProperty(CC_PropertyString(CC_PropertyId::HOPS, "many")), XCode::OK);
    EXPECT_NE(a.adapter.getOwnProperty(CC_PropertyId::HOPS), nullptr);
    EXPECT_FALSE(a.adapter.getOwn(Key::HOPS));
    EXPECT_EQ(a.adapter.getOwn(Key::HOPS, 5u), 5u);
}

TEST_F(CC_CallAdapter_Keys_Test, WithoutMemoryForTheValueItIsAFailureAndNothingChanges)
{
    connect();
    ASSERT_EQ(a.adapter.setOwn(Key::NAME, "Anna"), XCode::OK);
    FailingAllocator::failNth(1);
    XCode const own = a.adapter.setOwn(Key::NAME, LONG_TEXT);
    FailingAllocator::failNth(1);
    XCode const peer = a.adapter.setPeer(Key::NAME, LONG_TEXT);
    FailingAllocator::failNth(1);
    XCode const call = a.adapter.setCall(Key::NAME, LONG_TEXT);
    FailingAllocator::stop();
    EXPECT_EQ(own, XCode::FAILURE);
    EXPECT_EQ(peer, XCode::FAILURE);
    EXPECT_EQ(call, XCode::FAILURE);
    EXPECT_EQ(a.adapter.getOwn(Key::NAME), "Anna");
    EXPECT_FALSE(a.adapter.getPeer(Key::NAME));
    EXPECT_FALSE(a.adapter.getCall(Key::NAME));
}
