// Inside each notification that exists, an observer does something drastic, once. The sanitizers watch; afterwards
// every counter is back.
#include "callcontrol/CC_Context.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/CallControlFixture.h"
#include "testing/LeakCheck.h"
#include "tests/support/Party.h"

#include <algorithm>
#include <cctype>
#include <functional>
#include <gtest/gtest.h>
#include <vector>

namespace
{
class World;

/// Observes everything there is and tells the world of each notification.
class Everything final : public CC_CallObserver,
                         public CC_CallLegObserver,
                         public CC_Context::Observer,
                         public CallControl::ContextObserver,
                         public CC_Provider::Observer,
                         public CC_Endpoint::Observer
{
public:
    explicit Everything(World& world) : m_world(world) {}

    void onCallObservationEnded(CC_Event<CC_Call> const&) override { happened("call ended"); }
    void onCallCallLegAdded(CC_Event<CC_Call> const& event) override
    {
        // also from outside the call, to hear of the leg's end
        CC_CallLeg& leg = *dynamic_cast<CC_EvCallCallLegModified const&>(event).getCallLeg();
        std::ignore = leg.addCallLegObserver(this);
        happened("leg added");
    }
    void onCallCallLegRemoved(CC_Event<CC_Call> const&) override { happened("leg removed"); }
    void onCallPropertyChanged(CC_Event<CC_Call> const&) override { happened("call property"); }
    void onCallLegObservationEnded(CC_Event<CC_CallLeg> const&) override { happened("leg ended"); }
    void onCallLegCallRelinked(CC_Event<CC_CallLeg> const&) override { happened("leg relinked"); }
    void onCallLegPropertyChanged(CC_Event<CC_CallLeg> const&) override { happened("leg property"); }
    void onCallLegSynchronousService(CC_Event<CC_CallLeg> const&) override { happened("leg service"); }
    void aboutDestroy(CC_Context&) override { happened("context destroyed"); }
    void aboutAddProvider(CC_Context&, String const&) override { happened("provider added"); }
    void aboutRemoveProvider(CC_Context&, String const&) override { happened("provider removed"); }
    void aboutCreateCall(CC_Context&, CC_Call* call) override;
    void aboutDestroyCall(CC_Context&, CC_Call*) override { happened("call released"); }
    void contextAdded(String const&) override { happened("registry: context added"); }
    void contextDestroyed(String const&) override { happened("registry: context destroyed"); }
    void aboutDestroy(CC_Provider&) override { happened("provider destroyed"); }
    void aboutFinished(CC_Endpoint&) override { happened("endpoint finished"); }
    void aboutDestroy(CC_Endpoint&) override { happened("endpoint destroyed"); }

    void observe(CC_Call& call);
    void observeContext();
    void removeItself();

private:
    void happened(char const* what);

    World& m_world;
    std::vector<CC_Call*> m_calls; // only compared with what is alive
    bool m_isRemoved = false;
};

/// Two calls of two parties each, with observers everywhere, and a plan of what happens where.
class World
{
public:
    using Action = std::function<void(World&)>;

    World(std::string point, unsigned int occurrence, Action action)
        : m_point(std::move(point)), m_occurrence(occurrence), m_action(std::move(action))
    {
        observers.push_back(std::make_unique<Everything>(*this));
        observers.push_back(std::make_unique<Everything>(*this));
        for (auto const& observer : observers)
        {
            CallControl::REGISTER_CONTEXT_OBSERVER(*observer);
            observer->observeContext();
        }
        for (char const* const name : {"anna", "bert", "carl", "dora"})
            parties.push_back(makeParty(name));
    }

    ~World()
    {
        m_point.clear(); // nothing strikes any more
        for (auto const& party : parties)
            party->adapter.reset();
        fixture.m_loop.settle();
        parties.clear();
        for (auto const& observer : observers)
        {
            CallControl::UNREGISTER_CONTEXT_OBSERVER(*observer);
            if (CC_Context* const context = CallControl::GET_CONTEXT("SWITCH"))
                context->removeContextObserver(*observer);
        }
        CallControl::DESTROY_CONTEXT("other");
        CallControl::DESTROY_CONTEXT("SWITCH");
        fixture.m_loop.settle();
    }

    void happened(std::string const& what)
    {
        if (what != m_point || ++m_seen != m_occurrence)
            return;
        hasStruck = true;
        m_action(*this);
    }

