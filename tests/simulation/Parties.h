#pragma once

#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterObserver.h"
#include "callcontrol/CC_Context.h"
#include "callcontrol/CallControl.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "callcontrol/provider/CC_Provider.h"
#include "calls/CC_CallLegObserver.h"
#include "calls/CC_CallObserver.h"
#include "platform/driver/IRebootMgmt.h"
#include "platform/media/MG_IContextRepository.h"
#include "platform/monitor/Monitor.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "tests/simulation/CallOut.h"
#include "tests/simulation/FilterRule.h"

#include <map>
#include <memory>
#include <utility>

// Those who take part in a run: each calls out to the world whenever the library calls it, and the world may do
// anything there. So whatever such an operation needs after that it has taken to its stack before.

namespace Simulation
{
class World;

/// Whether a call still exists, for a module's operation that is lent one.
class CallWatch : public CC_CallObserver
{
public:
    CallWatch() = default;
    explicit CallWatch(CC_Call& call) { watch(&call); }
    ~CallWatch() override { watch(nullptr); }
    void watch(CC_Call* call);
    CC_Call* get() const { return m_call; }

    void onCallObservationEnded(CC_Event<CC_Call> const&) override { m_call = nullptr; }
    void onCallCallLegAdded(CC_Event<CC_Call> const&) override {}
    void onCallCallLegRemoved(CC_Event<CC_Call> const&) override {}
    void onCallPropertyChanged(CC_Event<CC_Call> const&) override {}

private:
    CC_Call* m_call = nullptr;
};

/// Observes whatever it is told to, and finds out when it is told of something that it does not observe (any more).
class Guest : public CC_CallObserver,
              public CC_CallLegObserver,
              public CC_Context::Observer,
              public CallControl::ContextObserver,
              public CC_Provider::Observer,
              public CC_Endpoint::Observer
{
public:
    Guest(World& world, unsigned int index) : m_world(world), m_index(index) {}

    /// One registration more or less with that object.
    void count(void const* source, int change);
    bool observes(void const* source) const { return m_registrations.find(source) != m_registrations.end(); }

    void onCallObservationEnded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override;
    void onCallCallLegRemoved(CC_Event<CC_Call> const& event) override;
    void onCallPropertyChanged(CC_Event<CC_Call> const& event) override;
    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event) override;
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event) override;
    void aboutDestroy(CC_Context& context) override;
    void aboutAddProvider(CC_Context& context, String const& name) override;
    void aboutRemoveProvider(CC_Context& context, String const& name) override;
    void aboutCreateCall(CC_Context& context, CC_Call* call) override;
    void aboutDestroyCall(CC_Context& context, CC_Call* call) override;
    void contextAdded(String const& name) override;
    void contextDestroyed(String const& name) override;
    void aboutDestroy(CC_Provider& provider) override;
    void aboutFinished(CC_Endpoint& endpoint) override;
    void aboutDestroy(CC_Endpoint& endpoint) override;

    /// Hears legs through their calls, so that nobody can tell from its own registrations which.
    bool hearsThroughCalls() const { return m_index % 2 != 0; }
    bool m_isInRegistry = false;

private:
    class Telling;
    enum class Last : bool
    {
        NO,
        YES
    };
    void hear(void const* source, CallOut what, unsigned long long with = 0, Last last = Last::NO);

    World& m_world;
    unsigned int m_index;
    std::map<void const*, int> m_registrations;
};

class Provider : public CC_Provider
{
public:
    Provider(World& world, unsigned int module) : CC_Provider("simulated", ""), m_world(world), m_module(module) {}
    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offered) override;
    ProviderType getProviderType() const override { return USER_DEFINED_INTERFACE; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }

private:
    World& m_world;
    unsigned int m_module;
};

class Endpoint : public CC_Endpoint
{
public:
    Endpoint(World& world, unsigned int module, CC_PropertyFilterContainer* input, CC_PropertyFilterContainer* output);
    String const& getName() const override;
    String const& getNetwork() const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override;
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties) override;

private:
    World& m_world;
    unsigned int m_module;
    String m_name;
    String m_network;
};

class AdapterObserver : public CC_CallAdapterObserver
{
public:
    AdapterObserver(World& world, unsigned int line) : m_world(world), m_line(line) {}
    void notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service) override;

private:
    World& m_world;
    unsigned int m_line;
};

/// An adapter of a class of the module's own, which overrides what may be overridden.
template <class Base>
class Overriding : public Base
{
public:
    Overriding(World& world, unsigned int line) : m_world(world), m_line(line) {}

