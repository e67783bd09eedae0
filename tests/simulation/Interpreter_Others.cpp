#include "callcontrol/CC_CallPool.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "tests/simulation/Interpreter.h"
#include "tests/simulation/Library.h"

#include <thread>

// Who observes, filters, reads, disturbs.

namespace Simulation
{
void Interpreter::changeFilters(Operation const& operation)
{
    Module& module = m_world.module(operation[0]);
    bool const isInput = operation[1] % 2 == 0;
    CC_PropertyFilterContainer& filters = isInput ? module.inputFilters : module.outputFilters;
    FilterRule const rule = FilterRule::CHOOSE(operation[3], operation[4]);
    Filter const filter(m_world, module.index, isInput, rule);
    bool const isAdded = operation[2] % 4 != 3;
    if (isAdded && filters.getNumberOfFilters() >= 4)
        return;
    if (MAY_FILTERS_KEEP_CALLS && isAdded && isInput && rule.mayHideState())
        m_world.m_hasFailingFilter = true;
    Memory::Library const library;
    if (operation[2] % 4 == 0)
        std::ignore = filters.addFilter(filter);
    else if (operation[2] % 4 == 1)
        std::ignore = filters.addFilter(filter, operation[5] % 4);
    else if (operation[2] % 4 == 2)
        std::ignore = filters.replaceFilter(filter, operation[5] % 4);
    else
        filters.removeFilter(operation[5] % 4);
}

void Interpreter::useFilters(Operation const& operation)
{
    Module& module = m_world.module(operation[0]);
    if (module.endpoint == nullptr)
        return;
    (operation[1] % 2 == 0 ? m_world.m_hadInputFilters : m_world.m_hadOutputFilters) = true;
    if (operation[1] % 2 == 0)
        module.endpoint->setInputFilterContainer(operation[2] % 2 != 0 ? &module.inputFilters : nullptr);
    else
        module.endpoint->setOutputFilterContainer(operation[2] % 2 != 0 ? &module.outputFilters : nullptr);
}

// --- observers -------------------------------------------------------------------------------------------------------

/// Registrations are counted only where nothing refuses them; taking one back that was never made changes nothing.
void Interpreter::observe(Operation const& operation, int change)
{
    Guest& guest = m_world.guest(operation[0]);
    CC_Call* const call = m_world.call(operation[2], operation[3]);
    CC_CallLeg* const leg = m_world.anyLeg(operation[2], operation[3]);
    unsigned int const kind = operation[1] % 6;
    if (kind < 2 && call != nullptr)
        observeCall(guest, *call, change);
    else if (kind == 2 && guest.hearsThroughCalls() && call != nullptr)
    {
        Memory::Library const library;
        if (change > 0)
            std::ignore = call->addCallLegObserver(&guest);
        else
            call->removeCallLegObserver(&guest);
    }
    else if (kind == 2 && !guest.hearsThroughCalls() && leg != nullptr)
    {
        Memory::Library const library;
        if (change > 0 && leg->addCallLegObserver(&guest).isOk())
            guest.count(leg, 1);
        else if (change < 0 && guest.observes(leg))
        {
            guest.count(leg, -1);
            leg->removeCallLegObserver(&guest);
        }
    }
    else if (kind > 2)
        observeOther(operation, guest, change);
}

void Interpreter::observeCall(Guest& guest, CC_Call& call, int change)
{
    Memory::Library const library;
    if (change > 0 && call.addCallObserver(&guest).isOk())
        guest.count(&call, 1);
    else if (change < 0 && guest.observes(&call))
    {
        guest.count(&call, -1);
        call.removeCallObserver(&guest);
    }
}

void Interpreter::observeOther(Operation const& operation, Guest& guest, int change)
{
    CC_Context* const context = CallControl::GET_CONTEXT(String(World::CONTEXT_NAME(operation[2])));
    Module const& module = m_world.module(operation[3]);
    Memory::Library const library;
    switch (operation[1] % 6)
    {
    case 3:
        if (context != nullptr && change > 0 && context->addContextObserver(guest).isOk())
            guest.count(context, 1);
        else if (context != nullptr && change < 0 && guest.observes(context))
        {
            guest.count(context, -1);
            context->removeContextObserver(guest);
        }
        break;
    case 4:
        if (change > 0)
            CallControl::REGISTER_CONTEXT_OBSERVER(guest);
        else
            CallControl::UNREGISTER_CONTEXT_OBSERVER(guest);
        break;
    default:
        if (module.endpoint == nullptr || module.provider == nullptr || change < 0)
            break;
        if (module.endpoint->addEndpointObserver(guest).isOk())
            guest.count(static_cast<CC_Endpoint*>(module.endpoint.get()), 1);
        if (module.provider->addProviderObserver(guest).isOk())
            guest.count(static_cast<CC_Provider*>(module.provider.get()), 1);
        break;
    }
}

// --- disturbance -----------------------------------------------------------------------------------------------------

/// Other threads may read the statistics, and give a reference on a leg up that is not the last. Joined at once, so
/// that nothing depends on when they run.
void Interpreter::otherThread(Operation const& operation)
{
    CC_CallLeg* const leg = m_world.leg(operation[1]);
    if (operation[0] % 2 != 0 && leg != nullptr)
    {
        leg->addReference();
        std::thread([leg] { leg->removeReference(); }).join();
        return;
    }
    std::thread(
        []
        {
            CC_CallPool::s_statistics.prepareGet();
            TYAutoLock<TYMutex> const lock(CC_CallPool::Statistics::s_mutex);
            std::ignore = CC_CallPool::s_statistics.m_callTime;
        })
        .join();
}

void Interpreter::dump(Operation const& operation)
{
    CC_CallAdapter const* const adapter = m_world.line(operation[1]).adapter.get();
    CC_Call const* const call = m_world.call(operation[2], operation[3]);
    InfoContainer info;
    String const context(World::CONTEXT_NAME(operation[1]));
    Memory::Library const library;
    if (operation[0] % 3 == 0 && adapter != nullptr)
        adapter->getInfo(info, 9, 0, 9, 0, "");
    else if (operation[0] % 3 == 1 && call != nullptr)
        call->getInfo(info, 9, 0, 9, 0, "");
    else if (operation[0] % 3 == 2)
        CallControl::GET_CALL_INFO(info, context, 9, 0, 9, 0, "");
}

void Interpreter::read(Operation const& operation)
{
    using Read = XCode (CC_CallAdapter::*)(CC_PropertyContainer&, unsigned int) const;
    static constexpr Read READS[] = {&CC_CallAdapter::getOwnProperties,  &CC_CallAdapter::getOwnPropertiesUnfiltered,
                                     &CC_CallAdapter::getPeerProperties, &CC_CallAdapter::getPeerPropertiesUnfiltered,
                                     &CC_CallAdapter::getCallProperties, &CC_CallAdapter::getCallPropertiesUnfiltered};
    static constexpr unsigned int MASKS[] = {0xff00, 0x100, 0x200, 0x400, 0x800, 0x1000, 0x8000};
    CC_CallAdapter const* const adapter = m_world.line(operation[0]).adapter.get();
    if (adapter == nullptr)
        return;
    CC_PropertyContainer properties;
    Values::STORE(properties, Values::CHOOSE_SEVERAL(operation[3]));
    Memory::Library const library;
    std::ignore = (adapter->*READS[operation[1] % 6])(properties, MASKS[operation[2] % 7]);
}

void Interpreter::setOptions(Operation const& operation)
{
    String const context(World::CONTEXT_NAME(operation[0]));
    String const text(Values::TEXT(operation[2]));
    Memory::Library const library;
    if (operation[1] % 3 == 0)
        std::ignore = CallControl::SET_MAX_HOPS(context, operation[2]);
    else if (operation[1] % 3 == 1)
        std::ignore = CallControl::SET_NATIONAL_PREFIX(context, text);
    else
        std::ignore = CallControl::SET_INTERNATIONAL_PREFIX(context, text);
}
} // namespace Simulation
