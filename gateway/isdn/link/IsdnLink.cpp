#include "isdn/link/IsdnLink.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <cstring>
#include <new>
#include <string_view>
#include <sys/time.h>
#include <utility>
#include <vector>

namespace
{
constexpr std::size_t CHECK_SUM = 2; // octets at the end of a frame, which the stack expects and never reads
constexpr int NO_DESCRIPTOR = 0;     // the stack keeps it and does nothing with it
constexpr long SOONEST = 1;          // milliseconds; a timer that is due is not asked for again in the same turn
constexpr long MILLISECONDS_OF_SECOND = 1000;

/// The stack's own words, line by line.
void LOG(pri*, char* text)
{
    std::string_view line(text);
    line = line.substr(0, line.find_last_not_of('\n') + 1);
    if (!line.empty())
        spdlog::debug("isdn stack: {}", line);
}

/// Stacks whose links have ended. Nothing gives them back, but nobody is to take them for lost either, not even after
/// the process has ended its objects.
std::vector<pri*>& LEFT_STACKS()
{
    static auto& s_stacks = *new std::vector<pri*>;
    return s_stacks;
}

long MILLISECONDS_UNTIL(timeval const& then)
{
    timeval now = {};
    gettimeofday(&now, nullptr);
    long const milliseconds = (then.tv_sec - now.tv_sec) * MILLISECONDS_OF_SECOND +
                              (then.tv_usec - now.tv_usec + MILLISECONDS_OF_SECOND - 1) / MILLISECONDS_OF_SECOND;
    return std::max(milliseconds, SOONEST);
}
} // namespace

IsdnLink::IsdnLink(IsdnLine& line, Options const& options, TYEventLoop& loop, SignallingLoop& watch,
                   IsdnLinkObserver& observer)
    : m_line(line)
    , m_options(options)
    , m_watch(watch)
    , m_observer(observer)
    , m_timer(loop, EventPrio::NORMAL, ON_TIMER, this)
    , m_reopening(loop, EventPrio::NORMAL, ON_REOPENING, this)
{
    pri_set_message(LOG);
    pri_set_error(LOG);
    LEFT_STACKS().reserve(LEFT_STACKS().size() + 1);
}

/// Not before there is a line: what the stack says at once would be lost, and said again when calls are up already.
bool IsdnLink::makeStack()
{
    if (m_stack != nullptr)
        return true;
    m_stack = pri_new_cb(NO_DESCRIPTOR, m_options.isNetwork ? PRI_NETWORK : PRI_CPE, PRI_SWITCH_EUROISDN_E1, READ,
                         WRITE, this);
    if (m_stack == nullptr)
        return false;
    pri_set_overlapdial(m_stack, m_options.isOverlap);
    pri_facility_enable(m_stack);
    pri_aoc_events_enable(m_stack, 1);
    pri_hangup_fix_enable(m_stack, 1); // Q.931, 5.3.2
    pri_hold_enable(m_stack, 1);
    pri_transfer_enable(m_stack, 1);
    setTimers();
    return true;
}

IsdnLink::~IsdnLink()
{
    if (m_isWatched)
        m_watch.forget(m_line.getDescriptor());
    m_line.close();
    if (m_stack == nullptr)
        return;
    pri_set_userdata(m_stack, nullptr);
    LEFT_STACKS().push_back(m_stack);
}

void IsdnLink::setTimers()
{
    IsdnTimers const& timers = m_options.timers;
    std::pair<int, unsigned int> const values[] = {{PRI_TIMER_T200, timers.t200}, {PRI_TIMER_T203, timers.t203},
                                                   {PRI_TIMER_T303, timers.t303}, {PRI_TIMER_T305, timers.t305},
                                                   {PRI_TIMER_T308, timers.t308}, {PRI_TIMER_T309, timers.t309},
                                                   {PRI_TIMER_T310, timers.t310}, {PRI_TIMER_T313, timers.t313}};
    for (auto const& [timer, milliseconds] : values)
        if (milliseconds != 0)
            pri_set_timer(m_stack, timer, static_cast<int>(milliseconds));
}

void IsdnLink::open()
{
    if (m_isWatched)
        return;
    bool const isNew = m_stack != nullptr;
    if (!m_line.open() || !makeStack())
    {
        m_reopening.start(m_options.timers.reopening);
        return;
    }
    if (isNew)
        m_observer.onNewLine();
    m_watch.watch(m_line.getDescriptor(), [this] { onReadable(); });
    m_isWatched = true;
    onReadable();
}

void IsdnLink::ON_REOPENING(void* link) { static_cast<IsdnLink*>(link)->open(); }

int IsdnLink::READ(pri* stack, void* buffer, int length)
{
    auto* const link = static_cast<IsdnLink*>(pri_get_userdata(stack));
    if (link == nullptr || length < static_cast<int>(CHECK_SUM))
        return 0;
    auto* const octets = static_cast<unsigned char*>(buffer);
    std::size_t const room = static_cast<std::size_t>(length) - CHECK_SUM;
    std::size_t const got = link->m_line.receive({octets, room});
    if (got == 0)
        return 0;
    link->m_hasRead = true;
    link->m_window.onReceived({octets, got});
    std::memset(octets + got, 0, room - got + CHECK_SUM); // the stack reads past the end of an element without octets
    return static_cast<int>(got + CHECK_SUM);
}

int IsdnLink::WRITE(pri* stack, void* buffer, int length)
{
    auto* const link = static_cast<IsdnLink*>(pri_get_userdata(stack));
    if (link != nullptr && length > static_cast<int>(CHECK_SUM))
    {
        std::span const frame(static_cast<unsigned char const*>(buffer), static_cast<std::size_t>(length) - CHECK_SUM);
        link->m_line.send(frame);
        link->m_window.onSent(frame);
        link->m_wasQuiet = link->m_wasQuiet && link->isQuiet();
    }
    return length; // what the line did not take is lost as on any line, and sent again
}

void IsdnLink::onReadable()
{
    do
    {
        m_hasRead = false;
        if (pri_event* const event = pri_check_event(m_stack))
            take(*event);
    } while (m_hasRead && m_line.isOpen());
    startTimer();
    if (!m_line.isOpen())
        closeLine();
    tellIfQuiet();
}

/// The far end has gone. What that means for the link its timers will say.
void IsdnLink::closeLine()
{
    if (!std::exchange(m_isWatched, false))
        return;
    m_watch.forget(m_line.getDescriptor());
    m_line.close();
    m_reopening.start(m_options.timers.reopening);
}

void IsdnLink::ON_TIMER(void* link) { static_cast<IsdnLink*>(link)->runTimers(); }

void IsdnLink::runTimers()
{
    while (pri_event* const event = pri_schedule_run(m_stack))
        take(*event);
    startTimer();
    tellIfQuiet();
}

void IsdnLink::tellIfQuiet()
{
    if (isQuiet() && !std::exchange(m_wasQuiet, true))
        m_observer.onLinkQuiet();
}

void IsdnLink::startTimer()
{
    if (timeval const* const next = pri_schedule_next(m_stack))
        m_timer.start(static_cast<unsigned int>(MILLISECONDS_UNTIL(*next)));
    else
        m_timer.stop();
}

void IsdnLink::take(pri_event& event)
{
    bool const isUp = event.e == PRI_EVENT_DCHAN_UP;
    if (!isUp && event.e != PRI_EVENT_DCHAN_DOWN)
    {
        m_observer.onLinkEvent(event);
        return;
    }
    if (std::exchange(m_isUp, isUp) != isUp)
        m_observer.onLinkChange(isUp);
}
