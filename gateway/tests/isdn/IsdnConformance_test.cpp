#include "IsdnFarSide.h"
#include "IsdnTestLoop.h"
#include "callcontrol/CallControl.h"
#include "isdn/endpoint/IsdnInterface.h"
#include "isdn/line/IsdnSocketLine.h"
#include "testing/DrivenClock.h"
#include "testing/FailingAllocator.h"
#include "testing/ModuleConformanceTests.h"

#include <gtest/gtest.h>
#include <spdlog/spdlog.h>

#include <chrono>
#include <map>
#include <memory>
#include <stdexcept>

namespace
{
constexpr std::chrono::milliseconds PATIENCE{2000}; // what has not happened then does not

/// The loop that the far side of the line runs in: what it does needs none of the module's memory.
class AsideLoop : public SignallingLoop
{
public:
    explicit AsideLoop(SignallingLoop& loop) : m_loop(loop) {}
    void watch(int descriptor, std::function<void()> onReadable) override
    {
        m_loop.watch(descriptor,
                     [onReadable]
                     {
                         FailingAllocator::Pause const unseen;
                         onReadable();
                     });
    }
    void forget(int descriptor) override { m_loop.forget(descriptor); }
    void run() override {}
    void stop() override {}

private:
    SignallingLoop& m_loop;
};

/// A line of the gateway, and the network at its other end, all on one thread.
class IsdnDriver : public ModuleDriver, public IsdnLinkObserver
{
public:
    IsdnDriver()
    {
        spdlog::set_level(spdlog::level::off);
        auto ends = IsdnWires::MAKE();
        m_near = std::make_unique<IsdnSocketLine>(std::move(ends->first));
        m_far = std::make_unique<IsdnSocketLine>(std::move(ends->second));
        IsdnConfiguration configuration;
        configuration.name = NAME;
        m_interface = std::make_unique<IsdnInterface>(m_environment, configuration, *m_near);
        if (!CallControl::ADD_PROVIDER("", NAME, *m_interface).isOk())
            throw std::runtime_error("the line cannot be set up");
        m_interface->open();
        m_link = std::make_unique<IsdnLink>(*m_far, IsdnLink::Options{true, true, {}}, m_eventLoop, m_aside, *this);
        m_link->open();
        if (!runUntil([this] { return m_interface->getLink().isUp() && m_link->isUp(); }))
            throw std::runtime_error("the link does not come up");
    }
    ~IsdnDriver() override { CallControl::REMOVE_PROVIDER("", NAME); }

    String getProviderName() const override { return NAME; }
    String getNumber() const override { return "4989123"; }

    void placeCall(String const& number) override
    {
        FailingAllocator::Pause const unseen;
        m_link->ask(
            [&](pri* stack)
            {
                pri_sr* const request = pri_sr_new();
                std::string called(number.view());
                Call& call = m_calls.emplace_back();
                call.handle = pri_new_call(stack);
                call.channel = 17 + static_cast<int>(m_calls.size() % 15); // the first are free again by the last
                pri_sr_set_channel(request, call.channel, 0, 0);
                pri_sr_set_bearer(request, PRI_TRANS_CAP_SPEECH, PRI_LAYER_1_ALAW);
                pri_sr_set_called(request, called.data(), PRI_NATIONAL_ISDN, 1);
                pri_setup(stack, call.handle, request);
                pri_sr_free(request);
                return 0;
            });
    }
    void ring() override
    {
        act([](pri* stack, Call& call) { return pri_acknowledge(stack, call.handle, call.channel, 0); });
    }
    void answer() override
    {
        act([](pri* stack, Call& call) { return pri_answer(stack, call.handle, call.channel, 0); });
    }
    void clear(QCause cause) override
    {
        act(
            [&](pri* stack, Call& call)
            {
                call.isCleared = true;
                return pri_hangup(stack, call.handle, static_cast<int>(cause));
            });
    }
    void sendDigit(char digit) override
    {
        char const digits[] = {digit, '\0'};
        act([&](pri* stack, Call& call) { return pri_keypad_facility(stack, call.handle, digits); });
    }
    void goSilent() override { m_isSilent = true; }

    bool runUntil(std::function<bool()> const& isDone) override { return m_loop.runUntil(isDone, PATIENCE); }
    void settle() override { m_loop.settle(); }
    /// Our own timers go by a clock of our own, those of the stack by the system's.
    void letTimePass() override
    {
        m_clock.advance(m_interface->getLink().getTimers().answer);
        m_loop.settle();
    }

private:
    static constexpr char const* NAME = "isdn";
    struct Call
    {
        q931_call* handle = nullptr;
        int channel = 0;
        std::string number;
        bool isCleared = false;
        bool isOffered = false;
    };

