#pragma once

#include "platform/base/Export.h"

#include <pthread.h>

/// A mutex.
class CC_EXPORT TYMutex
{
public:
    /// `recursive`: 0, or 1 when the thread that holds it may lock it again.
    explicit TYMutex(unsigned int recursive = 0);
    ~TYMutex();
    TYMutex(TYMutex const&) = delete;
    TYMutex& operator=(TYMutex const&) = delete;

    /// Waits for the mutex, and gives it up. REQUIRES: who unlocks holds it. @{
    void lock();
    void unlock();
    /// @}

private:
    pthread_mutex_t m_mutex;
};

/// Holds a mutex while it lives.
///
///     TYAutoLock<TYMutex> const lock(s_mutex);
template <class Mutex>
class TYAutoLock
{
public:
    /// Waits for the mutex. REQUIRES: the mutex outlives the lock.
    explicit TYAutoLock(Mutex& mutex) : m_mutex(mutex) { m_mutex.lock(); }
    ~TYAutoLock() { m_mutex.unlock(); }
    TYAutoLock(TYAutoLock const&) = delete;
    TYAutoLock& operator=(TYAutoLock const&) = delete;

private:
    Mutex& m_mutex;
};
