// Dialling by number, and the re-dial that bridges overlap sending.
//
// A dial is remembered whole or not at all, as a record that nobody changes while a dial uses it: the digits that are
// collected meanwhile go into a copy. So whoever is told of a dial may destroy the adapter or dial elsewhere.
#include "adapters/CC_CallAdapterE164.h"

#include "adapters/CC_CallAdapterE164_ValueOf.h"
#include "callcontrol/CallControl.h"
#include "platform/base/TYCounted.h"
#include "platform/base/TYRecycled.h"
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

/// Properties of a container that is new, made where they stay: storing copies costs 2 % of a call's instructions.
class CC_CallAdapterE164::NewProperties
{
public:
    /// REQUIRES: the container is empty.
    explicit NewProperties(CC_PropertyContainer& container) : m_container(container) {}

    /// No id twice. Throws std::bad_alloc when memory for the value is out.
    template <class Property, class... Values>
    [[gnu::noinline]] void add(unsigned int id, Values const&... values)
    {
        m_areAllThere = m_container.append<Property>(id, values...) && m_areAllThere;
    }
    void addNumber(String const& number, QTypeOfNumber type, QNumberingPlan plan)
    {
        add<CC_PropertyString>(CC_PropertyId::E164_NUMBER, number);
        add<CC_PropertyTypeOfNumber>(CC_PropertyId::TYPE_OF_NUMBER, type);
        add<CC_PropertyNumberingPlan>(CC_PropertyId::NUMBERING_PLAN, plan);
    }
    void addIndicators(QPresentationIndicator presentation, QScreeningIndicator screening)
    {
        add<CC_PropertyPresentationIndicator>(CC_PropertyId::PRESENTATION_INDICATOR, presentation);
        add<CC_PropertyScreeningIndicator>(CC_PropertyId::SCREENING_INDICATOR, screening);
    }
    void addName(String const& name) { add<CC_PropertyString>(CC_PropertyId::NAME, name); }
    /// Otherwise memory is out.
    bool areAllThere() const { return m_areAllThere; }

private:
    CC_PropertyContainer& m_container;
    bool m_areAllThere = true;
};

namespace
{
/// What the caller adds overrides; as much of it as memory allows.
void MERGE(CC_PropertyContainer& container, CC_PropertyContainer const* extra)
{
    if (extra != nullptr)
        std::ignore = container.set(*extra);
}

/// Copying a container tells nothing of what memory has refused.
bool IS_WHOLE(CC_PropertyContainer const& copy, CC_PropertyContainer const& original)
{
    return copy.getNumberOfProperties() == original.getNumberOfProperties();
}

XCode OK_OR_FAILURE(XCode result) { return result.isOk() ? XCode::OK : XCode::FAILURE; }

/// While the destination is in one of these states, digits belong to the number.
bool IS_COLLECTING(CC_PropertyCallLegState::State state)
{
    return state >= CC_PropertyCallLegState::TRYING && state <= CC_PropertyCallLegState::ALERTING;
}
} // namespace

/// All arguments of a dial. Counted: a dial that uses them goes on, and does not see them change, when the adapter ends
/// or dials elsewhere meanwhile.
struct CC_CallAdapterE164::LastDial : TYCounted, TYRecycled
{
    /// Throws std::bad_alloc when memory is out.
    LastDial(String const& theContextName, String const& theProviderName, String const& theDestination,
             MG_IContext* theDatapathContext)
        : contextName(theContextName)
        , providerName(theProviderName)
        , destination(theDestination)
        , datapathContext(theDatapathContext)
    {
    }

