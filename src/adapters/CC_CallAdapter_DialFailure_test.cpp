#include "testing/FailingAllocator.h"
#include "testing/RecordingContextObserver.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/TestLine.h"

namespace
{
using namespace CC_PropertyId;
using LogLine = RecordingMonitor::Line;

/// Each way in which dial and accept fail, and what is left of them.
class CC_CallAdapter_DialFailure_Test : public TestLines
{
protected:
    static CC_PropertyContainer MARKED()
    {
        CC_PropertyContainer one;
        EXPECT_TRUE(one.set(CC_PropertyString(URI, "refuse me")).isOk());
        return one;
    }
    /// From now on what holds a URI does not pass the line's input filters.
    static void REFUSE_MARKED(TestLine& line)
    {
        line.filterInput([](CC_PropertyContainer& properties)
                         { return properties.get(URI) != nullptr ? XCode::NO_ELEMENT : XCode::OK; });
    }
    /// No leg, no events, no call; and it works again.
    void expectIdle(TestLine& line)
    {
        EXPECT_EQ(line.adapter.getCall(), nullptr);
        EXPECT_EQ(line.adapter.getCallLegName(), "");
        EXPECT_EQ(line.own(STATE) + line.peer(STATE) + line.call(CONTEXT), "---");
        settle();
        EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u);
        line.endpoint.setInputFilterContainer(nullptr);
        provider.m_dial = nullptr;
        EXPECT_EQ(line.dial(), XCode::OK) << "it was idle again";
    }
    unsigned int events() const { return TYEvent::s_numberOfInstances.load(); }
};
} // namespace

TEST_F(CC_CallAdapter_DialFailure_Test, AnUnknownProviderIsLoggedAndLeavesNothing)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    unsigned int const eventsBefore = events();
    EXPECT_EQ(a.dial("nobody"), XCode::FAILURE);
    String expected;
    expected.format("[EP %s/%s] DESTINATION PROVIDER '%s' DOES NOT EXIST", "a", "line", "nobody");
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{1, expected.c_str()}}));
    EXPECT_EQ(events(), eventsBefore);
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 0u) << "no call was acquired";
    expectIdle(a);
}

TEST_F(CC_CallAdapter_DialFailure_Test, AnUnknownContextIsAnUnknownProvider)
{
    RecordingMonitor monitor(RTD::LEVEL_FAILURE);
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(a.adapter.dial("nowhere", "isdn", "1", none, none, none, nullptr), XCode::FAILURE);
    EXPECT_TRUE(monitor.contains("DESTINATION PROVIDER 'isdn' DOES NOT EXIST"));
    expectIdle(a);
}

TEST_F(CC_CallAdapter_DialFailure_Test, OwnPropertiesThatDoNotPassTheFiltersEndTheDialBeforeACallIsAcquired)
{
    REFUSE_MARKED(a);
    unsigned int const eventsBefore = events();
    EXPECT_EQ(a.dial("isdn", MARKED()), XCode::FAILURE);
    EXPECT_EQ(events(), eventsBefore);
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 0u);
    EXPECT_EQ(provider.take(), Lines());
    expectIdle(a);
}

TEST_F(CC_CallAdapter_DialFailure_Test, WithoutACallThereIsNoElement)
{
    RecordingContextObserver thief("thief");
    ASSERT_TRUE(getContext()->addContextObserver(thief).isOk());
    thief.m_onCreateCall = [](CC_Context& context, CC_Call* call) { context.releaseCall(call); };
    EXPECT_EQ(a.dial(), XCode::NO_ELEMENT);
    EXPECT_EQ(provider.take(), Lines());
    getContext()->removeContextObserver(thief);
    expectIdle(a);
}

TEST_F(CC_CallAdapter_DialFailure_Test, CallPropertiesThatDoNotPassTheFiltersHandTheCallBack)
{
    REFUSE_MARKED(a);
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    EXPECT_EQ(a.dial("isdn", none, none, MARKED()), XCode::FAILURE);
    EXPECT_EQ(provider.take(), Lines());
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 1u) << "the call was acquired";
    turn();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u) << "and goes back to its pool in the next turn";
    expectIdle(a);
}

