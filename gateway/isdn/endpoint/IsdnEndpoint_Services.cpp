// What goes both ways beside the call itself: digits, charges, notifications, texts.
#include "isdn/element/IsdnCause.h"
#include "isdn/element/IsdnCharge.h"
#include "isdn/element/IsdnProperty.h"
#include "isdn/element/IsdnRedirection.h"
#include "isdn/element/IsdnText.h"
#include "isdn/element/IsdnUserUser.h"
#include "isdn/endpoint/IsdnEndpoint_Ask.h"
#include "media/context/CallMedia.h"
#include "media/rtp/ChannelTermination.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyKeys.h"
#include "services/CC_ServiceUserInput.h"

#include <tuple>

using namespace IsdnProperty;

namespace
{
constexpr std::string_view DIGITS = "0123456789*#ABCD";
constexpr unsigned int DIGIT_TIME = 100;       // milliseconds
constexpr unsigned int CHARGE_PATIENCE = 1000; // milliseconds that a RELEASE waits for what the call has cost

std::string DIGITS_OF(std::string_view text)
{
    std::string digits(text);
    std::erase_if(digits, [](char c) { return DIGITS.find(c) == std::string_view::npos; });
    return digits;
}
} // namespace

void IsdnEndpoint::onTimer()
{
    if (m_failure != QCause::NONE)
    {
        clear(m_failure);
        return;
    }
    switch (m_state)
    {
    case IsdnCallState::OVERLAP_RECEIVING: // T302
        if (!m_isInCall)
            dialIfComplete(true);
        else
            endNumber();
        break;
    case IsdnCallState::NULL_STATE: // T302: no further digit has come from the other side
        std::ignore = m_adapter.setOwn(Key::STATE, LegState::TRYING);
        sendSetup(true);
        break;
    case IsdnCallState::OVERLAP_SENDING: // T304
        clear(QCause::RECOVERY_ON_TIMER_EXPIRY);
        break;
    case IsdnCallState::CLEARING:
        if (m_heldRelease != QCause::NONE)
        {
            leaveCall(m_heldRelease);
            break;
        }
        lookForEnd();
        if (m_state == IsdnCallState::OVER)
            leaveCall(getPeerCause());
        break;
    default:
        clear(m_state == IsdnCallState::CALL_DELIVERED ? QCause::NO_ANSWER_FROM_USER : QCause::NO_USER_RESPONDING);
    }
}

/// No further digit comes: who waits for the whole number has it now, whoever wants more gets none.
void IsdnEndpoint::endNumber()
{
    m_isNumberComplete = true;
    std::ignore = m_adapter.setOwnSupportsOverlapSending(false);
    if (getPeerState() == LegState::ADDRESS_INCOMPLETE && m_adapter.getPeerSupportsOverlapReceiving())
        clear(QCause::INVALID_NUMBER_FORMAT);
}

void IsdnEndpoint::readCommands(pri_subcommands const* commands, CC_PropertyContainer& own)
{
    DialPlan const& plan = m_interface.getEnvironment().dialPlan;
    for (int i = 0; commands != nullptr && i < commands->counter_subcmd; ++i)
    {
        pri_subcommand const& command = commands->subcmd[i];
        switch (command.cmd)
        {
        case PRI_SUBCMD_REDIRECTING:
            if (m_isCalling)
                IsdnRedirection::OF(command.u.redirecting).normalised(plan).addTo(own);
            break;
        case PRI_SUBCMD_CONNECTED_LINE:
            IsdnParty::OF(command.u.connected_line.id).normalised(plan).addTo(own);
            break;
        case PRI_SUBCMD_AOC_S:
            ADD(own, CC_PropertyTariff(CC_PropertyId::TARIFF, IsdnCharge::OF_S(command.u.aoc_s)));
            break;
        case PRI_SUBCMD_AOC_D:
            ADD(own, CC_PropertyCharge(CC_PropertyId::CHARGE, IsdnCharge::OF_D(command.u.aoc_d)));
            break;
        case PRI_SUBCMD_AOC_E:
            ADD(own, CC_PropertyCharge(CC_PropertyId::CHARGE, IsdnCharge::OF_E(command.u.aoc_e)));
            break;
        case PRI_SUBCMD_DISPLAY_TEXT:
            ADD_TEXT(own, CC_PropertyId::DISPLAY, IsdnText::FROM_WIRE(command.u.display.text));
            break;
        default:
            break;
        }
    }
}

