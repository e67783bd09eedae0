#include "tests/simulation/Parties.h"

#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "calls/CC_Monitor.h"
#include "platform/driver/DRIVER.h"
#include "properties/CC_Flags.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "services/CC_Service.h"
#include "tests/simulation/World.h"

#include <new>

namespace Simulation
{
namespace
{
/// The ids of the set as one number, so that two sets are compared cheaply.
unsigned long long SUM(CC_Flags const& flags)
{
    unsigned long long sum = 0;
    for (unsigned int id = flags.getFirstSet(0); id != 0xffffffff; id = flags.getFirstSet(id + 1))
        sum = sum * 31 + id;
    return sum;
}
} // namespace

// --- watches and guests ----------------------------------------------------------------------------------------------

void CallWatch::watch(CC_Call* call)
{
    if (m_call != nullptr)
        m_call->removeCallObserver(this);
    m_call = call;
    if (m_call != nullptr && !m_call->addCallObserver(this).isOk())
        m_call = nullptr;
}

void Guest::count(void const* source, int change)
{
    Memory::Ours const ours;
    int& registrations = m_registrations[source];
    registrations += change;
    if (registrations == 0)
        m_registrations.erase(source);
}

void Guest::hear(void const* source, CallOut what, unsigned long long with, Last last)
{
    {
        Memory::Ours const ours;
        bool const mayBeTold = source == nullptr || source == m_world.m_telling || // its end, and changes in between
                               m_registrations.find(source) != m_registrations.end();
        if (!mayBeTold)
            m_world.fail("guest " + std::to_string(m_index) + " is told \"" + NAME_OF(what) +
                         "\" of something that it does not observe");
        if (last == Last::YES)
            m_registrations.erase(source);
        m_world.hear(World::WHO_GUEST(m_index), what, with);
    }
    World::CALL_OUT(what);
}

/// While it lives that call can be meant, though nothing lists it any more.
class Guest::Telling
{
public:
    Telling(World& world, CC_Call* call) : m_world(world), m_before(std::exchange(world.m_telling, call)) {}
    ~Telling() { m_world.m_telling = m_before; }
    Telling(Telling const&) = delete;
    Telling& operator=(Telling const&) = delete;

private:
    World& m_world;
    CC_Call* m_before;
};

void Guest::onCallObservationEnded(CC_Event<CC_Call> const& event)
{
    Telling const telling(m_world, event.getSource());
    hear(event.getSource(), CallOut::CALL_ENDED, 0, Last::YES);
}

void Guest::onCallCallLegAdded(CC_Event<CC_Call> const& event) { hear(event.getSource(), CallOut::LEG_ADDED); }

void Guest::onCallCallLegRemoved(CC_Event<CC_Call> const& event) { hear(event.getSource(), CallOut::LEG_REMOVED); }

void Guest::onCallPropertyChanged(CC_Event<CC_Call> const& event)
{
    hear(event.getSource(), CallOut::CALL_CHANGED, SUM(CC_EvCallPropertyChanged::FROM(event).getFlags()));
}

void Guest::onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event)
{
    hear(hearsThroughCalls() ? nullptr : event.getSource(), CallOut::LEG_ENDED, 0,
         hearsThroughCalls() ? Last::NO : Last::YES);
}

void Guest::onCallLegCallRelinked(CC_Event<CC_CallLeg> const& event)
{
    CC_Call const* const joined = CC_EvCallLegCallRelinked::FROM(event).getNewCall();
    if (joined != nullptr && joined == m_world.m_released.get())
        m_world.fail("a leg goes into a call that was given back");
    hear(hearsThroughCalls() ? nullptr : event.getSource(), CallOut::LEG_RELINKED);
}

void Guest::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    hear(hearsThroughCalls() ? nullptr : event.getSource(), CallOut::LEG_CHANGED,
         SUM(CC_EvCallLegPropertyChanged::FROM(event).getFlags()));
}

void Guest::onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event)
{
    hear(hearsThroughCalls() ? nullptr : event.getSource(), CallOut::LEG_SERVICE);
}

void Guest::aboutDestroy(CC_Context& context) { hear(&context, CallOut::CONTEXT_DESTROYED, 0, Last::YES); }

void Guest::aboutAddProvider(CC_Context& context, String const&) { hear(&context, CallOut::PROVIDER_ADDED); }

void Guest::aboutRemoveProvider(CC_Context& context, String const&) { hear(&context, CallOut::PROVIDER_REMOVED); }

