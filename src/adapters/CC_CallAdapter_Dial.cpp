// How the own leg begins: dial and accept.
#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "calls/CC_Monitor.h"
#include "platform/base/Assert.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"

#include <cstdint>
#include <new>
#include <tuple>

bool CC_CallAdapter::isReady() const
{
    return m_endpoint != nullptr && !m_isResetting && m_ownCallLeg == nullptr && m_peerChangeEvent == nullptr &&
           m_secondEvent == nullptr;
}

XCode CC_CallAdapter::dial(String const& contextName, String const& providerName, String const& destination,
                           CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                           CC_PropertyContainer const& callProperties, MG_IContext* datapathContext)
{
    if (!isReady())
        return XCode::REFUSED;
    Attempt const attempt(*this);
    XCode result = XCode::FAILURE;
    try
    {
        result = tryDial(contextName, providerName, destination, ownProperties, offerProperties, callProperties,
                         datapathContext);
    }
    catch (std::bad_alloc const&)
    {
        result = XCode::FAILURE;
    }
    if (!result.isOk() && !attempt.isOver())
        dropOwnCallLeg(QCause::NETWORK_OUT_OF_ORDER, 0);
    return result;
}

XCode CC_CallAdapter::tryDial(String const& contextName, String const& providerName, String const& destination,
                              CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                              CC_PropertyContainer const& callProperties, MG_IContext* datapathContext)
{
    Attempt const attempt(*this);
    CC_Provider* const provider = CallControl::GET_PROVIDER(contextName, providerName);
    if (provider == nullptr)
    {
        if (RTD::Monitor const* const monitor = CC_Monitor::FOR(RTD::LEVEL_FAILURE))
            monitor->debug("[EP %s/%s] DESTINATION PROVIDER '%s' DOES NOT EXIST", getEndpointName(), m_name.c_str(),
                           providerName.c_str());
        return XCode::FAILURE;
    }
    CC_PropertyContainer own(ownProperties);
    if (own.getNumberOfProperties() != ownProperties.getNumberOfProperties()) // else memory is out
        return XCode::FAILURE;
    if (!createEvents().isOk() || !setInitialProperties(own, CC_PropertyCallLegState::CONNECTED).isOk() ||
        !createOwnCallLeg().isOk() || !startOwnCallLeg(own).isOk() || attempt.isOver())
        return XCode::FAILURE;
    CC_Call* const call = CallControl::ACQUIRE_CALL(contextName, datapathContext);
    if (call == nullptr)
        return XCode::NO_ELEMENT;
    CC_Call::Hold const keepCall(call);
    XCode const result = attempt.isOver() ? XCode::FAILURE
                                          : joinAndOffer(*provider, *call, contextName, providerName, destination,
                                                         offerProperties, callProperties);
    if (!result.isOk() && (attempt.isOver() || m_ownCallLeg->getCall() == nullptr))
        call->defer(); // nobody else would hand it back to its pool
    return result;
}

/// The second half of dialling: the new call gets its properties and the own leg, and goes to the provider.
XCode CC_CallAdapter::joinAndOffer(CC_Provider& provider, CC_Call& call, String const& contextName,
                                   String const& providerName, String const& destination,
                                   CC_PropertyContainer const& offerProperties,
                                   CC_PropertyContainer const& callProperties)
{
    Attempt const attempt(*this);
    CC_Call::Hold const keepCall(&call);
    if (!joinNewCall(call, callProperties).isOk() || attempt.isOver() || keepCall.isReleased())
        return XCode::FAILURE;
    if (RTD::Monitor const* const monitor = CC_Monitor::FOR(RTD::LEVEL_FLOW))
        monitor->debug("[EP %s/%s] Dial to provider %s (%s) using call %s", getEndpointName(), m_name.c_str(),
                       providerName.c_str(), destination.c_str(), call.getName().c_str());
    if (CallControl::GET_PROVIDER(contextName, providerName) != &provider)
        return XCode::FAILURE; // taken out by somebody who was told of the call
    return offerToProvider(provider, call, providerName, destination, offerProperties);
}

/// Gives a new call its properties and the own leg.
XCode CC_CallAdapter::joinNewCall(CC_Call& call, CC_PropertyContainer const& properties)
{
    Attempt const attempt(*this);
    CC_PropertyContainer filtered;
    CC_PropertyContainer const* const written = filterInput(properties, filtered);
    if (written == nullptr || !call.setProperties(*written).isOk() || attempt.isOver())
        return XCode::FAILURE;
    return call.addCallLeg(*m_ownCallLeg);
}

XCode CC_CallAdapter::offerToProvider(CC_Provider& provider, CC_Call& call, String const& providerName,
                                      String const& destination, CC_PropertyContainer const& properties)
{
    CC_PropertyContainer filtered;
    CC_PropertyContainer const* const offered = filterInput(properties, filtered);
    if (offered == nullptr || !provider.dial(call, providerName, destination, *offered).isOk())
        return XCode::FAILURE;
    return XCode::OK;
}

