#include "sip/access/SipCredentials.h"

#include "platform/base/TYTime.h"
#include "sip/message/SipText.h"

#include <algorithm>
#include <spdlog/spdlog.h>

namespace
{
constexpr unsigned int MOST_TRIES = 4;  // of one request
constexpr std::size_t MOST_REALMS = 4;  // a proxy or two, and the server
constexpr long BETWEEN_COMPLAINTS = 60; // seconds

/// Whether credentials of that realm are among them.
bool HAS_REALM(msg_auth_t const* shown, std::string const& realm)
{
    for (; shown != nullptr; shown = shown->au_next)
        if (SipChallenge::PARAMETER(*shown, "realm") == realm)
            return true;
    return false;
}

template <class Header>
void REMOVE_ALL(msg_t* request, sip_t* sip, Header* sip_t::*header)
{
    while (sip->*header != nullptr)
        sip_header_remove(request, sip, reinterpret_cast<sip_header_t*>(sip->*header));
}

/// It comes from the peer.
std::string PRINTABLE(std::string text)
{
    std::replace_if(text.begin(), text.end(), SipText::IS_CONTROL, ' ');
    return text;
}
} // namespace

void SipCredentials::sign(msg_t* request)
{
    if (m_known.empty())
        return;
    sip_t* const sip = sip_object(request);
    REMOVE_ALL(request, sip, &sip_t::sip_authorization);
    REMOVE_ALL(request, sip, &sip_t::sip_proxy_authorization);
    char const* const uri = url_as_string(msg_home(request), sip->sip_request->rq_url);
    std::string_view const body =
        sip->sip_payload != nullptr ? std::string_view(sip->sip_payload->pl_data, sip->sip_payload->pl_len) : "";
    std::string lines;
    for (Known& known : m_known)
        lines += known.challenge.answer({m_user, known.secret}, sip->sip_request->rq_method_name,
                                        uri != nullptr ? uri : "", body, ++known.count);
    sip_add_tl(request, sip, SIPTAG_HEADER_STR(lines.c_str()), TAG_END());
}

bool SipCredentials::take(sip_t const* request, sip_t const* response, unsigned int tries)
{
    int const status = response->sip_status->st_status;
    bool const isProxy = status == 407;
    if ((!isProxy && status != 401) || nta_sip_is_internal(response))
        return false;
    // several who were asked at once may be told in one answer, each of them with either header
    bool const byProxy = takeFrom(response->sip_proxy_authenticate, request->sip_proxy_authorization, true, tries);
    bool const byServer = takeFrom(response->sip_www_authenticate, request->sip_authorization, false, tries);
    ++(byProxy || byServer ? m_counters.answered : m_counters.refused);
    return byProxy || byServer;
}

/// Of each realm the first that we can answer (RFC 8760, 2.4); whether there is one.
bool SipCredentials::takeFrom(msg_auth_t const* challenges, msg_auth_t const* shown, bool isOfProxy, unsigned int tries)
{
    std::vector<std::string> done;
    bool isAnswered = false;
    for (; challenges != nullptr; challenges = challenges->au_next)
    {
        std::optional<SipChallenge> const challenge = SipChallenge::READ(*challenges, isOfProxy);
        if (!challenge || std::find(done.begin(), done.end(), challenge->realm) != done.end())
            continue;
        bool const isWrong = tries > 0 && !challenge->isStale && HAS_REALM(shown, challenge->realm);
        if (isWrong || tries >= MOST_TRIES)
            complain("refuses our credentials", challenge->realm);
        else if (!note(*challenge))
        {
            complain("asks for credentials that we have not", challenge->realm);
            continue; // of another algorithm we may have them
        }
        else
            isAnswered = true;
        done.push_back(challenge->realm);
    }
    return isAnswered;
}

/// False without a password.
bool SipCredentials::note(SipChallenge const& challenge)
{
    std::optional<std::string> const secret = m_passwords->find(m_user, challenge.realm, challenge.algorithm);
    if (!secret)
        return false;
    std::erase_if(
        m_known, [&](Known const& known)
        { return known.challenge.isOfProxy == challenge.isOfProxy && known.challenge.realm == challenge.realm; });
    if (m_known.size() >= MOST_REALMS)
        m_known.erase(m_known.begin());
    m_known.push_back({challenge, *secret});
    return true;
}

/// Once a minute at most.
void SipCredentials::complain(char const* what, std::string const& realm)
{
    long const now = TY::Time::NOW(TY::Time::MONOTONIC).seconds;
    if (m_lastComplaint != 0 && now - m_lastComplaint < BETWEEN_COMPLAINTS)
        return;
    m_lastComplaint = now;
    spdlog::warn("interface {}: the peer {}, realm '{}'", m_name, what, PRINTABLE(realm));
}
