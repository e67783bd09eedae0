#pragma once

#include "platform/eventloop/TYTimer.h"

#include <string>

/// Tells the service manager that started the process how it is (sd_notify(3)): that it serves, that it ends, and, if
/// asked to, again and again that its loop turns. Nothing where no manager asks.
///
///     ServiceNotifier notifier(loop);
///     notifier.tellReady();
class ServiceNotifier
{
public:
    /// Reads NOTIFY_SOCKET and WATCHDOG_USEC of the environment.
    explicit ServiceNotifier(TYEventLoop& loop);
    ServiceNotifier(ServiceNotifier const&) = delete;
    ServiceNotifier& operator=(ServiceNotifier const&) = delete;

    /// From now on the loop is watched.
    void tellReady();
    void tellStopping() const { send("STOPPING=1"); }

private:
    void send(std::string const& text) const;
    static void ON_TIMER(void* notifier);

    std::string m_socket;        // empty: nobody asks
    unsigned int m_interval = 0; // milliseconds; 0: nobody watches
    TYTimer m_timer;
};