void IsdnEndpoint::readUserUser(char const* text, CC_PropertyContainer& own)
{
    if (*text != '\0')
        ADD(own, CC_PropertyParametrizedString(CC_PropertyId::USER_TO_USER_INFORMATION, IsdnUserUser::FROM_WIRE(text)));
}

/// The next message takes it along, unless an earlier one has; without memory it goes without.
void IsdnEndpoint::sendUserUser()
try
{
    std::string text = IsdnUserUser::TO_WIRE(m_adapter.getPeerUserToUser());
    if (text == m_userUser)
        return;
    m_userUser = std::move(text);
    pri_call_set_useruser(m_call, m_userUser.c_str());
}
catch (std::bad_alloc const&)
{
}

/// EN 300 141-1, 7: the far side's user holds.
void IsdnEndpoint::onNotify(int indicator)
{
    if (m_state != IsdnCallState::ACTIVE || !m_isInCall)
        return;
    if (indicator == PRI_NOTIFY_REMOTE_HOLD || indicator == PRI_NOTIFY_USER_SUSPENDED)
        std::ignore = m_adapter.setOwn(Key::STATE, LegState::HELD);
    else if (indicator == PRI_NOTIFY_REMOTE_RETRIEVAL || indicator == PRI_NOTIFY_USER_RESUMED)
        std::ignore = m_adapter.setOwn(Key::STATE, LegState::CONNECTED);
}

/// EN 300 141-1, 9: the channel is free for another call of the far side's until its user takes this one back.
void IsdnEndpoint::onHold()
{
    if (m_state != IsdnCallState::ACTIVE || !m_isInCall || m_isOnHold)
    {
        ask([&](pri* stack) { return pri_hold_rej(stack, m_call, PRI_CAUSE_WRONG_CALL_STATE); });
        return;
    }
    m_isOnHold = true;
    m_media.reset();
    m_interface.getChannels().giveBack(std::exchange(m_timeslot, IsdnChannels::NONE));
    ask([&](pri* stack) { return pri_hold_ack(stack, m_call); });
    std::ignore = m_adapter.setOwn(Key::STATE, LegState::HELD);
}

bool IsdnEndpoint::joinCallOf(IsdnEndpoint& other)
{
    bool const areUp = m_isInCall && other.m_isInCall && m_state == IsdnCallState::ACTIVE;
    return areUp && m_adapter.transfer(other.m_adapter, true).isOk();
}

void IsdnEndpoint::onRetrieve(pri_event_retrieve const& retrieve)
{
    bool const isWaiting = m_isOnHold && m_state == IsdnCallState::ACTIVE && m_isInCall;
    if (!isWaiting || !takeRequestedChannel(retrieve.channel, retrieve.flexible != 0))
    {
        QCause const cause =
            isWaiting ? QCause::NO_CIRCUIT_CHANNEL_AVAILABLE : QCause::MESSAGE_NOT_COMPATIBLE_WITH_CALL_STATE;
        ask([&](pri* stack) { return pri_retrieve_rej(stack, m_call, IsdnCause::TO_WIRE(cause)); });
        return;
    }
    m_isOnHold = false;
    ask([&](pri* stack) { return pri_retrieve_ack(stack, m_call, getChannel()); });
    std::ignore = m_adapter.setOwn(Key::STATE, LegState::CONNECTED);
    openMedia();
}

void IsdnEndpoint::tellHold()
{
    bool const isHeld = getPeerState() == LegState::HELD;
    if (m_state != IsdnCallState::ACTIVE || std::exchange(m_isPeerHeld, isHeld) == isHeld)
        return;
    ask([&](pri* stack)
        { return pri_notify(stack, m_call, 0, isHeld ? PRI_NOTIFY_REMOTE_HOLD : PRI_NOTIFY_REMOTE_RETRIEVAL); });
}

