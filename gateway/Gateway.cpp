#include "Gateway.h"

#include "adapters/CC_CallAdapter.h"
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "configuration/ConfigurationChange.h"
#include "diagnosis/CC_Explanation.h"
#include "diagnosis/CC_RecordingReport.h"
#include "host/MediaContexts.h"
#include "media/context/CallMedia.h"
#include "operation/Log.h"
#include "operation/record/CallLine.h"
#include "platform/eventloop/TYEvent.h"
#include "recorder/CC_Recorder.h"

#include <spdlog/spdlog.h>

#include <algorithm>
#include <csignal>

#include <stdexcept>
#include <sys/signalfd.h>
#include <tuple>
#include <unistd.h>

namespace
{
constexpr unsigned int EVERYTHING = 99; // levels and details of a dump

sigset_t HANDLED_SIGNALS()
{
    sigset_t signals;
    sigemptyset(&signals);
    for (int const signal : {SIGTERM, SIGINT, SIGHUP, SIGUSR1, SIGUSR2, SIGCHLD})
        sigaddset(&signals, signal);
    return signals;
}

String CONTEXT_NAME(Configuration const& configuration)
{
    return configuration.context.empty() ? CallControl::DEFAULT_CONTEXT_NAME : configuration.context.c_str();
}

std::unique_ptr<CallRecords> OPEN_RECORDS(Configuration const& configuration)
try
{
    return configuration.records.isOn() ? std::make_unique<CallRecords>(configuration.records) : nullptr;
}
catch (CallRecords::Failure const& error)
{
    throw ConfigurationError(configuration.file, "records." + error.key, error.what());
}

std::unique_ptr<HepCapture> OPEN_CAPTURE(Configuration const& configuration, TYEventLoop& loop)
try
{
    return configuration.capture.isOn() ? std::make_unique<HepCapture>(configuration.capture, loop) : nullptr;
}
catch (std::runtime_error const& error)
{
    throw ConfigurationError(configuration.file, "capture.server", error.what());
}
} // namespace

Gateway::Signals::Signals()
{
    sigset_t const signals = HANDLED_SIGNALS();
    m_descriptor = signalfd(-1, &signals, SFD_NONBLOCK | SFD_CLOEXEC);
    if (m_descriptor < 0)
        throw std::runtime_error("no descriptor for signals");
}

Gateway::Signals::~Signals() { close(m_descriptor); }

void Gateway::BLOCK_SIGNALS()
{
    sigset_t const signals = HANDLED_SIGNALS();
    sigprocmask(SIG_BLOCK, &signals, nullptr);
    std::signal(SIGPIPE, SIG_IGN);
    std::signal(SIGXFSZ, SIG_IGN); // a limit of files' sizes is a disk that is full
}

unsigned int Gateway::GET_NUMBER_OF_LEFT_OVERS()
{
    unsigned int const ofCalls =
        CC_Call::s_numberOfInstances + CC_CallLeg::s_numberOfInstances + CC_CallAdapter::s_numberOfInstances;
    unsigned int const ofModules = CC_Endpoint::s_numberOfInstances + CC_Provider::s_numberOfInstances;
    unsigned int const inside = CC_Property::s_numberOfInstances + TYEvent::s_numberOfInstances.load() +
                                MediaContext::s_numberOfInstances + CallMedia::s_numberOfInstances;
    return ofCalls + ofModules + inside;
}

