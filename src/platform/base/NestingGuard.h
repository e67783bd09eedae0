#pragma once

/// Counts how deep an operation is nested in itself, for as long as the guard lives.
///
/// The diagnostic dumps use one static counter per class, so that a call printed inside a leg inside a call does not
/// descend a second time.
///
///     static unsigned int s_depth = 0;
///     NestingGuard const nesting(s_depth);
///     if (nesting.isOutermost())
///         ...
class NestingGuard
{
public:
    /// Counts up, and down again at its end. REQUIRES: the counter outlives it.
    explicit NestingGuard(unsigned int& counter) : m_counter(counter) { ++m_counter; }
    ~NestingGuard() { --m_counter; }
    NestingGuard(NestingGuard const&) = delete;
    NestingGuard& operator=(NestingGuard const&) = delete;

    /// Whether nobody else counts: the counter was 0.
    bool isOutermost() const { return m_counter == 1; }

private:
    unsigned int& m_counter;
};
