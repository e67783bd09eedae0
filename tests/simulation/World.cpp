#include "tests/simulation/World.h"

#include "callcontrol/CC_CallPool.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyId.h"
#include "tests/simulation/Library.h"

#include <algorithm>

namespace Simulation
{
World* World::s_current = nullptr;

World::World(Operation const& first) : m_first(first)
{
    s_current = this;
    CC_CallPool::s_statistics.prepareGet();
    m_added = CC_CallPool::s_statistics.m_callsAdded;
    m_removed = CC_CallPool::s_statistics.m_callsRemoved;
    CallControl::SET_MG_CONTEXT_REPOSITORY(&m_media);
    m_reboot.enable(true);
    for (unsigned int i = 0; i < NUMBER_OF_GUESTS; ++i)
        m_guests[i] = std::make_unique<Guest>(*this, i);
    for (unsigned int i = 0; i < NUMBER_OF_CONTEXTS; ++i)
        if (i == 0 || (m_first[4] >> i & 1) != 0)
            std::ignore = CallControl::CREATE_CONTEXT(CONTEXT_NAME(i));
    unsigned int const modules = 2 + m_first[0] % (MOST_MODULES - 1);
    for (unsigned int i = 0; i < modules; ++i)
        m_modules.push_back(std::make_unique<Module>(*this, i));
    for (unsigned int i = 0; i < modules; ++i)
        makeModule(i);
}

World::~World()
{
    takeDown();
    s_current = nullptr;
}

void World::fail(std::string const& what)
{
    if (m_failure.empty())
        m_failure = what;
}

void World::hear(unsigned int who, CallOut what, unsigned long long with)
{
    Memory::Ours const ours;
    m_heard.push_back(static_cast<unsigned long long>(who) << 48 | static_cast<unsigned long long>(what) << 40 |
                      (with & 0xffffffffff));
}

void World::hearChange(unsigned int number, CC_CallAdapter const* adapter, bool isEmpty, unsigned long long sum)
{
    Memory::Ours const ours;
    Line const& heard = line(number);
    if (adapter != heard.adapter.get())
        fail("line " + std::to_string(number) + " is told of changes by an adapter that it does not have any more");
    else if (heard.adapter->getEndpoint() == nullptr)
        fail("line " + std::to_string(number) + " is told of changes after its clean-up");
    if (isEmpty)
        fail("line " + std::to_string(number) + " is told that nothing changed");
    hear(WHO_LINE(number), CallOut::PEER_CHANGED, sum);
}

void World::hearService(unsigned int number, CC_CallAdapter const* adapter, unsigned int type)
{
    Memory::Ours const ours;
    if (adapter != line(number).adapter.get())
        fail("line " + std::to_string(number) + " is asked for a service by an adapter that it does not have any more");
    std::ignore = type; // a number of this process, in the order of first use
    hear(WHO_LINE(number), CallOut::PEER_SERVICE);
}

char const* World::CONTEXT_NAME(unsigned int index)
{
    static constexpr char const* NAMES[NUMBER_OF_CONTEXTS] = {"SWITCH", "other", "third"};
    return NAMES[index % NUMBER_OF_CONTEXTS];
}

Properties World::OWN_PROPERTIES(unsigned int line, unsigned int seed)
{
    Properties properties{Values::MAKE_NUMBER(CC_PropertyId::CALL_LEG_ID, Kind::UNSIGNED, 10 + line)};
    for (Property& property : Values::CHOOSE_SEVERAL(seed))
        properties.push_back(std::move(property));
    return properties;
}

Line& World::line(unsigned int index)
{
    unsigned int const number = lineNumber(index);
    return m_modules[number / LINES_OF_A_MODULE]->lines[number % LINES_OF_A_MODULE];
}

namespace
{
CC_Call* CALL_OF_CONTEXT(unsigned int index)
{
    char const* const context = World::CONTEXT_NAME(index);
    unsigned int const count = CallControl::GET_NUMBER_OF_CALLS(context);
    return count != 0 ? CallControl::GET_CALL(context, index / World::NUMBER_OF_CONTEXTS % count) : nullptr;
}
} // namespace

CC_Call* World::call(unsigned int way, unsigned int index)
{
    switch (way % 4)
    {
    case 2:
        return line(index).adapter != nullptr ? line(index).adapter->getCall() : nullptr;
    case 3:
        if (way % 8 == 7)
            return m_telling;
        return leg(index) != nullptr ? leg(index)->getCall() : nullptr;
    default:
        return CALL_OF_CONTEXT(index);
    }
}

CC_CallLeg* World::anyLeg(unsigned int way, unsigned int index)
{
    if (way % 2 == 0)
        return leg(index);
    CC_Call const* const of = call(way / 2, index);
    if (of == nullptr || of->getNumberOfCallLegs() == 0)
        return nullptr;
    return of->getCallLeg(way / 8 % of->getNumberOfCallLegs());
}

void World::noteMove(unsigned int index, CC_Call* to)
{
    Memory::Ours const ours;
    Sent& sent = m_sent[index % NUMBER_OF_LEGS];
    if (to != nullptr && to == m_telling) // it takes no leg, and who observes it only now is not told of the end
    {
        sent.isSent = false;
        return sent.to.watch(nullptr);
    }
    sent.isSent = true;
    sent.isIntoCall = to != nullptr;
    sent.to.watch(to);
}

// --- modules ---------------------------------------------------------------------------------------------------------

void World::makeModule(unsigned int index)
{
    Memory::Ours const ours;
    Module& made = module(index);
    if (made.endpoint != nullptr)
        return;
    made.provider = std::make_unique<Provider>(*this, made.index);
    made.endpoint = std::make_unique<Endpoint>(*this, made.index, nullptr, nullptr);
    made.endpoint->setInputFilterContainer(&made.inputFilters);
    made.endpoint->setOutputFilterContainer(&made.outputFilters);
    if ((m_first[5] >> made.index % 8 & 1) == 0)
    {
        made.endpoint->setInputFilterContainer(nullptr);
        made.endpoint->setOutputFilterContainer(nullptr);
    }
    m_hadInputFilters = m_hadInputFilters || made.endpoint->getInputFilterContainer() != nullptr;
    m_hadOutputFilters = m_hadOutputFilters || made.endpoint->getOutputFilterContainer() != nullptr;
    for (unsigned int i = 0; i < LINES_OF_A_MODULE; ++i)
        makeAdapter(made.index * LINES_OF_A_MODULE + i,
                    (m_first[1] >> made.index % 8 & 1) + 2 * (m_first[3] >> made.index % 8 & 1));
    Memory::Library const library;
    std::ignore =
        CallControl::ADD_PROVIDER(CONTEXT_NAME(0), ("p" + std::to_string(made.index)).c_str(), *made.provider);
}

void World::destroyModule(unsigned int index)
{
    Module& leaving = module(index);
    if (leaving.pins != 0)
        return;
    {
        Pin const pin(leaving); // no second end inside this one
        Memory::Library const library;
        for (Line& line : leaving.lines)
            std::unique_ptr<CC_CallAdapter>(std::move(line.adapter)).reset();
        for (unsigned int i = 0; i < NUMBER_OF_CONTEXTS; ++i)
        {
            String const name(("p" + std::to_string(leaving.index)).c_str());
            if (leaving.provider != nullptr &&
                CallControl::GET_PROVIDER(CONTEXT_NAME(i), name) == leaving.provider.get())
                CallControl::REMOVE_PROVIDER(CONTEXT_NAME(i), name);
        }
        for (Line const& line : leaving.lines)
            if (line.adapter != nullptr)
                return; // somebody made another meanwhile
    }
    Memory::Library const library;
    std::unique_ptr<Endpoint> const endpoint = std::move(leaving.endpoint); // nobody makes an adapter for it any more
    std::unique_ptr<Provider>(std::move(leaving.provider)).reset();
}

void World::makeAdapter(unsigned int number, unsigned int kind)
{
    Memory::Ours const ours;
    Line& made = line(number);
    Module& owner = module(lineNumber(number) / LINES_OF_A_MODULE);
    if (made.adapter != nullptr || owner.endpoint == nullptr)
        return;
    made.e164 = nullptr;
    made.isOverriding = (kind & 2) != 0;
    if ((kind & 1) != 0)
    {
        auto adapter = made.isOverriding ? std::make_unique<Overriding<CC_CallAdapterE164>>(*this, lineNumber(number))
                                         : std::unique_ptr<CC_CallAdapterE164>(std::make_unique<CC_CallAdapterE164>());
        made.e164 = adapter.get();
        made.adapter = std::move(adapter);
    }
    else if (made.isOverriding)
        made.adapter = std::make_unique<Overriding<CC_CallAdapter>>(*this, lineNumber(number));
    else
        made.adapter = std::make_unique<CC_CallAdapter>();
    ++made.adapters;
    made.isObserved = !made.isOverriding;
    std::ignore = made.adapter->setup("l", *owner.endpoint, made.isObserved ? &made.observer : nullptr);
}

/// Released first: one that is live keeps its call.
void World::giveUpLeg(unsigned int index)
{
    CC_CallLeg* const given = std::exchange(leg(index), nullptr);
    if (given == nullptr)
        return;
    FIX_STATE(*given);
    Values::WITH(Values::MAKE_STATE(-1),
                 [&](CC_Property const& released)
                 {
                     Memory::Library const library;
                     std::ignore = given->setProperty(released);
                 });
    Memory::Library const library;
    given->removeReference();
}

// --- the end ---------------------------------------------------------------------------------------------------------

void World::strike(CallOut kind)
{
    Reactions::Reaction due{};
    Memory::Ours const ours;
    if (!m_reactions.take(kind, due) || m_depth > 8 || hasFailed())
        return;
    bool const isOfProperty = kind >= CallOut::PROPERTY_CLONE && kind <= CallOut::PROPERTY_END;
    bool const isJoining = kind == CallOut::LEG_ADDED;
    bool const mayBeNews = isJoining || isOfProperty; // whose copies are made inside such news, too
    Levels const before = mayBeNews ? getActivityLevels() : Levels();
    ++m_depth;
    ++m_strikes;
    m_carryOut(due.begin, due.end);
    --m_depth;
    if (!mayBeNews || m_mayPeersBeStale)
        return;
    Levels const after = getActivityLevels();
    m_mayPeersBeStale = isJoining ? HAVE_RISEN(before, after) : before != after;
}

/// Whether a leg is more active than it was, or was not there. That one is less, those who chose it find out.
bool World::HAVE_RISEN(Levels const& before, Levels const& after)
{
    auto const hasRisen = [&](Levels::value_type const& now)
    {
        return std::none_of(before.begin(), before.end(),
                            [&](Levels::value_type const& then)
                            { return then.first == now.first && then.second >= now.second; });
    };
    return std::any_of(after.begin(), after.end(), hasRisen);
}

/// Of all legs in calls, and of the guests': their calls may have lost the context that lists them.
World::Levels World::getActivityLevels() const
{
    Levels levels;
    for (unsigned int i = 0; i < NUMBER_OF_CONTEXTS; ++i)
        for (unsigned int j = 0; CC_Call const* const call = CallControl::GET_CALL(CONTEXT_NAME(i), j); ++j)
            for (unsigned int k = 0; k < call->getNumberOfCallLegs(); ++k)
                levels.emplace_back(call->getCallLeg(k), call->getCallLeg(k)->getActivityLevel());
    for (CC_CallLeg const* const leg : m_legs)
        levels.emplace_back(leg, leg != nullptr ? leg->getActivityLevel() : 0);
    return levels;
}

bool World::isBlank(CC_Call const& call) const
{
    return std::any_of(m_blankCalls.begin(), m_blankCalls.end(),
                       [&](auto const& watch) { return watch->get() == &call; });
}

/// Calls that nobody but their acquirer gives back, and those that a filter kept from hearing of the end.
void World::releaseWhatMayStay()
{
    for (auto const& watch : m_blankCalls)
        if (watch->get() != nullptr)
            watch->get()->defer();
    m_loop.settle(1000);
    for (unsigned int i = 0; i < NUMBER_OF_CONTEXTS; ++i)
        while (CC_Call* const left = CallControl::GET_CALL(CONTEXT_NAME(i), 0))
        {
            if (!m_hasFailingFilter)
                fail("at the end, when all have dropped, a call is left in context " + std::to_string(i));
            CallControl::RELEASE_CALL(CONTEXT_NAME(i), left);
        }
}

void World::takeDown()
{
    m_reactions.clear();
    Memory::FAIL_NTH(0);
    Memory::Library const library;
    for (auto const& leaving : m_modules)
        leaving->held.watch(nullptr);
    for (Sent& sent : m_sent)
        sent.to.watch(nullptr);
    m_made.watch(nullptr);
    m_released.watch(nullptr);
    for (auto const& leaving : m_modules)
        for (Line& line : leaving->lines)
            line.adapter.reset();
    for (unsigned int i = 0; i < NUMBER_OF_LEGS; ++i)
        giveUpLeg(i);
    if (m_loop.settle(1000) == 1000)
        fail("the loop never comes to rest");
    releaseWhatMayStay();
    m_loop.settle(1000);
    for (unsigned int i = 0; i < m_modules.size(); ++i)
        destroyModule(i);
    for (unsigned int i = 0; i < NUMBER_OF_CONTEXTS; ++i)
        CallControl::DESTROY_CONTEXT(CONTEXT_NAME(i));
    for (auto const& guest : m_guests)
        CallControl::UNREGISTER_CONTEXT_OBSERVER(*guest);
    m_loop.settle(1000);
}
} // namespace Simulation
