// Who holds what, found in one walk over all that is alive.
//
// An explanation is asked for when something is wrong, so it believes nobody: it follows no pointer that a module has
// set (its endpoint, its observer), and knows an observer by comparing addresses with those of adapters and calls that
// are alive. Nobody is called, so nothing can come or go while it looks.
#include "diagnosis/CC_Explanation.h"

#include "diagnosis/CC_ExplanationEnd.h"
#include "diagnosis/CC_Inside.h"
#include "environment/CC_Moment.h"

#include <algorithm>
#include <unordered_map>
#include <unordered_set>
#include <utility>

namespace
{
using Adapter = CC_Explanation::Adapter;
using Age = CC_Explanation::Age;
using Holder = CC_Explanation::Holder;
using Observer = CC_Explanation::Observer;
using State = CC_PropertyCallLegState;

constexpr long long NANOSECONDS_IN_SECOND = 1000000000;

std::string TEXT(String const& text) { return std::string(text.view()); }

Age AGE_OF(CC_Moment const& moment, CC_Moment const& now)
{
    if (moment == CC_Moment() || now == CC_Moment())
        return {};
    return {true, now.nanoseconds - moment.nanoseconds, now.turn - moment.turn};
}

bool IS_AS_OLD(CC_Moment const& start, CC_Moment const& now, unsigned int seconds)
{
    Age const age = AGE_OF(start, now);
    return !age.isKnown || age.nanoseconds >= seconds * NANOSECONDS_IN_SECOND;
}

/// Not by asking the endpoint, which may be gone.
Adapter NAME_OF(CC_CallAdapter const& adapter)
{
    std::string_view const name = adapter.getName().view();
    std::string_view const leg = adapter.getCallLegName().view();
    Adapter result{std::string(name), {}};
    if (leg.size() > name.size() && leg.ends_with(name) && leg[leg.size() - name.size() - 1] == '/')
        result.endpoint = leg.substr(0, leg.size() - name.size() - 1);
    return result;
}

/// Finds out who holds and observes what was asked for. `ask` first, then `look` once, then `of`.
class Survey
{
public:
    void ask(CC_Call const& call)
    {
        CC_Inside::OBSERVERS(call).forEachEntry([&](auto const& entry) { m_known[entry.m_observer]; });
        CC_Inside::LEG_OBSERVERS(call).forEachEntry([&](auto const& entry) { m_known[entry.m_observer]; });
        for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
            ask(*call.getCallLeg(i));
    }
    void ask(CC_CallLeg const& leg)
    {
        m_holders[&leg];
        CC_Inside::OBSERVERS(leg).forEachEntry([&](auto const& entry) { m_known[entry.m_observer]; });
    }

    void look()
    {
        CC_Inside::FOR_EACH_CALL([&](CC_Call const& call) { lookAt(call); });
        CC_Inside::FOR_EACH_ADAPTER([&](CC_CallAdapter const& adapter) { lookAt(adapter); });
    }

    CC_Explanation::Call of(CC_Call const& call) const;
    CC_Explanation::Leg of(CC_CallLeg const& leg) const;

    CC_Moment const now = CC_Moment::NOW();

private:
    // what an observer's address belongs to: one of these, or neither
    struct Known
    {
        CC_Call const* call = nullptr;
        CC_CallAdapter const* adapter = nullptr;
    };
    struct Holders
    {
        std::vector<CC_Call const*> calls;
        std::vector<CC_CallAdapter const*> own;
        std::vector<CC_CallAdapter const*> peer;
    };

    void lookAt(CC_Call const& call)
    {
        if (auto const found = m_known.find(static_cast<CC_CallLegObserver const*>(&call)); found != m_known.end())
            found->second.call = &call;
        for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
            if (Holders* const holders = find(call.getCallLeg(i)))
                holders->calls.push_back(&call);
    }
    void lookAt(CC_CallAdapter const& adapter)
    {
        for (void const* const address : {static_cast<void const*>(static_cast<CC_CallObserver const*>(&adapter)),
                                          static_cast<void const*>(static_cast<CC_CallLegObserver const*>(&adapter))})
            if (auto const found = m_known.find(address); found != m_known.end())
                found->second.adapter = &adapter;
        if (Holders* const holders = find(adapter.getOwnCallLeg()))
            holders->own.push_back(&adapter);
        if (Holders* const holders = find(adapter.getPeerCallLeg()))
            holders->peer.push_back(&adapter);
    }
    Holders* find(CC_CallLeg const* leg)
    {
        auto const found = m_holders.find(leg);
        return found != m_holders.end() ? &found->second : nullptr;
    }

    template <class Entry, class CountOwn>
    void add(std::vector<Observer>& observers, Entry const& entry, CountOwn const& countOwn) const;
    static int OWN_REGISTRATIONS(CC_CallLeg const& leg, Known const& known);

