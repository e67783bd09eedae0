#pragma once

#include <functional>
#include <vector>

class TurnTime;
class TYEventLoop;

/// The outermost event loop of the process, from which all others of the signalling thread run. A module whose protocol
/// stack has a loop of its own that cannot run within another brings it along; else EpollLoop is it. One thread, the
/// one that made it.
///
///     loop.attach(callControlLoop);
///     loop.watch(descriptor, [this] { onReadable(); });
///     loop.run(); // until stop()
class SignallingLoop
{
public:
    virtual ~SignallingLoop() = default;

    /// Calls `onReadable` whenever the descriptor is readable, until it is forgotten. Throws std::runtime_error when
    /// the system refuses.
    virtual void watch(int descriptor, std::function<void()> onReadable) = 0;
    /// Ends the above, also from inside; to be called before the descriptor is closed. Nothing for one that is not
    /// watched.
    virtual void forget(int descriptor) = 0;
    virtual void run() = 0;
    /// Ends `run()`.
    virtual void stop() = 0;

    /// Runs turns of `loop`, which must outlive this loop's running, whenever work is pending in it.
    void attach(TYEventLoop& loop);
    /// Notes each turn there from now on; null: nowhere.
    void setTurnTime(TurnTime* time) { m_turnTime = time; }

protected:
    /// Around what is done between two waits: what is posted meanwhile runs before the second, without a system call.
    /// @{
    void beginBusy();
    void endBusy();
    /// @}

private:
    std::vector<TYEventLoop*> m_attached;
    TurnTime* m_turnTime = nullptr;
};
