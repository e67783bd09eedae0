#include "adapters/CC_CallAdapter.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/CallControlFixture.h"
#include "testing/PropertyNames.h"
#include "testing/RecordingAdapterObserver.h"
#include "testing/RecordingCallLegObserver.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingMonitor.h"
#include "testing/RecordingProvider.h"

#include <gtest/gtest.h>

namespace
{
/// A caller dials a line that rejects.
class CC_Endpoint_Reject_Test : public testing::Test, protected CallControlFixture
{
protected:
    CC_Endpoint_Reject_Test()
    {
        EXPECT_TRUE(CallControl::ADD_PROVIDER("", "isdn", m_provider).isOk());
        EXPECT_TRUE(m_caller.setup("caller", m_callersLine, &m_callersModule).isOk());
        m_provider.m_dial =
            [this](CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offered)
        { return m_line.offer(call, destination, offered); };
        m_line.m_handleOffer = [this](CC_Call& call, String const&, CC_PropertyContainer const&)
        {
            m_adaptersBefore = CC_CallAdapter::s_numberOfInstances;
            if (m_witness != nullptr)
                std::ignore = call.addCallLegObserver(m_witness);
            m_line.actionRejectOfferedCall_WithCause(call, m_properties, m_cause);
            m_adaptersAfter = CC_CallAdapter::s_numberOfInstances;
            return XCode::OK;
        };
    }
    ~CC_Endpoint_Reject_Test() override { m_caller.cleanup(); }

    XCode dial()
    {
        CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
        return m_caller.dial("", "isdn", "4989123", none, none, none, nullptr);
    }
    std::string peerValue(unsigned int id) const
    {
        String text;
        CC_Property const* const property = m_caller.getPeerProperty(id);
        return property != nullptr ? property->getValueString(text).c_str() : "absent";
    }

    RecordingProvider m_provider{"isdn"};
    RecordingEndpoint m_callersLine{"near", "home"};
    RecordingEndpoint m_line{"far", "abroad"};
    RecordingAdapterObserver m_callersModule{"module"};
    CC_CallAdapter m_caller;
    CC_PropertyContainer m_properties;
    QCause m_cause = QCause::USER_BUSY;
    RecordingCallLegObserver* m_witness = nullptr;
    unsigned int m_adaptersBefore = 0;
    unsigned int m_adaptersAfter = 0;
};
} // namespace

TEST_F(CC_Endpoint_Reject_Test, TheCallersDialSucceedsAndItsModuleHearsTheStateAndTheCause)
{
    EXPECT_EQ(dial(), XCode::OK);
    EXPECT_EQ(m_callersModule.getFlagSets().size(), 0u) << "not inside the operation";
    settle();
    ASSERT_EQ(m_callersModule.getFlagSets().size(), 1u);
    EXPECT_EQ(m_callersModule.take(),
              Lines{"module: peer changed (Network, Call-Leg-ID, Context, Provides Data, Cause, State)"});
    EXPECT_EQ(peerValue(CC_PropertyId::STATE), "RELEASED");
    auto const* const cause = dynamic_cast<CC_PropertyCause const*>(m_caller.getPeerProperty(CC_PropertyId::CAUSE));
    ASSERT_NE(cause, nullptr);
    EXPECT_EQ(cause->getCause(), QCause::USER_BUSY);
    EXPECT_EQ(cause->getSipCode(), 0u);
}

TEST_F(CC_Endpoint_Reject_Test, OneAdapterNamedRejectComesAndGoes)
{
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    EXPECT_EQ(dial(), XCode::OK);
    EXPECT_EQ(m_adaptersAfter, m_adaptersBefore);
    String const callName = m_caller.getCall()->getName();
    String expected;
    expected.format("[EP %s/%s] Accept call %s", "far", "reject", callName.c_str());
    EXPECT_TRUE(monitor.contains(expected.c_str()));
    expected.format("[EP %s/%s] Drop call %s", "far", "reject", callName.c_str());
    EXPECT_TRUE(monitor.contains(expected.c_str()));
    EXPECT_EQ(m_caller.getCall()->getCallLeg(1)->getName(), "far/reject");
}

TEST_F(CC_Endpoint_Reject_Test, ALegWithTheGivenPropertiesTriesAndIsReleased)
{
    RecordingCallLegObserver witness("w");
    m_witness = &witness;
    ASSERT_TRUE(m_properties.set(CC_PropertyString(CC_PropertyId::NAME, "nobody")).isOk());
    EXPECT_EQ(dial(), XCode::OK);
    EXPECT_EQ(witness.take(), (Lines{"w: far/reject moved from none to call", "w: far/reject changed (Cause)",
                                     "w: far/reject changed (State)"}));
    EXPECT_EQ(peerValue(CC_PropertyId::NAME), "nobody");
    EXPECT_EQ(peerValue(CC_PropertyId::NETWORK), "abroad");
    m_caller.getCall()->removeCallLegObserver(&witness);
}

TEST_F(CC_Endpoint_Reject_Test, TheCallStaysTheCallersUntilItDrops)
{
    EXPECT_EQ(dial(), XCode::OK);
    settle();
    ASSERT_NE(m_caller.getCall(), nullptr);
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 1u);
    m_caller.drop(QCause::USER_BUSY, 0);
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u);
}

TEST_F(CC_Endpoint_Reject_Test, TheUnspecifiedCauseLeavesTheCauseAtNone)
{
    m_cause = QCause::UNSPECIFIED;
    EXPECT_EQ(dial(), XCode::OK);
    settle();
    auto const* const cause = dynamic_cast<CC_PropertyCause const*>(m_caller.getPeerProperty(CC_PropertyId::CAUSE));
    ASSERT_NE(cause, nullptr);
    EXPECT_EQ(cause->getCause(), QCause::NONE);
    EXPECT_EQ(peerValue(CC_PropertyId::STATE), "RELEASED");
}

TEST_F(CC_Endpoint_Reject_Test, AProviderThatRejectsAndFailsTooGetsTheCallersOwnCause)
{
    RecordingCallLegObserver witness("w");
    QCause callersCause = QCause::NONE;
    witness.m_onChanged = [&](CC_EvCallLegPropertyChanged const& event)
    {
        if (event.getSource()->getName() == "near/caller" && event.getFlags().get(CC_PropertyId::CAUSE))
            callersCause =
                dynamic_cast<CC_PropertyCause const&>(*event.getSource()->getProperties().get(CC_PropertyId::CAUSE))
                    .getCause();
    };
    m_witness = &witness;
    m_provider.m_dial =
        [this](CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offered)
    {
        std::ignore = m_line.offer(call, destination, offered);
        return XCode::FAILURE;
    };
    EXPECT_EQ(dial(), XCode::FAILURE);
    EXPECT_EQ(callersCause, QCause::NETWORK_OUT_OF_ORDER);
    settle();
    EXPECT_EQ(CallControl::GET_NUMBER_OF_CALLS(""), 0u);
}
