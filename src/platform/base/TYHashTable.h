#pragma once

#include "platform/base/String.h"
#include "platform/base/XCode.h"

#include <cstddef>
#include <functional>
#include <new>
#include <string_view>
#include <utility>
#include <vector>

/// How keys are spread over the buckets: numbers by their remainder, strings by a hash of their bytes.
/// `Argument`: as what a key is looked up; for strings any text, so that looking up a literal needs no memory.
template <class Key>
struct TYHash
{
    /// A number is its own hash. @{
    using Argument = Key const&;
    std::size_t operator()(Key const& key) const { return static_cast<std::size_t>(key); }
    /// @}
};
/// Hashes the text.
template <>
struct TYHash<String>
{
    /// The whole text counts, not that up to a NUL. @{
    using Argument = std::string_view;
    std::size_t operator()(std::string_view key) const { return std::hash<std::string_view>()(key); }
    /// @}
};

/// A table with a fixed number of buckets that also keeps its entries in the order in which they were added.
/// It does not own what its values point to. Constructing one throws std::bad_alloc when memory is out.
template <class Key, class Value>
class TYHashTable
{
public:
    /// What a key is looked up by.
    using Argument = typename TYHash<Key>::Argument;

    /// One key with its value, as walks see it.
    class Entry
    {
    public:
        /// As they were added. @{
        Key const& getKey() const { return m_key; }
        Value const& getValue() const { return m_value; }
        /// @}
        Entry const* getNext() const { return m_next; } ///< the entry added after this one, or null

    private:
        friend class TYHashTable;
        Entry(Key const& key, Value const& value) : m_key(key), m_value(value) {}
        Key m_key;
        Value m_value;
        Entry* m_chain = nullptr; // in the bucket
        Entry* m_previous = nullptr;
        Entry* m_next = nullptr;
    };

    /// `buckets`: at least 1 (0 counts as 1); the table takes any number of entries, but slows down with many in each.
    explicit TYHashTable(std::size_t buckets) : m_buckets(buckets == 0 ? 1 : buckets) {}
    ~TYHashTable() { clear(); }
    TYHashTable(TYHashTable const&) = delete;
    TYHashTable& operator=(TYHashTable const&) = delete;

    /// How many entries there are, and the one that was added first; null when there is none. @{
    unsigned int getCount() const { return m_count; }
    Entry const* getFirst() const { return m_first; }
    /// @}

    /// The entry, null when there is none; it lives until it is removed.
    Entry const* find(Argument key) const
    {
        Entry const* entry = m_buckets[bucketOf(key)];
        while (entry != nullptr && !(entry->m_key == key))
            entry = entry->m_chain;
        return entry;
    }
    /// The value under `key`, or `Value()` (null for a table of pointers).
    Value get(Argument key) const
    {
        Entry const* const entry = find(key);
        return entry == nullptr ? Value() : entry->m_value;
    }

    /// OK; REFUSED when the key is present; NO_ELEMENT when memory is out. The table is unchanged unless OK.
    XCode add(Key const& key, Value const& value)
    {
        if (find(key) != nullptr)
            return XCode::REFUSED;
        Entry* const entry = CREATE(key, value);
        if (entry == nullptr)
            return XCode::NO_ELEMENT;
        Entry*& bucket = m_buckets[bucketOf(key)];
        entry->m_chain = bucket;
        bucket = entry;
        entry->m_previous = m_last;
        (m_last != nullptr ? m_last->m_next : m_first) = entry;
        m_last = entry;
        ++m_count;
        return XCode::OK;
    }

    /// Whether there was such an entry.
    bool remove(Argument key) { return remove(key, nullptr); }
    /// Moves the entry's key to `removed`, unless that is null.
    bool remove(Argument key, Key* removed)
    {
        Entry** link = &m_buckets[bucketOf(key)];
        while (*link != nullptr && !((*link)->m_key == key))
            link = &(*link)->m_chain;
        Entry* const entry = *link;
        if (entry == nullptr)
            return false;
        *link = entry->m_chain;
        (entry->m_previous != nullptr ? entry->m_previous->m_next : m_first) = entry->m_next;
        (entry->m_next != nullptr ? entry->m_next->m_previous : m_last) = entry->m_previous;
        --m_count;
        if (removed != nullptr)
            *removed = std::move(entry->m_key);
        delete entry;
        return true;
    }

    /// Ends all entries.
    void clear()
    {
        while (m_first != nullptr)
        {
            Entry* const next = m_first->m_next;
            delete m_first;
            m_first = next;
        }
        m_last = nullptr;
        m_count = 0;
        for (Entry*& bucket : m_buckets)
            bucket = nullptr;
    }

private:
    std::size_t bucketOf(Argument key) const { return TYHash<Key>()(key) % m_buckets.size(); }
    static Entry* CREATE(Key const& key, Value const& value)
    {
        try
        {
            return new Entry(key, value);
        }
        catch (std::bad_alloc const&)
        {
            return nullptr;
        }
    }

    std::vector<Entry*> m_buckets;
    Entry* m_first = nullptr;
    Entry* m_last = nullptr;
    unsigned int m_count = 0;
};

/// The tables of the library, by the type of their keys. @{
template <class Value>
using INStringHashTable = TYHashTable<String, Value>;
template <class Value>
using TYStringHashTable = TYHashTable<String, Value>;
template <class Value>
using TYUInt32HashTable = TYHashTable<unsigned int, Value>;
template <class Value>
using TYInt32HashTable = TYHashTable<int, Value>;
/// @}
