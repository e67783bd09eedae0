#pragma once

#include "media/context/MediaAddress.h"
#include "platform/base/XCode.h"

/// A descriptor that is closed with its owner.
class Descriptor
{
public:
    Descriptor() = default;
    explicit Descriptor(int descriptor) : m_descriptor(descriptor) {}
    ~Descriptor() { reset(); }
    Descriptor(Descriptor&& other) noexcept : m_descriptor(other.release()) {}
    Descriptor& operator=(Descriptor&& other) noexcept;

    int get() const { return m_descriptor; } ///< -1: none
    int release();
    void reset();

private:
    int m_descriptor = -1;
};

/// The two sockets of a leg: an even port for RTP, the odd one above it for RTCP (RFC 3550, 11).
struct RtpPorts
{
    Descriptor rtp;
    Descriptor rtcp;
    MediaAddress address; ///< of rtp; rtcp's port is one more

    MediaAddress getRtcp() const { return {address.host, static_cast<unsigned short>(address.port + 1)}; }
};

/// From where the legs' ports are taken. Each search begins behind the last pair found, so that what was given up rests
/// for as long as the range allows and late packets of an earlier call find nobody. One thread.
class RtpPortRange
{
public:
    /// Ports from `first` to `last`, 0 and what has no odd one above it left out. `differentiation`: the code point of
    /// what is sent.
    RtpPortRange(unsigned short first, unsigned short last, unsigned int differentiation);

    /// Two sockets on the address: OK; ABSENT when every pair is taken; FAILURE when the address is not of this machine
    /// or the system gives no socket.
    XCode open(IpAddress const& local, RtpPorts& ports);

private:
    unsigned int m_first;
    unsigned int m_pairs; // how many there are
    unsigned int m_next = 0;
    unsigned int m_differentiation;
};
