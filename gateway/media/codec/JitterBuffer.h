#pragma once

#include "media/rtp/RtpPacket.h"
#include "platform/media/MG_Rtp.h"

#include <array>

/// Packets between their arrival, as the network has it, and their evenly timed use.
///
/// It keeps as little as the stream needs: a packet that comes too late for its moment makes all that follow later by
/// so much, and when for some seconds there was always more than enough, one packet is given up. So the delay follows
/// the jitter up at once and down slowly.
///
///     buffer.put(header, codec, payload);
///     switch (buffer.next(slot)) // whenever a packet's worth of sound is needed
class JitterBuffer
{
public:
    static constexpr std::size_t SLOTS = 32;
    static constexpr std::size_t LONGEST = 1780; ///< octets of payload; longer ones are not taken

    struct Slot
    {
        bool isUsed = false;
        std::uint16_t sequence = 0;
        MG_Rtp::ECodec::Type codec = MG_Rtp::ECodec::NONE;
        std::size_t length = 0;
        std::array<unsigned char, LONGEST> payload;
    };
    enum Result
    {
        PACKET,
        LOST, ///< a later one is there: this one will hardly come
        EMPTY ///< nothing is there, or is to be used yet
    };

    /// A packet that came, in any order.
    void put(RtpHeader const& header, MG_Rtp::ECodec::Type codec, std::span<unsigned char const> payload);
    /// What is next. PACKET: in `slot`, until the next call.
    Result next(Slot const*& slot);

    /// Packets that are there, gaps among them.
    unsigned int getDepth() const;
    /// Packets that came when their moment was over, and that were given up to catch up. @{
    unsigned int getLate() const { return m_late; }
    unsigned int getDropped() const { return m_dropped; }
    /// @}

private:
    void begin(RtpHeader const& header);
    bool isPatient();
    void shorten();

    std::array<Slot, SLOTS> m_slots;
    bool m_hasBegun = false;
    bool m_isPlaying = false;
    std::uint32_t m_source = 0;
    std::uint16_t m_next = 0;    // to be used
    std::uint16_t m_highest = 0; // that came; one below m_next: none is there
    unsigned int m_waited = 0;   // before playing
    unsigned int m_empty = 0;    // in a row
    unsigned int m_holds = 0;    // to be answered with EMPTY, so that the delay grows
    unsigned int m_taken = 0;    // since it was last looked whether less would do
    unsigned int m_least = SLOTS;
    unsigned int m_late = 0;
    unsigned int m_dropped = 0;
};
