#pragma once

#include "sip/access/SipSources.h"

#include <cstddef>

/// Keeps answers to those whose address may be made up from being a weapon against whoever has that address: beyond a
/// first few octets, which a phone's first question needs, a source gets no more than it has sent. Who has shown that
/// answers reach it (it knows a nonce of ours) is no such source for an hour.
///
/// Bounded: of so many sources the one that was heard of least lately is forgotten when another comes. One thread.
class SipReflection
{
public:
    static constexpr std::size_t CREDIT = 4096; ///< octets
    static constexpr std::size_t MOST = 4096;   ///< sources
    static constexpr long MEMORY = 3600;        ///< seconds

    explicit SipReflection(std::size_t most = MOST) : m_records(most) {}

    /// Whether the answer may be sent; it then counts. Throws std::bad_alloc.
    bool admit(InternetAddress const& source, std::size_t octetsOfRequest, std::size_t octetsOfAnswer);
    /// Throws std::bad_alloc.
    void noteReached(InternetAddress const& source);
    unsigned long long getNumberOfHeldBack() const { return m_heldBack; }

private:
    struct Record
    {
        std::size_t received = 0;
        std::size_t sent = 0;
        long reached = 0; ///< until then answers do not count
        long last = 0;
    };

    Record& find(InternetAddress const& source, long now);

    SipSources<Record> m_records;
    unsigned long long m_heldBack = 0;
};