    using Base::accept;
    using Base::dial;
    XCode setup(String const& name, CC_Endpoint& endpoint, CC_CallAdapterObserver* observer) override;
    void cleanup() override;
    XCode dial(String const& contextName, String const& providerName, String const& destination,
               CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
               CC_PropertyContainer const& callProperties, MG_IContext* datapathContext) override;
    XCode accept(CC_Call& call, CC_PropertyContainer const& ownProperties) override;
    void drop(QCause cause, unsigned int causeValue) override;
    void notifyPeerPropertyChange(CC_Flags const& flags) override;
    void notifyPeerSynchronousService(CC_Service& service) override;

private:
    /// Whether the adapter is still there after the call-out.
    bool callOut(CallOut kind);

    World& m_world;
    unsigned int m_line;
};

/// Follows its rule, after it has called out.
class Filter : public CC_PropertyFilter
{
public:
    Filter(World& world, unsigned int module, bool isInput, FilterRule const& rule)
        : m_world(&world), m_module(module), m_isInput(isInput), m_rule(rule)
    {
    }
    Filter(Filter const&) = default;
    Filter& operator=(Filter const&) = default;
    ~Filter() override;
    CC_PropertyFilter* clone() const override;
    XCode apply(CC_PropertyContainer& properties) const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }

private:
    World* m_world;
    unsigned int m_module;
    bool m_isInput;
    FilterRule m_rule;
};

/// One line of a module: an adapter, and what hears from it.
struct Line
{
    Line(World& world, unsigned int number) : observer(world, number) {}

    AdapterObserver observer;
    std::unique_ptr<CC_CallAdapter> adapter;
    CC_CallAdapterE164* e164 = nullptr;
    bool hasWrittenToPeer = false; // its view may hold what the peer's leg refuses
    bool isOverriding = false;
    bool isObserved = false;
    unsigned int adapters = 0; // so far, to tell one from the next
};

enum class AnswerMode : unsigned char
{
    FIRST_LINE,
    SECOND_LINE,
    IDLE_LINE,
    REJECT,
    HOLD,
    FAIL,
    IGNORE,
    ACCEPT_AND_FAIL,
    NUMBER_OF_MODES
};

struct Module
{
    Module(World& world, unsigned int index);

    unsigned int const index;
    std::unique_ptr<Provider> provider;
    CC_PropertyFilterContainer inputFilters; // these live as long as the world: who uses them may be on the stack
    CC_PropertyFilterContainer outputFilters;
    std::unique_ptr<Endpoint> endpoint;
    Line lines[2];
    CallWatch held; // an offer that waits
    AnswerMode answerMode = AnswerMode::IDLE_LINE;
    unsigned int cause = 16;
    unsigned int pins = 0; // whose endpoint is needed by an operation on the stack
};

/// Keeps a module's endpoint while somebody on the stack needs it.
class Pin
{
public:
    explicit Pin(Module& module) : m_module(module) { ++m_module.pins; }
    ~Pin() { --m_module.pins; }
    Pin(Pin const&) = delete;
    Pin& operator=(Pin const&) = delete;

private:
    Module& m_module;
};

class MediaContext : public MG_IContext
{
public:
    explicit MediaContext(unsigned int id) : m_id(id) { ++s_numberOfInstances; }
    ~MediaContext() override;
    unsigned int getId() const override { return m_id; }
    static unsigned int s_numberOfInstances;

private:
    unsigned int m_id;
};

class MediaRepository : public MG_IContextRepository
{
public:
    MediaRepository() { addReference(); }
    ~MediaRepository() override;
    XCode createContext(TYPtr<MG_IContext>& context) override;

    bool m_isFailing = false;
    unsigned int m_lastId = 0;
};

/// The reboot management as the platform's drivers offer it; held by reference count, so it is told when the run ends.
class RebootManagement
{
public:
    explicit RebootManagement(World& world);
    ~RebootManagement();
    void enable(bool isEnabled);
    bool isEnabled() const { return m_isEnabled; }

    int m_locks = 0;
    int m_takenLocks = 0; // those given back, too
    bool m_isRefusing = false;

private:
    class Interface;
    World& m_world;
    Interface* m_interface;
    bool m_isEnabled = false;
};

class LogWriter : public RTD::Writer
{
public:
    LogWriter();
    ~LogWriter() override;
    void write(unsigned int monitorId, unsigned int level, char const* text) override;

private:
    bool m_isWriting = false;
};
} // namespace Simulation
