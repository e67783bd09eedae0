#include "tests/simulation/Model.h"

#include "platform/base/XCode.h"
#include "properties/CC_PropertyId.h"

#include <algorithm>

// Here: containers, legs, calls and the loop. Model_Adapter.cpp has what adapters do, Model_Operations.cpp what the
// operations mean.

namespace Simulation
{
using namespace CC_PropertyId;

namespace
{
constexpr unsigned int OK = XCode::OK.getValue();
constexpr unsigned int REFUSED = XCode::REFUSED.getValue();
constexpr unsigned int FAILURE = XCode::FAILURE.getValue();
} // namespace

// --- containers and observers ----------------------------------------------------------------------------------------

Value const* Model::Container::find(unsigned int id) const
{
    auto const found = std::find_if(list.begin(), list.end(), [id](Property const& own) { return own.id == id; });
    return found != list.end() ? &found->value : nullptr;
}

void Model::Container::set(Property const& property)
{
    for (Property& own : list)
        if (own.id == property.id)
        {
            if (own.value.kind == property.value.kind)
                own.value = property.value;
            return;
        }
    list.push_back(property);
}

void Model::Container::setAllOfGroups(Container const& other)
{
    for (Property const& property : other.list)
        if ((property.id & 0xff00) != 0)
            set(property);
}

void Model::Container::remove(unsigned int id)
{
    std::erase_if(list, [id](Property const& own) { return own.id == id; });
}

std::string Model::Container::text(unsigned int id) const
{
    Value const* const value = find(id);
    return value != nullptr && value->kind == Kind::TEXT ? value->text : std::string();
}

void Model::Observers::add(Who who, int index)
{
    for (Observer& own : list)
        if (own.is(who, index))
        {
            ++own.count;
            return;
        }
    list.push_back({who, index, 1});
}

void Model::Observers::remove(Who who, int index)
{
    for (Observer& own : list)
        if (own.is(who, index))
            --own.count;
}

void Model::Observers::silence()
{
    for (Observer& own : list)
        own.count = 0;
}

bool Model::Observers::holds(Who who, int index) const
{
    return std::any_of(list.begin(), list.end(),
                       [&](Observer const& own) { return own.is(who, index) && own.count != 0; });
}

// --- who hears -------------------------------------------------------------------------------------------------------

void Model::hear(unsigned int who, CallOut what, std::set<unsigned int> const& ids)
{
    unsigned long long sum = 0;
    for (unsigned int const id : ids)
        sum = sum * 31 + id;
    m_heard.push_back(static_cast<unsigned long long>(who) << 48 | static_cast<unsigned long long>(what) << 40 |
                      (sum & 0xffffffffff));
}

void Model::hearGuests(Observers const& observers, CallOut what)
{
    for (Observer const& observer : observers.list)
        if (observer.count != 0 && observer.who == Who::GUEST)
            hear(static_cast<unsigned int>(observer.index), what);
}

void Model::hearLine(Adapter const& adapter, CallOut what, std::set<unsigned int> const& ids)
{
    if (adapter.line != NOBODY && (adapter.isObserved || adapter.isOverriding))
        hear(0x100 + static_cast<unsigned int>(adapter.line), what, ids);
}

// --- legs ------------------------------------------------------------------------------------------------------------

int Model::Leg::getState() const
{
    Value const* const state = properties.find(STATE);
    return state != nullptr && state->kind == Kind::STATE ? static_cast<int>(state->number) - 2 : -1;
}

int Model::newLeg()
{
    Leg leg;
    leg.properties.list = {Values::MAKE_STATE(-2), Values::MAKE_NUMBER(PROVIDES_DATA, Kind::BOOLEAN, 0),
                           Values::MAKE_CAUSE(0, 0)};
    m_legs.push_back(leg);
    return static_cast<int>(m_legs.size()) - 1;
}

void Model::removeReference(int index)
{
    if (--m_legs[static_cast<std::size_t>(index)].references != 0)
        return;
    Leg& leg = m_legs[static_cast<std::size_t>(index)];
    hearGuests(leg.observers, CallOut::LEG_ENDED);
    leg.observers.silence();
    leg.isAlive = false;
}

/// An adapter gives a leg up: the call of one that is released has itself looked at.
void Model::giveUp(int index)
{
    Leg const& leg = m_legs[static_cast<std::size_t>(index)];
    int const call = leg.getState() == -1 ? leg.call : NOBODY;
    removeReference(index);
    if (call != NOBODY)
        defer(call);
}

unsigned int Model::storeOnLeg(int index, Property const& property, std::set<unsigned int>& changed)
{
    Leg& leg = m_legs[static_cast<std::size_t>(index)];
    Value const* const stored = leg.properties.find(property.id);
    if (stored != nullptr && *stored == property.value)
        return OK;
    if (property.id == STATE)
    {
        if (property.value.kind != Kind::STATE || property.value == Values::MAKE_STATE(-2).value)
            return REFUSED;
        if (leg.isFixed && !(property.value == Values::MAKE_STATE(-1).value))
            return OK;
    }
    leg.properties.set(property);
    changed.insert(property.id);
    return OK;
}

unsigned int Model::setOnLeg(int leg, Property const& property)
{
    std::set<unsigned int> changed;
    if (storeOnLeg(leg, property, changed) != OK)
        return FAILURE;
    if (!changed.empty())
        tellLeg(leg, changed);
    return OK;
}

unsigned int Model::setSeveralOnLeg(int leg, Properties const& properties)
{
    unsigned int result = OK;
    std::set<unsigned int> changed;
    Property const* state = nullptr;
    for (Property const& property : properties)
        if (property.id == STATE)
            state = &property;
        else if (unsigned int const stored = storeOnLeg(leg, property, changed); result == OK)
            result = stored;
    if (state != nullptr)
        if (unsigned int const stored = storeOnLeg(leg, *state, changed); result == OK)
            result = stored;
    tellLeg(leg, changed);
    return result;
}

void Model::tellLeg(int index, std::set<unsigned int> const& changed)
{
    auto const leg = static_cast<std::size_t>(index);
    for (std::size_t i = 0; i < m_legs[leg].observers.list.size(); ++i)
    {
        Observer const observer = m_legs[leg].observers.list[i];
        if (observer.count == 0)
            continue;
        if (observer.who == Who::ADAPTER)
            onLegChanged(observer.index, index, changed);
        else if (observer.who == Who::GUEST)
            hear(static_cast<unsigned int>(observer.index), CallOut::LEG_CHANGED, changed);
        else if (changed.count(STATE) != 0 || changed.count(NETWORK) != 0)
            defer(observer.index);
    }
}

void Model::deliverService(int index)
{
    auto const leg = static_cast<std::size_t>(index);
    for (std::size_t i = 0; i < m_legs[leg].observers.list.size(); ++i)
    {
        Observer const observer = m_legs[leg].observers.list[i];
        if (observer.count == 0)
            continue;
        if (observer.who == Who::GUEST)
            hear(static_cast<unsigned int>(observer.index), CallOut::LEG_SERVICE);
        if (observer.who != Who::ADAPTER)
            continue;
        Adapter const& adapter = m_adapters[static_cast<std::size_t>(observer.index)];
        if (adapter.own != NOBODY && adapter.own != index)
            hearLine(adapter, CallOut::PEER_SERVICE);
    }
}

// --- calls -----------------------------------------------------------------------------------------------------------

int Model::newCall(int context)
{
    Call call;
    call.context = context;
    int const index = static_cast<int>(m_calls.size());
    call.legObservers.add(Who::CALL, index);
    m_calls.push_back(call);
    return index;
}

void Model::setOnCall(int index, Property const& property)
{
    Call& call = m_calls[static_cast<std::size_t>(index)];
    Value const* const stored = call.properties.find(property.id);
    if (stored != nullptr && *stored == property.value)
        return;
    call.properties.set(property);
    tellCall(index, {property.id});
}

void Model::setSeveralOnCall(int index, Properties const& properties)
{
    std::set<unsigned int> changed;
    for (Property const& property : properties)
    {
        Call& call = m_calls[static_cast<std::size_t>(index)];
        Value const* const stored = call.properties.find(property.id);
        if (stored != nullptr && *stored == property.value)
            continue;
        call.properties.set(property);
        changed.insert(property.id);
    }
    tellCall(index, changed);
}

void Model::tellCall(int index, std::set<unsigned int> const& changed)
{
    auto const call = static_cast<std::size_t>(index);
    for (std::size_t i = 0; i < m_calls[call].callObservers.list.size(); ++i)
    {
        Observer const observer = m_calls[call].callObservers.list[i];
        if (observer.count == 0)
            continue;
        if (observer.who == Who::GUEST)
            hear(static_cast<unsigned int>(observer.index), CallOut::CALL_CHANGED, changed);
        else
            updateCall(observer.index);
    }
}

void Model::addLegObserver(int index, Who who, int observer)
{
    Call& call = m_calls[static_cast<std::size_t>(index)];
    call.legObservers.add(who, observer);
    for (int const leg : call.legs)
        m_legs[static_cast<std::size_t>(leg)].observers.add(who, observer);
}

void Model::removeLegObserver(int index, Who who, int observer)
{
    Call& call = m_calls[static_cast<std::size_t>(index)];
    call.legObservers.remove(who, observer);
    for (int const leg : call.legs)
        m_legs[static_cast<std::size_t>(leg)].observers.remove(who, observer);
}

void Model::transfer(int to, int index)
{
    auto const moved = static_cast<std::size_t>(index);
    int const from = m_legs[moved].call;
    if (from == to)
        return;
    if (to != NOBODY)
    {
        ++m_legs[moved].references;
        m_calls[static_cast<std::size_t>(to)].legs.push_back(index);
    }
    if (from != NOBODY)
    {
        auto const old = static_cast<std::size_t>(from);
        for (Observer const& observer : m_calls[old].legObservers.list)
            if (observer.count != 0)
                m_legs[moved].observers.remove(observer.who, observer.index);
        std::erase(m_calls[old].legs, index);
        for (std::size_t i = 0; i < m_calls[old].callObservers.list.size(); ++i)
        {
            Observer const observer = m_calls[old].callObservers.list[i];
            if (observer.count == 0)
                continue;
            if (observer.who == Who::GUEST)
                hear(static_cast<unsigned int>(observer.index), CallOut::LEG_REMOVED);
            else if (Adapter const& adapter = m_adapters[static_cast<std::size_t>(observer.index)];
                     adapter.own != NOBODY && m_legs[static_cast<std::size_t>(adapter.own)].call == from &&
                     adapter.own != index && adapter.peer == index)
                linkPeer(observer.index);
        }
    }
    m_legs[moved].call = to;
    if (to != NOBODY)
    {
        auto const joined = static_cast<std::size_t>(to);
        for (std::size_t i = 0; i < m_calls[joined].callObservers.list.size(); ++i)
        {
            Observer const observer = m_calls[joined].callObservers.list[i];
            if (observer.count == 0)
                continue;
            if (observer.who == Who::GUEST)
                hear(static_cast<unsigned int>(observer.index), CallOut::LEG_ADDED);
            else if (Adapter const& adapter = m_adapters[static_cast<std::size_t>(observer.index)];
                     adapter.own != NOBODY && m_legs[static_cast<std::size_t>(adapter.own)].call == to &&
                     adapter.own != index)
                linkPeer(observer.index);
        }
        for (Observer const& observer : m_calls[joined].legObservers.list)
            if (observer.count != 0)
                m_legs[moved].observers.add(observer.who, observer.index);
    }
    for (std::size_t i = 0; i < m_legs[moved].observers.list.size(); ++i)
    {
        Observer const observer = m_legs[moved].observers.list[i];
        if (observer.count == 0)
            continue;
        if (observer.who == Who::GUEST)
            hear(static_cast<unsigned int>(observer.index), CallOut::LEG_RELINKED);
        else if (observer.who == Who::ADAPTER)
            onRelinked(observer.index, index, to, from);
    }
    if (from == NOBODY)
        return;
    removeReference(index);
    if (!hasLiveLeg(from))
        defer(from);
}

void Model::addCallLeg(int call, int leg)
{
    transfer(call, leg);
    defer(call);
}

bool Model::hasLiveLeg(int index) const
{
    Call const& call = m_calls[static_cast<std::size_t>(index)];
    return std::any_of(call.legs.begin(), call.legs.end(),
                       [this](int leg) { return m_legs[static_cast<std::size_t>(leg)].getState() != -1; });
}

int Model::otherMostActive(int index, int excluded, int preferred) const
{
    int best = NOBODY;
    int level = 0;
    for (int const leg : m_calls[static_cast<std::size_t>(index)].legs)
    {
        int const own = m_legs[static_cast<std::size_t>(leg)].getState();
        if (leg == excluded || (best != NOBODY && own < level))
            continue;
        if (best == NOBODY || own > level || leg == preferred)
        {
            best = leg;
            level = own;
        }
    }
    return best;
}

void Model::defer(int index)
{
    Call& call = m_calls[static_cast<std::size_t>(index)];
    if (call.isPending || call.isEnding || !call.isAlive)
        return;
    call.isPending = true;
    m_queue.emplace_back(Who::CALL, index);
}

void Model::removeAllLegs(int index)
{
    std::vector<int> const legs = m_calls[static_cast<std::size_t>(index)].legs;
    for (int const leg : legs)
        transfer(NOBODY, leg);
}

void Model::deferred(int index)
{
    auto const call = static_cast<std::size_t>(index);
    bool isLive = false;
    std::vector<int> const legs = m_calls[call].legs;
    for (int const leg : legs)
    {
        Leg const& looked = m_legs[static_cast<std::size_t>(leg)];
        if (looked.getState() != -1)
            isLive = true;
        else if (looked.references == 1)
            transfer(NOBODY, leg);
    }
    if (isLive)
        return pushBack(index);
    removeAllLegs(index);
    release(index);
}

/// Gives the call back to its pool, or lets it destroy itself.
void Model::release(int index)
{
    Call const& call = m_calls[static_cast<std::size_t>(index)];
    if (call.context != NOBODY)
    {
        Context& context = m_contexts[static_cast<std::size_t>(call.context)];
        std::erase(context.calls, index);
        ++m_callsRemoved;
        if (context.calls.empty())
            hear(0x200, CallOut::REBOOT_RELEASE); // when the call was given back, which holds itself until then
    }
    destroyCall(index);
}

void Model::destroyCall(int index)
{
    auto const call = static_cast<std::size_t>(index);
    m_calls[call].isEnding = true;
    removeLegObserver(index, Who::CALL, index);
    removeAllLegs(index);
    m_calls[call].legObservers.silence();
    hearGuests(m_calls[call].callObservers, CallOut::CALL_ENDED);
    m_calls[call].callObservers.silence();
    m_calls[call].isAlive = false;
    std::erase(m_queue, std::pair(Who::CALL, index));
    for (Module& module : m_modules)
        if (module.held == index)
            module.held = NOBODY;
}

void Model::pushBack(int index)
{
    Call const& call = m_calls[static_cast<std::size_t>(index)];
    if (call.legs.size() != 2)
        return;
    Leg const& a = m_legs[static_cast<std::size_t>(call.legs[0])];
    Leg const& b = m_legs[static_cast<std::size_t>(call.legs[1])];
    Value const* const networks[] = {a.properties.find(NETWORK), b.properties.find(NETWORK)};
    Value const* const ids[] = {a.properties.find(CALL_LEG_ID), b.properties.find(CALL_LEG_ID)};
    for (int i = 0; i < 2; ++i)
        if (networks[i] == nullptr || networks[i]->kind != Kind::TEXT || ids[i] == nullptr ||
            ids[i]->kind != Kind::UNSIGNED)
            return;
    if (networks[0]->text != networks[1]->text)
        return;
    int const levels[] = {a.getState(), b.getState()};
    if (std::max(levels[0], levels[1]) < 6 || std::min(levels[0], levels[1]) < 4)
        return;
    bool const isFirst = levels[0] != levels[1] ? levels[0] < levels[1] : ids[0]->number < ids[1]->number;
    deliverService(call.legs[isFirst ? 0 : 1]);
}

// --- the loop --------------------------------------------------------------------------------------------------------

void Model::turn()
{
    std::deque<std::pair<Who, int>> taken;
    taken.swap(m_queue);
    while (!taken.empty())
    {
        auto const [who, index] = taken.front();
        taken.pop_front();
        if (who == Who::ADAPTER)
        {
            Adapter& adapter = m_adapters[static_cast<std::size_t>(index)];
            if (!adapter.isPending)
                continue; // destroyed meanwhile
            adapter.isPending = false;
            handle(index);
        }
        else if (Call& call = m_calls[static_cast<std::size_t>(index)]; call.isAlive && call.isPending)
        {
            call.isPending = false;
            deferred(index);
        }
    }
}

void Model::settle()
{
    for (int i = 0; i < 1000 && !m_queue.empty(); ++i)
        turn();
}
} // namespace Simulation
