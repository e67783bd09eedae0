#pragma once

#include "adapters/CC_CallAdapterE164.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/CallControlFixture.h"
#include "testing/FailingAllocator.h"
#include "testing/RecordingAdapterObserver.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingProvider.h"

#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <tuple>

using State = CC_PropertyCallLegState;

/// A module's line for the tests of the E.164 adapter: an endpoint, what the module hears, and an adapter named "line"
/// of that class or one that derives from it.
template <class Adapter = CC_CallAdapterE164>
class TestLineE164
{
public:
    explicit TestLineE164(std::string const& name) : module(name), endpoint(name, (name + "-net").c_str()) { renew(); }

    /// A new adapter in place of the one before.
    void renew()
    {
        adapter = std::make_unique<Adapter>();
        EXPECT_EQ(adapter->setup("line", endpoint, &module), XCode::OK);
    }
    XCode dial(String const& calledNumber = "4989", MG_IContext* media = nullptr, String const& provider = "isdn",
               CC_PropertyContainer const& own = CC_PropertyContainer::EMPTY(),
               CC_PropertyContainer const& call = CC_PropertyContainer::EMPTY())
    {
        CC_PropertyContainer offer;
        EXPECT_EQ(offer.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, calledNumber)), XCode::OK);
        return adapter->dial("SWITCH", provider, "trunk", own, offer, call, media);
    }
    XCode accept(CC_Call& call) { return adapter->accept(call, CC_PropertyContainer::EMPTY()); }
    void become(State::State state)
    {
        EXPECT_EQ(adapter->setOwnProperty(State(CC_PropertyId::STATE, state)), XCode::OK);
    }
    void key(String const& digits)
    {
        CC_ServiceUserInput input(digits);
        adapter->invokeSynchronousService(input);
    }

    /// The values as texts, "-" for what is absent.
    static std::string TEXT(CC_Property const* property)
    {
        String text;
        return property != nullptr ? property->getValueString(text).c_str() : "-";
    }
    std::string own(unsigned int id) const { return TEXT(adapter->getOwnProperty(id)); }
    std::string leg(unsigned int id) const { return TEXT(adapter->getOwnPropertyUnfiltered(id)); }
    std::string peer(unsigned int id) const { return TEXT(adapter->getPeerProperty(id)); }
    std::string call(unsigned int id) const { return TEXT(adapter->getCallProperty(id)); }

    RecordingAdapterObserver module;
    RecordingEndpoint endpoint;
    std::unique_ptr<Adapter> adapter;
};

/// The line `a` dials the provider "isdn", which has the line `b` accept and keeps what it was offered.
template <class AdapterOfA = CC_CallAdapterE164>
class TestLinesE164 : public testing::Test, protected CallControlFixture
{
protected:
    TestLinesE164()
    {
        EXPECT_EQ(CallControl::ADD_PROVIDER("SWITCH", "isdn", provider), XCode::OK);
        provider.m_dial =
            [this](CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offer)
        {
            FailingAllocator::Pause const unseen;
            offered = offer;
            numbers.push_back(TestLineE164<>::TEXT(offer.get(CC_PropertyId::E164_NUMBER)));
            destinations.emplace_back(destination.c_str());
            return onOffer ? onOffer(call) : b.accept(call);
        };
    }
    ~TestLinesE164() override
    {
        a.adapter.reset();
        b.adapter.reset();
        CallControl::REMOVE_PROVIDER("SWITCH", "isdn");
    }

    /// Lets the loop run and forgets what was heard.
    void listen()
    {
        settle();
        a.module.take();
        b.module.take();
    }

    CC_PropertyContainer offered; ///< with the last dial
    Lines numbers;                ///< called, of all dials
    Lines destinations;
    std::function<XCode(CC_Call&)> onOffer;
    RecordingProvider provider{"isdn"};
    TestLineE164<AdapterOfA> a{"a"};
    TestLineE164<> b{"b"};
};
