#pragma once

#include "configuration/AddressRange.h"

#include <cstddef>
#include <list>
#include <map>
#include <utility>

/// What is remembered of addresses, a bounded number of them: when another comes, the one that was used least lately is
/// forgotten, at a cost that does not grow with their number. (They are in an order, since whoever chooses addresses
/// could make those of a hash collide.) One thread.
///
///     ++sources.use(address).requests;
template <class Record>
class SipSources
{
public:
    explicit SipSources(std::size_t most) : m_most(most) {}

    /// Of an address that was not there a new one. Throws std::bad_alloc.
    Record& use(InternetAddress const& address)
    {
        if (auto const found = m_places.find(address); found != m_places.end())
        {
            m_sources.splice(m_sources.end(), m_sources, found->second);
            return found->second->second;
        }
        if (m_places.size() >= m_most)
            erase(m_sources.front().first);
        auto const [place, isNew] = m_places.try_emplace(address);
        try
        {
            place->second = m_sources.insert(m_sources.end(), {address, Record()});
        }
        catch (std::bad_alloc const&)
        {
            m_places.erase(place);
            throw;
        }
        return place->second->second;
    }
    /// Does not count as use; null: it is not there.
    Record const* find(InternetAddress const& address) const
    {
        auto const found = m_places.find(address);
        return found != m_places.end() ? &found->second->second : nullptr;
    }
    void erase(InternetAddress address)
    {
        auto const found = m_places.find(address);
        if (found == m_places.end())
            return;
        m_sources.erase(found->second);
        m_places.erase(found);
    }
    std::size_t getSize() const { return m_places.size(); }

    // --- those that were used least lately first
    auto begin() const { return m_sources.begin(); }
    auto end() const { return m_sources.end(); }

private:
    using Sources = std::list<std::pair<InternetAddress, Record>>;

    std::size_t m_most;
    Sources m_sources; // in the order of their use
    std::map<InternetAddress, typename Sources::iterator> m_places;
};