    std::unordered_map<void const*, Known> m_known; // by the observer's address
    std::unordered_map<CC_CallLeg const*, Holders> m_holders;
};

/// `countOwn(known)`: the registrations that are the observer's own.
template <class Entry, class CountOwn>
void Survey::add(std::vector<Observer>& observers, Entry const& entry, CountOwn const& countOwn) const
{
    auto const registrations = static_cast<int>(entry.m_count);
    if (registrations == 0)
        return;
    Known const& known = m_known.at(entry.m_observer);
    Observer& observer =
        observers.emplace_back(Observer{Observer::FOREIGN, registrations, registrations, 0, {}, entry.m_observer});
    if (known.adapter == nullptr && known.call == nullptr)
        return;
    observer.surplus -= countOwn(known);
    observer.kind = known.adapter != nullptr ? Observer::ADAPTER : Observer::CALL;
    if (known.adapter != nullptr)
        observer.adapter = NAME_OF(*known.adapter);
    else
        observer.call = known.call->getSerial();
}

/// Of a leg: one for the adapter that drives it, and one for each call that has given it its leg observers.
int Survey::OWN_REGISTRATIONS(CC_CallLeg const& leg, Known const& known)
{
    if (known.adapter == nullptr)
        return CC_Inside::IS_GIVEN(leg, *known.call, known.call) ? 1 : 0;
    CC_CallAdapter const& adapter = *known.adapter;
    CC_Call const* const call = CC_Inside::OBSERVED_CALL(adapter);
    bool const isOwn = adapter.getOwnCallLeg() == &leg && CC_Inside::OBSERVES_OWN_LEG(adapter);
    bool const isGiven =
        call != nullptr && CC_Inside::IS_CALL_LEG_OBSERVER(adapter) && CC_Inside::IS_GIVEN(leg, *call, &adapter);
    return (isOwn ? 1 : 0) + (isGiven ? 1 : 0);
}

CC_Explanation::Leg Survey::of(CC_CallLeg const& leg) const
{
    Holders const& found = m_holders.at(&leg);
    CC_Explanation::Leg result{};
    result.serial = leg.getSerial();
    result.name = TEXT(leg.getName().isEmpty() ? String::addressOf(&leg) : leg.getName());
    result.state = leg.getState();
    result.age = AGE_OF(leg.getStart(), now);
    result.inState = AGE_OF(leg.getStateSince(), now);
    result.references = CC_Inside::REFERENCES(leg);
    result.isMoving = CC_Inside::IS_MOVING(leg);
    result.isBusy = result.isMoving;
    int unknown = result.references;
    result.holders.reserve(found.calls.size() + found.own.size() + found.peer.size() + 2); // of moves and unknown ones
    auto const add = [&](Holder&& holder)
    {
        unknown -= holder.references;
        result.holders.push_back(std::move(holder));
    };
    auto const addAdapter = [&](Holder::Kind kind, CC_CallAdapter const& adapter)
    {
        add({kind, 1, 0, NAME_OF(adapter), CC_Inside::NUMBER_UNTOLD(adapter)});
        result.isBusy = result.isBusy || CC_Inside::IS_BUSY(adapter);
    };
    for (CC_Call const* const call : found.calls)
    {
        add({Holder::CALL, 1, call->getSerial(), {}, 0});
        result.isBusy = result.isBusy || CC_Inside::HOLDS(*call) != 0;
    }
    for (CC_CallAdapter const* const adapter : found.own)
    {
        addAdapter(Holder::OWN_ADAPTER, *adapter);
        State const* const viewed = CC_Inside::VIEWED_STATE(*adapter);
        if (viewed != nullptr && viewed->getState() != result.state)
            result.viewedState = State::STATE_NAME(viewed->getState());
    }
    for (CC_CallAdapter const* const adapter : found.peer)
        addAdapter(Holder::PEER_ADAPTER, *adapter);
    if (int const references = CC_Inside::REFERENCES_OF_MOVE(leg); references != 0)
        add({Holder::MOVE, references, 0, {}, 0});
    if (unknown != 0)
        result.holders.push_back({Holder::NOBODY_KNOWN, unknown, 0, {}, 0});
    result.observers.reserve(CC_Inside::OBSERVERS(leg).getNumberOfEntries());
    CC_Inside::OBSERVERS(leg).forEachEntry(
        [&](auto const& entry)
        { this->add(result.observers, entry, [&](Known const& known) { return OWN_REGISTRATIONS(leg, known); }); });
    return result;
}

CC_Explanation::Call Survey::of(CC_Call const& call) const
{
    CC_Explanation::Call result{};
    result.serial = call.getSerial();
    result.name = TEXT(call.getName());
    result.state = call.getState();
    result.age = AGE_OF(call.getStart(), now);
    result.inState = AGE_OF(call.getStateSince(), now);
    result.hasPool = call.getCallPool() != nullptr;
    result.isReleased = CC_Inside::IS_RELEASED(call);
    result.isCleanUpPending = CC_Inside::IS_CLEAN_UP_PENDING(call);
    result.hasCleanUp = CC_Inside::HAS_CLEAN_UP(call);
    result.holds = CC_Inside::HOLDS(call);
    result.legs.reserve(call.getNumberOfCallLegs());
    for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
        result.legs.push_back(of(*call.getCallLeg(i)));
    auto const isRegistered = [&](Known const& known, bool (*isObserver)(CC_CallAdapter const&)) {
        return known.adapter != nullptr && CC_Inside::OBSERVED_CALL(*known.adapter) == &call &&
               isObserver(*known.adapter);
    };
    result.observers.reserve(CC_Inside::OBSERVERS(call).getNumberOfEntries());
    CC_Inside::OBSERVERS(call).forEachEntry(
        [&](auto const& entry)
        {
            add(result.observers, entry,
                [&](Known const& known) { return isRegistered(known, CC_Inside::IS_CALL_OBSERVER) ? 1 : 0; });
        });
    result.legObservers.reserve(CC_Inside::LEG_OBSERVERS(call).getNumberOfEntries());
    CC_Inside::LEG_OBSERVERS(call).forEachEntry(
        [&](auto const& entry)
        {
            add(result.legObservers, entry,
                [&](Known const& known)
                { return known.call == &call || isRegistered(known, CC_Inside::IS_CALL_LEG_OBSERVER) ? 1 : 0; });
        });
    return result;
}

/// Of the calls of which `isAsked(call, now)`.
template <class IsAsked>
std::vector<CC_Explanation::Call> EXPLAIN_CALLS(IsAsked const& isAsked)
{
    Survey survey;
    std::vector<CC_Call const*> asked;
    CC_Inside::FOR_EACH_CALL(
        [&](CC_Call const& call)
        {
            if (CC_Inside::IS_ENDING(call) || !isAsked(call, survey.now))
                return;
            survey.ask(call);
            asked.push_back(&call);
        });
    survey.look();
    std::vector<CC_Explanation::Call> calls;
    calls.reserve(asked.size());
    std::reverse(asked.begin(), asked.end()); // in the order of their making
    for (CC_Call const* const call : asked)
    {
        calls.push_back(survey.of(*call));
        CC_ExplanationEnd::TELL(calls.back());
    }
    return calls;
}
} // namespace

