#include "adapters/CC_CallAdapterE164.h"

#include "adapters/CC_CallAdapterE164_ValueOf.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyInformationTransferCapability.h"
#include "properties/CC_PropertyNumberingPlan.h"
#include "properties/CC_PropertyPresentationIndicator.h"
#include "properties/CC_PropertyScreeningIndicator.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyTypeOfNumber.h"
#include "properties/CC_PropertyUnsigned.h"
#include "services/CC_ServiceUserInput.h"
#include "services/CC_ServiceUserInputUpdate.h"

#include <new>
#include <tuple>

namespace
{
/// Stores them in their order, up to the first that is refused; whether none was.
template <class... Properties>
bool SET(CC_PropertyContainer& container, Properties const&... properties)
{
    return (container.set(properties).isOk() && ...);
}

bool SET_NUMBER(CC_PropertyContainer& container, String const& number, QTypeOfNumber type, QNumberingPlan plan)
{
    return SET(container, CC_PropertyString(CC_PropertyId::E164_NUMBER, number),
               CC_PropertyTypeOfNumber(CC_PropertyId::TYPE_OF_NUMBER, type),
               CC_PropertyNumberingPlan(CC_PropertyId::NUMBERING_PLAN, plan));
}

bool SET_INDICATORS(CC_PropertyContainer& container, QPresentationIndicator presentation, QScreeningIndicator screening)
{
    return SET(container, CC_PropertyPresentationIndicator(CC_PropertyId::PRESENTATION_INDICATOR, presentation),
               CC_PropertyScreeningIndicator(CC_PropertyId::SCREENING_INDICATOR, screening));
}

bool SET_NAME(CC_PropertyContainer& container, String const& name)
{
    return SET(container, CC_PropertyString(CC_PropertyId::NAME, name));
}

/// What the caller adds overrides; as much of it as memory allows.
void MERGE(CC_PropertyContainer& container, CC_PropertyContainer const* extra)
{
    if (extra != nullptr)
        std::ignore = container.set(*extra);
}

/// Copying a container tells nothing of what memory has refused.
bool COPY(CC_PropertyContainer& to, CC_PropertyContainer const& from)
{
    to = from;
    return to.getNumberOfProperties() == from.getNumberOfProperties();
}

XCode OK_OR_FAILURE(XCode result) { return result.isOk() ? XCode::OK : XCode::FAILURE; }

/// While the destination is in one of these states, digits belong to the number.
bool IS_COLLECTING(CC_PropertyCallLegState::State state)
{
    return state >= CC_PropertyCallLegState::TRYING && state <= CC_PropertyCallLegState::ALERTING;
}
} // namespace

CC_CallAdapterE164::CC_CallAdapterE164() = default;

CC_CallAdapterE164::~CC_CallAdapterE164()
{
    CC_CallAdapterE164::cleanup(); // who hears of the end may still call operations of this class
}

XCode CC_CallAdapterE164::setup(String const& name, CC_Endpoint& endpoint, CC_CallAdapterObserver* observer)
{
    return CC_CallAdapter::setup(name, endpoint, observer);
}

void CC_CallAdapterE164::cleanup() { CC_CallAdapter::cleanup(); }

XCode CC_CallAdapterE164::Dial::store(String const& newContextName, String const& newProviderName,
                                      String const& newDestination, CC_PropertyContainer const& newOwnProperties,
                                      CC_PropertyContainer const& newOfferProperties,
                                      CC_PropertyContainer const& newCallProperties, MG_IContext* newDatapathContext)
{
    try
    {
        contextName = newContextName;
        providerName = newProviderName;
        destination = newDestination;
    }
    catch (std::bad_alloc const&)
    {
        return forget();
    }
    datapathContext.set(newDatapathContext);
    bool const isWhole = COPY(ownProperties, newOwnProperties) && COPY(offerProperties, newOfferProperties) &&
                         COPY(callProperties, newCallProperties);
    return isWhole ? XCode::OK : forget();
}

/// Half of one dial and half of another would be a call to nobody knows where.
XCode CC_CallAdapterE164::Dial::forget()
{
    *this = Dial();
    return XCode::FAILURE;
}

XCode CC_CallAdapterE164::dial(String const& contextName, String const& providerName, String const& destination,
                               CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                               CC_PropertyContainer const& callProperties, MG_IContext* datapathContext)
{
    ++m_numberOfDials;
    if (!m_lastDial
             .store(contextName, providerName, destination, ownProperties, offerProperties, callProperties,
                    datapathContext)
             .isOk())
        return XCode::FAILURE;
    return CC_CallAdapter::dial(contextName, providerName, destination, ownProperties, offerProperties, callProperties,
                                datapathContext);
}

XCode CC_CallAdapterE164::accept(CC_Call& call, CC_PropertyContainer const& ownProperties)
{
    return CC_CallAdapter::accept(call, ownProperties);
}

