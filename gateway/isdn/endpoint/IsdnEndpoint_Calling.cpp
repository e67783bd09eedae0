// The calling side: the SETUP was received, the peer leg says how it is answered.
#include "isdn/element/IsdnProgress.h"
#include "isdn/element/IsdnProperty.h"
#include "isdn/element/IsdnRedirection.h"
#include "isdn/element/IsdnSubaddress.h"
#include "isdn/endpoint/IsdnEndpoint_Ask.h"
#include "media/tone/CauseTone.h"
#include "properties/CC_Cause.h"
#include "properties/CC_PropertyKeys.h"

#include <spdlog/spdlog.h>

#include <algorithm>

using namespace IsdnProperty;

namespace
{
constexpr int CHANNEL_MASK = 0xff;
constexpr int ANY_CHANNEL = 0xff;
constexpr int NO_CHANNEL = 0;
constexpr char END_OF_NUMBER = '#';
} // namespace

void IsdnEndpoint::receiveSetup(pri_event_ring& ring)
{
    m_isCalling = true;
    m_interface.know(ring.call, *this);
    m_call = ring.call;
    advance(IsdnCallState::SETUP_IN);
    if (!m_interface.getConfiguration().channels.any() || !takeRequestedChannel(ring.channel, ring.flexible != 0))
    {
        bool const isAny = (ring.channel & CHANNEL_MASK) == ANY_CHANNEL || ring.flexible != 0;
        clear(isAny ? QCause::NO_CIRCUIT_CHANNEL_AVAILABLE : QCause::REQUESTED_CIRCUIT_CHANNEL_NOT_AVAILABLE);
        return;
    }
    bool const isComplete = ring.complete != 0 || !m_interface.getConfiguration().isOverlapReceiving;
    handle(
        [&]
        {
            readSetup(ring);
            dialIfComplete(isComplete);
        });
}

/// The one that the far side prefers, or another if that is not free and it does not insist (Q.931, 5.1.2, 5.2.3.1).
bool IsdnEndpoint::takeRequestedChannel(int channel, bool isFlexible)
{
    IsdnChannels& channels = m_interface.getChannels();
    auto const requested = static_cast<unsigned int>(channel & CHANNEL_MASK);
    bool const isAny = requested == ANY_CHANNEL || channel < 0;
    m_channelFlags = isAny ? 0 : channel & ~CHANNEL_MASK;
    if (!isAny && requested == NO_CHANNEL)
        return false; // a waiting call, of which this line has none
    bool const isTaken =
        !isAny && (channels.take(requested) || (m_interface.yieldChannel(requested) && channels.take(requested)));
    m_timeslot = isTaken ? requested : isAny || isFlexible ? channels.take() : IsdnChannels::NONE;
    return m_timeslot != IsdnChannels::NONE;
}

void IsdnEndpoint::readSetup(pri_event_ring const& ring)
{
    m_bearer = IsdnBearer::OF(ring.ctype);
    m_called = IsdnParty::OF_CALLED(ring.callednum, ring.calledplan);
    if (m_called.number.empty()) // EN 300 122: the number may come as keypad digits
        m_called.number = ring.keypad_digits;
    if (std::string const subaddress = IsdnSubaddress::OF(ring.called_subaddress); !subaddress.empty())
        ADD_TEXT(m_offer, IsdnSubaddress::PROPERTY, subaddress);
    IsdnParty const calling = IsdnParty::OF(ring.calling).normalised(m_interface.getEnvironment().dialPlan);
    m_calling = calling.getText();
    calling.addTo(m_setup);
    IsdnProgress const progress = IsdnProgress::OF(ring.progressmask);
    ADD(m_setup, CC_PropertyBoolean(CC_PropertyId::ENDPOINT_IS_ISDN, progress.isIsdn));
    ADD(m_setup, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true)); // the channel is there from now on
    addCodecs(m_setup);
    readCommands(ring.subcmds, m_setup);
    readUserUser(ring.useruserinfo, m_setup);
}