    /// Whether the arguments are these very objects.
    bool isMadeOf(String const& aContextName, String const& aProviderName, String const& aDestination,
                  CC_PropertyContainer const& own, CC_PropertyContainer const& offer, CC_PropertyContainer const& call,
                  MG_IContext const* aDatapathContext) const
    {
        return &aContextName == &contextName && &aProviderName == &providerName && &aDestination == &destination &&
               &own == &ownProperties && &offer == &offerProperties && &call == &callProperties &&
               aDatapathContext == datapathContext.get();
    }
    /// Whether memory sufficed.
    bool copy(CC_PropertyContainer const& own, CC_PropertyContainer const& offer, CC_PropertyContainer const& call)
    {
        ownProperties = own;
        offerProperties = offer;
        callProperties = call;
        return IS_WHOLE(ownProperties, own) && IS_WHOLE(offerProperties, offer) && IS_WHOLE(callProperties, call);
    }

    String contextName;
    String providerName;
    String destination;
    TYPtr<MG_IContext> datapathContext;
    CC_PropertyContainer ownProperties;
    CC_PropertyContainer offerProperties;
    CC_PropertyContainer callProperties;
};

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

/// Half of one dial and half of another would be a call to nobody knows where.
XCode CC_CallAdapterE164::forgetLastDial()
{
    m_lastDial.set(nullptr);
    return XCode::FAILURE;
}

XCode CC_CallAdapterE164::dial(String const& contextName, String const& providerName, String const& destination,
                               CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                               CC_PropertyContainer const& callProperties, MG_IContext* datapathContext)
{
    TYLifeline::Watch const self(getLifeline());
    TYPtr<LastDial> last = m_lastDial;
    if (!last || !last->isMadeOf(contextName, providerName, destination, ownProperties, offerProperties, callProperties,
                                 datapathContext))
    {
        try
        {
            last = TYPtr<LastDial>(new LastDial(contextName, providerName, destination, datapathContext));
        }
        catch (std::bad_alloc const&)
        {
            return forgetLastDial();
        }
        bool const isWhole = last->copy(ownProperties, offerProperties, callProperties);
        if (!self.isAlive()) // a property's clone is a module's code
            return XCode::FAILURE;
        if (!isWhole)
            return forgetLastDial();
        m_lastDial = last;
        if (!self.isAlive()) // what the dial before has held is others' code, too, when it ends
            return XCode::FAILURE;
    }
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
    TYLifeline::Watch const self(getLifeline());
    TYPtr<LastDial> last;
    try
    {
        last = TYPtr<LastDial>(new LastDial(contextName, providerName, destination, datapathContext));
        NewProperties own(last->ownProperties);
        own.addNumber(callingNumber, callingTypeOfNumber, callingNumberingPlan);
        own.addIndicators(callingPresentation, callingScreening);
        own.addName(callingName);
        own.add<CC_PropertyBoolean>(CC_PropertyId::SUPPORTS_OVERLAP_SENDING, !sendingComplete);
        NewProperties offer(last->offerProperties);
        offer.addNumber(calledNumber, calledTypeOfNumber, calledNumberingPlan);
        offer.addName(calledName);
        NewProperties call(last->callProperties);
        call.add<CC_PropertyInformationTransferCapability>(CC_PropertyId::INFORMATION_TRANSFER_CAPABILITY,
                                                           informationTransferCapability);
        call.add<CC_PropertyUnsigned>(CC_PropertyId::HOPS, CallControl::GET_MAX_HOPS(contextName));
        if (!own.areAllThere() || !offer.areAllThere() || !call.areAllThere())
            return forgetLastDial();
    }
    catch (std::bad_alloc const&)
    {
        return forgetLastDial();
    }
    MERGE(last->ownProperties, extraOwnProperties);
    MERGE(last->offerProperties, extraOfferProperties);
    MERGE(last->callProperties, extraCallProperties);
    if (!self.isAlive()) // an extra property's clone is a module's code
        return XCode::FAILURE;
    m_lastDial = last;
    if (!self.isAlive()) // nor the end of what the dial before has held
        return XCode::FAILURE;
    return OK_OR_FAILURE(dial(last->contextName, last->providerName, last->destination, last->ownProperties,
                              last->offerProperties, last->callProperties, last->datapathContext.get()));
}

