#include "sip/SipConfiguration.h"

#include "configuration/ConfigurationSection.h"
#include "media/context/MediaDescription.h"
#include "sip/message/SipCarriedHeaders.h"
#include "sip/message/SipCodec.h"
#include "sip/stack/SipTls.h"

#include <algorithm>
#include <limits>
#include <stdexcept>

namespace
{
constexpr unsigned int UNLIMITED = std::numeric_limits<int>::max();
constexpr unsigned int LEAST_MESSAGE = 1024;   // octets
constexpr unsigned int MOST_MESSAGE = 1 << 20; // of a stream; a datagram ends at 65535

SipWay::Way WAY_OF(std::string const& transport)
{
    if (transport == "sips")
        return SipWay::SIPS;
    if (transport == "tls")
        return SipWay::TLS;
    return transport == "tcp" ? SipWay::TCP : SipWay::UDP;
}

/// Where the name says how a peer is reached, its requests in a dialog come back as well as they can: by UDP, else TCP.
void CHECK_NAMED(ConfigurationSection const& section, SipConfiguration const& interface)
{
    std::vector<SipPeer> const peers = interface.getPeers();
    if (std::none_of(peers.begin(), peers.end(),
                     [](SipPeer const& peer) { return peer.address.isName() && peer.address.port == 0; }))
        section.refuse("transport", "'named' is for peers that have a name without a port");
    if (interface.listensOnTls)
        section.refuse("transports", "may not have 'tls' where the name chooses: what it secures would be left to it");
}

/// Without `transports` an interface listens on what it speaks to its peer.
void READ_TRANSPORTS(ConfigurationSection const& section, SipConfiguration& interface)
{
    std::string const transportToPeer = section.oneOf("transport", "udp", {"udp", "tcp", "tls", "sips", "named"});
    interface.way = WAY_OF(transportToPeer);
    interface.isWayNamed = transportToPeer == "named";
    bool const isSecured = SipWay::IS_SECURED(interface.way);
    char const* const towardsPeer = isSecured ? "tls" : interface.way == SipWay::TCP ? "tcp" : "udp";
    interface.listensOnUdp = false;
    std::vector<std::string> const ownTransports =
        interface.isWayNamed ? std::vector<std::string>{"udp", "tcp"} : std::vector<std::string>{towardsPeer};
    for (std::string const& transport : section.texts("transports", ownTransports))
        if (transport == "udp")
            interface.listensOnUdp = true;
        else if (transport == "tcp")
            interface.listensOnTcp = true;
        else if (transport == "tls")
            interface.listensOnTls = true;
        else
            section.refuse("transports", "must be some of udp, tcp, tls");
    if (interface.isWayNamed)
    {
        CHECK_NAMED(section, interface);
        interface.way = interface.listensOnUdp ? SipWay::UDP : SipWay::TCP;
    }
    if (!(isSecured                      ? interface.listensOnTls
          : interface.way == SipWay::TCP ? interface.listensOnTcp
                                         : interface.listensOnUdp))
        section.refuse("transports", std::string("must have '") + towardsPeer + "', which is the peer's");
}

SipTlsSettings::Check READ_CHECK(ConfigurationSection const& section, char const* key, char const* fallback)
{
    std::string const text = section.oneOf(key, fallback, {"name", "peer", "off"});
    return text == "name" ? SipTlsSettings::NAME : text == "peer" ? SipTlsSettings::PEER : SipTlsSettings::OFF;
}

void CHECK_NAMES(ConfigurationSection const& section, std::vector<std::string> const& names)
{
    for (std::string const& name : names)
        if (name.empty() || name.find_first_of(" :/*@;?") != std::string::npos ||
            name.find_first_not_of("0123456789.") == std::string::npos)
            section.refuse("tls-names", "'" + name + "' is no name of a host");
}

/// The port where nothing else is listened on is that of `listen`.
void READ_TLS(ConfigurationSection const& section, SipConfiguration& interface)
{
    constexpr char const* KEYS[] = {"tls-port",   "tls-certificate",    "tls-key",   "tls-authorities",
                                    "tls-verify", "tls-verify-clients", "tls-names", "tls-version"};
    if (!interface.listensOnTls)
    {
        for (char const* const key : KEYS)
            if (section.has(key))
                section.refuse(key, "is of no use without 'tls' in transports");
        return;
    }
    bool const isAlone = !interface.listensOnUdp && !interface.listensOnTcp;
    interface.tlsPort = static_cast<std::uint16_t>(
        section.number("tls-port", isAlone ? interface.listen.port : interface.tlsPort, 1, 65535));
    if (interface.listensOnTcp && interface.tlsPort == interface.listen.port)
        section.refuse("tls-port", "is that of TCP");
    std::string const verify = section.oneOf("tls-verify", "name", {"name", "peer", "off"});
    SipTlsSettings& tls = interface.tls;
    tls.ofServers = READ_CHECK(section, "tls-verify", "name");
    tls.ofClients = READ_CHECK(section, "tls-verify-clients", verify.c_str());
    tls.certificate = section.neededText("tls-certificate");
    tls.key = section.neededText("tls-key");
    tls.authorities = section.text("tls-authorities", {});
    bool const verifies = tls.ofServers != SipTlsSettings::OFF || tls.ofClients != SipTlsSettings::OFF;
    if (verifies && tls.authorities.empty())
        section.refuse("tls-authorities", "is needed to verify certificates");
    tls.names = section.texts("tls-names", {});
    CHECK_NAMES(section, tls.names);
    if (tls.names.empty())
        for (SipPeer const& peer : interface.getPeers())
            if (peer.address.isName())
                tls.names.push_back(peer.address.host);
    tls.isLeast13 = section.oneOf("tls-version", "1.2", {"1.2", "1.3"}) == "1.3";
    try
    {
        SipTls::CHECK(tls);
    }
    catch (SipTlsSettings::Failure const& error)
    {
        section.refuse(error.key, error.what());
    }
}

/// Where others find it: no address that is everybody's, or many's.
void CHECK_REACHABLE(ConfigurationSection const& section, char const* key, SocketAddress const& address)
{
    if (address.isUnspecified())
        section.refuse(key, "'" + address.host + "' is nobody's address");
    if (address.isMulticast())
        section.refuse(key, "'" + address.host + "' is a multicast address");
}

SocketAddress READ_REACHABLE(ConfigurationSection const& section, char const* key)
{
    SocketAddress address = section.address(key);
    CHECK_REACHABLE(section, key, address);
    return address;
}

void READ_ADDRESSES(ConfigurationSection const& section, SipConfiguration& interface)
{
    interface.listen = section.address("listen");
    if (section.has("advertise"))
        interface.advertise = READ_REACHABLE(section, "advertise");
    else if (interface.listen.isUnspecified())
        section.refuse("listen", "'" + interface.listen.host + "' cannot be told to peers: advertise is needed");
    if (interface.listen.isMulticast())
        section.refuse("listen", "'" + interface.listen.host + "' is a multicast address");
    if (interface.advertise.port != 0 && interface.advertise.isVersion6() != interface.listen.isVersion6())
        section.refuse("advertise", "is not of the version of the internet protocol that listen is of");
}

SocketAddress READ_PEER(ConfigurationSection const& section, char const* key, SipConfiguration const& interface)
{
    SocketAddress peer = section.addressOrName(key);
    if (peer.isName())
        return peer;
    CHECK_REACHABLE(section, key, peer);
    if (peer.isVersion6() != interface.listen.isVersion6())
        section.refuse(key, "is not of the version of the internet protocol that listen is of");
    if (peer == interface.listen || peer == interface.advertise)
        section.refuse(key, "is the interface itself");
    return peer;
}

/// Names are asked for when a call goes there, so who may send is not known before.
void READ_NAMES(ConfigurationSection const& section, SipConfiguration& interface)
{
    if (section.has("resolver"))
        interface.resolver = READ_REACHABLE(section, "resolver");
    for (SipPeer const& peer : interface.getPeers())
        if (peer.address.isName() && !section.has("allow"))
            section.refuse("allow", "is needed where a peer has a name");
}

/// One as `peer`, or several as tables.
void READ_PEERS(ConfigurationSection const& section, SipConfiguration& interface)
{
    for (ConfigurationSection const& table : section.sections("peers"))
    {
        table.allow({"address", "priority", "weight"});
        SipPeer const peer{READ_PEER(table, "address", interface), table.number("priority", 0, 0, 65535),
                           table.number("weight", 1, 0, 65535)};
        for (SipPeer const& other : interface.peers)
            if (other.address == peer.address)
                table.refuse("address", "is that of another peer");
        interface.peers.push_back(peer);
    }
    if (!interface.peers.empty() && section.has("peer"))
        section.refuse("peer", "is of no use with peers");
    if (!interface.peers.empty())
        interface.peer = interface.peers.front().address;
    else if (section.has("peer") || !section.flag("registrar"))
        interface.peer = READ_PEER(section, "peer", interface);
    READ_NAMES(section, interface);
    interface.probe = section.number("probe", interface.probe, 0, 3600);
    interface.probeUp = section.number("probe-up", interface.probeUp, 1, 100);
    interface.probeDown = section.number("probe-down", interface.probeDown, 1, 100);
    interface.failoverAfter = section.number("failover-after", interface.failoverAfter, 0, 640000);
}

/// By the names that session descriptions have for them.
void READ_CODECS(ConfigurationSection const& section, SipConfiguration& interface)
{
    if (!section.has("codecs"))
        return;
    interface.codecs.clear();
    for (std::string const& name : section.texts("codecs", {}))
    {
        MG_Rtp::ECodec::Type const codec = SipCodec::NAMED(name);
        if (codec == MG_Rtp::ECodec::NONE)
            section.refuse("codecs", "'" + name + "' is no codec");
        if (std::find(interface.codecs.begin(), interface.codecs.end(), codec) != interface.codecs.end())
            section.refuse("codecs", "'" + name + "' is in it twice");
        interface.codecs.push_back(codec);
    }
    if (interface.codecs.size() > MediaFormats::MOST)
        section.refuse("codecs", "may have " + std::to_string(MediaFormats::MOST) + " of them");
}

/// As whom, and with what password, it calls a peer that asks.
void READ_CREDENTIALS(ConfigurationSection const& section, SipConfiguration& interface)
{
    interface.user = section.text("user", {});
    if (section.has("passwords"))
        try
        {
            interface.passwords = SipPasswords::READ(section.neededText("passwords"));
        }
        catch (std::invalid_argument const& error)
        {
            section.refuse("passwords", error.what());
        }
    interface.authenticates = section.flag("authenticate");
    if (interface.user.empty() && !interface.authenticates && interface.passwords != nullptr)
        section.refuse("passwords", "are of no use without user or authenticate");
    if (interface.user.empty())
        return;
    if (interface.passwords == nullptr)
        section.refuse("user", "has no password: passwords is needed");
    if (!interface.passwords->hasUser(interface.user))
        section.refuse("user", "'" + interface.user + "' is not in the file of passwords");
}

/// Whether it asks who sends, and whom it knows.
void READ_AUTHENTICATION(ConfigurationSection const& section, SipConfiguration& interface)
{
    interface.realm = section.text("realm", interface.name);
    if (interface.realm.empty() || interface.realm.find_first_of("\"\\:") != std::string::npos)
        section.refuse("realm", "is empty, or has a quote, a backslash or a colon");
    if (section.has("algorithms"))
        interface.algorithms.clear();
    for (std::string const& name : section.texts("algorithms", {"SHA-256", "MD5"}))
        if (std::optional<SipDigest::Algorithm> const algorithm = SipDigest::NAMED(name); !algorithm)
            section.refuse("algorithms", "must be some of SHA-256, SHA-512-256, MD5");
        else if (section.has("algorithms"))
            interface.algorithms.push_back(*algorithm);
    if (!interface.authenticates)
        return;
    if (interface.passwords == nullptr)
        section.refuse("authenticate", "by what? passwords is needed");
    if (!interface.passwords->hasRealm(interface.realm))
        section.refuse("authenticate", "nobody of the realm '" + interface.realm + "' is in the file of passwords");
    for (SipDigest::Algorithm const algorithm : interface.algorithms)
        if (std::string const user = interface.passwords->findWithout(interface.realm, algorithm); !user.empty())
            section.refuse("algorithms", "of '" + user + "' there is no hash by " + SipDigest::NAME(algorithm));
}

/// Whether users of its realm tell it where they are.
void READ_REGISTRAR(ConfigurationSection const& section, SipConfiguration& interface)
{
    interface.isRegistrar = section.flag("registrar");
    interface.registrations = section.text("registrations", {});
    interface.leastRegistration = section.number("min-expires", interface.leastRegistration, 1, 86400);
    interface.longestRegistration = section.number("max-expires", interface.longestRegistration, 1, 86400);
    interface.maxContacts = section.number("max-contacts", interface.maxContacts, 1, 100);
    if (interface.longestRegistration < interface.leastRegistration)
        section.refuse("max-expires", "must not be below min-expires");
    if (!interface.isRegistrar)
        return;
    if (!interface.authenticates)
        section.refuse("registrar", "of whom? authenticate is needed");
    if (!interface.hasPeer() && !section.has("allow"))
        section.refuse("allow", "is needed where there is no peer");
}

/// Whether, and how, it tells its peer where it is.
void READ_REGISTRATION(ConfigurationSection const& section, SipConfiguration& interface)
{
    interface.registers = section.flag("register");
    if (interface.registers && !interface.hasPeer())
        section.refuse("peer", "is missing");
    interface.domain = section.text("domain", interface.hasPeer() ? interface.peer.text() : interface.name);
    if (interface.domain.empty() || interface.domain.find_first_of(" <>@;?\"/") != std::string::npos)
        section.refuse("domain", "is no name of a host");
    interface.registerExpires = section.number("register-expires", interface.registerExpires, 1, 86400);
    interface.registerRetry = section.number("register-retry", interface.registerRetry, 1, 1800);
    if (interface.registers && interface.user.empty())
        section.refuse("register", "as whom? user is needed");
}

/// That cross from side to side besides the usual ones.
void READ_HEADERS(ConfigurationSection const& section, SipConfiguration& interface)
{
    interface.headers = section.texts("headers", {});
    for (std::string const& name : interface.headers)
        if (!SipCarriedHeaders::IS_LISTABLE(name))
            section.refuse("headers", "'" + name + "' is no header that may be carried");
    if (interface.headers.size() > SipCarriedHeaders::MOST_LINES)
        section.refuse("headers", "may have " + std::to_string(SipCarriedHeaders::MOST_LINES) + " of them");
}

void CHECK_MEDIA_ADDRESS(ConfigurationSection const& section, SipConfiguration const& interface)
{
    try
    {
        if (SocketAddress::PARSE(SocketAddress{interface.mediaAddress, 1}.text()).isUnspecified())
            section.refuse("media-address", "'" + interface.mediaAddress + "' cannot be told to peers");
    }
    catch (std::invalid_argument const& error)
    {
        section.refuse("media-address", error.what());
    }
}
} // namespace

