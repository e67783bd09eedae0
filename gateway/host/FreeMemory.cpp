#include "host/FreeMemory.h"

#include <malloc.h>
#include <spdlog/spdlog.h>

namespace
{
constexpr unsigned int INTERVAL = 5000;               // milliseconds
constexpr unsigned long WORTH_IT = 2ul * 1024 * 1024; // octets
} // namespace

FreeMemory::FreeMemory(TYEventLoop& loop)
    : m_timer(
          loop, EventPrio::LOW, [](void* self) { static_cast<FreeMemory*>(self)->look(); }, this)
{
    m_timer.start(INTERVAL);
}

void FreeMemory::look()
{
    m_timer.start(INTERVAL);
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
