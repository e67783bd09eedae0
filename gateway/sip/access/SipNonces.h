#pragma once

#include "configuration/AddressRange.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <string_view>

/// The nonces that we give to those whom we ask for credentials, and how often each was used.
///
/// A nonce says itself when it was given and to which address, under a seal, so that asking needs no memory. Only those
/// that came back with the right password are kept, a bounded number of them: of others the oldest is forgotten, and
/// with it all that are as old, so that none is ever taken twice with the same count.
class SipNonces
{
public:
    static constexpr long LIFETIME = 300; ///< seconds
    static constexpr std::size_t MOST = 16384;

    enum Use
    {
        GOOD,
        EXPIRED,
        REPLAYED
    };

    /// `most`: how many are kept.
    explicit SipNonces(std::size_t most = MOST);

    std::string make(InternetAddress const& source) const;
    /// Whether we have given it to that address; how long ago does not matter.
    bool isOurs(std::string_view nonce, InternetAddress const& source) const;
    /// One of ours came back with that count and the right password.
    Use use(std::string const& nonce, std::uint32_t count);

private:
    /// Counts may come in another order than they were sent in, within limits.
    struct Counts
    {
        std::uint32_t highest = 0;
        std::uint64_t seen = 0; ///< bit n: the highest but n
    };

    std::string seal(std::string_view beginning, InternetAddress const& source) const;
    void forgetOldest();

    std::string m_key;
    std::size_t m_most;
    std::map<std::string, Counts, std::less<>> m_used; // they begin with their times, so the oldest is the first
    long m_forgotten = 0;                              // seconds; what is as old is taken as expired
};