void Guest::aboutCreateCall(CC_Context& context, CC_Call*) { hear(&context, CallOut::CALL_CREATED); }

void Guest::aboutDestroyCall(CC_Context& context, CC_Call*) { hear(&context, CallOut::CALL_RELEASED); }

void Guest::contextAdded(String const&) { hear(nullptr, CallOut::REGISTRY_ADDED); }

void Guest::contextDestroyed(String const&) { hear(nullptr, CallOut::REGISTRY_DESTROYED); }

void Guest::aboutDestroy(CC_Provider& provider) { hear(&provider, CallOut::PROVIDER_DESTROYED, 0, Last::YES); }

void Guest::aboutFinished(CC_Endpoint&) {}

void Guest::aboutDestroy(CC_Endpoint& endpoint) { hear(&endpoint, CallOut::ENDPOINT_DESTROYED, 0, Last::YES); }

// --- providers and endpoints -----------------------------------------------------------------------------------------

XCode Provider::dial(CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offered)
{
    World& world = m_world;
    unsigned int const index = m_module;
    if (world.m_reactions.isAwaited(CallOut::PROVIDER_DIAL))
    {
        CallWatch const watch(call);
        World::CALL_OUT(CallOut::PROVIDER_DIAL);
        if (watch.get() == nullptr)
            return XCode::FAILURE;
    }
    Endpoint* const endpoint = world.module(index).endpoint.get();
    return endpoint != nullptr ? endpoint->offer(call, destination, offered) : XCode::FAILURE;
}

Endpoint::Endpoint(World& world, unsigned int module, CC_PropertyFilterContainer* input,
                   CC_PropertyFilterContainer* output)
    : CC_Endpoint(input, output)
    , m_world(world)
    , m_module(module)
    , m_name(("m" + std::to_string(module)).c_str())
    , m_network((world.m_first[2] >> module % 8 & 1) != 0 ? "shared" : ("net-" + std::to_string(module)).c_str())
{
}

String const& Endpoint::getName() const
{
    Pin const pin(m_world.module(m_module));
    if (m_world.m_logLevel == RTD::LEVEL_OFF) // lines that name an adapter do not expect it to go in the middle
        World::CALL_OUT(CallOut::ENDPOINT_NAME);
    return m_name;
}

String const& Endpoint::getNetwork() const
{
    Pin const pin(m_world.module(m_module));
    World::CALL_OUT(CallOut::ENDPOINT_NAME);
    return m_network;
}

InfoContainer& Endpoint::getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                                 String const&) const
{
    Pin const pin(m_world.module(m_module));
    World::CALL_OUT(CallOut::ENDPOINT_DUMP);
    return info;
}

namespace
{
XCode ACCEPT(World& world, unsigned int lineNumber, CC_Call& call)
{
    Line& line = world.line(lineNumber);
    if (line.adapter == nullptr)
        return XCode::FAILURE;
    Memory::Ours const ours;
    CC_PropertyContainer own;
    Values::STORE(own, World::OWN_PROPERTIES(lineNumber, 0));
    Memory::Library const library;
    return line.adapter->accept(call, own);
}

unsigned int CHOOSE_LINE(World& world, Module const& module)
{
    unsigned int const first = module.index * World::LINES_OF_A_MODULE;
    if (module.answerMode == AnswerMode::SECOND_LINE)
        return first + 1;
    Line const& line = world.line(first);
    bool const isFree = line.adapter != nullptr && line.adapter->getCallLegName().isEmpty();
    return module.answerMode == AnswerMode::IDLE_LINE && !isFree ? first + 1 : first;
}

XCode REJECT(World& world, Module& module, CC_Call& call, unsigned int cause)
{
    Pin const pin(module);
    Memory::Ours const ours;
    CC_PropertyContainer own;
    Values::STORE(own, World::OWN_PROPERTIES(World::REJECTING_LINE, 0));
    std::ignore = world;
    Memory::Library const library;
    module.endpoint->actionRejectOfferedCall_WithCause(call, own, static_cast<QCause>(cause));
    return XCode::OK;
}
} // namespace