    Party& party(unsigned int index) { return *parties[index]; }
    /// Null when the party or its adapter is gone.
    CC_CallAdapter* adapterOf(unsigned int index)
    {
        return index < parties.size() ? parties[index]->adapter.get() : nullptr;
    }
    CC_Call* callOf(unsigned int index)
    {
        CC_CallAdapter const* const adapter = adapterOf(index);
        return adapter != nullptr ? adapter->getCall() : nullptr;
    }
    void hangUp(unsigned int index)
    {
        if (CC_CallAdapter* const adapter = adapterOf(index))
            adapter->drop(QCause::NORMAL_CALL_CLEARING, 0);
    }
    void destroyAdapter(unsigned int index)
    {
        if (index < parties.size())
            parties[index]->adapter.reset();
    }
    void transfer(unsigned int by, unsigned int other, bool removeOwnLeg)
    {
        if (adapterOf(by) != nullptr && adapterOf(other) != nullptr)
            std::ignore = adapterOf(by)->transfer(*adapterOf(other), removeOwnLeg);
    }

    /// Everything that can happen to two calls, so that every notification occurs.
    void live()
    {
        std::ignore = CallControl::CREATE_CONTEXT("other");
        dial(0, 1);
        dial(2, 3);
        settle();
        for (unsigned int const callee : {1u, 3u})
        {
            become(callee, State::ALERTING);
            become(callee, State::CONNECTED);
        }
        settle();
        ask(0);
        setCallProperty(0);
        settle();
        transfer(0, 3, true);
        settle();
        if (CC_Call* const call = callOf(1))
            CallControl::RELEASE_CALL("SWITCH", call);
        settle();
        for (unsigned int i = 0; i < 4; ++i)
            hangUp(i);
        settle();
        dial(0, 1);
        settle();
        CC_Endpoint::NOTIFY_OBSERVER_ABOUT_FINISHED(*observers[0], party(0).endpoint, nullptr);
        std::unique_ptr<Party> leaving = std::move(parties[2]);
        parties.erase(parties.begin() + 2);
        leaving.reset();
        CallControl::DESTROY_CONTEXT("SWITCH");
        settle();
    }

    void dial(unsigned int from, unsigned int to)
    {
        if (adapterOf(from) != nullptr && to < parties.size())
            std::ignore = party(from).dial(party(to));
    }
    void settle() { fixture.m_loop.settle(100); }

    CallControlFixture fixture;
    std::vector<std::unique_ptr<Everything>> observers;
    std::vector<std::unique_ptr<Party>> parties;
    bool hasStruck = false;

private:
    std::unique_ptr<Party> makeParty(char const* name)
    {
        auto party = std::make_unique<Party>(name);
        Party* const made = party.get();
        made->endpoint.m_handleOffer = [this, made](CC_Call& call, String const&, CC_PropertyContainer const&)
        {
            happened("offer");
            return made->adapter != nullptr ? made->adapter->accept(call, CC_PropertyContainer::EMPTY())
                                            : XCode::FAILURE;
        };
        made->observer.m_onPeerPropertyChange = [this](CC_CallAdapter&, CC_Flags const&) { happened("peer property"); };
        made->observer.m_onPeerSynchronousService = [this](CC_CallAdapter&, CC_Service&) { happened("peer service"); };
        std::ignore = made->endpoint.addEndpointObserver(*observers[0]);
        std::ignore = made->provider.addProviderObserver(*observers[0]);
        return party;
    }
    void become(unsigned int index, State::State state)
    {
        if (adapterOf(index) != nullptr)
            std::ignore = party(index).become(state);
    }
    void ask(unsigned int index)
    {
        CC_ServiceUserInput digits("1");
        if (adapterOf(index) != nullptr)
            adapterOf(index)->invokeSynchronousService(digits);
    }
    void setCallProperty(unsigned int index)
    {
        if (adapterOf(index) != nullptr)
            std::ignore = adapterOf(index)->setCallProperty(CC_PropertyString(CC_PropertyId::PRECALL_SERVICE, "x"));
    }

