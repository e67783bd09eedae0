#include "platform/base/TYRecycled.h"

#include <atomic>
#include <utility>

namespace
{
struct Block
{
    Block* next;
};

struct List
{
    Block* first = nullptr;
    unsigned int count = 0;
};

constexpr std::size_t UNIT = sizeof(void*);
constexpr std::size_t MAX_SIZE = 512;

/// The blocks that a thread keeps, a list for each size up to the largest.
struct Cache
{
    List lists[MAX_SIZE / UNIT];
};

#if defined(__SANITIZE_ADDRESS__)
#define CC_SEEKS_FAULTS 1
#elif defined(__has_feature)
#define CC_SEEKS_FAULTS __has_feature(address_sanitizer)
#else
#define CC_SEEKS_FAULTS 0
#endif

#if defined(NDEBUG) && !CC_SEEKS_FAULTS
constexpr unsigned int BLOCKS_AT_FIRST = TYRecycled::DEFAULT_BLOCKS;
#else
constexpr unsigned int BLOCKS_AT_FIRST = 0;
#endif
std::atomic<unsigned int> s_limit{BLOCKS_AT_FIRST};

// A pointer, since room for thread-local objects that is reached this quickly is scarce. What ends after the thread's
// cache finds it null and ended.
thread_local Cache* t_cache __attribute__((tls_model("initial-exec"))) = nullptr;
thread_local bool t_isEnded __attribute__((tls_model("initial-exec"))) = false;

// All blocks of a list are of the same size, whatever the sizes of the objects.
std::size_t INDEX_OF(std::size_t size) { return (size + UNIT - 1) / UNIT - 1; }
std::size_t BLOCK_SIZE_OF(std::size_t size) { return (INDEX_OF(size) + 1) * UNIT; }

void TRIM(Cache& cache, unsigned int limit)
{
    for (List& list : cache.lists)
        while (list.count > limit)
        {
            ::operator delete(std::exchange(list.first, list.first->next));
            --list.count;
        }
}

struct CacheEnd
{
    ~CacheEnd()
    {
        TRIM(*t_cache, 0);
        delete t_cache;
        t_cache = nullptr;
        t_isEnded = true;
    }
    void isReached() {}
};
thread_local CacheEnd t_end;

/// Makes the thread's cache, unless there is no memory for it or the thread's objects are at their end.
[[gnu::noinline]] Cache* MAKE_CACHE()
{
    if (!t_isEnded)
        t_cache = new (std::nothrow) Cache;
    if (t_cache != nullptr)
        t_end.isReached(); // from now on it has to be
    return t_cache;
}

void* TAKE(std::size_t size)
{
    Cache* const cache = t_cache;
    if (cache == nullptr || size > MAX_SIZE)
        return nullptr;
    List& list = cache->lists[INDEX_OF(size)];
    Block* const block = list.first;
    if (block != nullptr)
    {
        list.first = block->next;
        --list.count;
    }
    return block;
}

/// Whether the thread has kept the block.
bool KEEP(Cache& cache, void* memory, std::size_t size)
{
    List& list = cache.lists[INDEX_OF(size)];
    if (list.count >= s_limit.load(std::memory_order_relaxed))
        return false;
    list.first = new (memory) Block{list.first};
    ++list.count;
    return true;
}

/// A block that is too large, null, or the thread's first.
[[gnu::noinline]] void GIVE_BACK(void* block, std::size_t size)
{
    bool const isToKeep = block != nullptr && size <= MAX_SIZE && s_limit.load(std::memory_order_relaxed) != 0;
    Cache* const cache = isToKeep && t_cache == nullptr ? MAKE_CACHE() : nullptr;
    if (cache == nullptr || !KEEP(*cache, block, size))
        ::operator delete(block);
}
} // namespace

void* TYRecycled::operator new(std::size_t size)
{
    void* const block = TAKE(size);
    return block != nullptr ? block : ::operator new(BLOCK_SIZE_OF(size));
}

void* TYRecycled::operator new(std::size_t size, std::nothrow_t const&) noexcept
{
    void* const block = TAKE(size);
    return block != nullptr ? block : ::operator new(BLOCK_SIZE_OF(size), std::nothrow);
}

void TYRecycled::operator delete(void* block, std::size_t size) noexcept
{
    Cache* const cache = t_cache;
    if (block == nullptr || cache == nullptr || size > MAX_SIZE)
        return GIVE_BACK(block, size);
    if (!KEEP(*cache, block, size))
        ::operator delete(block);
}

void TYRecycled::operator delete(void* block, std::nothrow_t const&) noexcept { ::operator delete(block); }

void TYRecycled::KEEP_BLOCKS(unsigned int ofEachSize)
{
    s_limit.store(ofEachSize, std::memory_order_relaxed);
    if (t_cache != nullptr)
        TRIM(*t_cache, ofEachSize);
}
