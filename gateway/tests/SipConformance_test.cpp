#include "SipUserAgent.h"
#include "callcontrol/CallControl.h"
#include "platform/eventloop/TYEventLoop.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/message/SipPropertyId.h"
#include "sip/stack/SipStack.h"
#include "testing/DrivenClock.h"
#include "testing/FailingAllocator.h"
#include "testing/ModuleConformanceTests.h"

#include <gtest/gtest.h>
#include <spdlog/spdlog.h>

#include <chrono>
#include <netinet/in.h>
#include <random>
#include <stdexcept>
#include <sys/socket.h>
#include <tuple>
#include <unistd.h>

namespace
{
using namespace std::chrono_literals;

constexpr std::chrono::milliseconds PATIENCE = 10s; // what has not happened then does not
constexpr su_duration_t STEP = 20;                  // milliseconds, between looks at the clock

bool IS_FREE(int type, std::uint16_t port)
{
    sockaddr_in address = {};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    int const descriptor = socket(AF_INET, type | SOCK_CLOEXEC, 0);
    bool const isFree = descriptor >= 0 && bind(descriptor, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0;
    close(descriptor);
    return isFree;
}

/// A port of the loopback that nobody has, neither for UDP nor for TCP, nor is given by the system to somebody else.
std::uint16_t FREE_PORT()
{
    constexpr unsigned int FIRST = 26000;
    constexpr unsigned int NUMBER = 6000;
    static unsigned int s_next = std::random_device()(); // tests run beside each other
    for (unsigned int tries = 0; tries < NUMBER; ++tries)
        if (auto const port = static_cast<std::uint16_t>(FIRST + s_next++ % NUMBER);
            IS_FREE(SOCK_DGRAM, port) && IS_FREE(SOCK_STREAM, port))
            return port;
    throw std::runtime_error("no free port");
}

/// A SIP interface of the gateway, and a user agent at the other end of a UDP socket, all on one thread.
class SipDriver : public ModuleDriver
{
public:
    SipDriver()
        : m_host{m_stack, "SWITCH", Routing({{NAME, "", PEER}}), Admission(0, 0), CallTrace(0)}
        , m_environment{m_host, m_stack}
        , m_interface(m_environment, CONFIGURATION(m_agent.getAddress()))
    {
        spdlog::set_level(spdlog::level::off);
        m_agent.setPeer(m_interface.getConfiguration().listen);
        m_agent.onEvent = [this](SipUserAgent::Event const& event) { onEvent(event); };
        m_stack.watch(m_agent.getDescriptor(), [this] { ASIDE([this] { m_agent.receive(); }); });
        m_stack.watch(m_loop.getPollFd(), [this] { m_turns += m_loop.runTurn(); });
        if (!SipPropertyId::DECLARE().isOk() || !CallControl::ADD_PROVIDER("", NAME, m_interface).isOk())
            throw std::runtime_error("the SIP interface cannot be set up");
    }
    ~SipDriver() override { CallControl::REMOVE_PROVIDER("", NAME); }

    String getProviderName() const override { return NAME; }
    String getNumber() const override { return "4989123"; }
    char const* whyNot(Ability ability) const override
    {
        switch (ability)
        {
        case LATE_DIGITS:
            return "an INVITE bears a whole number";
        default:
            return nullptr;
        }
    }

    void placeCall(String const& number) override
    {
        ASIDE([&] { m_agent.call(number.c_str()); });
    }
    void ring() override
    {
        ASIDE([&] { m_agent.ring(); });
    }
    void answer() override
    {
        ASIDE([&] { m_agent.answer(); });
    }
    void clear(QCause cause) override
    {
        ASIDE([&] { m_agent.clear(static_cast<unsigned int>(cause)); });
    }
    void sendDigit(char digit) override
    {
        ASIDE([&] { m_agent.sendDigit(digit); });
    }
    void goSilent() override { m_agent.goSilent(); }

    bool runUntil(std::function<bool()> const& isDone) override
    {
        auto const end = std::chrono::steady_clock::now() + PATIENCE;
        while (!isDone() && std::chrono::steady_clock::now() < end)
            su_root_step(m_stack.getRoot(), STEP);
        return isDone();
    }
    /// Until a pong comes and nothing else has.
    void settle() override
    {
        unsigned long before = 0;
        do
        {
            before = getWork();
            unsigned int const pongs = m_agent.getNumberOfPongs();
            ASIDE([this] { m_agent.ping(); });
            runUntil([&] { return m_agent.getNumberOfPongs() > pongs; });
        } while (getWork() != before);
    }

    /// The timers of call control's loop go by a clock of our own, those of the SIP stack by the system's.
    void letTimePass() override
    {
        m_clock.advance(m_interface.getConfiguration().answerTimeout * 1000LL);
        m_turns += m_loop.runTurn();
    }

private:
    static constexpr char const* NAME = "sip";

    /// What the far side does needs none of the module's memory.
    template <class Work>
    static void ASIDE(Work const& work)
    {
        FailingAllocator::Pause const unseen;
        work();
    }
    static SipConfiguration CONFIGURATION(SocketAddress const& peer)
    {
        SipConfiguration configuration;
        configuration.name = NAME;
        configuration.listen = {"127.0.0.1", FREE_PORT()};
        configuration.peer = peer;
        configuration.maxRequestsPerSource = 0; // it is pinged whenever it is to settle
        return configuration;
    }

    unsigned long getWork() const { return m_agent.getNumberOfMessages() + m_turns; }
    void onEvent(SipUserAgent::Event const& event)
    {
        static constexpr Seen::What KINDS[] = {Seen::OFFERED, Seen::RINGING, Seen::ANSWERED, Seen::DIGITS,
                                               Seen::CLEARED};
        saw({.what = KINDS[event.kind],
             .text = event.number,
             .cause = static_cast<QCause>(event.cause),
             .call = event.call});
    }

    DrivenClock m_clock;
    TYEventLoop& m_loop = *CallControl::GET_CC_EVENT_LOOP();
    unsigned long m_turns = 0;
    SipUserAgent m_agent;
    SipStack m_stack;
    GatewayHost m_host;
    SipEnvironment m_environment;
    SipInterface m_interface;
};
} // namespace

CALLCONTROL_MODULE_CONFORMANCE(SipConformance, SipDriver);
