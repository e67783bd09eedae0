#include "Steps.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <sys/syscall.h>
#include <unistd.h>
#include <utility>

#if __has_include(<valgrind/callgrind.h>)
#include <valgrind/callgrind.h>
#else // a cross build, which runs elsewhere
#define CALLGRIND_START_INSTRUMENTATION
#define CALLGRIND_STOP_INSTRUMENTATION
#define CALLGRIND_DUMP_STATS_AT(name)
#endif

namespace
{
struct Allocations
{
    unsigned long number = 0;
    unsigned long long bytes = 0;
};

struct Step
{
    char const* name;
    Allocations allocations;
};

constexpr unsigned int MAX_STEPS = 64;
Step s_steps[MAX_STEPS]; // no container: nothing may be allocated here
unsigned int s_numberOfSteps = 0;
bool s_isArmed = false;
Step* s_current = nullptr;
Allocations s_allocations; // of the step under way

Step* STEP_OF(char const* name)
{
    for (Step& step : s_steps)
        if (step.name != nullptr && std::strcmp(step.name, name) == 0)
            return &step;
    if (s_numberOfSteps == MAX_STEPS)
        std::abort();
    s_steps[s_numberOfSteps].name = name;
    return &s_steps[s_numberOfSteps++];
}

/// What ran since the last mark counts for that name. No such system call exists; a plugin of qemu sees it go by.
void MARK(char const* name)
{
    CALLGRIND_DUMP_STATS_AT(name);
    syscall(SYS_prctl, 0x63636d6bL, name);
}

/// Closes the step under way. What runs from here to the next mark counts nowhere.
void CLOSE()
{
    Allocations const made = std::exchange(s_allocations, Allocations());
    MARK(s_current->name);
    s_current->allocations.number += made.number;
    s_current->allocations.bytes += made.bytes;
    s_current = nullptr;
}

void* ALLOCATE(std::size_t size)
{
    ++s_allocations.number;
    s_allocations.bytes += size;
    return std::malloc(size != 0 ? size : 1);
}

void* CHECKED(void* memory)
{
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}
} // namespace

void* operator new(std::size_t size) { return CHECKED(ALLOCATE(size)); }
void* operator new[](std::size_t size) { return CHECKED(ALLOCATE(size)); }
void* operator new(std::size_t size, std::nothrow_t const&) noexcept { return ALLOCATE(size); }
void* operator new[](std::size_t size, std::nothrow_t const&) noexcept { return ALLOCATE(size); }
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete[](void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }

void Steps::arm() { s_isArmed = true; }

void Steps::begin(char const* step)
{
    if (!s_isArmed)
        return;
    if (s_current == nullptr)
        CALLGRIND_START_INSTRUMENTATION;
    else
        CLOSE();
    s_current = STEP_OF(step);
    s_allocations = Allocations();
    MARK("(unmeasured)"); // the last thing: what follows is the step's
}

void Steps::next(char const* step)
{
    if (s_current != nullptr)
        begin(step);
}

void Steps::end()
{
    if (s_current == nullptr)
        return;
    CLOSE();
    CALLGRIND_STOP_INSTRUMENTATION;
}

void Steps::print()
{
    for (unsigned int i = 0; i < s_numberOfSteps; ++i)
        std::printf("%s\t%lu\t%llu\n", s_steps[i].name, s_steps[i].allocations.number, s_steps[i].allocations.bytes);
}