CC_Explanation CC_Explanation::OF_CALL(CC_Call const& asked)
{
    CC_Explanation explanation;
    explanation.m_calls = EXPLAIN_CALLS([&](CC_Call const& call, CC_Moment const&) { return &call == &asked; });
    return explanation;
}

CC_Explanation CC_Explanation::OF_CALL(unsigned long long serial)
{
    CC_Explanation explanation;
    explanation.m_calls =
        EXPLAIN_CALLS([&](CC_Call const& call, CC_Moment const&) { return call.getSerial() == serial; });
    return explanation;
}

CC_Explanation CC_Explanation::OF_CALLS_OLDER_THAN(unsigned int seconds)
{
    CC_Explanation explanation;
    explanation.m_calls = EXPLAIN_CALLS([&](CC_Call const& call, CC_Moment const& now)
                                        { return IS_AS_OLD(call.getStart(), now, seconds); });
    return explanation;
}

CC_Explanation CC_Explanation::OF_LEGS_WITHOUT_CALL(unsigned int seconds)
{
    // not by the leg's own pointer, which anybody may set
    std::unordered_set<CC_CallLeg const*> listed;
    CC_Inside::FOR_EACH_CALL(
        [&](CC_Call const& call)
        {
            for (unsigned int i = 0; i < call.getNumberOfCallLegs(); ++i)
                listed.insert(call.getCallLeg(i));
        });
    Survey survey;
    std::vector<CC_CallLeg const*> asked;
    CC_Inside::FOR_EACH_LEG(
        [&](CC_CallLeg const& leg)
        {
            if (CC_Inside::IS_ENDING(leg) || listed.contains(&leg) || !IS_AS_OLD(leg.getStart(), survey.now, seconds))
                return;
            survey.ask(leg);
            asked.push_back(&leg);
        });
    survey.look();
    CC_Explanation explanation;
    std::reverse(asked.begin(), asked.end());
    for (CC_CallLeg const* const leg : asked)
    {
        explanation.m_legs.push_back(survey.of(*leg));
        CC_ExplanationEnd::TELL(explanation.m_legs.back());
    }
    return explanation;
}
