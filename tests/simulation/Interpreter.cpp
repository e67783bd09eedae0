#include "tests/simulation/Interpreter.h"

#include "adapters/CC_CallAdapter.h"
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "calls/CC_Monitor.h"
#include "platform/base/TYRecycled.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"
#include "tests/simulation/Library.h"
#include "tests/simulation/Services.h"

#include <algorithm>

// Here: the stream itself, and what belongs to one module's line. Interpreter_Calls.cpp has calls, legs and contexts,
// Interpreter_Others.cpp who observes, filters, reads and disturbs.

namespace Simulation
{
Interpreter::Interpreter(World& world, Operations const& operations) : m_world(world), m_operations(operations)
{
    m_world.m_carryOut = [this](std::size_t begin, std::size_t end) { carryOutAll(begin, end); };
}

void Interpreter::carryOutAll(std::size_t begin, std::size_t end)
{
    for (std::size_t place = begin; place < end;)
        place = carryOut(place, end);
}

/// The reaction takes the operations behind it with it, those of the reactions among them, too.
std::size_t Interpreter::announce(std::size_t place, std::size_t end)
{
    Operation const& operation = m_operations[place];
    std::size_t const behind = std::min(place + 2 + operation[2] % MOST_INSIDE, end);
    m_world.m_reactions.add({CALL_OUT_OF(operation[0]), operation[1] % MOST_OTHERS, place + 1, behind});
    return behind;
}

namespace
{
/// Whether it may take a guest's leg along, other than by that guest's will.
bool MAY_MOVE_OTHER_LEGS(Code code)
{
    switch (code)
    {
    case Code::TURN:
    case Code::SETTLE:
    case Code::TRANSFER:
    case Code::RELEASE:
    case Code::DROP_CALLS:
    case Code::GIVE_UP_LEG:
    case Code::EMPTY_CALL:
    case Code::CLEAN_UP_CALL:
    case Code::NEW_CALL:
    case Code::FAIL_ALLOCATION:
        return true;
    default:
        return false;
    }
}
} // namespace

std::size_t Interpreter::carryOut(std::size_t place, std::size_t end)
{
    Operation const& operation = m_operations[place];
    m_result = NO_RESULT;
    if (m_world.hasFailed())
        return end;
    ++m_count;
    if (operation.code == Code::WHEN)
        return announce(place, end);
    m_world.m_areLegsDisturbed = m_world.m_areLegsDisturbed || MAY_MOVE_OTHER_LEGS(operation.code);
    bool const isToFail = std::exchange(m_isToFail, false);
    if (isToFail && operation.code == Code::DUMP)
        failAllocation(0); // dumps throw
    perform(operation);
    m_world.noteMemory();
    if (isToFail)
        failAllocation(0);
    return place + 1;
}

/// Maybe inside an operation that lacks memory itself, or will.
void Interpreter::failAllocation(unsigned int n)
{
    m_world.noteMemory();
    Memory::FAIL_NTH(n);
}

// The one table of what operations do: long, and nothing but that.
void Interpreter::perform(Operation const& operation)
{
    XCode result(NO_RESULT);
    CC_CallAdapter* const adapter = m_world.line(operation[0]).adapter.get();
    CC_CallLeg* const leg = m_world.leg(operation[0]);
    char const* const context = World::CONTEXT_NAME(operation[0]);
    switch (operation.code)
    {
    case Code::TURN:
        turn(1 + operation[0] % 3);
        break;
    case Code::SETTLE:
        settle();
        break;
    case Code::ADVANCE_CLOCK:
        m_world.m_clock.advance(operation[0] * 7);
        break;
    case Code::DIAL:
        result = dial(operation);
        break;
    case Code::ACCEPT:
        result = accept(operation);
        break;
    case Code::REJECT:
        reject(operation);
        break;
    case Code::ANSWER_MODE:
    {
        Module& module = m_world.module(operation[0]);
        module.answerMode =
            static_cast<AnswerMode>(operation[1] % static_cast<unsigned int>(AnswerMode::NUMBER_OF_MODES));
        module.cause = operation[2] % 128;
        break;
    }
    case Code::BECOME:
    case Code::SET_OWN:
    case Code::SET_PEER:
    case Code::SET_CALL:
        result = setOfAdapter(operation);
        break;
    case Code::SERVICE:
        service(adapter, nullptr, operation[1], operation[2]);
        break;
    case Code::TRANSFER:
        result = transfer(operation);
        break;
    case Code::DROP:
        if (adapter != nullptr)
        {
            Memory::Library const library;
            adapter->drop(operation[1] == 0 ? QCause::UNSPECIFIED : static_cast<QCause>(operation[1] % 128),
                          operation[2]);
        }
        break;
    case Code::CLEANUP:
        if (adapter != nullptr)
        {
            Memory::Library const library;
            adapter->cleanup();
        }
        break;
    case Code::SETUP:
        setup(operation);
        break;
    case Code::DESTROY_ADAPTER:
        destroyAdapter(operation[0]);
        break;
    case Code::MAKE_ADAPTER:
        m_world.makeAdapter(operation[0], operation[1]);
        break;
    case Code::ACQUIRE:
        acquire(operation);
        break;
    case Code::RELEASE:
        release(operation);
        break;
    case Code::DROP_CALLS:
        if (CC_CallPool* const pool = CallControl::GET_CALL_POOL(context))
        {
            CC_Call const* const one = pool->getAcquiredCall(operation[1]);
            String const name = operation[2] % 2 != 0 && one != nullptr ? one->getName() : String();
            Memory::Library const library;
            pool->dropCalls(String::s_empty, name);
        }
        break;
    case Code::NEW_LEG:
        newLeg(operation);
        break;
    case Code::ADD_LEG:
    case Code::MOVE_LEG:
    case Code::REMOVE_LEG:
        result = moveLeg(operation);
        break;
    case Code::SET_LEG:
        result = setOfLeg(operation);
        break;
    case Code::GIVE_UP_LEG:
        m_world.giveUpLeg(operation[0]);
        break;
    case Code::LEG_SERVICE:
        service(nullptr, leg, operation[1], operation[2]);
        break;
    case Code::SET_ON_CALL:
        result = setOnCall(operation);
        break;
    case Code::EMPTY_CALL:
    case Code::CLEAN_UP_CALL:
        emptyCall(operation);
        break;
    case Code::CREATE_CONTEXT:
    {
        Memory::Library const library;
        result = CallControl::CREATE_CONTEXT(String(context));
        break;
    }
    case Code::DESTROY_CONTEXT:
    {
        m_world.m_hasLostContext = true;
        m_world.m_lostPools += CallControl::GET_NUMBER_OF_CALLS(String(context)) != 0 ? 1 : 0;
        int const locks = m_world.m_reboot.m_takenLocks;
        Memory::Library const library;
        CallControl::DESTROY_CONTEXT(String(context));
        m_world.m_lostPools += m_world.m_reboot.m_takenLocks - locks; // maybe of calls made while it ended
        break;
    }
    case Code::ADD_PROVIDER:
    case Code::REMOVE_PROVIDER:
    {
        String const name(("p" + std::to_string(m_world.module(operation[0]).index)).c_str());
        String const in(World::CONTEXT_NAME(operation[1]));
        Provider* const provider = m_world.module(operation[0]).provider.get();
        Memory::Library const library;
        if (operation.code == Code::REMOVE_PROVIDER)
            CallControl::REMOVE_PROVIDER(in, name);
        else if (provider != nullptr)
            result = CallControl::ADD_PROVIDER(in, name, *provider);
        break;
    }
    case Code::DESTROY_MODULE:
        m_world.destroyModule(operation[0]);
        break;
    case Code::MAKE_MODULE:
        m_world.makeModule(operation[0]);
        break;
    case Code::CHANGE_FILTERS:
        changeFilters(operation);
        break;
    case Code::USE_FILTERS:
        useFilters(operation);
        break;
    case Code::OBSERVE:
        observe(operation, 1);
        break;
    case Code::STOP_OBSERVING:
        observe(operation, -1);
        break;
    case Code::FAIL_ALLOCATION:
        failAllocation(1 + operation[0]);
        m_isToFail = true;
        break;
    case Code::OTHER_THREAD:
        otherThread(operation);
        break;
    case Code::MEDIA_MODE:
        m_world.m_media.m_isFailing = operation[0] % 4 == 1;
        if (operation[0] % 4 != 3)
            CallControl::SET_MG_CONTEXT_REPOSITORY(operation[0] % 4 == 2 ? nullptr : &m_world.m_media);
        break;
    case Code::REBOOT_MODE:
        m_world.m_reboot.m_isRefusing = operation[0] % 2 != 0;
        break;
    case Code::LOG_LEVEL:
        m_world.m_logLevel = operation[0] % 6;
        RTD::REPOSITORY::ENABLE(CC_Monitor::ID, m_world.m_logLevel);
        break;
    case Code::DUMP:
        dump(operation);
        break;
    case Code::READ:
        read(operation);
        break;
    case Code::RESET_STATISTICS:
        CC_CallPool::s_statistics.resetMax();
        break;
    case Code::SET_NAME:
        if (adapter != nullptr)
        {
            String const name(Values::TEXT(operation[1]));
            Memory::Library const library;
            adapter->setName(name);
        }
        break;
    case Code::SET_DATAPATH:
        if (adapter != nullptr)
        {
            TYPtr<MG_IContext> const given(operation[1] % 2 != 0 ? new MediaContext(++m_world.m_lastGivenMedia)
                                                                 : nullptr);
            Memory::Library const library;
            adapter->setDatapathContext(given.get());
        }
        break;
    case Code::OFFER:
        result = offer(operation);
        break;
    case Code::ANSWER_HELD:
        answerHeld(operation);
        break;
    case Code::NEW_CALL:
        newCall(operation);
        break;
    case Code::CHANGE_UNTOLD:
        changeUntold(operation);
        break;
    case Code::ACCESSOR:
        accessor(operation);
        break;
    case Code::KEEP_BLOCKS:
        TYRecycled::KEEP_BLOCKS(operation[0] % 4 == 3 ? 0 : operation[0] % 4 * 7);
        break;
    case Code::SET_OPTIONS:
        setOptions(operation);
        break;
    case Code::WORLD:
    case Code::WHEN:
    case Code::NUMBER_OF_CODES:
        break;
    }
    m_result = result.getValue();
}

/// Not inside a handler, and not inside an operation either: what is asked for there is to be done later.
void Interpreter::turn(unsigned int turns)
{
    if (m_world.m_depth != 0)
        return;
    Memory::Library const library;
    for (unsigned int i = 0; i < turns; ++i)
        m_world.m_loop.turn();
}

void Interpreter::settle()
{
    if (m_world.m_depth != 0)
        return;
    constexpr unsigned int MANY = 200;
    Memory::Library const library;
    if (m_world.m_loop.settle(MANY) == MANY)
        m_world.fail("the loop does not come to rest");
}

/// Who asks a call to take a leg, and finds that it has been given back meanwhile, has nothing to expect of it.
void Interpreter::release(Operation const& operation)
{
    char const* const context = World::CONTEXT_NAME(operation[0]);
    unsigned int const count = CallControl::GET_NUMBER_OF_CALLS(context);
    if (count == 0)
        return;
    CallWatch released(*CallControl::GET_CALL(context, operation[1] % count));
    {
        Memory::Library const library;
        CallControl::RELEASE_CALL(context, released.get());
    }
    CC_Call* const held = released.get();
    if (held != nullptr && held->getNumberOfCallLegs() == 0 && CC_Call::Hold(held).isReleased())
        m_world.m_released.watch(held);
}

// --- a line ----------------------------------------------------------------------------------------------------------

XCode Interpreter::dial(Operation const& operation)
{
    Line& line = m_world.line(operation[0]);
    if (line.adapter == nullptr)
        return XCode(NO_RESULT);
    unsigned int const called = operation[1] % (m_world.getNumberOfModules() + 1);
    String const provider(("p" + std::to_string(called)).c_str());
    String const context(World::CONTEXT_NAME(operation[2]));
    String const number(Values::TEXT(operation[6]));
    TYPtr<MG_IContext> const media(operation[5] % 4 == 3 ? new MediaContext(++m_world.m_lastGivenMedia) : nullptr);
    CC_PropertyContainer own;
    CC_PropertyContainer offered;
    CC_PropertyContainer ofCall;
    Values::STORE(own, World::OWN_PROPERTIES(m_world.lineNumber(operation[0]), operation[3]));
    Values::STORE(offered, Values::CHOOSE_SEVERAL(operation[4]));
    Values::STORE(ofCall, Values::CHOOSE_SEVERAL(operation[4] / 3));
    Memory::Library const library;
    if (line.e164 != nullptr && operation[5] % 2 != 0)
        return line.e164->dial(context, provider, number, "100", QTypeOfNumber::NATIONAL, QNumberingPlan::ISDN,
                               QPresentationIndicator::ALLOWED, QScreeningIndicator::NETWORK_PROVIDED, "Ada", number,
                               QTypeOfNumber::UNKNOWN, QNumberingPlan::ISDN, String(), operation[5] % 8 == 5,
                               QInformationTransferCapability::SPEECH, media.get(), &own, &offered, &ofCall);
    return line.adapter->dial(context, provider, number, own, offered, ofCall, media.get());
}

XCode Interpreter::accept(Operation const& operation)
{
    CC_CallAdapter* const adapter = m_world.line(operation[0]).adapter.get();
    CC_Call* const call = m_world.call(operation[1], operation[2]);
    if (adapter == nullptr || call == nullptr)
        return XCode(NO_RESULT);
    CC_PropertyContainer own;
    Values::STORE(own, World::OWN_PROPERTIES(m_world.lineNumber(operation[0]), operation[3]));
    Memory::Library const library;
    return adapter->accept(*call, own);
}

void Interpreter::reject(Operation const& operation)
{
    Module& module = m_world.module(operation[0]);
    CC_Call* const call = m_world.call(operation[1], operation[2]);
    if (module.endpoint == nullptr || call == nullptr)
        return;
    Pin const pin(module);
    CC_PropertyContainer own;
    Values::STORE(own, World::OWN_PROPERTIES(World::REJECTING_LINE, 0));
    Memory::Library const library;
    module.endpoint->actionRejectOfferedCall_WithCause(*call, own, static_cast<QCause>(operation[3] % 128));
}

/// The module's pin is not needed: its endpoint may go inside what it is asked to handle.
XCode Interpreter::offer(Operation const& operation)
{
    Module const& module = m_world.module(operation[0]);
    CC_Call* const call = m_world.call(operation[1], operation[2]);
    if (module.endpoint == nullptr || call == nullptr)
        return XCode(NO_RESULT);
    CC_PropertyContainer properties;
    Values::STORE(properties, Values::CHOOSE_SEVERAL(operation[3]));
    Memory::Library const library;
    return module.endpoint->offer(*call, "0800", properties);
}

void Interpreter::answerHeld(Operation const& operation)
{
    Module& module = m_world.module(operation[0]);
    CC_Call* const call = module.held.get();
    module.held.watch(nullptr);
    Line const& line = module.lines[operation[1] % World::LINES_OF_A_MODULE];
    if (call == nullptr || module.endpoint == nullptr)
        return;
    CC_PropertyContainer own;
    if (operation[2] % 3 == 0)
    {
        Pin const pin(module);
        Values::STORE(own, World::OWN_PROPERTIES(World::REJECTING_LINE, 0));
        Memory::Library const library;
        module.endpoint->actionRejectOfferedCall_WithCause(*call, own, QCause::CALL_REJECTED);
    }
    else if (line.adapter != nullptr)
    {
        Values::STORE(own, World::OWN_PROPERTIES(module.index * 2 + operation[1] % 2, operation[3]));
        Memory::Library const library;
        std::ignore = line.adapter->accept(*call, own);
    }
}

namespace
{
/// What the operation writes: a State, or a chosen property.
Property WRITTEN(Operation const& operation, std::size_t which)
{
    if (operation.code == Code::BECOME)
        return Values::MAKE_STATE(static_cast<int>(operation[1] % 9) - 2);
    if (operation[which] % 4 == 3)
        return Values::MAKE_STATE(static_cast<int>(operation[which + 1] % 8) - 1);
    return Values::CHOOSE(operation[which] / 4 * 3 + operation[which] % 4, operation[which + 1]);
}

using SetOne = XCode (CC_CallAdapter::*)(CC_Property const&);
using SetSeveral = XCode (CC_CallAdapter::*)(CC_PropertyContainer const&);

struct Setters
{
    SetOne one[2]; // filtered and not
    SetSeveral several[2];
};

Setters const& SETTERS_OF(Code code)
{
    static constexpr Setters OWN = {{&CC_CallAdapter::setOwnProperty, &CC_CallAdapter::setOwnPropertyUnfiltered},
                                    {&CC_CallAdapter::setOwnProperties, &CC_CallAdapter::setOwnPropertiesUnfiltered}};
    static constexpr Setters PEER = {
        {&CC_CallAdapter::setPeerProperty, &CC_CallAdapter::setPeerPropertyUnfiltered},
        {&CC_CallAdapter::setPeerProperties, &CC_CallAdapter::setPeerPropertiesUnfiltered}};
    static constexpr Setters CALL = {
        {&CC_CallAdapter::setCallProperty, &CC_CallAdapter::setCallPropertyUnfiltered},
        {&CC_CallAdapter::setCallProperties, &CC_CallAdapter::setCallPropertiesUnfiltered}};
    return code == Code::SET_PEER ? PEER : code == Code::SET_CALL ? CALL : OWN;
}
} // namespace

namespace
{
/// Whether what a line writes as its peer's State becomes that leg's; without a peer nothing is written.
bool STORES_PEERS_STATE(CC_CallAdapter const& adapter)
{
    CC_CallLeg const* const peer = PEER_LEG(adapter);
    CC_Endpoint const* const endpoint = adapter.getEndpoint();
    return peer == nullptr || endpoint == nullptr ||
           (peer->getState() != CC_PropertyCallLegState::RELEASED && endpoint->getInputFilterContainer() == nullptr);
}
} // namespace

XCode Interpreter::setOfAdapter(Operation const& operation)
{
    CC_CallAdapter* const adapter = m_world.line(operation[0]).adapter.get();
    if (adapter == nullptr)
        return XCode(NO_RESULT);
    Setters const& setters = SETTERS_OF(operation.code);
    bool const isBecoming = operation.code == Code::BECOME;
    unsigned int const way = isBecoming ? 0 : operation[3];
    Property const written = WRITTEN(operation, 1);
    if (operation.code == Code::SET_PEER && written.id == CC_PropertyId::STATE && !STORES_PEERS_STATE(*adapter))
        m_world.m_mayPeersBeStale = true;
    if (operation.code == Code::SET_PEER)
        m_world.line(operation[0]).hasWrittenToPeer = true;
    XCode result;
    if (way % 4 < 2)
    {
        Values::WITH(written,
                     [&](CC_Property const& property)
                     {
                         Memory::Library const library;
                         result = (adapter->*setters.one[way % 2])(property);
                     });
        return result;
    }
    CC_PropertyContainer several;
    Values::STORE(several, {written});
    Values::STORE(several, Values::CHOOSE_SEVERAL(operation[4]));
    Memory::Library const library;
    return (adapter->*setters.several[way % 2])(several);
}

void Interpreter::service(CC_CallAdapter* adapter, CC_CallLeg* leg, unsigned int which, unsigned int text)
{
    if (adapter == nullptr && leg == nullptr)
        return;
    WITH_SERVICE(which, text,
                 [&](CC_Service& service)
                 {
                     Memory::Library const library;
                     adapter != nullptr ? adapter->invokeSynchronousService(service)
                                        : leg->invokeSynchronousService(service);
                 });
}

XCode Interpreter::transfer(Operation const& operation)
{
    CC_CallAdapter* const adapter = m_world.line(operation[0]).adapter.get();
    CC_CallAdapter const* const other = m_world.line(operation[1]).adapter.get();
    if (adapter == nullptr || other == nullptr)
        return XCode(NO_RESULT);
    Memory::Library const library;
    return adapter->transfer(*other, operation[2] % 2 != 0);
}

void Interpreter::setup(Operation const& operation)
{
    Line& line = m_world.line(operation[0]);
    Endpoint* const endpoint =
        m_world.module(m_world.lineNumber(operation[0]) / World::LINES_OF_A_MODULE).endpoint.get();
    if (line.adapter == nullptr || endpoint == nullptr)
        return;
    line.isObserved = !line.isOverriding && operation[1] % 4 != 3;
    CC_CallAdapterObserver* const observer = line.isObserved ? &line.observer : nullptr;
    Memory::Library const library;
    std::ignore = line.adapter->setup("l", *endpoint, observer);
}

/// The line is without an adapter before that is told of its end, so that nobody ends it twice.
void Interpreter::destroyAdapter(unsigned int line)
{
    Module& module = m_world.module(m_world.lineNumber(line) / World::LINES_OF_A_MODULE);
    Pin const pin(module);
    Memory::Library const library;
    std::unique_ptr<CC_CallAdapter>(std::move(m_world.line(line).adapter)).reset();
}

void Interpreter::accessor(Operation const& operation)
{
    CC_CallAdapterE164* const adapter =
        m_world.line(operation[0]).adapter != nullptr ? m_world.line(operation[0]).e164 : nullptr;
    if (adapter == nullptr)
        return;
    String const text(Values::TEXT(operation[2]));
    XCode result;
    Memory::Library const library;
    switch (operation[1] % 4)
    {
    case 0:
        result = adapter->setOwnSupportsOverlapReceiving(operation[2] % 2 != 0);
        break;
    case 1:
        result = adapter->setOwnE164(text);
        break;
    case 2:
        result = adapter->setOwnName(text);
        break;
    default:
        std::ignore = adapter->getPeerE164();
        std::ignore = adapter->getOwnName();
        std::ignore = adapter->getPeerSupportsOverlapReceiving();
        return;
    }
    std::ignore = result;
}
} // namespace Simulation
