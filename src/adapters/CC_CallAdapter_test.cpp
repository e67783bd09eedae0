#include "adapters/CC_CallAdapter.h"

#include "platform/base/NameOf.h"
#include "properties/CC_PropertyContextId.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/FakeMediaContext.h"
#include "testing/RecordingMonitor.h"
#include "tests/support/TestLine.h"

namespace
{
class CC_CallAdapter_Test : public TestLines
{
};

String ADDRESS_OF(CC_CallAdapter const& adapter)
{
    String text;
    return text.format("%p", static_cast<void const*>(&adapter));
}

/// "[EP %s/%s] Set name: %s"
std::string RENAMED(char const* endpoint, String const& oldName, String const& newName)
{
    String line;
    line.format("[EP %s/%s] Set name: %s", endpoint, oldName.c_str(), newName.c_str());
    return line.c_str();
}
} // namespace

// --- set-up and names ------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Test, ANewAdapterIsIdleAndWithoutAnything)
{
    CC_CallAdapter const adapter;
    EXPECT_EQ(adapter.getName(), "");
    EXPECT_EQ(adapter.getEndpoint(), nullptr);
    EXPECT_EQ(adapter.getObserver(), nullptr);
    EXPECT_EQ(adapter.getCall(), nullptr);
    EXPECT_EQ(adapter.getCallLegName(), "");
}

TEST_F(CC_CallAdapter_Test, LiveAdaptersAreCounted)
{
    unsigned int const before = CC_CallAdapter::s_numberOfInstances;
    {
        CC_CallAdapter const first;
        CC_CallAdapter const second;
        EXPECT_EQ(CC_CallAdapter::s_numberOfInstances, before + 2);
    }
    EXPECT_EQ(CC_CallAdapter::s_numberOfInstances, before);
}

TEST_F(CC_CallAdapter_Test, SetupBindsNameEndpointAndObserver)
{
    CC_CallAdapter adapter;
    EXPECT_EQ(adapter.setup("line 7", c.endpoint, &c.module), XCode::OK);
    EXPECT_EQ(adapter.getName(), "line 7");
    EXPECT_EQ(adapter.getEndpoint(), &c.endpoint);
    EXPECT_EQ(adapter.getObserver(), &c.module);
    EXPECT_EQ(adapter.setup("line 8", a.endpoint, nullptr), XCode::OK) << "and again";
    EXPECT_EQ(adapter.getName(), "line 8");
    EXPECT_EQ(adapter.getEndpoint(), &a.endpoint);
    EXPECT_EQ(adapter.getObserver(), nullptr);
}

TEST_F(CC_CallAdapter_Test, AnEmptyNameBecomesTheAddress)
{
    CC_CallAdapter adapter;
    EXPECT_EQ(adapter.setup("", c.endpoint, nullptr), XCode::OK);
    EXPECT_EQ(adapter.getName(), ADDRESS_OF(adapter));
    adapter.setName("line");
    adapter.setName("");
    EXPECT_EQ(adapter.getName(), ADDRESS_OF(adapter));
}

TEST_F(CC_CallAdapter_Test, SetupOfAnActiveAdapterDropsItsLegWithoutACause)
{
    connect();
    EXPECT_EQ(a.adapter.setup("other", a.endpoint, &a.module), XCode::OK);
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (State)"});
    EXPECT_EQ(b.peer(CC_PropertyId::STATE), "RELEASED");
    b.drop();
    settle();
    EXPECT_EQ(a.dial(), XCode::OK) << "it is idle again";
}

TEST_F(CC_CallAdapter_Test, RenamingIsLoggedAtTheNamingLevelWithTheOldName)
{
    RecordingMonitor monitor;
    a.adapter.setName("new");
    EXPECT_EQ(monitor.getLines(), (std::vector<RecordingMonitor::Line>{{4, RENAMED("a", "line", "new")}}));
    EXPECT_EQ(a.adapter.getName(), "new");
    monitor.clear();
    a.adapter.setName("");
    EXPECT_EQ(monitor.linesOfLevel(4), Lines{RENAMED("a", "new", ADDRESS_OF(a.adapter))});
}

TEST_F(CC_CallAdapter_Test, RenamingToTheSameNameIsSilent)
{
    RecordingMonitor monitor;
    a.adapter.setName("line");
    a.adapter.setName("");
    monitor.clear();
    a.adapter.setName("");
    EXPECT_EQ(monitor.getLines(), std::vector<RecordingMonitor::Line>());
}

