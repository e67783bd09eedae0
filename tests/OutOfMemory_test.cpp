// A whole call with the n-th allocation failing, for every n: an error comes back or the call completes, nothing leaks,
// and the same adapters hold the next call.
#include "properties/CC_PropertyFilterContainer.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/CallControlFixture.h"
#include "testing/FailingAllocator.h"
#include "testing/FakeRebootMgmt.h"
#include "testing/LeakCheck.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/Party.h"

#include <gtest/gtest.h>

namespace
{
/// From dial to the deferred clean-up. No assertions in here: they allocate. Whether the call was set up.
bool wholeCall(CallControlFixture& fixture, Party& anna, Party& bert, CC_PropertyContainer const& own)
{
    bool const isUp = anna.dial(bert, own, own, own).isOk();
    fixture.m_loop.settle();
    std::ignore = bert.become(State::ALERTING);
    fixture.m_loop.settle();
    std::ignore = bert.become(State::CONNECTED);
    std::ignore = bert.adapter->setOwnProperties(own);
    std::ignore = anna.adapter->setCallProperties(own);
    fixture.m_loop.settle();
    CC_ServiceUserInput digits("1");
    anna.adapter->invokeSynchronousService(digits);
    fixture.m_loop.settle();
    bert.hangUp();
    fixture.m_loop.settle();
    anna.hangUp();
    fixture.m_loop.settle();
    return isUp;
}

class OutOfMemory : public testing::TestWithParam<bool>
{
};

TEST_P(OutOfMemory, AWholeCallSurvivesEachSingleFailure)
{
    CallControlFixture fixture;
    FakeRebootMgmt reboot;
    CC_PropertyFilterContainer filters;
    RecordingPropertyFilter filter("filter");
    ASSERT_EQ(filters.addFilter(filter), XCode::OK);
    CC_PropertyFilterContainer* const used = GetParam() ? &filters : nullptr;
    Party anna("anna", "", nullptr, used, used);
    Party bert("bert", "", nullptr, used, used);
    CC_PropertyContainer own;
    ASSERT_EQ(own.set(CC_PropertyString(CC_PropertyId::NAME, "a name too long to be kept without memory")), XCode::OK);
    ASSERT_EQ(own.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, "4420791234")), XCode::OK);

    unsigned long tried = 0;
    unsigned int refused = 0;
    for (unsigned long n = 1;; ++n)
    {
        LeakCheck const check;
        FailingAllocator::failNth(n);
        bool const isUp = wholeCall(fixture, anna, bert, own);
        FailingAllocator::stop();
        bool const hasFailed = FailingAllocator::hasFailed();

        anna.adapter->cleanup();
        bert.adapter->cleanup();
        fixture.m_loop.settle();
        ASSERT_EQ(check.compare(), "") << "allocation " << n;
        ASSERT_EQ(CallControl::GET_NUMBER_OF_CALLS("SWITCH"), 0u) << "allocation " << n;
        anna.setup();
        bert.setup();
        ASSERT_TRUE(wholeCall(fixture, anna, bert, own)) << "the call after allocation " << n;
        ASSERT_EQ(check.compare(), "") << "the call after allocation " << n;
        if (!hasFailed)
        {
            EXPECT_TRUE(isUp);
            break;
        }
        tried = n;
        refused += isUp ? 0 : 1;
    }
    EXPECT_GT(tried, 50u) << "a call takes more allocations than that";
    EXPECT_GT(refused, 5u) << "some of them are worth refusing it";
    EXPECT_EQ(reboot.getNumberOfLocks(), 0);
}

INSTANTIATE_TEST_SUITE_P(WithAndWithoutFilters, OutOfMemory, testing::Bool());

TEST(OutOfMemoryOfTheCopy, AnAcceptedCallHasAllThatWasGivenOrIsNotAccepted)
{
    CallControlFixture fixture;
    Party anna("anna");
    CC_PropertyContainer own;
    ASSERT_EQ(own.set(CC_PropertyString(CC_PropertyId::NETWORK, "given")), XCode::OK);
    unsigned int refused = 0;
    for (unsigned long n = 1;; ++n)
    {
        CC_Call* const call = CallControl::ACQUIRE_CALL("SWITCH");
        FailingAllocator::failNth(n);
        XCode const accepted = anna.adapter->accept(*call, own);
        FailingAllocator::stop();
        if (accepted.isOk())
        {
            auto const* const network = dynamic_cast<CC_PropertyString const*>(
                call->getCallLeg(0)->getProperties().get(CC_PropertyId::NETWORK));
            ASSERT_NE(network, nullptr) << "allocation " << n;
            EXPECT_STREQ(network->getValue().c_str(), "given") << "allocation " << n;
        }
        refused += accepted.isOk() ? 0 : 1;
        anna.adapter->cleanup();
        CallControl::RELEASE_CALL("SWITCH", call);
        fixture.m_loop.settle();
        anna.setup();
        if (!FailingAllocator::hasFailed())
            break;
    }
    EXPECT_GT(refused, 3u);
}

TEST(OutOfMemoryAtStartUp, CreatingAContextReportsEachFailureAndLeavesNothing)
{
    CallControlFixture fixture;
    for (unsigned long n = 1;; ++n)
    {
        String const name("a context with a name of some length");
        FailingAllocator::failNth(n);
        XCode const created = CallControl::CREATE_CONTEXT(name);
        FailingAllocator::stop();
        if (!FailingAllocator::hasFailed())
        {
            EXPECT_EQ(created, XCode::OK);
            CallControl::DESTROY_CONTEXT(name);
            break;
        }
        EXPECT_EQ(created, XCode::FAILURE) << "allocation " << n;
        EXPECT_EQ(CallControl::GET_CONTEXT(name), nullptr);
    }
}
} // namespace
