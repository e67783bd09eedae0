#pragma once

#include "configuration/Configuration.h"
#include "host/CallControlHost.h"
#include "host/EpollLoop.h"
#include "host/GatewayHost.h"
#include "host/SignallingModule.h"
#include "media/context/MediaLayer.h"
#include "operation/Recording.h"
#include "operation/ServiceNotifier.h"
#include "operation/StateDump.h"
#include "operation/capture/HepCapture.h"
#include "operation/control/ControlCommands.h"
#include "operation/control/ControlServer.h"
#include "operation/http/HttpServer.h"
#include "operation/metric/GatewayMetrics.h"
#include "operation/page/CallPage.h"
#include "operation/page/ControlRelay.h"
#include "operation/page/StatusPage.h"
#include "operation/record/CallRecords.h"
#include "operation/record/CallWatch.h"
#include "platform/eventloop/TYEventLoop.h"
#include "platform/eventloop/TYTimer.h"

#include <map>
#include <memory>
#include <optional>
#include <string>

/// The gateway at work: call control and the signalling modules of a configuration, on the calling thread.
///
///     Gateway::BLOCK_SIGNALS();
///     Gateway gateway(configuration, std::move(modules), 1);
///     gateway.run(); // until SIGTERM or SIGINT and the end of the calls
class Gateway : private ControlledGateway
{
public:
    using Modules = SignallingModules;

    /// Opens all interfaces. `tracedCalls`: how many calls get a ladder on the standard output. Throws
    /// ConfigurationError for an interface that cannot be opened.
    Gateway(Configuration const& configuration, Modules modules, unsigned int tracedCalls);
    ~Gateway();
    Gateway(Gateway const&) = delete;
    Gateway& operator=(Gateway const&) = delete;

    /// Serves calls until it was asked to end and the calls are over, or were cleared in the configured time.
    void run();
    Counters const& getCounters() const { return m_host.counters; }

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
    SignallingLoop& findLoop(Modules const& modules);
    void openModules();
    void onSignal();
    void end(unsigned int patience);
    void clearCalls();
    void onClearTimer();
    void stopIfIdle();
    bool hasEndpoints() const;
    void onHangUp();
    void openControl();
    void openMetrics();
    void startMedia();
    void watchCalls();
    void prepareInterfaces(Configuration const& configuration);
    void followInterfaces(Configuration const& before);
    void follow(Configuration configuration);
    void followDialling(Configuration const& configuration);
    std::string getState() const;

    // --- ControlledGateway
    void shutDown(std::optional<unsigned int> seconds) override;
    std::string reload() override;

    Configuration m_configuration;
    TYEventLoop m_callControlLoop;
    TYEventLoop m_datapathLoop; // idle when the media layer has loops of its own
    std::unique_ptr<MediaLayer> m_media;
    std::unique_ptr<EpollLoop> m_ownLoop; // null where a module brings one
    SignallingLoop& m_loop;
    Signals m_signals;
    Recording m_recording;
    StateDump m_dump;
    std::unique_ptr<CallRecords> m_records; // null where it is not configured
    CallMetrics m_callMetrics;
    CallTracer m_tracer;
    CallWatch m_watch;                     // calls may last until call control ends
    std::unique_ptr<HepCapture> m_capture; // null where it is not configured
    CallControlHost m_callControl;
    GatewayHost m_host;
    ServiceNotifier m_service;
    TYTimer m_clearTimer;
    bool m_isClearing = false;
    Modules m_modules;
    ControlCommands m_commands;
    std::unique_ptr<ControlServer> m_control; // null where it is not configured
    StatusPage m_page;
    std::optional<ControlRelay> m_relay; // where there is a page and a socket
    std::unique_ptr<GatewayMetrics>
        m_metrics; // null where they are not configured, and so are the pages, which end first
    std::unique_ptr<HttpServer> m_pages;
};
