#include "testing/ConformanceSituation.h"

#include "callcontrol/CallControl.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "services/CC_ServiceUserInput.h"
#include "testing/FailingAllocator.h"

#include <tuple>

namespace
{
constexpr char const* PEERS_OWN_NUMBER = "4940555";

bool IS_OURS(String const& legName)
{
    for (char const* const party : {"peer/", "second/", "third/"})
        if (legName.startsWith(party))
            return true;
    return false;
}
} // namespace

ConformanceSituation::ConformanceSituation(ModuleConformance::Factory const& makeDriver) : m_makeDriver(makeDriver)
{
    restart();
}

ConformanceSituation::~ConformanceSituation() = default;

void ConformanceSituation::restart()
{
    m_parts.reset();
    m_ladder.clear();
    m_seenBefore = 0;
    m_legsBefore = CC_CallLeg::s_numberOfInstances;
    m_parts = std::make_unique<Parts>();
    m_parts->watch = std::make_unique<ConformanceWatch>(*m_parts->callControl.getContext(), m_ladder,
                                                        [](String const& name) { return !IS_OURS(name); });
    makePeer();
    m_parts->driver = m_makeDriver();
    m_parts->driver->m_onSeen = [this](Seen const& seen)
    {
        FailingAllocator::Pause const unseen;
        did(ConformanceLadder::WIRE, seen.getText());
    };
}

void ConformanceSituation::makePeer()
{
    m_parts->peer = std::make_unique<FakeModule>(ModuleDriver::PEER);
    FakeModule& peer = *m_parts->peer;
    peer.setNumber(PEERS_OWN_NUMBER);
    peer.m_provider.m_dial =
        [this](CC_Call& call, String const&, String const& number, CC_PropertyContainer const& offered)
    {
        m_parts->numberDialled = number;
        return m_parts->peer->m_endpoint.offer(call, number, offered);
    };
    peer.m_observer.m_onPeerSynchronousService = [this](CC_CallAdapter&, CC_Service& service)
    {
        FailingAllocator::Pause const unseen;
        if (service.isOfType(CC_ServiceUserInput::TYPE()))
            m_parts->digitsHeard += static_cast<CC_ServiceUserInput&>(service).getInput().view();
    };
}

FakeModule& ConformanceSituation::party(std::unique_ptr<FakeModule>& party, char const* name) const
{
    if (party == nullptr)
        party = std::make_unique<FakeModule>(name);
    return *party;
}

void ConformanceSituation::need(ModuleDriver::Ability ability) const
{
    if (char const* const why = driver().whyNot(ability))
        throw ConformanceSkip{why};
}

void ConformanceSituation::need(Caller caller) const
{
    need(caller == Caller::WIRE ? ModuleDriver::CALLS_FROM_WIRE : ModuleDriver::CALLS_TO_WIRE);
}

void ConformanceSituation::beginCall()
{
    m_ladder.clear();
    m_seenBefore = driver().getSeen().size();
    watch().forget();
    m_parts->numberDialled.clear();
    m_parts->digitsHeard.clear();
}

void ConformanceSituation::did(ConformanceLadder::Column column, std::string const& what)
{
    m_ladder.add(column, what);
}

// --- steps of a call -------------------------------------------------------------------------------------------------

void ConformanceSituation::call(Caller caller, Step step)
{
    need(caller);
    offer(caller);
    if (step != Step::OFFERED)
        ring(caller);
    if (step == Step::CONNECTED)
        answer(caller);
}

void ConformanceSituation::offer(Caller caller)
{
    caller == Caller::PEER ? offerFromPeer() : offerFromWire();
    settle();
}

void ConformanceSituation::offerFromPeer()
{
    String const number = driver().getNumber();
    did(ConformanceLadder::PEER, std::string("> dials ") + number.c_str());
    auto const& none = CC_PropertyContainer::EMPTY();
    CC_PropertyContainer own;
    std::ignore = own.set(CC_PropertyString(CC_PropertyId::E164_NUMBER, PEERS_OWN_NUMBER)); // no memory fails here
    expect(ModuleConformance::ANSWERS_EACH_OFFER,
           peer().dial(driver().getProviderName(), number, own, none, none).isOk(),
           "an offer to its own number is refused");
    await(
        ModuleConformance::ANSWERS_EACH_OFFER, [this] { return !watch().getModules().empty(); },
        "an offer was taken, but neither accepted nor rejected");
    await(
        ModuleConformance::TELLS_THE_WIRE, [this] { return count(Seen::OFFERED) != 0; },
        "the wire was not offered a call that was accepted");
}

void ConformanceSituation::offerFromWire()
{
    did(ConformanceLadder::WIRE, std::string("> calls ") + ModuleDriver::PEER_NUMBER);
    driver().placeCall(ModuleDriver::PEER_NUMBER);
    await(
        ModuleConformance::TELLS_THE_PEER, [this] { return peer().getCall() != nullptr; },
        "a call from the wire was not dialled to the provider 'peer'");
}

