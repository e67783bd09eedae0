#include "sip/stack/SipGuard.h"

#include "sip/stack/SipCapture.h"
#include "sip/stack/SipStack.h"
#include "sip/stack/StackFunction.h"

#include <algorithm>
#include <netdb.h>
#include <netinet/in.h>
#include <stdexcept>
#include <string>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <unistd.h>
#include <utility>

namespace
{
constexpr usize_t LARGEST_READ = 65536; // octets that the stack takes from a stream at once; a datagram has fewer
constexpr usize_t ROUNDING = 1024;      // by which the stack's buffers are larger than asked for

std::vector<SipGuard*> s_guards;

/// Which of the functions below the stack has called.
enum Called : unsigned int
{
    NEXT = 1,
    DELIVER = 2,
    SIZE = 4,
    DURATION = 8,
    REGISTER = 16,
    ALL = 31
};
unsigned int s_called = 0;

bool IS_ASKED() { return s_called == ALL && ConnectionGuard::GET_NUMBER_OF_CALLS() != 0; }
} // namespace

SipGuard::SipGuard(SipConfiguration const& configuration)
    : m_allow(SERVED_BY(configuration))
    , m_maxMessageSize(configuration.maxMessageSize)
    , m_maxHeaderSize(configuration.maxHeaderSize)
    , m_connections(configuration.listen, m_allow, configuration.maxConnectionsPerSource)
{
    if (configuration.listensOnTls)
        m_secured.emplace(SocketAddress{configuration.listen.host, configuration.tlsPort}, m_allow,
                          configuration.maxConnectionsPerSource);
    s_guards.push_back(this);
}

std::vector<AddressRange> SipGuard::SERVED_BY(SipConfiguration const& configuration)
{
    if (!configuration.allow.empty())
        return configuration.allow;
    std::vector<AddressRange> peers;
    for (SipPeer const& peer : configuration.getPeers())
        peers.push_back(AddressRange::PARSE(peer.address.host));
    return peers;
}

SipGuard::~SipGuard() { std::erase(s_guards, this); }

void SipGuard::watch(nta_agent_t* agent)
{
    m_ports.clear();
    for (tport_t* port = tport_primaries(nta_agent_tports(agent)); port != nullptr; port = tport_next(port))
        m_ports.push_back(port);
}

usize_t SipGuard::LIMIT_OF(SipConfiguration const& configuration)
{
    return configuration.maxMessageSize + LARGEST_READ + ROUNDING;
}

bool SipGuard::ADMIT(tport_t const* port, msg_t* message)
{
    tport_t const* const primary = tport_parent(port);
    for (SipGuard* const guard : s_guards)
        if (std::find(guard->m_ports.begin(), guard->m_ports.end(), primary) != guard->m_ports.end())
            return guard->admit(message);
    return true;
}

bool SipGuard::admit(msg_t* message)
{
    if (!AddressRange::CONTAINS(m_allow, AddressRange::ADDRESS_OF(msg_addr(message)->su_sa)))
    {
        ++m_counters.strangers;
        return false;
    }
    sip_t const* const sip = sip_object(message);
    if (sip == nullptr)
        return true;
    usize_t const size = msg_size(message);
    usize_t const body = sip->sip_payload != nullptr ? sip->sip_payload->pl_len : 0;
    bool const isTooLarge = size > m_maxMessageSize || size - std::min(body, size) > m_maxHeaderSize ||
                            (sip->sip_flags & MSG_FLG_TOOLARGE) != 0;
    if (!isTooLarge)
        return true;
    ++m_counters.tooLarge;
    if (sip->sip_request == nullptr || sip->sip_request->rq_method == sip_method_ack)
        return false;
    msg_set_flags(message, MSG_FLG_TOOLARGE); // the stack answers with 413 and ends the connection
    return true;
}

// --- the proof -------------------------------------------------------------------------------------------------------

namespace
{
constexpr char const* MESSAGE = "OPTIONS sip:x SIP/2.0\r\nContent-Length: 0\r\n\r\n";
constexpr int TURNS = 200;
constexpr su_duration_t TURN = 10;          // milliseconds
constexpr su_duration_t FAR_AWAY = 3600000; // for a timer that is waited for

/// A listener of the stack that takes whatever comes, and a connection to it.
class Proof
{
public:
    Proof(su_root_t* root, std::string const& host)
    {
        static tport_stack_class_t const s_class = {sizeof s_class, RECEIVE, COMPLAIN, ALLOCATE, nullptr};
        static char const* const s_transports[] = {"tcp", nullptr};
        bool const isVersion6 = host.find(':') != std::string::npos;
        std::string const name = isVersion6 ? "[" + host + "]" : host;
        tp_name_t address = {"tcp", name.c_str(), name.c_str(), "*", nullptr, nullptr};
        m_port = tport_tcreate(reinterpret_cast<tp_stack_t*>(this), &s_class, root, TAG_END());
        if (m_port == nullptr || tport_tbind(m_port, &address, s_transports, TAG_END()) < 0)
            return;
        connectTo(host, tport_name(tport_primaries(m_port))->tpn_port);
    }
    ~Proof()
    {
        if (m_descriptor >= 0)
            close(m_descriptor);
        if (m_port != nullptr)
            tport_destroy(m_port);
    }
    Proof(Proof const&) = delete;
    Proof& operator=(Proof const&) = delete;