/// EN 300 369-1: somebody else has the call now (EctInform).
void IsdnEndpoint::tellTransfer()
{
    IsdnParty party = IsdnParty::OF_PEER(m_adapter);
    if (m_state != IsdnCallState::ACTIVE || party.getDigits().empty() || party == m_toldParty)
        return;
    m_toldParty = std::move(party);
    pri_party_connected_line connected = {};
    connected.id = m_toldParty.getId();
    ask([&](pri* stack) { return pri_connected_line_update(stack, m_call, &connected); });
}

void IsdnEndpoint::onDigits(char const* digits)
{
    std::string const keyed = DIGITS_OF(digits);
    switch (advance(IsdnCallState::DIGITS_IN))
    {
    case IsdnCallState::COLLECT:
        if (!m_isInCall)
        {
            collect(keyed);
            break;
        }
        m_called.number += keyed; // for another route
        m_timer.start(m_interface.getLink().getTimers().t302);
        if (getPeerState() == LegState::ADDRESS_INCOMPLETE && !m_adapter.getPeerSupportsOverlapReceiving())
            m_hadPeer = false; // the adapter dials anew, and the new peer is not there at once
        [[fallthrough]];
    case IsdnCallState::GO_ON:
        if (m_isInCall && !keyed.empty())
        {
            CC_ServiceUserInput input(STRING(keyed));
            m_adapter.invokeSynchronousService(input);
        }
        break;
    default:
        break;
    }
}

void IsdnEndpoint::onUserInput(CC_ServiceUserInput const& input)
{
    std::string digits = DIGITS_OF(input.getInput().view());
    bool const isOfNumber = m_state == IsdnCallState::CALL_INITIATED || m_state == IsdnCallState::OVERLAP_SENDING;
    if (digits.empty())
        return;
    if (isOfNumber && !m_isNumberComplete)
        m_digits += digits;
    if (m_state == IsdnCallState::OVERLAP_SENDING)
        dialOn();
    else if (m_state == IsdnCallState::ACTIVE && m_media != nullptr &&
             m_interface.getConfiguration().digits == IsdnConfiguration::Digits::SOUND)
        for (char const digit : digits)
            m_media->sendDigit(digit, input.getDuration() != 0 ? input.getDuration() : DIGIT_TIME);
    else if (m_state == IsdnCallState::ACTIVE)
        ask([&](pri* stack) { return pri_keypad_facility(stack, m_call, digits.c_str()); });
}

/// Only a network tells what a call costs.
void IsdnEndpoint::tellCharge(CC_Flags const& flags)
{
    bool const isNetwork = m_interface.getConfiguration().isNetwork;
    bool const hasCall = m_call != nullptr && m_state > IsdnCallState::CALL_INITIATED;
    if (!isNetwork || !hasCall || (m_state == IsdnCallState::CLEARING && m_heldRelease == QCause::NONE))
        return;
    auto const* const tariff = m_adapter.getPeerTariff();
    if (flags.get(CC_PropertyId::TARIFF) && tariff != nullptr)
    {
        pri_subcmd_aoc_s const advice = IsdnCharge::TO_S(*tariff);
        ask([&](pri* stack) { return pri_aoc_s_send(stack, m_call, &advice); });
    }
    auto const* const charge = m_adapter.getPeerCharge();
    if (!flags.get(CC_PropertyId::CHARGE) || charge == nullptr)
        return;
    if (IsdnCharge::IS_TOTAL(*charge))
    {
        pri_subcmd_aoc_e const advice = IsdnCharge::TO_E(*charge);
        ask([&](pri* stack) { return pri_aoc_e_send(stack, m_call, &advice); });
        return;
    }
    pri_subcmd_aoc_d const advice = IsdnCharge::TO_D(*charge);
    ask([&](pri* stack) { return pri_aoc_d_send(stack, m_call, &advice); });
}

