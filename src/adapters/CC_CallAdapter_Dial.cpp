// How the own leg begins: dial and accept.
//
// Nearly every step calls out: the endpoint's name and network, filters, the media layer, whoever hears of the new call
// and leg, the log, the destination. Any of them may drop or destroy this adapter, begin another attempt with it, or
// release the call. So after each step an `Attempt` is asked whether this is still ours; when it is not, nothing is
// touched any more, not even to say why. The new call is held until we return, and deferred if it got no leg.
#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "adapters/CC_CallAdapter_Log.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "platform/base/Assert.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "recorder/CC_FilterNotes.h"
#include "recorder/CC_RecordWriter.h"

#include <cstdint>
#include <new>
#include <tuple>

namespace
{
using Kind = CC_RecordFormat::Kind;

constexpr char const* NO_MEMORY = "out of memory";
constexpr char const* LEG_TAKES_NOT_ALL = "the own leg takes not all properties";
constexpr char const* CALL_TAKES_NO_LEG = "the call takes no leg";

void RECORD_DIAL(CC_RecordWriter& recorder, CC_Call const& call, CC_CallLeg const& leg, String const& providerName,
                 String const& destination)
{
    constexpr std::size_t MOST = CC_RecordFormat::LARGEST_TEXT / 2;
    char* place = recorder.begin(Kind::DIALLING, call.getSerial(), leg.getSerial(), 0);
    place = CC_RecordWriter::APPEND(place, providerName.view().substr(0, MOST));
    *place++ = ' ';
    recorder.end(CC_RecordWriter::APPEND(place, destination.view().substr(0, MOST)));
}

/// Copying tells nothing of what memory has refused.
XCode WHOLE(CC_PropertyContainer const& copy, CC_PropertyContainer const& original)
{
    return copy.getNumberOfProperties() == original.getNumberOfProperties() ? XCode::OK : XCode::FAILURE;
}
} // namespace

bool CC_CallAdapter::isReady() const
{
    return m_endpoint != nullptr && !m_isResetting && m_ownCallLeg == nullptr && m_peerChangeEvent == nullptr &&
           m_secondEvent == nullptr;
}

XCode CC_CallAdapter::dial(String const& contextName, String const& providerName, String const& destination,
                           CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                           CC_PropertyContainer const& callProperties, MG_IContext* datapathContext)
{
    Attempt const attempt(*this, "Dial");
    if (!isReady())
        return attempt.fail(whyNotReady(), XCode::REFUSED);
    XCode result = XCode::FAILURE;
    try
    {
        result = tryDial(contextName, providerName, destination, ownProperties, offerProperties, callProperties,
                         datapathContext);
    }
    catch (std::bad_alloc const&)
    {
        result = attempt.fail(NO_MEMORY);
    }
    attempt.record(Kind::DIALLED, result);
    if (!result.isOk() && result != XCode::REFUSED && !attempt.isOver())
        dropOwnCallLeg(QCause::NETWORK_OUT_OF_ORDER, 0);
    return result;
}