Gateway::Gateway(Configuration const& configuration, Modules modules, unsigned int tracedCalls)
    : m_configuration(configuration)
    , m_media(configuration.relaysMedia ? std::make_unique<MediaLayer>(configuration.media, m_callControlLoop)
                                        : nullptr)
    , m_loop(findLoop(modules))
    , m_recording(configuration)
    , m_records(OPEN_RECORDS(configuration))
    , m_capture(OPEN_CAPTURE(configuration, m_callControlLoop))
    , m_callControl(m_callControlLoop, m_datapathLoop, CONTEXT_NAME(configuration), m_media.get())
    , m_host{m_loop,
             m_callControl.getContextName(),
             Routing(configuration.routes),
             Admission(configuration.maxCalls, configuration.maxCallsPerSecond, configuration.maxCallsPerSource),
             CallTrace(tracedCalls),
             {},
             0,
             configuration.relaysMedia,
             false,
             [this] { stopIfIdle(); }}
    , m_service(m_callControlLoop)
    , m_clearTimer(
          m_callControlLoop, EventPrio::NORMAL, [](void* gateway) { static_cast<Gateway*>(gateway)->onClearTimer(); },
          this)
    , m_modules(std::move(modules))
    , m_commands(m_host, m_modules, m_configuration.moduleOf, m_watch, m_tracer, m_records.get(), *this)
    , m_page(m_host, m_modules, m_configuration.moduleOf, m_watch)
{
    m_host.capture = m_capture.get();
    followDialling(configuration);
    watchCalls();
    m_loop.attach(m_callControlLoop);
    m_loop.attach(m_datapathLoop);
    m_loop.watch(m_signals.get(), [this] { onSignal(); });
    for (auto const& [name, module] : m_modules)
        module->open(m_host);
    openControl();
    openMetrics();
    startMedia();
}

void Gateway::startMedia()
{
    if (m_media == nullptr)
        return;
    m_media->setRecordingFailure([](std::string const& path, std::string const& reason)
                                 { spdlog::error("the recording {}: {}", path, reason); });
    m_media->start();
}

void Gateway::watchCalls()
{
    m_watch.tell([](CallRecord const& record) { spdlog::info("{}", CallLine::TEXT_OF(record)); });
    if (m_records != nullptr)
    {
        m_watch.tellChange([this](CallRecord const& record) { m_records->note(record); });
        m_watch.tell([this](CallRecord const& record) { m_records->write(record); });
    }
    m_watch.tell([this](CallRecord const& record) { m_tracer.onCallOver(record); });
    if (m_records != nullptr && m_configuration.records.refusesUnrecorded)
        m_host.mustRefuse = [this] { return !m_records->hasRoom(); };
    m_watch.watch(m_host.contextName);
}

void Gateway::openControl()
{
    if (m_configuration.control.path.empty())
        return;
    try
    {
        m_control = std::make_unique<ControlServer>(m_configuration.control, m_loop, m_callControlLoop, m_commands);
    }
    catch (std::runtime_error const& error)
    {
        throw ConfigurationError(m_configuration.file, "control.socket", error.what());
    }
}

void Gateway::openMetrics()
{
    if (m_configuration.metrics.listen.port == 0)
        return;
    m_watch.tell([this](CallRecord const& record) { m_callMetrics.note(record); });
    m_metrics = std::make_unique<GatewayMetrics>(m_host, m_modules, m_configuration.moduleOf, m_watch, m_callMetrics,
                                                 m_records.get(), m_callControlLoop);
    try
    {
        HttpContents contents{{{"/metrics", [this] {
                                    return HttpAnswer{200, m_metrics->getText(), MetricText::CONTENT_TYPE};
                                }}}};
        if (m_configuration.metrics.hasPage)
            contents.pages["/"] = [this] { return HttpAnswer{200, m_page.getText(), StatusPage::CONTENT_TYPE}; };
        if (m_configuration.metrics.hasPage && m_control != nullptr)
        {
            contents.files = CallPage::FILES(!m_configuration.metrics.token.empty());
            contents.relay = &m_relay.emplace(m_configuration.control.path, m_configuration.metrics.token);
        }
        m_pages = std::make_unique<HttpServer>(m_configuration.metrics.listen, m_loop, std::move(contents));
    }
    catch (std::runtime_error const& error)
    {
        throw ConfigurationError(m_configuration.file, "metrics.listen", error.what());
    }
}

/// The module whose loop it is ends last: what the others have there they take back.
Gateway::~Gateway()
{
    std::erase_if(m_modules, [](auto const& one) { return one.second->getLoop() == nullptr; });
}

