#include "tests/simulation/Invariants.h"

#include "callcontrol/CC_CallPool.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyKind.h"
#include "tests/simulation/Library.h"
#include "tests/simulation/Values.h"
#include "tests/simulation/World.h"

#include <algorithm>
#include <typeinfo>

namespace Simulation
{
namespace
{
template <class Visit>
void FOR_EACH_CALL(Visit const& visit)
{
    for (unsigned int i = 0; i < World::NUMBER_OF_CONTEXTS; ++i)
    {
        CC_Context* const context = CallControl::GET_CONTEXT(String(World::CONTEXT_NAME(i)));
        for (unsigned int j = 0; context != nullptr && j < context->getNumberOfCalls(); ++j)
            visit(*context->getCall(j), i);
    }
}

bool IS_LIVE(CC_Call const& call)
{
    for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
        if (call.getCallLeg(i)->getState() != -1)
            return true;
    return false;
}

/// A leg that a call lists says so, too, and the call's state is that of its legs.
void CHECK_MEMBERSHIP(World& world, CC_Call const& call)
{
    unsigned int const legs = call.getNumberOfCallLegs();
    unsigned int active = 0;
    for (unsigned int i = 0; i < legs; ++i)
    {
        CC_CallLeg const& leg = *call.getCallLeg(i);
        if (leg.getCall() != &call)
            return world.fail("a call lists a leg that names another call, or none");
        if (call.getNumberOfOtherCallLegs(leg) != legs - 1)
            return world.fail("a call counts the other legs wrong");
        active += leg.getActivityLevel() >= 0 ? 1 : 0;
    }
    if (static_cast<unsigned int>(call.getState()) != std::min(active, 3U) - std::min(active, 1U))
        world.fail("a call's state is not that of its legs");
}

void CHECK_LINE(World& world, unsigned int number, Line const& line)
{
    CC_CallAdapter const& adapter = *line.adapter;
    CC_CallLeg const* const own = OWN_LEG(adapter);
    CC_CallLeg const* const peer = PEER_LEG(adapter);
    std::string const name = "line " + std::to_string(number);
    if (!adapter.getCallLegName().isEmpty() && adapter.getEndpoint() == nullptr)
        return world.fail(name + " has a leg and is not set up");
    if (CAN_BE_COMPARED && own == nullptr &&
        (adapter.getOwnProperty(CC_PropertyId::STATE) != nullptr ||
         adapter.getPeerProperty(CC_PropertyId::STATE) != nullptr ||
         adapter.getCallProperty(CC_PropertyId::CONTEXT) != nullptr))
        return world.fail(name + " is idle and still sees something");
    if (peer == nullptr)
        return;
    if (own == nullptr || own == peer)
        return world.fail(name + " has a peer without a leg of its own, or its own leg for one");
    if (own->getCall() == nullptr || peer->getCall() != own->getCall())
        return world.fail(name + " has a peer that is not in its call");
}

/// Without filters that may hide a State, the peer is the most active of the others.
void CHECK_PEER(World& world, unsigned int number, Line const& line)
{
    CC_CallLeg const* const own = OWN_LEG(*line.adapter);
    CC_CallLeg const* const peer = PEER_LEG(*line.adapter);
    CC_Endpoint const* const endpoint = line.adapter->getEndpoint();
    if (own == nullptr || peer == nullptr || endpoint == nullptr || endpoint->getOutputFilterContainer() != nullptr ||
        world.m_hadOutputFilters || world.m_mayPeersBeStale || world.m_wasShortOfMemory)
        return;
    if (own->getCall()->getOtherMostActiveCallLeg(*own, peer) != peer)
        world.fail("line " + std::to_string(number) + " has a peer that is not the most active leg");
}

/// An id's class is fixed by its first owner: another class keeps its value.
bool IS_EQUAL(CC_Property const& one, CC_Property const& other)
{
    if (typeid(one) != typeid(other))
        return true;
    CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(one, other);
    return kind != nullptr ? kind->isEqual(one, other) : Values::READ(one) == Values::READ(other);
}

/// Whether one container has all of the other, or all but one id.
bool HOLDS(CC_PropertyContainer const& all, CC_PropertyContainer const& some, unsigned int butOne = 0)
{
    return std::all_of(some.begin(), some.end(),
                       [&](CC_Property const& one)
                       {
                           CC_Property const* const held = all.get(one.getId());
                           return one.getId() == butOne || (held != nullptr && IS_EQUAL(*held, one));
                       });
}

using Read = XCode (CC_CallAdapter::*)(CC_PropertyContainer&, unsigned int) const;

CC_PropertyContainer VIEW(Line const& line, Read read)
{
    CC_PropertyContainer view;
    std::ignore = (*line.adapter.*read)(view, ~0U);
    return view;
}

/// Without filters a line sees what its own leg and its call hold, and nothing of what it had before. With those on the
/// way in it sees what it has written, and the leg and the call hold what these have made of it.
void CHECK_OWN_VIEWS(World& world, CC_CallLeg const& own, Line const& line, std::string const& name)
{
    if (world.m_hadInputFilters)
        return;
    if (!HOLDS(own.getProperties(), VIEW(line, &CC_CallAdapter::getOwnProperties),
               CC_PropertyId::STATE)) // which the leg may refuse
        world.fail(name + " sees of itself what its leg does not hold");
    if (own.getCall() == nullptr)
        return;
    CC_PropertyContainer const ofCall = VIEW(line, &CC_CallAdapter::getCallProperties);
    if (!HOLDS(own.getCall()->getProperties(), ofCall))
        world.fail(name + " sees of its call what that does not hold");
    if (!HOLDS(ofCall, own.getCall()->getProperties()))
        world.fail(name + " does not see what its call holds");
}

/// The same of its peer as well.
void CHECK_VIEWS(World& world, unsigned int number, Line const& line)
{
    CC_CallLeg const* const own = OWN_LEG(*line.adapter);
    CC_CallLeg const* const peer = PEER_LEG(*line.adapter);
    if (!CAN_BE_COMPARED || own == nullptr || world.m_hadOutputFilters || world.m_wasShortOfMemory)
        return;
    std::string const name = "line " + std::to_string(number);
    CHECK_OWN_VIEWS(world, *own, line, name);
    if (peer == nullptr || line.hasWrittenToPeer || peer->mayChangeUntold())
        return;
    CC_PropertyContainer const ofPeer = VIEW(line, &CC_CallAdapter::getPeerProperties);
    if (!HOLDS(ofPeer, peer->getProperties()))
        world.fail(name + " does not see what its peer holds");
    if (!HOLDS(peer->getProperties(), ofPeer))
        world.fail(name + " sees of its peer what that does not hold");
}

template <class Visit>
void FOR_EACH_LINE(World& world, Visit const& visit)
{
    for (unsigned int i = 0; i < world.getNumberOfModules() * World::LINES_OF_A_MODULE; ++i)
        if (world.line(i).adapter != nullptr)
            visit(i, world.line(i));
}

void FORGET_BLANK_CALLS(World& world)
{
    std::erase_if(world.m_blankCalls, [](auto const& watch)
                  { return watch->get() == nullptr || watch->get()->getNumberOfCallLegs() != 0; });
}

void CHECK_CALL_AT_REST(World& world, CC_Call const& call, unsigned int context)
{
    if (IS_LIVE(call) || world.m_hasFailingFilter)
        return;
    if (call.getNumberOfCallLegs() != 0 || !world.isBlank(call))
        world.fail("a call of context " + std::to_string(context) + " stays without a live leg, " +
                   std::to_string(call.getNumberOfCallLegs()) + " legs");
}

void CHECK_LOCKS(World& world)
{
    int pools = 0;
    for (unsigned int i = 0; i < World::NUMBER_OF_CONTEXTS; ++i)
        pools += CallControl::GET_NUMBER_OF_CALLS(String(World::CONTEXT_NAME(i))) != 0 ? 1 : 0;
    int const locks = world.m_reboot.m_locks;
    if (world.m_wasShortOfMemory)
        return; // a lock may not have been had
    if (locks < pools || locks > pools + world.m_lostPools)
        world.fail(std::to_string(locks) + " reload locks are held while " + std::to_string(pools) +
                   " pools have calls");
}

void CHECK_STATISTICS(World& world)
{
    CC_CallPool::s_statistics.prepareGet();
    unsigned long long const added = CC_CallPool::s_statistics.m_callsAdded - world.m_added;
    unsigned long long const removed = CC_CallPool::s_statistics.m_callsRemoved - world.m_removed;
    unsigned long long calls = 0;
    FOR_EACH_CALL([&](CC_Call const&, unsigned int) { ++calls; });
    if (added - removed != calls)
        world.fail("the statistics count " + std::to_string(added - removed) + " calls, there are " +
                   std::to_string(calls));
}
} // namespace

namespace
{
/// A leg that was sent on while it was on its way is where it was sent last.
void CHECK_SENT_LEGS(World& world)
{
    for (unsigned int i = 0; i < World::NUMBER_OF_LEGS; ++i)
    {
        World::Sent& sent = world.m_sent[i];
        CC_CallLeg const* const leg = world.leg(i);
        bool const isThere = !sent.isIntoCall || sent.to.get() != nullptr;
        if (sent.isSent && isThere && leg != nullptr && !world.m_areLegsDisturbed && !world.m_wasShortOfMemory &&
            leg->getCall() != sent.to.get())
            world.fail("guest leg " + std::to_string(i) + " is not where it was sent last");
        sent.isSent = false;
        sent.to.watch(nullptr);
    }
    world.m_areLegsDisturbed = false;
}
} // namespace

void CHECK_AFTER_OPERATION(World& world)
{
    if (CAN_BE_COMPARED)
        CHECK_SENT_LEGS(world);
    FORGET_BLANK_CALLS(world);
    FOR_EACH_CALL([&](CC_Call const& call, unsigned int) { CHECK_MEMBERSHIP(world, call); });
    FOR_EACH_LINE(world, [&](unsigned int number, Line const& line) { CHECK_LINE(world, number, line); });
}

void CHECK_AT_REST(World& world)
{
    FOR_EACH_CALL([&](CC_Call const& call, unsigned int context) { CHECK_CALL_AT_REST(world, call, context); });
    CHECK_LOCKS(world);
    CHECK_STATISTICS(world);
    FOR_EACH_LINE(world,
                  [&](unsigned int number, Line const& line)
                  {
                      CHECK_PEER(world, number, line);
                      CHECK_VIEWS(world, number, line);
                  });
}

void CHECK_AT_THE_END(World& world)
{
    if (world.m_loop.settle(1000) == 1000)
        return world.fail("the loop does not come to rest");
    FORGET_BLANK_CALLS(world);
    CHECK_AT_REST(world);
    Memory::CHECK_KEPT_BLOCKS();
}
} // namespace Simulation
