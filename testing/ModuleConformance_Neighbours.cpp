// Cases of what is beside a call: a second one, and the end of the module.
#include "testing/ConformanceCases.h"

#include <tuple>

using namespace ConformanceCases;

namespace
{
// --- KeepsCallsApart -------------------------------------------------------------------------------------------------

void A_SECOND_CALL_COMES_AND_GOES(Situation& situation, Caller caller)
{
    situation.need(Caller::PEER);
    situation.call(caller, Step::CONNECTED);
    situation.did(Column::PEER, "> second dials, too");
    std::ignore = DIAL_MODULE(situation, situation.second());
    situation.settle();
    situation.did(Column::PEER, "> second hangs up");
    situation.second().hangUp();
    situation.settle();
    Suite::Rule const& rule = Suite::KEEPS_CALLS_APART;
    situation.expectWireNotCleared(rule);
    situation.expect(rule, situation.watch().getModules().front()->releases == 0, "the first call's leg was dropped");
    situation.expect(rule, situation.peer().getPeerState() == "CONNECTED", "the first call's leg is not CONNECTED");
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
} // namespace

void ConformanceCases::ADD_NEIGHBOURS(Cases& cases)
{
    ADD_BOTH(cases, Suite::KEEPS_CALLS_APART, "ASecondCallComesAndGoes", A_SECOND_CALL_COMES_AND_GOES);
    ADD_FROM_WIRE(cases, Suite::LEAVES_NOTHING, "TheModuleEndsBeforeAnybodyAccepts",
                  THE_MODULE_ENDS_BEFORE_ANYBODY_ACCEPTS);
    ADD_ALL(cases, Suite::LEAVES_NOTHING, "TheModuleEnds", THE_MODULE_ENDS);
}