XCode Endpoint::handleOffer(CC_Call& call, String const&, CC_PropertyContainer const&)
{
    World& world = m_world;
    Module& module = world.module(m_module);
    if (world.m_reactions.isAwaited(CallOut::ENDPOINT_OFFER))
    {
        CallWatch const watch(call);
        World::CALL_OUT(CallOut::ENDPOINT_OFFER);
        if (watch.get() == nullptr || module.endpoint == nullptr)
            return XCode::FAILURE;
    }
    switch (module.answerMode)
    {
    case AnswerMode::REJECT:
        return REJECT(world, module, call, module.cause);
    case AnswerMode::HOLD:
        module.held.watch(&call);
        return XCode::OK;
    case AnswerMode::FAIL:
        return XCode::FAILURE;
    case AnswerMode::IGNORE:
        return XCode::OK;
    case AnswerMode::ACCEPT_AND_FAIL:
        std::ignore = ACCEPT(world, CHOOSE_LINE(world, module), call);
        return XCode::REFUSED;
    default:
        return ACCEPT(world, CHOOSE_LINE(world, module), call);
    }
}

Module::Module(World& world, unsigned int number)
    : index(number), lines{{world, number * World::LINES_OF_A_MODULE}, {world, number * World::LINES_OF_A_MODULE + 1}}
{
}

// --- adapters --------------------------------------------------------------------------------------------------------

void AdapterObserver::notifyPeerPropertyChange(CC_CallAdapter& adapter, CC_Flags const& flags)
{
    m_world.hearChange(m_line, &adapter, flags.isEmpty(), SUM(flags));
    World::CALL_OUT(CallOut::PEER_CHANGED);
}

void AdapterObserver::notifyPeerSynchronousService(CC_CallAdapter& adapter, CC_Service& service)
{
    m_world.hearService(m_line, &adapter, service.type());
    World::CALL_OUT(CallOut::PEER_SERVICE);
}

template <class Base>
bool Overriding<Base>::callOut(CallOut kind)
{
    TYLifeline::Watch const self(this->getLifeline());
    World::CALL_OUT(kind);
    return self.isAlive();
}

template <class Base>
XCode Overriding<Base>::setup(String const& name, CC_Endpoint& endpoint, CC_CallAdapterObserver* observer)
{
    return callOut(CallOut::ADAPTER_SETUP) ? Base::setup(name, endpoint, observer) : XCode::FAILURE;
}

template <class Base>
void Overriding<Base>::cleanup()
{
    if (callOut(CallOut::ADAPTER_CLEANUP))
        Base::cleanup();
}

template <class Base>
XCode Overriding<Base>::dial(String const& contextName, String const& providerName, String const& destination,
                             CC_PropertyContainer const& ownProperties, CC_PropertyContainer const& offerProperties,
                             CC_PropertyContainer const& callProperties, MG_IContext* datapathContext)
{
    if (!callOut(CallOut::ADAPTER_DIAL))
        return XCode::FAILURE;
    return Base::dial(contextName, providerName, destination, ownProperties, offerProperties, callProperties,
                      datapathContext);
}

template <class Base>
XCode Overriding<Base>::accept(CC_Call& call, CC_PropertyContainer const& ownProperties)
{
    if (m_world.m_reactions.isAwaited(CallOut::ADAPTER_ACCEPT))
    {
        CallWatch const watch(call);
        if (!callOut(CallOut::ADAPTER_ACCEPT) || watch.get() == nullptr)
            return XCode::FAILURE;
    }
    return Base::accept(call, ownProperties);
}

template <class Base>
void Overriding<Base>::drop(QCause cause, unsigned int causeValue)
{
    if (callOut(CallOut::ADAPTER_DROP))
        Base::drop(cause, causeValue);
}

template <class Base>
void Overriding<Base>::notifyPeerPropertyChange(CC_Flags const& flags)
{
    m_world.hearChange(m_line, this, flags.isEmpty(), SUM(flags));
    World::CALL_OUT(CallOut::PEER_CHANGED);
}

template <class Base>
void Overriding<Base>::notifyPeerSynchronousService(CC_Service& service)
{
    m_world.hearService(m_line, this, service.type());
    World::CALL_OUT(CallOut::PEER_SERVICE);
}

template class Overriding<CC_CallAdapter>;
template class Overriding<CC_CallAdapterE164>;

// --- filters ---------------------------------------------------------------------------------------------------------

Filter::~Filter() { World::CALL_OUT(CallOut::FILTER_END); }

CC_PropertyFilter* Filter::clone() const
{
    auto* const copy = new (std::nothrow) Filter(*this);
    World::CALL_OUT(CallOut::FILTER_CLONE);
    return copy;
}

