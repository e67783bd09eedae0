#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"

#include <cstddef>

/// Where in a value the codec stands, so that its first error names the field: "Amount.multiplier: ...".
///
/// Used by encoder and decoder on the thread that runs them. The steps live on the stack and cost no memory; a text is
/// made only when something fails.
///
///     AsnTrace trace("Amount", error);
///     AsnTrace::Step const step(trace, "multiplier");
///     return trace.fail("is missing, octet %zu", offset); // "Amount.multiplier: is missing, octet 5"
class CC_EXPORT AsnTrace
{
public:
    /// One step into a structure (a name) or a list (an index), for as long as it lives.
    class Step
    {
    public:
        /// REQUIRES: the trace and the name outlive it; the step made last ends first. @{
        Step(AsnTrace& trace, char const* name) : m_trace(trace), m_before(trace.m_last), m_name(name) { link(); }
        Step(AsnTrace& trace, std::size_t index) : m_trace(trace), m_before(trace.m_last), m_index(index) { link(); }
        /// @}
        ~Step() { m_trace.m_last = m_before; }
        Step(Step const&) = delete;
        Step& operator=(Step const&) = delete;

    private:
        friend class AsnTrace;
        void link() { m_trace.m_last = this; }

        AsnTrace& m_trace;
        Step const* m_before;
        char const* m_name = nullptr; ///< null: a step into a list
        std::size_t m_index = 0;
    };

    /// `root` begins every text. Both must outlive the trace.
    AsnTrace(char const* root, String& error) : m_root(root), m_error(error) {}
    AsnTrace(AsnTrace const&) = delete;
    AsnTrace& operator=(AsnTrace const&) = delete;

    /// Sets the error text to path and reason. Returns false, for the caller to return. Throws std::bad_alloc.
    bool fail(char const* format, ...) __attribute__((format(printf, 2, 3)));

private:
    void appendPath(Step const* last);

    char const* m_root;
    String& m_error;
    Step const* m_last = nullptr;
};