SignallingLoop& Gateway::findLoop(Modules const& modules)
{
    SignallingLoop* found = nullptr;
    for (auto const& [name, module] : modules)
        if (SignallingLoop* const loop = module->getLoop(); found != nullptr && loop != nullptr)
            throw ConfigurationError(m_configuration.file, name, "needs the outermost loop, which another module has");
        else if (loop != nullptr)
            found = loop;
    if (found != nullptr)
        return *found;
    m_ownLoop = std::make_unique<EpollLoop>();
    return *m_ownLoop;
}

void Gateway::run()
{
    m_service.tellReady();
    m_loop.run();
}

void Gateway::onSignal()
{
    signalfd_siginfo info = {};
    while (read(m_signals.get(), &info, sizeof info) == static_cast<ssize_t>(sizeof info))
        switch (info.ssi_signo)
        {
        case SIGUSR1:
            m_dump.begin([this] { return getState(); });
            break;
        case SIGCHLD:
            m_dump.onChild();
            m_tracer.onChild();
            if (m_control != nullptr)
                m_control->onChild();
            break;
        case SIGHUP:
            onHangUp();
            break;
        case SIGUSR2:
            spdlog::info("SIGUSR2 means nothing here");
            break;
        default:
            end(m_configuration.clearAfter);
        }
}

void Gateway::onHangUp()
{
    if (m_records != nullptr)
        m_records->reopen();
    if (!REOPEN_LOG())
        spdlog::error("SIGHUP: the log cannot be opened again and goes on where it was");
    reload();
}

/// All or nothing: an operator who was refused knows that the gateway is as it was.
std::string Gateway::reload()
{
    try
    {
        Configuration configuration = Configuration::READ(m_configuration.file);
        if (std::string const key = ConfigurationChange::FIND_RESTART(m_configuration, configuration); !key.empty())
            throw ConfigurationError(configuration.file, key, "a change of it needs a restart");
        prepareInterfaces(configuration);
        Configuration const before = m_configuration;
        follow(std::move(configuration));
        followInterfaces(before);
        for (auto const& readAgain : m_host.onReload)
            readAgain();
        spdlog::info("the configuration is read again: {} routes", m_configuration.routes.size());
        return {};
    }
    catch (ConfigurationError const& error)
    {
        spdlog::error("the configuration stays as it was: {}", error.what());
        return error.what();
    }
}

void Gateway::prepareInterfaces(Configuration const& configuration)
try
{
    for (std::string const& name : configuration.interfaces)
        if (m_host.leaving.contains(name))
            throw ConfigurationError(configuration.file, "interfaces",
                                     "'" + name + "' was removed and has calls that are not over");
    for (auto const& [name, module] : m_modules)
        if (ConfigurationChange::IS_OF_MODULE(name, m_configuration, configuration) &&
            !module->prepareChange(configuration, configuration.modules.at(name)))
            throw ConfigurationError(configuration.file, name, "a change of it needs a restart");
}
catch (std::exception const&)
{
    for (auto const& [name, module] : m_modules)
        module->dropChange();
    throw;
}

void Gateway::followInterfaces(Configuration const& before)
{
    for (std::string const& name : before.interfaces)
        if (!m_configuration.interfaces.contains(name))
        {
            m_host.leaving.insert(name);
            m_host.blocked.erase(name); // whoever comes under that name one day is another
        }
    for (auto const& [name, module] : m_modules)
        if (ConfigurationChange::IS_OF_MODULE(name, before, m_configuration))
            module->change();
}

/// The context is there.
void Gateway::followDialling(Configuration const& configuration)
{
    DialPlan const& plan = m_host.dialPlan = configuration.dialPlan;
    std::ignore = CallControl::SET_MAX_HOPS(m_host.contextName, configuration.maxHops);
    std::ignore = CallControl::SET_INTERNATIONAL_PREFIX(m_host.contextName, plan.international.c_str());
    std::ignore = CallControl::SET_NATIONAL_PREFIX(m_host.contextName, plan.national.c_str());
}

