#pragma once

#include "platform/eventloop/TYTimer.h"

class TYEventLoop;

/// Gives memory back to the system that calls have left: the allocator keeps what lies between pieces that are in use,
/// and after a busy hour that would be nearly all of it. Looks every few seconds, and does something only if much is
/// free and more than a quarter of all. A look walks over all that is free, and nothing else runs meanwhile: after ten
/// thousand calls it takes as long as a hundred calls, so that the next one comes the later the longer it took.
///
///     FreeMemory const freeMemory(loop); // for as long as it lives
class FreeMemory
{
public:
    explicit FreeMemory(TYEventLoop& loop);
    FreeMemory(FreeMemory const&) = delete;
    FreeMemory& operator=(FreeMemory const&) = delete;

    /// Milliseconds from a look that took so much processor time until the next one.
    static unsigned int PAUSE_AFTER(long long nanoseconds);

private:
    void onTimer();
    void look();

    TYTimer m_timer;
    unsigned long m_left = 0; // octets that were free and could not be given back
};