TEST_F(CC_CallAdapter_DialFailure_Test, AnOfferThatDoesNotPassTheFiltersIsNotMade)
{
    REFUSE_MARKED(a);
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(a.dial("isdn", none, MARKED()), XCode::FAILURE);
    EXPECT_TRUE(monitor.contains("Dial to provider isdn (4989123)")) << "the leg had joined";
    EXPECT_EQ(provider.take(), Lines());
    expectIdle(a);
}

TEST_F(CC_CallAdapter_DialFailure_Test, AnyFailureOfTheProviderIsAFailureAndDropsWithCause38)
{
    for (XCode const answer : {XCode::REFUSED, XCode::NO_ELEMENT, XCode(0x12345678), XCode::FAILURE})
    {
        provider.m_dial = [this, answer](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
        {
            EXPECT_TRUE(c.accept(call).isOk()); // one that hears how the caller ends
            return answer;
        };
        EXPECT_EQ(a.dial(), XCode::FAILURE) << answer.getValue();
        EXPECT_EQ(c.peer(STATE), "RELEASED");
        auto const* const cause = dynamic_cast<CC_PropertyCause const*>(c.adapter.getPeerProperty(CAUSE));
        ASSERT_NE(cause, nullptr);
        EXPECT_EQ(static_cast<int>(cause->getCause()), 0x26);
        EXPECT_EQ(cause->getSipCode(), 0u);
        c.drop();
        settle();
    }
    expectIdle(a);
}

TEST_F(CC_CallAdapter_DialFailure_Test, AnAcceptThatDoesNotPassTheFiltersLeavesTheCallAlone)
{
    EXPECT_EQ(a.dial(), XCode::OK);
    b.drop();
    listen();
    REFUSE_MARKED(c);
    unsigned int const eventsBefore = events();
    EXPECT_EQ(c.adapter.accept(theCall(), MARKED()), XCode::FAILURE);
    EXPECT_EQ(events(), eventsBefore);
    EXPECT_EQ(heardBy(a), Lines());
    EXPECT_EQ(c.adapter.getCall(), nullptr);
    EXPECT_EQ(c.accept(theCall()), XCode::OK) << "it was idle again";
}

TEST_F(CC_CallAdapter_DialFailure_Test, TheLogSaysInOneLineWhichFailureItWas)
{
    CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
    RecordingMonitor monitor(RTD::LEVEL_FAILURE);
    auto const expectLine = [&](std::string const& text)
    {
        settle();
        EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{1, "[EP a/line] " + text}}));
        monitor.clear();
    };
    REFUSE_MARKED(a);
    EXPECT_EQ(a.dial("isdn", MARKED()), XCode::FAILURE);
    expectLine("Dial failed: the own leg takes not all properties");
    EXPECT_EQ(a.dial("isdn", none, none, MARKED()), XCode::FAILURE);
    expectLine("Dial failed: the input filters refuse the call's properties");
    EXPECT_EQ(a.dial("isdn", none, MARKED()), XCode::FAILURE);
    expectLine("Dial failed: the input filters refuse the offer's properties");
    provider.m_dial = [](CC_Call&, String const&, String const&, CC_PropertyContainer const&)
    { return XCode::REFUSED; };
    EXPECT_EQ(a.dial(), XCode::FAILURE);
    expectLine("Dial failed: the provider refuses");

    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    EXPECT_EQ(a.adapter.accept(*call, MARKED()), XCode::FAILURE);
    expectLine("Accept failed: the own leg takes not all properties");
    {
        CC_Call::Hold const keep(call);
        CallControl::RELEASE_CALL("", call); // it goes at the end of the hold, and takes no leg until then
        EXPECT_EQ(a.accept(*call), XCode::FAILURE);
        expectLine("Accept failed: the call takes no leg");
    }

    RecordingContextObserver thief("thief");
    ASSERT_TRUE(getContext()->addContextObserver(thief).isOk());
    thief.m_onCreateCall = [](CC_Context& context, CC_Call* created) { context.releaseCall(created); };
    EXPECT_EQ(a.dial(), XCode::NO_ELEMENT);
    expectLine("Dial failed: no call could be had");
    getContext()->removeContextObserver(thief);

    CC_CallAdapter idle;
    EXPECT_EQ(idle.dial("", "isdn", "1", none, none, none, nullptr), XCode::REFUSED);
    EXPECT_EQ(monitor.getLines(), (std::vector<LogLine>{{1, "[EP /] Dial failed: the adapter is not set up"}}));
}

