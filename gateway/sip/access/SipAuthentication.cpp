#include "sip/access/SipAuthentication.h"

#include "sip/access/SipChallenge.h"
#include "sip/message/SipParty.h"
#include "sip/message/SipText.h"
#include "sip/stack/SipHandles.h"

#include <algorithm>
#include <arpa/inet.h>
#include <charconv>
#include <spdlog/spdlog.h>

namespace
{
constexpr std::size_t NOBODY = 16; // octets

/// Of a "nc" in hexadecimal digits; one of before RFC 2617 has none, and its nonce serves once.
std::uint32_t COUNT_OF(std::string const& quality, std::string const& text)
{
    std::uint32_t count = quality.empty() ? 1 : 0;
    if (!quality.empty())
        std::from_chars(text.data(), text.data() + text.size(), count, 16);
    return count;
}
} // namespace

SipAuthentication::SipAuthentication(std::string name, std::string realm, std::vector<SipDigest::Algorithm> algorithms,
                                     std::shared_ptr<SipPasswords const> passwords)
    : m_name(std::move(name))
    , m_realm(std::move(realm))
    , m_algorithms(std::move(algorithms))
    , m_passwords(std::move(passwords))
    , m_nobody(SipDigest::RANDOM(NOBODY))
{
}

SipAuthentication::Decision SipAuthentication::check(sip_t const* request, InternetAddress const& source,
                                                     bool isEmergency)
{
    if (isEmergency)
        return checkEmergency(request, source);
    if (m_bans.isBanned(source))
    {
        ++m_counters.ignored;
        return {IGNORE, {}, {}};
    }
    Shown shown{};
    switch (examine(request, source, shown))
    {
    case RIGHT:
        ++m_counters.accepted;
        return {ACCEPTED, shown.user, {}, true};
    case STALE:
        ++m_counters.stale;
        return {ASK, {}, makeChallenge(source, true), m_nonces.isOurs(shown.nonce, source)};
    case WRONG:
        onWrong(source);
        return {ASK, {}, makeChallenge(source, false), true};
    case REPLAYED:
        ++m_counters.replayed;
        return {ASK, {}, makeChallenge(source, false), true};
    case MOVED:
        ++m_counters.moved;
        return {REFUSE, {}, {}, true};
    case NOTHING:
        ++m_counters.asked;
        break;
    }
    return {ASK, {}, makeChallenge(source, false)};
}

SipAuthentication::Decision SipAuthentication::checkEmergency(sip_t const* request, InternetAddress const& source)
{
    Shown shown{};
    bool const isKnown = !m_bans.isBanned(source) && examine(request, source, shown) == RIGHT;
    ++(isKnown ? m_counters.accepted : m_counters.emergency);
    return {ACCEPTED, isKnown ? shown.user : std::string(), {}, isKnown};
}

SipAuthentication::Finding SipAuthentication::examine(sip_t const* request, InternetAddress const& source, Shown& shown)
{
    if (!read(request, shown))
        return NOTHING;
    if (!m_nonces.isOurs(shown.nonce, source)) // that of a process before, or at another address: nothing is tried
        return STALE;
    if (!IS_MEANT(request, shown))
        return MOVED;
    if (!isRight(request, shown))
        return WRONG;
    switch (m_nonces.use(shown.nonce, COUNT_OF(shown.quality, shown.count)))
    {
    case SipNonces::GOOD:
        return RIGHT;
    case SipNonces::EXPIRED:
        return STALE;
    default:
        return REPLAYED;
    }
}

/// False without credentials for our realm that we could have asked for.
bool SipAuthentication::read(sip_t const* request, Shown& shown) const
{
    for (msg_auth_t const* header = request->sip_authorization; header != nullptr; header = header->au_next)
    {
        std::optional<SipDigest::Algorithm> const algorithm =
            SipDigest::NAMED(SipChallenge::PARAMETER(*header, "algorithm"));
        bool const isDigest =
            header->au_scheme != nullptr && SipText::EQUALS_IGNORING_CASE(header->au_scheme, "Digest");
        if (!isDigest || !algorithm || SipChallenge::PARAMETER(*header, "realm") != m_realm ||
            std::find(m_algorithms.begin(), m_algorithms.end(), *algorithm) == m_algorithms.end())
            continue;
        shown = {*algorithm,
                 SipChallenge::PARAMETER(*header, "username"),
                 SipChallenge::PARAMETER(*header, "nonce"),
                 SipChallenge::PARAMETER(*header, "uri"),
                 SipChallenge::PARAMETER(*header, "response"),
                 SipChallenge::PARAMETER(*header, "qop"),
                 SipChallenge::PARAMETER(*header, "nc"),
                 SipChallenge::PARAMETER(*header, "cnonce")};
        return shown.quality.empty() || SipText::IS_ONE_OF(shown.quality, {"auth", "auth-int"});
    }
    return false;
}

/// Whether the credentials were made for what the request asks for (RFC 7616, 3.4.6): who is called, or that nobody is.
/// That is all of the URI that no proxy on the way has to change: host, port and parameters are another one's once it
/// was routed, and a number is the same as sip and as tel URI, with separators or without.
bool SipAuthentication::IS_MEANT(sip_t const* request, Shown const& shown)
{
    SipHome const home(su_home_create());
    url_t const* const meant = url_make(home.get(), shown.uri.c_str());
    return meant != nullptr && meant->url_scheme != nullptr &&
           SipParty::OF_URI(*meant).getUser() == SipParty::OF_URI(*request->sip_request->rq_url).getUser();
}

/// The same work for whoever is not in the file.
bool SipAuthentication::isRight(sip_t const* request, Shown const& shown) const
{
    bool const isThere = m_passwords->hasUser(shown.user, m_realm);
    std::optional<std::string> const known = m_passwords->find(shown.user, m_realm, shown.algorithm);
    std::string const nobody = SipDigest::SECRET(shown.algorithm, shown.user, m_realm, m_nobody);
    std::string const& secret = isThere && known ? *known : nobody;
    std::string_view const body = request->sip_payload != nullptr
                                      ? std::string_view(request->sip_payload->pl_data, request->sip_payload->pl_len)
                                      : std::string_view();
    std::string const expected =
        SipDigest::RESPONSE(secret, {shown.algorithm, request->sip_request->rq_method_name, shown.uri, shown.nonce,
                                     shown.quality, shown.count, shown.clientNonce, body});
    return SipDigest::ARE_EQUAL(expected, shown.response) && isThere;
}

void SipAuthentication::onWrong(InternetAddress const& source)
{
    ++m_counters.wrong;
    if (long const seconds = m_bans.note(source); seconds != 0)
        spdlog::warn("interface {}: {} has failed to say who it is, and is not served for {} s", m_name,
                     AddressRange::TEXT_OF(source), seconds);
}

std::string SipAuthentication::makeChallenge(InternetAddress const& source, bool isStale) const
{
    std::string const nonce = m_nonces.make(source);
    std::string lines;
    for (SipDigest::Algorithm const algorithm : m_algorithms)
        lines += "WWW-Authenticate: Digest realm=\"" + m_realm + "\", nonce=\"" + nonce +
                 "\", algorithm=" + SipDigest::NAME(algorithm) + ", qop=\"auth\"" + (isStale ? ", stale=true" : "") +
                 "\r\n";
    return lines;
}
