#pragma once

#include "platform/base/TYTime.h"
#include "platform/eventloop/TYTimer.h"
#include "sip/SipConfiguration.h"
#include "sip/access/SipSender.h"
#include "sip/stack/SipHandles.h"

#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <vector>

/// The peers of an interface: whom a call goes to, and who of them is there.
///
/// Of those that take calls the ones of the least priority number come first, among these each as often as its weight
/// says (RFC 2782). A peer takes none for the time of its Retry-After, and, where the interface probes, as long as it
/// does not answer OPTIONS:
///
///     up -- so many probes in a row without an answer, or with 503 --> down -- so many with any other --> up
///
/// A probe waits for its answer until the next one is due. Belongs to the thread of the call-control loop. Its
/// interface owns it, and ends the agent and the sender after it.
class SipPeers
{
public:
    using Order = std::vector<std::size_t>;
    static constexpr std::size_t NONE = static_cast<std::size_t>(-1);

    SipPeers(SipConfiguration const& configuration, nta_agent_t* agent, SipSender& sender);
    ~SipPeers();
    SipPeers(SipPeers const&) = delete;
    SipPeers& operator=(SipPeers const&) = delete;

    /// Whom a call is to be offered to, one after the other; none: nobody takes calls now.
    Order choose() const;
    std::size_t getNumberOfPeers() const { return m_peers.size(); }
    char const* getStateName(std::size_t peer) const; ///< "up", "left alone" or "down"
    SocketAddress const& getAddress(std::size_t peer) const { return m_peers[peer].configured.address; }
    void noteCall(std::size_t peer) { ++m_peers[peer].calls; }
    /// It did not take the call: another one may.
    void noteFailure(std::size_t peer) { ++m_peers[peer].failures; }
    /// It takes no calls for these seconds, 60 at most.
    void leaveAlone(std::size_t peer, unsigned long seconds);

    void startProbing();
    void endProbing();
    /// A line for each peer, for the dump.
    std::string describe() const;

    // --- the rule, by itself
    /// Puts peers, by their numbers, in the order in which a call is offered to them.
    static void SORT(Order& order, std::function<SipPeer const&(std::size_t)> const& configured);

private:
    struct Peer
    {
        SipPeer configured;
        bool isUp = true;
        unsigned int row = 0; ///< of probes that say the contrary
        TY::Time busyUntil{};
        nta_outgoing_t* probe = nullptr;
        unsigned long long calls = 0;
        unsigned long long failures = 0;
    };

    bool takesCalls(Peer const& peer) const;
    static void ON_TIMER(void* peers);
    void onTimer();
    void probe(Peer& peer);
    static int HANDLE_RESPONSE(SipEndpoint* peers, nta_outgoing_t* request, sip_t const* response);
    void note(Peer& peer, bool isThere);
    static void FORGET(Peer& peer);
    SipEndpoint* asMagic() { return reinterpret_cast<SipEndpoint*>(this); }

    SipConfiguration const& m_configuration;
    SipSender& m_sender;
    std::vector<Peer> m_peers;
    SipLeg m_leg; // null: it does not probe
    TYTimer m_timer;
};
