#include "media/codec/JitterBuffer.h"

#include <algorithm>
#include <utility>

namespace
{
constexpr unsigned int FIRST_WAIT = 1; // packets; until jitter shows, so much must do
constexpr unsigned int MOST_WAIT = 10; // packets; what is deeper is given up
constexpr unsigned int MOST_EMPTY = 5; // in a row: a pause, after which it begins to wait anew
constexpr unsigned int WINDOW = 250;   // packets, 5 s
constexpr int MISORDER = 100;          // what lies farther back is another stream

int DISTANCE(std::uint16_t from, std::uint16_t to) { return static_cast<std::int16_t>(to - from); }
} // namespace

void JitterBuffer::begin(RtpHeader const& header)
{
    for (Slot& slot : m_slots)
        slot.isUsed = false;
    m_hasBegun = true;
    m_isPlaying = false;
    m_source = header.source;
    m_next = header.sequence;
    m_highest = static_cast<std::uint16_t>(m_next - 1);
    m_waited = m_empty = m_holds = m_taken = 0;
    m_least = SLOTS;
}

void JitterBuffer::put(RtpHeader const& header, MG_Rtp::ECodec::Type codec, std::span<unsigned char const> payload)
{
    if (payload.size() > LONGEST)
        return;
    int const ahead = DISTANCE(m_next, header.sequence);
    if (!m_hasBegun || header.source != m_source || ahead >= static_cast<int>(SLOTS) || ahead < -MISORDER)
        begin(header);
    else if (ahead < 0)
    {
        ++m_late;
        m_holds = 1; // had all been used later by one, it would have come in time
        return;
    }
    Slot& slot = m_slots[header.sequence % SLOTS];
    slot.isUsed = true;
    slot.sequence = header.sequence;
    slot.codec = codec;
    slot.length = payload.size();
    std::copy(payload.begin(), payload.end(), slot.payload.begin());
    if (DISTANCE(m_highest, header.sequence) > 0)
        m_highest = header.sequence;
}

unsigned int JitterBuffer::getDepth() const
{
    return m_hasBegun ? static_cast<unsigned int>(std::max(DISTANCE(m_next, m_highest) + 1, 0)) : 0;
}

/// Whether it waits for more to come before it gives anything.
bool JitterBuffer::isPatient()
{
    if (m_isPlaying)
        return std::exchange(m_holds, 0) != 0 && getDepth() < MOST_WAIT;
    m_isPlaying = getDepth() > FIRST_WAIT || m_waited++ >= FIRST_WAIT;
    return !m_isPlaying;
}

JitterBuffer::Result JitterBuffer::next(Slot const*& slot)
{
    if (getDepth() == 0)
    {
        if (++m_empty > MOST_EMPTY)
            m_isPlaying = false;
        m_waited = 0;
        m_least = 0;
        return EMPTY;
    }
    m_empty = 0;
    if (isPatient())
        return EMPTY;
    shorten();
    Slot& found = m_slots[m_next % SLOTS];
    bool const isThere = found.isUsed && found.sequence == m_next;
    found.isUsed = false;
    ++m_next;
    slot = &found;
    return isThere ? PACKET : LOST;
}

void JitterBuffer::shorten()
{
    m_least = std::min(m_least, getDepth() - 1);
    bool const isWindowOver = ++m_taken >= WINDOW;
    while (getDepth() > MOST_WAIT || (isWindowOver && m_least > 0))
    {
        ++m_next;
        ++m_dropped;
        m_least = 0;
    }
    if (isWindowOver)
        m_taken = 0, m_least = SLOTS;
}
