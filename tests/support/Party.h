#pragma once

#include "adapters/CC_CallAdapter.h"
#include "callcontrol/CallControl.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/base/NameOf.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "testing/RecordingAdapterObserver.h"
#include "testing/RecordingEndpoint.h"
#include "testing/RecordingProvider.h"

#include <memory>
#include <string>
#include <tuple>

using State = CC_PropertyCallLegState;

/// One signalling module with a line: a provider under its own name in the context "SWITCH", an endpoint, and an
/// adapter for one call. It accepts what it is offered, unless the test says otherwise through
/// `endpoint.m_handleOffer`. Unlike the kit's FakeModule it needs memory that may run out, and knows no numbers.
///
///     Party anna("anna"), bert("bert");
///     anna.dial(bert);
///     bert.become(State::CONNECTED);
class Party
{
public:
    explicit Party(std::string const& moduleName, String const& network = "", Journal* journal = nullptr,
                   CC_PropertyFilterContainer* inputFilters = nullptr,
                   CC_PropertyFilterContainer* outputFilters = nullptr)
        : name(moduleName.c_str())
        , provider(moduleName, journal)
        , endpoint(moduleName, network.isEmpty() ? name : network, journal, inputFilters, outputFilters)
        , observer(moduleName, journal)
        , adapter(std::make_unique<CC_CallAdapter>())
    {
        provider.m_dial =
            [this](CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offered)
        { return endpoint.offer(call, destination, offered); };
        endpoint.m_handleOffer = [this](CC_Call& call, String const&, CC_PropertyContainer const&)
        { return adapter->accept(call, CC_PropertyContainer::EMPTY()); };
        std::ignore = CallControl::ADD_PROVIDER("SWITCH", name, provider); // refused for a second line
        setup();
    }
    ~Party()
    {
        adapter.reset();
        if (CallControl::GET_PROVIDER("SWITCH", name) == &provider)
            CallControl::REMOVE_PROVIDER("SWITCH", name);
    }

    void setup() { std::ignore = adapter->setup("line", endpoint, &observer); }

    XCode dial(Party const& callee, CC_PropertyContainer const& own = CC_PropertyContainer::EMPTY(),
               CC_PropertyContainer const& offer = CC_PropertyContainer::EMPTY(),
               CC_PropertyContainer const& call = CC_PropertyContainer::EMPTY())
    {
        return adapter->dial("SWITCH", callee.name, "4989123", own, offer, call, nullptr);
    }
    XCode become(State::State state) { return adapter->setOwnProperty(State(CC_PropertyId::STATE, state)); }
    XCode say(unsigned int id, String const& text) { return adapter->setOwnProperty(CC_PropertyString(id, text)); }
    void hangUp(QCause cause = QCause::NORMAL_CALL_CLEARING)
    {
        if (adapter != nullptr)
            adapter->drop(cause, 0);
    }

    CC_Call* getCall() const { return adapter->getCall(); }
    /// "CONNECTED"; "none" without a peer.
    std::string peerState() const
    {
        auto const* const state = dynamic_cast<State const*>(adapter->getPeerProperty(CC_PropertyId::STATE));
        return state != nullptr ? State::STATE_NAME(state->getState()) : "none";
    }
    QCause peerCause() const
    {
        auto const* const cause = dynamic_cast<CC_PropertyCause const*>(adapter->getPeerProperty(CC_PropertyId::CAUSE));
        return cause != nullptr ? cause->getCause() : QCause::UNSPECIFIED;
    }
    /// The peer's text under that id; "none" if it is absent.
    std::string peerText(unsigned int id) const
    {
        CC_Property const* const property = adapter->getPeerProperty(id);
        String text;
        return property != nullptr ? property->getValueString(text).c_str() : "none";
    }

    String const name;
    RecordingProvider provider;
    RecordingEndpoint endpoint;
    RecordingAdapterObserver observer;
    std::unique_ptr<CC_CallAdapter> adapter;
};
