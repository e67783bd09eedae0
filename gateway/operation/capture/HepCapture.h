#pragma once

#include "configuration/CaptureOptions.h"
#include "host/Capture.h"
#include "platform/eventloop/TYTimer.h"

#include <array>
#include <string>

/// Tells a capture server, in datagrams (HepPacket). Never waits: what the system does not take at once is lost, and
/// counted. Several leave together, since most of what one costs is the way through the system and waking who reads
/// it: so what has come in the last 10 ms before the process is killed is not told.
///
///     HepCapture capture(options, loop);
///     capture.show(CapturedMessage{...});
///     capture.show(report, callId);
class HepCapture : public Capture
{
public:
    /// `loop`: of the same thread. Throws std::runtime_error with the reason when there is no way to the server.
    HepCapture(CaptureOptions const& options, TYEventLoop& loop);
    ~HepCapture() override;
    HepCapture(HepCapture const&) = delete;
    HepCapture& operator=(HepCapture const&) = delete;

    // --- Capture
    void show(CapturedMessage const& message) override;
    void show(MediaReport const& report, std::string const& call) override;
    void noteLost() override { ++m_counters.lost; }
    Counters const& getCounters() const override { return m_counters; }

private:
    static constexpr std::size_t MOST_WAITING = 64;

    void send();
    static void ON_TIME(void* self);

    CaptureOptions m_options;
    int m_socket;
    Counters m_counters;
    std::array<std::string, MOST_WAITING> m_packets; // of which so many wait:
    std::size_t m_waiting = 0;
    TYTimer m_timer;
};
