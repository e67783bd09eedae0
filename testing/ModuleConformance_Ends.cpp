// Cases of how calls end: DropsOnce, WritesNothingAfterTheDrop, ClearsTheWireOnce.
#include "callcontrol/CallControl.h"
#include "testing/ConformanceCases.h"

using namespace ConformanceCases;

namespace
{
void CLEAR(Situation& situation, bool isFromPeer)
{
    isFromPeer ? situation.endAsUsual() : situation.clearFromWire(QCause::NORMAL_CALL_CLEARING, Suite::DROPS_ONCE);
}

void EACH_LEG_IS_DROPPED_ONCE(Situation& situation, Caller caller, Step step, bool isFromPeer)
{
    situation.call(caller, step);
    CLEAR(situation, isFromPeer);
    for (auto const* const leg : situation.watch().getModules())
        situation.expect(Suite::DROPS_ONCE, leg->releases == 1, "a leg was RELEASED more than once");
}

void NOTHING_IS_WRITTEN_AFTERWARDS(Situation& situation, Caller caller, Step step, bool isFromPeer)
{
    situation.call(caller, step);
    CLEAR(situation, isFromPeer);
    for (auto const* const leg : situation.watch().getModules())
        situation.expect(Suite::WRITES_NOTHING_AFTER_THE_DROP, leg->writtenAfterRelease.empty(),
                         "after RELEASED it wrote " + leg->writtenAfterRelease);
}

void THE_WIRE_IS_CLEARED_ONCE(Situation& situation, Caller caller, Step step, bool isFromPeer)
{
    situation.call(caller, step);
    CLEAR(situation, isFromPeer);
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

template <class Play>
void ADD_BOTH_ENDS(Cases& cases, Suite::Rule const& rule, Play play)
{
    for (bool const isFromPeer : {true, false})
        ADD_ALL(cases, rule, isFromPeer ? "ThePeerClears" : "TheWireClears",
                [=](Situation& situation, Caller caller, Step step) { play(situation, caller, step, isFromPeer); });
}
} // namespace

void ConformanceCases::ADD_ENDS(Cases& cases)
{
    ADD_BOTH_ENDS(cases, Suite::DROPS_ONCE, EACH_LEG_IS_DROPPED_ONCE);
    ADD_BOTH_ENDS(cases, Suite::WRITES_NOTHING_AFTER_THE_DROP, NOTHING_IS_WRITTEN_AFTERWARDS);
    ADD_BOTH_ENDS(cases, Suite::CLEARS_THE_WIRE_ONCE, THE_WIRE_IS_CLEARED_ONCE);
    ADD_ALL(cases, Suite::DROPS_ONCE, "BothClearAtOnce", BOTH_CLEAR_AT_ONCE);
    for (bool const hasProvider : {true, false})
        ADD_FROM_WIRE(cases, Suite::CLEARS_THE_WIRE_ONCE, hasProvider ? "TheDialIsRefused" : "NobodyIsThere",
                      [hasProvider](Situation& situation) { THE_DIAL_FAILS(situation, hasProvider); });
}
