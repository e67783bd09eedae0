#pragma once

#include "configuration/Configuration.h"
#include "host/CallControlHost.h"
#include "host/FreeMemory.h"
#include "media/context/MediaLayer.h"
#include "operation/Recording.h"
#include "operation/StateDump.h"
#include "platform/eventloop/TYEventLoop.h"
#include "platform/eventloop/TYTimer.h"
#include "sip/endpoint/SipEnvironment.h"
#include "sip/endpoint/SipInterface.h"
#include "sip/stack/SipStack.h"

#include <memory>
#include <vector>

/// The gateway at work: call control and the SIP interfaces of a configuration, on the calling thread.
///
///     Gateway::BLOCK_SIGNALS();
///     Gateway gateway(configuration, 1);
///     gateway.run(); // until SIGTERM or SIGINT and the end of the calls
class Gateway
{
public:
    /// Listens on all interfaces. `tracedCalls`: how many calls get a ladder on the standard output. Throws
    /// ConfigurationError for an address that cannot be listened on.
    Gateway(Configuration const& configuration, unsigned int tracedCalls);
    Gateway(Gateway const&) = delete;
    Gateway& operator=(Gateway const&) = delete;

    /// Serves calls until it was asked to end and the calls are over, or were cleared in the configured time.
    void run();
    Counters const& getCounters() const { return m_environment.counters; }

    /// The signals that `run()` takes from a descriptor. To be called before any thread is made.
    static void BLOCK_SIGNALS();
    /// Calls, legs and adapters that are alive, and what belongs to them: 0 after the gateway's end.
    static unsigned int GET_NUMBER_OF_LEFT_OVERS();

private:
    /// The descriptor from which the signals are read.
    class Signals
    {
    public:
        Signals();
        ~Signals();
        Signals(Signals const&) = delete;
        Signals& operator=(Signals const&) = delete;
        int get() const { return m_descriptor; }

    private:
        int m_descriptor;
    };
    struct Port
    {
        Port(SipEnvironment& environment, CallControlHost const& host, Configuration::Interface const& configuration)
            : interface(environment, configuration), registration(host, interface.getName(), interface)
        {
        }
        SipInterface interface;
        CallControlHost::Registration registration; // taken back before the provider ends
    };

    void openPorts();
    void onSignal();
    void end();
    void clearCalls();
    void onClearTimer();
    void stopIfIdle();
    bool hasEndpoints() const;
    void onHangUp();
    std::string getState() const;

    Configuration m_configuration;
    TYEventLoop m_callControlLoop;
    TYEventLoop m_datapathLoop; // idle when the media layer has loops of its own
    std::unique_ptr<MediaLayer> m_media;
    SipStack m_stack;
    Signals m_signals;
    Recording m_recording;
    StateDump m_dump;
    CallControlHost m_host;
    SipEnvironment m_environment;
    FreeMemory m_freeMemory;
    TYTimer m_clearTimer;
    bool m_isClearing = false;
    std::vector<std::unique_ptr<Port>> m_ports;
};
