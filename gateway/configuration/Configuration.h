#pragma once

#include "configuration/AddressRange.h"
#include "media/context/MediaOptions.h"
#include "platform/media/MG_Rtp.h"
#include "sip/dialog/SipStream.h"

#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

/// An address of the internet and a port, as a configuration writes it: "192.0.2.1:5060" or "[2001:db8::1]:5060".
struct SocketAddress
{
    std::string host; ///< an address, never a name; version 6 without its brackets
    std::uint16_t port = 0;

    bool isVersion6() const { return host.find(':') != std::string::npos; }
    bool isUnspecified() const; ///< "0.0.0.0" or "[::]": every address of the host
    bool isMulticast() const;
    friend bool operator==(SocketAddress const&, SocketAddress const&) = default;
    /// The form above.
    std::string text() const;
    /// Throws std::invalid_argument with the reason for anything else, port 0 included.
    static SocketAddress PARSE(std::string const& text);
};

/// What cannot be served in a configuration: one line, "FILE: KEY: REASON".
class ConfigurationError : public std::runtime_error
{
public:
    ConfigurationError(std::string const& file, std::string const& key, std::string const& reason);
};

/// The gateway's configuration file as read: complete, checked, with defaults filled in. A plain value.
///
///     Configuration const configuration = Configuration::READ("/etc/callcontrol-gateway.toml");
///     for (Configuration::Interface const& interface : configuration.interfaces)
///         ...
///
/// README.md lists the keys.
struct Configuration
{
    /// One SIP interface: where it listens, and the peer to which its calls go.
    struct Interface
    {
        std::string name;
        SocketAddress listen;
        SocketAddress advertise; ///< what the peers are told instead of `listen`; port 0: nothing
        SocketAddress peer;
        bool usesTcp = false;     ///< towards the peer
        bool listensOnUdp = true; ///< one of the two at least
        bool listensOnTcp = false;
        std::vector<AddressRange> allow;     ///< who is served; empty: the peer's address alone
        unsigned int maxMessageSize = 65535; ///< octets
        unsigned int maxHeaderSize = 32768;  ///< octets: a message without its body
        unsigned int maxConnectionsPerSource = 16;
        unsigned int tcpIdle = 120;         ///< seconds that a connection may stay without a message
        unsigned int t1 = 500;              ///< milliseconds: the first retransmission
        unsigned int t1x64 = 32000;         ///< milliseconds: how long a transaction waits for its answer
        unsigned int answerTimeout = 180;   ///< seconds that the peer may ring
        unsigned int sessionExpires = 1800; ///< seconds within which a session is to be refreshed; 0: not asked for
        unsigned int leastExpires = 90;     ///< seconds: what a peer may ask for
        unsigned int longestCall = 0;       ///< seconds that an answered call from there may last; 0: no limit
        std::string mediaAddress;           ///< of this machine, where media come in; no name
        /// That are offered and taken where media are relayed, the best liked first.
        std::vector<MG_Rtp::ECodec::Type> codecs{MG_Rtp::ECodec::PCMA, MG_Rtp::ECodec::PCMU, MG_Rtp::ECodec::G722,
                                                 MG_Rtp::ECodec::OPUS, MG_Rtp::ECodec::G729, MG_Rtp::ECodec::GSM};
        /// SRTP towards the peer; where media are relayed.
        SipStream::Security security = SipStream::PLAIN;
        std::string conference;     ///< the number of the interface's conference; where media are relayed. Empty: none
        bool ringsBack = false;     ///< a caller hears a tone of ours while the callee is alerted without media
        bool detectsDigits = false; ///< in what its peers say; where media are relayed
        bool transfersOnWire = false; ///< a peer that is to be transferred is sent REFER; else we dial for it

        /// Where the peers reach it.
        SocketAddress const& getAddress() const { return advertise.port != 0 ? advertise : listen; }
    };
    /// Calls that come in on `from` to a number that begins with `prefix` leave on `to`.
    struct Route
    {
        std::string from;
        std::string prefix;
        std::string to;
    };

    std::string file;
    std::string context;                   ///< the call-control context; empty: its default
    std::string logLevel = "info";         ///< of spdlog
    std::string logFile;                   ///< empty: the standard error stream
    unsigned int callControlLogLevel = 1;  ///< of the library's monitor, 0 to 5
    unsigned int maxHops = 0;              ///< that a call may take from here on; 0: no limit of our own
    unsigned int maxCalls = 4000;          ///< at the same time; 0: no limit
    unsigned int maxCallsPerSecond = 200;  ///< 0: no limit
    unsigned int maxCallsPerSource = 2000; ///< of one address at the same time; 0: no limit
    std::string recording;                 ///< the recorder's file; empty: in memory
    unsigned int recordingSize = 4194304;  ///< octets; 0: nothing is recorded
    bool relaysMedia = false;              ///< through ports of ours; else the peers exchange them directly
    MediaOptions media;
    unsigned int clearAfter = 10; ///< seconds that calls may go on after the request to end
    std::vector<Interface> interfaces;
    std::vector<Route> routes;

    /// Throws ConfigurationError.
    static Configuration READ(std::string const& file);
    /// The same from the text itself; `file` names it in errors.
    static Configuration PARSE(std::string_view text, std::string const& file);

    Interface const* findInterface(std::string_view name) const;
};
