#include "sip/access/SipNonces.h"

#include "platform/base/TYTime.h"
#include "sip/access/SipDigest.h"

#include <algorithm>
#include <charconv>
#include <cstdio>

namespace
{
constexpr std::size_t TIME = 8;   // hexadecimal digits
constexpr std::size_t UNIQUE = 8; // octets
constexpr std::size_t BEGINNING = TIME + 2 * UNIQUE;
constexpr std::size_t SEAL = 32;     // hexadecimal digits
constexpr std::uint32_t WINDOW = 64; // counts
constexpr std::size_t KEY = 32;      // octets

long NOW() { return static_cast<long>(TY::Time::NOW(TY::Time::MONOTONIC).seconds); }

long TIME_OF(std::string_view nonce)
{
    unsigned long seconds = 0;
    std::from_chars(nonce.data(), nonce.data() + std::min(TIME, nonce.size()), seconds, 16);
    return static_cast<long>(seconds);
}
} // namespace

SipNonces::SipNonces(std::size_t most) : m_key(SipDigest::RANDOM(KEY)), m_most(most) {}

std::string SipNonces::make(InternetAddress const& source) const
{
    char time[TIME + 1];
    snprintf(time, sizeof time, "%08lx", static_cast<unsigned long>(NOW()) & 0xffffffffu);
    std::string const beginning = time + SipDigest::RANDOM(UNIQUE);
    return beginning + seal(beginning, source);
}

std::string SipNonces::seal(std::string_view beginning, InternetAddress const& source) const
{
    std::string text(beginning);
    text.append(reinterpret_cast<char const*>(source.data()), source.size());
    return SipDigest::SEAL(m_key, text).substr(0, SEAL);
}

bool SipNonces::isOurs(std::string_view nonce, InternetAddress const& source) const
{
    return nonce.size() == BEGINNING + SEAL &&
           SipDigest::ARE_EQUAL(nonce.substr(BEGINNING), seal(nonce.substr(0, BEGINNING), source));
}

SipNonces::Use SipNonces::use(std::string const& nonce, std::uint32_t count)
{
    long const oldest = NOW() - LIFETIME;
    while (!m_used.empty() && TIME_OF(m_used.begin()->first) < oldest)
        m_used.erase(m_used.begin());
    if (TIME_OF(nonce) < oldest || (TIME_OF(nonce) <= m_forgotten && !m_used.contains(nonce)))
        return EXPIRED;
    if (m_used.size() >= m_most && !m_used.contains(nonce))
        forgetOldest();
    Counts& counts = m_used[nonce];
    if (count == 0)
        return REPLAYED;
    if (count > counts.highest)
    {
        std::uint32_t const step = count - counts.highest;
        counts.seen = step < WINDOW ? counts.seen << step : 0;
        counts.highest = count;
    }
    std::uint32_t const behind = counts.highest - count;
    std::uint64_t const bit = behind < WINDOW ? std::uint64_t{1} << behind : 0;
    if (bit == 0 || (counts.seen & bit) != 0)
        return REPLAYED;
    counts.seen |= bit;
    return GOOD;
}

void SipNonces::forgetOldest()
{
    m_forgotten = std::max(m_forgotten, TIME_OF(m_used.begin()->first));
    m_used.erase(m_used.begin());
}
