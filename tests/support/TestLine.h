#pragma once

#include "adapters/CC_CallAdapter.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/CallControlFixture.h"
#include "testing/RecordingAdapterObserver.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingPropertyFilter.h"
#include "testing/RecordingProvider.h"

#include <gtest/gtest.h>
#include <string>
#include <tuple>
#include <utility>

using State = CC_PropertyCallLegState;

/// A module's line for the tests of the adapter: an endpoint, what the module hears, and the adapter of one call, named
/// "line". In verbs, so that tests read as stories.
class TestLine
{
public:
    explicit TestLine(std::string const& name) : module(name), endpoint(name, (name + "-net").c_str())
    {
        EXPECT_TRUE(adapter.setup("line", endpoint, &module).isOk());
    }

    XCode dial(String const& provider = "isdn", CC_PropertyContainer const& own = CC_PropertyContainer::EMPTY(),
               CC_PropertyContainer const& offer = CC_PropertyContainer::EMPTY(),
               CC_PropertyContainer const& call = CC_PropertyContainer::EMPTY(), MG_IContext* media = nullptr)
    {
        return adapter.dial("", provider, "4989123", own, offer, call, media);
    }
    XCode accept(CC_Call& call) { return adapter.accept(call, CC_PropertyContainer::EMPTY()); }
    void drop() { adapter.drop(QCause::UNSPECIFIED, 0); }
    void become(State::State state) { EXPECT_TRUE(adapter.setOwnProperty(State(CC_PropertyId::STATE, state)).isOk()); }
    void say(unsigned int id, char const* text)
    {
        EXPECT_TRUE(adapter.setOwnProperty(CC_PropertyString(id, text)).isOk());
    }

    /// The values as texts, "-" for what is absent.
    static std::string TEXT(CC_Property const* property)
    {
        String text;
        return property != nullptr ? property->getValueString(text).c_str() : "-";
    }
    std::string own(unsigned int id) const { return TEXT(adapter.getOwnProperty(id)); }
    std::string leg(unsigned int id) const { return TEXT(adapter.getOwnPropertyUnfiltered(id)); }
    std::string peer(unsigned int id) const { return TEXT(adapter.getPeerProperty(id)); }
    std::string call(unsigned int id) const { return TEXT(adapter.getCallProperty(id)); }
    std::string callItself(unsigned int id) const { return TEXT(adapter.getCallPropertyUnfiltered(id)); }

    /// Adds a filter that does `apply`, also when the line drops at the end of the test: what it captures must live as
    /// long as the line.
    template <class Apply>
    void filterInput(Apply apply)
    {
        add(inputFilters,
            [this, apply = std::move(apply)](CC_PropertyContainer& properties)
            {
                ++inputFilterRuns;
                return apply(properties);
            });
        endpoint.setInputFilterContainer(&inputFilters);
    }
    template <class Apply>
    void filterOutput(Apply apply)
    {
        add(outputFilters, std::move(apply));
        endpoint.setOutputFilterContainer(&outputFilters);
    }

    RecordingAdapterObserver module;
    unsigned int inputFilterRuns = 0;
    CC_PropertyFilterContainer inputFilters;
    CC_PropertyFilterContainer outputFilters;
    RecordingEndpoint endpoint;
    CC_CallAdapter adapter;

private:
    template <class Apply>
    static void add(CC_PropertyFilterContainer& filters, Apply apply)
    {
        RecordingPropertyFilter filter("f");
        filter.onApply(std::move(apply));
        EXPECT_TRUE(filters.addFilter(filter).isOk());
    }
};

/// The line `a` dials the provider "isdn", which has the line `b` accept.
class TestLines : public testing::Test, protected CallControlFixture
{
protected:
    TestLines()
    {
        EXPECT_TRUE(CallControl::ADD_PROVIDER("", "isdn", provider).isOk());
        provider.m_dial = [this](CC_Call& call, String const&, String const&, CC_PropertyContainer const&)
        { return b.accept(call); };
    }
    ~TestLines() override { CallControl::REMOVE_PROVIDER("", "isdn"); }

    /// a and b in one call, b in that state, and everything up to now heard.
    void connect(State::State stateOfB = State::CONNECTED)
    {
        EXPECT_EQ(a.dial(), XCode::OK);
        b.become(stateOfB);
        listen();
    }
    /// Lets the loop run and forgets what was heard.
    void listen()
    {
        settle();
        for (TestLine* const line : {&a, &b, &c})
            line->module.take();
    }
    /// What the module hears in the loop's next turns.
    Lines heardBy(TestLine& line)
    {
        settle();
        return line.module.take();
    }
    CC_Call& theCall() const { return *a.adapter.getCall(); }

    RecordingProvider provider{"isdn"};
    TestLine a{"a"};
    TestLine b{"b"};
    TestLine c{"c"};
};
