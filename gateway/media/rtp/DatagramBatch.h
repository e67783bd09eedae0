#pragma once

#include "media/rtp/DatagramAddress.h"

#include <array>
#include <cstddef>
#include <span>
#include <sys/socket.h>

/// Datagrams on their way through, so many with one call of the system: received into buffers of its own, sent from
/// wherever they are. One for each datapath loop.
///
///     for (unsigned int i = 0, count = batch.receive(from); i < count; ++i)
///         batch.queue(batch.getOctets(i), target);
///     batch.send(to);
class DatagramBatch
{
public:
    static constexpr unsigned int MOST = 16;     ///< datagrams
    static constexpr std::size_t LONGEST = 1800; ///< octets; no network passes on more without tearing it apart
    static constexpr std::size_t ROOM = 2048;    ///< what a received one may grow to in its place

    DatagramBatch();

    /// Takes what has come, without waiting: how many datagrams.
    unsigned int receive(int descriptor);
    /// REQUIRES: index is below what `receive` returned last. @{
    std::span<unsigned char> getOctets(unsigned int index)
    {
        return {m_octets[index].data(), m_received[index].msg_len};
    }
    DatagramAddress const& getSource(unsigned int index);
    bool isCut(unsigned int index) const { return (m_received[index].msg_hdr.msg_flags & MSG_TRUNC) != 0; }
    /// @}

    /// Sets one more out to be sent, at most MOST. The octets and the address must stay until then.
    void queue(std::span<unsigned char> octets, DatagramAddress const& to);
    /// Sends what was queued: how many the system took.
    unsigned int send(int descriptor);

private:
    std::array<std::array<unsigned char, ROOM>, MOST> m_octets;
    std::array<DatagramAddress, MOST> m_sources;
    std::array<iovec, MOST> m_receivedVectors{};
    std::array<mmsghdr, MOST> m_received{};
    std::array<iovec, MOST> m_sentVectors{};
    std::array<mmsghdr, MOST> m_sent{};
    unsigned int m_queued = 0;
};
