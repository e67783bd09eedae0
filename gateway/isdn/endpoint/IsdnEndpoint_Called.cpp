// The called side: the call was offered, the SETUP is sent, its answers become states of the leg.
#include "isdn/element/IsdnProgress.h"
#include "isdn/element/IsdnProperty.h"
#include "isdn/element/IsdnRedirection.h"
#include "isdn/element/IsdnSubaddress.h"
#include "isdn/element/IsdnUserUser.h"
#include "isdn/endpoint/IsdnEndpoint_Ask.h"
#include "properties/CC_PropertyKeys.h"

#include <memory>
#include <tuple>

using namespace IsdnProperty;

namespace
{
constexpr int CHANNEL_MASK = 0xff;
} // namespace

XCode IsdnEndpoint::handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    try
    {
        return acceptOffer(call, name, properties);
    }
    catch (std::bad_alloc const&)
    {
        if (!m_isInCall)
            return XCode::FAILURE;
        clear(QCause::RESOURCE_UNAVAILABLE);
        return XCode::OK;
    }
}

XCode IsdnEndpoint::acceptOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties)
{
    m_called = IsdnParty::OF_OFFER(properties);
    if (m_called.number.empty())
        m_called.number = name.view();
    if (XCode const bound = m_adapter.setup(name, *this, this); !bound.isOk())
        return bound;
    CC_CallAdapterE164::Party const party{.number = STRING(m_called.number),
                                          .typeOfNumber = m_called.type,
                                          .numberingPlan = m_called.plan,
                                          .name = STRING(m_called.name)};
    if (XCode const accepted = m_adapter.acceptAs(call, party); !accepted.isOk())
        return accepted;
    m_isInCall = true;
    m_hadPeer = true;
    bool const isComplete = !m_adapter.getPeerSupportsOverlapSending();
    m_bearer = {m_adapter.getInformationTransferCapability()};
    m_own.clear();
    addCodecs(m_own);
    if (!m_own.isEmpty())
        std::ignore = m_adapter.setOwnProperties(m_own);
    if (m_interface.getEnvironment().isBlocked(m_interface.getConfiguration().name))
        clear(QCause::TEMPORARY_FAILURE);
    else if (!m_interface.getLink().isUp())
        clear(QCause::NETWORK_OUT_OF_ORDER);
    else if (m_timeslot = m_interface.getChannels().take(); m_timeslot == IsdnChannels::NONE)
        clear(QCause::NO_CIRCUIT_CHANNEL_AVAILABLE);
    else if (isComplete || m_interface.getConfiguration().isOverlapSending)
        sendSetup(isComplete);
    else
    {
        std::ignore = m_adapter.setOwnSupportsOverlapReceiving(false);
        std::ignore = m_adapter.setOwn(Key::STATE, LegState::ADDRESS_INCOMPLETE);
        m_timer.start(m_interface.getLink().getTimers().t302); // then the number is taken as it is
    }
    return XCode::OK;
}

void IsdnEndpoint::sendSetup(bool isComplete)
{
    std::unique_ptr<pri_sr, void (*)(pri_sr*)> const request(pri_sr_new(), pri_sr_free);
    m_call = ask([](pri* stack) { return pri_new_call(stack); });
    if (request == nullptr || m_call == nullptr || !startCall(request.get(), isComplete))
        clear(QCause::TEMPORARY_FAILURE);
    else
        m_timer.start(m_interface.getLink().getTimers().answer);
}

bool IsdnEndpoint::startCall(pri_sr* request, bool isComplete)
{
    m_interface.know(m_call, *this);
    bool const isIsdn = m_adapter.getPeer(Key::ENDPOINT_IS_ISDN, false);
    std::string digits = m_called.getDigits();
    if (digits.empty() && !m_called.number.empty())
        return false; // such as a name, which no line can call
    pri_sr_set_channel(request, static_cast<int>(m_timeslot), 0, !isIsdn);
    pri_sr_set_bearer(request, m_bearer.getCapability(), m_bearer.getLayer1());
    pri_sr_set_called(request, digits.data(), m_called.getPlan(), isComplete);
    m_toldParty = IsdnParty::OF_PEER(m_adapter);
    pri_party_id const caller = m_toldParty.getId();
    pri_sr_set_caller_party(request, &caller);
    if (pri_party_subaddress const called = IsdnSubaddress::TO_WIRE(m_called.subaddress); called.valid != 0)
        pri_sr_set_called_subaddress(request, &called);
    if (IsdnRedirection const redirection = IsdnRedirection::OF_PEER(m_adapter); redirection.count > 0)
    {
        pri_party_redirecting const redirecting = redirection.getRedirecting();
        pri_sr_set_redirecting_parties(request, &redirecting);
    }
    m_userUser = IsdnUserUser::TO_WIRE(m_adapter.getPeerUserToUser());
    if (!m_userUser.empty())
        pri_sr_set_useruser(request, m_userUser.c_str());
    m_isNumberComplete = isComplete;
    advance(IsdnCallState::SETUP_OUT);
    return ask([&](pri* stack) { return pri_setup(stack, m_call, request); }) == 0;
}

