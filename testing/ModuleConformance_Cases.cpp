// The cases of the conformance suite: for each rule the situations in which modules have been seen to break it.
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CallControl.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "services/CC_ServiceClass.h"
#include "testing/ConformanceSituation.h"
#include "testing/FailingAllocator.h"
#include "testing/ModuleConformance.h"

#include <exception>
#include <tuple>
#include <utility>

using Suite = ModuleConformance;
using Situation = ConformanceSituation;
using Caller = Situation::Caller;
using Step = Situation::Step;
using Seen = ModuleDriver::Seen;
using State = CC_PropertyCallLegState;
using Column = ConformanceLadder::Column;

namespace
{
constexpr Caller CALLERS[] = {Caller::WIRE, Caller::PEER};
constexpr Step STEPS[] = {Step::OFFERED, Step::RINGING, Step::CONNECTED};
constexpr QCause WHY = QCause::USER_BUSY; // a cause that no module takes for want of another

char const* NAME(Caller caller) { return caller == Caller::WIRE ? "CallFromTheWire" : "CallToTheWire"; }

char const* NAME(Step step)
{
    return step == Step::OFFERED ? "BeforeItRings" : step == Step::RINGING ? "WhileItRings" : "AfterTheAnswer";
}

/// A service of a kind that no module knows.
class UnheardOf : public CC_ServiceClass<UnheardOf>
{
public:
    static unsigned int TYPE()
    {
        static unsigned int s_type = INVALID_TYPE();
        return KEEP_TYPE(s_type);
    }
    String getInfo() const override { return "Unheard Of"; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }
};

// --- AnswersEachOffer ------------------------------------------------------------------------------------------------

/// Of the legs that answer an offer there is one, or one more if that was a rejection.
void EXPECT_ONE_ANSWER(Situation& situation, std::size_t legsBefore)
{
    situation.await(
        Suite::ANSWERS_EACH_OFFER, [&] { return situation.watch().getModules().size() > legsBefore; },
        "an offer was taken, but neither accepted nor rejected");
    situation.settle();
    situation.expect(Suite::ANSWERS_EACH_OFFER, situation.watch().getModules().size() == legsBefore + 1,
                     "an offer was answered twice");
}

void AN_OFFER_IS_ANSWERED_ONCE(Situation& situation)
{
    situation.offer(Caller::PEER);
    EXPECT_ONE_ANSWER(situation, 0);
    situation.endAsUsual();
}

/// The number stands in the destination alone.
void AN_OFFER_WITHOUT_PROPERTIES(Situation& situation)
{
    situation.did(Column::PEER, "> dials without any property");
    auto const& none = CC_PropertyContainer::EMPTY();
    auto& adapter = *situation.peer().m_adapter;
    if (adapter
            .CC_CallAdapter::dial("", situation.driver().getProviderName(), situation.driver().getNumber(), none, none,
                                  none, nullptr)
            .isOk())
        EXPECT_ONE_ANSWER(situation, 0);
    situation.peer().hangUp();
    situation.expectDropped(Suite::DROPS_ONCE);
}

void AN_OFFER_WHILE_A_CALL_IS_UP(Situation& situation)
{
    situation.call(Caller::PEER, Step::CONNECTED);
    situation.did(Column::PEER, "> second dials, too");
    auto const& none = CC_PropertyContainer::EMPTY();
    if (situation.second()
            .dial(situation.driver().getProviderName(), situation.driver().getNumber(), none, none, none)
            .isOk())
        EXPECT_ONE_ANSWER(situation, 1);
}

/// It hangs up before the module has heard anything of it.
void AN_OFFER_WHOSE_CALLER_IS_GONE(Situation& situation)
{
    auto const& none = CC_PropertyContainer::EMPTY();
    situation.did(Column::PEER, "> dials and hangs up at once");
    bool const isTaken =
        situation.peer()
            .dial(situation.driver().getProviderName(), situation.driver().getNumber(), none, none, none)
            .isOk();
    situation.peer().hangUp();
    if (isTaken)
        EXPECT_ONE_ANSWER(situation, 0);
    situation.expectDropped(Suite::SURVIVES_A_LOST_PEER);
}

// --- TellsTheWire, TellsThePeer --------------------------------------------------------------------------------------

void THE_WIRE_IS_TOLD_THE_NUMBER(Situation& situation)
{
    situation.offer(Caller::PEER);
    Seen const* const offered = situation.find(Seen::OFFERED);
    situation.expect(Suite::TELLS_THE_WIRE, offered->text == situation.driver().getNumber().view(),
                     "the wire was offered the number '" + offered->text + "'");
    situation.expect(Suite::TELLS_THE_WIRE, situation.count(Seen::OFFERED) == 1, "the wire was offered it twice");
    situation.endAsUsual();
}

void THE_WIRE_HEARS_EACH_STEP_ONCE(Situation& situation)
{
    situation.call(Caller::WIRE, Step::CONNECTED);
    situation.expect(Suite::TELLS_THE_WIRE, situation.count(Seen::RINGING) == 1, "it rings more than once");
    situation.expect(Suite::TELLS_THE_WIRE, situation.count(Seen::ANSWERED) == 1, "it is answered more than once");
    situation.endAsUsual();
}

void THE_PEER_IS_DIALLED_THE_NUMBER(Situation& situation)
{
    situation.call(Caller::WIRE, Step::OFFERED);
    std::string const dialled(situation.numberDialled().view());
    situation.expect(Suite::TELLS_THE_PEER, dialled == ModuleDriver::PEER_NUMBER,
                     "the number dialled is '" + dialled + "'");
    situation.endAsUsual();
}

void THE_PEER_HEARS_EACH_STEP(Situation& situation)
{
    situation.call(Caller::PEER, Step::CONNECTED);
    situation.endAsUsual();
}

// --- how calls end: DropsOnce, WritesNothingAfterTheDrop, ClearsTheWireOnce ----------------------------------------

void CLEAR(Situation& situation, bool isFromPeer, QCause cause, Suite::Rule const& whenNotTold)
{
    isFromPeer ? situation.clearFromPeer(cause, whenNotTold) : situation.clearFromWire(cause, whenNotTold);
}

void EACH_LEG_IS_DROPPED_ONCE(Situation& situation, Caller caller, Step step, bool isFromPeer)
{
    situation.call(caller, step);
    CLEAR(situation, isFromPeer, QCause::NORMAL_CALL_CLEARING,
          isFromPeer ? Suite::CLEARS_THE_WIRE_ONCE : Suite::DROPS_ONCE);
    for (auto const* const leg : situation.watch().getModules())
        situation.expect(Suite::DROPS_ONCE, leg->releases == 1, "a leg was RELEASED more than once");
}

void NOTHING_IS_WRITTEN_AFTERWARDS(Situation& situation, Caller caller, Step step, bool isFromPeer)
{
    situation.call(caller, step);
    CLEAR(situation, isFromPeer, QCause::NORMAL_CALL_CLEARING,
          isFromPeer ? Suite::CLEARS_THE_WIRE_ONCE : Suite::DROPS_ONCE);
    for (auto const* const leg : situation.watch().getModules())
        situation.expect(Suite::WRITES_NOTHING_AFTER_THE_DROP, leg->writtenAfterRelease.empty(),
                         "after RELEASED it wrote " + leg->writtenAfterRelease);
}

void THE_WIRE_IS_CLEARED_ONCE(Situation& situation, Caller caller, Step step, bool isFromPeer)
{
    situation.call(caller, step);
    CLEAR(situation, isFromPeer, QCause::NORMAL_CALL_CLEARING,
          isFromPeer ? Suite::CLEARS_THE_WIRE_ONCE : Suite::DROPS_ONCE);
}

/// Neither has heard of the other's clearing when it clears itself.
void BOTH_CLEAR_AT_ONCE(Situation& situation, Caller caller, Step step)
{
    situation.call(caller, step);
    situation.did(Column::PEER, "> hangs up, and so does the wire");
    situation.peer().hangUp();
    situation.driver().clear(QCause::NORMAL_CALL_CLEARING);
    situation.expectDropped(Suite::DROPS_ONCE);
    situation.settle();
    situation.expect(Suite::CLEARS_THE_WIRE_ONCE, situation.count(Seen::CLEARED) <= 1,
                     "the wire was cleared more than once");
    situation.beginCall();
    situation.call(caller, Step::CONNECTED);
    situation.endAsUsual();
}

/// Nobody is there, or the module that is does not take the call: the dial itself fails.
void THE_DIAL_FAILS(Situation& situation, bool hasProvider)
{
    situation.did(Column::PEER, hasProvider ? "> refuses every dial" : "> is not registered");
    situation.peer().m_provider.m_dial = [](CC_Call&, String const&, String const&, CC_PropertyContainer const&)
    { return XCode(XCode::FAILURE); };
    if (!hasProvider)
        CallControl::REMOVE_PROVIDER("", ModuleDriver::PEER);
    situation.did(Column::WIRE, std::string("> calls ") + ModuleDriver::PEER_NUMBER);
    situation.driver().placeCall(ModuleDriver::PEER_NUMBER);
    situation.expectWireCleared(Suite::CLEARS_THE_WIRE_ONCE);
    situation.expectDropped(Suite::DROPS_ONCE);
}

// --- CarriesCauses ---------------------------------------------------------------------------------------------------

std::string TEXT_OF(QCause cause) { return std::to_string(static_cast<int>(cause)); }

void CAUSES_REACH_THE_WIRE(Situation& situation, Caller caller, Step step)
{
    for (QCause const cause : situation.driver().getCausesToWire())
    {
        situation.beginCall();
        situation.call(caller, step);
        situation.clearFromPeer(cause, Suite::CLEARS_THE_WIRE_ONCE);
        QCause const arrived = situation.find(Seen::CLEARED)->cause;
        situation.expect(Suite::CARRIES_CAUSES, arrived == cause,
                         "the peer's cause " + TEXT_OF(cause) + " reaches the wire as " + TEXT_OF(arrived));
    }
}

void CAUSES_REACH_THE_PEER(Situation& situation, Caller caller, Step step)
{
    for (QCause const cause : situation.driver().getCausesFromWire())
    {
        situation.beginCall();
        situation.call(caller, step);
        situation.clearFromWire(cause, Suite::DROPS_ONCE);
        QCause const arrived = situation.watch().getModules().front()->cause;
        situation.expect(Suite::CARRIES_CAUSES, arrived == cause,
                         "the wire's cause " + TEXT_OF(cause) + " reaches the peer as " + TEXT_OF(arrived));
    }
}

void A_REJECTION_REACHES_THE_WIRE(Situation& situation)
{
    situation.need(Caller::WIRE);
    for (QCause const cause : situation.driver().getCausesToWire())
    {
        situation.beginCall();
        situation.peer().rejectOffers(cause);
        situation.did(Column::PEER, "> rejects what comes with " + TEXT_OF(cause));
        situation.driver().placeCall(ModuleDriver::PEER_NUMBER);
        situation.expectWireCleared(Suite::CLEARS_THE_WIRE_ONCE);
        QCause const arrived = situation.find(Seen::CLEARED)->cause;
        situation.expect(Suite::CARRIES_CAUSES, arrived == cause,
                         "the rejection with " + TEXT_OF(cause) + " reaches the wire as " + TEXT_OF(arrived));
        situation.expectDropped(Suite::DROPS_ONCE);
    }
}

// --- FollowsAnyOrder -------------------------------------------------------------------------------------------------

void BECOME(Situation& situation, State::State state)
{
    std::ignore = situation.peer().become(state); // no memory fails here
}

void EXPECT_ANSWERED_ONCE(Situation& situation)
{
    situation.await(
        Suite::FOLLOWS_ANY_ORDER, [&] { return situation.count(Seen::ANSWERED) != 0; },
        "the peer is CONNECTED, and the wire was not told of an answer");
    situation.settle();
    situation.expect(Suite::FOLLOWS_ANY_ORDER, situation.count(Seen::ANSWERED) == 1,
                     "the wire was told of an answer more than once");
    situation.expectWireNotCleared(Suite::FOLLOWS_ANY_ORDER);
}

void ANSWERED_WITHOUT_RINGING(Situation& situation)
{
    situation.call(Caller::WIRE, Step::OFFERED);
    BECOME(situation, State::CONNECTED);
    EXPECT_ANSWERED_ONCE(situation);
    situation.endAsUsual();
}

void THE_WIRE_ANSWERS_WITHOUT_RINGING(Situation& situation)
{
    situation.call(Caller::PEER, Step::OFFERED);
    situation.did(Column::WIRE, "> answers");
    situation.driver().answer();
    situation.await(
        Suite::FOLLOWS_ANY_ORDER, [&] { return situation.peer().getPeerState() == "CONNECTED"; },
        "the wire has answered without ringing, and the peer was not told CONNECTED");
    situation.settle();
    situation.endAsUsual();
}

void STATES_COME_AGAIN_AND_GO_BACK(Situation& situation)
{
    situation.call(Caller::WIRE, Step::OFFERED);
    for (State::State const state :
         {State::PROCEEDING, State::ALERTING, State::PROCEEDING, State::ALERTING, State::CONNECTED, State::HELD,
          State::CONNECTED, State::ALERTING, State::CONNECTED})
    {
        BECOME(situation, state);
        situation.settle();
    }
    EXPECT_ANSWERED_ONCE(situation);
    situation.endAsUsual();
}

void THE_WHOLE_CALL_IN_ONE_TURN(Situation& situation)
{
    situation.call(Caller::WIRE, Step::OFFERED);
    BECOME(situation, State::ALERTING);
    BECOME(situation, State::CONNECTED);
    situation.clearFromPeer(WHY, Suite::FOLLOWS_ANY_ORDER);
}

void RINGING_AND_ANSWER_IN_ONE_TURN(Situation& situation)
{
    situation.call(Caller::WIRE, Step::OFFERED);
    BECOME(situation, State::ALERTING);
    BECOME(situation, State::CONNECTED);
    EXPECT_ANSWERED_ONCE(situation);
    situation.endAsUsual();
}

void PROPERTIES_COME_BEFORE_STATES(Situation& situation)
{
    situation.call(Caller::WIRE, Step::OFFERED);
    for (unsigned int const id : {CC_PropertyId::NAME, CC_PropertyId::E164_NUMBER, CC_PropertyId::DISPLAY})
    {
        std::ignore = situation.peer().say(id, "4711"); // no memory fails here, nor below
        situation.settle();
    }
    std::ignore = situation.peer().say(CC_PropertyBoolean(CC_PropertyId::PROVIDES_DATA, true));
    situation.settle();
    BECOME(situation, State::CONNECTED);
    EXPECT_ANSWERED_ONCE(situation);
    situation.endAsUsual();
}

/// A call from the wire is offered to the peer, and neither accepted nor rejected yet.
void CALL_WHO_HOLDS_IT(Situation& situation)
{
    situation.peer().holdOffers();
    situation.did(Column::WIRE, std::string("> calls ") + ModuleDriver::PEER_NUMBER);
    situation.driver().placeCall(ModuleDriver::PEER_NUMBER);
    situation.await(
        Suite::TELLS_THE_PEER, [&] { return situation.peer().isHolding(); }, "the call did not reach the peer");
    situation.settle();
}

void THE_OFFER_IS_ANSWERED_LATE(Situation& situation)
{
    CALL_WHO_HOLDS_IT(situation);
    situation.expectWireNotCleared(Suite::FOLLOWS_ANY_ORDER);
    situation.did(Column::PEER, "> accepts what it held");
    std::ignore = situation.peer().acceptHeld(); // no memory fails here
    BECOME(situation, State::CONNECTED);
    EXPECT_ANSWERED_ONCE(situation);
    situation.endAsUsual();
}

void THE_WIRE_CLEARS_BEFORE_ANYBODY_ACCEPTS(Situation& situation)
{
    CALL_WHO_HOLDS_IT(situation);
    situation.clearFromWire(QCause::NORMAL_CALL_CLEARING, Suite::FOLLOWS_ANY_ORDER);
}

void A_SERVICE_THAT_NOBODY_KNOWS(Situation& situation, Caller caller, Step step)
{
    situation.call(caller, step);
    UnheardOf service;
    situation.peer().m_adapter->invokeSynchronousService(service);
    situation.settle();
    situation.expectWireNotCleared(Suite::FOLLOWS_ANY_ORDER);
    situation.expect(Suite::FOLLOWS_ANY_ORDER, !situation.isModulesLegOver(), "the module's leg was dropped");
    situation.endAsUsual();
}

/// The peer consults a third party and joins the two: the module has another peer in the same turn.
void REPLACE_PEER(Situation& situation)
{
    situation.did(Column::PEER, "> is replaced by third, whom second had called");
    std::ignore = situation.second().dial(situation.third()); // no memory fails here
    std::ignore = situation.third().become(State::CONNECTED);
    situation.settle();
    std::ignore = situation.peer().m_adapter->transfer(*situation.second().m_adapter, true);
    situation.peer().hangUp();
    situation.second().hangUp();
    situation.settle();
}

void EXPECT_THE_NEW_PEER(Situation& situation)
{
    situation.expectWireNotCleared(Suite::FOLLOWS_ANY_ORDER);
    situation.expect(Suite::FOLLOWS_ANY_ORDER, !situation.isModulesLegOver(), "the module's leg was dropped");
    situation.did(Column::PEER, "> third hangs up");
    situation.third().hangUp(WHY);
    situation.expectWireCleared(Suite::FOLLOWS_ANY_ORDER);
    situation.expectDropped(Suite::FOLLOWS_ANY_ORDER);
}

void THE_PEER_IS_REPLACED(Situation& situation, Caller caller)
{
    situation.call(caller, Step::CONNECTED);
    REPLACE_PEER(situation);
    EXPECT_THE_NEW_PEER(situation);
}

/// The peer joins a third party to the call and leaves it: two turns later there is another peer.
void A_THIRD_PARTY_STAYS(Situation& situation, Caller caller)
{
    situation.call(caller, Step::CONNECTED);
    situation.did(Column::PEER, "> confers with third, whom second had called");
    std::ignore = situation.second().dial(situation.third()); // no memory fails here
    std::ignore = situation.third().become(State::CONNECTED);
    situation.settle();
    std::ignore = situation.peer().m_adapter->transfer(*situation.second().m_adapter, false);
    situation.second().hangUp();
    situation.settle();
    situation.did(Column::PEER, "> hangs up");
    situation.peer().hangUp();
    situation.settle();
    EXPECT_THE_NEW_PEER(situation);
}

void THE_PEER_IS_REPLACED_BY_ONE_THAT_HAS_ANSWERED(Situation& situation)
{
    situation.call(Caller::WIRE, Step::RINGING);
    REPLACE_PEER(situation);
    EXPECT_ANSWERED_ONCE(situation);
    EXPECT_THE_NEW_PEER(situation);
}

// --- SurvivesALostPeer -----------------------------------------------------------------------------------------------

enum class Loss
{
    LEG_TAKEN_OUT,
    MODULE_DESTROYED,
    OPERATOR_DROPS,
    CALL_RELEASED
};

char const* NAME(Loss loss)
{
    switch (loss)
    {
    case Loss::LEG_TAKEN_OUT:
        return "ThePeersLegIsTakenOut";
    case Loss::MODULE_DESTROYED:
        return "ThePeersModuleEnds";
    case Loss::OPERATOR_DROPS:
        return "TheOperatorDropsAllCalls";
    case Loss::CALL_RELEASED:
        return "TheCallIsReleased";
    }
    return "(unknown)";
}

void LOSE(Situation& situation, Loss loss)
{
    CC_CallLeg* const leg = situation.findLegOf(situation.peer());
    CC_Call* const call = situation.peer().getCall();
    situation.did(Column::PEER, std::string("> ") + NAME(loss));
    switch (loss)
    {
    case Loss::LEG_TAKEN_OUT:
        call->removeCallLeg(*leg);
        break;
    case Loss::MODULE_DESTROYED:
        situation.peer().m_adapter.reset();
        break;
    case Loss::OPERATOR_DROPS:
        situation.callControl().getPool()->dropCalls("", "");
        break;
    case Loss::CALL_RELEASED:
        CallControl::RELEASE_CALL("", call);
        break;
    }
}

void A_LOST_PEER_ENDS_THE_CALL(Situation& situation, Loss loss, Caller caller, Step step)
{
    situation.call(caller, step);
    LOSE(situation, loss);
    situation.expectWireCleared(Suite::SURVIVES_A_LOST_PEER);
    situation.expectDropped(Suite::SURVIVES_A_LOST_PEER);
}

/// The module cannot know: nobody has come yet whom it could miss. But it has to end it when the wire clears.
void THE_CALL_IS_RELEASED_BEFORE_ANYBODY_ACCEPTS(Situation& situation)
{
    CALL_WHO_HOLDS_IT(situation);
    situation.did(Column::PEER, std::string("> ") + NAME(Loss::CALL_RELEASED));
    CallControl::RELEASE_CALL("", CallControl::GET_CALL("", 0));
    situation.settle();
    situation.did(Column::WIRE, "> clears");
    situation.driver().clear(QCause::NORMAL_CALL_CLEARING);
    situation.expectDropped(Suite::SURVIVES_A_LOST_PEER);
}

// --- SurvivesASilentWire ---------------------------------------------------------------------------------------------

void THE_PEER_HANGS_UP_ON_A_SILENT_WIRE(Situation& situation, Caller caller, Step step)
{
    situation.call(caller, step);
    situation.did(Column::WIRE, "> falls silent");
    situation.driver().goSilent();
    situation.did(Column::PEER, "> hangs up");
    situation.peer().hangUp();
    situation.expectDropped(Suite::SURVIVES_A_SILENT_WIRE);
}

void A_SILENT_WIRE_IS_GIVEN_UP(Situation& situation, Step step)
{
    situation.need(ModuleDriver::GIVING_UP);
    situation.call(Caller::PEER, step);
    situation.did(Column::WIRE, "> falls silent");
    situation.driver().goSilent();
    situation.driver().letTimePass();
    situation.await(
        Suite::SURVIVES_A_SILENT_WIRE, [&] { return situation.isModulesLegOver(); },
        "a call that the wire does not answer was not given up");
    QCause const cause = situation.watch().getModules().front()->cause;
    situation.expect(Suite::SURVIVES_A_SILENT_WIRE, cause != QCause::NONE,
                     "a call that the wire does not answer was given up without a cause");
    situation.expectDropped(Suite::SURVIVES_A_SILENT_WIRE);
}

void A_WIRE_THAT_WAS_NEVER_THERE_IS_GIVEN_UP(Situation& situation)
{
    situation.need(Caller::PEER);
    situation.need(ModuleDriver::GIVING_UP);
    situation.did(Column::WIRE, "> is silent from the beginning");
    situation.driver().goSilent();
    auto const& none = CC_PropertyContainer::EMPTY();
    if (situation.peer()
            .dial(situation.driver().getProviderName(), situation.driver().getNumber(), none, none, none)
            .isOk())
    {
        EXPECT_ONE_ANSWER(situation, 0);
        situation.driver().letTimePass();
    }
    situation.await(
        Suite::SURVIVES_A_SILENT_WIRE, [&] { return situation.isModulesLegOver(); },
        "a call that the wire does not answer was not given up");
    situation.expectDropped(Suite::SURVIVES_A_SILENT_WIRE);
}

// --- KeepsCallsApart -------------------------------------------------------------------------------------------------

void A_SECOND_CALL_COMES_AND_GOES(Situation& situation, Caller caller)
{
    situation.need(Caller::PEER);
    situation.call(caller, Step::CONNECTED);
    auto const& none = CC_PropertyContainer::EMPTY();
    situation.did(Column::PEER, "> second dials, too");
    std::ignore =
        situation.second().dial(situation.driver().getProviderName(), situation.driver().getNumber(), none, none, none);
    situation.settle();
    situation.did(Column::PEER, "> second hangs up");
    situation.second().hangUp();
    situation.settle();
    Suite::Rule const& rule = Suite::KEEPS_CALLS_APART;
    situation.expectWireNotCleared(rule);
    situation.expect(rule, situation.watch().getModules().front()->releases == 0, "the first call's leg was dropped");
    situation.expect(rule, situation.peer().getPeerState() == "CONNECTED", "the first call's leg is not CONNECTED");
}

// --- PassesDigits, CompletesNumbers ----------------------------------------------------------------------------------

void DIGITS_REACH_THE_PEER(Situation& situation, Caller caller)
{
    situation.need(ModuleDriver::DIGITS_FROM_WIRE);
    situation.call(caller, Step::CONNECTED);
    for (char const digit : {'1', '9', '#'})
    {
        situation.did(Column::WIRE, std::string("> sends ") + digit);
        situation.driver().sendDigit(digit);
        situation.settle();
    }
    situation.await(
        Suite::PASSES_DIGITS, [&] { return situation.digitsHeard() == "19#"; },
        "of 19# the peer hears '" + situation.digitsHeard() + "'");
    situation.endAsUsual();
}

void DIGITS_REACH_THE_WIRE(Situation& situation, Caller caller)
{
    situation.need(ModuleDriver::DIGITS_TO_WIRE);
    situation.call(caller, Step::CONNECTED);
    for (char const* const digit : {"1", "9", "#"})
        situation.peer().key(digit);
    situation.settle();
    std::string heard;
    for (Seen const& seen : situation.driver().getSeen())
        if (seen.what == Seen::DIGITS)
            heard += seen.text;
    situation.expect(Suite::PASSES_DIGITS, heard == "19#", "of 19# the wire hears '" + heard + "'");
    situation.endAsUsual();
}

void LATE_DIGITS_COMPLETE_THE_NUMBER(Situation& situation, bool isOneByOne)
{
    situation.need(ModuleDriver::LATE_DIGITS);
    std::string const number(situation.driver().getNumber().view());
    auto const& none = CC_PropertyContainer::EMPTY();
    situation.did(Column::PEER, "> dials " + number.substr(0, 2));
    situation.expect(Suite::ANSWERS_EACH_OFFER,
                     situation.peer()
                         .dial(situation.driver().getProviderName(), number.substr(0, 2).c_str(), none, none, none)
                         .isOk(),
                     "an offer with the first digits of its number is refused");
    situation.settle();
    Suite::Rule const& rule = Suite::COMPLETES_NUMBERS;
    situation.expect(rule, situation.count(Seen::OFFERED) == 0, "the wire was offered half a number");
    std::size_t const step = isOneByOne ? 1 : number.size();
    for (std::size_t i = 2; i < number.size(); i += step)
    {
        situation.peer().key(number.substr(i, step).c_str());
        situation.settle();
    }
    situation.await(
        rule, [&] { return situation.count(Seen::OFFERED) != 0; },
        "the number is complete, and the wire is not offered it");
    situation.expect(rule, situation.find(Seen::OFFERED)->text == number,
                     "the wire was offered the number '" + situation.find(Seen::OFFERED)->text + "'");
    situation.endAsUsual();
}

// --- SurvivesNoMemory ------------------------------------------------------------------------------------------------

/// A call as far as it comes; nobody looks whether it does.
void TRY_CALL(Situation& situation, Caller caller, String const& provider, String const& number)
{
    auto const& none = CC_PropertyContainer::EMPTY();
    if (caller == Caller::PEER)
        std::ignore = situation.peer().dial(provider, number, none, none, none);
    else
        situation.driver().placeCall(number);
    situation.settle();
    caller == Caller::PEER ? situation.driver().ring() : void(situation.peer().become(State::ALERTING));
    situation.settle();
    caller == Caller::PEER ? situation.driver().answer() : void(situation.peer().become(State::CONNECTED));
    situation.settle();
}

/// Whether the chosen allocation was made. Both hang up whatever has become of the call, then a next one has to
/// succeed.
bool IS_SURVIVED(Situation& situation, Caller caller, unsigned long n)
{
    situation.restart();
    String const provider = situation.driver().getProviderName();
    String const number = caller == Caller::PEER ? situation.driver().getNumber() : String(ModuleDriver::PEER_NUMBER);
    FailingAllocator::failNth(n);
    TRY_CALL(situation, caller, provider, number);
    FailingAllocator::stop();
    if (!FailingAllocator::hasFailed())
        return false;
    Suite::Rule const& rule = Suite::SURVIVES_NO_MEMORY;
    std::string const when = "allocation " + std::to_string(n) + " had failed: ";
    situation.did(Column::PEER, "> hangs up, and so does the wire");
    situation.hangUpOthers();
    situation.driver().clear(QCause::NORMAL_CALL_CLEARING);
    situation.await(
        rule, [&] { return situation.isEverythingGone(); }, when + "both sides have hung up, and something is left");
    situation.peer().renew();
    try
    {
        situation.beginCall();
        situation.call(caller, Step::CONNECTED);
        situation.endAsUsual();
    }
    catch (ConformanceFailure const& failure)
    {
        situation.expect(rule, false, when + "in the next call " + failure.what);
    }
    return true;
}

void ANY_ALLOCATION_MAY_FAIL(Situation& situation, Caller caller)
{
    situation.need(ModuleDriver::FAILING_ALLOCATIONS);
    situation.call(caller, Step::CONNECTED); // what this breaks has nothing to do with memory
    situation.endAsUsual();
    for (unsigned long n = 1; IS_SURVIVED(situation, caller, n); ++n)
    {
    }
    situation.endAsUsual(); // the last round has a whole call
}

// --- LeavesNothing ---------------------------------------------------------------------------------------------------

void END_MODULE(Situation& situation)
{
    situation.did(Column::MODULE, "> the module ends");
    situation.destroyModule();
    situation.callControl().settle();
}

void THE_MODULE_ENDS_BEFORE_ANYBODY_ACCEPTS(Situation& situation)
{
    CALL_WHO_HOLDS_IT(situation);
    END_MODULE(situation);
    situation.expect(Suite::LEAVES_NOTHING, situation.isEverythingGone(),
                     "the module has ended, and " + situation.whatIsLeft() + " left");
}

void THE_MODULE_ENDS(Situation& situation, Caller caller, Step step)
{
    situation.call(caller, step);
    END_MODULE(situation);
    std::string const state = situation.peer().getPeerState();
    situation.expect(Suite::LEAVES_NOTHING, state == "RELEASED" || state == "none",
                     "the module has ended, and the peer sees its leg " + state);
    situation.hangUpOthers();
    situation.callControl().settle();
    situation.expect(Suite::LEAVES_NOTHING, situation.isEverythingGone(),
                     "the module has ended, and " + situation.whatIsLeft() + " left");
}

// --- the list --------------------------------------------------------------------------------------------------------

using Cases = std::vector<Suite::Case>;

std::string NAME(Suite::Rule const& rule, std::string const& situation) { return rule.name + ("_" + situation); }

std::string NAME(Suite::Rule const& rule, std::string const& what, Step step, Caller caller)
{
    return NAME(rule, what + NAME(step) + "_" + NAME(caller));
}

std::string NAME(Suite::Rule const& rule, std::string const& what, Caller caller)
{
    return NAME(rule, what + "_" + NAME(caller));
}

template <class Play>
void ADD_TO_WIRE(Cases& cases, Suite::Rule const& rule, char const* name, Play play)
{
    cases.push_back({&rule, NAME(rule, name),
                     [play](Situation& situation)
                     {
                         situation.need(Caller::PEER);
                         play(situation);
                     }});
}

template <class Play>
void ADD_FROM_WIRE(Cases& cases, Suite::Rule const& rule, char const* name, Play play)
{
    cases.push_back({&rule, NAME(rule, name),
                     [play](Situation& situation)
                     {
                         situation.need(Caller::WIRE);
                         play(situation);
                     }});
}

/// For calls in both directions.
template <class Play>
void ADD_BOTH(Cases& cases, Suite::Rule const& rule, char const* name, Play play)
{
    for (Caller const caller : CALLERS)
        cases.push_back({&rule, NAME(rule, name, caller), [=](Situation& situation) { play(situation, caller); }});
}

/// In both directions, at each step.
template <class Play>
void ADD_ALL(Cases& cases, Suite::Rule const& rule, char const* name, Play play)
{
    for (Caller const caller : CALLERS)
        for (Step const step : STEPS)
            cases.push_back(
                {&rule, NAME(rule, name, step, caller), [=](Situation& situation) { play(situation, caller, step); }});
}

template <class Play>
void ADD_ENDS(Cases& cases, Suite::Rule const& rule, Play play)
{
    for (bool const isFromPeer : {true, false})
        ADD_ALL(cases, rule, isFromPeer ? "ThePeerClears" : "TheWireClears",
                [=](Situation& situation, Caller caller, Step step) { play(situation, caller, step, isFromPeer); });
}

void ADD_OFFERS(Cases& cases)
{
    ADD_TO_WIRE(cases, Suite::ANSWERS_EACH_OFFER, "OneAnswer", AN_OFFER_IS_ANSWERED_ONCE);
    ADD_TO_WIRE(cases, Suite::ANSWERS_EACH_OFFER, "AnOfferWithoutProperties", AN_OFFER_WITHOUT_PROPERTIES);
    ADD_TO_WIRE(cases, Suite::ANSWERS_EACH_OFFER, "AnOfferWhileACallIsUp", AN_OFFER_WHILE_A_CALL_IS_UP);
    ADD_TO_WIRE(cases, Suite::ANSWERS_EACH_OFFER, "AnOfferWhoseCallerIsGone", AN_OFFER_WHOSE_CALLER_IS_GONE);
    ADD_TO_WIRE(cases, Suite::TELLS_THE_WIRE, "TheNumber", THE_WIRE_IS_TOLD_THE_NUMBER);
    ADD_FROM_WIRE(cases, Suite::TELLS_THE_WIRE, "EachStepOnce", THE_WIRE_HEARS_EACH_STEP_ONCE);
    ADD_FROM_WIRE(cases, Suite::TELLS_THE_PEER, "TheNumber", THE_PEER_IS_DIALLED_THE_NUMBER);
    ADD_TO_WIRE(cases, Suite::TELLS_THE_PEER, "EachStep", THE_PEER_HEARS_EACH_STEP);
}

void ADD_ENDS(Cases& cases)
{
    ADD_ENDS(cases, Suite::DROPS_ONCE, EACH_LEG_IS_DROPPED_ONCE);
    ADD_ENDS(cases, Suite::WRITES_NOTHING_AFTER_THE_DROP, NOTHING_IS_WRITTEN_AFTERWARDS);
    ADD_ENDS(cases, Suite::CLEARS_THE_WIRE_ONCE, THE_WIRE_IS_CLEARED_ONCE);
    ADD_ALL(cases, Suite::DROPS_ONCE, "BothClearAtOnce", BOTH_CLEAR_AT_ONCE);
    for (bool const hasProvider : {true, false})
        ADD_FROM_WIRE(cases, Suite::CLEARS_THE_WIRE_ONCE, hasProvider ? "TheDialIsRefused" : "NobodyIsThere",
                      [hasProvider](Situation& situation) { THE_DIAL_FAILS(situation, hasProvider); });
    ADD_ALL(cases, Suite::CARRIES_CAUSES, "FromThePeer", CAUSES_REACH_THE_WIRE);
    ADD_ALL(cases, Suite::CARRIES_CAUSES, "FromTheWire", CAUSES_REACH_THE_PEER);
    ADD_FROM_WIRE(cases, Suite::CARRIES_CAUSES, "Rejected", A_REJECTION_REACHES_THE_WIRE);
}

void ADD_ORDERS(Cases& cases)
{
    Suite::Rule const& rule = Suite::FOLLOWS_ANY_ORDER;
    ADD_FROM_WIRE(cases, rule, "AnsweredWithoutRinging", ANSWERED_WITHOUT_RINGING);
    ADD_TO_WIRE(cases, rule, "TheWireAnswersWithoutRinging", THE_WIRE_ANSWERS_WITHOUT_RINGING);
    ADD_FROM_WIRE(cases, rule, "StatesComeAgainAndGoBack", STATES_COME_AGAIN_AND_GO_BACK);
    ADD_FROM_WIRE(cases, rule, "RingingAndAnswerInOneTurn", RINGING_AND_ANSWER_IN_ONE_TURN);
    ADD_FROM_WIRE(cases, rule, "TheWholeCallInOneTurn", THE_WHOLE_CALL_IN_ONE_TURN);
    ADD_FROM_WIRE(cases, rule, "PropertiesComeBeforeStates", PROPERTIES_COME_BEFORE_STATES);
    ADD_FROM_WIRE(cases, rule, "TheOfferIsAnsweredLate", THE_OFFER_IS_ANSWERED_LATE);
    ADD_FROM_WIRE(cases, rule, "TheWireClearsBeforeAnybodyAccepts", THE_WIRE_CLEARS_BEFORE_ANYBODY_ACCEPTS);
    ADD_ALL(cases, rule, "AServiceThatNobodyKnows", A_SERVICE_THAT_NOBODY_KNOWS);
    ADD_BOTH(cases, rule, "ThePeerIsReplaced", THE_PEER_IS_REPLACED);
    ADD_BOTH(cases, rule, "AThirdPartyStays", A_THIRD_PARTY_STAYS);
    ADD_FROM_WIRE(cases, rule, "ThePeerIsReplacedByOneThatHasAnswered", THE_PEER_IS_REPLACED_BY_ONE_THAT_HAS_ANSWERED);
}

void ADD_LOSSES(Cases& cases)
{
    for (Loss const loss : {Loss::LEG_TAKEN_OUT, Loss::MODULE_DESTROYED, Loss::OPERATOR_DROPS, Loss::CALL_RELEASED})
        ADD_ALL(cases, Suite::SURVIVES_A_LOST_PEER, NAME(loss),
                [loss](Situation& situation, Caller caller, Step step)
                { A_LOST_PEER_ENDS_THE_CALL(situation, loss, caller, step); });
    ADD_FROM_WIRE(cases, Suite::SURVIVES_A_LOST_PEER, "TheCallIsReleasedBeforeAnybodyAccepts",
                  THE_CALL_IS_RELEASED_BEFORE_ANYBODY_ACCEPTS);
    ADD_ALL(cases, Suite::SURVIVES_A_SILENT_WIRE, "ThePeerHangsUp", THE_PEER_HANGS_UP_ON_A_SILENT_WIRE);
    for (Step const step : {Step::OFFERED, Step::RINGING})
        ADD_TO_WIRE(cases, Suite::SURVIVES_A_SILENT_WIRE,
                    step == Step::OFFERED ? "GivenUpBeforeItRings" : "GivenUpWhileItRings",
                    [step](Situation& situation) { A_SILENT_WIRE_IS_GIVEN_UP(situation, step); });
    ADD_TO_WIRE(cases, Suite::SURVIVES_A_SILENT_WIRE, "NeverThere", A_WIRE_THAT_WAS_NEVER_THERE_IS_GIVEN_UP);
}

void ADD_THE_REST(Cases& cases)
{
    ADD_BOTH(cases, Suite::KEEPS_CALLS_APART, "ASecondCallComesAndGoes", A_SECOND_CALL_COMES_AND_GOES);
    ADD_BOTH(cases, Suite::PASSES_DIGITS, "ToThePeer", DIGITS_REACH_THE_PEER);
    ADD_BOTH(cases, Suite::PASSES_DIGITS, "ToTheWire", DIGITS_REACH_THE_WIRE);
    ADD_TO_WIRE(cases, Suite::COMPLETES_NUMBERS, "AllAtOnce",
                [](Situation& situation) { LATE_DIGITS_COMPLETE_THE_NUMBER(situation, false); });
    ADD_TO_WIRE(cases, Suite::COMPLETES_NUMBERS, "OneByOne",
                [](Situation& situation) { LATE_DIGITS_COMPLETE_THE_NUMBER(situation, true); });
    ADD_BOTH(cases, Suite::SURVIVES_NO_MEMORY, "EachAllocation", ANY_ALLOCATION_MAY_FAIL);
    ADD_FROM_WIRE(cases, Suite::LEAVES_NOTHING, "TheModuleEndsBeforeAnybodyAccepts",
                  THE_MODULE_ENDS_BEFORE_ANYBODY_ACCEPTS);
    ADD_ALL(cases, Suite::LEAVES_NOTHING, "TheModuleEnds", THE_MODULE_ENDS);
}

Cases MAKE_CASES()
{
    Cases cases;
    ADD_OFFERS(cases);
    ADD_ENDS(cases);
    ADD_ORDERS(cases);
    ADD_LOSSES(cases);
    ADD_THE_REST(cases);
    return cases;
}
} // namespace

std::vector<ModuleConformance::Case> const& ModuleConformance::CASES()
{
    static Cases const s_cases = MAKE_CASES();
    return s_cases;
}
