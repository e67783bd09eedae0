#include "host/FreeMemory.h"

#include <algorithm>
#include <ctime>
#include <malloc.h>
#include <spdlog/spdlog.h>

namespace
{
constexpr long long INTERVAL = 5000;                  // milliseconds
constexpr long long LONGEST_INTERVAL = 600000;        // milliseconds
constexpr long long SHARE = 1000;                     // of the time, of which one part is spent here
constexpr unsigned long WORTH_IT = 2ul * 1024 * 1024; // octets

long long PROCESSOR_NANOSECONDS()
{
    timespec now = {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<long long>(now.tv_sec) * 1000000000 + now.tv_nsec;
}
} // namespace

FreeMemory::FreeMemory(TYEventLoop& loop)
    : m_timer(
          loop, EventPrio::LOW, [](void* self) { static_cast<FreeMemory*>(self)->onTimer(); }, this)
{
    m_timer.start(INTERVAL);
}

unsigned int FreeMemory::PAUSE_AFTER(long long nanoseconds)
{
    return static_cast<unsigned int>(std::clamp(nanoseconds / 1000000 * SHARE, INTERVAL, LONGEST_INTERVAL));
}

void FreeMemory::onTimer()
{
    long long const before = PROCESSOR_NANOSECONDS();
    look();
    m_timer.start(PAUSE_AFTER(PROCESSOR_NANOSECONDS() - before));
}

void FreeMemory::look()
{
    struct mallinfo2 const before = mallinfo2();
    bool const isMuch = before.fordblks > before.arena / 4 && before.fordblks > m_left + WORTH_IT;
    if (!isMuch)
    {
        m_left = before.fordblks < m_left ? before.fordblks : m_left;
        return;
    }
    malloc_trim(0);
    m_left = mallinfo2().fordblks; // pages that were given back count as free all the same
    spdlog::debug("of {} KiB of memory {} KiB were free and have been given back as far as possible",
                  before.arena / 1024, before.fordblks / 1024);
}
