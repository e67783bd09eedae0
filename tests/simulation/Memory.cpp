#include "tests/simulation/Memory.h"

#include <atomic>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>

#if defined(__SANITIZE_ADDRESS__)
#define SIMULATION_KEEPS_FREED_BLOCKS 0
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define SIMULATION_KEEPS_FREED_BLOCKS 0
#endif
#endif
#ifndef SIMULATION_KEEPS_FREED_BLOCKS
#define SIMULATION_KEEPS_FREED_BLOCKS 1
#endif

namespace Simulation
{
thread_local bool Memory::s_isInLibrary = false;
long Memory::s_blocks = 0;
unsigned int Memory::s_toFail = 0;
bool Memory::s_hasFailed = false;

void Memory::FAIL_NTH(unsigned int n)
{
    s_toFail = n;
    s_hasFailed = false;
}

/// What operator new and delete do. One thread at a time, which the lock sees to: other threads are few and short.
class Heap
{
public:
    static void* ALLOCATE(std::size_t size) noexcept
    {
        if (IS_TO_FAIL())
            return nullptr;
        std::lock_guard const lock(s_mutex);
        ++Memory::s_blocks;
        return TAKE(size);
    }
    static void FREE(void* memory) noexcept
    {
        if (memory == nullptr)
            return;
        std::lock_guard const lock(s_mutex);
        --Memory::s_blocks;
        GIVE(memory);
    }
    static void CHECK_ALL() noexcept;

private:
    static bool IS_TO_FAIL()
    {
        if (!Memory::s_isInLibrary || Memory::s_toFail == 0 || --Memory::s_toFail != 0)
            return false;
        Memory::s_hasFailed = true;
        return true;
    }
    static void* TAKE(std::size_t size) noexcept;
    static void GIVE(void* memory) noexcept;

    struct Header
    {
        std::size_t size;
        std::uint64_t mark;
    };
    static constexpr std::uint64_t IN_USE = 0x5511ced0a11c0de1;
    static constexpr std::uint64_t KEPT = 0xdeadb10cdeadb10c;
    static constexpr int PATTERN = 0xdd;
    static constexpr std::size_t NUMBER_OF_KEPT = 4096;

    [[noreturn]] static void FAULT(char const* what)
    {
        std::fprintf(stderr, "memory: %s\n", what);
        std::abort();
    }
    static void CHECK(Header const& header);

    static std::mutex s_mutex;
    static Header* s_kept[NUMBER_OF_KEPT];
    static std::size_t s_next;
};

std::mutex Heap::s_mutex;
Heap::Header* Heap::s_kept[NUMBER_OF_KEPT];
std::size_t Heap::s_next = 0;

void Heap::CHECK(Header const& header)
{
    auto const* const octets = reinterpret_cast<unsigned char const*>(&header + 1);
    for (std::size_t i = 0; i < header.size; ++i)
        if (octets[i] != PATTERN)
            FAULT("somebody wrote to a block that was freed");
}

void* Heap::TAKE(std::size_t size) noexcept
{
#if SIMULATION_KEEPS_FREED_BLOCKS
    auto* const header = static_cast<Header*>(std::malloc(sizeof(Header) + size));
    if (header == nullptr)
        return nullptr;
    *header = {size, IN_USE};
    return header + 1;
#else
    return std::malloc(size != 0 ? size : 1);
#endif
}

void Heap::GIVE(void* memory) noexcept
{
#if SIMULATION_KEEPS_FREED_BLOCKS
    auto* const header = static_cast<Header*>(memory) - 1;
    if (header->mark != IN_USE)
        FAULT(header->mark == KEPT ? "a block is freed twice" : "what is freed is no block");
    header->mark = KEPT;
    std::memset(memory, PATTERN, header->size);
    Header*& place = s_kept[s_next];
    s_next = (s_next + 1) % NUMBER_OF_KEPT;
    if (place != nullptr)
    {
        CHECK(*place);
        std::free(place);
    }
    place = header;
#else
    std::free(memory);
#endif
}

void Heap::CHECK_ALL() noexcept
{
    std::lock_guard const lock(s_mutex);
    for (Header const* const header : s_kept)
        if (header != nullptr)
            CHECK(*header);
}

void Memory::CHECK_KEPT_BLOCKS() { Heap::CHECK_ALL(); }
} // namespace Simulation

namespace
{
void* CHECKED(void* memory)
{
    if (memory == nullptr)
        throw std::bad_alloc();
    return memory;
}
} // namespace

#define SIMULATION_EXPORT __attribute__((visibility("default")))
using Simulation::Heap;
SIMULATION_EXPORT void* operator new(std::size_t size) { return CHECKED(Heap::ALLOCATE(size)); }
SIMULATION_EXPORT void* operator new[](std::size_t size) { return CHECKED(Heap::ALLOCATE(size)); }
SIMULATION_EXPORT void* operator new(std::size_t size, std::nothrow_t const&) noexcept { return Heap::ALLOCATE(size); }
SIMULATION_EXPORT void* operator new[](std::size_t size, std::nothrow_t const&) noexcept
{
    return Heap::ALLOCATE(size);
}
SIMULATION_EXPORT void operator delete(void* memory) noexcept { Heap::FREE(memory); }
SIMULATION_EXPORT void operator delete[](void* memory) noexcept { Heap::FREE(memory); }
SIMULATION_EXPORT void operator delete(void* memory, std::size_t) noexcept { Heap::FREE(memory); }
SIMULATION_EXPORT void operator delete[](void* memory, std::size_t) noexcept { Heap::FREE(memory); }
SIMULATION_EXPORT void operator delete(void* memory, std::nothrow_t const&) noexcept { Heap::FREE(memory); }
SIMULATION_EXPORT void operator delete[](void* memory, std::nothrow_t const&) noexcept { Heap::FREE(memory); }
