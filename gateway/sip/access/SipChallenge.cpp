#include "sip/access/SipChallenge.h"

#include "sip/message/SipText.h"

#include <cstdio>

namespace
{
constexpr std::size_t CLIENT_NONCE = 8; // octets

/// The first that we know of "auth-int,auth", and "auth" rather than the other; nothing when it is neither.
std::optional<std::string> QUALITY_OF(std::string_view list)
{
    if (list.empty())
        return std::string();
    bool hasIntegrity = false;
    while (!list.empty())
    {
        std::string_view const one = SipText::CUT(list, ',');
        if (SipText::EQUALS_IGNORING_CASE(one, "auth"))
            return "auth";
        hasIntegrity = hasIntegrity || SipText::EQUALS_IGNORING_CASE(one, "auth-int");
    }
    return hasIntegrity ? std::optional<std::string>("auth-int") : std::nullopt;
}

std::string EIGHT_DIGITS(unsigned int number)
{
    char text[9];
    snprintf(text, sizeof text, "%08x", number);
    return text;
}
} // namespace

std::string SipChallenge::PARAMETER(msg_auth_t const& header, std::string_view name)
{
    for (msg_param_t const* parameter = header.au_params; parameter != nullptr && *parameter != nullptr; ++parameter)
    {
        std::string_view const text = *parameter;
        std::size_t const equals = text.find('=');
        if (equals == std::string_view::npos ||
            !SipText::EQUALS_IGNORING_CASE(SipText::TRIM(text.substr(0, equals)), name))
            continue;
        std::string_view value = SipText::TRIM(text.substr(equals + 1));
        if (value.size() >= 2 && value.front() == '"' && value.back() == '"')
            value = value.substr(1, value.size() - 2);
        return std::string(value);
    }
    return {};
}

std::optional<SipChallenge> SipChallenge::READ(msg_auth_t const& header, bool isOfProxy)
{
    if (header.au_scheme == nullptr || !SipText::EQUALS_IGNORING_CASE(header.au_scheme, "Digest"))
        return std::nullopt;
    std::string const name = PARAMETER(header, "algorithm");
    std::optional<SipDigest::Algorithm> const algorithm = SipDigest::NAMED(name);
    std::optional<std::string> const quality = QUALITY_OF(PARAMETER(header, "qop"));
    SipChallenge challenge;
    challenge.realm = PARAMETER(header, "realm");
    challenge.nonce = PARAMETER(header, "nonce");
    if (!algorithm || !quality || challenge.realm.empty() || challenge.nonce.empty())
        return std::nullopt;
    challenge.isOfProxy = isOfProxy;
    challenge.algorithm = *algorithm;
    challenge.algorithmName = name;
    challenge.opaque = PARAMETER(header, "opaque");
    challenge.quality = *quality;
    challenge.isStale = SipText::EQUALS_IGNORING_CASE(PARAMETER(header, "stale"), "true");
    return challenge;
}

std::string SipChallenge::answer(Credentials const& credentials, std::string_view method, std::string_view uri,
                                 std::string_view body, unsigned int count) const
{
    std::string const number = EIGHT_DIGITS(count);
    std::string const clientNonce = quality.empty() ? std::string() : SipDigest::RANDOM(CLIENT_NONCE);
    std::string const response =
        SipDigest::RESPONSE(credentials.secret, {algorithm, method, uri, nonce, quality, number, clientNonce, body});
    std::string line = isOfProxy ? "Proxy-Authorization" : "Authorization";
    line += ": Digest username=\"" + credentials.user + "\", realm=\"" + realm + "\", nonce=\"" + nonce + "\", uri=\"";
    line.append(uri).append("\", response=\"").append(response).append("\"");
    if (!algorithmName.empty())
        line += ", algorithm=" + algorithmName;
    if (!quality.empty())
        line += ", cnonce=\"" + clientNonce + "\", qop=" + quality + ", nc=" + number;
    if (!opaque.empty())
        line += ", opaque=\"" + opaque + "\"";
    return line + "\r\n";
}
