#pragma once

#include "sip/access/SipBans.h"
#include "sip/access/SipNonces.h"
#include "sip/access/SipPasswords.h"
#include "sip/stack/Sofia.h"

#include <memory>
#include <string>
#include <vector>

/// Asks who sends, and knows by the file of passwords whether it is true (RFC 3261, 22; RFC 7616; RFC 8760).
///
/// Nothing in the answers, nor in how long they take, says whether there is such a user. Asking costs no memory. A
/// password is tried against a nonce of ours alone, so who fails has got one: his address is not made up.
class SipAuthentication
{
public:
    struct Counters
    {
        unsigned long long accepted = 0;
        unsigned long long asked = 0;     ///< who has shown nothing
        unsigned long long wrong = 0;     ///< passwords and users
        unsigned long long stale = 0;     ///< nonces, expired or not ours
        unsigned long long replayed = 0;  ///< nonces, with a count that was used
        unsigned long long moved = 0;     ///< credentials that were shown for somebody else to be called
        unsigned long long ignored = 0;   ///< messages of those who are banned
        unsigned long long emergency = 0; ///< calls that were taken of somebody who is not known
    };
    enum Verdict
    {
        ACCEPTED, ///< `user` is who it is
        ASK,      ///< 401 with `challenge`
        REFUSE,   ///< 400
        IGNORE
    };
    struct Decision
    {
        Verdict verdict;
        std::string user;
        std::string challenge;  ///< whole lines
        bool isReached = false; ///< who sends has got an answer of ours: it knows a nonce that was for it
    };

    /// `name` of the interface, for the log.
    SipAuthentication(std::string name, std::string realm, std::vector<SipDigest::Algorithm> algorithms,
                      std::shared_ptr<SipPasswords const> passwords);

    /// `isEmergency`: who shows nothing, or nothing that is right, is accepted all the same, as nobody that is known.
    /// What he shows counts for nothing, so that nobody guesses passwords that way.
    Decision check(sip_t const* request, InternetAddress const& source, bool isEmergency = false);
    Counters const& getCounters() const { return m_counters; }
    std::size_t getNumberOfBanned() const { return m_bans.getNumberOfBanned(); }

private:
    /// What a request shows for our realm.
    struct Shown
    {
        SipDigest::Algorithm algorithm;
        std::string user;
        std::string nonce;
        std::string uri;
        std::string response;
        std::string quality;
        std::string count;
        std::string clientNonce;
    };
    enum Finding
    {
        RIGHT,
        NOTHING,
        WRONG,
        STALE,
        REPLAYED,
        MOVED
    };

    Decision checkEmergency(sip_t const* request, InternetAddress const& source);
    Finding examine(sip_t const* request, InternetAddress const& source, Shown& shown);
    bool read(sip_t const* request, Shown& shown) const;
    static bool IS_MEANT(sip_t const* request, Shown const& shown);
    bool isRight(sip_t const* request, Shown const& shown) const;
    void onWrong(InternetAddress const& source);
    std::string makeChallenge(InternetAddress const& source, bool isStale) const;

    std::string m_name;
    std::string m_realm;
    std::vector<SipDigest::Algorithm> m_algorithms;
    std::shared_ptr<SipPasswords const> m_passwords;
    std::string m_nobody; // the password of those who are not in the file
    SipNonces m_nonces;
    SipBans m_bans;
    Counters m_counters;
};