    std::string m_point;
    unsigned int m_occurrence;
    unsigned int m_seen = 0;
    Action m_action;
};

void Everything::happened(char const* what)
{
    if (!m_isRemoved)
        m_world.happened(what);
}

void Everything::aboutCreateCall(CC_Context&, CC_Call* call)
{
    observe(*call);
    happened("call created");
}

void Everything::observe(CC_Call& call)
{
    m_calls.push_back(&call);
    std::ignore = call.addCallObserver(this);
    std::ignore = call.addCallLegObserver(this);
}

void Everything::observeContext()
{
    if (CC_Context* const context = CallControl::GET_CONTEXT("SWITCH"))
        std::ignore = context->addContextObserver(*this);
}

/// From the lists of everything that is certainly alive.
void Everything::removeItself()
{
    m_isRemoved = true;
    CallControl::UNREGISTER_CONTEXT_OBSERVER(*this);
    if (CC_Context* const context = CallControl::GET_CONTEXT("SWITCH"))
        context->removeContextObserver(*this);
    for (unsigned int i = 0; i < m_world.parties.size(); ++i)
        if (CC_Call* const call = m_world.callOf(i);
            call != nullptr && std::find(m_calls.begin(), m_calls.end(), call) != m_calls.end())
        {
            std::erase(m_calls, call);
            call->removeCallObserver(this);
            call->removeCallLegObserver(this);
        }
}

struct Deed
{
    char const* name;
    World::Action action;
};

std::vector<Deed> const DEEDS = {
    {"RemovesItself", [](World& world) { world.observers[0]->removeItself(); }},
    {"RemovesItsNeighbour", [](World& world) { world.observers[1]->removeItself(); }},
    {"AddsAnother",
     [](World& world)
     {
         world.observers.push_back(std::make_unique<Everything>(world));
         CallControl::REGISTER_CONTEXT_OBSERVER(*world.observers.back());
         world.observers.back()->observeContext();
         for (unsigned int i = 0; i < world.parties.size(); ++i)
             if (CC_Call* const call = world.callOf(i))
                 world.observers.back()->observe(*call);
     }},
    {"DropsTheCaller", [](World& world) { world.hangUp(0); }},
    {"DropsTheCallee", [](World& world) { world.hangUp(1); }},
    {"DropsEverybody",
     [](World& world)
     {
         for (unsigned int i = 0; i < 4; ++i)
             world.hangUp(i);
     }},
    {"DestroysTheCallersAdapter", [](World& world) { world.destroyAdapter(0); }},
    {"DestroysTheCalleesAdapter", [](World& world) { world.destroyAdapter(1); }},
    {"DestroysEveryAdapter",
     [](World& world)
     {
         for (unsigned int i = 0; i < 4; ++i)
             world.destroyAdapter(i);
     }},
    {"DropsAndDialsAgain",
     [](World& world)
     {
         world.hangUp(0);
         world.dial(0, 1);
     }},
    {"Transfers", [](World& world) { world.transfer(0, 2, true); }},
    {"MakesAConference", [](World& world) { world.transfer(1, 2, false); }},
    {"ReleasesTheCall",
     [](World& world)
     {
         if (CC_Call* const call = world.callOf(0))
             CallControl::RELEASE_CALL("SWITCH", call);
     }},
    {"EmptiesTheCall",
     [](World& world)
     {
         CC_Call::Hold const call(world.callOf(0));
         if (call.get() == nullptr)
             return;
         call.get()->destroyParticipatingCallLegs();
         call.get()->defer(); // who empties a call asks for its clean-up
     }},
    {"RunsTheCleanUp",
     [](World& world)
     {
         if (CC_Call* const call = world.callOf(0))
             call->deferred();
     }},
    {"DestroysTheContext", [](World&) { CallControl::DESTROY_CONTEXT("SWITCH"); }},
    {"MakesTheContextAnew",
     [](World&)
     {
         CallControl::DESTROY_CONTEXT("SWITCH");
         std::ignore = CallControl::CREATE_CONTEXT("SWITCH");
     }},
    {"CreatesAContext", [](World&) { std::ignore = CallControl::CREATE_CONTEXT("other"); }},
    {"RemovesTheProvider", [](World&) { CallControl::REMOVE_PROVIDER("SWITCH", "bert"); }},
};

class Disruption : public testing::TestWithParam<char const*>
{
};

/// Strikes at each of the first occurrences of the point, with every deed.
constexpr unsigned int LAST_OCCURRENCE = 20;

TEST_P(Disruption, InsideThisNotificationAnythingMayBeDone)
{
    bool hasStruck = false;
    for (Deed const& deed : DEEDS)
        for (unsigned int occurrence = 1; occurrence <= LAST_OCCURRENCE; ++occurrence)
        {
            SCOPED_TRACE(std::string(deed.name) + ", occurrence " + std::to_string(occurrence));
            LeakCheck const check;
            {
                World world(GetParam(), occurrence, deed.action);
                world.live();
                hasStruck = hasStruck || world.hasStruck;
            }
            ASSERT_EQ(check.compare(), "");
        }
    EXPECT_TRUE(hasStruck) << "the point was never reached";
}

INSTANTIATE_TEST_SUITE_P(Each, Disruption,
                         testing::Values("leg added", "leg removed", "call property", "call ended", "leg relinked",
                                         "leg property", "leg service", "leg ended", "peer property", "peer service",
                                         "offer", "call created", "call released", "context destroyed",
                                         "provider added", "provider removed", "registry: context added",
                                         "registry: context destroyed", "provider destroyed", "endpoint finished",
                                         "endpoint destroyed"),
                         [](testing::TestParamInfo<char const*> const& point)
                         {
                             std::string name;
                             for (char const* letter = point.param; *letter != '\0'; ++letter)
                                 if (std::isalnum(static_cast<unsigned char>(*letter)) != 0)
                                     name.push_back(*letter);
                             return name;
                         });
} // namespace