/// REFUSED: the leg, if there is one, is not of this attempt.
XCode CC_CallAdapter::tryDial(String const& contextName, String const& providerName, String const& destination,
                              CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                              CC_PropertyContainer const& callProperties, MG_IContext* datapathContext)
{
    Attempt const attempt(*this, "Dial");
    CC_PropertyFilterContainer const* const filters = getInputFilters(); // those of now, whatever is set meanwhile
    CC_Provider* const provider = CallControl::GET_PROVIDER(contextName, providerName);
    if (provider == nullptr)
    {
        if (Log const log(*this, RTD::LEVEL_FAILURE); log.isWanted())
            log->debug("[EP %s/%s] DESTINATION PROVIDER '%s' DOES NOT EXIST", log.getEndpointName(), m_name.c_str(),
                       providerName.c_str());
        return XCode::FAILURE;
    }
    CC_PropertyContainer own(ownProperties);
    if (!attempt.survives(WHOLE(own, ownProperties), NO_MEMORY))
        return XCode::FAILURE;
    if (!isReady()) // a property's clone has begun an attempt of its own
        return attempt.fail(whyNotReady(), XCode::REFUSED);
    if (!attempt.survives(createEvents(), NO_MEMORY) ||
        !attempt.survives(setInitialProperties(own, CC_PropertyCallLegState::CONNECTED), NO_MEMORY) ||
        !attempt.survives(createOwnCallLeg(), NO_MEMORY) || !attempt.survives(startOwnCallLeg(own), LEG_TAKES_NOT_ALL))
        return XCode::FAILURE;
    CC_Call* const call = CallControl::ACQUIRE_CALL(contextName, datapathContext);
    if (call == nullptr)
        return attempt.fail("no call could be had", XCode::NO_ELEMENT);
    CC_Call::Hold const keepCall(call);
    XCode const result = attempt.isOver() ? XCode::FAILURE
                                          : joinAndOffer(*provider, *call, contextName, providerName, destination,
                                                         offerProperties, callProperties, filters);
    if (!result.isOk() && (attempt.isOver() || m_ownCallLeg->getCall() == nullptr))
        call->defer(); // nobody else would hand it back to its pool
    return result;
}

/// The second half of dialling: the new call gets its properties and the own leg, and goes to the provider.
XCode CC_CallAdapter::joinAndOffer(CC_Provider& provider, CC_Call& call, String const& contextName,
                                   String const& providerName, String const& destination,
                                   CC_PropertyContainer const& offerProperties,
                                   CC_PropertyContainer const& callProperties,
                                   CC_PropertyFilterContainer const* filters)
{
    Attempt const attempt(*this, "Dial");
    CC_Call::Hold const keepCall(&call);
    auto const isOver = [&] { return attempt.isOver() || keepCall.isReleased(); };
    XCode const joined = joinNewCall(call, callProperties, filters);
    if (!joined.isOk() || isOver())
        return XCode::FAILURE;
    if (Log const log(*this, RTD::LEVEL_FLOW); log.isWanted())
        log->debug("[EP %s/%s] Dial to provider %s (%s) using call %s", log.getEndpointName(), m_name.c_str(),
                   providerName.c_str(), destination.c_str(), call.getName().c_str());
    if (CC_RecordWriter* const recorder = CC_RecordWriter::ON(); recorder != nullptr && !isOver())
        RECORD_DIAL(*recorder, call, *m_ownCallLeg, providerName, destination);
    CC_PropertyContainer filtered;
    CC_PropertyContainer const* const offered = FILTER_INPUT(filters, offerProperties, filtered);
    if (isOver())
        return XCode::FAILURE;
    if (offered == nullptr)
        return attempt.fail("the input filters refuse the offer's properties");
    if (CallControl::GET_PROVIDER(contextName, providerName) != &provider)
        return attempt.fail("somebody who was told meanwhile has taken the provider out");
    return provider.dial(call, providerName, destination, *offered).isOk() ? XCode::OK
                                                                           : attempt.fail("the provider refuses");
}

/// Gives a new call its properties and the own leg.
XCode CC_CallAdapter::joinNewCall(CC_Call& call, CC_PropertyContainer const& properties,
                                  CC_PropertyFilterContainer const* filters)
{
    Attempt const attempt(*this, "Dial");
    CC_FilterNotes notes;
    CC_Writing const writing(CC_RecordFormat::Writer::CALL, *m_ownCallLeg);
    CC_Writing const throughFilters(notes);
    CC_PropertyContainer filtered;
    CC_PropertyContainer const* const written = FILTER_INPUT(filters, properties, filtered);
    if (written == nullptr)
        return attempt.fail("the input filters refuse the call's properties");
    if (attempt.isOver() || !attempt.survives(call.setProperties(*written), "the call takes not all properties") ||
        !attempt.survives(call.addCallLeg(*m_ownCallLeg), CALL_TAKES_NO_LEG))
        return XCode::FAILURE;
    return XCode::OK;
}

