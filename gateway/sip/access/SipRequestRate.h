#pragma once

#include "host/CallRate.h"
#include "sip/access/SipSources.h"

#include <string>
#include <utility>

/// How many requests that begin nothing which is limited otherwise one address may send in a second, of those that
/// belong to no dialog: each of them would take memory for as long as a transaction lasts. Counts those beyond, and has
/// the log tell of each address once a minute. One thread.
///
///     if (!rate.admit(source))
///         ... // drop it
class SipRequestRate
{
public:
    static constexpr std::size_t MOST = 4096; ///< addresses that are remembered
    static constexpr long BETWEEN_WORDS = 60; ///< seconds

    /// `perSecond`: 0: no limit.
    SipRequestRate(std::string interface, unsigned int perSecond)
        : m_interface(std::move(interface)), m_perSecond(perSecond)
    {
    }

    void setLimit(unsigned int perSecond) { m_perSecond = perSecond; }
    /// Whether the request may be looked at; it then counts. Throws std::bad_alloc.
    bool admit(InternetAddress const& source);
    unsigned long long getNumberOfRefused() const { return m_refused; }

private:
    struct Source
    {
        CallRate rate{0};
        unsigned long long refused = 0; ///< since the log was told
        long told = -BETWEEN_WORDS;     ///< seconds: when
    };

    void complain(InternetAddress const& address, Source& source) const;

    std::string m_interface;
    unsigned int m_perSecond;
    SipSources<Source> m_sources{MOST};
    unsigned long long m_refused = 0;
};