void Gateway::follow(Configuration configuration)
{
    configuration.isLogLevelFixed = m_configuration.isLogLevelFixed;
    if (configuration.isLogLevelFixed)
        configuration.logLevel = m_configuration.logLevel;
    m_host.routing = Routing(configuration.routes, &m_host.routing);
    m_host.admission.setLimits(configuration.maxCalls, configuration.maxCallsPerSecond,
                               configuration.maxCallsPerSource);
    followDialling(configuration);
    SET_LOG_LEVELS(configuration.logLevel, configuration.callControlLogLevel);
    m_configuration = std::move(configuration);
}

/// The first request lets the calls go on for a while, another one clears them at once.
void Gateway::end(unsigned int patience)
{
    if (m_host.isEnding)
    {
        clearCalls();
        return;
    }
    m_host.isEnding = true;
    for (auto const& onEnding : m_host.onEnding)
        onEnding();
    m_service.tellStopping();
    spdlog::info("ending: no new calls, {} up, to be cleared in {} s", CallControl::GET_NUMBER_OF_CALLS(), patience);
    m_clearTimer.start(patience * 1000);
    stopIfIdle();
}

void Gateway::shutDown(std::optional<unsigned int> seconds) { end(seconds.value_or(m_configuration.clearAfter)); }

void Gateway::onClearTimer()
{
    if (!m_isClearing)
        clearCalls();
    else
        m_loop.stop(); // a peer does not answer; we have waited for as long as its transaction lives
}

void Gateway::clearCalls()
{
    m_isClearing = true;
    spdlog::info("ending: {} calls are cleared", CallControl::GET_NUMBER_OF_CALLS());
    m_watch.noteAllCleared();
    unsigned int wait = 0;
    for (auto const& [name, module] : m_modules)
        wait = std::max(wait, module->clearCalls(QCause::TEMPORARY_FAILURE));
    m_clearTimer.start(wait);
    stopIfIdle();
}

void Gateway::stopIfIdle()
{
    if (m_host.isEnding && !hasEndpoints())
        m_loop.stop();
}

bool Gateway::hasEndpoints() const
{
    return std::any_of(m_modules.begin(), m_modules.end(),
                       [](auto const& module) { return module.second->getNumberOfEndpoints() != 0; });
}

/// In the process that tells it, which is a copy of this one.
std::string Gateway::getState() const
{
    InfoContainer info;
    CallControl::GET_PROVIDER_INFO(info, m_host.contextName, EVERYTHING, 0, EVERYTHING, 0, String::s_empty);
    CallControl::GET_CALL_INFO(info, m_host.contextName, EVERYTHING, 0, EVERYTHING, 0, String::s_empty);
    // why each call is still up, and what became of those before
    info.add(0, 0, "holders", String::s_empty);
    CC_Explanation::OF_CALLS_OLDER_THAN(0).getInfo(info, EVERYTHING, 1, EVERYTHING, 0, String::s_empty);
    CC_Explanation::OF_LEGS_WITHOUT_CALL().getInfo(info, EVERYTHING, 1, EVERYTHING, 0, String::s_empty);
    info.add(0, 0, "recorded", String::s_empty);
    if (CC_Recorder::IS_ON())
        CC_RecordingReport::ADD(info, 1, CC_RecordingReport(CC_Recording::READ(CC_Recorder::GET_IMAGE())).getCalls());
    CC_CallPool::Statistics& pool = CC_CallPool::s_statistics;
    pool.prepareGet();
    Counters const& counters = m_host.counters;
    unsigned int const up = CallControl::GET_NUMBER_OF_CALLS();
    std::string text = fmt::format("state: {} calls up\n{}", up, info.getString_TreeFormat().view());
    text += fmt::format("pool: {} calls added, {} removed, at most {} at once, {} ms of calls\n", pool.m_callsAdded,
                        pool.m_callsRemoved, pool.m_maxActiveCalls, pool.m_callTime);
    for (auto const& [name, module] : m_modules)
        text += module->describe();
    text += fmt::format("log: {} lines dropped\n", GET_DROPPED_LOG_LINES());
    text += fmt::format("counters: {} placed, {} answered, {} cleared, {} failed, {} refused, {} up\n", counters.placed,
                        counters.answered, counters.cleared, counters.failed, counters.refused, up);
    return text;
}