TEST_F(CC_CallAdapter_Test, RenamingBelowItsLevelIsNotLogged)
{
    RecordingMonitor monitor(RTD::LEVEL_CHANGE);
    a.adapter.setName("new");
    EXPECT_EQ(monitor.getLines().size(), 0u);
    EXPECT_EQ(a.adapter.getName(), "new");
}

TEST_F(CC_CallAdapter_Test, TheLegIsNamedAfterEndpointAndAdapterAndRenamedWithIt)
{
    EXPECT_EQ(a.adapter.getCallLegName(), "");
    connect();
    EXPECT_EQ(a.adapter.getCallLegName(), "a/line");
    a.adapter.setName("7");
    EXPECT_EQ(a.adapter.getCallLegName(), "a/7");
    EXPECT_EQ(theCall().getCallLeg(0)->getName(), "a/7");
    a.drop();
    EXPECT_EQ(a.adapter.getCallLegName(), "");
}

TEST_F(CC_CallAdapter_Test, CleanupLeavesItAsNewlyMade)
{
    connect();
    a.adapter.cleanup();
    EXPECT_EQ(a.adapter.getName(), "");
    EXPECT_EQ(a.adapter.getEndpoint(), nullptr);
    EXPECT_EQ(a.adapter.getObserver(), nullptr);
    EXPECT_EQ(a.adapter.getCall(), nullptr);
    for (unsigned int const id : {CC_PropertyId::STATE, CC_PropertyId::CONTEXT})
        EXPECT_EQ(a.own(id) + a.peer(id) + a.call(id), "---");
    EXPECT_EQ(a.dial(), XCode::REFUSED) << "it has no endpoint";
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (State)"}) << "no cause is given";
    EXPECT_EQ(heardBy(a), Lines());
}

TEST_F(CC_CallAdapter_Test, CleanupOfAnIdleAdapterForgetsItsSetup)
{
    c.adapter.cleanup();
    c.adapter.cleanup();
    EXPECT_EQ(c.adapter.getEndpoint(), nullptr);
    EXPECT_EQ(c.adapter.setup("line", c.endpoint, &c.module), XCode::OK);
    EXPECT_EQ(c.adapter.getEndpoint(), &c.endpoint);
}

TEST_F(CC_CallAdapter_Test, ItsEndDropsTheLegWithoutACause)
{
    {
        CC_CallAdapter adapter;
        ASSERT_TRUE(adapter.setup("short", c.endpoint, nullptr).isOk());
        CC_PropertyContainer const& none = CC_PropertyContainer::EMPTY();
        ASSERT_TRUE(adapter.dial("", "isdn", "1", none, none, none, nullptr).isOk());
        listen();
    }
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (State)"});
}

TEST(CC_CallAdapter, DestinationTypesHaveNames)
{
    struct Case
    {
        int type;
        char const* name;
    };
    for (Case const& row :
         {Case{0, "none"}, Case{1, "provider"}, Case{2, "table"}, Case{3, ERROR::INVALID}, Case{-1, ERROR::INVALID}})
        EXPECT_STREQ(CC_CallAdapter::DESTINATION_TYPE_NAME(static_cast<CC_CallAdapter::DestinationType>(row.type)),
                     row.name)
            << row.type;
}

// --- services --------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Test, AServiceReachesThePeersModuleAtOnceAndIsLogged)
{
    connect();
    RecordingMonitor monitor(RTD::LEVEL_FLOW);
    CC_ServiceUserInput digits("12");
    a.adapter.invokeSynchronousService(digits);
    EXPECT_EQ(b.module.take(), Lines{"b: peer asked (User Input: 12 (Duration: Unknown))"});
    EXPECT_EQ(a.module.take(), Lines()) << "not back to who asked";
    String expected;
    expected.format("[EP %s/%s] Invoke service: %s", "a", "line", digits.getInfo().c_str());
    EXPECT_EQ(monitor.getLines(), (std::vector<RecordingMonitor::Line>{{2, expected.c_str()}}));
}

TEST_F(CC_CallAdapter_Test, AServiceInACallOfThreeReachesBothOthers)
{
    connect();
    ASSERT_TRUE(c.accept(theCall()).isOk());
    listen();
    CC_ServiceUserInput digits("5");
    b.adapter.invokeSynchronousService(digits);
    EXPECT_EQ(a.module.getServices().size(), 1u);
    EXPECT_EQ(c.module.getServices().size(), 1u);
    EXPECT_EQ(b.module.getServices().size(), 0u);
}

