#include "callcontrol/provider/CC_Endpoint.h"

#include "calls/CC_Call.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/DrivenLoop.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingEndpointObserver.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <memory>
#include <new>
#include <utility>

namespace
{
/// An endpoint that is offered a name and a display text.
class CC_Endpoint_Offer_Test : public testing::Test
{
protected:
    CC_Endpoint_Offer_Test()
    {
        EXPECT_TRUE(m_offered.set(CC_PropertyString(CC_PropertyId::NAME, "Ada")).isOk());
        EXPECT_TRUE(m_offered.set(CC_PropertyString(CC_PropertyId::DISPLAY, "Lovelace")).isOk());
        m_endpoint.m_handleOffer = [this](CC_Call& call, String const& name, CC_PropertyContainer const& properties)
        {
            m_call = &call;
            m_name = name;
            m_properties = &properties;
            m_values = PROPERTY_VALUES(properties);
            return m_answer;
        };
    }
    ~CC_Endpoint_Offer_Test() override { endCall(); }

    void endCall()
    {
        if (CC_Call* const call = std::exchange(m_offeredCall, nullptr))
            call->destroy();
    }
    XCode offer() { return m_endpoint.offer(*m_offeredCall, "4989123", m_offered); }
    /// Filters that drop the name and, if so told, fail.
    void filterName(XCode result)
    {
        RecordingPropertyFilter filter("f");
        filter.onApply(
            [result](CC_PropertyContainer& properties)
            {
                properties.remove(CC_PropertyId::NAME);
                return result;
            });
        EXPECT_TRUE(m_filters.addFilter(filter).isOk());
        m_endpoint.setOutputFilterContainer(&m_filters);
    }

    DrivenLoop m_loop;
    CC_Call* m_offeredCall = new CC_Call;
    CC_PropertyFilterContainer m_filters;
    RecordingEndpoint m_endpoint{"line"};
    CC_PropertyContainer m_offered;
    XCode m_answer = XCode::OK;
    CC_Call* m_call = nullptr;
    String m_name;
    CC_PropertyContainer const* m_properties = nullptr;
    std::string m_values;
};
} // namespace

TEST_F(CC_Endpoint_Offer_Test, WithoutOutputFiltersTheCallersPropertiesArePassedThemselves)
{
    EXPECT_EQ(offer(), XCode::OK);
    EXPECT_EQ(m_call, m_offeredCall);
    EXPECT_EQ(m_name, "4989123");
    EXPECT_EQ(m_properties, &m_offered);
    EXPECT_EQ(m_values, "Name: Ada, Display: Lovelace");
}

TEST_F(CC_Endpoint_Offer_Test, OutputFiltersReworkACopyAndLeaveTheCallersPropertiesAlone)
{
    filterName(XCode::OK);
    EXPECT_EQ(offer(), XCode::OK);
    EXPECT_EQ(m_call, m_offeredCall);
    EXPECT_EQ(m_name, "4989123");
    EXPECT_NE(m_properties, &m_offered);
    EXPECT_EQ(m_values, "Display: Lovelace");
    EXPECT_EQ(PROPERTY_NAMES(m_offered), "Name, Display");
}

TEST_F(CC_Endpoint_Offer_Test, AFailingOutputFilterDoesNotStopTheOffer)
{
    filterName(XCode::FAILURE);
    EXPECT_EQ(offer(), XCode::OK);
    EXPECT_EQ(m_values, "Display: Lovelace");
}

TEST_F(CC_Endpoint_Offer_Test, InputFiltersHaveNoPartInAnOffer)
{
    filterName(XCode::OK);
    m_endpoint.setOutputFilterContainer(nullptr);
    m_endpoint.setInputFilterContainer(&m_filters);
    EXPECT_EQ(offer(), XCode::OK);
    EXPECT_EQ(m_properties, &m_offered);
}

