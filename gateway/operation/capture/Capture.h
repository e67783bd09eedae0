#pragma once

#include "configuration/CaptureOptions.h"
#include "operation/capture/HepPacket.h"

#include <string>

struct MediaReport;

/// Shows a capture server what goes over the wire: SIP messages whole, and RTCP reports. In datagrams, and never waits:
/// what the system does not take at once is lost, and counted. One thread.
///
///     Capture capture(options);
///     capture.show(HepPacket{...});
///     capture.show(report, callId);
class Capture
{
public:
    struct Counters
    {
        unsigned long long sent = 0;
        unsigned long long lost = 0; ///< not taken by the system, or too long for a datagram
    };

    /// Throws std::runtime_error with the reason when there is no way to the server.
    explicit Capture(CaptureOptions const& options);
    ~Capture();
    Capture(Capture const&) = delete;
    Capture& operator=(Capture const&) = delete;

    void show(HepPacket const& packet);
    /// `call`: its Call-ID.
    void show(MediaReport const& report, std::string const& call);
    /// Something that could not be shown.
    void noteLost() { ++m_counters.lost; }
    Counters const& getCounters() const { return m_counters; }

private:
    CaptureOptions m_options;
    int m_socket;
    Counters m_counters;
};
