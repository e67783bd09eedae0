#include "calls/CC_CallLegEvents.h"

#include "services/CC_ServicePushBack.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"
#include "tests/support/CallsTest.h"

#include <memory>
#include <typeinfo>

namespace
{
struct CC_CallLegEventsTest : CallsTest
{
    CC_CallLegEventsTest() : m_leg(newLeg("L")) { EXPECT_TRUE(m_flags.set(CC_PropertyId::NAME, true).isOk()); }

    CC_CallLeg& m_leg;
    CC_Flags m_flags;
};

String INFO(CC_Event<CC_CallLeg> const& event)
{
    String info("before ");
    return event.getInfo(info);
}
} // namespace

TEST_F(CC_CallLegEventsTest, EachAppendsExactlyItsClassName)
{
    CC_ServicePushBack pushBack(1);
    EXPECT_EQ(INFO(CC_EvCallLegObservationEnded(m_leg)), "before CC_EvCallLegObservationEnded");
    EXPECT_EQ(INFO(CC_EvCallLegCallRelinked(m_leg, nullptr, nullptr)), "before CC_EvCallLegCallRelinked");
    EXPECT_EQ(INFO(CC_EvCallLegPropertyChanged(m_leg, m_flags)), "before CC_EvCallLegPropertyChanged");
    EXPECT_EQ(INFO(CC_EvCallLegSynchronousService(m_leg, pushBack)), "before CC_EvCallLegSynchronousService");
}

TEST_F(CC_CallLegEventsTest, ACloneIsOfTheSameClassAndSource)
{
    CC_EvCallLegObservationEnded const event(m_leg);
    std::unique_ptr<CC_Event<CC_CallLeg>> const clone(event.clone());
    ASSERT_NE(clone, nullptr);
    CC_Event<CC_CallLeg> const& copy = *clone;
    EXPECT_EQ(typeid(copy), typeid(event));
    EXPECT_EQ(clone->getSource(), &m_leg);
}

TEST_F(CC_CallLegEventsTest, ACloneOfAMoveKeepsNewAndOldCallApart)
{
    CC_Call& from = newCall("X");
    CC_Call& to = newCall("Y");
    std::unique_ptr<CC_Event<CC_CallLeg>> const clone(CC_EvCallLegCallRelinked(m_leg, &to, &from).clone());
    auto const& relinked = dynamic_cast<CC_EvCallLegCallRelinked const&>(*clone);
    EXPECT_EQ(relinked.getNewCall(), &to);
    EXPECT_EQ(relinked.getOldCall(), &from);
    EXPECT_EQ(clone->getSource(), &m_leg);
}

TEST_F(CC_CallLegEventsTest, FlagsAreCopiedIntoTheEventAndIntoItsClone)
{
    std::unique_ptr<CC_Event<CC_CallLeg>> clone;
    {
        CC_EvCallLegPropertyChanged const event(m_leg, m_flags);
        m_flags.clear();
        clone.reset(event.clone());
    }
    EXPECT_EQ(PROPERTY_NAMES(dynamic_cast<CC_EvCallLegPropertyChanged const&>(*clone).getFlags()), "Name");
}

TEST_F(CC_CallLegEventsTest, ACloneOfAServicesEventPointsToTheService)
{
    CC_ServicePushBack pushBack(1);
    std::unique_ptr<CC_Event<CC_CallLeg>> const clone(CC_EvCallLegSynchronousService(m_leg, pushBack).clone());
    EXPECT_EQ(dynamic_cast<CC_EvCallLegSynchronousService const&>(*clone).getService(), &pushBack);
}

TEST_F(CC_CallLegEventsTest, ACloneThatFindsNoMemoryIsNull)
{
    CC_EvCallLegObservationEnded const event(m_leg);
    FailingAllocator::failNth(1);
    CC_Event<CC_CallLeg>* const clone = event.clone();
    FailingAllocator::stop();
    EXPECT_EQ(clone, nullptr);
    delete clone;
}
