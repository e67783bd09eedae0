#include "sip/dialog/SipTarget.h"

#include <array>
#include <cstdio>
#include <netinet/in.h>
#include <new>

namespace
{
struct Source
{
    std::array<char, SU_ADDRSIZE + 2> host{}; // that of version 6 in brackets
    std::array<char, 8> port{};

    explicit Source(msg_t const* message)
    {
        su_sockaddr_t const& address = *msg_addr(const_cast<msg_t*>(message)); // the stack has no other
        std::array<char, SU_ADDRSIZE> text{};
        su_inet_ntop(address.su_family, SU_ADDR(&address), text.data(), text.size());
        bool const isVersion6 = address.su_family == AF_INET6;
        std::snprintf(host.data(), host.size(), isVersion6 ? "[%s]" : "%s", text.data());
        std::snprintf(port.data(), port.size(), "%u", ntohs(address.su_port));
    }
};
} // namespace

SipTarget::SipTarget(sip_t const* sip, msg_t const* message)
    : m_home(message != nullptr ? su_home_create() : nullptr), m_contact(sip->sip_contact)
{
    bool const isToBeMoved = message != nullptr && m_contact != nullptr && sip->sip_record_route == nullptr &&
                             m_contact->m_url->url_type != url_any;
    if (!isToBeMoved)
        return;
    Source const source(message);
    sip_contact_t* const moved = sip_contact_dup(m_home.get(), m_contact);
    char const* const host = su_strdup(m_home.get(), source.host.data());
    char const* const port = su_strdup(m_home.get(), source.port.data());
    if (moved == nullptr || host == nullptr || port == nullptr)
        throw std::bad_alloc();
    moved->m_url->url_host = host;
    moved->m_url->url_port = port;
    m_contact = moved;
}

std::string SipTarget::AT_SOURCE(url_t const& uri, msg_t const* message)
{
    Source const source(message);
    SipHome const home(su_home_create());
    url_t moved = uri;
    moved.url_host = source.host.data();
    moved.url_port = source.port.data();
    char const* const text = url_as_string(home.get(), &moved);
    return text != nullptr ? text : "";
}
