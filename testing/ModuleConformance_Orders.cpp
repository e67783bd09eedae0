// Cases of what the peer may do in which order.
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "services/CC_ServiceClass.h"
#include "testing/ConformanceCases.h"

#include <tuple>

using namespace ConformanceCases;

namespace
{
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
} // namespace

void ConformanceCases::ADD_ORDERS(Cases& cases)
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
