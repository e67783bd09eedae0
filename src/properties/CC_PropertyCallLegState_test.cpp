#include "properties/CC_PropertyCallLegState.h"

#include "platform/base/NameOf.h"
#include "properties/CC_Factory.h"
#include "properties/CC_PropertyId.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <memory>

namespace
{
using State = CC_PropertyCallLegState::State;

struct Case
{
    State state;
    int number;
    char const* name;
};
// calls compare the numbers: inactive states are negative, the others count upward with the leg's progress
constexpr Case s_cases[] = {
    {State::IDLE, -2, "IDLE"},
    {State::RELEASED, -1, "RELEASED"},
    {State::DISCONNECTING, 0, "DISCONNECTING"},
    {State::TRYING, 1, "TRYING"},
    {State::ADDRESS_INCOMPLETE, 2, "ADDRESS-INCOMPLETE"},
    {State::PROCEEDING, 3, "PROCEEDING"},
    {State::ALERTING, 4, "ALERTING"},
    {State::HELD, 5, "HELD"},
    {State::CONNECTED, 6, "CONNECTED"},
};
} // namespace

TEST(CC_PropertyCallLegState, EveryStateHasItsNumberAndName)
{
    for (Case const& row : s_cases)
    {
        EXPECT_EQ(row.number, row.state) << row.name;
        EXPECT_STREQ(row.name, CC_PropertyCallLegState::STATE_NAME(row.state));
        EXPECT_EQ(row.name, VALUE_OF(CC_PropertyCallLegState(CC_PropertyId::STATE, row.state)));
    }
    for (int const number : {-3, 7})
        EXPECT_EQ(ERROR::INVALID, VALUE_OF(CC_PropertyCallLegState(CC_PropertyId::STATE, static_cast<State>(number))));
}

TEST(CC_PropertyCallLegState, AFreshOneIsReleased)
{
    std::unique_ptr<CC_Property> const made(CC_Factory().createProperty(CC_PropertyId::STATE));
    ASSERT_NE(nullptr, made);
    EXPECT_EQ("RELEASED", VALUE_OF(*made));
    EXPECT_EQ(State::RELEASED, CC_PropertyCallLegState(CC_PropertyId::STATE).getState());
    EXPECT_EQ("Invalid value", REFUSAL_OF(*made, "IDLE"));
}

TEST(CC_PropertyCallLegState, ComparesItsState)
{
    CC_PropertyCallLegState state(CC_PropertyId::STATE, State::ALERTING);
    EXPECT_FALSE(state.isEqual(CC_PropertyCallLegState(CC_PropertyId::STATE, State::HELD)));
    state.setState(State::HELD);
    EXPECT_TRUE(state.isEqual(CC_PropertyCallLegState(CC_PropertyId::STATE, State::HELD)));
}
