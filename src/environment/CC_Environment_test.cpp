#include "environment/CC_Environment.h"

#include "callcontrol/CallControl.h"
#include "platform/eventloop/TYEventLoop.h"
#include "testing/FakeMediaContextRepository.h"

#include <gtest/gtest.h>

TEST(CC_Environment, HoldsWhatTheApplicationGaveTheOneCallControl)
{
    TYEventLoop loop;
    FakeMediaContextRepository mediaContexts; // sets itself
    CallControl::SET_CC_EVENT_LOOP(&loop);
    EXPECT_EQ(CC_Environment::CC_EVENT_LOOP(), &loop);
    EXPECT_EQ(CC_Environment::MG_CONTEXT_REPOSITORY(), &mediaContexts);
    CallControl::SET_CC_EVENT_LOOP(nullptr);
    EXPECT_EQ(CC_Environment::CC_EVENT_LOOP(), nullptr);
}

TEST(CC_Environment, AnotherCallControlHasOneOfItsOwn)
{
    TYEventLoop loop;
    CallControl::INSTANCE();
    {
        CallControl other;
        other.setCcEventLoop(&loop);
        EXPECT_EQ(CC_Environment::CC_EVENT_LOOP(), nullptr);
    }
    EXPECT_EQ(CC_Environment::CC_EVENT_LOOP(), CallControl::GET_CC_EVENT_LOOP()) << "its end takes nothing away";
}
