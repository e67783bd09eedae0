// Cases of wires that say nothing any more.
#include "testing/ConformanceCases.h"

using namespace ConformanceCases;

namespace
{
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
    if (DIAL_MODULE(situation, situation.peer()).isOk())
    {
        EXPECT_ONE_ANSWER(situation, 0);
        situation.driver().letTimePass();
    }
    situation.await(
        Suite::SURVIVES_A_SILENT_WIRE, [&] { return situation.isModulesLegOver(); },
        "a call that the wire does not answer was not given up");
    situation.expectDropped(Suite::SURVIVES_A_SILENT_WIRE);
}
} // namespace

void ConformanceCases::ADD_SILENCE(Cases& cases)
{
    ADD_ALL(cases, Suite::SURVIVES_A_SILENT_WIRE, "ThePeerHangsUp", THE_PEER_HANGS_UP_ON_A_SILENT_WIRE);
    for (Step const step : {Step::OFFERED, Step::RINGING})
        ADD_TO_WIRE(cases, Suite::SURVIVES_A_SILENT_WIRE,
                    step == Step::OFFERED ? "GivenUpBeforeItRings" : "GivenUpWhileItRings",
                    [step](Situation& situation) { A_SILENT_WIRE_IS_GIVEN_UP(situation, step); });
    ADD_TO_WIRE(cases, Suite::SURVIVES_A_SILENT_WIRE, "NeverThere", A_WIRE_THAT_WAS_NEVER_THERE_IS_GIVEN_UP);
}
