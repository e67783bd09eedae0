#pragma once

#include "media/rtp/DatagramAddress.h"

/// To where a stream is sent and from where it is taken: what signalling said, unless packets come from elsewhere, as
/// they do from behind an address translator; then that is where answers go.
///
/// For a while after the first packet the described address may still take its place back. Then it has settled, and
/// packets from elsewhere are strays: whoever finds the port can neither be heard nor turn the stream to himself.
///
///     RtpLatch latch;
///     latch.expect(DatagramAddress(description.rtp));
///     if (!latch.accept(from, now))
///         ... // a stray
///     ... // send to latch.getTarget()
class RtpLatch
{
public:
    /// `window`: nanoseconds.
    explicit RtpLatch(long long window) : m_window(window) {}

    /// What signalling said; saying the same again keeps what was learned.
    void expect(DatagramAddress const& described);
    /// Whether a packet from there is the far side's. `now`: nanoseconds, monotonic.
    bool accept(DatagramAddress const& from, long long now)
    {
        return (m_isSettled && from == m_target) || learn(from, now);
    }
    /// Where to send; nowhere as long as nobody said and nothing came.
    DatagramAddress const& getTarget() const { return m_target; }

private:
    bool learn(DatagramAddress const& from, long long now);

    long long m_window;
    DatagramAddress m_described;
    DatagramAddress m_target;
    long long m_firstPacket = 0;
    bool m_hasLearned = false; // something came from elsewhere than described
    bool m_isSettled = false;
};
