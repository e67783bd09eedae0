#include "SipTimer.h"

SipTimer::SipTimer(su_root_t* root, std::function<void()> onExpiry)
    : m_timer(su_timer_create(su_root_task(root), 0)), m_onExpiry(std::move(onExpiry))
{
}

SipTimer::~SipTimer()
{
    if (m_timer != nullptr)
        su_timer_destroy(m_timer);
}

bool SipTimer::start(unsigned int milliseconds)
{
    stop();
    m_isRunning = m_timer != nullptr &&
                  su_timer_set_interval(m_timer, ON_EXPIRY, this, static_cast<su_duration_t>(milliseconds)) == 0;
    return m_isRunning;
}

void SipTimer::stop()
{
    if (m_isRunning)
        su_timer_reset(m_timer);
    m_isRunning = false;
}

void SipTimer::ON_EXPIRY(su_root_magic_t*, su_timer_t*, SipTimer* timer)
{
    timer->m_isRunning = false;
    timer->m_onExpiry();
}
