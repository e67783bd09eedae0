#include "tests/simulation/Comparison.h"

#include "callcontrol/CC_CallPool.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "tests/simulation/Library.h"
#include "tests/simulation/World.h"

#include <algorithm>

namespace Simulation
{
Comparison::Comparison(World& world)
    : m_world(world)
    , m_model(world.m_first)
    , m_callsBefore(CC_Call::s_numberOfInstances)
    , m_legsBefore(CC_CallLeg::s_numberOfInstances)
    , m_timeBefore(CC_CallPool::s_statistics.m_callTime)
{
    CC_CallPool::s_statistics.resetMax();
}

void Comparison::differ(std::string const& what) { m_world.fail("after \"" + m_operation + "\": " + what); }

bool Comparison::isPredicted() const
{
    return CAN_BE_COMPARED && m_world.m_strikes == 0 && !m_world.m_wasShortOfMemory && !m_model.isLost();
}

void Comparison::after(Operation const& operation, unsigned int result)
{
    if (isPredicted() && !m_world.hasFailed())
    {
        unsigned int const predicted = m_model.carryOut(operation);
        m_operation = NAME_OF(operation.code);
        if (isPredicted())
        {
            compareResult(operation, predicted, result);
            compareHeard();
            m_calls.assign(m_model.m_calls.size(), nullptr);
            m_legs.assign(m_model.m_legs.size(), nullptr);
            m_foundCalls.clear();
            m_foundLegs.clear();
            compareContexts();
            compareLines();
            compareGuestLegs();
            compareFound();
            compareStatistics();
            compareViews();
        }
    }
    m_world.m_heard.clear();
    m_model.m_heard.clear();
}

void Comparison::compareResult(Operation const&, unsigned int predicted, unsigned int result)
{
    if (predicted != result)
        differ("the result is " + std::to_string(result) + ", not " + std::to_string(predicted));
}

namespace
{
std::string PRINT_HEARD(std::vector<unsigned long long> const& heard)
{
    std::string text;
    for (unsigned long long const one : heard)
    {
        auto const who = static_cast<unsigned int>(one >> 48);
        text += (who == World::WHO_REBOOT ? std::string(" the reboot management")
                 : who >= 0x100           ? " line " + std::to_string(who - 0x100)
                                          : " guest " + std::to_string(who)) +
                " " + NAME_OF(static_cast<CallOut>(one >> 40 & 0xff)) + " (" + std::to_string(one & 0xffffffffff) +
                ");";
    }
    return text;
}
} // namespace

void Comparison::compareHeard()
{
    if (m_world.m_heard != m_model.m_heard)
        differ("heard is" + PRINT_HEARD(m_world.m_heard) + " and not" + PRINT_HEARD(m_model.m_heard));
}

// --- who is where ----------------------------------------------------------------------------------------------------

void Comparison::bindCall(std::string const& what, int predicted, CC_Call const* real)
{
    if ((predicted == Model::NOBODY) != (real == nullptr))
        return differ(what + (real == nullptr ? ": there is no call" : ": there is a call"));
    if (real == nullptr)
        return;
    CC_Call const*& bound = m_calls[static_cast<std::size_t>(predicted)];
    if (bound != nullptr && bound != real)
        return differ(what + ": it is another call");
    if (bound == nullptr)
        m_foundCalls.push_back(predicted);
    bound = real;
}

void Comparison::bindLeg(std::string const& what, int predicted, CC_CallLeg const* real)
{
    if ((predicted == Model::NOBODY) != (real == nullptr))
        return differ(what + (real == nullptr ? ": there is no leg" : ": there is a leg"));
    if (real == nullptr)
        return;
    CC_CallLeg const*& bound = m_legs[static_cast<std::size_t>(predicted)];
    if (bound != nullptr && bound != real)
        return differ(what + ": it is another leg");
    if (bound == nullptr)
        m_foundLegs.push_back(predicted);
    bound = real;
}

void Comparison::compareContexts()
{
    for (unsigned int i = 0; i < World::NUMBER_OF_CONTEXTS && !m_world.hasFailed(); ++i)
    {
        CC_Context* const real = CallControl::GET_CONTEXT(String(World::CONTEXT_NAME(i)));
        Model::Context const& predicted = m_model.m_contexts[i];
        std::string const name = std::string("context ") + World::CONTEXT_NAME(i);
        if ((real != nullptr) != predicted.exists)
            return differ(name + (real != nullptr ? " exists" : " does not exist"));
        if (real == nullptr)
            continue;
        if (real->getNumberOfCalls() != predicted.calls.size())
            return differ(name + " has " + std::to_string(real->getNumberOfCalls()) + " calls, not " +
                          std::to_string(predicted.calls.size()));
        if (real->getNumberOfProviders() != predicted.providers.size())
            return differ(name + " has " + std::to_string(real->getNumberOfProviders()) + " providers");
        for (unsigned int j = 0; j < real->getNumberOfCalls(); ++j)
            bindCall(name, predicted.calls[j], real->getCall(j));
    }
}

void Comparison::compareLines()
{
    for (unsigned int i = 0; i < m_model.getNumberOfLines() && !m_world.hasFailed(); ++i)
    {
        CC_CallAdapter const* const real = m_world.line(i).adapter.get();
        int const number = m_model.adapterOf(i);
        std::string const name = "line " + std::to_string(i);
        if ((real != nullptr) != (number != Model::NOBODY))
            return differ(name + " has or lacks an adapter");
        if (real == nullptr)
            continue;
        Model::Adapter const& predicted = m_model.m_adapters[static_cast<std::size_t>(number)];
        bindLeg(name + ", own leg", predicted.own, OWN_LEG(*real));
        bindLeg(name + ", peer", predicted.peer, PEER_LEG(*real));
    }
}

void Comparison::compareGuestLegs()
{
    for (unsigned int i = 0; i < World::NUMBER_OF_LEGS && !m_world.hasFailed(); ++i)
        bindLeg("guest leg " + std::to_string(i), m_model.m_guestLegs[i], m_world.leg(i));
}

/// What is found leads to more.
void Comparison::compareFound()
{
    for (std::size_t calls = 0, legs = 0;
         !m_world.hasFailed() && (calls < m_foundCalls.size() || legs < m_foundLegs.size());)
    {
        if (calls < m_foundCalls.size())
        {
            int const found = m_foundCalls[calls++];
            compareCall(found, *m_calls[static_cast<std::size_t>(found)]);
        }
        else
        {
            int const found = m_foundLegs[legs++];
            compareLeg(found, *m_legs[static_cast<std::size_t>(found)]);
        }
    }
}

void Comparison::compareCall(int number, CC_Call const& real)
{
    Model::Call const& predicted = m_model.m_calls[static_cast<std::size_t>(number)];
    std::string const name = "call " + std::to_string(number);
    if (!predicted.isAlive)
        return differ(name + " is still there");
    if (real.getNumberOfCallLegs() != predicted.legs.size())
        return differ(name + " has " + std::to_string(real.getNumberOfCallLegs()) + " legs, not " +
                      std::to_string(predicted.legs.size()));
    for (unsigned int i = 0; i < real.getNumberOfCallLegs(); ++i)
        bindLeg(name + ", leg " + std::to_string(i), predicted.legs[i], real.getCallLeg(i));
    compareContents(name, predicted.properties, real.getProperties());
}

void Comparison::compareLeg(int number, CC_CallLeg const& real)
{
    Model::Leg const& predicted = m_model.m_legs[static_cast<std::size_t>(number)];
    std::string const name = "leg " + std::to_string(number);
    if (!predicted.isAlive)
        return differ(name + " is still there");
    bindCall(name, predicted.call, real.getCall());
    compareContents(name, predicted.properties, real.getProperties());
}

// --- what they hold --------------------------------------------------------------------------------------------------

void Comparison::compareContents(std::string const& what, Model::Container const& predicted,
                                 CC_PropertyContainer const& real)
{
    bool isSame = real.getNumberOfProperties() == predicted.list.size();
    std::size_t i = 0;
    for (CC_Property const& property : real)
    {
        isSame = isSame && i < predicted.list.size() && property.getId() == predicted.list[i].id &&
                 Values::READ(property) == predicted.list[i].value;
        ++i;
    }
    if (!isSame)
        differ(what + " holds" + Values::PRINT(Values::READ(real)) + " and not" + Values::PRINT(predicted.list));
}

void Comparison::compareView(std::string const& what, Model::Container const& predicted, CC_CallAdapter const& adapter,
                             unsigned int which)
{
    using Copy = XCode (CC_CallAdapter::*)(CC_PropertyContainer&, unsigned int) const;
    static constexpr Copy COPIES[] = {&CC_CallAdapter::getOwnProperties, &CC_CallAdapter::getPeerProperties,
                                      &CC_CallAdapter::getCallProperties};
    using Read = CC_Property const* (CC_CallAdapter::*)(unsigned int) const;
    static constexpr Read READS[] = {&CC_CallAdapter::getOwnProperty, &CC_CallAdapter::getPeerProperty,
                                     &CC_CallAdapter::getCallProperty};
    for (Property const& property : predicted.list)
    {
        CC_Property const* const real = (adapter.*READS[which])(property.id);
        if (real == nullptr)
            return differ(what + " lacks " + Values::PRINT(property));
        if (Value const value = Values::READ(*real); !(value == property.value))
            return differ(what + " has " + Values::PRINT(Property{property.id, value}) + ", not " +
                          Values::PRINT(property));
    }
    CC_PropertyContainer all;
    std::ignore = (adapter.*COPIES[which])(all, ~0U);
    if (all.getNumberOfProperties() != predicted.list.size())
        differ(what + " has" + Values::PRINT(Values::READ(all)) + ", not" + Values::PRINT(predicted.list));
}

void Comparison::compareViews()
{
    for (unsigned int i = 0; i < m_model.getNumberOfLines() && !m_world.hasFailed(); ++i)
    {
        int const number = m_model.adapterOf(i);
        if (number == Model::NOBODY)
            continue;
        CC_CallAdapter const& real = *m_world.line(i).adapter;
        Model::Adapter const& predicted = m_model.m_adapters[static_cast<std::size_t>(number)];
        std::string const name = "line " + std::to_string(i);
        compareView(name + ", own view", predicted.ownView, real, 0);
        compareView(name + ", view of the peer", predicted.peerView, real, 1);
        compareView(name + ", view of the call", predicted.callView, real, 2);
    }
}

void Comparison::compareStatistics()
{
    auto const calls = static_cast<unsigned int>(std::count_if(m_model.m_calls.begin(), m_model.m_calls.end(),
                                                               [](Model::Call const& call) { return call.isAlive; }));
    auto const legs = static_cast<unsigned int>(
        std::count_if(m_model.m_legs.begin(), m_model.m_legs.end(), [](Model::Leg const& leg) { return leg.isAlive; }));
    if (CC_Call::s_numberOfInstances - m_callsBefore != calls)
        differ(std::to_string(CC_Call::s_numberOfInstances - m_callsBefore) + " calls are alive, not " +
               std::to_string(calls));
    if (CC_CallLeg::s_numberOfInstances - m_legsBefore != legs)
        differ(std::to_string(CC_CallLeg::s_numberOfInstances - m_legsBefore) + " legs are alive, not " +
               std::to_string(legs));
    CC_CallPool::Statistics& statistics = CC_CallPool::s_statistics;
    if (statistics.m_callsAdded - m_world.m_added != m_model.m_callsAdded ||
        statistics.m_callsRemoved - m_world.m_removed != m_model.m_callsRemoved)
        differ("the statistics count " + std::to_string(statistics.m_callsAdded - m_world.m_added) + " calls added, " +
               std::to_string(statistics.m_callsRemoved - m_world.m_removed) + " removed");
    statistics.prepareGet();
    if (statistics.m_callTime - m_timeBefore != m_model.m_callTime)
        differ("the time of calls is " + std::to_string(statistics.m_callTime - m_timeBefore) + ", not " +
               std::to_string(m_model.m_callTime));
    m_model.m_maxActiveCalls = std::max(m_model.m_maxActiveCalls, m_model.m_callsAdded - m_model.m_callsRemoved);
    if (statistics.m_maxActiveCalls - (m_world.m_added - m_world.m_removed) != m_model.m_maxActiveCalls)
        differ("the most calls were " + std::to_string(statistics.m_maxActiveCalls) + ", not " +
               std::to_string(m_model.m_maxActiveCalls));
}
} // namespace Simulation
