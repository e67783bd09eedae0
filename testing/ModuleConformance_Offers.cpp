// Cases of how offers are answered and how a call comes up.
#include "testing/ConformanceCases.h"

using namespace ConformanceCases;

namespace
{
// --- AnswersEachOffer ------------------------------------------------------------------------------------------------

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
            .dial("", situation.driver().getProviderName(), situation.driver().getNumber(), none, none, none, nullptr)
            .isOk())
        EXPECT_ONE_ANSWER(situation, 0);
    situation.peer().hangUp();
    situation.expectDropped(Suite::DROPS_ONCE);
}

void AN_OFFER_WHILE_A_CALL_IS_UP(Situation& situation)
{
    situation.call(Caller::PEER, Step::CONNECTED);
    situation.did(Column::PEER, "> second dials, too");
    if (DIAL_MODULE(situation, situation.second()).isOk())
        EXPECT_ONE_ANSWER(situation, 1);
}

/// It hangs up before the module has heard anything of it.
void AN_OFFER_WHOSE_CALLER_IS_GONE(Situation& situation)
{
    situation.did(Column::PEER, "> dials and hangs up at once");
    bool const isTaken = DIAL_MODULE(situation, situation.peer()).isOk();
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
} // namespace

void ConformanceCases::ADD_OFFERS(Cases& cases)
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