SipConfiguration SipConfiguration::READ(ConfigurationSection const& section, bool relaysMedia)
{
    section.allow({"name",
                   "listen",
                   "advertise",
                   "peer",
                   "peers",
                   "resolver",
                   "probe",
                   "probe-up",
                   "probe-down",
                   "failover-after",
                   "trusted",
                   "nat",
                   "redirections",
                   "headers",
                   "isup",
                   "user",
                   "passwords",
                   "authenticate",
                   "realm",
                   "algorithms",
                   "registrar",
                   "registrations",
                   "min-expires",
                   "max-expires",
                   "max-contacts",
                   "register",
                   "domain",
                   "register-expires",
                   "register-retry",
                   "transport",
                   "transports",
                   "tls-port",
                   "tls-certificate",
                   "tls-key",
                   "tls-authorities",
                   "tls-verify",
                   "tls-verify-clients",
                   "tls-names",
                   "tls-version",
                   "allow",
                   "max-message-size",
                   "max-header-size",
                   "max-connections-per-source",
                   "max-requests-per-source",
                   "tcp-idle",
                   "t1",
                   "t1x64",
                   "answer-timeout",
                   "codecs",
                   "charges",
                   "overlap",
                   "digit-timeout",
                   "detect-digits",
                   "srtp",
                   "ringback",
                   "failure-tone",
                   "conference",
                   "transfer",
                   "media-address",
                   "session-expires",
                   "min-se",
                   "max-call-duration"});
    SipConfiguration interface;
    interface.name = section.neededText("name");
    READ_ADDRESSES(section, interface);
    READ_PEERS(section, interface);
    READ_TRANSPORTS(section, interface);
    READ_TLS(section, interface);
    READ_CREDENTIALS(section, interface);
    READ_AUTHENTICATION(section, interface);
    READ_HEADERS(section, interface);
    interface.isBehindNat = section.flag("nat");
    interface.isTrusted = section.has("trusted") ? section.flag("trusted") : !interface.authenticates;
    interface.carriesIsup = section.flag("isup");
    if (interface.carriesIsup && !interface.isTrusted)
        section.refuse("isup", "tells who withholds his number: it is for peers that are trusted");
    READ_REGISTRAR(section, interface);
    READ_REGISTRATION(section, interface);
    interface.allow = section.ranges("allow");
    interface.maxMessageSize =
        section.number("max-message-size", interface.maxMessageSize, LEAST_MESSAGE, MOST_MESSAGE);
    interface.maxHeaderSize = section.number("max-header-size", interface.maxHeaderSize, LEAST_MESSAGE, MOST_MESSAGE);
    interface.maxConnectionsPerSource =
        section.number("max-connections-per-source", interface.maxConnectionsPerSource, 1, UNLIMITED);
    interface.maxRequestsPerSource =
        section.number("max-requests-per-source", interface.maxRequestsPerSource, 0, UNLIMITED);
    interface.tcpIdle = section.number("tcp-idle", interface.tcpIdle, 1, 86400);
    interface.t1 = section.number("t1", interface.t1, 10, 10000);
    interface.t1x64 = section.number("t1x64", 64 * interface.t1, interface.t1, 640000);
    interface.transfersOnWire = section.oneOf("transfer", "dial", {"dial", "refer"}) == "refer";
    READ_CODECS(section, interface);
    std::string const srtp = section.oneOf("srtp", "off", {"off", "optional", "required"});
    interface.security = srtp == "off"        ? SipStream::PLAIN
                         : srtp == "optional" ? SipStream::OPTIONAL
                                              : SipStream::SECURED;
    interface.conference = section.text("conference", {});
    interface.failureTone = section.number("failure-tone", interface.failureTone, 0, 60);
    interface.ringsBack = section.flag("ringback");
    std::string const charges = section.oneOf("charges", "off", {"off", "tell", "take"});
    interface.charges = charges == "tell"   ? SipConfiguration::Charges::TELL
                        : charges == "take" ? SipConfiguration::Charges::TAKE
                                            : SipConfiguration::Charges::OFF;
    std::string const redirections = section.oneOf("redirections", "refuse", {"refuse", "follow", "hand-on"});
    interface.redirections = redirections == "follow"    ? SipConfiguration::Redirections::FOLLOW
                             : redirections == "hand-on" ? SipConfiguration::Redirections::HAND_ON
                                                         : SipConfiguration::Redirections::REFUSE;
    if (section.oneOf("overlap", "off", {"off", "invite"}) == "invite")
        interface.overlap = SipConfiguration::Overlap::INVITE;
    interface.digitTimeout = section.number("digit-timeout", interface.digitTimeout, 1, 60);
    interface.detectsDigits = section.flag("detect-digits");
    interface.mediaAddress = section.text("media-address", interface.listen.host);
    interface.leastExpires = section.number("min-se", interface.leastExpires, 1, 86400);
    interface.sessionExpires = section.number("session-expires", interface.sessionExpires, 0, 86400);
    interface.longestCall = section.number("max-call-duration", interface.longestCall, 0, 86400);
    interface.answerTimeout = section.number("answer-timeout", interface.answerTimeout, 1, 3600);
    if (relaysMedia)
        CHECK_MEDIA_ADDRESS(section, interface);
    else if (!interface.conference.empty())
        section.refuse("conference", "needs media.mode \"relay\"");
    return interface;
}