void IsdnEndpoint::collect(std::string_view digits)
{
    std::size_t const end = digits.find(END_OF_NUMBER);
    m_called.number += digits.substr(0, end);
    if (m_called.number.size() > IsdnParty::LONGEST_NUMBER)
        clear(QCause::INVALID_NUMBER_FORMAT);
    else
        dialIfComplete(end != std::string_view::npos && m_interface.getConfiguration().collects);
}

/// The called number as far as its type alone tells; what was dialled with a prefix may be an emergency number, and the
/// routes' own to tell.
IsdnParty IsdnEndpoint::getDialled() const
{
    bool const isTyped = m_called.type != QTypeOfNumber::UNKNOWN;
    return isTyped ? m_called.normalised(m_interface.getEnvironment().dialPlan) : m_called;
}

/// Overlap receiving (Q.931, 5.1.3 and 5.2.4): what is not complete is collected, or dialled as soon as it has a route.
void IsdnEndpoint::dialIfComplete(bool isComplete)
{
    m_isNumberComplete = m_isNumberComplete || isComplete;
    bool const mayDial = m_isNumberComplete || !m_interface.getConfiguration().collects;
    if (mayDial)
        m_routes = m_interface.getEnvironment().findRoutes(m_interface.getConfiguration().name, getDialled().getText(),
                                                           m_calling, m_callNumber);
    if (!m_routes.isEmpty())
        dial(m_isNumberComplete);
    else if (!m_isNumberComplete)
        requestDigits();
    else
    {
        QCause const why = m_routes.getRefusal();
        spdlog::info("call {} {} refused: no route to '{}', cause {} ({})", m_callNumber, getName().view(),
                     m_called.getText(), static_cast<int>(why), CAUSE_SHORT_NAME(why));
        clear(m_called.number.empty() ? QCause::INVALID_NUMBER_FORMAT : why);
    }
}

void IsdnEndpoint::requestDigits()
{
    if (advance(IsdnCallState::SETUP_ACK_OUT) == IsdnCallState::GO_ON)
        ask([&](pri* stack) { return pri_setup_ack(stack, m_call, getChannel(), 0, 0); });
    m_timer.start(m_interface.getLink().getTimers().t302);
}

void IsdnEndpoint::dial(bool isComplete)
{
    m_timer.stop();
    m_isInCall = true;
    placeCall(nullptr);
    if (m_isInCall && isComplete && advance(IsdnCallState::PROCEEDING_OUT) == IsdnCallState::GO_ON)
        ask([&](pri* stack) { return pri_proceeding(stack, m_call, getChannel(), 0); });
    else if (m_isInCall && !isComplete)
        requestDigits();
    openMedia();
}

/// What cannot be placed is cleared.
void IsdnEndpoint::placeCall(MG_IContext* datapathContext)
{
    String name;
    name.format("%u", m_callNumber);
    XCode result = m_adapter.setup(name, *this, this);
    IsdnParty const called = m_routes.isNumberShaped() ? IsdnParty::OF_TEXT(m_routes.getNumber()) : getDialled();
    if (result.isOk())
        result = m_adapter.dial(
            {.contextName = m_interface.getEnvironment().contextName,
             .providerName = STRING(m_routes.getProvider()),
             .destination = STRING(called.getText()),
             .called = {.number = STRING(called.number), .typeOfNumber = called.type, .numberingPlan = called.plan},
             .sendingComplete = m_isNumberComplete,
             .informationTransferCapability = m_bearer.capability,
             .datapathContext = datapathContext,
             .extraOwnProperties = &m_setup,
             .extraOfferProperties = &m_offer});
    if (!result.isOk())
        clear(QCause::NETWORK_OUT_OF_ORDER);
}

