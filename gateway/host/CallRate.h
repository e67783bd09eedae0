#pragma once

#include "platform/base/TYTime.h"

/// Whether calls begin too fast: a bucket that holds one second's worth of calls and fills up evenly. One thread.
///
///     CallRate rate(200);
///     if (!rate.take())
///         ... // a call more than 200 in a second
class CallRate
{
public:
    /// 0: no limit.
    explicit CallRate(unsigned int perSecond) : m_perSecond(perSecond), m_tokens(perSecond) {}

    void setLimit(unsigned int perSecond);
    /// Whether one more may begin; it then counts.
    bool take();

private:
    void refill();

    unsigned int m_perSecond;
    double m_tokens;
    TY::Time m_lastRefill;
    bool m_hasStarted = false;
};
