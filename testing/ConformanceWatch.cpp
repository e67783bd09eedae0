#include "testing/ConformanceWatch.h"

#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyCause.h"
#include "properties/CC_PropertyId.h"
#include "services/CC_Service.h"
#include "testing/FailingAllocator.h"
#include "testing/PropertyNames.h"

#include <algorithm>
#include <tuple>
#include <utility>

namespace
{
QCause CAUSE_OF(CC_CallLeg const& leg)
{
    auto const* const cause = CC_PropertyCause::FROM(leg.getProperties().get(CC_PropertyId::CAUSE));
    return cause != nullptr ? cause->getCause() : QCause::NONE;
}

std::string STATE_TEXT(int state)
{
    return CC_PropertyCallLegState::STATE_NAME(static_cast<CC_PropertyCallLegState::State>(state));
}
} // namespace

ConformanceWatch::ConformanceWatch(CC_Context& context, ConformanceLadder& ladder,
                                   std::function<bool(String const&)> isModules)
    : m_context(&context), m_ladder(ladder), m_isModules(std::move(isModules))
{
    std::ignore = context.addContextObserver(*this); // no memory fails here
}

ConformanceWatch::~ConformanceWatch()
{
    if (m_context != nullptr)
        m_context->removeContextObserver(*this);
    for (CC_Call* const call : m_calls)
    {
        call->removeCallLegObserver(this);
        call->removeCallObserver(this);
    }
    for (CC_CallLeg* const leg : m_observed)
        leg->removeCallLegObserver(this);
}

std::vector<ConformanceWatch::Leg const*> ConformanceWatch::getModules() const
{
    FailingAllocator::Pause const unseen;
    std::vector<Leg const*> legs;
    for (Leg const& leg : m_legs)
        if (leg.isModules)
            legs.push_back(&leg);
    return legs;
}

void ConformanceWatch::forget()
{
    std::erase_if(m_legs, [](Leg const& leg) { return leg.hasLeft; });
}

void ConformanceWatch::aboutDestroy(CC_Context&) { m_context = nullptr; }

void ConformanceWatch::aboutCreateCall(CC_Context&, CC_Call* call)
{
    FailingAllocator::Pause const unseen;
    if (call->addCallObserver(this).isOk() && call->addCallLegObserver(this).isOk())
        m_calls.push_back(call);
}

void ConformanceWatch::onCallObservationEnded(CC_Event<CC_Call> const& event)
{
    FailingAllocator::Pause const unseen;
    std::erase(m_calls, CC_EvCallObservationEnded::FROM(event).getSource());
}

void ConformanceWatch::onCallCallLegAdded(CC_Event<CC_Call> const& event)
{
    FailingAllocator::Pause const unseen;
    CC_CallLeg& joined = *CC_EvCallCallLegModified::FROM(event).getCallLeg();
    Leg* leg = find(joined);
    bool const isMoved = leg != nullptr && leg->hasLeft && leg->releases == 0;
    if (!isMoved)
        leg = &m_legs.emplace_back(Leg{&joined, m_isModules(joined.getName())});
    leg->hasLeft = false;
    note(*leg, "joins, " + STATE_TEXT(joined.getState()));
}

/// The module's legs are followed further: whoever has lost its call has to drop all the same.
void ConformanceWatch::onCallCallLegRemoved(CC_Event<CC_Call> const& event)
{
    FailingAllocator::Pause const unseen;
    Leg* const leg = find(*CC_EvCallCallLegModified::FROM(event).getCallLeg());
    if (leg == nullptr)
        return;
    note(*leg, "leaves the call");
    leg->hasLeft = true;
    if (leg->isModules && leg->releases == 0 && leg->leg->addCallLegObserver(this).isOk())
        m_observed.push_back(leg->leg);
}

void ConformanceWatch::onCallLegObservationEnded(CC_Event<CC_CallLeg> const& event)
{
    FailingAllocator::Pause const unseen;
    std::erase(m_observed, CC_EvCallLegObservationEnded::FROM(event).getSource());
}

void ConformanceWatch::onCallLegPropertyChanged(CC_Event<CC_CallLeg> const& event)
{
    FailingAllocator::Pause const unseen;
    auto const& changed = CC_EvCallLegPropertyChanged::FROM(event);
    if (Leg* const leg = find(*changed.getSource()))
        noteChange(*leg, changed.getFlags());
}

void ConformanceWatch::noteChange(Leg& leg, CC_Flags const& flags)
{
    std::string const names = PROPERTY_NAMES(flags);
    if (names.empty())
        return;
    int const state = leg.leg->getState();
    bool const isState = flags.get(CC_PropertyId::STATE);
    bool const isCause = flags.get(CC_PropertyId::CAUSE);
    if (leg.releases != 0)
        leg.writtenAfterRelease += (leg.writtenAfterRelease.empty() ? "" : ", ") + names;
    if (isState && state == CC_PropertyCallLegState::RELEASED && leg.releases++ == 0)
        leg.cause = CAUSE_OF(*leg.leg);
    note(leg, isState   ? STATE_TEXT(state)
              : isCause ? "cause " + std::to_string(static_cast<int>(CAUSE_OF(*leg.leg)))
                        : "writes " + names);
}

void ConformanceWatch::onCallLegSynchronousService(CC_Event<CC_CallLeg> const& event)
{
    FailingAllocator::Pause const unseen;
    auto const& asked = CC_EvCallLegSynchronousService::FROM(event);
    if (Leg const* const leg = find(*asked.getSource()))
        note(*leg, std::string("asks ") + asked.getService()->getInfo().c_str());
}

/// The last one at that address: whoever tells us of it is alive.
ConformanceWatch::Leg* ConformanceWatch::find(CC_CallLeg const& leg)
{
    auto const found = std::find_if(m_legs.rbegin(), m_legs.rend(), [&](Leg const& each) { return each.leg == &leg; });
    return found != m_legs.rend() ? &*found : nullptr;
}

void ConformanceWatch::note(Leg const& leg, std::string const& text)
{
    std::string const name = leg.isModules ? "" : leg.leg->getName().c_str() + std::string(" ");
    m_ladder.add(leg.isModules ? ConformanceLadder::MODULE : ConformanceLadder::PEER, name + text);
}
