#pragma once

#include "sip/access/SipDigest.h"
#include "sip/stack/Sofia.h"

#include <optional>
#include <string>
#include <string_view>

/// What a peer wants to know from whom it has asked for credentials: a WWW-Authenticate or Proxy-Authenticate header. A
/// plain value; texts are as they stand in the header, without their quotes.
struct SipChallenge
{
    bool isOfProxy = false;
    SipDigest::Algorithm algorithm = SipDigest::MD5;
    std::string algorithmName; ///< as the peer has written it; empty: not at all
    std::string realm;
    std::string nonce;
    std::string opaque;
    std::string quality; ///< "auth" or "auth-int"; empty: the peer knows none
    bool isStale = false;

    /// Nothing for a scheme, an algorithm or a quality of protection that is not served, or without realm or nonce.
    static std::optional<SipChallenge> READ(msg_auth_t const& header, bool isOfProxy);

    /// What is sent with a request: the whole header, with its line break.
    struct Credentials
    {
        std::string user;
        std::string secret; ///< SipDigest::SECRET
    };
    std::string answer(Credentials const& credentials, std::string_view method, std::string_view uri,
                       std::string_view body, unsigned int count) const;

    /// The parameter of that name, without its quotes; empty where there is none.
    static std::string PARAMETER(msg_auth_t const& header, std::string_view name);
};