// --- without memory --------------------------------------------------------------------------------------------------

namespace
{
/// How many allocations the two events take before dial puts the state into the properties.
constexpr unsigned long EVENT_ALLOCATIONS = 2;
} // namespace

TEST_F(CC_CallAdapter_DialFailure_Test, ADialThatFailsBeforeItsLegExistsLeavesItsEventsUntilCleanup)
{
    unsigned int const eventsBefore = events();
    for (unsigned long n = 1; n <= 2; ++n) // the state, the cause
    {
        FailingAllocator::failNth(EVENT_ALLOCATIONS + n);
        XCode const result = a.dial();
        FailingAllocator::stop();
        EXPECT_EQ(result, XCode::FAILURE);
        EXPECT_EQ(events(), eventsBefore + 2) << "there was no leg to drop";
        EXPECT_EQ(a.adapter.getCallLegName(), "");
        EXPECT_EQ(a.dial(), XCode::REFUSED);
        EXPECT_EQ(a.dial("nobody"), XCode::REFUSED);
        CC_Call* const call = CallControl::ACQUIRE_CALL("");
        EXPECT_EQ(a.accept(*call), XCode::REFUSED);
        CallControl::RELEASE_CALL("", call);
        a.drop();
        EXPECT_EQ(a.dial(), XCode::REFUSED) << "a drop without a leg does nothing";
        EXPECT_TRUE(a.adapter.setup("line", a.endpoint, &a.module).isOk());
        EXPECT_EQ(a.dial(), XCode::REFUSED) << "setting up again does not help either";

        a.adapter.cleanup();
        EXPECT_EQ(events(), eventsBefore);
        EXPECT_TRUE(a.adapter.setup("line", a.endpoint, &a.module).isOk());
    }
    EXPECT_EQ(a.dial(), XCode::OK);
}

TEST_F(CC_CallAdapter_DialFailure_Test, AnAcceptHasItsLegBeforeThePropertiesAndLeavesNoEvents)
{
    CC_Call* const call = CallControl::ACQUIRE_CALL("");
    unsigned int const eventsBefore = events();
    for (unsigned long n = 2; n <= 6; ++n) // the leg and what is put into it
    {
        FailingAllocator::failNth(EVENT_ALLOCATIONS + n);
        XCode const result = a.accept(*call);
        FailingAllocator::stop();
        if (result.isOk())
        {
            a.drop(); // what failed may be missing
            continue;
        }
        EXPECT_EQ(result, XCode::FAILURE);
        EXPECT_EQ(events(), eventsBefore) << "allocation " << n;
        EXPECT_EQ(a.adapter.getCallLegName(), "");
    }
    EXPECT_EQ(a.accept(*call), XCode::OK);
}

TEST_F(CC_CallAdapter_DialFailure_Test, WhicheverAllocationFailsTheAdapterDialsAgainAfterCleanup)
{
    bool hasFailed = false;
    for (unsigned long n = 1; n < 1000; ++n)
    {
        FailingAllocator::failNth(n);
        XCode const result = a.dial();
        FailingAllocator::stop();
        bool const wasHit = FailingAllocator::hasFailed();
        if (!result.isOk())
        {
            hasFailed = true;
            EXPECT_TRUE(result == XCode::FAILURE || result == XCode::NO_ELEMENT) << n << ": " << result.getValue();
        }
        a.adapter.cleanup();
        b.adapter.cleanup();
        settle();
        EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u) << "allocation " << n;
        ASSERT_TRUE(a.adapter.setup("line", a.endpoint, &a.module).isOk());
        ASSERT_TRUE(b.adapter.setup("line", b.endpoint, &b.module).isOk());
        if (!wasHit)
            break;
    }
    EXPECT_TRUE(hasFailed);
}