/// The far side hangs up, and what the call has cost in all is to come: from a peer that has told of costs before.
bool IsdnEndpoint::awaitsFinalCharge() const
{
    auto const* const charge = m_adapter.getPeerCharge();
    bool const isTotal = charge != nullptr && IsdnCharge::IS_TOTAL(*charge);
    return m_interface.getConfiguration().isNetwork && m_isInCall && !isPeerReleased() && !isTotal &&
           (charge != nullptr || m_adapter.getPeerTariff() != nullptr);
}

/// Until the other side has cleared, or for a while, our leg stays in the call, and says that it only waits.
void IsdnEndpoint::holdRelease(QCause cause)
{
    m_own.clear();
    ADD(m_own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, false));
    ADD(m_own, CC_PropertyCause(CC_PropertyId::CAUSE, cause, 0));
    ADD(m_own, CC_PropertyCallLegState(CC_PropertyId::STATE, LegState::DISCONNECTING));
    m_timer.start(CHARGE_PATIENCE);
    std::ignore = m_adapter.setOwnProperties(m_own); // without memory the other side hears of it when we leave
}

void IsdnEndpoint::sendHeldRelease()
{
    QCause const cause = std::exchange(m_heldRelease, QCause::NONE);
    if (cause == QCause::NONE || m_call == nullptr)
        return;
    ask([&](pri* stack) { return pri_hangup(stack, m_call, IsdnCause::TO_WIRE(cause)); });
    lookForEnd();
}

// --- media -----------------------------------------------------------------------------------------------------------

/// A line speaks A-law (G.711) and nothing else, or carries bits (RFC 4040).
void IsdnEndpoint::addCodecs(CC_PropertyContainer& own) const
{
    if (!m_interface.getEnvironment().relaysMedia)
        return;
    VoipCodec const codec(m_bearer.isSpeech() ? MG_Rtp::ECodec::PCMA : MG_Rtp::ECodec::CLEARMODE, 20);
    VoipCodecListSet supported;
    std::ignore = supported.getList(VoipCodecListSet::SEND_RECEIVE).append(codec);
    ADD(own, CC_PropertyCodecs(CC_PropertyId::SUPPORTED_CODECS, supported));
    ADD(own, CC_PropertyCodec(CC_PropertyId::CURRENT_CODEC, VoipCodecAndMode(codec, VoipCodecAndMode::SEND_RECEIVE)));
    ADD(own, CC_PropertyCodecNegotiating(CC_PropertyId::CODEC_NEGOTIATING, CC_PropertyCodecNegotiating::NOT_CAPABLE));
}

/// The B channel becomes a termination of the call's media, or follows it into another call.
void IsdnEndpoint::openMedia()
{
    CallMedia* const call = m_isInCall && m_interface.getEnvironment().relaysMedia
                                ? CallMedia::OF(m_adapter.getDatapathContext())
                                : nullptr;
    if (call == nullptr || m_timeslot == IsdnChannels::NONE)
        return;
    if (m_media == nullptr || m_mediaTimeslot != m_timeslot)
    {
        m_mediaTimeslot = m_timeslot;
        m_media = call->addChannel(m_interface.getLink().getLine().openChannel(m_timeslot).release(), *this,
                                   CallMedia::PART_OF(m_adapter));
        if (m_media != nullptr && !m_bearer.isSpeech())
            m_media->describe(ChannelTermination::DESCRIPTION(MG_Rtp::ECodec::CLEARMODE));
        else if (m_media != nullptr && m_interface.getConfiguration().digits == IsdnConfiguration::Digits::SOUND)
            m_media->detectDigits(true);
    }
    else if (&m_media->getCall() != call)
        m_media->moveTo(*call);
}

void IsdnEndpoint::onDigit(char digit, unsigned int milliseconds)
{
    handle(
        [&]
        {
            CC_ServiceUserInput input(STRING(std::string_view(&digit, 1)), milliseconds);
            m_adapter.invokeSynchronousService(input);
        });
}
