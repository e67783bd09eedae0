#include "services/CC_ServicePushBack.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/PropertyTesting.h"
#include "tests/support/TestLine.h"

#include <functional>
#include <memory>

namespace
{
/// An endpoint that does something when it is asked for its name the nth time.
class InterruptedEndpoint : public RecordingEndpoint
{
public:
    using RecordingEndpoint::RecordingEndpoint;
    String const& getName() const override
    {
        if (m_left != 0 && --m_left == 0)
            m_interrupt();
        return RecordingEndpoint::getName();
    }
    mutable unsigned int m_left = 0;
    std::function<void()> m_interrupt;
};

/// A line whose adapter ends while its endpoint is named.
class CC_CallAdapter_Log_Test : public TestLines
{
protected:
    using Deed = std::function<void(CC_CallAdapter&)>;

    /// Does it as often as the endpoint's name is asked for in it, and each time the adapter ends in another of these.
    void interruptEach(Deed const& prepare, Deed const& deed)
    {
        RecordingMonitor const monitor(RTD::LEVEL_NAMING);
        for (unsigned int nth = 1, reached = nth; reached >= nth; ++nth)
        {
            InterruptedEndpoint endpoint("x");
            auto adapter = std::make_unique<CC_CallAdapter>();
            EXPECT_TRUE(adapter->setup("line", endpoint, nullptr).isOk());
            prepare(*adapter);
            endpoint.m_interrupt = [&adapter] { adapter.reset(); };
            endpoint.m_left = nth;
            deed(*adapter);
            reached = nth - endpoint.m_left;
            EXPECT_EQ(adapter == nullptr, endpoint.m_left == 0) << nth;
            m_interruptions += adapter == nullptr ? 1 : 0;
            endpoint.m_left = 0;
            adapter.reset();
            for (TestLine* const line : {&a, &b, &c})
                line->drop();
            settle();
        }
        EXPECT_GT(m_interruptions, 0U);
    }
    static void NOTHING(CC_CallAdapter&) {}
    static void DIAL(CC_CallAdapter& adapter)
    {
        auto const& none = CC_PropertyContainer::EMPTY();
        std::ignore = adapter.dial("", "isdn", "4989123", none, none, none, nullptr);
    }

    unsigned int m_interruptions = 0;
};
} // namespace

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsDialIsLogged) { interruptEach(NOTHING, DIAL); }

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsDialToNobodyIsLogged)
{
    interruptEach(NOTHING,
                  [](CC_CallAdapter& adapter)
                  {
                      auto const& none = CC_PropertyContainer::EMPTY();
                      std::ignore = adapter.dial("", "nobody", "4989123", none, none, none, nullptr);
                  });
}

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsSecondDialIsRefusedInTheLog) { interruptEach(DIAL, DIAL); }

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsAcceptIsLogged)
{
    interruptEach([this](CC_CallAdapter&) { EXPECT_EQ(a.dial(), XCode::OK); }, [this](CC_CallAdapter& adapter)
                  { std::ignore = adapter.accept(theCall(), CC_PropertyContainer::EMPTY()); });
}

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsDropIsLogged)
{
    interruptEach(DIAL, [](CC_CallAdapter& adapter) { adapter.drop(QCause::UNSPECIFIED, 0); });
}

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsNewNameIsLoggedOrGivenToItsLeg)
{
    interruptEach(DIAL, [](CC_CallAdapter& adapter) { adapter.setName("another"); });
}

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsServiceIsLogged)
{
    interruptEach(DIAL,
                  [](CC_CallAdapter& adapter)
                  {
                      CC_ServicePushBack service(1);
                      adapter.invokeSynchronousService(service);
                  });
}

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsTransferIsLogged)
{
    interruptEach(
        [this](CC_CallAdapter& adapter)
        {
            DIAL(adapter);
            EXPECT_EQ(c.accept(*CallControl::ACQUIRE_CALL("", nullptr)), XCode::OK);
        },
        [this](CC_CallAdapter& adapter) { std::ignore = adapter.transfer(c.adapter, true); });
}

TEST_F(CC_CallAdapter_Log_Test, ItMayEndWhileItsFailedTransferIsLogged)
{
    interruptEach(DIAL, [this](CC_CallAdapter& adapter) { std::ignore = adapter.transfer(a.adapter, true); });
}

/// What a property says of itself may be anything.
TEST_F(CC_CallAdapter_Log_Test, ItMayEndInsideItsDump)
{
    for (unsigned int const side : {0U, 1U, 2U})
    {
        RecordingEndpoint endpoint("x");
        auto adapter = std::make_unique<CC_CallAdapter>();
        EXPECT_TRUE(adapter->setup("line", endpoint, nullptr).isOk());
        DIAL(*adapter);
        auto const deeds = std::make_shared<ActingProperty::Deeds>();
        ActingProperty const property(CC_PropertyId::URI, 1, deeds);
        XCode (CC_CallAdapter::*const setters[])(CC_Property const&) = {
            &CC_CallAdapter::setOwnProperty, &CC_CallAdapter::setPeerProperty, &CC_CallAdapter::setCallProperty};
        EXPECT_TRUE((adapter.get()->*setters[side])(property).isOk());
        deeds->onText = [&adapter] { adapter.reset(); };
        InfoContainer info;
        EXPECT_EQ(&adapter->getInfo(info, 9, 0, 9, 0, ""), &info);
        EXPECT_EQ(adapter, nullptr);
        b.drop();
        settle();
    }
}

TEST_F(CC_CallAdapter_Log_Test, ALegMayLeaveInsideTheDumpOfItsCall)
{
    connect();
    auto const deeds = std::make_shared<ActingProperty::Deeds>();
    EXPECT_TRUE(a.adapter.setCallProperty(ActingProperty(CC_PropertyId::URI, 1, deeds)).isOk());
    for (unsigned int legs = 2; legs-- != 0;)
    {
        deeds->onText = [this] { theCall().removeCallLeg(*theCall().getCallLeg(0)); };
        InfoContainer info;
        CC_Call& call = theCall();
        call.getInfo(info, 9, 0, 9, 0, "");
        EXPECT_EQ(call.getNumberOfCallLegs(), legs);
        if (a.adapter.getCall() == nullptr)
            break;
    }
}

TEST_F(CC_CallAdapter_Log_Test, ACallMayEndInsideTheDumpOfItsPool)
{
    EXPECT_EQ(a.dial(), XCode::OK);
    EXPECT_EQ(c.accept(*CallControl::ACQUIRE_CALL("", nullptr)), XCode::OK);
    auto const deeds = std::make_shared<ActingProperty::Deeds>();
    EXPECT_TRUE(a.adapter.setCallProperty(ActingProperty(CC_PropertyId::URI, 1, deeds)).isOk());
    deeds->onText = [this] { CallControl::RELEASE_CALL("", &theCall()); };
    InfoContainer info;
    CallControl::GET_CALL_INFO(info, "", 9, 0, 9, 0, "");
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 1);
    unsigned int calls = 0;
    for (unsigned int i = 0; i < info.getNumberOfEntries(); ++i)
        calls += info.getEntry(i).level == 2 && info.getEntry(i).key == String("Call") ? 1 : 0;
    EXPECT_EQ(calls, 2U) << "each once";
}