XCode CC_CallAdapter::accept(CC_Call& call, CC_PropertyContainer const& ownProperties)
{
    if (!isReady())
        return XCode::REFUSED;
    Attempt const attempt(*this);
    CC_Call::Hold const keepCall(&call);
    XCode result = XCode::FAILURE;
    try
    {
        result = tryAccept(call, ownProperties);
    }
    catch (std::bad_alloc const&)
    {
        result = XCode::FAILURE;
    }
    if (!result.isOk() && !attempt.isOver())
        dropOwnCallLeg(QCause::NETWORK_OUT_OF_ORDER, 0);
    return result;
}

XCode CC_CallAdapter::tryAccept(CC_Call& call, CC_PropertyContainer const& ownProperties)
{
    Attempt const attempt(*this);
    if (!createEvents().isOk())
        return XCode::FAILURE;
    if (RTD::Monitor const* const monitor = CC_Monitor::FOR(RTD::LEVEL_FLOW))
        monitor->debug("[EP %s/%s] Accept call %s", getEndpointName(), m_name.c_str(), call.getName().c_str());
    CC_PropertyContainer own(ownProperties);
    bool const isComplete = own.getNumberOfProperties() == ownProperties.getNumberOfProperties(); // else memory is out
    if (!createOwnCallLeg().isOk() || !isComplete ||
        !setInitialProperties(own, CC_PropertyCallLegState::TRYING).isOk() || !startOwnCallLeg(own).isOk() ||
        attempt.isOver())
        return XCode::FAILURE;
    return call.addCallLeg(*m_ownCallLeg).isOk() ? XCode::OK : XCode::FAILURE;
}

XCode CC_CallAdapter::createEvents()
{
    TYEventLoop* const loop = CallControl::GET_CC_EVENT_LOOP();
    TY_ASSERT(loop != nullptr, "a call before CallControl::SET_CC_EVENT_LOOP");
    if (loop == nullptr)
        return XCode::FAILURE;
    m_peerChangeEvent = new (std::nothrow) Event(*loop, EventPrio::HIGH, *this);
    m_secondEvent = new (std::nothrow) Event(*loop, EventPrio::HIGHEST, *this);
    return m_peerChangeEvent != nullptr && m_secondEvent != nullptr ? XCode::OK : XCode::FAILURE;
}

/// The calling side counts as connected from the start, the called side begins with TRYING.
XCode CC_CallAdapter::setInitialProperties(CC_PropertyContainer& properties, int state)
{
    auto const value = static_cast<CC_PropertyCallLegState::State>(state);
    if (!properties.set(CC_PropertyCallLegState(CC_PropertyId::STATE, value)).isOk() ||
        !properties.set(CC_PropertyCause(CC_PropertyId::CAUSE, QCause::NONE, 0)).isOk())
        return XCode::FAILURE;
    return XCode::OK;
}

XCode CC_CallAdapter::createOwnCallLeg()
{
    String const name = makeCallLegName();
    m_ownCallLeg = new (std::nothrow) CC_CallLeg;
    return m_ownCallLeg != nullptr ? m_ownCallLeg->setName(name) : XCode::FAILURE;
}

/// Completes the properties by what the caller has left out, writes them to the new leg and observes it.
XCode CC_CallAdapter::startOwnCallLeg(CC_PropertyContainer& properties)
{
    if (properties.get(CC_PropertyId::NETWORK) == nullptr &&
        !properties.set(CC_PropertyString(CC_PropertyId::NETWORK, m_endpoint->getNetwork())).isOk())
        return XCode::FAILURE;
    auto const id = static_cast<std::uint32_t>(reinterpret_cast<std::uintptr_t>(m_ownCallLeg));
    if (properties.get(CC_PropertyId::CALL_LEG_ID) == nullptr &&
        !properties.set(CC_PropertyUnsigned(CC_PropertyId::CALL_LEG_ID, id)).isOk())
        return XCode::FAILURE;
    if (!writeFirstProperties(properties).isOk() || !m_ownCallLeg->addCallLegObserver(this).isOk())
        return XCode::FAILURE;
    m_observesOwnCallLeg = true;
    return XCode::OK;
}

/// As `setOwnProperties`. Without filters nobody needs the properties afterwards nor hears of the new leg's, so our
/// view takes them instead of copies (3 % of a call's instructions).
XCode CC_CallAdapter::writeFirstProperties(CC_PropertyContainer& properties)
{
    if (getInputFilters() != nullptr)
        return setOwnProperties(properties);
    if (!m_ownCallLeg->setProperties(properties).isOk())
        return XCode::FAILURE;
    m_ownView.take(properties);
    return XCode::OK;
}
