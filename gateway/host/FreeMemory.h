#pragma once

#include "platform/eventloop/TYTimer.h"

class TYEventLoop;

/// Gives memory back to the system that calls have left: the allocator keeps what lies between pieces that are in use,
/// and after a busy hour that would be nearly all of it. Looks every few seconds, and does something only if much is
/// free and more than a quarter of all.
///
///     FreeMemory const freeMemory(loop); // for as long as it lives
class FreeMemory
{
public:
    explicit FreeMemory(TYEventLoop& loop);
    FreeMemory(FreeMemory const&) = delete;
    FreeMemory& operator=(FreeMemory const&) = delete;

private:
    void look();

    TYTimer m_timer;
    unsigned long m_left = 0; // octets that were free and could not be given back
};
