#include "properties/CC_Flags.h"

#include <algorithm>
#include <bit>
#include <new>
#include <utility>

CC_Flags::CC_Flags(CC_Flags&& other) noexcept
    : m_capacity(std::exchange(other.m_capacity, 0)), m_count(std::exchange(other.m_count, 0))
{
    std::copy_n(other.m_inline, INLINE, m_inline);
    if (other.m_entries != other.m_inline)
        m_entries = std::exchange(other.m_entries, other.m_inline);
}

CC_Flags& CC_Flags::operator=(CC_Flags const& other)
{
    if (this == &other)
        return *this;
    unsigned int copied = other.m_count;
    if (copied > m_capacity)
    {
        m_count = 0; // what enlarge need not copy
        if (!enlarge(copied).isOk())
            copied = m_capacity;
    }
    std::copy_n(other.m_entries, copied, m_entries);
    m_count = copied;
    return *this;
}

XCode CC_Flags::set(unsigned int bit, bool value)
{
    unsigned int const word = WORD_OF(bit);
    Entry* position = m_entries;
    Entry* const end = m_entries + m_count;
    while (position != end && position->wordIndex < word)
        ++position;
    if (position != end && position->wordIndex == word)
    {
        position->bits = value ? position->bits | MASK_OF(bit) : position->bits & ~MASK_OF(bit);
        return XCode::OK;
    }
    return value ? insert(static_cast<unsigned int>(position - m_entries), {word, MASK_OF(bit)}) : XCode::OK;
}

XCode CC_Flags::insert(unsigned int index, Entry entry)
{
    if (m_count == m_capacity && m_capacity < INLINE)
        ++m_capacity;
    else if (m_count == m_capacity)
    {
        if (XCode const enlarged = enlarge(m_capacity + 1); !enlarged.isOk()) // by one: there are only a few words
            return enlarged;
    }
    for (unsigned int i = m_count; i > index; --i) // few, and nearly always none
        m_entries[i] = m_entries[i - 1];
    m_entries[index] = entry;
    ++m_count;
    return XCode::OK;
}

unsigned int CC_Flags::getFirstSet(unsigned int from) const
{
    unsigned int const word = WORD_OF(from);
    for (unsigned int i = 0; i < m_count; ++i)
    {
        Entry const& entry = m_entries[i];
        if (entry.wordIndex < word)
            continue;
        unsigned int const candidates = entry.wordIndex == word ? entry.bits & ~(MASK_OF(from) - 1) : entry.bits;
        if (candidates != 0)
            return entry.wordIndex * BITS_PER_WORD + static_cast<unsigned int>(std::countr_zero(candidates));
    }
    return NONE;
}

bool CC_Flags::isEmpty() const
{
    if (m_count == 0)
        return true;
    unsigned int const volatile& bits = m_entries[0].bits; // another thread may set them; a plain loop may be deleted
    while (bits == 0)
    {
    }
    return false;
}

XCode CC_Flags::enlarge(unsigned int newCapacity)
{
    if (newCapacity < m_count)
        return XCode::REFUSED;
    Entry* const entries = newCapacity <= INLINE ? m_inline : new (std::nothrow) Entry[newCapacity]();
    if (entries == nullptr)
        return XCode::NO_ELEMENT;
    if (entries != m_entries)
    {
        std::copy_n(m_entries, m_count, entries);
        release();
        m_entries = entries;
    }
    m_capacity = newCapacity;
    return XCode::OK;
}
