#include "sip/access/SipPeers.h"

#include "callcontrol/CallControl.h"
#include "sip/message/SipAddress.h"

#include <sofia-sip/su_uniqueid.h>
#include <spdlog/spdlog.h>

#include <algorithm>
#include <new>
#include <utility>

namespace
{
constexpr unsigned long LONGEST_PAUSE = 60; // seconds

bool IS_PAST(TY::Time const& time)
{
    TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
    return now.seconds > time.seconds || (now.seconds == time.seconds && now.nanoseconds >= time.nanoseconds);
}
} // namespace

SipPeers::SipPeers(SipConfiguration const& configuration, nta_agent_t* agent, SipSender& sender)
    : m_configuration(configuration)
    , m_sender(sender)
    , m_timer(*CallControl::GET_CC_EVENT_LOOP(), EventPrio::NORMAL, ON_TIMER, this)
{
    for (SipPeer const& peer : configuration.getPeers())
        m_peers.push_back(Peer{peer});
    if (configuration.probe == 0 || m_peers.empty())
        return;
    SocketAddress const self = configuration.getAddress(configuration.way);
    std::string const from = SipAddress::MAKE_NAME_ADDR({}, SipAddress::MAKE_URI("gateway", self, SipWay::UDP));
    m_leg.reset(nta_leg_tcreate(agent, nullptr, nullptr, SIPTAG_FROM_STR(from.c_str()), SIPTAG_TO_STR(from.c_str()),
                                TAG_END()));
    if (m_leg == nullptr || nta_leg_tag(m_leg.get(), nullptr) == nullptr)
        throw std::bad_alloc();
}

SipPeers::~SipPeers() { endProbing(); }

// --- whom a call goes to ---------------------------------------------------------------------------------------------

bool SipPeers::takesCalls(Peer const& peer) const
{
    return peer.isUp && (peer.busyUntil.seconds == 0 || IS_PAST(peer.busyUntil));
}

char const* SipPeers::getStateName(std::size_t peer) const
{
    if (takesCalls(m_peers[peer]))
        return "up";
    return m_peers[peer].isUp ? "left alone" : "down";
}

SipPeers::Order SipPeers::choose() const
{
    Order order;
    order.reserve(m_peers.size());
    for (std::size_t i = 0; i < m_peers.size(); ++i)
        if (takesCalls(m_peers[i]))
            order.push_back(i);
    SORT(order, [this](std::size_t i) -> SipPeer const& { return m_peers[i].configured; });
    return order;
}

void SipPeers::SORT(Order& order, std::function<SipPeer const&(std::size_t)> const& configured)
{
    std::stable_sort(order.begin(), order.end(),
                     [&](std::size_t one, std::size_t other)
                     { return configured(one).priority < configured(other).priority; });
    for (std::size_t i = 0; i + 1 < order.size(); ++i) // the next one, by lot, of those that are as good
    {
        std::size_t end = i;
        unsigned int sum = 0;
        while (end < order.size() && configured(order[end]).priority == configured(order[i]).priority)
            sum += configured(order[end++]).weight;
        auto lot = static_cast<unsigned int>(sum == 0 ? 0 : su_randint(0, static_cast<int>(sum) - 1));
        std::size_t drawn = i;
        while (drawn + 1 < end && lot >= configured(order[drawn]).weight)
            lot -= configured(order[drawn++]).weight;
        std::swap(order[i], order[drawn]);
    }
}

void SipPeers::leaveAlone(std::size_t peer, unsigned long seconds)
{
    unsigned long const served = std::min(seconds, LONGEST_PAUSE);
    TY::Time& until = m_peers[peer].busyUntil;
    until = TY::Time::NOW(TY::Time::MONOTONIC);
    until.seconds += static_cast<decltype(until.seconds)>(served);
    spdlog::info("interface {}: the peer {} takes no calls, none is sent for {} s", m_configuration.name,
                 getAddress(peer).text(), served);
}

// --- who is there ----------------------------------------------------------------------------------------------------

void SipPeers::startProbing()
{
    if (m_leg != nullptr)
        m_timer.start(0);
}

void SipPeers::endProbing()
{
    m_timer.stop();
    for (Peer& peer : m_peers)
        FORGET(peer);
}

void SipPeers::ON_TIMER(void* peers)
{
    try
    {
        static_cast<SipPeers*>(peers)->onTimer();
    }
    catch (std::bad_alloc const&)
    {
    }
}

void SipPeers::onTimer()
{
    m_timer.start(m_configuration.probe * 1000);
    for (Peer& peer : m_peers)
    {
        if (peer.probe != nullptr)
            note(peer, false);
        FORGET(peer);
        probe(peer);
    }
}

void SipPeers::probe(Peer& peer)
{
    std::string const uri =
        SipAddress::MAKE_URI({}, peer.configured.address, m_configuration.getWayTo(peer.configured.address));
    std::string const to = SipAddress::MAKE_NAME_ADDR({}, uri);
    peer.probe = m_sender.send(m_leg.get(), HANDLE_RESPONSE, asMagic(), SIP_METHOD_OPTIONS,
                               URL_STRING_MAKE(uri.c_str()), SIPTAG_TO_STR(to.c_str()),
                               SIPTAG_ACCEPT_STR("application/sdp"), SIPTAG_MAX_FORWARDS_STR("70"), TAG_END());
    if (peer.probe == nullptr)
        note(peer, false);
}

int SipPeers::HANDLE_RESPONSE(SipEndpoint* peers, nta_outgoing_t* request, sip_t const* response)
{
    auto& self = *reinterpret_cast<SipPeers*>(peers);
    int const status = response != nullptr ? response->sip_status->st_status : nta_outgoing_status(request);
    if (status < 200)
        return 0;
    bool const isOurs = response == nullptr || nta_sip_is_internal(response);
    for (Peer& peer : self.m_peers)
        if (peer.probe == request)
        {
            FORGET(peer);
            self.note(peer, !isOurs && status != 503);
            break;
        }
    return 0;
}

void SipPeers::note(Peer& peer, bool isThere)
{
    peer.row = isThere == peer.isUp ? 0 : peer.row + 1;
    if (peer.row < (isThere ? m_configuration.probeUp : m_configuration.probeDown))
        return;
    peer.isUp = isThere;
    peer.row = 0;
    spdlog::log(isThere ? spdlog::level::info : spdlog::level::warn, "interface {}: the peer {} is {}",
                m_configuration.name, peer.configured.address.text(), isThere ? "up" : "down");
}

void SipPeers::FORGET(Peer& peer)
{
    if (peer.probe == nullptr)
        return;
    nta_outgoing_bind(peer.probe, nullptr, nullptr);
    nta_outgoing_destroy(std::exchange(peer.probe, nullptr));
}

std::string SipPeers::describe() const
{
    std::string text;
    for (std::size_t i = 0; i < m_peers.size(); ++i)
        text += fmt::format("interface {}: peer {} is {}, {} calls, {} not taken\n", m_configuration.name,
                            getAddress(i).text(), getStateName(i), m_peers[i].calls, m_peers[i].failures);
    return text;
}
