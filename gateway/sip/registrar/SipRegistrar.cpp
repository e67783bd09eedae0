#include "sip/registrar/SipRegistrar.h"

#include "sip/dialog/SipTarget.h"
#include "sip/message/SipAddress.h"
#include "sip/registrar/SipBindingStore.h"
#include "sip/registrar/SipPath.h"
#include "sip/stack/SipGuard.h"
#include "sip/stack/SipHandles.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <cstdlib>
#include <stdexcept>

namespace
{
constexpr std::size_t LONGEST_URI = 512;       // octets
constexpr unsigned int DEFAULT_EXPIRES = 3600; // seconds, where neither header says any

/// "0.75" as 750.
unsigned int PREFERENCE_OF(char const* text)
{
    return text == nullptr ? 1000u : static_cast<unsigned int>(std::clamp(std::strtod(text, nullptr), 0.0, 1.0) * 1000);
}

unsigned long SECONDS_OF(sip_t const* request, sip_contact_t const* contact)
{
    if (contact->m_expires != nullptr)
        return std::strtoul(contact->m_expires, nullptr, 10);
    return request->sip_expires != nullptr ? request->sip_expires->ex_delta : DEFAULT_EXPIRES;
}

bool IS_EVERYTHING(sip_contact_t const* contact) { return contact->m_url->url_type == url_any; }
} // namespace

SipRegistrar::SipRegistrar(SipConfiguration const& configuration)
    : m_configuration(configuration)
    , m_served(SipGuard::SERVED_BY(configuration))
    , m_bindings(configuration.maxContacts)
{
    if (!configuration.registrations.empty())
        m_store = std::make_unique<SipBindingStore>(configuration.registrations, configuration.name,
                                                    [this](std::string const& user, SipBinding const& binding)
                                                    {
                                                        if (hasUser(user))
                                                            m_bindings.restore(user, binding);
                                                    });
}

SipRegistrar::~SipRegistrar() = default;

bool SipRegistrar::hasUser(std::string_view user) const
{
    return m_configuration.passwords->hasUser(user, m_configuration.realm);
}

std::vector<SipContact> SipRegistrar::find(std::string_view user) const
{
    std::vector<SipContact> contacts;
    for (SipBinding& binding : m_bindings.find(user))
        contacts.push_back(
            {std::move(binding.called.empty() ? binding.uri : binding.called), std::move(binding.route)});
    return contacts;
}

int SipRegistrar::receive(nta_incoming_t* transaction, sip_t const* request, std::string const& user)
{
    int const status = take(transaction, request, user);
    ++(status == 200 ? m_counters.taken : m_counters.refused);
    return status;
}

int SipRegistrar::take(nta_incoming_t* transaction, sip_t const* request, std::string const& user)
{
    url_t const& self = *request->sip_to->a_url;
    if (self.url_user == nullptr || SipAddress::UNESCAPE_USER(self.url_user) != user)
        return 403; // somebody else
    std::string const callId = request->sip_call_id->i_id;
    std::uint32_t const sequence = request->sip_cseq->cs_seq;
    sip_contact_t const* const contact = request->sip_contact;
    std::optional<std::string> const route = SipPath::READ(request);
    if (!route)
        return 400;
    SipBindings::Result result = SipBindings::OK;
    if (contact != nullptr && IS_EVERYTHING(contact))
    {
        bool const isWhole = contact->m_next == nullptr && request->sip_expires != nullptr &&
                             request->sip_expires->ex_date == 0 && request->sip_expires->ex_delta == 0;
        if (!isWhole)
            return 400;
        result = m_bindings.clear(user, callId, sequence);
    }
    else if (contact != nullptr)
    {
        std::vector<SipBindings::Wish> wishes;
        if (int const refused = readWishes(transaction, request, *route, wishes); refused != 0)
            return refused;
        result = m_bindings.update(user, wishes, callId, sequence);
    }
    if (result != SipBindings::OK && result != SipBindings::REFRESHED)
        return result == SipBindings::TOO_MANY ? 403 : 500;
    if (contact != nullptr && m_store != nullptr)
        m_store->write(user, m_bindings.find(user), result == SipBindings::REFRESHED);
    answer(transaction, user, SipPath::GET_HEADER(request, *route));
    return 200;
}

