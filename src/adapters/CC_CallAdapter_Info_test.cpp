#include "tests/support/TestLine.h"

#include <functional>

namespace
{
/// An endpoint in whose dump something else happens.
class InterruptedEndpoint : public RecordingEndpoint
{
public:
    using RecordingEndpoint::RecordingEndpoint;
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        m_interrupt(info);
        return info;
    }
    std::function<void(InfoContainer&)> m_interrupt;
};

class CC_CallAdapter_Info_Test : public TestLines
{
protected:
    /// Each entry as "level/detail key: text", one a line.
    static std::string ENTRIES(InfoContainer const& info)
    {
        String all;
        for (unsigned int i = 0; i < info.getNumberOfEntries(); ++i)
        {
            InfoContainer::Entry const& entry = info.getEntry(i);
            all.concatf("%u/%u %s: %s\n", entry.level, entry.detail, entry.key.c_str(), entry.text.c_str());
        }
        return all.c_str();
    }
    static std::string DUMP(CC_CallAdapter const& adapter, unsigned int maxLevel, unsigned int maxDetail)
    {
        InfoContainer info;
        EXPECT_EQ(&adapter.getInfo(info, maxLevel, 3, maxDetail, 5, "My "), &info);
        return ENTRIES(info);
    }
};

char const* const TITLE = "3/5 My Call Adapter: line\n";
} // namespace

TEST_F(CC_CallAdapter_Info_Test, EndpointViewsAndLegsStandBelowTheTitle)
{
    connect();
    EXPECT_EQ(DUMP(a.adapter, 4, 5), std::string(TITLE) + "4/5 Near End Endpoint: a\n"
                                                          "4/5 Near End Properties: \n"
                                                          "4/5 Far End Properties: \n"
                                                          "4/5 Call Properties: \n"
                                                          "4/5 Near End Call Leg: a/line\n"
                                                          "4/5 Far End Call Leg: b/line\n");
}

TEST_F(CC_CallAdapter_Info_Test, WithoutLegsTheyAreLeftOut)
{
    EXPECT_EQ(DUMP(a.adapter, 9, 9), std::string(TITLE) + "4/5 Near End Endpoint: a\n"
                                                          "4/5 Near End Properties: \n"
                                                          "4/5 Far End Properties: \n"
                                                          "4/5 Call Properties: \n");
}

TEST_F(CC_CallAdapter_Info_Test, WithoutAnEndpointItIsLeftOut)
{
    CC_CallAdapter const adapter;
    EXPECT_EQ(DUMP(adapter, 4, 5), "3/5 My Call Adapter: \n"
                                   "4/5 Near End Properties: \n"
                                   "4/5 Far End Properties: \n"
                                   "4/5 Call Properties: \n");
}

TEST_F(CC_CallAdapter_Info_Test, TheViewsShowTheirProperties)
{
    connect();
    b.say(CC_PropertyId::NAME, "Bob");
    std::string const dump = DUMP(a.adapter, 5, 5);
    EXPECT_NE(dump.find("4/5 Far End Properties: \n"), std::string::npos);
    EXPECT_NE(dump.find("5/5 Name: Bob\n"), std::string::npos);
    EXPECT_LT(dump.find("4/5 Far End Properties"), dump.find("5/5 Name: Bob"));
    EXPECT_LT(dump.find("5/5 Name: Bob"), dump.find("4/5 Call Properties"));
}

TEST_F(CC_CallAdapter_Info_Test, TheLimitsHold)
{
    connect();
    EXPECT_EQ(DUMP(a.adapter, 3, 5), TITLE);
    EXPECT_EQ(DUMP(a.adapter, 2, 5), "");
    EXPECT_EQ(DUMP(a.adapter, 4, 4), "");
    EXPECT_EQ(DUMP(a.adapter, 3, 9), TITLE);
}

TEST_F(CC_CallAdapter_Info_Test, AnAdapterInsideAnotherAdaptersDumpShowsItsTitleAlone)
{
    InterruptedEndpoint endpoint("interrupted");
    CC_CallAdapter outer;
    ASSERT_TRUE(outer.setup("outer", endpoint, nullptr).isOk());
    std::string inside;
    endpoint.m_interrupt = [&](InfoContainer&) { inside = DUMP(c.adapter, 9, 9); };
    DUMP(outer, 9, 9);
    EXPECT_EQ(inside, TITLE);
    EXPECT_NE(DUMP(c.adapter, 9, 9), TITLE) << "outside it is complete again";
}
