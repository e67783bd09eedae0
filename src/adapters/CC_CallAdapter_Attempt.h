#pragma once

#include "adapters/CC_CallAdapter.h"

/// Tells an operation that called out into a module whether its adapter still exists and still drives the same leg.
class CC_CallAdapter::Attempt
{
public:
    explicit Attempt(CC_CallAdapter const& adapter)
        : m_adapter(adapter), m_self(adapter.m_lifeline), m_number(adapter.m_attempt)
    {
    }
    bool isOver() const { return !m_self.isAlive() || m_adapter.m_attempt != m_number; }

private:
    CC_CallAdapter const& m_adapter;
    TYLifeline::Watch m_self;
    unsigned int m_number;
};