namespace
{
XCode APPLY(FilterRule const& rule, CC_PropertyContainer& properties)
{
    switch (rule.what)
    {
    case FilterRule::RENAME:
        return properties.set(CC_PropertyString(CC_PropertyId::NAME, Values::TEXT(rule.parameter)));
    case FilterRule::DROP:
        properties.remove(rule.getDroppedId());
        return XCode::OK;
    case FilterRule::DERIVE:
        if (auto const* const name = CC_PropertyString::FROM(properties.get(CC_PropertyId::NAME)))
            return properties.set(CC_PropertyString(CC_PropertyId::DISPLAY, name->getValue()));
        return XCode::OK;
    case FilterRule::TRANSLATE:
        if (properties.get(CC_PropertyId::E164_NUMBER) == nullptr)
            return XCode::OK;
        return properties.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, Values::TEXT(rule.parameter)));
    case FilterRule::FAIL:
        return XCode(5);
    case FilterRule::ADD:
    {
        XCode result;
        Values::WITH(rule.getAdded(), [&](CC_Property const& added) { result = properties.set(added); });
        return result;
    }
    default:
        throw std::bad_alloc();
    }
}
} // namespace

XCode Filter::apply(CC_PropertyContainer& properties) const
{
    Pin const pin(m_world->module(m_module));
    FilterRule const rule = m_rule;
    World::CALL_OUT(m_isInput ? CallOut::INPUT_FILTER : CallOut::OUTPUT_FILTER);
    Memory::Ours const ours;
    return APPLY(rule, properties);
}

// --- media, reboot management, log -----------------------------------------------------------------------------------

unsigned int MediaContext::s_numberOfInstances = 0;

MediaContext::~MediaContext()
{
    --s_numberOfInstances;
    World::CALL_OUT(CallOut::MEDIA_END);
}

MediaRepository::~MediaRepository()
{
    if (CallControl::GET_MG_CONTEXT_REPOSITORY() == this)
        CallControl::SET_MG_CONTEXT_REPOSITORY(nullptr);
}

XCode MediaRepository::createContext(TYPtr<MG_IContext>& context)
{
    World::CALL_OUT(CallOut::MEDIA_REQUEST);
    if (m_isFailing)
        return XCode::FAILURE;
    Memory::Ours const ours;
    TYPtr<MG_IContext> const made(new MediaContext(++m_lastId));
    context = made;
    return XCode::OK;
}

class RebootManagement::Interface : public IRebootMgmt
{
public:
    explicit Interface(RebootManagement& owner) : m_owner(&owner) {}
    XCode addGracefulLock(String const&, String const&, int) override
    {
        if (m_owner == nullptr)
            return XCode::FAILURE;
        XCode const result = m_owner->m_isRefusing ? XCode::FAILURE : XCode::OK;
        ++m_owner->m_locks;
        ++m_owner->m_takenLocks;
        m_owner->m_world.hear(World::WHO_REBOOT, CallOut::REBOOT_ADD);
        World::CALL_OUT(CallOut::REBOOT_ADD);
        return result;
    }
    XCode releaseGracefulLock(String const&) override
    {
        if (m_owner == nullptr)
            return XCode::FAILURE;
        XCode const result = m_owner->m_isRefusing ? XCode::FAILURE : XCode::OK;
        --m_owner->m_locks;
        m_owner->m_world.hear(World::WHO_REBOOT, CallOut::REBOOT_RELEASE);
        World::CALL_OUT(CallOut::REBOOT_RELEASE);
        return result;
    }
    RebootManagement* m_owner;
};

RebootManagement::RebootManagement(World& world) : m_world(world), m_interface(new Interface(*this))
{
    m_interface->addReference();
}

RebootManagement::~RebootManagement()
{
    enable(false);
    m_interface->m_owner = nullptr;
    m_interface->removeReference();
}

void RebootManagement::enable(bool isEnabled)
{
    if (isEnabled == m_isEnabled)
        return;
    m_isEnabled = isEnabled;
    if (isEnabled)
        std::ignore = DRIVER::INSTANCE().addDriverInterface(m_interface, TY::UUID::INVALID(), "reboot");
    else
        DRIVER::INSTANCE().removeDriverInterface(m_interface);
}

LogWriter::LogWriter() { RTD::REPOSITORY::SET_WRITER(this); }

LogWriter::~LogWriter()
{
    RTD::REPOSITORY::ENABLE(CC_Monitor::ID, RTD::LEVEL_OFF);
    RTD::REPOSITORY::SET_WRITER(nullptr);
}

void LogWriter::write(unsigned int, unsigned int, char const*)
{
    if (m_isWriting)
        return;
    m_isWriting = true;
    World::CALL_OUT(CallOut::LOG_LINE);
    m_isWriting = false;
}
} // namespace Simulation