XCode CC_CallAdapter::accept(CC_Call& call, CC_PropertyContainer const& ownProperties)
{
    Attempt const attempt(*this, "Accept");
    if (!isReady())
        return attempt.fail(whyNotReady(), XCode::REFUSED);
    CC_Call::Hold const keepCall(&call);
    XCode result = XCode::FAILURE;
    try
    {
        result = tryAccept(call, ownProperties);
    }
    catch (std::bad_alloc const&)
    {
        result = attempt.fail(NO_MEMORY);
    }
    attempt.record(Kind::ACCEPTED, result);
    if (!result.isOk() && !attempt.isOver())
        dropOwnCallLeg(QCause::NETWORK_OUT_OF_ORDER, 0);
    return result;
}

XCode CC_CallAdapter::tryAccept(CC_Call& call, CC_PropertyContainer const& ownProperties)
{
    Attempt const attempt(*this, "Accept");
    if (!attempt.survives(createEvents(), NO_MEMORY))
        return XCode::FAILURE;
    if (Log const log(*this, RTD::LEVEL_FLOW); log.isWanted())
        log->debug("[EP %s/%s] Accept call %s", log.getEndpointName(), m_name.c_str(), call.getName().c_str());
    CC_PropertyContainer own(ownProperties);
    XCode const isWhole = WHOLE(own, ownProperties);
    if (attempt.isOver() || !attempt.survives(createOwnCallLeg(), NO_MEMORY) || !attempt.survives(isWhole, NO_MEMORY) ||
        !attempt.survives(setInitialProperties(own, CC_PropertyCallLegState::TRYING), NO_MEMORY) ||
        !attempt.survives(startOwnCallLeg(own), LEG_TAKES_NOT_ALL) ||
        !attempt.survives(call.addCallLeg(*m_ownCallLeg), CALL_TAKES_NO_LEG))
        return XCode::FAILURE;
    return XCode::OK;
}

char const* CC_CallAdapter::whyNotReady() const
{
    return m_endpoint == nullptr ? "the adapter is not set up"
           : m_isResetting       ? "the adapter is being set up or cleaned up"
                                 : "the adapter has a leg or what is left of one";
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
    Attempt const attempt(*this);
    String const name = makeCallLegName();
    if (attempt.isOver())
        return XCode::FAILURE;
    m_ownCallLeg = new (std::nothrow) CC_CallLeg;
    return m_ownCallLeg != nullptr ? m_ownCallLeg->setName(name) : XCode::FAILURE;
}

/// Completes the properties by what the caller has left out, writes them to the new leg and observes it.
XCode CC_CallAdapter::startOwnCallLeg(CC_PropertyContainer& properties)
{
    Attempt const attempt(*this);
    if (properties.find(CC_PropertyId::NETWORK) == nullptr &&
        !properties.append<CC_PropertyString>(CC_PropertyId::NETWORK, m_endpoint->getNetwork()))
        return XCode::FAILURE;
    if (attempt.isOver())
        return XCode::FAILURE;
    auto const id = static_cast<std::uint32_t>(reinterpret_cast<std::uintptr_t>(m_ownCallLeg));
    if (properties.find(CC_PropertyId::CALL_LEG_ID) == nullptr &&
        !properties.append<CC_PropertyUnsigned>(CC_PropertyId::CALL_LEG_ID, id))
        return XCode::FAILURE;
    XCode const written = writeFirstProperties(properties);
    if (!written.isOk() || attempt.isOver() || !m_ownCallLeg->addCallLegObserver(this).isOk())
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
    Attempt const attempt(*this);
    CC_Writing const writing(CC_RecordFormat::Writer::OWN, *m_ownCallLeg);
    XCode const written = m_ownCallLeg->setProperties(properties);
    if (!written.isOk() || attempt.isOver())
        return XCode::FAILURE;
    if (!m_ownView.getProperties().isEmpty())
        return m_ownView.write(properties); // somebody was called who has written to it before us
    m_ownView.take(properties);
    return XCode::OK;
}
