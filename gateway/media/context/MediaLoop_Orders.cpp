#include "media/context/MediaLoop.h"

#include <sys/epoll.h>
#include <type_traits>

unsigned long long MediaOrder::LEG_OF(Any const& order)
{
    return std::visit(
        [](auto const& one) -> unsigned long long
        {
            using Order = std::remove_cvref_t<decltype(one)>;
            if constexpr (std::is_same_v<Order, Make>)
                return one.leg->getNumber();
            else if constexpr (std::is_same_v<Order, Stop> || std::is_same_v<Order, Record>)
                return 0;
            else
                return one.leg;
        },
        order);
}

bool MediaLoop::post(MediaOrder::Any&& order) { return m_orders.post(std::move(order)); }

void MediaLoop::takeOrders()
{
    m_orders.take([this](MediaOrder::Any& order) { take(order); });
}

void MediaLoop::take(MediaOrder::Any& order)
try
{
    if (m_isClosed)
        return;
    bool const brings = std::holds_alternative<MediaOrder::Make>(order);
    auto const expected = brings ? m_expected.end() : m_expected.find(MediaOrder::LEG_OF(order));
    if (expected != m_expected.end())
        expected->second.push_back(std::move(order));
    else
        std::visit([this](auto& one) { obey(one); }, order);
}
catch (std::bad_alloc const&)
{
    ++m_counters.failures; // the order is not obeyed; what is there goes on
}

MediaLoop::Leg* MediaLoop::find(unsigned long long leg)
{
    auto const found = m_legs.find(leg);
    return found == m_legs.end() ? nullptr : &found->second;
}

void MediaLoop::obey(MediaOrder::Make& order)
{
    unsigned long long const number = order.leg->getNumber();
    auto const expected = m_expected.extract(number);
    Leg& leg = m_legs[number];
    leg.termination = std::move(order.leg);
    try
    {
        join(leg, order.call);
    }
    catch (std::bad_alloc const&)
    {
        m_legs.erase(number);
        throw;
    }
    leg.termination->setObserver(this);
    leg.sockets[0] = {leg.termination.get(), false};
    leg.sockets[1] = {leg.termination.get(), true};
    watch(leg.termination->getRtp(), leg.sockets[0]);
    watch(leg.termination->getRtcp(), leg.sockets[1]);
    startClock();
    if (expected.empty())
        return;
    for (MediaOrder::Any& waiting : expected.mapped())
        take(waiting);
}

/// Leaves the call before. Throws std::bad_alloc before anything has changed.
void MediaLoop::join(Leg& leg, unsigned long long call)
{
    Bridge& bridge = m_bridges[call];
    bridge.makeRoom();
    if (leg.bridge != nullptr)
        leave(leg);
    leg.call = call;
    leg.bridge = &bridge;
    if (auto const recording = m_recordings.find(call); recording != m_recordings.end() && bridge.isEmpty())
        bridge.setRecording(recording->second.get());
    bridge.add(*leg.termination);
}

void MediaLoop::leave(Leg& leg)
{
    leg.bridge->remove(*leg.termination);
    if (leg.bridge->isEmpty())
        m_bridges.erase(leg.call);
    leg.bridge = nullptr;
}

std::unique_ptr<RtpTermination> MediaLoop::remove(unsigned long long number)
{
    Leg* const leg = find(number);
    if (leg == nullptr)
        return nullptr;
    leave(*leg);
    std::unique_ptr<RtpTermination> termination = std::move(leg->termination);
    epoll_ctl(m_epoll.get(), EPOLL_CTL_DEL, termination->getRtp(), nullptr);
    epoll_ctl(m_epoll.get(), EPOLL_CTL_DEL, termination->getRtcp(), nullptr);
    m_legs.erase(number);
    return termination;
}

void MediaLoop::obey(MediaOrder::Describe& order)
{
    if (Leg* const leg = find(order.leg))
    {
        leg->termination->describe(order.description, m_now);
        leg->bridge->connect();
    }
}

void MediaLoop::obey(MediaOrder::Connect& order)
{
    Leg* const leg = find(order.leg);
    if (leg == nullptr || leg->call == order.call)
        return;
    join(*leg, order.call);
}

void MediaLoop::obey(MediaOrder::Expect& order) { m_expected[order.leg]; }

void MediaLoop::obey(MediaOrder::HandOver& order)
{
    if (std::unique_ptr<RtpTermination> leg = remove(order.leg))
        order.loop->post(MediaOrder::Make{order.call, std::move(leg)});
}

void MediaLoop::obey(MediaOrder::Tone& order)
{
    if (Leg* const leg = find(order.leg))
        leg->termination->playTone(m_tones.find(order.tone));
}

void MediaLoop::obey(MediaOrder::Play& order)
{
    if (Leg* const leg = find(order.leg))
        leg->termination->playSound(order.sound, order.isEndless);
}

void MediaLoop::obey(MediaOrder::Detect& order)
{
    if (Leg* const leg = find(order.leg))
        leg->termination->detectDigits(order.isWanted);
}

void MediaLoop::obey(MediaOrder::Digit& order)
{
    if (Leg* const leg = find(order.leg))
        leg->termination->sendDigit(order.digit, order.milliseconds);
}

void MediaLoop::obey(MediaOrder::Aside& order)
{
    if (Leg* const leg = find(order.leg))
        leg->termination->setDigitsAside(order.isAside);
}

void MediaLoop::obey(MediaOrder::Ask& order)
{
    if (Leg* const leg = find(order.leg))
        onQuality(*leg->termination);
}

void MediaLoop::obey(MediaOrder::End& order)
{
    if (std::unique_ptr<RtpTermination> const leg = remove(order.leg))
        leg->end(m_now);
}

/// Before the call's first leg comes, or after; the call's end takes it back.
void MediaLoop::obey(MediaOrder::Record& order)
{
    auto const bridge = m_bridges.find(order.call);
    if (bridge != m_bridges.end())
        bridge->second.setRecording(order.recording.get());
    if (order.recording != nullptr)
        m_recordings[order.call] = order.recording;
    else
        m_recordings.erase(order.call);
}

void MediaLoop::obey(MediaOrder::Stop&) { m_isStopping = true; }