TEST_F(CC_Endpoint_Offer_Test, TheEndpointsAnswerIsTheResult)
{
    for (XCode const answer : {XCode::OK, XCode::REFUSED, XCode(0x12345678)})
    {
        m_answer = answer;
        m_endpoint.setOutputFilterContainer(nullptr);
        EXPECT_EQ(offer(), answer);
        m_endpoint.setOutputFilterContainer(&m_filters);
        EXPECT_EQ(offer(), answer) << "also behind filters";
    }
}

TEST_F(CC_Endpoint_Offer_Test, AFilterThatRunsOutOfMemoryDoesNotKeepTheCallFromBeingOffered)
{
    RecordingPropertyFilter filter("f");
    filter.onApply([](CC_PropertyContainer&) -> XCode { throw std::bad_alloc(); });
    EXPECT_TRUE(m_filters.addFilter(filter).isOk());
    m_endpoint.setOutputFilterContainer(&m_filters);
    EXPECT_EQ(offer(), XCode::OK);
    EXPECT_NE(m_call, nullptr) << "with what the filters have left";
}

TEST_F(CC_Endpoint_Offer_Test, AnEndpointThatEndsWhileItsOfferIsCopiedIsOfferedNothing)
{
    auto endpoint = std::make_unique<RecordingEndpoint>("line", "network", nullptr, nullptr, &m_filters);
    endpoint->m_handleOffer = m_endpoint.m_handleOffer;
    auto const deeds = std::make_shared<ActingProperty::Deeds>();
    EXPECT_TRUE(m_offered.set(ActingProperty(CC_PropertyId::URI, 1, deeds)).isOk());
    deeds->onClone = [&endpoint] { endpoint.reset(); };
    EXPECT_EQ(endpoint->offer(*m_offeredCall, "4989123", m_offered), XCode::FAILURE);
    EXPECT_EQ(m_call, nullptr);
}

TEST_F(CC_Endpoint_Offer_Test, ACallThatEndsWhileItsOfferIsCopiedIsNotOffered)
{
    m_endpoint.setOutputFilterContainer(&m_filters);
    auto const deeds = std::make_shared<ActingProperty::Deeds>();
    EXPECT_TRUE(m_offered.set(ActingProperty(CC_PropertyId::URI, 1, deeds)).isOk());
    deeds->onClone = [this] { endCall(); };
    EXPECT_EQ(offer(), XCode::FAILURE);
    EXPECT_EQ(m_call, nullptr);
}

TEST_F(CC_Endpoint_Offer_Test, AnEndpointThatEndsInsideItsOutputFilterIsOfferedNothing)
{
    auto endpoint = std::make_unique<RecordingEndpoint>("line", "network", nullptr, nullptr, &m_filters);
    endpoint->m_handleOffer = m_endpoint.m_handleOffer;
    RecordingPropertyFilter filter("f");
    filter.onApply(
        [&endpoint](CC_PropertyContainer&)
        {
            endpoint.reset();
            return XCode::OK;
        });
    EXPECT_TRUE(m_filters.addFilter(filter).isOk());
    EXPECT_EQ(endpoint->offer(*m_offeredCall, "4989123", m_offered), XCode::FAILURE);
    EXPECT_EQ(m_call, nullptr);
}

TEST(CC_Endpoint, TheFirstFiltersAreForInputTheSecondForOutput)
{
    CC_PropertyFilterContainer input;
    CC_PropertyFilterContainer output;
    RecordingEndpoint endpoint("line", "network", nullptr, &input, &output);
    EXPECT_EQ(endpoint.getInputFilterContainer(), &input);
    EXPECT_EQ(endpoint.getOutputFilterContainer(), &output);
    endpoint.setInputFilterContainer(&output);
    endpoint.setOutputFilterContainer(nullptr);
    EXPECT_EQ(endpoint.getInputFilterContainer(), &output);
    EXPECT_EQ(endpoint.getOutputFilterContainer(), nullptr);
}

