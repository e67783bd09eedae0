#include "media/context/MediaLoop.h"

#include "platform/base/TYTime.h"

#include <array>
#include <stdexcept>
#include <sys/epoll.h>

namespace
{
constexpr long long MILLISECOND = 1000000; // ns
constexpr unsigned long long TICKS_OF_A_SECOND = 1000 / MediaLoop::TICK;
constexpr int MOST_EVENTS = 512; // taken with one wake
} // namespace

MediaLoop::MediaLoop(Mailbox<MediaNews>& news, ToneTable const& tones)
    : m_news(news)
    , m_tones(tones)
    , m_orders(
          m_events, [](void* self) { static_cast<MediaLoop*>(self)->takeOrders(); }, this)
    , m_clock(
          m_events, EventPrio::HIGH, [](void* self) { static_cast<MediaLoop*>(self)->onClock(); }, this)
    , m_epoll(epoll_create1(EPOLL_CLOEXEC))
{
    int const events = m_events.getPollFd();
    if (m_epoll.get() < 0 || events < 0 || !watch(events, m_eventsSocket))
        throw std::runtime_error("a datapath loop cannot be made");
}

MediaLoop::~MediaLoop() { stop(); }

void MediaLoop::start()
{
    m_isStopping = false;
    m_thread = std::thread([this] { run(); });
}

void MediaLoop::stop()
{
    if (m_thread.joinable())
    {
        post(MediaOrder::Stop());
        m_thread.join();
    }
    m_isClosed = true;  // what was posted last would go on to loops that have ended
    m_events.runTurn(); // and the loop is this thread's again
    m_clock.stop();
    readTime();
    for (auto& [number, leg] : m_legs)
        leg.termination->end(m_now);
    m_legs.clear();
    m_bridges.clear();
    m_recordings.clear();
}

void MediaLoop::run()
{
    while (!m_isStopping)
        turn(-1);
}

bool MediaLoop::watch(int descriptor, Socket& socket)
{
    epoll_event event{EPOLLIN, {&socket}};
    return epoll_ctl(m_epoll.get(), EPOLL_CTL_ADD, descriptor, &event) == 0;
}

void MediaLoop::readTime()
{
    TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
    m_now = now.seconds * 1000 * MILLISECOND + now.nanoseconds;
}

bool MediaLoop::turn(int milliseconds)
{
    std::array<epoll_event, MOST_EVENTS> events;
    int const count = epoll_wait(m_epoll.get(), events.data(), MOST_EVENTS, milliseconds);
    readTime();
    bool hasEvents = false;
    for (int i = 0; i < count; ++i)
    {
        auto const& socket = *static_cast<Socket const*>(events[static_cast<std::size_t>(i)].data.ptr);
        if (socket.leg == nullptr)
            hasEvents = true;
        else
            onReadable(socket);
    }
    if (hasEvents) // after the sockets: an order may end the leg of one of them
        m_events.runTurn();
    m_counters.turns += count > 0;
    return count > 0;
}

void MediaLoop::onReadable(Socket const& socket)
{
    if (socket.isRtcp)
        socket.leg->receiveRtcp(m_batch, m_now);
    else
        socket.leg->receiveRtp(m_batch, m_now);
    if (socket.leg->isCutOff())
        epoll_ctl(m_epoll.get(), EPOLL_CTL_DEL, socket.leg->getRtp(), nullptr);
}

void MediaLoop::startClock()
{
    if (m_clock.isRunning())
        return;
    m_nextTick = m_now + TICK * MILLISECOND;
    std::ignore = m_clock.startPeriodic(TICK); // the period is not 0
}

void MediaLoop::onClock()
{
    readTime();
    for (unsigned int late = 0; m_nextTick <= m_now && late <= MOST_LATE_TICKS; ++late)
        tick();
    while (m_nextTick <= m_now)
    {
        ++m_counters.skippedTicks;
        m_nextTick += TICK * MILLISECOND;
    }
    if (m_legs.empty())
        m_clock.stop();
}

void MediaLoop::tick()
{
    m_nextTick += TICK * MILLISECOND;
    for (auto& [number, bridge] : m_bridges)
        tick(bridge);
    ++m_ticks;
    attend();
}

void MediaLoop::tick(Bridge& bridge)
try
{
    bridge.tick(m_now);
}
catch (std::bad_alloc const&)
{
    ++m_counters.failures; // a codec could not be made: this frame is lost
}

/// Each leg once a second, in each tick those whose turn it is: so the work is spread evenly without a timer for each.
void MediaLoop::attend()
{
    for (auto& [number, leg] : m_legs)
    {
        if (number % TICKS_OF_A_SECOND == m_ticks % TICKS_OF_A_SECOND)
            leg.termination->attend(m_now);
    }
}

void MediaLoop::onDigit(RtpTermination const& leg, HeardDigit const& heard)
{
    tell({leg.getNumber(), MediaNews::DIGIT, heard.digit, heard.milliseconds, {}, heard.isSound});
}

void MediaLoop::onSilence(RtpTermination const& leg, unsigned int seconds)
{
    tell({leg.getNumber(), MediaNews::SILENCE, '\0', seconds});
}

void MediaLoop::onSpeech(RtpTermination const& leg) { tell({leg.getNumber(), MediaNews::SPEECH}); }

void MediaLoop::onQuality(RtpTermination& leg)
{
    tell({leg.getNumber(), MediaNews::QUALITY, '\0', 0, leg.getQuality()});
}

void MediaLoop::onReport(RtpTermination const& leg, MediaReport const& report)
{
    tell({.leg = leg.getNumber(), .kind = MediaNews::REPORT, .report = report});
}

void MediaLoop::tell(MediaNews const& news) { m_news.post(news); }