/// Nobody was reached, and the wire has heard nothing of it: with a new leg in another call, but the same media.
bool IsdnEndpoint::tryNextRoute(QCause cause)
{
    bool const isUntold = m_state == IsdnCallState::INCOMING_PROCEEDING && !m_hasToldData;
    if (!m_isCalling || !isUntold || !m_routes.goOn(static_cast<unsigned int>(cause)))
        return false;
    spdlog::debug("call {} {} goes on to {} after cause {} ({})", m_callNumber, getName().view(),
                  m_routes.getProvider(), static_cast<int>(cause), CAUSE_SHORT_NAME(cause));
    TYPtr<MG_IContext> const media(m_adapter.getDatapathContext());
    m_hadPeer = false;
    m_adapter.drop(cause, 0);
    placeCall(media.get());
    return true;
}

/// The far side's user hears in the channel why his call fails before it is cleared: the stack sends no DISCONNECT that
/// leaves the channel to tones.
bool IsdnEndpoint::tellByTone(QCause cause)
{
    unsigned int const seconds = m_interface.getConfiguration().failureTone;
    MG_Tones::ECallProgressTone::Type const tone = CauseTone::OF(cause);
    if (!m_isCalling || seconds == 0 || m_media == nullptr || !m_bearer.isSpeech() ||
        tone == MG_Tones::ECallProgressTone::NONE || advance(IsdnCallState::PROGRESS_OUT) != IsdnCallState::GO_ON)
        return false;
    m_failure = cause;
    m_media->playTone(tone);
    if (!std::exchange(m_hasToldData, true))
        ask([&](pri* stack) { return pri_progress(stack, m_call, getChannel(), 1); });
    m_timer.start(seconds * 1000);
    return true;
}

/// Brings the SETUP's answers up to where the peer leg has come.
void IsdnEndpoint::followPeer()
{
    LegState::State const state = getPeerState();
    m_hadPeer = m_hadPeer || m_adapter.getPeer(Key::STATE);
    if (state >= LegState::HELD)
        tellConnected();
    else
        tellProgress(state);
}

void IsdnEndpoint::tellProgress(LegState::State state)
{
    bool const hasData = hasPeerData();
    bool const isNewData = hasData && !m_hasToldData;
    if (state == LegState::ALERTING && advance(IsdnCallState::ALERTING_OUT) == IsdnCallState::GO_ON)
    {
        m_timer.stop();
        bool const needsTone = m_interface.getConfiguration().isNetwork && !hasData && m_media != nullptr;
        if (needsTone)
            m_media->playTone(MG_Tones::ECallProgressTone::RINGING);
        m_hasToldData = m_hasToldData || hasData;
        sendUserUser();
        ask([&](pri* stack) { return pri_acknowledge(stack, m_call, getChannel(), hasData || needsTone); });
    }
    else if (state == LegState::PROCEEDING && advance(IsdnCallState::PROCEEDING_OUT) == IsdnCallState::GO_ON)
    {
        m_timer.stop();
        m_hasToldData = m_hasToldData || hasData;
        ask([&](pri* stack) { return pri_proceeding(stack, m_call, getChannel(), hasData); });
    }
    else if (isNewData && advance(IsdnCallState::PROGRESS_OUT) == IsdnCallState::GO_ON)
    {
        m_hasToldData = true;
        ask([&](pri* stack) { return pri_progress(stack, m_call, getChannel(), 1); });
    }
}

void IsdnEndpoint::tellConnected()
{
    if (advance(IsdnCallState::CONNECT_OUT) != IsdnCallState::GO_ON)
        return;
    m_timer.stop();
    if (m_media != nullptr)
        m_media->playTone(MG_Tones::ECallProgressTone::NONE);
    m_wasAnswered = true;
    ++m_interface.getEnvironment().counters.answered;
    pri_party_connected_line connected = {};
    m_toldParty = IsdnParty::OF_PEER(m_adapter);
    connected.id = m_toldParty.getId();
    bool const isIsdn = m_adapter.getPeer(Key::ENDPOINT_IS_ISDN, false);
    sendUserUser();
    ask(
        [&](pri* stack)
        {
            pri_connected_line_update(stack, m_call, &connected);
            return pri_answer(stack, m_call, getChannel(), !isIsdn);
        });
}