void ConformanceSituation::ring(Caller caller)
{
    if (caller == Caller::PEER)
    {
        did(ConformanceLadder::WIRE, "> rings");
        driver().ring();
        await(
            ModuleConformance::TELLS_THE_PEER, [this] { return peer().getPeerState() == "ALERTING"; },
            "the wire rings, and the peer was not told ALERTING");
    }
    else
    {
        std::ignore = peer().become(State::ALERTING); // no memory fails here, nor below
        await(
            ModuleConformance::TELLS_THE_WIRE, [this] { return count(Seen::RINGING) != 0; },
            "the peer is ALERTING, and the wire does not hear it ring");
    }
    settle();
}

void ConformanceSituation::answer(Caller caller)
{
    if (caller == Caller::PEER)
    {
        did(ConformanceLadder::WIRE, "> answers");
        driver().answer();
        await(
            ModuleConformance::TELLS_THE_PEER, [this] { return peer().getPeerState() == "CONNECTED"; },
            "the wire has answered, and the peer was not told CONNECTED");
    }
    else
    {
        std::ignore = peer().become(State::CONNECTED);
        await(
            ModuleConformance::TELLS_THE_WIRE, [this] { return count(Seen::ANSWERED) != 0; },
            "the peer is CONNECTED, and the wire was not told of an answer");
    }
    settle();
}

void ConformanceSituation::clearFromPeer(QCause cause, Rule const& whenNotTold)
{
    did(ConformanceLadder::PEER, "> hangs up");
    peer().hangUp(cause);
    expectWireCleared(whenNotTold);
    expectDropped(ModuleConformance::DROPS_ONCE);
}

void ConformanceSituation::clearFromWire(QCause cause, Rule const& whenNotTold)
{
    did(ConformanceLadder::WIRE, "> clears " + std::to_string(static_cast<int>(cause)));
    driver().clear(cause);
    await(
        whenNotTold, [this] { return isModulesLegOver(); },
        "the wire has cleared, and the module's leg is not RELEASED");
    expectDropped(ModuleConformance::DROPS_ONCE);
    expectWireNotCleared(ModuleConformance::CLEARS_THE_WIRE_ONCE);
}

// --- what is found ---------------------------------------------------------------------------------------------------

void ConformanceSituation::expect(Rule const& rule, bool isKept, std::string const& what) const
{
    if (!isKept)
        throw ConformanceFailure{&rule, what};
}

void ConformanceSituation::await(Rule const& rule, std::function<bool()> const& isDone, std::string const& what)
{
    expect(rule, driver().runUntil(isDone), what);
}

void ConformanceSituation::settle() { driver().settle(); }

unsigned int ConformanceSituation::count(Seen::What what) const
{
    auto const& seen = driver().getSeen();
    unsigned int number = 0;
    for (std::size_t i = m_seenBefore; i < seen.size(); ++i) // of the call that came first, should there be two
        number += seen[i].what == what && seen[i].call == seen[m_seenBefore].call;
    return number;
}

ConformanceSituation::Seen const* ConformanceSituation::find(Seen::What what) const
{
    for (std::size_t i = m_seenBefore; i < driver().getSeen().size(); ++i)
        if (driver().getSeen()[i].what == what)
            return &driver().getSeen()[i];
    return nullptr;
}

void ConformanceSituation::expectWireCleared(Rule const& whenNot)
{
    await(
        whenNot, [this] { return count(Seen::CLEARED) != 0; }, "the wire was not cleared");
    settle();
    Rule const& rule = ModuleConformance::CLEARS_THE_WIRE_ONCE;
    expect(rule, count(Seen::CLEARED) == 1, "the wire was cleared more than once");
    expect(rule, driver().getSeen().back().what == Seen::CLEARED, "the wire was told something after it was cleared");
}

void ConformanceSituation::expectWireNotCleared(Rule const& rule) const
{
    expect(rule, count(Seen::CLEARED) == 0, "the wire was cleared, and had no reason to be");
}

void ConformanceSituation::expectDropped(Rule const& whenNot)
{
    await(
        whenNot, [this] { return isModulesLegOver(); }, "the module's leg is still not RELEASED");
    hangUpOthers();
    await(
        ModuleConformance::DROPS_ONCE, [this] { return isEverythingGone(); },
        "its leg is RELEASED, but the reference is not given up");
}

void ConformanceSituation::hangUpOthers()
{
    for (auto const* const party : {&m_parts->peer, &m_parts->second, &m_parts->third})
        if (*party != nullptr)
            (*party)->hangUp();
}

bool ConformanceSituation::isModulesLegOver() const
{
    for (auto const* const leg : watch().getModules())
        if (leg->releases == 0)
            return false;
    return true;
}

bool ConformanceSituation::isEverythingGone() const
{
    return CallControl::GET_NUMBER_OF_CALLS() == 0 && CC_CallLeg::s_numberOfInstances == m_legsBefore;
}

std::string ConformanceSituation::whatIsLeft() const
{
    unsigned int const legs = CC_CallLeg::s_numberOfInstances - m_legsBefore;
    unsigned int const calls = CallControl::GET_NUMBER_OF_CALLS();
    return std::to_string(legs) + (legs == 1 ? " leg and " : " legs and ") + std::to_string(calls) +
           (calls == 1 ? " call are" : " calls are");
}

CC_CallLeg* ConformanceSituation::findLegOf(FakeModule const& party) const
{
    for (auto const& leg : watch().getLegs())
        if (!leg.isModules && !leg.hasLeft && leg.leg->getName().startsWith(party.getName() + "/"))
            return leg.leg;
    return nullptr;
}
