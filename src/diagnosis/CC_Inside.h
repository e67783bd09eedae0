#pragma once

#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "calls/CC_CallLeg_Move.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyId.h"

/// What an explanation reads of calls, legs and adapters beyond what they offer to everybody: their friend. It changes
/// nothing and calls nobody.
class CC_Inside
{
public:
    template <class Visit>
    static void FOR_EACH_CALL(Visit&& visit)
    {
        CC_Call::s_instances.forEach(visit);
    }
    template <class Visit>
    static void FOR_EACH_LEG(Visit&& visit)
    {
        CC_CallLeg::s_instances.forEach(visit);
    }
    template <class Visit>
    static void FOR_EACH_ADAPTER(Visit&& visit)
    {
        CC_CallAdapter::s_instances.forEach(visit);
    }

    // --- calls -------------------------------------------------------------------------------------------------------

    static unsigned int HOLDS(CC_Call const& call) { return call.m_holds; }
    static bool IS_ENDING(CC_Call const& call) { return call.m_isEnding; }
    static bool IS_RELEASED(CC_Call const& call) { return call.m_isReleased; }
    static bool HAS_CLEAN_UP(CC_Call const& call) { return call.m_deferredEvent != nullptr; }
    static bool IS_CLEAN_UP_PENDING(CC_Call const& call)
    {
        return call.m_deferredEvent != nullptr && call.m_deferredEvent->isPending();
    }
    static auto const& OBSERVERS(CC_Call const& call) { return call.m_callObservers; }
    static auto const& LEG_OBSERVERS(CC_Call const& call) { return call.m_callLegObservers; }

    // --- legs --------------------------------------------------------------------------------------------------------

    static int REFERENCES(CC_CallLeg const& leg) { return leg.m_referenceCount.load(); }
    static auto const& OBSERVERS(CC_CallLeg const& leg) { return leg.m_observers; }
    static bool IS_ENDING(CC_CallLeg const& leg) { return leg.m_isEnding; }
    static bool IS_MOVING(CC_CallLeg const& leg) { return leg.m_move != nullptr; }
    /// Those of the move under way: its own, and the old call's from the moment that the leg is no more in its list.
    static int REFERENCES_OF_MOVE(CC_CallLeg const& leg)
    {
        if (leg.m_move == nullptr)
            return 0;
        CC_Call const* const from = leg.m_move->source.get();
        return from == nullptr || from->isListed(leg) ? 1 : 2;
    }
    /// How often the leg observer is registered with the leg on behalf of `call`, one of whose leg observers it is.
    static bool IS_GIVEN(CC_CallLeg const& leg, CC_Call const& call, CC_CallLegObserver const* observer)
    {
        if (leg.m_observedBy == &call)
            return true;
        if (leg.m_move != nullptr)
            for (CC_CallLegObserver const* const given : leg.m_move->given)
                if (given == observer)
                    return true;
        return false;
    }

    // --- adapters ----------------------------------------------------------------------------------------------------

    /// The call with which it is registered, and in which of the two ways; it may have ended.
    static CC_Call const* OBSERVED_CALL(CC_CallAdapter const& adapter) { return adapter.m_observedCall; }
    static bool IS_CALL_OBSERVER(CC_CallAdapter const& adapter) { return adapter.m_isCallObserver; }
    static bool IS_CALL_LEG_OBSERVER(CC_CallAdapter const& adapter) { return adapter.m_isCallLegObserver; }
    static bool OBSERVES_OWN_LEG(CC_CallAdapter const& adapter) { return adapter.m_observesOwnCallLeg; }
    /// Whether one of its operations has called out and not yet come back.
    static bool IS_BUSY(CC_CallAdapter const& adapter) { return adapter.m_lifeline.isWatched(); }
    /// How many properties of peer and call its module is still to be told of.
    static unsigned int NUMBER_UNTOLD(CC_CallAdapter const& adapter)
    {
        unsigned int number = 0;
        if (adapter.m_peerChangeEvent != nullptr && adapter.m_peerChangeEvent->isPending())
            adapter.m_peerChangeEvent->m_flags.forEachSet([&](unsigned int) { return ++number != 0; });
        return number;
    }
    /// The State in the module's view of its own leg; null when there is none.
    static CC_PropertyCallLegState const* VIEWED_STATE(CC_CallAdapter const& adapter)
    {
        return CC_PropertyCallLegState::FROM(adapter.m_ownView.getProperties().get(CC_PropertyId::STATE));
    }
};
