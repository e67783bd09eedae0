#pragma once

#include "testing/ConformanceSituation.h"
#include "testing/ModuleConformance.h"

#include <string>
#include <vector>

/// What the groups of conformance cases have in common. Each group adds its own to the list; the rules' order is that
/// of the list.
namespace ConformanceCases
{
using Suite = ModuleConformance;
using Situation = ConformanceSituation;
using Caller = Situation::Caller;
using Step = Situation::Step;
using Seen = ModuleDriver::Seen;
using State = CC_PropertyCallLegState;
using Column = ConformanceLadder::Column;
using Cases = std::vector<Suite::Case>;

constexpr QCause WHY = QCause::USER_BUSY; // a cause that no module takes for want of another

// the groups
void ADD_OFFERS(Cases& cases);
void ADD_ENDS(Cases& cases);
void ADD_CAUSES(Cases& cases);
void ADD_ORDERS(Cases& cases);
void ADD_LOSSES(Cases& cases);
void ADD_SILENCE(Cases& cases);
void ADD_NEIGHBOURS(Cases& cases);
void ADD_DIGITS(Cases& cases);
void ADD_MEMORY(Cases& cases);

// steps of more than one group

/// The party dials the module's own number, whatever comes of it.
XCode DIAL_MODULE(Situation& situation, FakeModule& party);
/// Of the module's legs there is one more than before: it has accepted, or rejected, but not both.
void EXPECT_ONE_ANSWER(Situation& situation, std::size_t legsBefore);
/// A call from the wire is offered to the peer, and neither accepted nor rejected yet.
void CALL_WHO_HOLDS_IT(Situation& situation);
void BECOME(Situation& situation, State::State state);

// lists

/// A case of calls to the wire, from it, of both, and of both at each step.
void ADD_TO_WIRE(Cases& cases, Suite::Rule const& rule, std::string const& name, std::function<void(Situation&)> play);
void ADD_FROM_WIRE(Cases& cases, Suite::Rule const& rule, std::string const& name,
                   std::function<void(Situation&)> play);
void ADD_BOTH(Cases& cases, Suite::Rule const& rule, std::string const& name,
              std::function<void(Situation&, Caller)> const& play);
void ADD_ALL(Cases& cases, Suite::Rule const& rule, std::string const& name,
             std::function<void(Situation&, Caller, Step)> const& play);
} // namespace ConformanceCases
