#pragma once

#include "configuration/AddressRange.h"
#include "configuration/SocketAddress.h"
#include "platform/media/MG_Rtp.h"
#include "sip/access/SipPasswords.h"
#include "sip/dialog/SipStream.h"
#include "sip/message/SipWay.h"
#include "sip/stack/SipTlsSettings.h"

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

class ConfigurationSection;

/// One of the peers of an interface.
struct SipPeer
{
    SocketAddress address;     ///< or a name; port 0: that of its service, as the resolver says
    unsigned int priority = 0; ///< the least is tried first
    unsigned int weight = 1;   ///< among those of one priority
};

/// One SIP interface, [[sip]] in the configuration: where it listens, and the peer to which its calls go. A plain
/// value; README.md lists the keys.
struct SipConfiguration
{
    /// What becomes of numbers that come digit by digit.
    enum class Overlap
    {
        OFF,   ///< they are collected; an INVITE has the whole number
        INVITE ///< each digit is another INVITE (RFC 3578)
    };

    /// What calls cost: which of the two sides knows it.
    enum class Charges
    {
        OFF,
        TELL, ///< the peers are told
        TAKE  ///< the peers tell
    };

    /// What becomes of a call that the peer sends elsewhere, with 300 to 302.
    enum class Redirections
    {
        REFUSE, ///< it fails
        FOLLOW, ///< we dial, by the routes of the interface
        HAND_ON ///< the caller is told
    };

    std::string name;
    SocketAddress listen;
    SocketAddress advertise;        ///< what the peers are told instead of `listen`; port 0: nothing
    SocketAddress peer;             ///< without a host: none, it calls registered users alone; of several the first
    std::vector<SipPeer> peers{};   ///< where there are several
    SocketAddress resolver{};       ///< of names; port 0: that of the system
    unsigned int probe = 0;         ///< seconds between OPTIONS to each peer; 0: none
    unsigned int probeUp = 1;       ///< answers in a row, until a peer counts as there again
    unsigned int probeDown = 2;     ///< probes in a row without an answer, until it does not
    unsigned int failoverAfter = 0; ///< milliseconds without an answer, until another peer is tried; 0: t1x64
    SipWay::Way way = SipWay::UDP;  ///< towards the peer
    bool isWayNamed = false;        ///< by the peer's name, if that has no port; else it is `way`
    bool listensOnUdp = true;       ///< one of the three at least
    bool listensOnTcp = false;
    bool listensOnTls = false;
    std::uint16_t tlsPort = 5061;        ///< at the address of `listen`
    SipTlsSettings tls;                  ///< of use where it listens on that
    std::vector<AddressRange> allow;     ///< who is served; empty: the peer's address alone
    unsigned int maxMessageSize = 65535; ///< octets
    unsigned int maxHeaderSize = 32768;  ///< octets: a message without its body
    unsigned int maxConnectionsPerSource = 16;
    unsigned int maxRequestsPerSource =
        100;                            ///< a second, of those that belong to no dialog and begin none; 0: no limit
    unsigned int tcpIdle = 120;         ///< seconds that a connection may stay without a message
    unsigned int t1 = 500;              ///< milliseconds: the first retransmission
    unsigned int t1x64 = 32000;         ///< milliseconds: how long a transaction waits for its answer
    unsigned int answerTimeout = 180;   ///< seconds that the peer may ring
    unsigned int sessionExpires = 1800; ///< seconds within which a session is to be refreshed; 0: not asked for
    unsigned int leastExpires = 90;     ///< seconds: what a peer may ask for
    unsigned int longestCall = 0;       ///< seconds that an answered call from there may last; 0: no limit
    bool isBehindNat = false;           ///< its peers: they are where their messages come from
    bool isTrusted = true;              ///< its peers, in the sense of RFC 3325
    std::vector<std::string> headers{}; ///< names of those that cross besides the usual ones
    bool carriesIsup = false;           ///< from and to its peers, as it stands
    std::string user;                   ///< as whom it shows itself to a peer that asks; empty: it does not
    std::shared_ptr<SipPasswords const> passwords; ///< with a user, or where it asks: never null
    bool authenticates = false;                    ///< asks who sends
    std::string realm;                             ///< of those whom it asks
    std::vector<SipDigest::Algorithm> algorithms{SipDigest::SHA_256, SipDigest::MD5}; ///< the best liked first
    bool isRegistrar = false;                                                         ///< for the users of its realm
    std::string registrations;               ///< the file of their contacts; empty: in memory
    unsigned int leastRegistration = 60;     ///< seconds
    unsigned int longestRegistration = 3600; ///< seconds
    unsigned int maxContacts = 10;           ///< of a user
    bool registers = false;                  ///< with its peer, as that user
    std::string domain;                      ///< of the user, with the peer
    unsigned int registerExpires = 600;      ///< seconds that it asks for
    unsigned int registerRetry = 30;         ///< seconds after a first failure
    std::string mediaAddress;                ///< of this machine, where media come in; no name
    /// That are offered and taken where media are relayed, the best liked first.
    std::vector<MG_Rtp::ECodec::Type> codecs{MG_Rtp::ECodec::PCMA, MG_Rtp::ECodec::PCMU, MG_Rtp::ECodec::G722,
                                             MG_Rtp::ECodec::OPUS, MG_Rtp::ECodec::G729, MG_Rtp::ECodec::GSM};
    SipStream::Security security = SipStream::PLAIN; ///< SRTP towards the peer; where media are relayed
    std::string conference; ///< the number of the interface's conference; where media are relayed. Empty: none
    Charges charges = Charges::OFF;
    Overlap overlap = Overlap::OFF;
    Redirections redirections = Redirections::REFUSE;
    unsigned int digitTimeout = 15; ///< seconds after which no further digit is waited for
    unsigned int failureTone = 0;   ///< seconds for which a caller hears why his call fails; 0: he does not
    bool ringsBack = false;         ///< a caller hears a tone of ours while the callee is alerted without media
    bool detectsDigits = false;     ///< in what its peers say; where media are relayed
    bool transfersOnWire = false;   ///< a peer that is to be transferred is sent REFER; else we dial for it

    /// Where the peers reach it.
    SocketAddress const& getAddress() const { return advertise.port != 0 ? advertise : listen; }
    /// Where it listens for what comes that way.
    std::uint16_t getPort(SipWay::Way by) const { return SipWay::IS_SECURED(by) ? tlsPort : listen.port; }
    /// The address for what goes that way.
    SocketAddress getAddress(SipWay::Way by) const
    {
        return SipWay::IS_SECURED(by) ? SocketAddress{getAddress().host, tlsPort} : getAddress();
    }

    /// How a request outside of dialogs gets to that peer.
    SipWay::Way getWayTo(SocketAddress const& of) const
    {
        return isWayNamed && of.isName() && of.port == 0 ? SipWay::AS_NAMED : way;
    }

    bool hasPeer() const { return !peer.host.empty(); }
    std::vector<SipPeer> getPeers() const { return peers.empty() && hasPeer() ? std::vector{SipPeer{peer}} : peers; }

    /// Checked and with defaults filled in. `relaysMedia`: of use is only a media address that peers can reach. Throws
    /// ConfigurationError.
    static SipConfiguration READ(ConfigurationSection const& section, bool relaysMedia);
};
