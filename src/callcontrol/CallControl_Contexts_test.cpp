#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyId.h"
#include "testing/DrivenLoop.h"
#include "testing/FakeMediaContext.h"
#include "testing/FakeMediaContextRepository.h"
#include "testing/RecordingProvider.h"

#include <gtest/gtest.h>
#include <vector>

namespace
{
class CallControl_Contexts_Test : public testing::Test
{
protected:
    CallControl_Contexts_Test()
    {
        EXPECT_TRUE(m_control.createContext("SWITCH").isOk());
        EXPECT_TRUE(m_control.createContext("lab").isOk());
    }

    DrivenLoop m_loop;
    FakeMediaContextRepository m_mediaContexts;
    RecordingProvider m_provider{"provider"};
    CallControl m_control;
};
} // namespace

TEST_F(CallControl_Contexts_Test, TheEmptyNameAddressesSwitchInEveryOperation)
{
    CC_Context& standard = *m_control.getContext("SWITCH");
    EXPECT_EQ(m_control.setNationalPrefix("", "0"), XCode::OK);
    EXPECT_EQ(standard.getNationalPrefix(), "0");
    EXPECT_EQ(m_control.getNationalPrefix(""), "0");
    EXPECT_EQ(m_control.setInternationalPrefix("", "00"), XCode::OK);
    EXPECT_EQ(standard.getInternationalPrefix(), "00");
    EXPECT_EQ(m_control.getInternationalPrefix(""), "00");
    EXPECT_EQ(m_control.setMaxHops("", 9), XCode::OK);
    EXPECT_EQ(standard.getMaxHops(), 9u);
    EXPECT_EQ(m_control.getMaxHops(""), 9u);
    EXPECT_EQ(m_control.addProvider("", "isdn", m_provider), XCode::OK);
    EXPECT_EQ(standard.getProvider("isdn"), &m_provider);
    EXPECT_EQ(m_control.getNumberOfProviders(""), 1u);
    EXPECT_EQ(m_control.getProvider("", 0u), &m_provider);
    EXPECT_EQ(m_control.getProvider("", "isdn"), &m_provider);
    InfoContainer info;
    EXPECT_EQ(&m_control.getProviderInfo(info, "", 9, 0, 9, 0, "My "), &info);
    EXPECT_EQ(info.getEntry(0).key, "My Call Control");
    EXPECT_EQ(info.getEntry(0).text, "SWITCH");
    m_control.removeProvider("", "isdn");
    EXPECT_EQ(standard.getNumberOfProviders(), 0u);
    EXPECT_EQ(m_control.getCallPool(""), standard.getCallPool());
    CC_Call* const first = m_control.acquireCall("");
    CC_Call* const second = m_control.acquireCall("", nullptr);
    EXPECT_EQ(standard.getNumberOfCalls(), 2u);
    EXPECT_EQ(m_control.getNumberOfCalls(""), 2u);
    EXPECT_EQ(m_control.getCall("", 1), second);
    InfoContainer calls;
    EXPECT_EQ(&m_control.getCallInfo(calls, "", 9, 0, 9, 0, "My "), &calls);
    EXPECT_EQ(calls.getEntry(0).text, "SWITCH");
    EXPECT_EQ(calls.getEntry(1).key, "Call Pool");
    m_control.releaseCall("", first);
    m_control.releaseCall("", second);
    EXPECT_EQ(standard.getNumberOfCalls(), 0u);
}

TEST_F(CallControl_Contexts_Test, AContextCreatedUnderTheEmptyNameIsFoundByGetContextAlone)
{
    EXPECT_EQ(m_control.getContext(""), nullptr) << "this one does not stand for SWITCH";
    EXPECT_EQ(m_control.createContext(""), XCode::OK);
    CC_Context* const nameless = m_control.getContext("");
    ASSERT_NE(nameless, nullptr);
    EXPECT_EQ(nameless->getName(), "");
    EXPECT_EQ(m_control.setMaxHops("", 9), XCode::OK);
    EXPECT_EQ(nameless->getMaxHops(), 0u);
    EXPECT_EQ(m_control.getMaxHops("SWITCH"), 9u);
    m_control.destroyContext("");
    EXPECT_EQ(m_control.getContext(""), nullptr);
    EXPECT_NE(m_control.getContext("SWITCH"), nullptr) << "destroying takes the name as it is, too";
}

TEST_F(CallControl_Contexts_Test, WithoutSwitchTheEmptyNameFindsNothing)
{
    m_control.destroyContext("SWITCH");
    ASSERT_TRUE(m_control.createContext("").isOk());
    EXPECT_EQ(m_control.setMaxHops("", 9), XCode::FAILURE);
    EXPECT_EQ(m_control.acquireCall(""), nullptr);
}

