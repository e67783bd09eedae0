#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CC_Context.h"
#include "calls/CC_Call.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "testing/DrivenLoop.h"
#include "testing/RecordingContextObserver.h"
#include "testing/RecordingProvider.h"

#include <functional>
#include <gtest/gtest.h>
#include <string>
#include <utility>

namespace
{
/// A property in whose dump something else happens.
class InterruptingProperty : public CC_PropertyBoolean
{
public:
    explicit InterruptingProperty(std::function<void()> interrupt)
        : CC_PropertyBoolean(CC_PropertyId::ENDPOINT_IS_ISDN), m_interrupt(std::move(interrupt))
    {
    }
    CC_Property* clone() const override { return new InterruptingProperty(*this); }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        m_interrupt();
        return info;
    }

private:
    std::function<void()> m_interrupt;
};

/// Each entry as "level/detail key: text", one a line.
std::string ENTRIES(InfoContainer const& info)
{
    String all;
    for (unsigned int i = 0; i < info.getNumberOfEntries(); ++i)
    {
        InfoContainer::Entry const& entry = info.getEntry(i);
        all.concatf("%u/%u %s: %s\n", entry.level, entry.detail, entry.key.c_str(), entry.text.c_str());
    }
    return all.c_str();
}

class CC_Context_Info_Test : public testing::Test
{
protected:
    CC_Context_Info_Test()
    {
        EXPECT_TRUE(m_context.addProvider("sip", m_provider).isOk());
        EXPECT_TRUE(m_context.addProvider("isdn", m_provider).isOk());
    }
    std::string providers(unsigned int maxLevel, unsigned int maxDetail) const
    {
        InfoContainer info;
        EXPECT_EQ(&m_context.getProviderInfo(info, maxLevel, 3, maxDetail, 5, "My "), &info);
        return ENTRIES(info);
    }
    std::string calls(unsigned int maxLevel, unsigned int maxDetail) const
    {
        InfoContainer info;
        EXPECT_EQ(&m_context.getCallInfo(info, maxLevel, 3, maxDetail, 5, "My "), &info);
        return ENTRIES(info);
    }
    std::string poolLine() const
    {
        return std::string("4/5 Call Pool: ") + String::addressOf(m_context.getCallPool()).c_str() + "\n";
    }

    DrivenLoop m_loop;
    RecordingProvider m_provider{"provider"};
    CC_Context m_context{"lab"};
};

char const* const TITLE = "3/5 My Call Control: lab\n";
char const* const OBSERVERS = "4/9 Context Observer Container: \n5/9 Number Of Observers: 0\n";
} // namespace

TEST_F(CC_Context_Info_Test, ProvidersStandBelowTheirHeadingInTheOrderOfAdding)
{
    EXPECT_EQ(providers(5, 6), "3/5 My Call Control: lab\n4/6 Providers: \n5/6 sip: \n5/6 isdn: \n");
}

TEST_F(CC_Context_Info_Test, ProvidersKeepToTheLimits)
{
    EXPECT_EQ(providers(4, 6), "3/5 My Call Control: lab\n4/6 Providers: \n");
    EXPECT_EQ(providers(3, 6), TITLE);
    EXPECT_EQ(providers(5, 5), TITLE) << "the providers are finer by one";
    EXPECT_EQ(providers(2, 6), "");
    EXPECT_EQ(providers(5, 4), "");
}

TEST_F(CC_Context_Info_Test, CallsStandAsThePoolAndTheObserversDumpThem)
{
    EXPECT_EQ(calls(5, 9), TITLE + poolLine() + OBSERVERS);
}

TEST_F(CC_Context_Info_Test, CallsKeepToTheLimits)
{
    EXPECT_EQ(calls(5, 8), TITLE + poolLine()) << "the observers are finer by four";
    EXPECT_EQ(calls(4, 9), TITLE + poolLine() + "4/9 Context Observer Container: \n");
    EXPECT_EQ(calls(3, 9), TITLE);
    EXPECT_EQ(calls(2, 9), "");
    EXPECT_EQ(calls(5, 4), "");
}

TEST_F(CC_Context_Info_Test, TheCallsOfThePoolAreShown)
{
    CC_Call* const call = m_context.acquireCall();
    EXPECT_EQ(calls(5, 5), TITLE + poolLine() + "5/5 Call: " + call->getName().c_str() + "\n");
    m_context.releaseCall(call);
}

TEST_F(CC_Context_Info_Test, ObserversWithoutRegistrationsAreNumberedToo)
{
    RecordingContextObserver observer("o");
    ASSERT_TRUE(m_context.addContextObserver(observer).isOk());
    m_context.removeContextObserver(observer);
    EXPECT_NE(calls(5, 9).find("5/9 Number Of Observers: 1\n"), std::string::npos);
}

TEST_F(CC_Context_Info_Test, CallsInsideAnotherDumpOfCallsShowTheTitleAlone)
{
    CC_Context other("other");
    std::string inside;
    CC_Call* const call = m_context.acquireCall();
    ASSERT_TRUE(call->setProperty(InterruptingProperty(
                                      [&]
                                      {
                                          InfoContainer info;
                                          other.getCallInfo(info, 9, 0, 9, 0, "");
                                          other.getProviderInfo(info, 9, 0, 9, 0, "");
                                          inside = ENTRIES(info);
                                      }))
                    .isOk());
    calls(9, 9);
    EXPECT_EQ(inside, "0/0 Call Control: other\n0/0 Call Control: other\n1/1 Providers: \n")
        << "the providers are complete";
    m_context.releaseCall(call);
}
