#include "testing/CallControlFixture.h"

#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_Property.h"
#include "properties/CC_PropertyId.h"
#include "testing/LeakCheck.h"
#include "testing/RecordingContextObserver.h"

#include <gtest/gtest.h>
#include <memory>

TEST(CallControlFixture, IsReadyForCalls)
{
    CallControlFixture callControl;
    EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), &callControl.m_loop);
    EXPECT_EQ(CallControl::GET_MG_CONTEXT_REPOSITORY(), &callControl.m_mediaContexts);
    ASSERT_NE(callControl.getContext(), nullptr);
    EXPECT_EQ(callControl.getContext()->getName(), "SWITCH");
    EXPECT_EQ(callControl.getPool(), callControl.getContext()->getCallPool());
    std::unique_ptr<CC_Property> const property(CallControl::CREATE_PROPERTY(CC_PropertyId::NAME));
    EXPECT_NE(property, nullptr);
}

TEST(CallControlFixture, TakesEverythingBack)
{
    LeakCheck const check;
    {
        CallControlFixture callControl;
        CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
        CC_CallLeg* const leg = new CC_CallLeg;
        EXPECT_TRUE(call->addCallLeg(*leg).isOk());
        call->removeCallLeg(*leg); // the call's clean-up is still to come
        leg->removeReference();
    }
    EXPECT_EQ(check.compare(), "");
    EXPECT_EQ(CallControl::GET_CONTEXT("SWITCH"), nullptr);
    EXPECT_EQ(CallControl::GET_CC_EVENT_LOOP(), nullptr);
    EXPECT_EQ(CallControl::CREATE_PROPERTY(CC_PropertyId::NAME), nullptr);
}

TEST(CallControlFixture, TheTestMayDestroyTheContext)
{
    CallControlFixture callControl;
    CallControl::DESTROY_CONTEXT("SWITCH");
    EXPECT_EQ(callControl.getContext(), nullptr);
    EXPECT_EQ(callControl.getPool(), nullptr);
}

TEST(CallControlFixture, OneFollowsAnother)
{
    for (int i = 0; i < 3; ++i)
    {
        CallControlFixture callControl;
        EXPECT_NE(callControl.getPool(), nullptr);
    }
}

TEST(CallControlFixture, ObserversOfItsContextMayEndBeforeIt)
{
    Journal journal;
    {
        CallControlFixture callControl;
        RecordingContextObserver observer("o", &journal);
        EXPECT_EQ(observer.observe(*callControl.getContext()), XCode::OK);
        CallControl::RELEASE_CALL("SWITCH", CallControl::ACQUIRE_CALL("SWITCH"));
        journal.add("the test ends");
    }
    EXPECT_EQ(journal.take(), (Lines{"o: SWITCH call created", "o: SWITCH call destroyed", "the test ends"}));
}

TEST(CallControlFixtureDeathTest, ASecondOneAtATimeIsRefusedClearly)
{
    CallControlFixture const callControl;
    EXPECT_DEATH(CallControlFixture(), "is another fixture alive");
}
