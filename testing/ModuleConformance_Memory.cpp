// Cases of memory that runs out.
#include "testing/ConformanceCases.h"
#include "testing/FailingAllocator.h"

#include <tuple>

using namespace ConformanceCases;

namespace
{
bool IS_UP(Situation& situation, Caller caller)
{
    FailingAllocator::Pause const unseen;
    return caller == Caller::PEER ? situation.peer().getPeerState() == "CONNECTED"
                                  : situation.count(Seen::ANSWERED) == 1;
}

/// A call as far as it comes, and its end: whether it was up.
bool TRY_CALL(Situation& situation, Caller caller, bool isEndedByPeer, String const& provider, String const& number)
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
    bool const isUp = IS_UP(situation, caller);
    isEndedByPeer ? situation.peer().hangUp() : situation.driver().clear(QCause::NORMAL_CALL_CLEARING);
    situation.settle();
    return isUp;
}

/// Whether the chosen allocation was made. Both hang up whatever has become of the call, then a next one has to
/// succeed.
bool IS_SURVIVED(Situation& situation, Caller caller, bool isEndedByPeer, unsigned long n)
{
    situation.restart();
    String const provider = situation.driver().getProviderName();
    String const number = caller == Caller::PEER ? situation.driver().getNumber() : String(ModuleDriver::PEER_NUMBER);
    FailingAllocator::failNth(n);
    bool const wasUp = TRY_CALL(situation, caller, isEndedByPeer, provider, number);
    FailingAllocator::stop();
    Suite::Rule const& rule = Suite::SURVIVES_NO_MEMORY;
    if (!FailingAllocator::hasFailed())
    {
        situation.expect(rule, wasUp, "no allocation was left to fail, and the call has not come up");
        situation.expectDropped(rule);
        return false;
    }
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

void ANY_ALLOCATION_MAY_FAIL(Situation& situation, Caller caller, bool isEndedByPeer)
{
    situation.need(ModuleDriver::FAILING_ALLOCATIONS);
    situation.call(caller, Step::CONNECTED); // what this breaks has nothing to do with memory
    situation.endAsUsual();
    for (unsigned long n = 1; IS_SURVIVED(situation, caller, isEndedByPeer, n); ++n)
    {
    }
}
} // namespace

void ConformanceCases::ADD_MEMORY(Cases& cases)
{
    for (bool const isEndedByPeer : {true, false})
        ADD_BOTH(cases, Suite::SURVIVES_NO_MEMORY,
                 isEndedByPeer ? "EachAllocationUntilThePeerClears" : "EachAllocationUntilTheWireClears",
                 [=](Situation& situation, Caller caller)
                 { ANY_ALLOCATION_MAY_FAIL(situation, caller, isEndedByPeer); });
}
