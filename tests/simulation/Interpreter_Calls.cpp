#include "callcontrol/CC_CallPool.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"
#include "tests/simulation/Interpreter.h"
#include "tests/simulation/Library.h"

#include <array>

// What the operations do to calls and to the legs that no adapter drives.

namespace Simulation
{
void Interpreter::acquire(Operation const& operation)
{
    TYPtr<MG_IContext> const media(operation[1] % 3 == 1 ? new MediaContext(++m_world.m_lastGivenMedia) : nullptr);
    String const context(World::CONTEXT_NAME(operation[0]));
    CC_Call* acquired = nullptr;
    {
        Memory::Library const library;
        acquired = CallControl::ACQUIRE_CALL(context, media.get());
    }
    if (acquired != nullptr)
        m_world.m_blankCalls.push_back(std::make_unique<CallWatch>(*acquired));
}

void Interpreter::newLeg(Operation const& operation)
{
    CC_CallLeg*& place = m_world.leg(operation[0]);
    if (place != nullptr)
        return;
    auto* const made = new CC_CallLeg;
    place = made;
    std::ignore = made->setName("guest");
    std::ignore = made->setProperty(CC_PropertyUnsigned(CC_PropertyId::CALL_LEG_ID, operation[1] % 32));
    if (operation[3] % 2 != 0)
        std::ignore =
            made->setProperty(CC_PropertyString(CC_PropertyId::NETWORK, operation[3] % 4 == 1 ? "shared" : "x"));
    Values::WITH(Values::MAKE_STATE(static_cast<int>(operation[2] % 9) - 2),
                 [&](CC_Property const& state) { std::ignore = made->setProperty(state); });
}

XCode Interpreter::moveLeg(Operation const& operation)
{
    CC_CallLeg* const leg = m_world.leg(operation[0]);
    CC_Call* const call = m_world.call(operation[1], operation[2]);
    if (leg == nullptr)
        return XCode(NO_RESULT);
    CC_Call* const to = operation.code == Code::REMOVE_LEG || operation[3] % 4 == 3 ? nullptr : call;
    if (operation.code == Code::MOVE_LEG)
        return transferLeg(operation[0], *leg, to);
    if (call == nullptr)
        return XCode(NO_RESULT);
    XCode result(NO_RESULT);
    m_world.noteMove(operation[0], operation.code == Code::ADD_LEG ? call : nullptr);
    Memory::Library const library;
    if (operation.code == Code::REMOVE_LEG)
        call->removeCallLeg(*leg);
    else
        result = call->addCallLeg(*leg);
    if (!result.isOk() && result != XCode(NO_RESULT))
        m_world.m_areLegsDisturbed = true; // it stays where it is, and what was asked for before holds
    return result;
}

/// Who moves a leg into a call without its help has the call looked at.
XCode Interpreter::transferLeg(unsigned int number, CC_CallLeg& leg, CC_Call* to)
{
    CallWatch watch;
    watch.watch(to == m_world.m_telling ? nullptr : to);
    m_world.noteMove(number, to);
    Memory::Library const library;
    XCode const result = CC_Call::TRANSFER_CALL_LEG(to, leg);
    if (!result.isOk())
        m_world.m_areLegsDisturbed = true;
    if (watch.get() != nullptr)
        watch.get()->defer();
    return result;
}

namespace
{
Property WRITTEN(unsigned int which, unsigned int variant)
{
    if (which % 4 == 3)
        return Values::MAKE_STATE(static_cast<int>(variant % 9) - 2);
    return Values::CHOOSE(which / 4 * 3 + which % 4, variant);
}

/// One property or several, as the way says.
template <class Target>
XCode WRITE(Target& target, unsigned int which, unsigned int variant, unsigned int way, unsigned int others)
{
    XCode result;
    Property const written = WRITTEN(which, variant);
    if (way % 2 == 0)
    {
        Values::WITH(written,
                     [&](CC_Property const& property)
                     {
                         Memory::Library const library;
                         result = target.setProperty(property);
                     });
        return result;
    }
    CC_PropertyContainer several;
    Values::STORE(several, {written});
    Values::STORE(several, Values::CHOOSE_SEVERAL(others));
    Memory::Library const library;
    return target.setProperties(several);
}
} // namespace

XCode Interpreter::setOfLeg(Operation const& operation)
{
    CC_CallLeg* const leg = m_world.leg(operation[0]);
    if (leg == nullptr)
        return XCode(NO_RESULT);
    return WRITE(*leg, operation[1], operation[2], operation[3], operation[4]);
}

XCode Interpreter::setOnCall(Operation const& operation)
{
    CC_Call* const call = m_world.call(operation[0], operation[1]);
    if (call == nullptr)
        return XCode(NO_RESULT);
    return WRITE(*call, operation[2] / 4 * 4, operation[3], operation[4], operation[5]); // a call has no State
}

/// A live leg stays in its call also when nobody but that holds it: what the guests hold is given up meanwhile.
void Interpreter::cleanUpWithoutGuests(CC_Call& call)
{
    auto const isIn = [&call](CC_CallLeg const* leg)
    {
        for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
            if (call.getCallLeg(i) == leg)
                return true;
        return false;
    };
    std::array<CC_CallLeg*, World::NUMBER_OF_LEGS> given{};
    for (unsigned int i = 0; i < given.size(); ++i)
        if (CC_CallLeg* const leg = m_world.leg(i); leg != nullptr && leg->getState() >= 0 && isIn(leg))
        {
            given[i] = leg;
            leg->removeReference();
        }
    CC_Call::Hold const keepCall(&call);
    call.deferred();
    for (unsigned int i = 0; i < given.size(); ++i)
        if (given[i] != nullptr && isIn(given[i]))
            given[i]->addReference();
        else if (given[i] != nullptr)
        {
            m_world.leg(i) = nullptr; // it has ended
            m_world.fail("a live leg that only its call holds was taken out in the clean-up");
        }
}

void Interpreter::emptyCall(Operation const& operation)
{
    CC_Call* const call = m_world.call(operation[0], operation[1]);
    if (call == nullptr)
        return;
    Memory::Library const library;
    if (operation.code == Code::EMPTY_CALL)
    {
        CallWatch watch;
        {
            Memory::Ours const ours;
            watch.watch(call);
        }
        call->destroyParticipatingCallLegs();
        if (watch.get() != nullptr)
            watch.get()->defer(); // who empties a call asks for its clean-up
    }
    else if (operation[2] % 4 == 3 && m_world.m_reactions.isEmpty())
        cleanUpWithoutGuests(*call);
    else if (operation[2] % 2 != 0)
        call->deferred();
    else
        call->defer();
}

/// It belongs to nobody: its end is that of its legs, unless its maker ends it before, of which the model knows
/// nothing.
void Interpreter::newCall(Operation const& operation)
{
    CC_CallLeg* const leg = m_world.leg(operation[0]);
    if (operation[1] % 4 == 1 && m_world.m_strikes != 0 && m_world.m_made.get() != nullptr)
    {
        Memory::Library const library;
        return m_world.m_made.get()->destroy();
    }
    if (leg == nullptr || leg->getState() < 0)
        return;
    auto* const call = new CC_Call;
    m_world.m_made.watch(call);
    Memory::Library const library;
    if (!call->addCallLeg(*leg).isOk())
        call->destroy();
}

/// What is changed without telling anybody; never a State or Network, by which calls live.
void Interpreter::changeUntold(Operation const& operation)
{
    CC_CallLeg* const leg = m_world.leg(operation[0]);
    Property const changed = Values::CHOOSE(operation[1], operation[2]);
    if (leg == nullptr || changed.id == CC_PropertyId::NETWORK)
        return;
    if (operation[3] % 2 == 0)
    {
        Memory::Library const library;
        PROPERTIES_TO_WRITE(*leg).remove(changed.id);
        return;
    }
    Values::WITH(changed,
                 [&](CC_Property const& property)
                 {
                     bool isChanged = false;
                     Memory::Library const library;
                     std::ignore = leg->setPropertyNoNotification(property, isChanged);
                 });
}
} // namespace Simulation