XCode CC_CallAdapterE164::dial(DialForm const& form)
{
    Party const& calling = form.calling;
    Party const& called = form.called;
    return dial(form.contextName, form.providerName, form.destination, calling.number, calling.typeOfNumber,
                calling.numberingPlan, calling.presentation, calling.screening, calling.name, called.number,
                called.typeOfNumber, called.numberingPlan, called.name, form.sendingComplete,
                form.informationTransferCapability, form.datapathContext, form.extraOwnProperties,
                form.extraOfferProperties, form.extraCallProperties);
}

XCode CC_CallAdapterE164::acceptAs(CC_Call& call, Party const& answering)
{
    return accept(call, answering.number, answering.typeOfNumber, answering.numberingPlan, answering.presentation,
                  answering.screening, answering.name);
}

XCode CC_CallAdapterE164::accept(CC_Call& call, String const& number, QTypeOfNumber typeOfNumber,
                                 QNumberingPlan numberingPlan, QPresentationIndicator presentation,
                                 QScreeningIndicator screening, String const& name)
{
    CC_PropertyContainer own;
    try
    {
        NewProperties properties(own);
        properties.addNumber(number, typeOfNumber, numberingPlan);
        properties.addIndicators(presentation, screening);
        properties.addName(name);
        if (!properties.areAllThere())
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

/// The last dial, made if there is none, and a copy while a dial that uses it is under way; null when memory is out.
TYPtr<CC_CallAdapterE164::LastDial> CC_CallAdapterE164::lastDialToChange()
{
    if (m_lastDial && !m_lastDial->isShared())
        return m_lastDial;
    String const& none = String::s_empty;
    TYPtr<LastDial> changed(m_lastDial ? new LastDial(m_lastDial->contextName, m_lastDial->providerName,
                                                      m_lastDial->destination, m_lastDial->datapathContext.get())
                                       : new LastDial(none, none, none, nullptr));
    if (m_lastDial &&
        !changed->copy(m_lastDial->ownProperties, m_lastDial->offerProperties, m_lastDial->callProperties))
        return TYPtr<LastDial>();
    m_lastDial = changed;
    return changed;
}

/// Appends the digits to the called number that is remembered.
XCode CC_CallAdapterE164::collect(String const& digits)
{
    try
    {
        TYPtr<LastDial> const last = lastDialToChange();
        if (!last)
            return XCode::FAILURE;
        CC_PropertyContainer& offer = last->offerProperties;
        String const& collected = VALUE_OF<CC_PropertyString>(offer.get(CC_PropertyId::E164_NUMBER), String::s_empty);
        return offer.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, collected + digits));
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

/// Clears the attempt and dials again, with all digits so far, those that come while it ends included. A module that
/// has dialled elsewhere meanwhile has that dial made again, or refused.
void CC_CallAdapterE164::redial()
{
    TYLifeline::Watch const self(getLifeline());
    if (!m_lastDial->datapathContext)
        m_lastDial->datapathContext.set(getDatapathContext());
    drop(QCause::NORMAL_CALL_CLEARING, 0);
    if (!self.isAlive() || getEndpoint() == nullptr)
        return; // destroyed or cleaned up: nobody is to be told any more
    CC_Flags changed;
    if (m_lastDial && !m_lastDial->datapathContext && changed.set(CC_PropertyId::CONTEXT, true).isOk())
    {
        notifyPeerPropertyChange(changed); // not to the observer: intended, the adapter's own class reacts to this one
        if (!self.isAlive())
            return;
    }
    // what the dial comes to shows in the leg and the peer; a destination that refuses the longer number leaves us idle
    if (TYPtr<LastDial> const last = m_lastDial; last)
        std::ignore = dial(last->contextName, last->providerName, last->destination, last->ownProperties,
                           last->offerProperties, last->callProperties, last->datapathContext.get());
}