XCode CC_CallAdapterE164::dial(String const& contextName, String const& providerName, String const& destination,
                               String const& callingNumber, QTypeOfNumber callingTypeOfNumber,
                               QNumberingPlan callingNumberingPlan, QPresentationIndicator callingPresentation,
                               QScreeningIndicator callingScreening, String const& callingName,
                               String const& calledNumber, QTypeOfNumber calledTypeOfNumber,
                               QNumberingPlan calledNumberingPlan, String const& calledName, bool sendingComplete,
                               QInformationTransferCapability informationTransferCapability,
                               MG_IContext* datapathContext, CC_PropertyContainer const* extraOwnProperties,
                               CC_PropertyContainer const* extraOfferProperties,
                               CC_PropertyContainer const* extraCallProperties)
{
    CC_PropertyContainer own;
    CC_PropertyContainer offer;
    CC_PropertyContainer call;
    try
    {
        bool const isSet = SET_NUMBER(own, callingNumber, callingTypeOfNumber, callingNumberingPlan) &&
                           SET_INDICATORS(own, callingPresentation, callingScreening) && SET_NAME(own, callingName) &&
                           SET(own, CC_PropertyBoolean(CC_PropertyId::SUPPORTS_OVERLAP_SENDING, !sendingComplete)) &&
                           SET_NUMBER(offer, calledNumber, calledTypeOfNumber, calledNumberingPlan) &&
                           SET_NAME(offer, calledName) &&
                           SET(call,
                               CC_PropertyInformationTransferCapability(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY,
                                                                        informationTransferCapability),
                               CC_PropertyUnsigned(CC_PropertyId::HOPS, CallControl::GET_MAX_HOPS(contextName)));
        if (!isSet)
            return XCode::FAILURE;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
    MERGE(own, extraOwnProperties);
    MERGE(offer, extraOfferProperties);
    MERGE(call, extraCallProperties);
    return OK_OR_FAILURE(dial(contextName, providerName, destination, own, offer, call, datapathContext));
}

XCode CC_CallAdapterE164::accept(CC_Call& call, String const& number, QTypeOfNumber typeOfNumber,
                                 QNumberingPlan numberingPlan, QPresentationIndicator presentation,
                                 QScreeningIndicator screening, String const& name)
{
    CC_PropertyContainer own;
    try
    {
        if (!SET_NUMBER(own, number, typeOfNumber, numberingPlan) || !SET_INDICATORS(own, presentation, screening) ||
            !SET_NAME(own, name))
            return XCode::FAILURE;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
    return OK_OR_FAILURE(accept(call, own));
}

void CC_CallAdapterE164::invokeSynchronousService(CC_Service& service)
{
    bool const isInput = service.isOfType(CC_ServiceUserInput::TYPE());
    bool const isUpdate = service.isOfType(CC_ServiceUserInputUpdate::TYPE());
    auto const peerState = VALUE_OF<CC_PropertyCallLegState, &CC_PropertyCallLegState::getState>(
        getPeerProperty(CC_PropertyId::STATE), CC_PropertyCallLegState::RELEASED);
    if ((!isInput && !isUpdate) || !IS_COLLECTING(peerState))
        CC_CallAdapter::invokeSynchronousService(service);
    else if (isInput && !collect(static_cast<CC_ServiceUserInput const&>(service).getInput()).isOk())
        return; // a digit that the remembered number lacks must not reach the peer either
    else if (peerState != CC_PropertyCallLegState::ADDRESS_INCOMPLETE || getPeerSupportsOverlapReceiving())
        CC_CallAdapter::invokeSynchronousService(service);
    else if (isInput)
        redial();
}

/// Appends the digits to the called number that is remembered.
XCode CC_CallAdapterE164::collect(String const& digits)
{
    CC_PropertyContainer& offer = m_lastDial.offerProperties;
    try
    {
        String const& collected = VALUE_OF<CC_PropertyString>(offer.get(CC_PropertyId::E164_NUMBER), String::s_empty);
        return offer.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, collected + digits));
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

/// Clears the attempt and dials again, with all digits so far.
void CC_CallAdapterE164::redial()
{
    if (!m_lastDial.datapathContext)
        m_lastDial.datapathContext.set(getDatapathContext());
    Dial again; // a copy: the dial stores over what is remembered, and a module may dial elsewhere meanwhile
    if (!again
             .store(m_lastDial.contextName, m_lastDial.providerName, m_lastDial.destination, m_lastDial.ownProperties,
                    m_lastDial.offerProperties, m_lastDial.callProperties, m_lastDial.datapathContext.get())
             .isOk())
        return; // better the present attempt than none: the next digit tries again
    TYLifeline::Watch const self(getLifeline());
    auto const isOver = [this, &self, number = m_numberOfDials]
    { return !self.isAlive() || !isReady() || m_numberOfDials != number; };

    drop(QCause::NORMAL_CALL_CLEARING, 0);
    if (isOver())
        return;
    CC_Flags changed;
    if (!again.datapathContext && changed.set(CC_PropertyId::CONTEXT, true).isOk())
    {
        notifyPeerPropertyChange(changed); // not to the observer: intended, the adapter's own class reacts to this one
        if (isOver())
            return;
    }
    // a destination that refuses the longer number leaves the adapter idle, as after any dial
    std::ignore = dial(again.contextName, again.providerName, again.destination, again.ownProperties,
                       again.offerProperties, again.callProperties, again.datapathContext.get());
}
