#pragma once

#include <chrono>
#include <string>
#include <string_view>

struct MediaReport;
struct sockaddr;

/// One message on the wire.
struct CapturedMessage
{
    enum Protocol : unsigned char
    {
        SIP = 1,
        RTCP = 5 ///< its reports, as JSON
    };

    Protocol protocol;
    unsigned char transport; ///< the protocol number of the internet's: IPPROTO_UDP, IPPROTO_TCP
    sockaddr const& from;    ///< both of version 4 or both of version 6
    sockaddr const& to;
    std::chrono::system_clock::time_point time;
    std::string_view payload;
    std::string_view correlation = {}; ///< the Call-ID of the call that it is about, where the payload does not say it
};

/// Whom modules show what goes over the wire: messages whole, and RTCP reports. The gateway's; on the signalling
/// thread.
///
///     if (Capture* const capture = host.capture)
///         capture->show({CapturedMessage::SIP, IPPROTO_UDP, from, to, std::chrono::system_clock::now(), text});
class Capture
{
public:
    struct Counters
    {
        unsigned long long sent = 0;
        unsigned long long lost = 0; ///< not taken by the system, or too long for a datagram
    };

    virtual ~Capture() = default;

    virtual void show(CapturedMessage const& message) = 0;
    /// `call`: its Call-ID.
    virtual void show(MediaReport const& report, std::string const& call) = 0;
    /// Something that could not be shown.
    virtual void noteLost() = 0;
    virtual Counters const& getCounters() const = 0;
};
