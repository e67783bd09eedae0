#include "testing/FakeMediaContextRepository.h"

#include "callcontrol/CallControl.h"
#include "testing/FakeMediaContext.h"
#include "testing/FakeTerminationRepository.h"

#include <gtest/gtest.h>

TEST(FakeMediaContextRepository, IsCallControlsWhileItLives)
{
    {
        FakeMediaContextRepository const contexts;
        EXPECT_EQ(CallControl::GET_MG_CONTEXT_REPOSITORY(), &contexts);
    }
    EXPECT_EQ(CallControl::GET_MG_CONTEXT_REPOSITORY(), nullptr);
}

TEST(FakeMediaContextRepository, CountsRequestsAndNumbersContexts)
{
    FakeMediaContextRepository contexts;
    int runs = 0;
    contexts.m_onRequest = [&] { ++runs; };
    TYPtr<MG_IContext> first;
    TYPtr<MG_IContext> second;
    EXPECT_EQ(contexts.createContext(first), XCode::OK);
    EXPECT_EQ(contexts.createContext(second), XCode::OK);
    EXPECT_EQ(first->getId(), 1u);
    EXPECT_EQ(second->getId(), 2u);
    EXPECT_EQ(contexts.getNumberOfRequests(), 2u);
    EXPECT_EQ(runs, 2);
    EXPECT_EQ(FakeMediaContext::s_numberOfInstances, 2u);
}

TEST(FakeMediaContextRepository, AFailingOneLeavesThePointer)
{
    FakeMediaContextRepository contexts;
    TYPtr<MG_IContext> context;
    EXPECT_EQ(contexts.createContext(context), XCode::OK);
    contexts.setFailing(true);
    EXPECT_EQ(contexts.createContext(context), XCode::FAILURE);
    EXPECT_EQ(context->getId(), 1u);
    EXPECT_EQ(contexts.getNumberOfRequests(), 2u);
    contexts.setFailing(false);
    EXPECT_EQ(contexts.createContext(context), XCode::OK);
    EXPECT_EQ(context->getId(), 2u);
}

TEST(FakeTerminationRepository, IsCallControlsWhileItLives)
{
    {
        FakeTerminationRepository const terminations;
        EXPECT_EQ(CallControl::GET_MG_TERMINATION_REPOSITORY(), &terminations);
    }
    EXPECT_EQ(CallControl::GET_MG_TERMINATION_REPOSITORY(), nullptr);
}