TEST(CC_Endpoint, ItsFiltersOutliveIt)
{
    RecordingPropertyFilter filter("f");
    CC_PropertyFilterContainer filters;
    ASSERT_TRUE(filters.addFilter(filter).isOk());
    {
        RecordingEndpoint const endpoint("line", "network", nullptr, &filters, &filters);
    }
    EXPECT_EQ(filter.getNumberAlive(), 2u);
}

TEST(CC_Endpoint, LiveEndpointsAreCounted)
{
    unsigned int const before = CC_Endpoint::s_numberOfInstances;
    {
        RecordingEndpoint const first("first");
        RecordingEndpoint const second("second");
        EXPECT_EQ(CC_Endpoint::s_numberOfInstances, before + 2);
    }
    EXPECT_EQ(CC_Endpoint::s_numberOfInstances, before);
}

TEST(CC_Endpoint, ItsEndIsToldOnceEvenToAnObserverAddedTwice)
{
    Journal journal;
    RecordingEndpointObserver gone("gone", &journal);
    RecordingEndpointObserver once("once", &journal);
    RecordingEndpointObserver twice("twice", &journal);
    RecordingEndpointObserver overdrawn("overdrawn", &journal);
    {
        RecordingEndpoint endpoint("line", "network", &journal);
        for (CC_Endpoint::Observer* const observer :
             std::initializer_list<CC_Endpoint::Observer*>{&gone, &once, &twice, &twice, &overdrawn})
            EXPECT_EQ(endpoint.addEndpointObserver(*observer), XCode::OK);
        endpoint.removeEndpointObserver(gone);
        endpoint.removeEndpointObserver(overdrawn);
        endpoint.removeEndpointObserver(overdrawn); // no floor: -1 is told
    }
    EXPECT_EQ(journal.take(),
              (Lines{"once: endpoint destroyed", "twice: endpoint destroyed", "overdrawn: endpoint destroyed"}));
}

TEST(CC_Endpoint, ItsEndIsToldWhileItIsStillCountedAndHasItsFilters)
{
    CC_PropertyFilterContainer filters;
    RecordingEndpointObserver observer("o");
    unsigned int countThen = 0;
    CC_PropertyFilterContainer const* filtersThen = nullptr;
    observer.m_onDestroy = [&](CC_Endpoint& ending)
    {
        countThen = CC_Endpoint::s_numberOfInstances;
        filtersThen = ending.getOutputFilterContainer();
    };
    auto endpoint = std::make_unique<RecordingEndpoint>("line", "network", nullptr, nullptr, &filters);
    ASSERT_TRUE(endpoint->addEndpointObserver(observer).isOk());
    unsigned int const alive = CC_Endpoint::s_numberOfInstances;
    endpoint.reset();
    EXPECT_EQ(countThen, alive);
    EXPECT_EQ(filtersThen, &filters);
}

TEST(CC_Endpoint, WithoutMemoryAnObserverIsRefusedAsAFailure)
{
    RecordingEndpointObserver a("a");
    RecordingEndpointObserver b("b");
    RecordingEndpointObserver c("c");
    RecordingEndpoint endpoint("line");
    ASSERT_TRUE(endpoint.addEndpointObserver(a).isOk());
    ASSERT_TRUE(endpoint.addEndpointObserver(b).isOk());
    FailingAllocator::failNth(1);
    XCode const result = endpoint.addEndpointObserver(c);
    FailingAllocator::stop();
    EXPECT_EQ(result, XCode::FAILURE) << "a context says NO_ELEMENT here";
}

TEST(CC_Endpoint, BothNotificationsCanBeAskedForByTheModule)
{
    RecordingEndpointObserver observer("o");
    RecordingEndpoint endpoint("line");
    CC_Endpoint::NOTIFY_OBSERVER_ABOUT_FINISHED(observer, endpoint, nullptr);
    CC_Endpoint::NOTIFY_OBSERVER_ABOUT_DESTROY(observer, endpoint, nullptr);
    EXPECT_EQ(observer.take(), (Lines{"o: endpoint finished", "o: endpoint destroyed"}));
}
