#pragma once

/// Lets one chosen allocation of the process fail.
///
/// The test main replaces operator new (the throwing and the nothrow forms, for single objects and arrays) by one that
/// asks here. What malloc gives is not touched. Rerun a test with the first, second, third ... allocation failing until
/// none is left:
///
///     for (unsigned long n = 1;; ++n)
///     {
///         FailingAllocator::failNth(n);
///         bool const isDone = wholeCall();       // no assertions in here: they allocate
///         FailingAllocator::stop();
///         if (!FailingAllocator::hasFailed())
///             break;                             // fewer than n allocations: all were tried
///     }
///
/// Bring everything back to its beginning in each round: what refuses to go on after a failure (CC_CallAdapter::dial)
/// allocates nothing, and the loop ends early. Assert behind it that the last round did it all.
///
/// Memory that TYRecycled keeps for reuse is no allocation: `TYRecycled::KEEP_BLOCKS(0)` first, as the test main does.
/// The fakes and recorders of the kit do not count: they work in a Pause. A program with a main of its own links
/// `callcontrol::testing-new`, or its own operator new asks `isToFail()`; in one that does neither `failNth` aborts.
class FailingAllocator
{
public:
    /// The n-th allocation from now on (1 is the next) fails, once; 0: none fails. The count begins again. Aborts with
    /// a message when operator new does not ask.
    static void failNth(unsigned long n);
    /// Lets no further allocation fail, and ends the count.
    static void stop();
    /// The allocations since the last `failNth`, up to `stop` if that was called; the failed one counts.
    static unsigned long count();
    /// Whether the allocation that was chosen last was made, and failed.
    static bool hasFailed();

    /// Asked by operator new once for each allocation.
    static bool isToFail();

    /// While one lives, allocations of this thread neither count nor fail.
    class Pause
    {
    public:
        Pause();
        ~Pause();
        Pause(Pause const&) = delete;
        Pause& operator=(Pause const&) = delete;
    };
};
