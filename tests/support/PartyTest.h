#pragma once

#include "testing/CallControlFixture.h"
#include "tests/support/Party.h"

#include <gtest/gtest.h>
#include <initializer_list>

/// Whole calls among parties, in verbs.
class PartyTest : public testing::Test
{
protected:
    void settle() { fixture.m_loop.settle(); }
    void connect(Party& caller, Party& callee)
    {
        ASSERT_EQ(caller.dial(callee), XCode::OK);
        ASSERT_EQ(callee.become(State::CONNECTED), XCode::OK);
        settle();
    }
    /// Destroys the adapters; then no call and no leg may be left.
    void expectNothingLeft(std::initializer_list<Party*> parties)
    {
        for (Party* const party : parties)
            party->adapter.reset();
        settle();
        EXPECT_EQ(CC_Call::s_numberOfInstances, 0u);
        EXPECT_EQ(CC_CallLeg::s_numberOfInstances, 0u);
    }

    CallControlFixture fixture;
};
