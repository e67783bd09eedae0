// Cases of peers that vanish.
#include "callcontrol/CC_CallPool.h"
#include "callcontrol/CallControl.h"
#include "testing/ConformanceCases.h"

using namespace ConformanceCases;

namespace
{
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
} // namespace

void ConformanceCases::ADD_LOSSES(Cases& cases)
{
    for (Loss const loss : {Loss::LEG_TAKEN_OUT, Loss::MODULE_DESTROYED, Loss::OPERATOR_DROPS, Loss::CALL_RELEASED})
        ADD_ALL(cases, Suite::SURVIVES_A_LOST_PEER, NAME(loss),
                [loss](Situation& situation, Caller caller, Step step)
                { A_LOST_PEER_ENDS_THE_CALL(situation, loss, caller, step); });
    ADD_FROM_WIRE(cases, Suite::SURVIVES_A_LOST_PEER, "TheCallIsReleasedBeforeAnybodyAccepts",
                  THE_CALL_IS_RELEASED_BEFORE_ANYBODY_ACCEPTS);
}
