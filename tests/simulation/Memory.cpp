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
    static constexpr std::size_t LARGE = 256;

    [[noreturn]] static void FAULT(char const* what)
    {
        std::fprintf(stderr, "memory: %s\n", what);
        std::abort();
    }
    static void CHECK(Header const& header);

    /// What was freed last, the oldest making room for the next.
    template <std::size_t SIZE>
    class Kept
    {
    public:
        void keep(Header& header)
        {
            Header*& place = m_headers[m_next];
            if (place != nullptr)
            {
                CHECK(*place);
                std::free(place);
            }
            place = &header;
            m_next = (m_next + 1) % SIZE;
            m_unchecked = m_unchecked < SIZE ? m_unchecked + 1 : SIZE;
        }
        /// What came since the last time; what came before is looked at when it makes room.
        void checkNew()
        {
            for (; m_unchecked != 0; --m_unchecked)
                CHECK(*m_headers[(m_next + SIZE - m_unchecked) % SIZE]);
        }

    private:
        Header* m_headers[SIZE]{};
        std::size_t m_next = 0;
        std::size_t m_unchecked = 0;
    };

    static std::mutex s_mutex;
    static Kept<4096> s_small;
    /// Adapters among them. Their memory is not used again in the same run: an observer list finds an observer by its
    /// address, and one that has the address of a former one takes its place.
    static Kept<1024> s_large;
};

std::mutex Heap::s_mutex;
Heap::Kept<4096> Heap::s_small;
Heap::Kept<1024> Heap::s_large;

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
    header->size < LARGE ? s_small.keep(*header) : s_large.keep(*header);
#else
    std::free(memory);
#endif
}

void Heap::CHECK_ALL() noexcept
{
    std::lock_guard const lock(s_mutex);
    s_small.checkNew();
    s_large.checkNew();
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
