#pragma once

/// What became of the calls since the start, seen from the calling side. Every call that was placed is in the end
/// cleared (it was answered) or failed (it was not).
struct Counters
{
    unsigned long long placed = 0;
    unsigned long long answered = 0;
    unsigned long long cleared = 0;
    unsigned long long failed = 0;
    unsigned long long refused = 0; ///< 503 by admission or while ending; not counted as placed
};
