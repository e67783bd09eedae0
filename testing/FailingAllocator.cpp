#include "testing/FailingAllocator.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <new>

namespace
{
std::atomic<unsigned long> s_count{0};
std::atomic<unsigned long> s_chosen{0};
std::atomic<bool> s_isCounting{false};
std::atomic<bool> s_hasFailed{false};
constinit thread_local unsigned int s_pauses = 0;
constinit thread_local bool s_isAwaited = false; // a request of our own, which is neither counted nor refused

/// Whether operator new asks us.
bool IS_ASKED()
{
    s_isAwaited = true;
    void* const memory = ::operator new(1, std::nothrow);
    bool const isAsked = !s_isAwaited;
    s_isAwaited = false;
    ::operator delete(memory);
    return isAsked;
}

void EXPECT_ASKED()
{
    if (IS_ASKED())
        return;
    std::fputs("FailingAllocator: operator new does not ask it; link callcontrol::testing-main or testing-new\n",
               stderr);
    std::abort();
}
} // namespace

void FailingAllocator::failNth(unsigned long n)
{
    EXPECT_ASKED();
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
    if (s_isAwaited)
    {
        s_isAwaited = false;
        return false;
    }
    if (!s_isCounting.load(std::memory_order_relaxed) || s_pauses != 0)
        return false;
    if (++s_count != s_chosen)
        return false;
    s_hasFailed = true;
    return true;
}

FailingAllocator::Pause::Pause() { ++s_pauses; }

FailingAllocator::Pause::~Pause() { --s_pauses; }
