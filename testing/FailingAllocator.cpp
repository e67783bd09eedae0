#include "testing/FailingAllocator.h"

#include <atomic>

namespace
{
std::atomic<unsigned long> s_count{0};
std::atomic<unsigned long> s_chosen{0};
std::atomic<bool> s_isCounting{false};
std::atomic<bool> s_hasFailed{false};
constinit thread_local unsigned int s_pauses = 0;
} // namespace

void FailingAllocator::failNth(unsigned long n)
{
    s_count = 0;
    s_hasFailed = false;
    s_chosen = n;
    s_isCounting = true;
}

void FailingAllocator::stop() { s_isCounting = false; }

unsigned long FailingAllocator::count() { return s_count; }

bool FailingAllocator::hasFailed() { return s_hasFailed; }

bool FailingAllocator::isToFail()
{
    if (!s_isCounting.load(std::memory_order_relaxed) || s_pauses != 0)
        return false;
    if (++s_count != s_chosen)
        return false;
    s_hasFailed = true;
    return true;
}

FailingAllocator::Pause::Pause() { ++s_pauses; }

FailingAllocator::Pause::~Pause() { --s_pauses; }
