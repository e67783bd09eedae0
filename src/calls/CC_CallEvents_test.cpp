#include "calls/CC_CallEvents.h"

#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"
#include "tests/support/CallsTest.h"

#include <memory>
#include <typeinfo>

namespace
{
struct CC_CallEventsTest : CallsTest
{
    CC_CallEventsTest() : m_call(newCall("X")) { EXPECT_TRUE(m_flags.set(CC_PropertyId::NAME, true).isOk()); }

    CC_Call& m_call;
    CC_Flags m_flags;
};

String INFO(CC_Event<CC_Call> const& event)
{
    String info("before ");
    return event.getInfo(info);
}
} // namespace

TEST_F(CC_CallEventsTest, EachAppendsExactlyItsClassName)
{
    CC_CallLeg& leg = newLeg("L");
    EXPECT_EQ(INFO(CC_EvCallObservationEnded(m_call)), "before CC_EvCallObservationEnded");
    EXPECT_EQ(INFO(CC_EvCallCallLegModified(m_call, leg)), "before CC_EvCallCallLegModified");
    EXPECT_EQ(INFO(CC_EvCallPropertyChanged(m_call, m_flags)), "before CC_EvCallPropertyChanged");
}

TEST_F(CC_CallEventsTest, GetInfoReturnsTheTextThatItAppendedTo)
{
    String info;
    CC_EvCallObservationEnded const event(m_call);
    EXPECT_EQ(&event.getInfo(info), &info);
}

TEST_F(CC_CallEventsTest, ACloneIsOfTheSameClassAndSource)
{
    CC_EvCallObservationEnded const event(m_call);
    std::unique_ptr<CC_Event<CC_Call>> const clone(event.clone());
    ASSERT_NE(clone, nullptr);
    EXPECT_NE(clone.get(), &event);
    CC_Event<CC_Call> const& copy = *clone;
    EXPECT_EQ(typeid(copy), typeid(event));
    EXPECT_EQ(clone->getSource(), &m_call);
}

TEST_F(CC_CallEventsTest, ACloneOfALegsArrivalPointsToTheLeg)
{
    CC_CallLeg& leg = newLeg("L");
    std::unique_ptr<CC_Event<CC_Call>> const clone(CC_EvCallCallLegModified(m_call, leg).clone());
    EXPECT_EQ(dynamic_cast<CC_EvCallCallLegModified const&>(*clone).getCallLeg(), &leg);
    EXPECT_EQ(clone->getSource(), &m_call);
}

TEST_F(CC_CallEventsTest, FlagsAreCopiedIntoTheEventAndIntoItsClone)
{
    std::unique_ptr<CC_Event<CC_Call>> clone;
    {
        CC_EvCallPropertyChanged const event(m_call, m_flags);
        m_flags.clear();
        EXPECT_EQ(PROPERTY_NAMES(event.getFlags()), "Name");
        clone.reset(event.clone());
    }
    EXPECT_EQ(PROPERTY_NAMES(dynamic_cast<CC_EvCallPropertyChanged const&>(*clone).getFlags()), "Name");
}

TEST_F(CC_CallEventsTest, ACloneThatFindsNoMemoryIsNull)
{
    CC_EvCallPropertyChanged const event(m_call, m_flags);
    FailingAllocator::failNth(1);
    CC_Event<CC_Call>* const clone = event.clone();
    FailingAllocator::stop();
    EXPECT_EQ(clone, nullptr);
    delete clone;
}

TEST_F(CC_CallEventsTest, AnEventOfAnotherOperationCannotBeCast)
{
    CC_EvCallObservationEnded const event(m_call);
    CC_Event<CC_Call> const& base = event;
    EXPECT_THROW(static_cast<void>(dynamic_cast<CC_EvCallPropertyChanged const&>(base)), std::bad_cast);
}
