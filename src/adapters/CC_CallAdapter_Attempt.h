#pragma once

#include "adapters/CC_CallAdapter.h"
#include "recorder/CC_RecordFormat.h"

#include <tuple>

/// Tells an operation that called out into somebody else's code whether its adapter still exists and still drives the
/// same leg.
///
///     Attempt const attempt(*this, "Accept");
///     if (!attempt.survives(call.addCallLeg(*m_ownCallLeg), "the call takes no leg"))
///         return XCode::FAILURE; // and `this` may be gone
class CC_CallAdapter::Attempt
{
public:
    /// `operation`: its name for the log, for who uses `fail` or `survives`.
    explicit Attempt(CC_CallAdapter const& adapter, char const* operation = "")
        : m_adapter(adapter), m_self(adapter.m_lifeline), m_operation(operation), m_number(adapter.m_attempt)
    {
    }
    bool isOver() const { return !m_self.isAlive() || m_adapter.m_attempt != m_number; }

    /// Whether a step went well and the attempt goes on; one that failed is logged with the reason.
    bool survives(XCode step, char const* reason) const
    {
        if (!step.isOk())
            std::ignore = fail(reason); // the caller decides what it comes to
        return step.isOk() && !isOver();
    }
    /// Logs why the operation fails, unless it is over and nothing is left to name, and returns the result.
    XCode fail(char const* reason, XCode result = XCode::FAILURE) const;
    /// Records what came of the operation, unless the attempt is over.
    void record(CC_RecordFormat::Kind kind, XCode result) const;

private:
    CC_CallAdapter const& m_adapter;
    TYLifeline::Watch m_self;
    char const* m_operation;
    unsigned int m_number;
};
