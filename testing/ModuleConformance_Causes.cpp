// Cases of causes on their way.
#include "testing/ConformanceCases.h"

using namespace ConformanceCases;

namespace
{
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
} // namespace

void ConformanceCases::ADD_CAUSES(Cases& cases)
{
    ADD_ALL(cases, Suite::CARRIES_CAUSES, "FromThePeer", CAUSES_REACH_THE_WIRE);
    ADD_ALL(cases, Suite::CARRIES_CAUSES, "FromTheWire", CAUSES_REACH_THE_PEER);
    ADD_FROM_WIRE(cases, Suite::CARRIES_CAUSES, "Rejected", A_REJECTION_REACHES_THE_WIRE);
}
