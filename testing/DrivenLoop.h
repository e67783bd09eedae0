#pragma once

#include "platform/eventloop/TYEventLoop.h"

/// An event loop that a test turns by hand. While it lives it is call control's loop; the one before comes back then.
///
///     DrivenLoop loop;
///     call->defer();
///     loop.turn();                  // deferred() runs
///     EXPECT_EQ(loop.settle(), 0u); // and asks for nothing more
///
/// Its timers are due when the DrivenClock says so: `clock.advance(30000), loop.turn()` is half a minute later.
/// Calls and adapters must be gone before it is.
class DrivenLoop : public TYEventLoop
{
public:
    /// After so many turns `settle` takes the loop for one that never comes to rest.
    static constexpr unsigned int MANY_TURNS = 1000;

    DrivenLoop();
    ~DrivenLoop();

    /// Runs one turn: whether there was anything to do.
    bool turn() { return runTurn(); }
    /// Runs turns until there is nothing to do, at most `bound`. The number of turns that had something to do: `bound`
    /// when there may be more.
    unsigned int settle(unsigned int bound = MANY_TURNS);

private:
    TYEventLoop* m_before;
};