TEST_F(CallControl_Contexts_Test, AnUnknownContextGivesNothingAndChangesNothing)
{
    String const name("nobody");
    EXPECT_EQ(&m_control.getNationalPrefix(name), &String::s_empty);
    EXPECT_EQ(&m_control.getInternationalPrefix(name), &String::s_empty);
    EXPECT_EQ(m_control.getMaxHops(name), 0u);
    EXPECT_EQ(m_control.setNationalPrefix(name, "0"), XCode::FAILURE);
    EXPECT_EQ(m_control.setInternationalPrefix(name, "00"), XCode::FAILURE);
    EXPECT_EQ(m_control.setMaxHops(name, 9), XCode::FAILURE);
    EXPECT_EQ(m_control.addProvider(name, "isdn", m_provider), XCode::FAILURE);
    m_control.removeProvider(name, "isdn");
    EXPECT_EQ(m_control.getNumberOfProviders(name), 0u);
    EXPECT_EQ(m_control.getProvider(name, 0u), nullptr);
    EXPECT_EQ(m_control.getProvider(name, "isdn"), nullptr);
    EXPECT_EQ(m_control.getCallPool(name), nullptr);
    EXPECT_EQ(m_control.acquireCall(name), nullptr);
    EXPECT_EQ(m_control.acquireCall(name, nullptr), nullptr);
    m_control.releaseCall(name, nullptr);
    EXPECT_EQ(m_control.getNumberOfCalls(name), 0u);
    EXPECT_EQ(m_control.getCall(name, 0), nullptr);
    InfoContainer info;
    EXPECT_EQ(&m_control.getProviderInfo(info, name, 9, 0, 9, 0, ""), &info);
    EXPECT_EQ(&m_control.getCallInfo(info, name, 9, 0, 9, 0, ""), &info);
    EXPECT_EQ(info.getNumberOfEntries(), 0u);
    EXPECT_EQ(m_control.getContext(name), nullptr);
    EXPECT_EQ(m_control.getMaxHops("SWITCH"), 0u);
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 0u);
}

TEST_F(CallControl_Contexts_Test, ANamedContextIsTheOneThatIsMeant)
{
    EXPECT_EQ(m_control.setMaxHops("lab", 3), XCode::OK);
    EXPECT_EQ(m_control.getMaxHops("lab"), 3u);
    EXPECT_EQ(m_control.getMaxHops(""), 0u);
    EXPECT_EQ(m_control.addProvider("lab", "isdn", m_provider), XCode::OK);
    EXPECT_EQ(m_control.addProvider("lab", "isdn", m_provider), XCode::REFUSED);
    EXPECT_EQ(m_control.getProvider("", "isdn"), nullptr);
    CC_Call* const call = m_control.acquireCall("lab");
    EXPECT_EQ(m_control.getNumberOfCalls("lab"), 1u);
    EXPECT_EQ(m_control.getNumberOfCalls(""), 0u);
    EXPECT_EQ(m_control.getNumberOfCalls(), 1u);
    m_control.releaseCall("lab", call);
}

TEST_F(CallControl_Contexts_Test, AcquiringACallAsksTheMediaLayerOnce)
{
    CC_Call* const call = m_control.acquireCall("");
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 1u);
    m_control.releaseCall("", call);
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 1u);
}

TEST_F(CallControl_Contexts_Test, AcquiringACallWithAMediaContextAsksForNone)
{
    TYPtr<MG_IContext> const context(new FakeMediaContext(7));
    CC_Call* const call = m_control.acquireCall("", context.get());
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 0u);
    auto const* const property =
        dynamic_cast<CC_PropertyContextId const*>(call->getProperties().get(CC_PropertyId::CONTEXT));
    ASSERT_NE(property, nullptr);
    EXPECT_EQ(property->getContext(), context.get());
    m_control.releaseCall("", call);
}

TEST_F(CallControl_Contexts_Test, OnlyTheCallsOfTheFirst64ContextsAreSummed)
{
    std::vector<String> names{"SWITCH", "lab"};
    while (names.size() < 65)
    {
        names.push_back(String::stringOf(static_cast<unsigned int>(names.size())));
        ASSERT_TRUE(m_control.createContext(names.back()).isOk());
    }
    std::vector<CC_Call*> calls;
    for (String const& name : names)
        calls.push_back(m_control.acquireCall(name));
    EXPECT_EQ(m_control.getNumberOfCalls(), 64u);
    CC_Call* const another = m_control.acquireCall(names.back());
    EXPECT_EQ(m_control.getNumberOfCalls(), 64u) << "the last one is not looked at";
    m_control.releaseCall(names.back(), another);
    m_control.releaseCall(names.front(), calls.front());
    EXPECT_EQ(m_control.getNumberOfCalls(), 63u);
    m_control.destroyContext(names.front());
    EXPECT_EQ(m_control.getNumberOfCalls(), 64u) << "now it is one of the first";
    for (std::size_t i = 1; i < names.size(); ++i)
        m_control.releaseCall(names[i], calls[i]);
    EXPECT_EQ(m_control.getNumberOfCalls(), 0u);
}
