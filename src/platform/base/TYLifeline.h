#pragma once

/// Lets an operation that called out to somebody else's code ask whether its own object is still there.
///
/// A member of the object that may be destroyed inside such a call. The operation puts a `Watch` on its stack before
/// it calls out and asks it afterwards; the lifeline's destructor tells every watch. One thread only; nothing is
/// allocated.
///
///     TYLifeline::Watch const self(m_lifeline);
///     observer.somethingHappened();   // may delete this
///     if (!self.isAlive())
///         return;
class TYLifeline
{
public:
    /// Tells whether the object still exists.
    class Watch
    {
    public:
// g++ 12 sees the address of a local variable kept in a member, and not that the destructor takes it out again
#if defined(__GNUC__) && !defined(__clang__)
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdangling-pointer"
#endif
        /// REQUIRES: on the stack, so that watches end in the reverse order of their making.
        explicit Watch(TYLifeline const& lifeline) : m_lifeline(&lifeline), m_outer(lifeline.m_innermost)
        {
            lifeline.m_innermost = this;
        }
#if defined(__GNUC__) && !defined(__clang__)
#pragma GCC diagnostic pop
#endif
        ~Watch()
        {
            if (m_lifeline != nullptr)
                m_lifeline->m_innermost = m_outer;
        }
        Watch(Watch const&) = delete;
        Watch& operator=(Watch const&) = delete;

        /// False once the lifeline, and so the object that holds it, has ended.
        bool isAlive() const { return m_lifeline != nullptr; }

    private:
        friend class TYLifeline;
        TYLifeline const* m_lifeline;
        Watch* m_outer;
    };

    TYLifeline() = default;
    ~TYLifeline()
    {
        for (Watch* watch = m_innermost; watch != nullptr; watch = watch->m_outer)
            watch->m_lifeline = nullptr;
    }
    TYLifeline(TYLifeline const&) = delete;
    TYLifeline& operator=(TYLifeline const&) = delete;

    /// Whether an operation of the object has called out and not yet come back.
    bool isWatched() const { return m_innermost != nullptr; }

private:
    mutable Watch* m_innermost = nullptr; // watches live on the stack, so the innermost ends first
};
