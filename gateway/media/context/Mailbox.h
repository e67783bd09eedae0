#pragma once

#include "platform/eventloop/TYEvent.h"
#include "platform/eventloop/TYEventLoop.h"

#include <atomic>
#include <new>
#include <tuple>
#include <utility>

/// Values from any thread to the one of an event loop, in the order of each sender. Made and ended on the loop's
/// thread; senders must be gone by its end.
///
/// Posting takes memory and, if the loop is not yet awake, the loop's lock; so nobody posts for a packet.
template <class Value>
class Mailbox
{
public:
    /// `callback` is called with `argument` in a turn of the loop when something is there to `take`.
    Mailbox(TYEventLoop& loop, TYEvent::Callback callback, void* argument)
        : m_event(new TYEvent(loop, EventPrio::NORMAL, callback, argument))
    {
    }
    ~Mailbox()
    {
        m_event->destroy();
        take([](Value&) {});
    }
    Mailbox(Mailbox const&) = delete;
    Mailbox& operator=(Mailbox const&) = delete;

    /// Whether there was memory for it.
    bool post(Value value)
    {
        Letter* const letter = new (std::nothrow) Letter{std::move(value), m_newest.load(std::memory_order_relaxed)};
        if (letter == nullptr)
            return false;
        while (!m_newest.compare_exchange_weak(letter->older, letter, std::memory_order_release,
                                               std::memory_order_relaxed))
        {
        }
        return m_event->setIfNotPending().isOk();
    }

    /// Calls `handle(value)` with each that is there, the oldest first.
    template <class Handle>
    void take(Handle&& handle)
    {
        Letter* oldest = nullptr;
        for (Letter* letter = m_newest.exchange(nullptr, std::memory_order_acquire); letter != nullptr;)
            std::tie(oldest, letter) = std::pair(letter, std::exchange(letter->older, oldest));
        while (oldest != nullptr)
        {
            handle(oldest->value);
            delete std::exchange(oldest, oldest->older);
        }
    }

private:
    struct Letter
    {
        Value value;
        Letter* older;
    };
    TYEvent* m_event;
    std::atomic<Letter*> m_newest{nullptr};
};
