#pragma once

#include "sip/Sofia.h"

#include <functional>

/// Calls a function once, some time from now. Belongs to the thread of the stack's loop.
///
///     SipTimer timer(stack.getRoot(), [this] { giveUp(); });
///     timer.start(30000);
class SipTimer
{
public:
    SipTimer(su_root_t* root, std::function<void()> onExpiry);
    ~SipTimer();
    SipTimer(SipTimer const&) = delete;
    SipTimer& operator=(SipTimer const&) = delete;

    /// In that many milliseconds; a timer that is running starts anew. False when memory is out.
    bool start(unsigned int milliseconds);
    void stop();

private:
    static void ON_EXPIRY(su_root_magic_t*, su_timer_t*, SipTimer* timer);

    su_timer_t* m_timer;
    std::function<void()> m_onExpiry;
    bool m_isRunning = false;
};
