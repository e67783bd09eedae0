#include "platform/base/XCode.h"
#include "properties/CC_PropertyId.h"
#include "tests/simulation/Model.h"

#include <algorithm>

namespace Simulation
{
using namespace CC_PropertyId;

namespace
{
constexpr unsigned int OK = XCode::OK.getValue();
constexpr unsigned int REFUSED = XCode::REFUSED.getValue();
constexpr unsigned int FAILURE = XCode::FAILURE.getValue();

std::size_t AT(int index) { return static_cast<std::size_t>(index); }

Property WRITTEN(unsigned int which, unsigned int variant, unsigned int states)
{
    if (which % 4 == 3)
        return Values::MAKE_STATE(static_cast<int>(variant % states) + 7 - static_cast<int>(states));
    return Values::CHOOSE(which / 4 * 3 + which % 4, variant);
}
} // namespace

Model::Model(Operation const& first) : m_first(first)
{
    m_guestLegs.fill(NOBODY);
    for (unsigned int i = 0; i < m_contexts.size(); ++i)
        m_contexts[i].exists = i == 0 || (first[4] >> i & 1) != 0;
    m_modules.resize(2 + first[0] % 11);
    for (unsigned int i = 0; i < m_modules.size(); ++i)
        makeModule(i);
}

Model::Container Model::CONTAINER(Properties const& properties)
{
    Container container;
    for (Property const& property : properties)
        container.set(property);
    return container;
}

namespace
{
Properties OWN(unsigned int line, unsigned int seed)
{
    Properties properties{Values::MAKE_NUMBER(CALL_LEG_ID, Kind::UNSIGNED, 10 + line)};
    for (Property const& property : Values::CHOOSE_SEVERAL(seed))
        properties.push_back(property);
    return properties;
}
} // namespace

// --- whom an operation means -----------------------------------------------------------------------------------------

int Model::callOf(unsigned int way, unsigned int index) const
{
    if (way % 4 == 2)
    {
        int const adapter = adapterOf(lineOf(index));
        int const own = adapter != NOBODY ? m_adapters[AT(adapter)].own : NOBODY;
        return own != NOBODY ? m_legs[AT(own)].call : NOBODY;
    }
    if (way % 8 == 7)
        return NOBODY; // a call that is telling of its end
    if (way % 4 == 3)
    {
        int const leg = m_guestLegs[index % m_guestLegs.size()];
        return leg != NOBODY ? m_legs[AT(leg)].call : NOBODY;
    }
    std::vector<int> const& calls = m_contexts[index % 3].calls;
    return calls.empty() ? NOBODY : calls[index / 3 % calls.size()];
}

int Model::anyLegOf(unsigned int way, unsigned int index) const
{
    if (way % 2 == 0)
        return m_guestLegs[index % m_guestLegs.size()];
    int const call = callOf(way / 2, index);
    if (call == NOBODY || m_calls[AT(call)].legs.empty())
        return NOBODY;
    std::vector<int> const& legs = m_calls[AT(call)].legs;
    return legs[way / 8 % legs.size()];
}

// --- the operations --------------------------------------------------------------------------------------------------

unsigned int Model::carryOut(Operation const& operation)
{
    unsigned int const a = operation[0];
    int const adapter = adapterOf(lineOf(a));
    int const guestLeg = m_guestLegs[a % m_guestLegs.size()];
    Context& context = m_contexts[a % 3];
    switch (operation.code)
    {
    case Code::TURN:
        for (unsigned int i = 0; i < 1 + a % 3; ++i)
            turn();
        break;
    case Code::SETTLE:
        settle();
        break;
    case Code::ADVANCE_CLOCK:
        advance(a * 7);
        break;
    case Code::DIAL:
        return dialBy(operation);
    case Code::ACCEPT:
        if (int const call = callOf(operation[1], operation[2]); adapter != NOBODY && call != NOBODY)
            return accept(adapter, call, CONTAINER(OWN(lineOf(a), operation[3])));
        break;
    case Code::REJECT:
        if (int const call = callOf(operation[1], operation[2]); call != NOBODY && moduleOf(a).exists)
            reject(a % static_cast<unsigned int>(m_modules.size()), call, operation[3] % 128);
        break;
    case Code::ANSWER_MODE:
        moduleOf(a).answerMode = operation[1] % 8;
        moduleOf(a).cause = operation[2] % 128;
        break;
    case Code::BECOME:
    case Code::SET_OWN:
    case Code::SET_PEER:
    case Code::SET_CALL:
        return adapter != NOBODY ? setBy(operation) : NO_RESULT;
    case Code::SERVICE:
        if (adapter != NOBODY)
            service(adapter, operation[1], operation[2]);
        break;
    case Code::TRANSFER:
        if (int const other = adapterOf(lineOf(operation[1])); adapter != NOBODY && other != NOBODY)
            return transferCalls(adapter, other, operation[2] % 2 != 0);
        break;
    case Code::DROP:
        if (adapter != NOBODY)
            drop(adapter, operation[1] == 0 ? -1 : static_cast<int>(operation[1] % 128), operation[2]);
        break;
    case Code::CLEANUP:
        if (adapter != NOBODY)
        {
            drop(adapter, -1, 0);
            destroyEvents(m_adapters[AT(adapter)]);
            m_adapters[AT(adapter)].module = NOBODY;
            m_adapters[AT(adapter)].isObserved = false;
        }
        break;
    case Code::SETUP:
        setup(operation);
        break;
    case Code::DESTROY_ADAPTER:
        destroyAdapter(lineOf(a));
        break;
    case Code::MAKE_ADAPTER:
        makeAdapter(lineOf(a), operation[1]);
        break;
    case Code::ACQUIRE:
        std::ignore = acquire(a % 3, operation[1] % 3 == 1 ? ++m_lastGivenMedia : 0);
        break;
    case Code::RELEASE:
        if (!context.calls.empty())
        {
            int const call = context.calls[operation[1] % context.calls.size()];
            hearGuests(context.observers, CallOut::CALL_RELEASED);
            release(call);
        }
        break;
    case Code::DROP_CALLS:
    {
        std::vector<int> calls = context.calls;
        if (operation[2] % 2 != 0 && operation[1] < calls.size())
            calls = {calls[operation[1]]};
        for (int const call : calls)
            while (!m_calls[AT(call)].legs.empty())
            {
                transfer(NOBODY, m_calls[AT(call)].legs.front());
                defer(call);
            }
        break;
    }
    case Code::NEW_LEG:
        newGuestLeg(operation);
        break;
    case Code::ADD_LEG:
    case Code::MOVE_LEG:
    case Code::REMOVE_LEG:
        return guestLeg != NOBODY ? moveLeg(operation) : NO_RESULT;
    case Code::SET_LEG:
        if (guestLeg == NOBODY)
            break;
        if (Property const written = WRITTEN(operation[1], operation[2], 9); operation[3] % 2 == 0)
            return setOnLeg(guestLeg, written);
        else
        {
            Container several = CONTAINER({written});
            for (Property const& other : Values::CHOOSE_SEVERAL(operation[4]))
                several.set(other);
            return setSeveralOnLeg(guestLeg, several.list);
        }
    case Code::GIVE_UP_LEG:
        if (guestLeg != NOBODY)
        {
            m_guestLegs[a % m_guestLegs.size()] = NOBODY;
            m_legs[AT(guestLeg)].isFixed = true;
            setOnLeg(guestLeg, Values::MAKE_STATE(-1));
            removeReference(guestLeg);
        }
        break;
    case Code::LEG_SERVICE:
        if (guestLeg != NOBODY)
            deliverService(guestLeg);
        break;
    case Code::SET_ON_CALL:
        if (int const call = callOf(a, operation[1]); call != NOBODY)
        {
            Property const written = Values::CHOOSE(operation[2] / 4 * 3, operation[3]);
            Container several = CONTAINER({written});
            for (Property const& other : Values::CHOOSE_SEVERAL(operation[5]))
                several.set(other);
            operation[4] % 2 == 0 ? setOnCall(call, written) : setSeveralOnCall(call, several.list);
            return OK;
        }
        break;
    case Code::EMPTY_CALL:
        if (int const call = callOf(a, operation[1]); call != NOBODY)
        {
            removeAllLegs(call);
            defer(call);
        }
        break;
    case Code::CLEAN_UP_CALL:
        if (int const call = callOf(a, operation[1]); call != NOBODY)
            operation[2] % 2 != 0 ? deferred(call) : defer(call);
        break;
    case Code::CREATE_CONTEXT:
        return createContext(a % 3);
    case Code::DESTROY_CONTEXT:
        destroyContext(a % 3);
        break;
    case Code::ADD_PROVIDER:
        if (moduleOf(a).exists)
            return addProvider(operation[1] % 3, a % static_cast<unsigned int>(m_modules.size()));
        break;
    case Code::REMOVE_PROVIDER:
        removeProvider(operation[1] % 3, a % static_cast<unsigned int>(m_modules.size()));
        break;
    case Code::DESTROY_MODULE:
        destroyModule(a % static_cast<unsigned int>(m_modules.size()));
        break;
    case Code::MAKE_MODULE:
        makeModule(a % static_cast<unsigned int>(m_modules.size()));
        break;
    case Code::CHANGE_FILTERS:
        changeFilters(operation);
        break;
    case Code::USE_FILTERS:
        if (Module& module = moduleOf(a); module.exists)
            (operation[1] % 2 == 0 ? module.usesInput : module.usesOutput) = operation[2] % 2 != 0;
        break;
    case Code::OBSERVE:
    case Code::STOP_OBSERVING:
        observe(operation, operation.code == Code::OBSERVE);
        break;
    case Code::MEDIA_MODE:
        m_isMediaFailing = a % 4 == 1;
        if (a % 4 != 3)
            m_hasMedia = a % 4 != 2;
        break;
    case Code::RESET_STATISTICS:
        m_maxActiveCalls = 0;
        break;
    case Code::SET_DATAPATH:
        if (adapter != NOBODY)
        {
            unsigned long long const media = operation[1] % 2 != 0 ? ++m_lastGivenMedia : requestMedia();
            writeOne(adapter, Target::CALL, {CONTEXT, {Kind::MEDIA, media}});
        }
        break;
    case Code::OFFER:
        if (int const call = callOf(operation[1], operation[2]); call != NOBODY && moduleOf(a).exists)
            return offer(a % static_cast<unsigned int>(m_modules.size()), call);
        break;
    case Code::ANSWER_HELD:
        answerHeld(operation);
        break;
    case Code::NEW_CALL:
        if (guestLeg != NOBODY && m_legs[AT(guestLeg)].getState() >= 0)
            addCallLeg(newCall(NOBODY), guestLeg);
        break;
    case Code::CHANGE_UNTOLD:
        changeUntold(operation);
        break;
    case Code::ACCESSOR:
        if (adapter != NOBODY && m_adapters[AT(adapter)].isE164)
            std::ignore = accessor(operation);
        break;
    case Code::SET_OPTIONS:
        if (context.exists && operation[1] % 3 == 0)
            context.maxHops = operation[2];
        break;
    default: // has nothing to do with what is predicted
        break;
    }
    return NO_RESULT;
}

void Model::advance(unsigned int milliseconds)
{
    m_callTime += static_cast<unsigned long long>(milliseconds) * (m_callsAdded - m_callsRemoved);
}

unsigned int Model::dialBy(Operation const& operation)
{
    unsigned int const line = lineOf(operation[0]);
    int const adapter = adapterOf(line);
    if (adapter == NOBODY)
        return NO_RESULT;
    unsigned long long const media = operation[5] % 4 == 3 ? ++m_lastGivenMedia : 0;
    Container const own = CONTAINER(OWN(line, operation[3]));
    Container const offered = CONTAINER(Values::CHOOSE_SEVERAL(operation[4]));
    Container const ofCall = CONTAINER(Values::CHOOSE_SEVERAL(operation[4] / 3));
    if (m_adapters[AT(adapter)].isE164 && operation[5] % 2 != 0)
        return dialE164(adapter, operation, own, offered, ofCall, media);
    return dial(adapter, operation[2] % 3, operation[1] % static_cast<unsigned int>(m_modules.size() + 1), own, offered,
                ofCall, media);
}

unsigned int Model::dialE164(int adapter, Operation const& operation, Container const& own, Container const& offered,
                             Container const& ofCall, unsigned long long media)
{
    unsigned int const called = operation[1] % static_cast<unsigned int>(m_modules.size() + 1);
    std::string const number = Values::TEXT(operation[6]);
    bool const isComplete = operation[5] % 8 == 5;
    Container ownAll =
        CONTAINER({Values::MAKE_TEXT(E164_NUMBER, "100"), Values::MAKE_NUMBER(TYPE_OF_NUMBER, Kind::TYPE_OF_NUMBER, 2),
                   Values::MAKE_NUMBER(NUMBERING_PLAN, Kind::NUMBERING_PLAN, 1),
                   Values::MAKE_NUMBER(PRESENTATION_INDICATOR, Kind::PRESENTATION, 0),
                   Values::MAKE_NUMBER(SCREENING_INDICATOR, Kind::SCREENING, 3), Values::MAKE_TEXT(NAME, "Ada"),
                   Values::MAKE_NUMBER(SUPPORTS_OVERLAP_SENDING, Kind::BOOLEAN, isComplete ? 0 : 1)});
    ownAll.setAllOfGroups(own);
    Container offeredAll =
        CONTAINER({Values::MAKE_TEXT(E164_NUMBER, number), Values::MAKE_NUMBER(TYPE_OF_NUMBER, Kind::TYPE_OF_NUMBER, 0),
                   Values::MAKE_NUMBER(NUMBERING_PLAN, Kind::NUMBERING_PLAN, 1), Values::MAKE_TEXT(NAME, "")});
    offeredAll.setAllOfGroups(offered);
    Context const& context = m_contexts[operation[2] % 3];
    Container all = CONTAINER({Values::MAKE_NUMBER(INFORMATION_TRANSFER_CAPABILITY, Kind::TRANSFER_CAPABILITY, 0),
                               Values::MAKE_NUMBER(HOPS, Kind::UNSIGNED, context.exists ? context.maxHops : 0)});
    all.setAllOfGroups(ofCall);
    return dial(adapter, operation[2] % 3, called, ownAll, offeredAll, all, media) == OK ? OK : FAILURE;
}

unsigned int Model::setBy(Operation const& operation)
{
    int const adapter = adapterOf(lineOf(operation[0]));
    if (operation.code == Code::BECOME)
        return writeOne(adapter, Target::OWN, Values::MAKE_STATE(static_cast<int>(operation[1] % 9) - 2));
    Target const target = operation.code == Code::SET_OWN    ? Target::OWN
                          : operation.code == Code::SET_PEER ? Target::PEER
                                                             : Target::CALL;
    bool const isFiltered = operation[3] % 2 == 0;
    Property const written = WRITTEN(operation[1], operation[2], 8);
    if (operation[3] % 4 < 2)
        return writeOne(adapter, target, written, isFiltered);
    Container several = CONTAINER({written});
    for (Property const& other : Values::CHOOSE_SEVERAL(operation[4]))
        several.set(other);
    return write(adapter, target, several, false, isFiltered);
}

unsigned int Model::accessor(Operation const& operation)
{
    int const adapter = adapterOf(lineOf(operation[0]));
    switch (operation[1] % 4)
    {
    case 0:
        return writeOne(adapter, Target::OWN,
                        Values::MAKE_NUMBER(SUPPORTS_OVERLAP_RECEIVING, Kind::BOOLEAN, operation[2] % 2));
    case 1:
        return writeOne(adapter, Target::OWN, Values::MAKE_TEXT(E164_NUMBER, Values::TEXT(operation[2])));
    case 2:
        return writeOne(adapter, Target::OWN, Values::MAKE_TEXT(NAME, Values::TEXT(operation[2])));
    default:
        return NO_RESULT;
    }
}

void Model::setup(Operation const& operation)
{
    unsigned int const line = lineOf(operation[0]);
    int const adapter = adapterOf(line);
    if (adapter == NOBODY || !m_modules[line / 2].exists)
        return;
    drop(adapter, -1, 0);
    Adapter& own = m_adapters[AT(adapter)];
    own.module = static_cast<int>(line / 2);
    own.isObserved = !own.isOverriding && operation[1] % 4 != 3;
}

// --- modules and adapters --------------------------------------------------------------------------------------------

void Model::makeModule(unsigned int index)
{
    Module& module = m_modules[index];
    if (module.exists)
        return;
    module.exists = true;
    module.usesInput = module.usesOutput = (m_first[5] >> index % 8 & 1) != 0;
    for (unsigned int i = 0; i < 2; ++i)
        makeAdapter(index * 2 + i, (m_first[1] >> index % 8 & 1) + 2 * (m_first[3] >> index % 8 & 1));
    std::ignore = addProvider(0, index);
}

void Model::makeAdapter(unsigned int line, unsigned int kind)
{
    Module& module = m_modules[line / 2];
    if (!module.exists || module.adapters[line % 2] != NOBODY)
        return;
    int const made = newAdapter(static_cast<int>(line), static_cast<int>(line / 2));
    module.adapters[line % 2] = made;
    Adapter& adapter = m_adapters[AT(made)];
    adapter.isE164 = (kind & 1) != 0;
    adapter.isOverriding = (kind & 2) != 0;
    adapter.isObserved = !adapter.isOverriding;
}

void Model::destroyAdapter(unsigned int line)
{
    int const adapter = adapterOf(line);
    if (adapter == NOBODY)
        return;
    drop(adapter, -1, 0);
    m_adapters[AT(adapter)].isAlive = false;
    m_modules[line / 2].adapters[line % 2] = NOBODY;
}

void Model::destroyModule(unsigned int index)
{
    Module& module = m_modules[index];
    destroyAdapter(index * 2);
    destroyAdapter(index * 2 + 1);
    for (unsigned int i = 0; i < m_contexts.size() && module.exists; ++i)
        if (std::find(m_contexts[i].providers.begin(), m_contexts[i].providers.end(), index) !=
            m_contexts[i].providers.end())
            removeProvider(i, index);
    if (!module.exists)
        return;
    hearGuests(module.ofProvider, CallOut::PROVIDER_DESTROYED);
    hearGuests(module.ofEndpoint, CallOut::ENDPOINT_DESTROYED);
    module.ofProvider = module.ofEndpoint = {};
    module.exists = false;
}

void Model::changeFilters(Operation const& operation)
{
    Module& module = moduleOf(operation[0]);
    std::vector<FilterRule>& filters = operation[1] % 2 == 0 ? module.input : module.output;
    FilterRule const rule = FilterRule::CHOOSE(operation[3], operation[4]);
    unsigned int const way = operation[2] % 4;
    if (way != 3 && filters.size() >= 4)
        return;
    std::size_t const place = std::min<std::size_t>(way == 0 ? filters.size() : operation[5] % 4, filters.size());
    auto const position = filters.begin() + static_cast<std::ptrdiff_t>(place);
    if (way < 2)
        filters.insert(position, rule);
    else if (place < filters.size())
    {
        if (way == 2)
            *position = rule;
        else
            filters.erase(position);
    }
    else if (way == 2)
        filters.push_back(rule);
}

void Model::answerHeld(Operation const& operation)
{
    unsigned int const number = operation[0] % static_cast<unsigned int>(m_modules.size());
    Module& module = m_modules[number];
    int const call = std::exchange(module.held, NOBODY);
    if (call == NOBODY || !module.exists)
        return;
    if (operation[2] % 3 == 0)
        reject(number, call, 21);
    else if (int const adapter = module.adapters[operation[1] % 2]; adapter != NOBODY)
        std::ignore = accept(adapter, call, CONTAINER(OWN(number * 2 + operation[1] % 2, operation[3])));
}

// --- legs that nobody's adapter drives -------------------------------------------------------------------------------

void Model::newGuestLeg(Operation const& operation)
{
    int& place = m_guestLegs[operation[0] % m_guestLegs.size()];
    if (place != NOBODY)
        return;
    place = newLeg();
    setOnLeg(place, Values::MAKE_NUMBER(CALL_LEG_ID, Kind::UNSIGNED, operation[1] % 32));
    if (operation[3] % 2 != 0)
        setOnLeg(place, Values::MAKE_TEXT(NETWORK, operation[3] % 4 == 1 ? "shared" : "x"));
    setOnLeg(place, Values::MAKE_STATE(static_cast<int>(operation[2] % 9) - 2));
}

unsigned int Model::moveLeg(Operation const& operation)
{
    int const leg = m_guestLegs[operation[0] % m_guestLegs.size()];
    int const call = callOf(operation[1], operation[2]);
    if (operation.code == Code::MOVE_LEG)
    {
        int const to = operation[3] % 4 == 3 ? NOBODY : call;
        transfer(to, leg);
        if (to != NOBODY)
            defer(to);
        return OK;
    }
    if (call == NOBODY)
        return NO_RESULT;
    if (operation.code == Code::ADD_LEG)
    {
        addCallLeg(call, leg);
        return OK;
    }
    transfer(NOBODY, leg);
    defer(call);
    return NO_RESULT;
}

void Model::changeUntold(Operation const& operation)
{
    int const leg = m_guestLegs[operation[0] % m_guestLegs.size()];
    Property const changed = Values::CHOOSE(operation[1], operation[2]);
    if (leg == NOBODY || changed.id == NETWORK)
        return;
    Container& properties = m_legs[AT(leg)].properties;
    operation[3] % 2 == 0 ? properties.remove(changed.id) : properties.set(changed);
}

// --- contexts --------------------------------------------------------------------------------------------------------

unsigned int Model::createContext(unsigned int index)
{
    if (m_contexts[index].exists)
        return REFUSED;
    m_contexts[index] = {};
    m_contexts[index].exists = true;
    for (int const guest : m_registry)
        hear(static_cast<unsigned int>(guest), CallOut::REGISTRY_ADDED);
    return OK;
}

void Model::destroyContext(unsigned int index)
{
    for (int const guest : m_registry)
        hear(static_cast<unsigned int>(guest), CallOut::REGISTRY_DESTROYED);
    Context& context = m_contexts[index];
    if (!context.exists)
        return;
    hearGuests(context.observers, CallOut::CONTEXT_DESTROYED);
    for (int const call : context.calls)
    {
        m_calls[AT(call)].context = NOBODY;
        ++m_callsRemoved;
    }
    context = {};
}

unsigned int Model::addProvider(unsigned int index, unsigned int module)
{
    Context& context = m_contexts[index];
    if (!context.exists)
        return FAILURE;
    if (std::find(context.providers.begin(), context.providers.end(), module) != context.providers.end())
        return REFUSED;
    context.providers.push_back(module);
    hearGuests(context.observers, CallOut::PROVIDER_ADDED);
    return OK;
}

void Model::removeProvider(unsigned int index, unsigned int module)
{
    Context& context = m_contexts[index];
    if (!context.exists)
        return;
    std::erase(context.providers, module);
    hearGuests(context.observers, CallOut::PROVIDER_REMOVED);
}

// --- observers -------------------------------------------------------------------------------------------------------

void Model::observe(Operation const& operation, bool isMore)
{
    int const guest = static_cast<int>(operation[0] % 6);
    bool const hearsThroughCalls = guest % 2 != 0;
    int const call = callOf(operation[2], operation[3]);
    int const leg = anyLegOf(operation[2], operation[3]);
    unsigned int const kind = operation[1] % 6;
    auto const change = [&](Observers& observers)
    {
        if (isMore)
            observers.add(Who::GUEST, guest);
        else if (observers.holds(Who::GUEST, guest))
            observers.remove(Who::GUEST, guest);
    };
    if (kind < 2)
    {
        if (call != NOBODY)
            change(m_calls[AT(call)].callObservers);
    }
    else if (kind == 2 && hearsThroughCalls)
    {
        if (call != NOBODY)
            isMore ? addLegObserver(call, Who::GUEST, guest) : removeLegObserver(call, Who::GUEST, guest);
    }
    else if (kind == 2)
    {
        if (leg != NOBODY)
            change(m_legs[AT(leg)].observers);
    }
    else if (kind == 3)
    {
        if (m_contexts[operation[2] % 3].exists)
            change(m_contexts[operation[2] % 3].observers);
    }
    else if (kind == 4)
    {
        bool const isThere = std::find(m_registry.begin(), m_registry.end(), guest) != m_registry.end();
        if (isMore && !isThere)
            m_registry.push_back(guest);
        else if (!isMore)
            std::erase(m_registry, guest);
    }
    else if (Module& module = moduleOf(operation[3]); module.exists && isMore)
    {
        module.ofEndpoint.add(Who::GUEST, guest);
        module.ofProvider.add(Who::GUEST, guest);
    }
}
} // namespace Simulation
