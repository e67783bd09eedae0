#include "sip/stack/SipListener.h"

#include "sip/message/SipAddress.h"
#include "sip/stack/SipGuard.h"
#include "sip/stack/SipStack.h"
#include "sip/stack/SipTls.h"

#include <arpa/inet.h>
#include <bit>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <netinet/in.h>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <unistd.h>

namespace
{
constexpr unsigned int SOCKET_BUFFER = 4u << 20; // bytes; a burst of calls comes faster than one thread reads
constexpr unsigned int UDP_MTU = 65535;          // bytes; above it the stack would change to TCP on its own
constexpr char const* NO_FOLDER = "/dev/null";   // of certificates; the stack would take those of the user

socklen_t FILL(sockaddr_storage& storage, SocketAddress const& address)
{
    storage = {};
    if (address.isVersion6())
    {
        auto& target = reinterpret_cast<sockaddr_in6&>(storage);
        target.sin6_family = AF_INET6;
        target.sin6_port = htons(address.port);
        inet_pton(AF_INET6, address.host.c_str(), &target.sin6_addr);
        return sizeof target;
    }
    auto& target = reinterpret_cast<sockaddr_in&>(storage);
    target.sin_family = AF_INET;
    target.sin_port = htons(address.port);
    inet_pton(AF_INET, address.host.c_str(), &target.sin_addr);
    return sizeof target;
}

/// The stack shares a UDP port with whoever has it already and tells nobody, so we ask for it first.
void CHECK_PORT(SocketAddress const& address, int type, char const* transport)
{
    sockaddr_storage storage;
    socklen_t const length = FILL(storage, address);
    int const descriptor = socket(storage.ss_family, type, 0);
    int const on = 1;
    if (type == SOCK_STREAM) // connections that ended a moment ago do not count
        setsockopt(descriptor, SOL_SOCKET, SO_REUSEADDR, &on, sizeof on);
    bool const isFree = descriptor >= 0 && bind(descriptor, reinterpret_cast<sockaddr*>(&storage), length) == 0 &&
                        (type != SOCK_STREAM || listen(descriptor, 1) == 0);
    int const error = errno;
    if (descriptor >= 0)
        close(descriptor);
    if (!isFree)
        throw std::runtime_error("cannot listen on " + address.text() + " (" + transport +
                                 "): " + std::strerror(error));
}
} // namespace

namespace
{
/// When an answer goes to the port that its request came from (RFC 3581), in the stack's words. @{
constexpr int ASKED_FOR = 1;
constexpr int ALWAYS = 2;
/// @}

url_string_t const* const NO_PORT =
    std::bit_cast<url_string_t const*>(std::intptr_t{-1}); // null would be one on every address

struct Transport
{
    char const* name;
    SipWay::Way way;
    bool isWanted;
};

/// With the address that the peers are told, which the stack writes into Via, and the port that is really listened on.
std::string MAKE_BINDING(SipConfiguration const& configuration, Transport const& transport)
{
    SocketAddress const told = {configuration.getAddress().host, configuration.getPort(transport.way)};
    std::string uri = SipAddress::MAKE_URI({}, told, transport.way);
    if (transport.way == SipWay::UDP)
        uri += ";transport=udp"; // and no other
    return configuration.advertise.port == 0 ? uri : uri + ";maddr=" + configuration.listen.host;
}
} // namespace

SipAgent SipListener::MAKE_AGENT(SipStack& stack, SipConfiguration const& configuration, Means const& means,
                                 nta_message_f* onMessage, SipInterface* interface)
{
    SipGuard::PROVE(stack, configuration.listen.host);
    unsigned int const idle = configuration.tcpIdle * 1000;
    SipAgent agent(nta_agent_create(
        stack.getRoot(), NO_PORT, onMessage, interface, NTATAG_UA(1), NTATAG_PASS_100(1), NTATAG_MERGE_482(1),
        NTATAG_MAXSIZE(SipGuard::LIMIT_OF(configuration)), NTATAG_UDP_MTU(UDP_MTU), NTATAG_SIP_T1(configuration.t1),
        NTATAG_SIP_T1X64(configuration.t1x64), NTATAG_SERVER_RPORT(configuration.isBehindNat ? ALWAYS : ASKED_FOR),
        TAG_IF(means.isShown, NTATAG_SIPFLAGS(MSG_DO_CANONIC | MSG_DO_EXTRACT_COPY)),
        TAG_IF(means.resolver != nullptr, SRESTAG_RESOLV_CONF(means.resolver)), TAG_END()));
    for (Transport const& transport : {Transport{"udp", SipWay::UDP, configuration.listensOnUdp},
                                       Transport{"tcp", SipWay::TCP, configuration.listensOnTcp},
                                       Transport{"tls", SipWay::SIPS, configuration.listensOnTls}})
    {
        if (!transport.isWanted)
            continue;
        SocketAddress const listen = {configuration.listen.host, configuration.getPort(transport.way)};
        CHECK_PORT(listen, transport.way == SipWay::UDP ? SOCK_DGRAM : SOCK_STREAM, transport.name);
        auto const open = [&]
        {
            return nta_agent_add_tport(agent.get(), URL_STRING_MAKE(MAKE_BINDING(configuration, transport).c_str()),
                                       TPTAG_UDP_RMEM(SOCKET_BUFFER), TPTAG_UDP_WMEM(SOCKET_BUFFER), TPTAG_IDLE(idle),
                                       TPTAG_TIMEOUT(idle),
                                       TAG_IF(transport.way == SipWay::SIPS, TPTAG_CERTIFICATE(NO_FOLDER)), TAG_END());
        };
        if (agent == nullptr || (transport.way == SipWay::SIPS ? means.tls->attach(open) : open()) < 0)
            throw std::runtime_error("cannot listen on " + listen.text() + " (" + transport.name + ")");
    }
    means.guard.watch(agent.get());
    return agent;
}
