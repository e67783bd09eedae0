#pragma once

#include "host/SignallingLoop.h"

#include <map>
#include <memory>

/// The outermost loop where no protocol stack brings one.
class EpollLoop : public SignallingLoop
{
public:
    /// Throws std::runtime_error when the system refuses.
    EpollLoop();
    ~EpollLoop() override;
    EpollLoop(EpollLoop const&) = delete;
    EpollLoop& operator=(EpollLoop const&) = delete;

    // --- SignallingLoop
    void watch(int descriptor, std::function<void()> onReadable) override;
    void forget(int descriptor) override;
    void run() override;
    void stop() override { m_isRunning = false; }

private:
    void runTurn();

    int m_descriptor;
    bool m_isRunning = false;
    std::map<int, std::shared_ptr<std::function<void()>>> m_handlers; // shared: one may forget itself
};
