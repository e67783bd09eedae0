#pragma once

#include "sip/access/SipSources.h"

#include <cstddef>

/// Who has failed too often to say who he is, by his address; of version 6 by its first 64 bits, which are one party's.
/// Each ban is twice as long as the one before, up to an hour. A bounded number of addresses is kept, of those that
/// were banned and of the others; the one that has failed least lately of its kind goes when another comes.
class SipBans
{
public:
    static constexpr unsigned int PATIENCE = 5; ///< failures before a ban, and between two
    static constexpr long FIRST = 60;           ///< seconds
    static constexpr long LONGEST = 3600;       ///< seconds; without a failure for so long all is forgotten
    static constexpr std::size_t MOST = 4096;

    explicit SipBans(std::size_t most = MOST) : m_failing(most), m_banned(most) {}

    /// One more failure. Seconds of the ban that begins with it; 0: none does.
    long note(InternetAddress const& source);
    bool isBanned(InternetAddress const& source) const;
    std::size_t getNumberOfBanned() const;

private:
    struct Record
    {
        unsigned int failures = 0; ///< since the last ban
        long ban = 0;              ///< seconds: the last one
        long until = 0;
        long last = 0; ///< failure
    };

    Record& find(InternetAddress const& party);

    SipSources<Record> m_failing; // not banned yet
    SipSources<Record> m_banned;  // once
};
