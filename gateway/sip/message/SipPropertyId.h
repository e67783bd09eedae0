#pragma once

#include "platform/base/XCode.h"
#include "properties/CC_PropertyId.h"

/// The properties that the SIP modules exchange beyond those that every module knows, under ids that are set apart for
/// modules.
namespace SipPropertyId
{
/// SipSessionWord, of a leg: its side's own last offer
inline constexpr unsigned int SESSION_OFFER = CC_PropertyId::FIRST_OF_MODULES;
/// CC_PropertyUnsigned, of a call: the gateway's number for it
inline constexpr unsigned int CALL_NUMBER = CC_PropertyId::FIRST_OF_MODULES + 1;
/// CC_PropertyUnsigned, of an offer: how many hops are left
inline constexpr unsigned int MAX_FORWARDS = CC_PropertyId::FIRST_OF_MODULES + 2;
/// SipSessionWord, of a leg: what became of the other side's offer
inline constexpr unsigned int SESSION_ANSWER = CC_PropertyId::FIRST_OF_MODULES + 3;
/// CC_PropertyUnsigned, of a leg: which of the parties that a proxy has called says what the leg says now, counted from
/// 0 as they were first heard of
inline constexpr unsigned int FORK = CC_PropertyId::FIRST_OF_MODULES + 4;
/// CC_PropertyString, of a leg that asks for a transfer, and then of the offer: header lines for the INVITE to the
/// target
inline constexpr unsigned int HEADERS_FOR_TARGET = CC_PropertyId::FIRST_OF_MODULES + 5;

/// CC_PropertyBoolean, of a call: it is a conference
inline constexpr unsigned int CONFERENCE = CC_PropertyId::FIRST_OF_MODULES + 6;
/// CC_PropertyBoolean, of an offer: the caller asks for TLS on every hop of SIP
inline constexpr unsigned int SECURED = CC_PropertyId::FIRST_OF_MODULES + 7;
/// CC_PropertyString, of a leg: header lines that its side lets through (SipCarriedHeaders)
inline constexpr unsigned int CARRIED_HEADERS = CC_PropertyId::FIRST_OF_MODULES + 8;
/// CC_PropertyParametrizedString, of a leg: its peer has sent the call elsewhere (SipRedirection)
inline constexpr unsigned int REDIRECTION = CC_PropertyId::FIRST_OF_MODULES + 9;
/// CC_PropertyParametrizedString, of a leg: the last message of ISUP that its peer has sent (SipIsup)
inline constexpr unsigned int ISUP = CC_PropertyId::FIRST_OF_MODULES + 10;

/// Declares the names of these, with which logs and
/// dumps show them from then on: OK, also when they have these already; otherwise as CC_PropertyTable::DECLARE.
XCode DECLARE();
/// The name of any property id, these included once they are declared; "(unknown)" otherwise.
char const* NAME(unsigned int id);
} // namespace SipPropertyId
