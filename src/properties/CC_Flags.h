#pragma once

#include "platform/base/Export.h"
#include "platform/base/XCode.h"

#include <bit>

/// A set of property ids, as bits of which only the 32-bit words that hold any are stored: which properties changed.
/// A value; not locked.
///
/// Ids crowd around 0x400000, so a set is one to a few words and grows by exactly one at a time. The first two lie in
/// the object itself: a set that travels with an event needs no memory.
///
///     CC_Flags changed;
///     if (changed.set(CC_PropertyId::STATE, true).isOk() && changed.get(CC_PropertyId::STATE))
///         ...
///     for (unsigned int id = changed.getFirstSet(0); id != CC_Flags::NONE; id = changed.getFirstSet(id + 1))
///         ...
class CC_EXPORT CC_Flags
{
public:
    /// One stored word: bit n of `bits` stands for the number 32 * `wordIndex` + n.
    struct Entry
    {
        /// The word's number, 0 to 0x7ffffff, and its bits. @{
        unsigned int wordIndex;
        unsigned int bits;
        /// @}
    };
    /// What getFirstSet returns when there is none.
    static constexpr unsigned int NONE = 0xffffffff;

    CC_Flags() = default; ///< empty, with room for nothing
    /// As the assignment: without memory words are missing.
    CC_Flags(CC_Flags const& other) { *this = other; }
    /// Leaves `other` empty; needs no memory.
    CC_Flags(CC_Flags&& other) noexcept;
    ~CC_Flags() { release(); }
    /// The capacity never shrinks, which is why an assignment never takes the other's memory over. When memory is out,
    /// as many words as fit are copied and the rest is missing; nothing tells so.
    CC_Flags& operator=(CC_Flags const& other);

    /// Whether the number is in the set.
    bool get(unsigned int bit) const
    {
        unsigned int const word = WORD_OF(bit);
        for (Entry const* entry = m_entries; entry != m_entries + m_count && entry->wordIndex <= word; ++entry)
            if (entry->wordIndex == word)
                return (entry->bits & MASK_OF(bit)) != 0;
        return false;
    }
    /// OK, or NO_ELEMENT when a word is needed and memory is out; the set is then unchanged. A word whose bits all
    /// become clear stays in place.
    XCode set(unsigned int bit, bool value);
    /// The lowest number in the set that is not below `from`, or NONE.
    unsigned int getFirstSet(unsigned int from) const;

    /// Calls `handle(number)` for each number in the set, upward, as long as that returns true; whether it always did.
    template <class Handle>
    bool forEachSet(Handle&& handle) const
    {
        for (Entry const* entry = m_entries; entry != m_entries + m_count; ++entry)
            for (unsigned int bits = entry->bits; bits != 0; bits &= bits - 1)
                if (!handle(entry->wordIndex * 32 + static_cast<unsigned int>(std::countr_zero(bits))))
                    return false;
        return true;
    }

    /// Whether nothing was set since the set was made or cleared.
    ///
    /// It looks at the first word alone. If that word's bits were all taken back by `set(bit, false)`, the operation
    /// waits until another thread sets one: intended, a set is emptied by `clear()` and never bit by bit.
    bool isEmpty() const;
    /// Empties the set; the memory stays for the next use.
    void clear() { m_count = 0; }

    /// Makes room for exactly `newCapacity` words. OK; REFUSED below the number of words in use; NO_ELEMENT when memory
    /// is needed and out. The set is unchanged unless OK.
    XCode enlarge(unsigned int newCapacity);

    unsigned int getCapacity() const { return m_capacity; } ///< words there is room for
    unsigned int getCount() const { return m_count; }       ///< words in use
    /// The words in use, in ascending order. REQUIRES: index < getCount()
    Entry const& getEntry(unsigned int index) const { return m_entries[index]; }

private:
    static constexpr unsigned int INLINE = 2;
    static constexpr unsigned int BITS_PER_WORD = 32;

    static constexpr unsigned int WORD_OF(unsigned int bit) { return bit / BITS_PER_WORD; }
    static constexpr unsigned int MASK_OF(unsigned int bit) { return 1U << (bit % BITS_PER_WORD); }

    XCode insert(unsigned int index, Entry entry);
    void release()
    {
        if (m_entries != m_inline)
            delete[] m_entries;
    }

    unsigned int m_capacity = 0;
    unsigned int m_count = 0;
    Entry m_inline[INLINE] = {};
    Entry* m_entries = m_inline; // elsewhere if the capacity is more
};
