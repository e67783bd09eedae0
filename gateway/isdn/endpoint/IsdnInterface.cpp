#include "isdn/endpoint/IsdnInterface.h"

#include "callcontrol/CallControl.h"
#include "isdn/element/IsdnCause.h"
#include "isdn/endpoint/IsdnEndpoint.h"
#include "platform/eventloop/TYEvent.h"

#include <spdlog/spdlog.h>

#include <new>
#include <tuple>
#include <utility>

namespace
{
constexpr int CHANNEL_MASK = 0xff;
constexpr int ALL_CHANNELS = -1;

/// The call that an event is about; null for one that is about none.
q931_call* CALL_OF(pri_event const& event)
{
    switch (event.e)
    {
    case PRI_EVENT_RING:
    case PRI_EVENT_INFO_RECEIVED:
        return event.ring.call;
    case PRI_EVENT_HANGUP:
    case PRI_EVENT_HANGUP_REQ:
    case PRI_EVENT_HANGUP_ACK:
        return event.hangup.call;
    case PRI_EVENT_RINGING:
        return event.ringing.call;
    case PRI_EVENT_ANSWER:
        return event.answer.call;
    case PRI_EVENT_FACILITY:
        return event.facility.call;
    case PRI_EVENT_PROCEEDING:
    case PRI_EVENT_PROGRESS:
        return event.proceeding.call;
    case PRI_EVENT_SETUP_ACK:
        return event.setup_ack.call;
    case PRI_EVENT_NOTIFY:
        return event.notify.call;
    case PRI_EVENT_KEYPAD_DIGIT:
        return event.digit.call;
    case PRI_EVENT_HOLD:
        return event.hold.call;
    case PRI_EVENT_RETRIEVE:
        return event.retrieve.call;
    default:
        return nullptr;
    }
}
} // namespace

IsdnInterface::IsdnInterface(IsdnEnvironment& environment, IsdnConfiguration const& configuration, IsdnLine& line)
    : CC_Provider(configuration.name.c_str(), "isdn")
    , m_environment(environment)
    , m_configuration(configuration)
    , m_name(configuration.name.c_str())
    , m_channels(configuration.channels, configuration.isNetwork)
    , m_link(line,
             {configuration.isNetwork, configuration.isOverlapReceiving || configuration.isOverlapSending,
              configuration.timers},
             *CallControl::GET_CC_EVENT_LOOP(), environment.watch, *this)
{
    m_cleanUpEvent = new TYEvent(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::LOW, CLEAN_UP, this);
}

IsdnInterface::~IsdnInterface()
{
    m_endpoints.clear();
    m_cleanUpEvent->destroy();
}

XCode IsdnInterface::dial(CC_Call& call, String const&, String const& destination,
                          CC_PropertyContainer const& offerProperties)
{
    try
    {
        IsdnEndpoint& endpoint = makeEndpoint(0);
        XCode const result = endpoint.offer(call, destination, offerProperties);
        if (!result.isOk())
            finish(endpoint);
        return result;
    }
    catch (std::bad_alloc const&)
    {
        return XCode::FAILURE;
    }
}

InfoContainer& IsdnInterface::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                      unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    String text;
    text.format("%s, %s side of %s, link %s, %u channels free, %zu endpoints", m_name.c_str(),
                m_configuration.isNetwork ? "network" : "user", m_configuration.line.c_str(),
                m_link.isUp() ? "up" : "down", m_channels.getNumberOfFree(), m_endpoints.size());
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "ISDN Interface", text);
    return info;
}

void IsdnInterface::know(q931_call* call, IsdnEndpoint& endpoint)
{
    IsdnEndpoint* const before = std::exchange(m_calls[call], &endpoint);
    if (before != nullptr)
        before->loseCall();
}

void IsdnInterface::onLinkChange(bool isUp)
{
    spdlog::log(isUp ? spdlog::level::info : spdlog::level::warn, "interface {}: the link is {}", m_configuration.name,
                isUp ? "up" : "down");
}

void IsdnInterface::onLinkEvent(pri_event& event)
{
    if (event.e == PRI_EVENT_RESTART)
    {
        onRestart(event.restart.channel);
        return;
    }
    if (event.e == PRI_EVENT_FACILITY)
        onFacility(event.facility);
    q931_call* const call = CALL_OF(event);
    auto const found = m_calls.find(call);
    if (event.e == PRI_EVENT_RING)
        onRing(event.ring);
    else if (found != m_calls.end())
        found->second->onEvent(event);
    else if (event.e == PRI_EVENT_HANGUP || event.e == PRI_EVENT_HANGUP_REQ)
        refuse(call, IsdnCause::FROM_WIRE(event.hangup.cause)); // we know nothing of it any more
}