TEST_F(CC_CallAdapter_Test, AServiceOfAnIdleAdapterIsNothing)
{
    RecordingMonitor monitor;
    CC_ServiceUserInput digits("5");
    a.adapter.invokeSynchronousService(digits);
    EXPECT_EQ(monitor.getLines().size(), 0u);
}

TEST_F(CC_CallAdapter_Test, WithoutAnObserverTheAdapterIsToldItself)
{
    struct Overriding : CC_CallAdapter
    {
        void notifyPeerPropertyChange(CC_Flags const& flags) override { hasState = flags.get(CC_PropertyId::STATE); }
        void notifyPeerSynchronousService(CC_Service&) override { ++services; }
        bool hasState = false;
        int services = 0;
    };
    connect();
    Overriding own;
    ASSERT_TRUE(own.setup("own", c.endpoint, nullptr).isOk());
    ASSERT_TRUE(own.accept(theCall(), CC_PropertyContainer::EMPTY()).isOk());
    settle();
    EXPECT_TRUE(own.hasState);
    CC_ServiceUserInput digits("5");
    a.adapter.invokeSynchronousService(digits);
    EXPECT_EQ(own.services, 1);
}

TEST_F(CC_CallAdapter_Test, ItsOwnNotificationsDoNothing)
{
    connect();
    ASSERT_TRUE(b.adapter.setup("line", b.endpoint, nullptr).isOk());
    ASSERT_TRUE(b.accept(theCall()).isOk());
    CC_ServiceUserInput digits("5");
    a.adapter.invokeSynchronousService(digits);
    settle();
    EXPECT_EQ(b.module.take(), Lines());
}

// --- the media context -----------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Test, WithoutALegOrACallThereIsNoMediaContext)
{
    EXPECT_EQ(a.adapter.getDatapathContext(), nullptr);
    a.adapter.setDatapathContext(nullptr);
    EXPECT_EQ(m_mediaContexts.getNumberOfRequests(), 1u) << "the property asked; there was nowhere to put it";
    EXPECT_EQ(a.call(CC_PropertyId::CONTEXT), "-");
}

TEST_F(CC_CallAdapter_Test, TheMediaContextIsThatOfTheCallForEverybody)
{
    connect();
    TYPtr<MG_IContext> const media(new FakeMediaContext(77));
    a.adapter.setDatapathContext(media.get());
    EXPECT_EQ(a.adapter.getDatapathContext(), media.get());
    EXPECT_EQ(std::as_const(b.adapter).getDatapathContext(), media.get());
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (Context)"});
    EXPECT_EQ(heardBy(a), Lines());
}

TEST_F(CC_CallAdapter_Test, TheMediaContextGoesThroughTheInputFilters)
{
    connect();
    MG_IContext* const before = a.adapter.getDatapathContext();
    a.filterInput(
        [](CC_PropertyContainer& properties)
        {
            properties.remove(CC_PropertyId::CONTEXT);
            return XCode::OK;
        });
    TYPtr<MG_IContext> const media(new FakeMediaContext(77));
    a.adapter.setDatapathContext(media.get());
    EXPECT_EQ(a.adapter.getDatapathContext(), before);
}

TEST_F(CC_CallAdapter_Test, AContextPropertyOfAnotherClassIsNoMediaContext)
{
    CC_Call* const call = new CC_Call;
    ASSERT_TRUE(call->setProperty(CC_PropertyString(CC_PropertyId::CONTEXT, "no context")).isOk());
    ASSERT_TRUE(a.accept(*call).isOk());
    EXPECT_EQ(a.adapter.getDatapathContext(), nullptr);
    EXPECT_EQ(std::as_const(a.adapter).getDatapathContext(), nullptr);
    a.drop();
    settle();
}

TEST_F(CC_CallAdapter_Test, ShowsItsLegAndItsPeers)
{
    EXPECT_EQ(a.adapter.getOwnCallLeg(), nullptr);
    EXPECT_EQ(a.adapter.getPeerCallLeg(), nullptr);
    connect();
    EXPECT_EQ(a.adapter.getOwnCallLeg(), theCall().getCallLeg(0));
    EXPECT_EQ(a.adapter.getPeerCallLeg(), theCall().getCallLeg(1));
    EXPECT_EQ(b.adapter.getPeerCallLeg(), a.adapter.getOwnCallLeg());
}
