#include "media/rtp/TelephoneEventSender.h"

#include <algorithm>

bool TelephoneEventSender::add(char digit, unsigned int milliseconds)
{
    unsigned char const event = TelephoneEvent::EVENT_OF(digit);
    if (event > 15 || m_size == ROOM)
        return false;
    auto const ticks = static_cast<unsigned short>(std::clamp(milliseconds, 40u, 5000u) / TICK);
    m_waiting[(m_first + m_size++) % ROOM] = {event, ticks};
    return true;
}

std::optional<TelephoneEventSender::Packet> TelephoneEventSender::tick(unsigned int clockRate)
{
    if (m_size == 0)
        return std::nullopt;
    Waiting const& digit = m_waiting[m_first];
    unsigned int const ticks = ++m_ticks;
    unsigned int const last = digit.ticks + ENDS - 1u;
    if (ticks > last)
    {
        if (ticks >= last + SILENCE)
        {
            m_first = (m_first + 1) % ROOM;
            --m_size;
            m_ticks = 0;
        }
        return std::nullopt;
    }
    // the field holds eight seconds at 8 kHz, but little more than one at 48
    unsigned int const duration =
        std::min(std::min<unsigned int>(ticks, digit.ticks) * clockRate / 1000 * TICK, 65535u);
    return Packet{{digit.event, ticks >= digit.ticks, 10, static_cast<std::uint16_t>(duration)}, ticks == 1};
}