    void send() const
    {
        std::string const two = std::string(MESSAGE) + MESSAGE;
        if (m_descriptor >= 0 && write(m_descriptor, two.data(), two.size()) < 0)
            return; // which shows
    }

private:
    static void RECEIVE(tp_stack_t*, tport_t*, msg_t* message, tp_magic_t*, su_time_t) { msg_destroy(message); }
    static void COMPLAIN(tp_stack_t*, tport_t*, int, char const*) {}
    static msg_t* ALLOCATE(tp_stack_t*, int flags, char const*, usize_t, tport_t const*, tp_client_t*)
    {
        return msg_create(sip_default_mclass(), flags);
    }

    void connectTo(std::string const& host, char const* port)
    {
        addrinfo hints = {};
        hints.ai_flags = AI_NUMERICHOST | AI_NUMERICSERV;
        hints.ai_socktype = SOCK_STREAM;
        addrinfo* found = nullptr;
        if (getaddrinfo(host.c_str(), port, &hints, &found) != 0)
            return;
        m_descriptor = socket(found->ai_family, SOCK_STREAM | SOCK_CLOEXEC, 0);
        if (connect(m_descriptor, found->ai_addr, found->ai_addrlen) != 0)
            close(std::exchange(m_descriptor, -1));
        freeaddrinfo(found);
    }

    tport_t* m_port = nullptr;
    int m_descriptor = -1;
};

void NOTHING(su_root_magic_t*, su_timer_t*, su_timer_arg_t*) {}
} // namespace

void SipGuard::PROVE(SipStack& stack, std::string const& host)
{
    if (IS_ASKED())
        return;
    su_timer_t* const timer = su_timer_create(su_root_task(stack.getRoot()), FAR_AWAY);
    su_timer_set(timer, NOTHING, nullptr);
    Proof const proof(stack.getRoot(), host);
    proof.send();
    for (int i = 0; i < TURNS && !IS_ASKED(); ++i)
        su_root_step(stack.getRoot(), TURN);
    su_timer_destroy(timer);
    if (!IS_ASKED())
        throw std::runtime_error("the SIP stack does not ask what it may take (" + std::to_string(s_called) + ")");
}

// --- in place of the stack's and the system's own --------------------------------------------------------------------

#define IN_PLACE extern "C" __attribute__((visibility("default")))

/// The stack's own forgets the limit from the second message of a connection on.
IN_PLACE msg_t* msg_next(msg_t* message)
{
    static auto* const s_original = STACK_FUNCTION<msg_t*(msg_t*)>("msg_next");
    s_called |= NEXT;
    msg_t* const next = s_original(message);
    if (next != nullptr)
        msg_maxsize(next, msg_maxsize(message, 0));
    return next;
}

/// Every message passes here, those that are no SIP among them.
IN_PLACE void tport_deliver(tport_t* port, msg_t* message, msg_t* next, void* compressor, su_time_t now)
{
    static auto* const s_original = STACK_FUNCTION<void(tport_t*, msg_t*, msg_t*, void*, su_time_t)>("tport_deliver");
    s_called |= DELIVER;
    SipStack::NOTE_MESSAGE();
    if (!SipGuard::ADMIT(port, message))
    {
        msg_destroy(message);
        return;
    }
    SipCapture::ON_RECEIVED(port, message);
    s_original(port, message, next, compressor, now);
}

/// The stack starts the time of a connection with its first message; one that never brings any must end as well.
IN_PLACE int tport_register_secondary(tport_t* connection, su_wakeup_f wakeup, int events)
{
    static auto* const s_original = STACK_FUNCTION<int(tport_t*, su_wakeup_f, int)>("tport_register_secondary");
    static auto* const s_startTime = STACK_FUNCTION<int(tport_t*)>("tport_set_secondary_timer");
    s_called |= REGISTER;
    int const result = s_original(connection, wakeup, events);
    if (result == 0)
        s_startTime(connection);
    return result;
}

/// How many octets the stack is to read: with all that a busy peer has sent its limit would be reached, and the
/// connection given up. What is left wakes it again.
IN_PLACE issize_t su_getmsgsize(su_socket_t descriptor)
{
    s_called |= SIZE;
    int size = 0;
    if (ioctl(descriptor, FIONREAD, &size) != 0)
        return -1;
    return std::min<issize_t>(size, LARGEST_READ);
}

/// Milliseconds, rounded up: the stack waits for its next timer for so long, and with the part of a millisecond left
/// out it would then ask the clock, without any wait, until that is over.
IN_PLACE su_duration_t su_duration(su_time_t const later, su_time_t const earlier)
{
    s_called |= DURATION;
    constexpr long long MOST = SU_DURATION_MAX;
    long long const seconds = static_cast<long long>(later.tv_sec) - static_cast<long long>(earlier.tv_sec);
    long long const micros = static_cast<long long>(later.tv_usec) - static_cast<long long>(earlier.tv_usec);
    if (seconds > MOST / 1000 || seconds < -MOST / 1000)
        return seconds > 0 ? SU_DURATION_MAX : -SU_DURATION_MAX;
    long long const total = seconds * 1000000 + micros;
    long long const millis = total / 1000 + (total % 1000 > 0 ? 1 : 0);
    return static_cast<su_duration_t>(std::clamp(millis, -MOST, MOST));
}