/// 0, or the status with which the whole request is refused.
int SipRegistrar::readWishes(nta_incoming_t* transaction, sip_t const* request, std::string const& route,
                             std::vector<SipBindings::Wish>& wishes) const
{
    if (!route.empty() && !isServed(*request->sip_path->r_url))
        return 403;
    SipHome const home(su_home_create());
    bool const isMoved = m_configuration.isBehindNat && route.empty(); // else a proxy was the last on the way
    SipHeldMessage const message(isMoved ? nta_incoming_getrequest(transaction) : nullptr);
    for (sip_contact_t const* contact = request->sip_contact; contact != nullptr; contact = contact->m_next)
    {
        if (IS_EVERYTHING(contact))
            return 400;
        char const* const uri = url_as_string(home.get(), contact->m_url);
        bool const isReached = route.empty() && !isMoved ? isServed(*contact->m_url) : isOther(*contact->m_url);
        if (uri == nullptr || std::string_view(uri).size() > LONGEST_URI || !isReached)
            return 403;
        unsigned long const seconds = SECONDS_OF(request, contact);
        if (seconds != 0 && seconds < m_configuration.leastRegistration)
        {
            std::string const least = std::to_string(m_configuration.leastRegistration);
            nta_incoming_treply(transaction, SIP_423_INTERVAL_TOO_BRIEF, SIPTAG_MIN_EXPIRES_STR(least.c_str()),
                                TAG_END());
            return 423;
        }
        wishes.push_back(
            {uri, PREFERENCE_OF(contact->m_q),
             static_cast<unsigned int>(std::min<unsigned long>(seconds, m_configuration.longestRegistration)),
             isMoved ? SipTarget::AT_SOURCE(*contact->m_url, message.get()) : std::string(), route});
    }
    return 0;
}

/// An address of a phone's, and not our own: we would call ourselves.
bool SipRegistrar::isOther(url_t const& uri) const
{
    if (uri.url_type != url_sip || uri.url_host == nullptr || uri.url_headers != nullptr)
        return false;
    SocketAddress const& self = m_configuration.getAddress();
    return uri.url_host != self.host || std::to_string(self.port) != url_port(&uri);
}

/// Nobody is to be called at an address that may not call us.
bool SipRegistrar::isServed(url_t const& uri) const
{
    if (!isOther(uri))
        return false;
    try
    {
        std::string host = uri.url_host;
        if (host.size() > 2 && host.front() == '[')
            host = host.substr(1, host.size() - 2);
        return AddressRange::CONTAINS(m_served, AddressRange::PARSE(host).getFirst());
    }
    catch (std::invalid_argument const&)
    {
        return false; // a name; or a range
    }
}

void SipRegistrar::answer(nta_incoming_t* transaction, std::string const& user, std::string const& pathHeader) const
{
    std::string lines = pathHeader;
    for (SipBinding const& binding : m_bindings.find(user))
        lines += fmt::format("Contact: <{}>;expires={};q={}.{:03}\r\n", binding.uri, binding.until - SipBindings::NOW(),
                             binding.preference / 1000, binding.preference % 1000);
    nta_incoming_treply(transaction, SIP_200_OK, TAG_IF(!lines.empty(), SIPTAG_HEADER_STR(lines.c_str())), TAG_END());
}

std::string SipRegistrar::describe() const
{
    return fmt::format("interface {}: {} contacts, {} registrations taken, {} refused, {} failures to write\n",
                       m_configuration.name, m_bindings.getNumber(), m_counters.taken, m_counters.refused,
                       m_store != nullptr ? m_store->getNumberOfFailures() : 0);
}