void IsdnInterface::onRing(pri_event_ring& ring)
{
    unsigned int const callNumber = m_environment.beginCall(m_configuration.name);
    if (callNumber == 0)
    {
        refuseNew(ring, QCause::SWITCHING_EQUIPMENT_CONGESTION);
        return;
    }
    IsdnEndpoint* endpoint = nullptr;
    try
    {
        endpoint = &makeEndpoint(callNumber);
        endpoint->receiveSetup(ring);
    }
    catch (std::bad_alloc const&)
    {
        ++m_environment.counters.failed;
        if (endpoint != nullptr)
            finish(*endpoint);
        refuseNew(ring, QCause::RESOURCE_UNAVAILABLE);
    }
}

/// The stack clears no call that it has not answered.
void IsdnInterface::refuseNew(pri_event_ring const& ring, QCause cause)
{
    q931_call* const call = ring.call;
    m_link.ask([&](pri* stack) { return pri_proceeding(stack, call, ring.channel, 0); });
    refuse(call, cause);
}

void IsdnInterface::refuse(q931_call* call, QCause cause)
{
    m_link.ask([&](pri* stack) { return pri_hangup(stack, call, IsdnCause::TO_WIRE(cause)); });
}

/// Explicit call transfer (EN 300 369-1): the far side's user has two calls, one of them on hold, and connects the two
/// others. Both calls are cleared then.
void IsdnInterface::onFacility(pri_event_facility const& facility)
{
    for (int i = 0; facility.subcmds != nullptr && i < facility.subcmds->counter_subcmd; ++i)
    {
        pri_subcommand const& command = facility.subcmds->subcmd[i];
        if (command.cmd != PRI_SUBCMD_TRANSFER_CALL)
            continue;
        pri_subcmd_transfer const transfer = command.u.transfer;
        q931_call* const asked = facility.subcall;
        bool const isJoined = join(transfer.call_1, transfer.call_2);
        m_link.ask([&](pri* stack) { return pri_transfer_rsp(stack, asked, transfer.invoke_id, isJoined); });
        for (q931_call* const call : {transfer.call_1, transfer.call_2})
            if (auto const found = m_calls.find(call); isJoined && found != m_calls.end())
                found->second->clear(QCause::NORMAL_CALL_CLEARING);
        return; // the stack's event is another one by now
    }
}

bool IsdnInterface::join(q931_call* one, q931_call* other)
{
    auto const first = m_calls.find(one);
    auto const second = m_calls.find(other);
    return first != m_calls.end() && second != m_calls.end() && first != second &&
           first->second->joinCallOf(*second->second);
}

/// The stack acknowledges it (Q.931, 5.5.2).
void IsdnInterface::onRestart(int channel)
{
    auto const timeslot = static_cast<unsigned int>(channel & CHANNEL_MASK);
    for (auto const& [endpoint, owned] : m_endpoints)
        if (channel == ALL_CHANNELS || endpoint->getTimeslot() == timeslot)
            endpoint->clear(QCause::TEMPORARY_FAILURE);
}

bool IsdnInterface::yieldChannel(unsigned int timeslot)
{
    for (auto const& [endpoint, owned] : m_endpoints)
        if (endpoint->getTimeslot() == timeslot)
            return endpoint->yieldChannel();
    return false;
}

void IsdnInterface::clearCalls(QCause cause)
{
    for (auto const& [endpoint, owned] : m_endpoints)
        endpoint->clear(cause);
}

bool IsdnInterface::clearCall(unsigned long long serial, QCause cause)
{
    bool isHere = false;
    for (auto const& [endpoint, owned] : m_endpoints)
        if (endpoint->isInCall(serial))
        {
            endpoint->clear(cause);
            isHere = true;
        }
    return isHere;
}

IsdnEndpoint& IsdnInterface::makeEndpoint(unsigned int callNumber)
{
    if (m_finished.capacity() <= m_endpoints.size()) // so that an end needs no memory
        m_finished.reserve(2 * (m_endpoints.size() + 1));
    auto owner = std::make_unique<IsdnEndpoint>(*this, callNumber);
    IsdnEndpoint& endpoint = *owner;
    m_endpoints[&endpoint] = std::move(owner);
    return endpoint;
}

void IsdnInterface::finish(IsdnEndpoint& endpoint)
{
    m_finished.push_back(&endpoint);
    std::ignore = m_cleanUpEvent->setIfNotPending(); // refused only once it is destroyed, with the interface
}

void IsdnInterface::CLEAN_UP(void* interface) { static_cast<IsdnInterface*>(interface)->cleanUp(); }

void IsdnInterface::cleanUp()
{
    for (std::size_t i = 0; i < m_finished.size(); ++i) // ending one may finish another
        m_endpoints.erase(m_finished[i]);
    m_finished.clear();
    if (m_environment.onEndpointGone)
        m_environment.onEndpointGone();
}

void IsdnInterface::onLinkQuiet()
{
    if (m_endpoints.empty() && m_environment.onEndpointGone)
        m_environment.onEndpointGone();
}