    template <class Work>
    void act(Work const& work)
    {
        FailingAllocator::Pause const unseen;
        for (Call& call : m_calls)
            if (!call.isCleared && !m_isSilent)
            {
                m_link->ask([&](pri* stack) { return work(stack, call); });
                return;
            }
    }
    unsigned int find(q931_call* handle) const
    {
        for (std::size_t i = m_calls.size(); i > 0; --i) // the stack gives the addresses of old calls to new ones
            if (m_calls[i - 1].handle == handle)
                return static_cast<unsigned int>(i);
        return 0;
    }
    /// The number comes in pieces; it is the whole one, or nothing is said.
    void collect(Call& call, unsigned int number, char const* digits, bool isComplete)
    {
        call.number += digits;
        bool const isWhole = isComplete || getNumber() == std::string_view(call.number);
        if (!isWhole)
        {
            m_link->ask([&](pri* stack) { return pri_setup_ack(stack, call.handle, call.channel, 0, 0); });
            return;
        }
        m_link->ask([&](pri* stack) { return pri_proceeding(stack, call.handle, call.channel, 0); });
        saw({.what = Seen::OFFERED, .text = call.number, .call = number});
    }
    void onCleared(pri_event& event)
    {
        unsigned int const number = find(event.hangup.call);
        int const cause = event.hangup.cause;
        bool const isRequest = event.e == PRI_EVENT_HANGUP_REQ;
        bool const isNews = number != 0 && !m_calls[number - 1].isCleared && event.e != PRI_EVENT_HANGUP_ACK;
        if (number != 0)
            m_calls[number - 1].isCleared = true;
        q931_call* const handle = event.hangup.call;
        m_link->ask([&](pri* stack) { return pri_hangup(stack, handle, isRequest ? cause : -1); });
        if (isNews)
            saw({.what = Seen::CLEARED, .cause = static_cast<QCause>(cause), .call = number});
    }

    // --- IsdnLinkObserver
    void onLinkChange(bool) override {}
    void onLinkEvent(pri_event& event) override
    {
        FailingAllocator::Pause const unseen;
        switch (event.e)
        {
        case PRI_EVENT_RING:
        {
            Call& call = m_calls.emplace_back();
            call.handle = event.ring.call;
            call.channel = event.ring.channel;
            if (!m_isSilent)
                collect(call, static_cast<unsigned int>(m_calls.size()), event.ring.callednum,
                        event.ring.complete != 0);
            break;
        }
        case PRI_EVENT_INFO_RECEIVED:
            if (unsigned int const number = find(event.ring.call); number != 0 && !m_isSilent)
                collect(m_calls[number - 1], number, event.ring.callednum, event.ring.complete != 0);
            break;
        case PRI_EVENT_RINGING:
            saw({.what = Seen::RINGING, .call = find(event.ringing.call)});
            break;
        case PRI_EVENT_ANSWER:
            saw({.what = Seen::ANSWERED, .call = find(event.answer.call)});
            break;
        case PRI_EVENT_KEYPAD_DIGIT:
            saw({.what = Seen::DIGITS, .text = event.digit.digits, .call = find(event.digit.call)});
            break;
        case PRI_EVENT_HANGUP_REQ:
        case PRI_EVENT_HANGUP:
        case PRI_EVENT_HANGUP_ACK:
            onCleared(event);
            break;
        default:
            break;
        }
    }

    DrivenClock m_clock;
    TYEventLoop& m_eventLoop = *CallControl::GET_CC_EVENT_LOOP();
    IsdnTestLoop m_loop{m_eventLoop};
    AsideLoop m_aside{m_loop};
    unsigned int m_lastCall = 0;
    Counters m_counters;
    DialPlan m_dialPlan;
    IsdnEnvironment m_environment{m_loop,
                                  "SWITCH",
                                  [](std::string const&, std::string const& number, std::string const&, unsigned int)
                                  { return RouteHunt::TO(PEER, number); },
                                  [this](std::string const&) { return ++m_lastCall; },
                                  [](std::string const&) { return false; },
                                  m_dialPlan,
                                  m_counters};
    std::unique_ptr<IsdnSocketLine> m_near, m_far;
    std::unique_ptr<IsdnInterface> m_interface;
    std::unique_ptr<IsdnLink> m_link;
    std::vector<Call> m_calls;
    bool m_isSilent = false;
};
} // namespace

CALLCONTROL_MODULE_CONFORMANCE(IsdnConformance, IsdnDriver);