void IsdnEndpoint::followWire(pri_event& event)
{
    switch (event.e)
    {
    case PRI_EVENT_SETUP_ACK:
        if (advance(IsdnCallState::SETUP_ACK_IN) != IsdnCallState::DIAL_ON)
            break;
        takeChannel(event.setup_ack.channel);
        tellPeer(LegState::ADDRESS_INCOMPLETE, event.setup_ack.progressmask, event.setup_ack.subcmds, nullptr);
        dialOn();
        break;
    case PRI_EVENT_PROCEEDING:
        if (advance(IsdnCallState::PROCEEDING_IN) != IsdnCallState::GO_ON)
            break;
        takeChannel(event.proceeding.channel);
        tellPeer(LegState::PROCEEDING, event.proceeding.progressmask, event.proceeding.subcmds, nullptr);
        m_timer.start(m_interface.getLink().getTimers().answer);
        break;
    case PRI_EVENT_PROGRESS:
        if (advance(IsdnCallState::PROGRESS_IN) == IsdnCallState::GO_ON)
            tellPeer(m_state == IsdnCallState::CALL_DELIVERED ? LegState::ALERTING : LegState::PROCEEDING,
                     event.proceeding.progressmask, event.proceeding.subcmds, nullptr);
        break;
    case PRI_EVENT_RINGING:
        if (advance(IsdnCallState::ALERTING_IN) != IsdnCallState::GO_ON)
            break;
        takeChannel(event.ringing.channel);
        tellPeer(LegState::ALERTING, event.ringing.progressmask, event.ringing.subcmds, event.ringing.useruserinfo);
        m_timer.start(m_interface.getLink().getTimers().answer);
        break;
    case PRI_EVENT_ANSWER:
        if (advance(IsdnCallState::CONNECT_IN) != IsdnCallState::GO_ON)
            break;
        m_timer.stop();
        takeChannel(event.answer.channel);
        m_wasAnswered = true;
        tellPeer(LegState::CONNECTED, event.answer.progressmask, event.answer.subcmds, event.answer.useruserinfo);
        break;
    default:
        break;
    }
}

/// The far side's first answer says which channel it is (Q.931, 5.1.2).
void IsdnEndpoint::takeChannel(int channel)
{
    auto const timeslot = static_cast<unsigned int>(channel & CHANNEL_MASK);
    m_isChannelConfirmed = true;
    bool const isNews = channel > 0 && IsdnLine::IS_B_CHANNEL(timeslot) && timeslot != m_timeslot;
    if (!isNews)
        return;
    IsdnChannels& channels = m_interface.getChannels();
    channels.giveBack(m_timeslot);
    m_timeslot = channels.take(timeslot) ? timeslot : IsdnChannels::NONE;
    if (m_timeslot == IsdnChannels::NONE)
        clear(QCause::CHANNEL_UNACCEPTABLE);
}

bool IsdnEndpoint::yieldChannel()
{
    bool const mayYield = !m_isCalling && !m_isChannelConfirmed && !m_interface.getConfiguration().isNetwork;
    if (mayYield)
        m_interface.getChannels().giveBack(std::exchange(m_timeslot, IsdnChannels::NONE));
    return mayYield;
}

void IsdnEndpoint::tellPeer(LegState::State state, int progressMask, pri_subcommands const* commands,
                            char const* userUser)
{
    if (!m_isInCall)
        return;
    openMedia();
    IsdnProgress const progress = IsdnProgress::OF(progressMask);
    m_own.clear();
    readCommands(commands, m_own);
    if (userUser != nullptr)
        readUserUser(userUser, m_own);
    if (progress.isInBand || state == LegState::CONNECTED)
        ADD(m_own, CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
    ADD(m_own, CC_PropertyBoolean(CC_PropertyId::ENDPOINT_IS_ISDN, progress.isIsdn));
    ADD(m_own, CC_PropertyCallLegState(CC_PropertyId::STATE, state));
    if (!m_adapter.setOwnProperties(m_own).isOk() && state == LegState::CONNECTED)
        clear(QCause::RESOURCE_UNAVAILABLE); // nobody would ever hear of the answer
}

/// Sends the digits that have come since the SETUP, and waits for what the far side makes of them: T304.
void IsdnEndpoint::dialOn()
{
    for (char const digit : std::exchange(m_digits, {}))
        ask([&](pri* stack) { return pri_information(stack, m_call, digit); });
    if (m_state == IsdnCallState::OVERLAP_SENDING)
        m_timer.start(m_interface.getLink().getTimers().t304);
}
