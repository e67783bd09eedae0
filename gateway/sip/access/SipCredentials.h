#pragma once

#include "sip/access/SipChallenge.h"
#include "sip/access/SipPasswords.h"

#include <memory>
#include <string>
#include <vector>

/// What an interface shows to its peer when that asks who we are (RFC 3261, 22; RFC 8760).
///
/// A peer that has asked once is shown it with each request from then on, counted as the peer's nonce wants it; so a
/// call costs another round trip only when the nonce has expired. Nothing is shown to a realm without a password.
///
///     credentials.sign(request);
///     ... // 401 or 407
///     if (!credentials.take(request, response, tries)) // the answer stands
class SipCredentials
{
public:
    struct Counters
    {
        unsigned long long answered = 0; ///< challenges
        unsigned long long refused = 0;  ///< credentials that the peer does not take, or asks for and we have not
    };

    /// `name` of the interface, for the log.
    SipCredentials(std::string name, std::string user, std::shared_ptr<SipPasswords const> passwords)
        : m_name(std::move(name)), m_user(std::move(user)), m_passwords(std::move(passwords))
    {
    }

    /// Adds what the peer is known to want, in place of what is there. The request must have its method and URI.
    void sign(msg_t* request);
    /// Whether the request is to be sent once more, signed, for such an answer. `tries`: how many times it was already.
    /// Another nonce instead of one that is stale is taken a few times, wrong credentials are shown once.
    bool take(sip_t const* request, sip_t const* response, unsigned int tries);
    Counters const& getCounters() const { return m_counters; }

private:
    /// What one realm wants.
    struct Known
    {
        SipChallenge challenge;
        std::string secret;
        unsigned int count = 0;
    };

    bool takeFrom(msg_auth_t const* challenges, msg_auth_t const* shown, bool isOfProxy, unsigned int tries);
    bool note(SipChallenge const& challenge);
    void complain(char const* what, std::string const& realm);

    std::string m_name;
    std::string m_user;
    std::shared_ptr<SipPasswords const> m_passwords;
    std::vector<Known> m_known;
    Counters m_counters;
    long m_lastComplaint = 0; // seconds
};
